// Nothing lost, cut or reordered, whatever fails: a fresh job and a resume each meet one injected
// fault (a results write that fills the disk at a byte offset, a flush or a checkpoint rewrite
// that fails once or from then on, an exception on a sieving thread, the writer or the
// checkpointer, a kill as the results file is opened, the file deleted, replaced or cut under
// the job), must report it, must leave every record they had on the disk (that the user did not
// remove) and a file of whole records in order that the checkpoint describes, and a resume on a
// working disk must then finish the file of one uninterrupted job, byte for byte. A fresh job
// starts over the finished file of an earlier one.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <atomic>
#include <cerrno>
#include <cstdio>
#include <filesystem>
#include <stdexcept>
#include <thread>

#include "core/texts.hpp"
#include "generation/generation_job.hpp"
#include "generation/results_oracle.hpp"
#include "generation/resume_job.hpp"
#include "support/temp_folder.hpp"

namespace tarn {
namespace {

using namespace test;
using namespace std::chrono_literals;

constexpr std::int64_t kLimit = 100'000;  // about 70 KB of records, 17 buffers of 4 KiB

struct Fault {
    enum class Kind {
        Write,              // the disk fills once the run has written `at` bytes
        Sync,               // the at-th flush fails
        Checkpoint,         // the at-th checkpoint rewrite fails
        ThrowInWriter,      // the writer meets an exception at byte `at`
        ThrowInProducer,    // the sieving thread meets one after batch `at`
        ThrowInCheckpoint,  // the checkpointer meets one at its at-th rewrite
        Kill,               // killed as it opens the results file: the files as they are then
        Delete,             // after the at-th checkpoint during the job, the results file is
        Replace,            // deleted, replaced by a copy of its durable records,
        Truncate,           // or cut inside its last durable record
    };
    Kind kind;
    std::uint64_t at;
    bool persistent = false;  // Sync, Checkpoint: every later call fails too
};

std::string describe(const Fault& f) {
    static const char* names[] = {"write",
                                  "sync",
                                  "checkpoint",
                                  "throw in writer",
                                  "throw in producer",
                                  "throw in checkpoint",
                                  "kill",
                                  "delete",
                                  "replace",
                                  "truncate"};
    return std::string(names[static_cast<int>(f.kind)]) + " at " + std::to_string(f.at) +
           (f.persistent ? " from then on" : "");
}

// Windows refuses to delete or rename over the results file while a job appends to it: the job
// goes on to its end.
#ifdef _WIN32
constexpr bool kResultsInUseAreKept = true;
#else
constexpr bool kResultsInUseAreKept = false;
#endif

// Counts the calls of one run and fails the one the fault names.
struct Injector {
    Fault fault;
    std::atomic<std::uint64_t> written{0}, syncs{0}, checkpoints{0}, changes{0};
    std::atomic<bool> fired{false};
    std::string path, killedResults, killedCheckpoint;

