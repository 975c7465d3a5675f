#include "generation/chunk_producer.hpp"

#include <algorithm>
#include <array>
#include <bit>
#include <cstring>
#include <optional>
#include <utility>

#include "core/exception_text.hpp"
#include "generation/record_formatter.hpp"

namespace tarn {
namespace {

// Bit i of eight turns read as one little-endian word, counted from the first turn's start.
constexpr std::array<std::uint32_t, 64> kWordOffsets = [] {
    std::array<std::uint32_t, 64> offsets{};
    for (std::uint32_t i = 0; i < 64; ++i)
        offsets[i] = static_cast<std::uint32_t>(kWheelPeriod) * (i / 8) + kTurnOffsets[i % 8];
    return offsets;
}();

int decimalDigits(std::uint64_t n) {
    int digits = 1;
    while (n >= 10) {
        n /= 10;
        ++digits;
    }
    return digits;
}

}  // namespace

ChunkProducer::ChunkProducer(const ChunkPlan& plan, WritePipeline& pipeline, const StopSignal& stop,
                             JobProgress* progress)
    : plan_(plan), pipeline_(pipeline), stop_(stop), progress_(progress) {}

ChunkProducer::~ChunkProducer() {
    close(false);
    join();
}

void ChunkProducer::start(int threads, BucketSieve& large) {
    large_ = &large;
    groupChunk_.assign(static_cast<std::size_t>(large.groups()), 0);
    for (int i = 0; i < std::max(threads, 1); ++i) threads_.emplace_back([this] { work(); });
}

void ChunkProducer::join() {
    for (std::thread& t : threads_)
        if (t.joinable()) t.join();
}

void ChunkProducer::close(bool failed) {
    {
        std::lock_guard lock(mutex_);
        closed_ = true;
        failed_ = failed_ || failed;
    }
    published_.notify_all();
}

void ChunkProducer::work() {
    RecordBuffer* buffer = nullptr;
    try {
        std::optional<WheelSieve> sieve;
        std::vector<std::uint8_t> sieved(static_cast<std::size_t>(plan_.chunkTurns));
        for (;;) {
            // A buffer first, then a chunk: a claimed chunk never waits for memory.
            buffer = pipeline_.take();
            if (!buffer) return;
            const Claim chunk = claim();
            if (chunk.index < 0) break;
            const std::int64_t turns = chunk.endTurn - chunk.firstTurn;
            std::memset(sieved.data(), 0, static_cast<std::size_t>(turns));
            bool crossed = true;
            for (int g = 0; crossed && g < large_->groups(); ++g)
                crossed = crossOff(g, chunk.index, sieved.data(), turns);
            if (!crossed) break;
            if (!sieve)
                sieve.emplace(chunk.firstTurn, plan_.limit);
            else
                sieve->skipTo(chunk.firstTurn);
            const std::int64_t reached = sieveChunk(*sieve, chunk, sieved);
            const std::int64_t count = countPrimes(sieved, reached - chunk.firstTurn);
            const std::int64_t before = recordsBefore(chunk.index);
            if (before < 0) break;
            publish(chunk.index, before + count);
            format(chunk, reached, sieved, before, count, *buffer);
            buffer->sequence = plan_.firstSequence + static_cast<std::uint64_t>(chunk.index);
            buffer->endsJob = reached < chunk.endTurn;
            if (buffer->endsJob) close(false);
            pipeline_.hand(std::exchange(buffer, nullptr));
        }
    } catch (...) {
        pipeline_.fail({PipelineFailure::Kind::Internal, 0, describeCurrentException()});
        close(true);
    }
    if (buffer) pipeline_.release(buffer);
}

bool ChunkProducer::crossOff(int group, std::int64_t index, std::uint8_t* bytes,
                             std::int64_t turns) {
    const auto g = static_cast<std::size_t>(group);
    {
        std::unique_lock lock(mutex_);
        published_.wait(lock, [&] { return failed_ || groupChunk_[g] == index; });
        if (failed_) return false;
    }
    large_->crossOffNext(group, bytes, turns);
    {
        std::lock_guard lock(mutex_);
        ++groupChunk_[g];
    }
    published_.notify_all();
    return true;
}

ChunkProducer::Claim ChunkProducer::claim() {
    std::lock_guard lock(mutex_);
    const std::int64_t first = plan_.firstTurn + nextChunk_ * plan_.chunkTurns;
    // A stop between two chunks ends the job after the last whole one, but the job's first
    // turn always runs.
    if (closed_ || first >= plan_.endTurn || pipeline_.failed() ||
        (nextChunk_ > 0 && stop_.requested())) {
        closed_ = true;
        return {};
    }
    if (progress_) progress_->candidate.store(turnStart(first), std::memory_order_relaxed);
    return {nextChunk_++, first, std::min(first + plan_.chunkTurns, plan_.endTurn)};
}

std::int64_t ChunkProducer::sieveChunk(WheelSieve& sieve, const Claim& chunk,
                                       std::vector<std::uint8_t>& sieved) {
    std::int64_t turn = chunk.firstTurn;
    std::int64_t length = chunk.index == 0 ? 1 : plan_.segmentTurns;
    while (turn < chunk.endTurn) {
        length = std::min(length, chunk.endTurn - turn);
        std::uint8_t* segment = sieved.data() + (turn - chunk.firstTurn);
        sieve.sieveNext(segment, static_cast<std::size_t>(length));
        if (turn + length == plan_.endTurn) {
            // Candidates above the limit in the last turn are neither tested nor written.
            const std::int64_t last = turnStart(plan_.endTurn - 1);
            for (int b = 0; b < 8; ++b)
                if (last + kTurnOffsets[b] > plan_.limit)
                    segment[length - 1] |= std::uint8_t(1u << b);
        }
        turn += length;
        length = plan_.segmentTurns;
        if (pipeline_.failed()) break;
        if (turn < chunk.endTurn && stop_.requested()) break;
    }
    return turn;
}

std::int64_t ChunkProducer::countPrimes(const std::vector<std::uint8_t>& sieved,
                                        std::int64_t turns) const {
    std::int64_t count = 0;
    std::size_t i = 0;
    const auto n = static_cast<std::size_t>(turns);
    for (; i + 8 <= n; i += 8) {
        std::uint64_t word;
        std::memcpy(&word, sieved.data() + i, 8);
        count += std::popcount(~word);
    }
    for (; i < n; ++i) count += std::popcount(static_cast<std::uint8_t>(~sieved[i]));
    return count;
}

std::int64_t ChunkProducer::recordsBefore(std::int64_t index) {
    if (index == 0) return plan_.recordsBefore;
    std::unique_lock lock(mutex_);
    published_.wait(lock, [&] { return failed_ || recordsAfter_.contains(index - 1); });
    if (failed_) return -1;
    const auto it = recordsAfter_.find(index - 1);
    const std::int64_t before = it->second;
    recordsAfter_.erase(it);
    return before;
}

void ChunkProducer::publish(std::int64_t index, std::int64_t recordsAfter) {
    {
        std::lock_guard lock(mutex_);
        recordsAfter_[index] = recordsAfter;
    }
    published_.notify_all();
}

void ChunkProducer::format(const Claim& chunk, std::int64_t reached,
                           const std::vector<std::uint8_t>& sieved, std::int64_t before,
                           std::int64_t count, RecordBuffer& buffer) const {
    const auto lastCandidate = static_cast<std::uint64_t>(turnStart(reached) - kLastToNextTurn);
    const std::size_t longest =
        static_cast<std::size_t>(decimalDigits(lastCandidate)) + 2 +
        (plan_.enumerated ? static_cast<std::size_t>(decimalDigits(before + count)) + 1 : 0);
    char* const data =
        buffer.reserve(static_cast<std::size_t>(count) * longest + RecordFormatter::kMaxRecord);
    char* out = data;
    RecordFormatter formatter(static_cast<std::uint64_t>(turnStart(chunk.firstTurn)),
                              static_cast<std::uint64_t>(before), plan_.enumerated);
    const std::int64_t turns = reached - chunk.firstTurn;
    std::int64_t t = 0;
    if constexpr (std::endian::native == std::endian::little) {
        // Eight turns a word: one hard-to-predict loop end per eight turns, not per turn.
        for (; t + 8 <= turns; t += 8) {
            std::uint64_t word;
            std::memcpy(&word, sieved.data() + t, 8);
            const auto start = static_cast<std::uint64_t>(turnStart(chunk.firstTurn + t));
            for (word = ~word; word != 0; word &= word - 1)
                out = formatter.put(out, start + kWordOffsets[std::countr_zero(word)]);
        }
    }
    for (; t < turns; ++t) {
        unsigned primes = static_cast<std::uint8_t>(~sieved[static_cast<std::size_t>(t)]);
        const auto start = static_cast<std::uint64_t>(turnStart(chunk.firstTurn + t));
        for (; primes != 0; primes &= primes - 1)
            out = formatter.put(out, start + kTurnOffsets[std::countr_zero(primes)]);
    }
    buffer.size = static_cast<std::size_t>(out - data);
    buffer.lastCandidate = static_cast<std::int64_t>(lastCandidate);
    buffer.primeCount = before + count;
}

}  // namespace tarn
