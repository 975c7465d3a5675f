// The generation job against a plain sieve: byte-for-byte results files and checkpoint lines for
// complete runs, stops after a chosen turn, continued (appended) runs, and the checkpoints written
// while the job runs.
#include "generation/generation_job.hpp"

#include <gtest/gtest.h>

#include <mutex>
#include <thread>
#include <random>

#include "generation/job_texts.hpp"
#include "generation/prime_oracle.hpp"
#include "support/temp_folder.hpp"

using namespace tarn;
using tarn::test::expectedResults;
using tarn::test::nextTurnAbove;
using tarn::test::readFile;
using tarn::test::TempFolder;

namespace {

const std::vector<std::int64_t>& oracle() {
    static const std::vector<std::int64_t> primes = test::primesUpTo(10'000'000);
    return primes;
}

struct JobRun {
    JobResult result;
    std::string results;
    std::string checkpoint;
};

JobRun runIn(const TempFolder& folder, JobSpec spec, const JobHooks& hooks = {},
             const StopSignal* stopSignal = nullptr) {
    spec.folder = folder.path();
    StopSignal idle;
    JobRun r;
    r.result = runJob(spec, stopSignal ? *stopSignal : idle, nullptr, hooks);
    r.results = readFile(folder.path() + "primes.txt");
    r.checkpoint = readFile(folder.path() + "primes.ini");
    return r;
}

void expectComplete(std::int64_t limit, bool enumerated, const JobHooks& hooks = {}) {
    SCOPED_TRACE("limit " + std::to_string(limit) + (enumerated ? " enumerated" : " plain"));
    TempFolder folder;
    const JobRun r = runIn(folder, JobSpec{"", limit, enumerated}, hooks);
    ASSERT_EQ(r.result.status, JobResult::Status::Completed) << r.result.error;
    EXPECT_EQ(r.results, expectedResults(oracle(), limit, enumerated));
    EXPECT_EQ(r.result.candidate, nextTurnAbove(limit));
    EXPECT_EQ(r.result.primeCount, test::countUpTo(oracle(), limit));
    EXPECT_EQ(r.checkpoint, checkpointLine({nextTurnAbove(limit), limit, 0}));
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

}  // namespace

TEST(GenerationJob, WorkedLimitsGiveTheDescribedFiles) {
    TempFolder folder;
    const JobRun r = runIn(folder, JobSpec{"", 100, false});
    ASSERT_EQ(r.result.status, JobResult::Status::Completed);
    EXPECT_EQ(r.checkpoint, " 101  100  0 \r\n");
    EXPECT_EQ(r.results.substr(0, 12), "2\r\n3\r\n5\r\n7\r\n");
    EXPECT_EQ(r.result.primeCount, 25);
    EXPECT_EQ(completionReport(r.result),
              "Done!!! The results were saved in the file " + folder.path() +
                  "primes.txt. 25 primes found up to number 100... Save the file to other "
                  "location.");
    EXPECT_EQ(completionInfoLine(r.result), "INFO: 25 primes found up to number 100...");

    const JobRun e = runIn(folder, JobSpec{"", 110, true});
    EXPECT_EQ(e.checkpoint, " 131  110  0 \r\n");
    EXPECT_EQ(e.results.substr(0, 20), "1;2\r\n2;3\r\n3;5\r\n4;7\r\n");
    EXPECT_EQ(e.results.substr(e.results.size() - 8), "29;109\r\n");
    EXPECT_EQ(completionInfoLine(e.result), "INFO: 29 primes found up to number 110...");

    const JobRun k = runIn(folder, JobSpec{"", 1000, false});
    EXPECT_EQ(k.checkpoint, " 1001  1000  0 \r\n");
    EXPECT_EQ(k.result.primeCount, 168);
}

TEST(GenerationJob, LimitsAroundTurnEdgesMatchThePlainSieve) {
    for (const std::int64_t limit : {100LL, 110LL, 1000LL, 1206LL, 1207LL, 1208LL, 1210LL, 1211LL,
                                     1212LL, 30 * 331 + 7LL, 30 * 331 + 11LL, 997LL}) {
        expectComplete(limit, false);
        expectComplete(limit, true);
    }
}

TEST(GenerationJob, LimitsAcrossSegmentBoundariesMatchThePlainSieve) {
    // The first batch is one turn and the next 32768 turns; its end is turn 32769.
    const std::int64_t edge = 30 * 32769 + 11;
    for (const std::int64_t limit : {edge - 1, edge, edge + 1, edge + 30})
        expectComplete(limit, false);
    // Small batches and small buffers hand many partial buffers to the writer.
    JobHooks hooks;
    hooks.turnsPerBatch = 7;
    hooks.bufferBytes = 4096;
    expectComplete(200'000, true, hooks);
    expectComplete(200'003, false, hooks);
}

TEST(GenerationJob, RandomLimitsMatchThePlainSieve) {
    std::mt19937_64 random(20240601);
    std::uniform_int_distribution<std::int64_t> pick(100, 10'000'000);
    for (int i = 0; i < 4; ++i) expectComplete(pick(random), i % 2 == 1);
    expectComplete(10'000'000, false);
}

TEST(GenerationJob, StopAfterSomeTurnsLeavesWholeTurns) {
    for (const std::int64_t turns : {1, 2, 3, 50, 333}) {
        for (const bool enumerated : {false, true}) {
            SCOPED_TRACE(turns);
            TempFolder folder;
            StopSignal stop;
            const JobRun r =
                runIn(folder, JobSpec{"", 100'000, enumerated}, stopAfter(stop, turns), &stop);
            const std::int64_t last = 30 * turns + 7;
            ASSERT_EQ(r.result.status, JobResult::Status::Stopped);
            EXPECT_EQ(r.result.candidate, last);
            EXPECT_EQ(r.checkpoint, checkpointLine({last, 100'000, 1}));
            EXPECT_EQ(r.results, expectedResults(oracle(), last, enumerated));
            EXPECT_EQ(r.result.primeCount, test::countUpTo(oracle(), last));
        }
    }
}

TEST(GenerationJob, StopAskedBeforeTheStartEndsAfterTheFirstTurn) {
    TempFolder folder;
    StopSignal stop;
    stop.request();
    const JobRun r = runIn(folder, JobSpec{"", 1'000'000, false}, {}, &stop);
    ASSERT_EQ(r.result.status, JobResult::Status::Stopped);
    EXPECT_EQ(r.checkpoint, " 37  1000000  1 \r\n");
    EXPECT_EQ(r.results, "2\r\n3\r\n5\r\n7\r\n11\r\n13\r\n17\r\n19\r\n23\r\n29\r\n31\r\n37\r\n");
    EXPECT_EQ(r.result.primeCount, 12);
}

TEST(GenerationJob, StopSeenAfterTheLastTurnCountsAsComplete) {
    TempFolder folder;
    StopSignal stop;
    const JobRun r = runIn(folder, JobSpec{"", 100, false}, stopAfter(stop, 3), &stop);
    EXPECT_EQ(r.result.status, JobResult::Status::Completed);
    EXPECT_EQ(r.checkpoint, " 101  100  0 \r\n");
}

TEST(GenerationJob, ContinuedJobGivesTheSameFileAsOneRun) {
    for (const bool enumerated : {false, true}) {
        for (const std::int64_t turns : {1, 40, 1000}) {
            SCOPED_TRACE(turns);
            const std::int64_t limit = 123'457;
            TempFolder folder;
            StopSignal stop;
            const JobRun first =
                runIn(folder, JobSpec{"", limit, enumerated}, stopAfter(stop, turns), &stop);
            ASSERT_EQ(first.result.status, JobResult::Status::Stopped);
            JobSpec next{
                "", limit, enumerated, true, first.result.candidate + 4, first.result.primeCount};
            StopSignal idle;
            const JobRun second = runIn(folder, next);
            ASSERT_EQ(second.result.status, JobResult::Status::Completed) << second.result.error;
            EXPECT_EQ(second.results, expectedResults(oracle(), limit, enumerated));
            EXPECT_EQ(second.checkpoint, checkpointLine({nextTurnAbove(limit), limit, 0}));
            EXPECT_EQ(second.result.primeCount, test::countUpTo(oracle(), limit));
        }
    }
}

TEST(GenerationJob, ContinuedJobPastItsLimitWritesNothing) {
    TempFolder folder;
    test::writeFile(folder.path() + "primes.txt", "2\r\n");
    const JobRun r = runIn(folder, JobSpec{"", 100, false, true, 101, 25});
    EXPECT_EQ(r.result.status, JobResult::Status::Completed);
    EXPECT_EQ(r.results, "2\r\n");
    EXPECT_EQ(r.checkpoint, " 101  100  0 \r\n");
}

TEST(GenerationJob, CheckpointsDuringTheJobAgreeWithTheFile) {
    TempFolder folder;
    const std::string resultsPath = folder.path() + "primes.txt";
    JobHooks hooks;
    hooks.checkpointInterval = std::chrono::milliseconds(0);
    hooks.turnsPerBatch = 64;
    hooks.bufferBytes = 4096;
    // Slow the sieve down so that the checkpointer gets many turns whatever the machine's speed.
    hooks.afterBatch = [](std::int64_t) { std::this_thread::sleep_for(std::chrono::microseconds(300)); };
    std::mutex mutex;
    std::vector<std::string> faults;
    int seen = 0;
    hooks.afterCheckpoint = [&](const Checkpoint& c, std::uint64_t bytes) {
        std::lock_guard lock(mutex);
        ++seen;
        const std::string expected = expectedResults(oracle(), c.candidate, true);
        const std::string onDisk = readFile(resultsPath).substr(0, bytes);
        if (c.candidate % 30 != 7 || c.interrupted != 1 || c.limit != 2'000'000)
            faults.push_back("checkpoint " + checkpointLine(c));
        if (onDisk != expected) faults.push_back("file at " + std::to_string(c.candidate));
        if (readCheckpoint(folder.path() + "primes.ini") != c) faults.push_back("ini differs");
    };
    const JobRun r = runIn(folder, JobSpec{"", 2'000'000, true}, hooks);
    ASSERT_EQ(r.result.status, JobResult::Status::Completed);
    EXPECT_GE(seen, 2);
    EXPECT_TRUE(faults.empty()) << faults.front();
    EXPECT_EQ(r.checkpoint, checkpointLine({nextTurnAbove(2'000'000), 2'000'000, 0}));
}

TEST(GenerationJob, MinimumOfTheGenerateCommand) {
    EXPECT_EQ(checkGenerationMinimum(99), std::optional<std::string>("Minimum value is 100"));
    EXPECT_EQ(checkGenerationMinimum(Number::fromWhole(2)), "Minimum value is 100");
    EXPECT_FALSE(checkGenerationMinimum(100).has_value());
    EXPECT_FALSE(checkGenerationMinimum(Number::fromWhole(922337203685277)).has_value());
}
