#include "generation/write_pipeline.hpp"

#include "core/exception_text.hpp"

namespace tarn {

char* RecordBuffer::reserve(std::size_t bytes) {
    if (bytes > capacity) {
        data.reset();  // the old storage goes before the new one comes
        data.reset(new char[bytes]);
        capacity = bytes;
    }
    return data.get();
}

WritePipeline::WritePipeline(ResultsSink& sink, JobFiles& files, CheckpointPlan checkpoints,
                             int bufferCount, FileMark start, JobProgress* progress)
    : sink_(sink),
      files_(files),
      checkpoints_(std::move(checkpoints)),
      progress_(progress),
      buffers_(static_cast<std::size_t>(bufferCount)),
      written_(start),
      durable_(start) {
    for (RecordBuffer& b : buffers_) free_.push_back(&b);
}

WritePipeline::~WritePipeline() { finish(); }

void WritePipeline::start() {
    writer_ = std::thread([this] { writeLoop(); });
    try {
        checkpointer_ = std::thread([this] { checkpointLoop(); });
    } catch (...) {
        fail({PipelineFailure::Kind::Internal, 0, describeCurrentException()});
        throw;
    }
}

RecordBuffer* WritePipeline::take() {
    std::unique_lock lock(mutex_);
    changed_.wait(lock, [this] { return !free_.empty() || failed(); });
    if (failed()) return nullptr;
    RecordBuffer* b = free_.back();
    free_.pop_back();
    return b;
}

void WritePipeline::hand(RecordBuffer* buffer) {
    {
        std::lock_guard lock(mutex_);
        ready_.emplace(buffer->sequence, buffer);
    }
    changed_.notify_all();
}

void WritePipeline::finish() {
    {
        std::lock_guard lock(mutex_);
        producerDone_ = true;
    }
    changed_.notify_all();
    if (writer_.joinable()) writer_.join();
    if (checkpointer_.joinable()) checkpointer_.join();
}

void WritePipeline::fail(PipelineFailure failure) {
    {
        std::lock_guard lock(mutex_);
        if (failure_.kind == PipelineFailure::Kind::None) failure_ = std::move(failure);
        failed_.store(true, std::memory_order_release);
    }
    changed_.notify_all();
}

void WritePipeline::release(RecordBuffer* buffer) {
    {
        std::lock_guard lock(mutex_);
        free_.push_back(buffer);
    }
    changed_.notify_all();
}

void WritePipeline::writeLoop() {
    bool ended = false;  // a buffer that ends the job was written: drop the rest
    for (;;) {
        RecordBuffer* b = nullptr;
        {
            std::unique_lock lock(mutex_);
            changed_.wait(lock, [this] { return ready_.contains(nextSequence_) || producerDone_; });
            // Once the producers are done, a missing buffer is a turn never sieved.
            const auto next = ready_.find(nextSequence_);
            if (next == ready_.end()) break;
            b = next->second;
            ready_.erase(next);
            ++nextSequence_;
        }
        if (!failed() && !ended) {
            try {
                writeOne(*b);
            } catch (...) {
                fail({PipelineFailure::Kind::Internal, 0, describeCurrentException()});
            }
            ended = b->endsJob;
        }
        release(b);
    }
    {
        std::lock_guard lock(mutex_);
        writerDone_ = true;
    }
    changed_.notify_all();
}

void WritePipeline::writeOne(RecordBuffer& b) {
    if (b.size != 0) {
        const std::uint64_t offset = sink_.size();
        std::size_t reached = 0;
        if (const int error = sink_.write(b.data.get(), b.size, reached); error != 0) {
            fail({PipelineFailure::Kind::Write, error, {}});
            return;
        }
        sink_.startWriteback(offset, b.size);
        if (const FileCheck check = sink_.check();
            check.change != FileCheck::Change::None || check.error != 0) {
            fail({PipelineFailure::Kind::Changed, check.error, {}, check});
            return;
        }
    }
    {
        std::lock_guard lock(mutex_);
        written_ = {sink_.size(), b.lastCandidate, b.primeCount};
    }
    changed_.notify_all();
    if (progress_) progress_->primeCount.store(b.primeCount, std::memory_order_relaxed);
}

void WritePipeline::checkpointLoop() {
    // The first flush comes as soon as there is something written: the seed records.
    auto lastFlush = std::chrono::steady_clock::now() - checkpoints_.interval;
    try {
        while (checkpointOnce(lastFlush)) {
        }
    } catch (...) {
        fail({PipelineFailure::Kind::Internal, 0, describeCurrentException()});
    }
}

// Waits until new records are due for a flush; returns false once there will be none.
bool WritePipeline::checkpointOnce(std::chrono::steady_clock::time_point& lastFlush) {
    FileMark mark;
    {
        std::unique_lock lock(mutex_);
        for (;;) {
            if (writerDone_ || failed()) return false;
            const bool news =
                written_.bytes > durable_.bytes || written_.candidate > durable_.candidate;
            const auto due = lastFlush + checkpoints_.interval;
            if (news && std::chrono::steady_clock::now() >= due) break;
            if (news)
                changed_.wait_until(lock, due);
            else
                changed_.wait(lock);
        }
        mark = written_;
    }
    lastFlush = std::chrono::steady_clock::now();
    if (const int error = sink_.sync(); error != 0) {
        fail({PipelineFailure::Kind::Sync, error, {}});
        return false;
    }
    // A checkpoint must not vouch for records that are no longer at the path.
    if (const FileCheck check = sink_.check();
        check.change != FileCheck::Change::None || check.error != 0) {
        fail({PipelineFailure::Kind::Changed, check.error, {}, check});
        return false;
    }
    const Checkpoint checkpoint{mark.candidate, checkpoints_.limit, 1};
    if (std::string reason = files_.saveCheckpoint(checkpoints_.path, checkpoint);
        !reason.empty()) {
        fail({PipelineFailure::Kind::Checkpoint, 0, std::move(reason)});
        return false;
    }
    {
        std::lock_guard lock(mutex_);
        durable_ = mark;
    }
    return true;
}

}  // namespace tarn
