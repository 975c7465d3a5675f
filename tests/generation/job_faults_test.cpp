// Nothing lost, cut or reordered, whatever fails: a fresh job and a resume each meet one injected
// fault through the job's files (a results write that fills the disk at a byte offset, a flush or
// a checkpoint rewrite that fails once or from then on, an exception on the writer or the
// checkpointer, a kill as the results file is opened, the file deleted, replaced or cut under
// the job), must report it, must leave every record they had on the disk (that the user did not
// remove) and a file of whole records in order that the checkpoint describes, and a resume on a
// working disk must then finish the file of one uninterrupted job, byte for byte. A fresh job
// starts over the finished file of an earlier one.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <atomic>
#include <cerrno>
#include <filesystem>
#include <stdexcept>
#include <thread>

#include "core/exception_text.hpp"
#include "core/texts.hpp"
#include "generation/generation_job.hpp"
#include "generation/results_oracle.hpp"
#include "generation/resume_job.hpp"
#include "generation/sink_relay.hpp"
#include "generation/texts.hpp"
#include "support/temp_folder.hpp"

namespace tarn {
namespace {

using namespace test;
using namespace std::chrono_literals;

constexpr std::int64_t kLimit = 100'000;  // about 70 KB of records, 52 chunks of 64 turns

// What fails, counted from the run's start: Write, ThrowInWriter at byte `at`; Sync, Checkpoint,
// ThrowInCheckpoint at the at-th call; Delete, Replace, Truncate (inside its last durable record)
// the results file after the at-th checkpoint during the job; Kill as the file is opened.
enum class Kind {
    Write,
    Sync,
    Checkpoint,
    ThrowInWriter,
    ThrowInCheckpoint,
    Kill,
    Delete,
    Replace,
    Truncate
};
struct Fault {
    Kind kind;
    std::uint64_t at;
    bool persistent = false;  // Sync, Checkpoint: every later call fails too
};

// Windows refuses to delete or rename over the results file while a job appends to it: the job
// goes on to its end.
#ifdef _WIN32
constexpr bool kResultsInUseAreKept = true;
#else
constexpr bool kResultsInUseAreKept = false;
#endif

// The job's files, failing where the fault says.
class FaultyFiles final : public JobFiles {
public:
    FaultyFiles(Fault fault, bool enumerated) : fault_(fault), enumerated_(enumerated) {}

    std::unique_ptr<ResultsSink> openResults(const std::string& path, bool append,
                                             int& error) override {
        auto file = JobFiles::openResults(path, append, error);
        path_ = path;
        if (hits(Kind::Kill, 0)) {
            killedResults = readFile(path);
            killedCheckpoint = readFile(path.substr(0, path.size() - 3) + "ini");
        }
        return file ? std::make_unique<Sink>(std::move(file), *this) : nullptr;
    }
    std::string saveCheckpoint(const std::string& path, const Checkpoint& c) override {
        const std::uint64_t count = ++checkpoints_;
        if (hits(Kind::ThrowInCheckpoint, count)) throw std::runtime_error("injected");
        if (hits(Kind::Checkpoint, count)) return systemReason(EIO);
        std::string reason = JobFiles::saveCheckpoint(path, c);
        if (c.interrupted == 1 && fault_.kind >= Kind::Delete && hits(fault_.kind, ++changes_))
            change(oracleResults(c.candidate, enumerated_).size());
        return reason;
    }

