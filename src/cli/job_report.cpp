#include "cli/job_report.hpp"

#include <CLI/CLI.hpp>
#include <cstdio>
#include <iostream>
#include <string>

#include "cli/cli_context.hpp"
#include "cli/standard_output.hpp"
#include "generation/job_texts.hpp"
#include "platform/process.hpp"

namespace tarn::cli {

namespace {

// h:mm:ss
std::string clockText(double seconds) {
    const auto whole = static_cast<long long>(std::max(0.0, seconds) + 0.5);
    char text[32];
    std::snprintf(text, sizeof text, "%lld:%02lld:%02lld", whole / 3600, whole / 60 % 60,
                  whole % 60);
    return text;
}

}  // namespace

ProgressLine::ProgressLine(const JobProgress& progress, std::int64_t from, std::int64_t limit)
    : progress_(progress), from_(from), limit_(limit) {
    if (platform::isTerminal(platform::Stream::Error)) thread_ = std::thread([this] { run(); });
}

ProgressLine::~ProgressLine() {
    if (!thread_.joinable()) return;
    {
        std::lock_guard lock(mutex_);
        done_ = true;
    }
    wake_.notify_all();
    thread_.join();
    std::fputs("\r\033[K", stderr);
}

void ProgressLine::run() {
    const auto started = std::chrono::steady_clock::now();
    std::unique_lock lock(mutex_);
    while (!wake_.wait_for(lock, std::chrono::milliseconds(250), [this] { return done_; })) {
        const std::int64_t at = progress_.candidate.load(std::memory_order_relaxed);
        const std::int64_t primes = progress_.primeCount.load(std::memory_order_relaxed);
        const double seconds =
            std::chrono::duration<double>(std::chrono::steady_clock::now() - started).count();
        const double span = static_cast<double>(limit_ - from_);
        const double done = std::max(0.0, static_cast<double>(at - from_));
        const double share = span > 0 ? std::min(1.0, done / span) : 1.0;
        const double rate = seconds > 0 ? done / seconds : 0;
        const std::string elapsed = clockText(seconds);
        // The rate so far, over what is left; nothing to say until the job has moved.
        const std::string left = rate > 0 ? clockText((span - done) / rate) : "-:--:--";
        std::fprintf(stderr, "\r\033[K%5.1f%%  %lld primes  %s elapsed  %s left", 100.0 * share,
                     static_cast<long long>(primes), elapsed.c_str(), left.c_str());
        std::fflush(stderr);
    }
}

// Prints the outcome of a job and turns it into the exit code.
int reportJob(const JobResult& result) {
    switch (result.status) {
        case JobResult::Status::Completed:
            writeStandardOutput(completionReport(result) + '\n');
            return kOk;
        case JobResult::Status::Stopped:
            std::cerr << kAllStoppedMessage << '\n';
            return kStopped;
        case JobResult::Status::Failed:
            break;
    }
    std::cerr << result.error << '\n';
    return kIoFailure;
}

void addThreadsOption(CLI::App& command, int& threads) {
    command.add_option("--threads", threads, "Sieving threads (default: one per core)")
        ->check(CLI::Range(1, 1024));
}

void addCheckpointIntervalOption(CLI::App& command, JobHooks& hooks) {
    command
        .add_option_function<int>(
            "--checkpoint-interval",
            [&hooks](int ms) { hooks.checkpointInterval = std::chrono::milliseconds(ms); })
        ->check(CLI::Range(0, 3600000))
        ->group("");
}

}  // namespace tarn::cli
