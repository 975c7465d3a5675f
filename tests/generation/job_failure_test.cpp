// Write failures of the generation job: a results file that fills up at a chosen byte, a results
// file on a full device, a folder that is not there, and a checkpoint that cannot be rewritten.
// The job must end Failed, name the file and the reason, and leave a checkpoint that describes
// what the results file really holds, so that a continued job completes it exactly.
#include <gtest/gtest.h>

#include <cerrno>
#include <filesystem>

#include "generation/generation_job.hpp"
#include "generation/results_oracle.hpp"
#include "support/temp_folder.hpp"

namespace tarn {
namespace {

using test::oracleResults;
using test::readFile;
using test::TempFolder;

// The real file, which reports a full disk once `capacity` bytes have been written.
class FillingSink final : public ResultsSink {
public:
    FillingSink(std::unique_ptr<ResultsSink> file, std::uint64_t capacity)
        : file_(std::move(file)), capacity_(capacity) {}
    int write(const char* data, std::size_t size, std::size_t& written) override {
        const std::size_t part = std::min<std::uint64_t>(capacity_ - std::min(capacity_, used_), size);
        const int error = file_->write(data, part, written);
        used_ += written;
        return error != 0 ? error : part < size ? ENOSPC : 0;
    }
    int sync() override { return file_->sync(); }
    int truncate(std::uint64_t size) override { return file_->truncate(used_ = size); }
    int close() override { return file_->close(); }

private:
    std::unique_ptr<ResultsSink> file_;
    std::uint64_t capacity_, used_ = 0;
};

JobHooks fillingAt(std::uint64_t capacity) {
    JobHooks hooks;
    hooks.bufferBytes = 4096;
    hooks.turnsPerBatch = 16;
    hooks.openResults = [capacity](const std::string& path, bool append, int& error) {
        auto file = openResultsFile(path, append, error);
        return file ? std::make_unique<FillingSink>(std::move(file), capacity) : nullptr;
    };
    return hooks;
}

JobResult failIn(const std::string& folder, std::int64_t limit, const JobHooks& hooks = {}) {
    const JobResult r = runJob(JobSpec{folder, limit, false}, StopSignal{}, nullptr, hooks);
    EXPECT_EQ(r.status, JobResult::Status::Failed);
    return r;
}

TEST(GenerationJobFailure, FullDiskLeavesWholeTurnsAndAContinuableCheckpoint) {
    const std::int64_t limit = 300'000;
    for (const std::uint64_t capacity : {21u, 4096u, 5000u, 40000u, 100001u}) {
        for (const bool enumerated : {false, true}) {
            SCOPED_TRACE(capacity);
            TempFolder folder;
            const JobResult failed = runJob(JobSpec{folder.path(), limit, enumerated}, StopSignal{},
                                            nullptr, fillingAt(capacity));
            ASSERT_EQ(failed.status, JobResult::Status::Failed);
            EXPECT_EQ(failed.error.substr(0, failed.error.find(':')),
                      "The file " + folder.path() + "primes.txt could not be written");
            EXPECT_NE(failed.error.find("No space left on device."), std::string::npos);
            const auto checkpoint = readCheckpoint(folder.path() + "primes.ini");
            ASSERT_TRUE(checkpoint.has_value());
            ASSERT_EQ(checkpoint->interrupted, 1);
            ASSERT_EQ(checkpoint->candidate % 30, 7);
            EXPECT_EQ(checkpoint->candidate, failed.candidate);
            const std::string onDisk = readFile(folder.path() + "primes.txt");
            EXPECT_LE(onDisk.size(), capacity);
            EXPECT_EQ(onDisk, oracleResults(checkpoint->candidate, enumerated));
            // The checkpoint is a true one: continuing from it completes the file.
            const JobResult resumed = runJob(JobSpec{folder.path(), limit, enumerated, true,
                                                     checkpoint->candidate + 4, failed.primeCount},
                                             StopSignal{});
            ASSERT_EQ(resumed.status, JobResult::Status::Completed) << resumed.error;
            EXPECT_EQ(readFile(folder.path() + "primes.txt"), oracleResults(limit, enumerated));
        }
    }
}

TEST(GenerationJobFailure, OtherFailuresNameTheFileAndTheReason) {
    {  // No room even for the seed records: nothing to continue.
        TempFolder folder;
        failIn(folder.path(), 1000, fillingAt(5));
        EXPECT_EQ(readFile(folder.path() + "primes.txt"), "");
        EXPECT_EQ(readFile(folder.path() + "primes.ini"), " 11  1000  0 \r\n");
    }
    if (std::filesystem::exists("/dev/full")) {
        TempFolder folder;
        std::filesystem::create_symlink("/dev/full", folder.path() + "primes.txt");
        const std::string error = failIn(folder.path(), 100'000).error;
        EXPECT_EQ(error.rfind("The file " + folder.path() +
                                  "primes.txt could not be written: No space left on device.",
                              0),
                  0u)
            << error;
        EXPECT_EQ(readCheckpoint(folder.path() + "primes.ini")->interrupted, 0);
    }
    {
        TempFolder folder;
        const std::string missing = folder.path() + "gone/";
        EXPECT_EQ(failIn(missing, 1000).error,
                  "The file " + missing +
                      "primes.txt could not be opened for writing: No such file or directory.");
        EXPECT_FALSE(std::filesystem::exists(missing));
    }
    // A folder in the way of the checkpoint's temporary file makes every rewrite fail, during
    // the job and, with no checkpoint during it, at its end.
    TempFolder folder;
    std::filesystem::create_directory(folder.path() + "primes.ini.tmp");
    JobHooks notDurable;
    notDurable.durable = false;
    for (const JobHooks& hooks : {JobHooks{}, notDurable}) {
        const std::string error = failIn(folder.path(), 100'000, hooks).error;
        EXPECT_EQ(error.rfind("The file " + folder.path() + "primes.ini could not be written: ", 0),
                  0u)
            << error;
    }
}

}  // namespace
}  // namespace tarn
