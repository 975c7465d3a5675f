// Kill tests: tarn-cli generate and resume are killed at random moments, then
// resumed until the job completes; the results file must be byte for byte that of one
// uninterrupted run. Each run checkpoints as soon as its first records are written, so a kill
// after that leaves a torn file to resume; a kill before it leaves nothing to resume, and then
// the job is simply started again.
#include <gtest/gtest.h>

#include <algorithm>
#include <random>

#include "generation/checkpoint_file.hpp"
#include "generation/results_oracle.hpp"
#include "support/child_process.hpp"

namespace tarn {
namespace {

using namespace test;

TEST(ResumeCrash, KilledJobsResumeToTheUninterruptedFile) {
    // Kills land anywhere inside a job. The reference run says how long a whole job takes in
    // this build on this machine, and a run of --version how long the program takes just to start.
    const std::string limit = "100000000";
    TempFolder reference, output;
    const auto timed = [&](std::vector<std::string> args) {
        const auto launch = std::chrono::steady_clock::now();
        EXPECT_EQ(runCli(std::move(args), output.path()).code, 0);
        return std::chrono::duration_cast<std::chrono::milliseconds>(
            std::chrono::steady_clock::now() - launch);
    };
    const auto whole = timed({"--folder", reference.path(), "generate", limit});
    const auto startup = timed({"--version"});
    const std::string expected = readFile(reference.path() + "primes.txt");
    const std::string expectedCheckpoint = readFile(reference.path() + "primes.ini");
    EXPECT_EQ(std::count(expected.begin(), expected.end(), '\n'), 5761455);  // pi(10^8)

    const unsigned seed = std::random_device{}();
    std::mt19937 random(seed);
    std::uniform_int_distribution<long> killDelay(
        1, std::max<long>(2, static_cast<long>((whole - startup).count())));
    int resumes = 0;
    for (int run = 0; run < 4; ++run) {
        TempFolder folder;
        bool completed = false;
        std::string history;  // the commands of this run and how each ended
        for (int attempt = 0; attempt < 30 && !completed; ++attempt) {
            const auto checkpoint = readCheckpoint(folder.path() + "primes.ini").checkpoint;
            const bool resume = checkpoint && checkpoint->interrupted == 1;
            resumes += resume;
            // One sieving thread, two, and more than the cores, in turn.
            const std::string threads = "--threads=" + std::to_string((run + attempt) % 3 * 2 + 1);
            std::vector<std::string> args{"--folder", folder.path(), resume ? "resume" : "generate",
                                          threads};
            if (!resume) args.push_back(limit);
            ChildProcess child(args, output.path());
            // Then let it run to its end; while no kill has yet left a job to resume (a start-up
            // slower than the one measured, as under an emulator), kill on a little longer.
            const bool kill = attempt < 4 || (resumes == 0 && attempt < 12);
            if (kill) {
                std::this_thread::sleep_for(startup + std::chrono::milliseconds(killDelay(random)));
                child.kill();
            }
            const int code = child.wait();
            history += std::string(resume ? " resume " : " generate ") + threads + ":" +
                       std::to_string(code);
            completed = code == 0;
            ASSERT_TRUE(completed || (kill && code == kKilledExitCode))
                << "seed " << seed << ", run " << run << history << ": " << child.err();
        }
        ASSERT_TRUE(completed) << "seed " << seed << history;
        ASSERT_TRUE(sameText(readFile(folder.path() + "primes.txt"), expected))
            << "seed " << seed << ", run " << run << history;
        EXPECT_EQ(readFile(folder.path() + "primes.ini"), expectedCheckpoint);
    }
    EXPECT_GT(resumes, 0) << "no kill landed inside a job; seed " << seed;
}

}  // namespace
}  // namespace tarn
