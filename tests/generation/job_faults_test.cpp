// Nothing lost, cut or reordered, whatever fails: a fresh job and a resume each meet one injected
// fault through the job's files (a results write that fills the disk at a byte offset, a flush or
// a checkpoint rewrite that fails once or from then on, an exception on the writer or the
// checkpointer, a kill as the results file is opened, the file deleted, replaced or cut under
// the job), must report it, must leave every record they had on the disk (that the user did not
// remove) and a file of whole records in order that the checkpoint describes, and a resume on a
// working disk must then finish the file of one uninterrupted job, byte for byte. A fresh job
// starts over the finished file of an earlier one.
#include <gtest/gtest.h>

#include <atomic>
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

// What fails, counted from the run's start: Write, WriterThrows at byte `at`; Sync, Save,
// SaveThrows at the at-th call; Delete, Replace, Cut (inside its last durable record) the results
// file after the at-th checkpoint during the job; Kill as the file is opened.
enum Kind { Write, Sync, Save, WriterThrows, SaveThrows, Kill, Delete, Replace, Cut };
struct Fault {
    Kind kind;
    std::uint64_t at;
    bool persistent = false;  // Sync, Save: every later call fails too
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
        if (hits(Kill, 0)) {
            killedResults = readFile(path);
            killedCheckpoint = readFile(path.substr(0, path.size() - 3) + "ini");
        }
        return file ? std::make_unique<Sink>(std::move(file), *this) : nullptr;
    }
    std::string saveCheckpoint(const std::string& path, const Checkpoint& c) override {
        const std::uint64_t count = ++checkpoints_;
        if (hits(SaveThrows, count)) throw std::runtime_error("injected");
        if (hits(Save, count)) return systemReason(EIO);
        std::string reason = JobFiles::saveCheckpoint(path, c);
        if (c.interrupted == 1 && fault_.kind >= Delete && hits(fault_.kind, ++changes_))
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
            if ((fault.kind == Write || fault.kind == WriterThrows) && bytes + size > fault.at) {
                f.fired = true;
                if (fault.kind == WriterThrows) throw std::runtime_error("injected");
                part = static_cast<std::size_t>(fault.at - std::min(fault.at, bytes));
            }
            const int error = file_->write(data, part, written);
            bytes += written;
            return error != 0 || part == size ? error : ENOSPC;
        }
        int sync() override { return f.hits(Sync, ++f.syncs_) ? EIO : file_->sync(); }
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
        if (fault_.kind == Cut) return std::filesystem::resize_file(path_, durable - 3);
        const std::string records = readFile(path_).substr(0, durable);
        std::error_code refused;
        std::filesystem::remove(path_, refused);
        EXPECT_EQ(!!refused, kResultsInUseAreKept) << refused.message();
        if (fault_.kind == Replace && !refused) writeFile(path_, records);
    }

    const Fault fault_;
    const bool enumerated_;
    std::string path_;
    std::atomic<std::uint64_t> syncs_{0}, checkpoints_{0}, changes_{0};
};

std::string expectedMessage(Kind kind, const std::string& folder) {
    const std::string results = folder + "primes.txt";
    if (kResultsInUseAreKept && (kind == Delete || kind == Replace)) return "";
    const std::string messages[] = {fileWriteFailure(results, systemReason(ENOSPC)),
                                    fileWriteFailure(results, systemReason(EIO)),
                                    fileWriteFailure(folder + "primes.ini", systemReason(EIO)),
                                    unexpectedFailure("injected"),
                                    unexpectedFailure("injected"),
                                    "",
                                    resultsChangeMessage(results, {FileCheck::Change::Gone}, 0),
                                    resultsChangeMessage(results, {FileCheck::Change::Replaced}, 0),
                                    "The file " + results + " holds "};  // then the sizes
    return messages[kind];
}