    bool hits(Fault::Kind kind, std::uint64_t count) {
        const bool hit =
            fault.kind == kind && (count == fault.at || (fault.persistent && count > fault.at));
        if (hit) fired = true;
        return hit;
    }
};

class FaultySink final : public ResultsSink {
public:
    FaultySink(std::unique_ptr<ResultsSink> file, Injector& injector)
        : file_(std::move(file)), injector_(injector) {}
    int write(const char* data, std::size_t size, std::size_t& written) override {
        const Fault& f = injector_.fault;
        const std::uint64_t before = injector_.written;
        written = 0;
        if ((f.kind == Fault::Kind::Write || f.kind == Fault::Kind::ThrowInWriter) &&
            before + size > f.at) {
            injector_.fired = true;
            if (f.kind == Fault::Kind::ThrowInWriter) throw std::runtime_error("injected");
            const std::size_t part = static_cast<std::size_t>(f.at - std::min(f.at, before));
            const int error = file_->write(data, part, written);
            injector_.written += written;
            return error != 0 ? error : ENOSPC;
        }
        const int error = file_->write(data, size, written);
        injector_.written += written;
        return error;
    }
    int sync() override {
        return injector_.hits(Fault::Kind::Sync, ++injector_.syncs) ? EIO : file_->sync();
    }
    int truncate(std::uint64_t size) override { return file_->truncate(size); }
    FileCheck check() override { return file_->check(); }
    int close() override { return file_->close(); }
    std::uint64_t size() const override { return file_->size(); }

private:
    std::unique_ptr<ResultsSink> file_;
    Injector& injector_;
};

JobHooks faultyHooks(Injector& injector) {
    JobHooks hooks;
    hooks.turnsPerChunk = 64;
    hooks.turnsPerBatch = 16;
    hooks.checkpointInterval = 0ms;
    hooks.openResults = [&injector](const std::string& path, bool append, int& error) {
        auto file = openResultsFile(path, append, error);
        injector.path = path;
        if (injector.hits(Fault::Kind::Kill, 0)) {
            injector.killedResults = readFile(path);
            injector.killedCheckpoint = readFile(path.substr(0, path.size() - 3) + "ini");
        }
        return file ? std::make_unique<FaultySink>(std::move(file), injector) : nullptr;
    };
    hooks.writeCheckpoint = [&injector](const std::string& path, const Checkpoint& c) {
        const std::uint64_t count = ++injector.checkpoints;
        if (injector.hits(Fault::Kind::ThrowInCheckpoint, count))
            throw std::runtime_error("injected");
        if (injector.hits(Fault::Kind::Checkpoint, count)) return systemReason(EIO);
        return writeCheckpoint(path, c);
    };
    hooks.afterCheckpoint = [&injector](const Checkpoint&, std::uint64_t durableBytes) {
        const Fault::Kind kind = injector.fault.kind;
        if (kind < Fault::Kind::Delete || !injector.hits(kind, ++injector.changes)) return;
        if (kind == Fault::Kind::Truncate)
            return std::filesystem::resize_file(injector.path, durableBytes - 3);
        const std::string records = readFile(injector.path).substr(0, durableBytes);
        std::error_code refused;
        std::filesystem::remove(injector.path, refused);
        EXPECT_EQ(!!refused, kResultsInUseAreKept) << refused.message();
        if (kind == Fault::Kind::Replace && !refused) writeFile(injector.path, records);
    };
    // Holds the sieving back until the checkpointer has flushed a few times, so that the
    // faults of the first flushes land inside the run whatever the machine's speed.
    hooks.afterBatch = [&injector](std::int64_t turns) {
        const auto batches = static_cast<std::uint64_t>(turns) / 16;
        if (injector.hits(Fault::Kind::ThrowInProducer, batches))
            throw std::runtime_error("injected");
        const auto until = std::chrono::steady_clock::now() + 2s;
        while (injector.syncs < std::min<std::uint64_t>(batches / 8, 4) && !injector.fired &&
               std::chrono::steady_clock::now() < until)
            std::this_thread::sleep_for(100us);
    };
    return hooks;
}

std::string expectedMessage(const Fault& f, const std::string& folder) {
    if (kResultsInUseAreKept && (f.kind == Fault::Kind::Delete || f.kind == Fault::Kind::Replace))
        return "";
    switch (f.kind) {
        case Fault::Kind::Write:
            return "The file " + folder +
                   "primes.txt could not be written: " + systemReason(ENOSPC) + ".";
        case Fault::Kind::Sync:
            return "The file " + folder + "primes.txt could not be written: " + systemReason(EIO) +
                   ".";
        case Fault::Kind::Checkpoint:
            return "The file " + folder + "primes.ini could not be written: " + systemReason(EIO) +
                   ".";
        case Fault::Kind::Kill:
            return "";
        case Fault::Kind::Delete:
            return "The file " + folder +
                   "primes.txt was deleted while the job was writing it. The job stopped; "
                   "generate the primes again.";
        case Fault::Kind::Replace:
            return "The file " + folder +
                   "primes.txt was replaced by another file while the job was writing it. The "
                   "job stopped; generate the primes again.";
        case Fault::Kind::Truncate:  // then the sizes, and what was kept
            return "The file " + folder + "primes.txt holds ";
        default:
            return "The job stopped on an unexpected error: injected.";
    }
}

// The checkpoint's candidate, or 0 when there is none to continue from.
std::int64_t resumePoint(const std::string& folder) {
    const std::string line = readFile(folder + "primes.ini");
    long long candidate = 0, limit = 0;
    int interrupted = 0;
    if (std::sscanf(line.c_str(), "%lld %lld %d", &candidate, &limit, &interrupted) != 3 ||
        interrupted != 1)
        return 0;
    return candidate;
}

// A fresh job, or (stopAfter > 0) a resume of a job stopped after that many turns, meets the
// fault; then the file is finished on a working disk.
void runWithFault(const Fault& fault, bool enumerated, std::int64_t stopAfter,
                  std::string& missed) {
    // One sieving thread for plain records, three for enumerated ones.
    const int threads = enumerated ? 3 : 1;
    SCOPED_TRACE(describe(fault) + (enumerated ? ", enumerated, 3 threads" : ", plain, 1 thread") +
                 (stopAfter > 0 ? ", resumed" : ", fresh"));
    TempFolder folder;
    const std::string full = oracleResults(kLimit, enumerated);
    std::int64_t kept = 0;  // candidate up to which records were on the disk before the run
    if (stopAfter == 0) runJob({folder.path(), 1000, enumerated}, StopSignal{}, nullptr);
    if (stopAfter > 0) {
        StopSignal stop;
        JobHooks hooks;
        hooks.turnsPerBatch = 1;
        hooks.afterBatch = [&](std::int64_t done) {
            if (done >= stopAfter) stop.request();
        };
        const JobResult r = runJob({folder.path(), kLimit, enumerated}, stop, nullptr, hooks);
        ASSERT_EQ(r.status, JobResult::Status::Stopped);
        kept = r.candidate;
    }

    Injector injector;
    injector.fault = fault;
    const JobHooks hooks = faultyHooks(injector);
    std::string message;
    if (stopAfter > 0) {
        const ResumeResult r = runResume(folder.path(), StopSignal{}, nullptr, {}, hooks, threads);
        message = r.status == ResumeResult::Status::Failed ? r.message : "";
    } else {
        const JobResult r =
            runJob({folder.path(), kLimit, enumerated}, StopSignal{}, nullptr, hooks);
        message = r.status == JobResult::Status::Failed ? r.error : "";
    }
    if (!injector.fired) missed += describe(fault) + "; ";
    if (fault.kind == Fault::Kind::Kill) {
        writeFile(folder.path() + "primes.txt", injector.killedResults);
        writeFile(folder.path() + "primes.ini", injector.killedCheckpoint);
    }
    if (injector.fired) {
        if (fault.kind == Fault::Kind::Truncate)
            EXPECT_THAT(message, testing::StartsWith(expectedMessage(fault, folder.path())));
        else
            EXPECT_EQ(message, expectedMessage(fault, folder.path()));
        // Whole records in order, and nothing that was on the disk before the run is gone.
        const std::string file = readFile(folder.path() + "primes.txt");
        EXPECT_TRUE(full.starts_with(file)) << file.size() << " bytes";
        EXPECT_TRUE(file.ends_with("\r\n") || file.empty());
        const std::int64_t point = resumePoint(folder.path());
        if (fault.kind < Fault::Kind::Delete) {
            EXPECT_GE(point, kept);
        }
        // A finished checkpoint names a whole file.
        if (const auto c = readCheckpoint(folder.path() + "primes.ini").checkpoint;
            c && c->interrupted == 0 && c->candidate > c->limit) {
            EXPECT_TRUE(sameText(file, oracleResults(c->limit, enumerated)));
        }
        EXPECT_TRUE(file.starts_with(oracleResults(point, enumerated))) << "checkpoint " << point;
    }

    // A working disk: resume what can be resumed, generate again what cannot.
    for (int attempt = 0;
         attempt < 2 && readFile(folder.path() + "primes.ini") != completeCheckpoint(kLimit);
         ++attempt) {
        if (resumePoint(folder.path()) > 0) {
            const ResumeResult r = runResume(folder.path(), StopSignal{}, nullptr, {});
            EXPECT_EQ(r.status, ResumeResult::Status::Completed) << r.message;
        } else {
            runJob({folder.path(), kLimit, enumerated}, StopSignal{}, nullptr);
        }
    }
    EXPECT_TRUE(sameText(readFile(folder.path() + "primes.txt"), full));
    EXPECT_EQ(readFile(folder.path() + "primes.ini"), completeCheckpoint(kLimit));
}

std::vector<Fault> faultTable() {
    using K = Fault::Kind;
    std::vector<Fault> faults;
    // Inside the seed records, on the edges of a buffer, deep into the run.
    for (const std::uint64_t at : {0, 1, 5, 12, 13, 4095, 4096, 4097, 20000, 33333, 50001})
        faults.push_back({K::Write, at});
    for (const std::uint64_t at : {1, 2, 3}) {
        for (const bool persistent : {false, true}) {
            faults.push_back({K::Sync, at, persistent});
            faults.push_back({K::Checkpoint, at, persistent});
        }
    }
    for (const std::uint64_t at : {0, 9000, 30000}) faults.push_back({K::ThrowInWriter, at});
    for (const std::uint64_t at : {1, 3}) {
        faults.push_back({K::ThrowInProducer, at});
        faults.push_back({K::ThrowInCheckpoint, at});
        for (const K change : {K::Delete, K::Replace, K::Truncate}) faults.push_back({change, at});
    }
    faults.push_back({K::Kill, 0});
    return faults;
}

TEST(JobFaults, AFreshJobKeepsItsRecordsAndAResumeFinishesTheFile) {
    std::string missed;
    for (const Fault& fault : faultTable())
        for (const bool enumerated : {false, true}) runWithFault(fault, enumerated, 0, missed);
    EXPECT_EQ(missed, "");
}

TEST(JobFaults, AResumeKeepsEveryRecordOnTheDiskAndAnotherFinishesTheFile) {
    std::string missed;
    for (const Fault& fault : faultTable())
        for (const bool enumerated : {false, true}) runWithFault(fault, enumerated, 300, missed);
    EXPECT_EQ(missed, "");
}

}  // namespace
}  // namespace tarn
