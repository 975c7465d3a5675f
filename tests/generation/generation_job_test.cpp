// The generation job against the oracle: byte-for-byte results files and checkpoint lines for
// complete runs, stops at a chosen point, continued (appended) runs, the checkpoints written
// while the job runs, and failures of the real file system (injected faults have a table of
// their own). A failed job must name the file and the reason.
#include "generation/generation_job.hpp"

#include <gtest/gtest.h>

#include <atomic>
#include <cerrno>
#include <filesystem>
#include <random>
#include <thread>

#include "core/texts.hpp"
#include "generation/results_oracle.hpp"
#include "generation/sink_relay.hpp"
#include "support/temp_folder.hpp"

namespace tarn {
namespace {

using namespace test;
using Status = JobResult::Status;
using namespace std::chrono_literals;

struct JobRun {
    JobResult result;
    std::string results, checkpoint;
};

JobRun runIn(const TempFolder& folder, JobSpec spec, const JobOptions& options = {},
             const StopSignal& stop = StopSignal{}) {
    spec.folder = folder.path();
    return {runJob(spec, stop, nullptr, options), readFile(folder.path() + "primes.txt"),
            readFile(folder.path() + "primes.ini")};
}

void expectComplete(const JobRun& r, std::int64_t limit, bool enumerated) {
    ASSERT_EQ(r.result.status, Status::Completed) << r.result.error;
    EXPECT_TRUE(sameText(r.results, oracleResults(limit, enumerated)));
    EXPECT_EQ(r.checkpoint, completeCheckpoint(limit));
    EXPECT_EQ(r.result.primeCount, primeCount(limit));
}

void expectComplete(std::int64_t limit, bool enumerated, JobOptions options) {
    SCOPED_TRACE("limit " + std::to_string(limit) + (enumerated ? " enumerated " : " plain ") +
                 std::to_string(options.threads) + " threads");
    TempFolder folder;
    expectComplete(runIn(folder, {"", limit, enumerated}, options), limit, enumerated);
}

TEST(GenerationJob, CompleteRunsMatchTheOracle) {
    // The minimum, a prime, the end of a wheel turn (30k + 7), past it, the next turn's start.
    int threads = 0;
    for (const std::int64_t limit : {100, 997, 1207, 1208, 1211})
        for (const bool enumerated : {false, true})
            expectComplete(limit, enumerated, {threads++ % 3 + 1});
    // The first batch is one turn, the next ones 32768 turns, a chunk 4 batches: edges of the
    // first batch and of the first chunk.
    for (const std::int64_t turns : {32769, 4 * 32768}) {
        const std::int64_t edge = 30 * turns + 11;
        for (const std::int64_t limit : {edge - 1, edge})
            expectComplete(limit, limit % 2 == 0, {threads++ % 3 + 1});
    }
    // Many small chunks for more threads than cores, each waiting for the serial numbers of the
    // one before.
    for (const int many : {3, 8}) expectComplete(300'007, true, {many, kCheckpointInterval, 7, 50});
    std::mt19937_64 random(20240601);
    std::uniform_int_distribution<std::int64_t> pick(100, 3'000'000);
    for (int i = 0; i < 3; ++i) expectComplete(pick(random), i % 2 == 1, {i % 3 + 1});
}

// High up the large primes cross off from their buckets: continued jobs near 10^12 (over 10^7
// numbers, where the buckets come round again several times), 10^14 and the top of the range,
// against a plain segmented sieve.
TEST(GenerationJob, ContinuedRunsHighUpMatchAPlainSegmentedSieve) {
    struct Case {
        std::int64_t height, span, chunkTurns;
        int threads;
    };
    const std::int64_t top = 922'337'203'685'277;
    for (const auto& [height, span, chunkTurns, threads] :
         std::initializer_list<Case>{{1'000'000'000'000, 10'000'000, 4999, 3},
                                     {100'000'000'000'000, 4'000'000, 0, 2},
                                     {top - 2'000'000, 2'000'000, 4096, 2}}) {
        SCOPED_TRACE("height " + std::to_string(height));
        const std::int64_t first = height - (height - 11) % 30;
        const std::int64_t limit = std::min(first + span, top);
        TempFolder folder;
        writeFile(folder.path() + "primes.txt", "");
        const JobSpec spec{"", limit, threads != 2, true, first, 1000};
        const JobRun r = runIn(folder, spec, {threads, kCheckpointInterval, 0, chunkTurns});
        ASSERT_EQ(r.result.status, Status::Completed) << r.result.error;
        std::string expected;
        std::int64_t serial = spec.primeCountBefore;
        for (const std::int64_t p : plainSegment(first, limit))
            expected += (spec.enumerated ? std::to_string(++serial) + ";" : "") +
                        std::to_string(p) + "\r\n";
        EXPECT_TRUE(sameText(r.results, expected));
    }
}

// The real files, watched: a stop is asked once the run has written `stopAt` bytes, and each
// checkpoint during the job must describe records that are in the file (the writer may wait for
// a few of them, whatever the machine's speed).
class WatchedFiles final : public JobFiles {
public:
    WatchedFiles(StopSignal& stop, std::uint64_t stopAt, bool enumerated, int holdBack = 0)
        : stop_(stop), stopAt_(stopAt), enumerated_(enumerated), holdBack_(holdBack) {}
    std::unique_ptr<ResultsSink> openResults(const std::string& path, bool append,
                                             int& error) override {
        path_ = path;
        auto file = JobFiles::openResults(path, append, error);
        return file ? std::make_unique<Sink>(std::move(file), *this) : nullptr;
    }
    std::string saveCheckpoint(const std::string& path, const Checkpoint& c) override {
        std::string reason = JobFiles::saveCheckpoint(path, c);
        if (c.interrupted == 1) {
            ++checkpoints;
            EXPECT_EQ(c.candidate % 30, 7);
            EXPECT_EQ(readFile(path), oracleCheckpoint(c.candidate, c.limit, 1));
            EXPECT_TRUE(readFile(path_).starts_with(oracleResults(c.candidate, enumerated_)))
                << "file at " << c.candidate;
        }
        return reason;
    }
    std::atomic<int> checkpoints{0};

private:
    struct Sink final : SinkRelay {
        Sink(std::unique_ptr<ResultsSink> file, WatchedFiles& files)
            : SinkRelay(std::move(file)), f(files) {}
        int write(const char* data, std::size_t size, std::size_t& written) override {
            const auto until = std::chrono::steady_clock::now() + 5s;
            while (f.checkpoints < std::min(++writes / 8, f.holdBack_) &&
                   std::chrono::steady_clock::now() < until)
                std::this_thread::sleep_for(100us);
            const int error = file_->write(data, size, written);
            if ((bytes += written) >= f.stopAt_) f.stop_.request();
            return error;
        }
        WatchedFiles& f;
        int writes = 0;
        std::uint64_t bytes = 0;  // written in this run
    };

    StopSignal& stop_;
    const std::uint64_t stopAt_;
    const bool enumerated_;
    const int holdBack_;  // checkpoints the writer waits for, one every 8 writes
    std::string path_;
};

// A job stopped (0: a stop asked before the start, which still lets the first turn run; else
// once a chosen count of bytes is written), continued in append mode and stopped again further
// on, then continued to its end: each stop lands on a whole turn, possibly before chunks that
// other threads have finished, the checkpoint and count say so, and the end is the file of one
// uninterrupted run. A stop seen after the last turn is a completion.
TEST(GenerationJob, StoppedAndContinuedJobsGiveTheFileOfOneRun) {
    const std::tuple<std::int64_t, std::uint64_t, int> cases[] = {
        {100'000, 0, 1},    {100'000, 1, 1},     {100'000, 30, 1},
        {123'457, 3000, 2}, {200'000, 20000, 8}, {100, 30, 3}};
    int stops = 0;
    for (const auto& [limit, stopAt, threads] : cases) {
        for (const bool enumerated : {false, true}) {
            SCOPED_TRACE(std::to_string(stopAt) + " bytes, limit " + std::to_string(limit) + ", " +
                         std::to_string(threads) + " threads");
            TempFolder folder;
            JobSpec spec{"", limit, enumerated};
            for (const std::uint64_t bytes : {stopAt, stopAt + 5000, std::uint64_t{0}}) {
                const bool last = spec.append && bytes == 0;
                StopSignal stop;
                if (bytes == 0 && !last) stop.request();
                WatchedFiles files(stop, last ? UINT64_MAX : std::max<std::uint64_t>(bytes, 1),
                                   enumerated);
                const JobRun r =
                    runIn(folder, spec, {threads, kCheckpointInterval, 5, 40, &files}, stop);
                if (last || r.result.status == Status::Completed) {
                    expectComplete(r, limit, enumerated);
                    break;
                }
                ASSERT_EQ(r.result.status, Status::Stopped);
                ++stops;
                const std::int64_t at = r.result.candidate;
                EXPECT_TRUE(spec.append || bytes != 0 || at == 37) << at;
                EXPECT_EQ(at % 30, 7);
                EXPECT_GT(at, spec.firstTurn);
                EXPECT_EQ(r.checkpoint, oracleCheckpoint(at, limit, 1));
                EXPECT_TRUE(sameText(r.results, oracleResults(at, enumerated)));
                EXPECT_EQ(r.result.primeCount, primeCount(at));
                spec = {"", limit, enumerated, true, at + 4, r.result.primeCount};
            }
        }
    }
    EXPECT_GE(stops, 15);  // most stops land inside a job
}

TEST(GenerationJob, CheckpointsDuringTheJobAgreeWithTheFile) {
    TempFolder folder;
    StopSignal never;
    WatchedFiles files(never, UINT64_MAX, true, 3);
    // Small batches and small buffers also hand many partial buffers to the writer.
    expectComplete(runIn(folder, {"", 2'000'000, true}, {3, 0ms, 64, 64, &files}), 2'000'000, true);
    EXPECT_GE(files.checkpoints, 3);
}

// Failures of the real file system: a folder that is not there (the checkpoint goes first,
// before the results file is emptied), and a full device.
TEST(GenerationJobFailure, FailuresNameTheFile) {
    TempFolder folder;
    const std::string missing = folder.path() + "gone/";
    JobResult r = runJob({missing, 1000}, StopSignal{});
    EXPECT_EQ(r.error, fileWriteFailure(missing + "primes.ini", systemReason(ENOENT)));
    EXPECT_FALSE(std::filesystem::exists(missing));
    if (!std::filesystem::exists("/dev/full")) return;
    std::filesystem::create_symlink("/dev/full", folder.path() + "primes.txt");
    r = runJob({folder.path(), 100'000}, StopSignal{});
    EXPECT_TRUE(
        r.error.starts_with(fileWriteFailure(folder.path() + "primes.txt", systemReason(ENOSPC))))
        << r.error;
    EXPECT_EQ(readCheckpoint(folder.path() + "primes.ini").checkpoint->interrupted, 0);
}

}  // namespace
}  // namespace tarn
