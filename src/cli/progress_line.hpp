// The progress line of tarn-cli's long commands (generate, resume, split) on a terminal: the
// share done, what the command counts, the elapsed time and an estimate of the time left.
#pragma once

#include <condition_variable>
#include <cstdint>
#include <functional>
#include <mutex>
#include <string>
#include <thread>

#include "generation/generation_job.hpp"

namespace tarn::cli {

// What the line shows at one moment.
struct ProgressSample {
    double share = 0;    // of the whole work, 0 to 1
    std::string counts;  // "1234 primes", "3 files"
};

// Shows the sample a few times a second on standard error while the object lives, and clears
// the line at its end; nothing at all when standard error is not a terminal.
class ProgressLine {
public:
    explicit ProgressLine(std::function<ProgressSample()> sample);
    ~ProgressLine();
    ProgressLine(const ProgressLine&) = delete;
    ProgressLine& operator=(const ProgressLine&) = delete;

private:
    void run();

    std::function<ProgressSample()> sample_;
    std::mutex mutex_;
    std::condition_variable wake_;
    bool done_ = false;
    std::thread thread_;
};

// A generation job's sample: candidates from `from` up to `limit`, and the primes written.
std::function<ProgressSample()> jobSample(const JobProgress& progress, std::int64_t from,
                                          std::int64_t limit);

}  // namespace tarn::cli
