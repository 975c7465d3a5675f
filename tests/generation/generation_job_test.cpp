// The generation job against the oracle: byte-for-byte results files and checkpoint lines for
// complete runs, stops after a chosen turn, continued (appended) runs, and the checkpoints written
// while the job runs.
#include "generation/generation_job.hpp"

#include <gtest/gtest.h>

#include <mutex>
#include <random>
#include <thread>

#include "generation/results_oracle.hpp"
#include "support/temp_folder.hpp"

namespace tarn {
namespace {

using Status = JobResult::Status;
using test::completeCheckpoint;
using test::oracleCheckpoint;
using test::oracleResults;
using test::primeCount;
using test::readFile;
using test::TempFolder;

struct JobRun {
    JobResult result;
    std::string results, checkpoint;
};

JobRun runIn(const TempFolder& folder, JobSpec spec, const JobHooks& hooks = {},
             const StopSignal& stop = StopSignal{}) {
    spec.folder = folder.path();
    JobRun r{runJob(spec, stop, nullptr, hooks), "", ""};
    r.results = readFile(folder.path() + "primes.txt");
    r.checkpoint = readFile(folder.path() + "primes.ini");
    return r;
}

void expectComplete(std::int64_t limit, bool enumerated, const JobHooks& hooks = {}) {
    SCOPED_TRACE("limit " + std::to_string(limit) + (enumerated ? " enumerated" : " plain"));
    TempFolder folder;
    const JobRun r = runIn(folder, JobSpec{"", limit, enumerated}, hooks);
    ASSERT_EQ(r.result.status, Status::Completed) << r.result.error;
    EXPECT_EQ(r.results, oracleResults(limit, enumerated));
    EXPECT_EQ(r.checkpoint, completeCheckpoint(limit));
    EXPECT_EQ(r.result.candidate, test::nextTurnAbove(limit));
    EXPECT_EQ(r.result.primeCount, primeCount(limit));
}

// A stop raised from inside the job once `turns` turns are done; one turn per batch.
JobHooks stopAfter(StopSignal& stop, std::int64_t turns) {
    JobHooks hooks;
    hooks.turnsPerBatch = 1;
    hooks.afterBatch = [&stop, turns](std::int64_t done) {
        if (done >= turns) stop.request();
    };
    return hooks;
}

TEST(GenerationJob, CompleteRunsMatchTheOracle) {
    // Limits at and around the ends of wheel turns (30k + 7, 30k + 11).
    for (const std::int64_t limit : {100, 110, 997, 1000, 1206, 1207, 1208, 1210, 1211, 1212,
                                     30 * 331 + 7, 30 * 331 + 11})
        for (const bool enumerated : {false, true}) expectComplete(limit, enumerated);
    // The first batch is one turn and the next 32768 turns; its end is turn 32769.
    const std::int64_t edge = 30 * 32769 + 11;
    for (const std::int64_t limit : {edge - 1, edge, edge + 1, edge + 30})
        expectComplete(limit, false);
    // Small batches and small buffers hand many partial buffers to the writer.
    JobHooks small;
    small.turnsPerBatch = 7;
    small.bufferBytes = 4096;
    expectComplete(200'000, true, small);
    expectComplete(200'003, false, small);
    std::mt19937_64 random(20240601);
    std::uniform_int_distribution<std::int64_t> pick(100, 10'000'000);
    for (int i = 0; i < 4; ++i) expectComplete(pick(random), i % 2 == 1);
    expectComplete(10'000'000, false);
}

// A stop leaves whole turns: the job ends at 30 * turns + 7, or completes when that turn was its
// last. A stop asked before the start still lets the first turn run.
TEST(GenerationJob, StopLeavesWholeTurns) {
    const std::pair<std::int64_t, std::int64_t> cases[] = {
        {100'000, 0}, {100'000, 1}, {100'000, 2}, {100'000, 3}, {100'000, 50}, {100'000, 333},
        {100, 3}};
    for (const auto& [limit, turns] : cases) {
        for (const bool enumerated : {false, true}) {
            SCOPED_TRACE(std::to_string(turns) + " turns, limit " + std::to_string(limit));
            TempFolder folder;
            StopSignal stop;
            if (turns == 0) stop.request();
            const JobRun r =
                runIn(folder, JobSpec{"", limit, enumerated}, stopAfter(stop, turns), stop);
            const std::int64_t last = 30 * std::max<std::int64_t>(turns, 1) + 7;
            const bool completes = last + 4 > limit;
            ASSERT_EQ(r.result.status, completes ? Status::Completed : Status::Stopped);
            EXPECT_EQ(r.checkpoint, completes ? completeCheckpoint(limit)
                                              : oracleCheckpoint(last, limit, 1));
            EXPECT_EQ(r.results, oracleResults(std::min(last, limit), enumerated));
            EXPECT_EQ(r.result.primeCount, primeCount(std::min(last, limit)));
            if (!completes) {
                EXPECT_EQ(r.result.candidate, last);
            }
        }
    }
}

// Stopped, continued in append mode and stopped again, then continued to the end: the file of one
// uninterrupted run.
TEST(GenerationJob, ContinuedJobGivesTheSameFileAsOneRun) {
    const std::int64_t limit = 123'457;
    for (const bool enumerated : {false, true}) {
        for (const std::int64_t turns : {1, 40, 1000}) {
            SCOPED_TRACE(turns);
            TempFolder folder;
            JobSpec spec{"", limit, enumerated};
            std::int64_t last = 30 * turns + 7;
            for (const std::int64_t stopAt : {turns, std::int64_t{7}}) {
                StopSignal stop;
                const JobRun r = runIn(folder, spec, stopAfter(stop, stopAt), stop);
                ASSERT_EQ(r.result.status, Status::Stopped);
                EXPECT_EQ(r.result.candidate, last);
                EXPECT_EQ(r.checkpoint, oracleCheckpoint(last, limit, 1));
                EXPECT_EQ(r.results, oracleResults(last, enumerated));
                spec = {"", limit, enumerated, true, last + 4, r.result.primeCount};
                last += 30 * 7;
            }
            const JobRun r = runIn(folder, spec);
            ASSERT_EQ(r.result.status, Status::Completed) << r.result.error;
            EXPECT_EQ(r.results, oracleResults(limit, enumerated));
            EXPECT_EQ(r.checkpoint, completeCheckpoint(limit));
            EXPECT_EQ(r.result.primeCount, primeCount(limit));
        }
    }
}

TEST(GenerationJob, CheckpointsDuringTheJobAgreeWithTheFile) {
    TempFolder folder;
    JobHooks hooks;
    hooks.checkpointInterval = std::chrono::milliseconds(0);
    hooks.turnsPerBatch = 64;
    hooks.bufferBytes = 4096;
    // Slow the sieve down so that the checkpointer gets many turns whatever the machine's speed.
    hooks.afterBatch = [](std::int64_t) {
        std::this_thread::sleep_for(std::chrono::microseconds(300));
    };
    std::mutex mutex;
    std::vector<std::string> faults;
    int seen = 0;
    hooks.afterCheckpoint = [&](const Checkpoint& c, std::uint64_t bytes) {
        std::lock_guard lock(mutex);
        ++seen;
        if (c.candidate % 30 != 7 || c.interrupted != 1 || c.limit != 2'000'000)
            faults.push_back("checkpoint " + checkpointLine(c));
        if (readFile(folder.path() + "primes.txt").substr(0, bytes) !=
            oracleResults(c.candidate, true))
            faults.push_back("file at " + std::to_string(c.candidate));
        if (readCheckpoint(folder.path() + "primes.ini") != c) faults.push_back("ini differs");
    };
    const JobRun r = runIn(folder, JobSpec{"", 2'000'000, true}, hooks);
    ASSERT_EQ(r.result.status, Status::Completed);
    EXPECT_GE(seen, 2);
    EXPECT_TRUE(faults.empty()) << faults.front();
    EXPECT_EQ(r.checkpoint, completeCheckpoint(2'000'000));
}

}  // namespace
}  // namespace tarn
