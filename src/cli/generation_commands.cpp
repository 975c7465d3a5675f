// The generation commands of tarn-cli: `generate LIMIT [--enumerate]` writes every prime up to
// LIMIT into primes.txt of the folder and the checkpoint into primes.ini, with the same entry
// rule, minimum, messages and stop path as the window.
#include <unistd.h>

#include <CLI/CLI.hpp>
#include <chrono>
#include <condition_variable>
#include <cstdio>
#include <iostream>
#include <mutex>
#include <thread>

#include "cli/cli_context.hpp"
#include "core/entry.hpp"
#include "generation/generation_job.hpp"
#include "generation/job_texts.hpp"

namespace tarn::cli {
namespace {

// A progress line on the terminal's error stream, a few times a second, while a job runs.
class ProgressLine {
public:
    ProgressLine(const JobProgress& progress, std::int64_t from, std::int64_t limit)
        : progress_(progress), from_(from), limit_(limit) {
        if (::isatty(2)) thread_ = std::thread([this] { run(); });
    }
    ~ProgressLine() {
        if (!thread_.joinable()) return;
        {
            std::lock_guard lock(mutex_);
            done_ = true;
        }
        wake_.notify_all();
        thread_.join();
        std::fputs("\r\033[K", stderr);
    }

private:
    void run() {
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
            const double left = rate > 0 ? (span - done) / rate : 0;
            std::fprintf(stderr, "\r\033[K%5.1f%%  %lld primes  %.3g numbers/s  %.0f s left",
                         100.0 * share, static_cast<long long>(primes), rate, left);
            std::fflush(stderr);
        }
    }

    const JobProgress& progress_;
    const std::int64_t from_;
    const std::int64_t limit_;
    std::mutex mutex_;
    std::condition_variable wake_;
    bool done_ = false;
    std::thread thread_;
};

// Prints the outcome of a job and turns it into the exit code.
int reportJob(const JobResult& result) {
    switch (result.status) {
        case JobResult::Status::Completed:
            std::cout << completionReport(result) << '\n';
            return kOk;
        case JobResult::Status::Stopped:
            std::cerr << kStoppedMessage << '\n';
            return kStopped;
        case JobResult::Status::Failed:
            break;
    }
    std::cerr << result.error << '\n';
    return kIoFailure;
}

}  // namespace

void registerGenerationCommands(CLI::App& app, Context& ctx) {
    struct Options {
        std::string limit;
        bool enumerate = false;
        bool noSync = false;
    };
    auto options = std::make_shared<Options>();

    CLI::App* generate = app.add_subcommand(
        "generate", "Write every prime up to LIMIT into primes.txt and the checkpoint primes.ini");
    generate->add_option("LIMIT", options->limit, "Largest number to test (at least 100)")
        ->required();
    generate->add_flag("--enumerate", options->enumerate,
                       "Write records as serial number;prime (5;11)");
    // Measurements only: leaves out the periodic flush to the disk and its checkpoints.
    generate->add_flag("--no-sync", options->noSync)->group("");
    generate->callback([&ctx, options] {
        const EntryResult entry = ReadNumberEntry(options->limit);
        if (!entry.accepted()) {
            std::cerr << entry.message << '\n';
            ctx.exitCode = kRefused;
            return;
        }
        if (const auto refusal = checkGenerationMinimum(*entry.number)) {
            std::cerr << *refusal << '\n';
            ctx.exitCode = kRefused;
            return;
        }
        JobSpec spec;
        spec.folder = ctx.folder;
        spec.limit = entry.number->whole();
        spec.enumerated = options->enumerate;
        JobHooks hooks;
        hooks.durable = !options->noSync;
        JobProgress progress;
        ctx.stop.clear();
        JobResult result;
        {
            ProgressLine line(progress, 11, spec.limit);
            result = runJob(spec, ctx.stop, &progress, hooks);
        }
        ctx.exitCode = reportJob(result);
    });
}

}  // namespace tarn::cli