    std::atomic<bool> fired{false};
    std::string killedResults, killedCheckpoint;

private:
    struct Sink final : SinkRelay {
        Sink(std::unique_ptr<ResultsSink> file, FaultyFiles& files)
            : SinkRelay(std::move(file)), f(files) {}
        int write(const char* data, std::size_t size, std::size_t& written) override {
            // Holds the writer back until the checkpointer has flushed a few times, so that the
            // faults of the first flushes land inside the run whatever the machine's speed.
            const auto until = std::chrono::steady_clock::now() + 2s;
            while (f.syncs_ < std::min<std::uint64_t>(++writes / 2, 4) && !f.fired &&
                   std::chrono::steady_clock::now() < until)
                std::this_thread::sleep_for(100us);
            const Fault& fault = f.fault_;
            std::size_t part = size;
            if ((fault.kind == Kind::Write || fault.kind == Kind::ThrowInWriter) &&
                bytes + size > fault.at) {
                f.fired = true;
                if (fault.kind == Kind::ThrowInWriter) throw std::runtime_error("injected");
                part = static_cast<std::size_t>(fault.at - std::min(fault.at, bytes));
            }
            const int error = file_->write(data, part, written);
            bytes += written;
            return error != 0 || part == size ? error : ENOSPC;
        }
        int sync() override { return f.hits(Kind::Sync, ++f.syncs_) ? EIO : file_->sync(); }
        FaultyFiles& f;
        std::uint64_t bytes = 0, writes = 0;
    };

    bool hits(Kind kind, std::uint64_t count) {
        const bool hit =
            fault_.kind == kind && (count == fault_.at || (fault_.persistent && count > fault_.at));
        if (hit) fired = true;
        return hit;
    }
    // The user deletes, replaces or cuts the file with `durable` bytes on the disk.
    void change(std::uint64_t durable) {
        if (fault_.kind == Kind::Truncate) return std::filesystem::resize_file(path_, durable - 3);
        const std::string records = readFile(path_).substr(0, durable);
        std::error_code refused;
        std::filesystem::remove(path_, refused);
        EXPECT_EQ(!!refused, kResultsInUseAreKept) << refused.message();
        if (fault_.kind == Kind::Replace && !refused) writeFile(path_, records);
    }