// A fresh job, or (resumed) a resume of a job stopped at 30 * 300 + 7, meets the fault; then the
// file is finished on a working disk.
void runWithFault(const Fault& fault, bool enumerated, bool resumed, std::string& missed) {
    const std::string name = std::to_string(fault.kind) + " at " + std::to_string(fault.at) +
                             (fault.persistent ? " on" : "") + (enumerated ? " enumerated" : "") +
                             (resumed ? " resumed" : "");
    SCOPED_TRACE(name);
    TempFolder folder;
    const std::string txt = folder.path() + "primes.txt", ini = folder.path() + "primes.ini";
    const std::string full = oracleResults(kLimit, enumerated);
    const std::int64_t kept = resumed ? 30 * 300 + 7 : 0;  // on the disk before the run
    if (resumed) {
        writeFile(txt, oracleResults(kept, enumerated));
        writeFile(ini, oracleCheckpoint(kept, kLimit, 1));
    } else {
        runJob({folder.path(), 1000, enumerated}, StopSignal{});
    }
    FaultyFiles files(fault, enumerated);
    // One sieving thread for plain records, three for enumerated ones.
    const JobOptions options{enumerated ? 3 : 1, 0ms, 16, 64, &files};
    const std::string message =
        resumed ? runResume(folder.path(), StopSignal{}, nullptr, {}, options).message
                : runJob({folder.path(), kLimit, enumerated}, StopSignal{}, nullptr, options).error;
    if (!files.fired) missed += name + "; ";
    if (fault.kind == Kill) {
        writeFile(txt, files.killedResults);
        writeFile(ini, files.killedCheckpoint);
    }
    const auto point = [&] {
        const auto c = readCheckpoint(ini).checkpoint;
        return c && c->interrupted == 1 ? c->candidate : 0;
    };
    if (files.fired) {
        const std::string expected = expectedMessage(fault.kind, folder.path());
        EXPECT_EQ(fault.kind == Cut ? message.substr(0, expected.size()) : message, expected);
        // Whole records in order, and nothing that was on the disk before the run is gone.
        const std::string file = readFile(txt);
        EXPECT_TRUE(full.starts_with(file)) << file.size() << " bytes";
        EXPECT_TRUE(file.ends_with("\r\n") || file.empty());
        EXPECT_GE(point(), fault.kind < Delete ? kept : 0);
        // A finished checkpoint names a whole file.
        const auto c = readCheckpoint(ini).checkpoint;
        if (c && c->interrupted == 0 && c->candidate > c->limit) {
            EXPECT_TRUE(sameText(file, oracleResults(c->limit, enumerated)));
        }
        EXPECT_TRUE(file.starts_with(oracleResults(point(), enumerated))) << point();
    }
    // A working disk: resume what can be resumed, generate again what cannot.
    for (int attempt = 0; attempt < 2 && readFile(ini) != completeCheckpoint(kLimit); ++attempt) {
        if (point() == 0) runJob({folder.path(), kLimit, enumerated}, StopSignal{});
        if (point() > 0) {
            EXPECT_EQ(runResume(folder.path(), StopSignal{}, nullptr, {}).status,
                      ResumeResult::Status::Completed);
        }
    }
    EXPECT_TRUE(sameText(readFile(txt), full));
    EXPECT_EQ(readFile(ini), completeCheckpoint(kLimit));
}

// One row per way of failing: a write that fails at once, inside the seeds, at the end of a
// write or inside one, deep into the run; the first flush or checkpoint or a later one, once or
// for good.
void runFaultTable(bool resumed) {
    std::vector<Fault> faults{
        {WriterThrows, 0}, {WriterThrows, 30000}, {SaveThrows, 1}, {SaveThrows, 3},
        {Delete, 1},       {Replace, 1},          {Cut, 1},        {Kill, 0}};
    for (const std::uint64_t at : {0, 5, 12, 13, 33333}) faults.push_back({Write, at});
    for (const std::uint64_t at : {1, 3})
        for (const bool persistent : {false, true})
            for (const Kind kind : {Sync, Save}) faults.push_back({kind, at, persistent});
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
