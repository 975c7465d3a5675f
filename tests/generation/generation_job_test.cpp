// The generation job against the oracle: byte-for-byte results files and checkpoint lines for
// complete runs, stops after a chosen turn, continued (appended) runs, the checkpoints written
// while the job runs, and write failures: a results file that fills up at a chosen byte or sits
// on a full device, a folder that is not there, a checkpoint that cannot be rewritten. A failed
// job must name the file and the reason, and leave a checkpoint that describes what the results
// file really holds, so that a continued job completes it exactly.
#include "generation/generation_job.hpp"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <atomic>
#include <cerrno>
#include <filesystem>
#include <random>
#include <thread>

#include "generation/results_oracle.hpp"
#include "support/temp_folder.hpp"

namespace tarn {
namespace {

using namespace test;
using Status = JobResult::Status;
using namespace std::chrono_literals;
using testing::StartsWith;

struct JobRun {
    JobResult result;
    std::string results, checkpoint;
};

JobRun runIn(const TempFolder& folder, JobSpec spec, const JobHooks& hooks = {},
             const StopSignal& stop = StopSignal{}) {
    spec.folder = folder.path();
    JobResult result = runJob(spec, stop, nullptr, hooks);
    return {result, readFile(folder.path() + "primes.txt"), readFile(folder.path() + "primes.ini")};
}

void expectComplete(const JobRun& r, std::int64_t limit, bool enumerated) {
    ASSERT_EQ(r.result.status, Status::Completed) << r.result.error;
    EXPECT_TRUE(sameText(r.results, oracleResults(limit, enumerated)));
    EXPECT_EQ(r.checkpoint, completeCheckpoint(limit));
    EXPECT_EQ(r.result.primeCount, primeCount(limit));
}

void expectComplete(std::int64_t limit, bool enumerated, int threads, const JobHooks& hooks = {}) {
    SCOPED_TRACE("limit " + std::to_string(limit) + (enumerated ? " enumerated " : " plain ") +
                 std::to_string(threads) + " threads");
    TempFolder folder;
    JobSpec spec{"", limit, enumerated};
    spec.threads = threads;
    expectComplete(runIn(folder, spec, hooks), limit, enumerated);
}

TEST(GenerationJob, CompleteRunsMatchTheOracle) {
    // Limits at and around the ends of wheel turns (30k + 7, 30k + 11).
    int threads = 0;
    for (const std::int64_t limit :
         {100, 110, 997, 1000, 1206, 1207, 1208, 1210, 1211, 1212, 30 * 331 + 7, 30 * 331 + 11})
        for (const bool enumerated : {false, true})
            expectComplete(limit, enumerated, threads++ % 3 + 1);
    // The first batch is one turn, the next ones 32768 turns, a chunk 4 batches: edges of the
    // first batch and of the first chunk.
    for (const std::int64_t turns : {32769, 4 * 32768}) {
        const std::int64_t edge = 30 * turns + 11;
        for (const std::int64_t limit : {edge - 1, edge})
            expectComplete(limit, limit % 2 == 0, threads++ % 3 + 1);
    }
    // Many small chunks for more threads than cores, each waiting for the serial numbers of the
    // one before.
    JobHooks small;
    small.turnsPerBatch = 7;
    small.turnsPerChunk = 50;
    for (const int many : {2, 3, 8}) expectComplete(300'007, true, many, small);
    std::mt19937_64 random(20240601);
    std::uniform_int_distribution<std::int64_t> pick(100, 3'000'000);
    for (int i = 0; i < 3; ++i) expectComplete(pick(random), i % 2 == 1, i % 3 + 1);
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
        JobSpec spec{"", limit, threads != 2, true, first, 1000};
        spec.threads = threads;
        JobHooks hooks;
        hooks.turnsPerChunk = chunkTurns;
        const JobRun r = runIn(folder, spec, hooks);
        ASSERT_EQ(r.result.status, Status::Completed) << r.result.error;
        std::string expected;
        std::int64_t serial = spec.primeCountBefore;
        for (const std::int64_t p : plainSegment(first, limit))
            expected += (spec.enumerated ? std::to_string(++serial) + ";" : "") +
                        std::to_string(p) + "\r\n";
        EXPECT_TRUE(sameText(r.results, expected));
    }
}

// A job stopped after `turns` turns (0: a stop asked before the start, which still lets the first
// turn run), continued in append mode and stopped again 7 turns later, then continued to its end:
// each stop leaves whole turns, the end the file of one uninterrupted run. A stop seen after the
// last turn is a completion.
TEST(GenerationJob, StoppedAndContinuedJobsGiveTheFileOfOneRun) {
    const std::pair<std::int64_t, std::int64_t> cases[] = {
        {100'000, 0},   {100'000, 1},    {100'000, 2}, {100'000, 3}, {123'457, 40},
        {100'000, 333}, {123'457, 1000}, {100, 1},     {100, 3}};
    for (const auto& [limit, turns] : cases) {
        for (const bool enumerated : {false, true}) {
            SCOPED_TRACE(std::to_string(turns) + " turns, limit " + std::to_string(limit));
            TempFolder folder;
            JobSpec spec{"", limit, enumerated};
            std::int64_t last = 30 * std::max<std::int64_t>(turns, 1) + 7;
            for (const std::int64_t stopAt : {turns, std::int64_t{7}, std::int64_t{-1}}) {
                // The stop is raised from inside the job once `stopAt` turns are done, with one
                // turn per batch; the last run has the default batches and no stop.
                StopSignal stop;
                if (stopAt == 0) stop.request();
                JobHooks hooks;
                hooks.turnsPerBatch = stopAt < 0 ? 0 : 1;
                hooks.afterBatch = [&stop, stopAt](std::int64_t done) {
                    if (stopAt >= 0 && done >= stopAt) stop.request();
                };
                spec.threads = 1;  // the stop lands exactly after the batch that asks for it
                const JobRun r = runIn(folder, spec, hooks, stop);
                if (stopAt < 0 || last + 4 > limit) {
                    expectComplete(r, limit, enumerated);
                    break;
                }
                ASSERT_EQ(r.result.status, Status::Stopped);
                EXPECT_EQ(r.result.candidate, last);
                EXPECT_EQ(r.checkpoint, oracleCheckpoint(last, limit, 1));
                EXPECT_TRUE(sameText(r.results, oracleResults(last, enumerated)));
                EXPECT_EQ(r.result.primeCount, primeCount(last));
                spec = {"", limit, enumerated, true, last + 4, r.result.primeCount};
                last += 30 * 7;
            }
        }
    }
}

// With several threads a stop raised by one of them lands where the earliest chunk in progress
// ends, possibly before chunks that other threads have finished: the file still ends on the last
// whole turn written, the checkpoint and count say so, and a continued job completes the file.
TEST(GenerationJob, StopsAmongSeveralThreadsLandOnAWholeTurn) {
    const std::int64_t limit = 200'000;
    for (const int threads : {2, 3, 8}) {
        for (const std::int64_t stopAt : {1, 40, 333, 1000, 5000}) {
            SCOPED_TRACE(std::to_string(threads) + " threads, stop at " + std::to_string(stopAt));
            const bool enumerated = (threads + stopAt) % 2 == 1;
            TempFolder folder;
            StopSignal stop;
            JobHooks hooks;
            hooks.turnsPerBatch = 5;
            hooks.turnsPerChunk = 40;
            hooks.afterBatch = [&stop, stopAt](std::int64_t turns) {
                if (turns >= stopAt) stop.request();
            };
            JobSpec spec{"", limit, enumerated};
            spec.threads = threads;
            const JobRun r = runIn(folder, spec, hooks, stop);
            ASSERT_EQ(r.result.status, Status::Stopped);
            const std::int64_t last = r.result.candidate;
            EXPECT_EQ(last % 30, 7);
            EXPECT_GE(last, 37);
            EXPECT_TRUE(sameText(r.results, oracleResults(last, enumerated)));
            EXPECT_EQ(r.checkpoint, oracleCheckpoint(last, limit, 1));
            EXPECT_EQ(r.result.primeCount, primeCount(last));
            JobSpec rest{"", limit, enumerated, true, last + 4, r.result.primeCount};
            rest.threads = threads;
            expectComplete(runIn(folder, rest), limit, enumerated);
        }
    }
}

TEST(GenerationJob, CheckpointsDuringTheJobAgreeWithTheFile) {
    TempFolder folder;
    JobHooks hooks;
    hooks.checkpointInterval = std::chrono::milliseconds(0);
    hooks.turnsPerBatch = 64;
    hooks.turnsPerChunk = 64;
    // Hold the sieving back until the checkpointer has caught up a few times, whatever the
    // machine's speed: one more checkpoint every 6400 turns, up to three.
    std::atomic<int> seen = 0;
    hooks.afterBatch = [&seen](std::int64_t turns) {
        const auto until = std::chrono::steady_clock::now() + 5s;
        while (seen < std::min<std::int64_t>(turns / 6400, 3) &&
               std::chrono::steady_clock::now() < until)
            std::this_thread::sleep_for(100us);
    };
    hooks.afterCheckpoint = [&](const Checkpoint& c, std::uint64_t bytes) {
        ++seen;
        EXPECT_EQ(c.candidate % 30, 7);
        EXPECT_EQ(readFile(folder.path() + "primes.ini"),
                  oracleCheckpoint(c.candidate, 2'000'000, 1));
        EXPECT_TRUE(readFile(folder.path() + "primes.txt").substr(0, bytes) ==
                    oracleResults(c.candidate, true))
            << "file at " << c.candidate;
    };
    // Small batches and small buffers also hand many partial buffers to the writer.
    JobSpec spec{"", 2'000'000, true};
    spec.threads = 3;
    expectComplete(runIn(folder, spec, hooks), 2'000'000, true);
    EXPECT_GE(seen, 3);
}

JobResult failIn(const std::string& folder, std::int64_t limit, const JobHooks& hooks = {},
                 bool enumerated = false) {
    const JobResult r = runJob(JobSpec{folder, limit, enumerated}, StopSignal{}, nullptr, hooks);
    EXPECT_EQ(r.status, JobResult::Status::Failed);
    return r;
}

// Failures of the real file system; injected faults have a table of their own.
TEST(GenerationJobFailure, FailuresNameTheFileAndLeaveAContinuableCheckpoint) {
    if (std::filesystem::exists("/dev/full")) {
        TempFolder folder;
        std::filesystem::create_symlink("/dev/full", folder.path() + "primes.txt");
        EXPECT_THAT(failIn(folder.path(), 100'000).error,
                    StartsWith("The file " + folder.path() +
                               "primes.txt could not be written: No space left on device."));
        EXPECT_EQ(readCheckpoint(folder.path() + "primes.ini").checkpoint->interrupted, 0);
    }
    {
        TempFolder folder;
        const std::string missing = folder.path() + "gone/";
        // The checkpoint goes first, before the results file is emptied.
        EXPECT_EQ(
            failIn(missing, 1000).error,
            "The file " + missing + "primes.ini could not be written: No such file or directory.");
        EXPECT_FALSE(std::filesystem::exists(missing));
    }
    // A folder in the way of the checkpoint's temporary file fails the real rewrite (injected
    // checkpoint faults have a table of their own).
    TempFolder folder;
    std::filesystem::create_directory(folder.path() + "primes.ini.tmp");
    JobHooks atTheEnd;
    atTheEnd.durable = false;
    EXPECT_THAT(failIn(folder.path(), 100'000, atTheEnd).error,
                StartsWith("The file " + folder.path() + "primes.ini could not be written: "));
}

}  // namespace
}  // namespace tarn
