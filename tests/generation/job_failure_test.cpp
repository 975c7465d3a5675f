// Write failures of the generation job: a results file that fills up at a chosen byte, a results
// file on a full device, a folder that is not there, and a checkpoint that cannot be rewritten.
// The job must end Failed, name the file and the reason, and leave a checkpoint that describes
// what the results file really holds, so that a continued job completes it exactly.
#include <gtest/gtest.h>
#include <unistd.h>

#include <atomic>
#include <filesystem>

#include "generation/generation_job.hpp"
#include "generation/prime_oracle.hpp"
#include "support/temp_folder.hpp"

using namespace tarn;
using tarn::test::expectedResults;
using tarn::test::readFile;
using tarn::test::TempFolder;

namespace {

// The real file, which reports a full disk once `capacity` bytes have been written.
class FillingSink final : public ResultsSink {
public:
    FillingSink(std::unique_ptr<ResultsSink> file, std::uint64_t capacity)
        : file_(std::move(file)), capacity_(capacity) {}
    int write(const char* data, std::size_t size, std::size_t& written) override {
        const std::uint64_t room = capacity_ > used_ ? capacity_ - used_ : 0;
        const std::size_t part = static_cast<std::size_t>(std::min<std::uint64_t>(room, size));
        const int error = file_->write(data, part, written);
        used_ += written;
        if (error != 0) return error;
        return part < size ? ENOSPC : 0;
    }
    int sync() override { return file_->sync(); }
    int truncate(std::uint64_t size) override {
        used_ = size;
        return file_->truncate(size);
    }
    int close() override { return file_->close(); }

private:
    std::unique_ptr<ResultsSink> file_;
    std::uint64_t capacity_;
    std::uint64_t used_ = 0;
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

const std::vector<std::int64_t>& oracle() {
    static const std::vector<std::int64_t> primes = test::primesUpTo(300'000);
    return primes;
}

}  // namespace

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
            EXPECT_EQ(onDisk, expectedResults(oracle(), checkpoint->candidate, enumerated));

            // The checkpoint is a true one: continuing from it completes the file.
            const JobResult resumed = runJob(JobSpec{folder.path(), limit, enumerated, true,
                                                     checkpoint->candidate + 4, failed.primeCount},
                                             StopSignal{});
            ASSERT_EQ(resumed.status, JobResult::Status::Completed) << resumed.error;
            EXPECT_EQ(readFile(folder.path() + "primes.txt"),
                      expectedResults(oracle(), limit, enumerated));
        }
    }
}

TEST(GenerationJobFailure, NoRoomForTheSeedRecordsLeavesNothingToContinue) {
    TempFolder folder;
    const JobResult r =
        runJob(JobSpec{folder.path(), 1000, false}, StopSignal{}, nullptr, fillingAt(5));
    ASSERT_EQ(r.status, JobResult::Status::Failed);
    EXPECT_EQ(readFile(folder.path() + "primes.txt"), "");
    EXPECT_EQ(readFile(folder.path() + "primes.ini"), " 11  1000  0 \r\n");
}

TEST(GenerationJobFailure, ResultsFileOnAFullDevice) {
    if (!std::filesystem::exists("/dev/full")) GTEST_SKIP() << "no /dev/full";
    TempFolder folder;
    std::filesystem::create_symlink("/dev/full", folder.path() + "primes.txt");
    const JobResult r = runJob(JobSpec{folder.path(), 100'000, true}, StopSignal{});
    ASSERT_EQ(r.status, JobResult::Status::Failed);
    EXPECT_EQ(r.error.rfind("The file " + folder.path() +
                                "primes.txt could not be written: No space left on device.",
                            0),
              0u)
        << r.error;
    EXPECT_EQ(readCheckpoint(folder.path() + "primes.ini")->interrupted, 0);
}

TEST(GenerationJobFailure, MissingFolderTouchesNothing) {
    TempFolder folder;
    const std::string missing = folder.path() + "gone/";
    const JobResult r = runJob(JobSpec{missing, 1000, false}, StopSignal{});
    ASSERT_EQ(r.status, JobResult::Status::Failed);
    EXPECT_EQ(r.error, "The file " + missing +
                           "primes.txt could not be opened for writing: No such file or "
                           "directory.");
    EXPECT_FALSE(std::filesystem::exists(missing));
}

TEST(GenerationJobFailure, CheckpointThatCannotBeWrittenFailsTheJob) {
    TempFolder folder;
    // A folder in the way of the checkpoint's temporary file makes every rewrite fail.
    std::filesystem::create_directory(folder.path() + "primes.ini.tmp");
    const JobResult r = runJob(JobSpec{folder.path(), 100'000, false}, StopSignal{});
    ASSERT_EQ(r.status, JobResult::Status::Failed);
    EXPECT_EQ(r.error.rfind("The file " + folder.path() + "primes.ini could not be written: ", 0),
              0u)
        << r.error;
}

TEST(GenerationJobFailure, CheckpointFailureAtTheEndIsNotACompletion) {
    TempFolder folder;
    JobHooks hooks;
    hooks.durable = false;  // no checkpoint during the job: only the final one fails
    std::filesystem::create_directory(folder.path() + "primes.ini.tmp");
    const JobResult r = runJob(JobSpec{folder.path(), 1000, false}, StopSignal{}, nullptr, hooks);
    EXPECT_EQ(r.status, JobResult::Status::Failed);
    EXPECT_NE(r.error.find("primes.ini could not be written"), std::string::npos);
}