    const Fault fault_;
    const bool enumerated_;
    std::string path_;
    std::atomic<std::uint64_t> syncs_{0}, checkpoints_{0}, changes_{0};
};

std::string expectedMessage(Kind kind, const std::string& folder) {
    const std::string results = folder + "primes.txt";
    if (kResultsInUseAreKept && (kind == Kind::Delete || kind == Kind::Replace)) return "";
    switch (kind) {
        case Kind::Write:
            return fileWriteFailure(results, systemReason(ENOSPC));
        case Kind::Sync:
            return fileWriteFailure(results, systemReason(EIO));
        case Kind::Checkpoint:
            return fileWriteFailure(folder + "primes.ini", systemReason(EIO));
        case Kind::Kill:
            return "";
        case Kind::Delete:
            return resultsChangeMessage(results, {FileCheck::Change::Gone}, 0);
        case Kind::Replace:
            return resultsChangeMessage(results, {FileCheck::Change::Replaced}, 0);
        case Kind::Truncate:  // then the sizes, and what was kept
            return "The file " + results + " holds ";
        default:
            return unexpectedFailure("injected");
    }
}

// A fresh job, or (resumed) a resume of a job stopped at 30 * 300 + 7, meets the fault; then the
// file is finished on a working disk.
void runWithFault(const Fault& fault, bool enumerated, bool resumed, std::string& missed) {
    // One sieving thread for plain records, three for enumerated ones.
    JobOptions options{enumerated ? 3 : 1, 0ms, 16, 64};
    const std::string name = std::to_string(static_cast<int>(fault.kind)) + " at " +
                             std::to_string(fault.at) + (fault.persistent ? " on" : "") +
                             (enumerated ? " enumerated" : " plain") + (resumed ? " resumed" : "");
    SCOPED_TRACE(name);
    TempFolder folder;
    const std::string full = oracleResults(kLimit, enumerated);
    const std::int64_t kept = resumed ? 30 * 300 + 7 : 0;  // on the disk before the run
    if (resumed) {
        writeFile(folder.path() + "primes.txt", oracleResults(kept, enumerated));
        writeFile(folder.path() + "primes.ini", oracleCheckpoint(kept, kLimit, 1));
    } else {
        runJob({folder.path(), 1000, enumerated}, StopSignal{});
    }

    FaultyFiles files(fault, enumerated);
    options.files = &files;
    std::string message;
    if (resumed) {
        const ResumeResult r = runResume(folder.path(), StopSignal{}, nullptr, {}, options);
        message = r.status == ResumeResult::Status::Failed ? r.message : "";
    } else {
        const JobResult r =
            runJob({folder.path(), kLimit, enumerated}, StopSignal{}, nullptr, options);
        message = r.status == JobResult::Status::Failed ? r.error : "";
    }
    if (!files.fired) missed += name + "; ";
    if (fault.kind == Kind::Kill) {
        writeFile(folder.path() + "primes.txt", files.killedResults);
        writeFile(folder.path() + "primes.ini", files.killedCheckpoint);
    }
    const auto point = [&] {
        const auto c = readCheckpoint(folder.path() + "primes.ini").checkpoint;
        return c && c->interrupted == 1 ? c->candidate : 0;
    };
    if (files.fired) {
        const std::string expected = expectedMessage(fault.kind, folder.path());
        EXPECT_EQ(fault.kind == Kind::Truncate ? message.substr(0, expected.size()) : message,
                  expected);
        // Whole records in order, and nothing that was on the disk before the run is gone.
        const std::string file = readFile(folder.path() + "primes.txt");
        EXPECT_TRUE(full.starts_with(file)) << file.size() << " bytes";
        EXPECT_TRUE(file.ends_with("\r\n") || file.empty());
        EXPECT_GE(point(), fault.kind < Kind::Delete ? kept : 0);
        // A finished checkpoint names a whole file.
        if (const auto c = readCheckpoint(folder.path() + "primes.ini").checkpoint;
            c && c->interrupted == 0 && c->candidate > c->limit) {
            EXPECT_TRUE(sameText(file, oracleResults(c->limit, enumerated)));
        }
        EXPECT_TRUE(file.starts_with(oracleResults(point(), enumerated)))
            << "checkpoint " << point();
    }

    // A working disk: resume what can be resumed, generate again what cannot.
    for (int attempt = 0;
         attempt < 2 && readFile(folder.path() + "primes.ini") != completeCheckpoint(kLimit);
         ++attempt) {
        if (point() > 0) {
            EXPECT_EQ(runResume(folder.path(), StopSignal{}, nullptr, {}).status,
                      ResumeResult::Status::Completed);
        } else {
            runJob({folder.path(), kLimit, enumerated}, StopSignal{});
        }
    }
    EXPECT_TRUE(sameText(readFile(folder.path() + "primes.txt"), full));
    EXPECT_EQ(readFile(folder.path() + "primes.ini"), completeCheckpoint(kLimit));
}

void runFaultTable(bool resumed) {
    std::vector<Fault> faults;
    // Inside the seed records, on the edges of a buffer, deep into the run.
    for (const std::uint64_t at : {0, 1, 5, 12, 13, 4095, 4096, 4097, 20000, 33333, 50001})
        faults.push_back({Kind::Write, at});
    for (const std::uint64_t at : {1, 2, 3})
        for (const bool persistent : {false, true})
            for (const Kind kind : {Kind::Sync, Kind::Checkpoint})
                faults.push_back({kind, at, persistent});
    for (const std::uint64_t at : {0, 9000, 30000}) faults.push_back({Kind::ThrowInWriter, at});
    for (const std::uint64_t at : {1, 3})
        for (const Kind kind :
             {Kind::ThrowInCheckpoint, Kind::Delete, Kind::Replace, Kind::Truncate})
            faults.push_back({kind, at});
    faults.push_back({Kind::Kill, 0});
    std::string missed;
    for (const Fault& fault : faults)
        for (const bool enumerated : {false, true})
            runWithFault(fault, enumerated, resumed, missed);
    EXPECT_EQ(missed, "");
}

TEST(JobFaults, AFreshJobKeepsItsRecordsAndAResumeFinishesTheFile) { runFaultTable(false); }
TEST(JobFaults, AResumeKeepsEveryRecordOnTheDiskAndAnotherFinishesTheFile) { runFaultTable(true); }

}  // namespace
}  // namespace tarn
