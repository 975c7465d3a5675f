// What the job commands of tarn-cli share: the progress line on a terminal and the report
// of a job's outcome with its exit code.
#pragma once

#include <chrono>
#include <condition_variable>
#include <cstdint>
#include <mutex>
#include <thread>

#include "generation/generation_job.hpp"

namespace CLI {
class App;
}

namespace tarn::cli {

// A progress line on the terminal's error stream, a few times a second, while a job runs.
class ProgressLine {
public:
    ProgressLine(const JobProgress& progress, std::int64_t from, std::int64_t limit);
    ~ProgressLine();

private:
    void run();

    const JobProgress& progress_;
    const std::int64_t from_;
    const std::int64_t limit_;
    std::mutex mutex_;
    std::condition_variable wake_;
    bool done_ = false;
    std::thread thread_;
};

// Prints the outcome of a job (report on stdout, stop notice or failure on stderr) and turns
// it into the exit code.
int reportJob(const JobResult& result);

// --threads N of the job commands.
void addThreadsOption(CLI::App& command, int& threads);

// A hidden option of the job commands: the interval of the checkpoints during the job, so that
// tests can kill a job between two of them.
void addCheckpointIntervalOption(CLI::App& command, JobHooks& hooks);

}  // namespace tarn::cli
