#include "cli/progress_line.hpp"

#include <algorithm>
#include <chrono>
#include <cstdio>

#include "cli/config.hpp"
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

ProgressLine::ProgressLine(std::function<ProgressSample()> sample) : sample_(std::move(sample)) {
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
    while (!wake_.wait_for(lock, kProgressInterval, [this] { return done_; })) {
        const ProgressSample now = sample_();
        const double share = std::clamp(now.share, 0.0, 1.0);
        const double seconds =
            std::chrono::duration<double>(std::chrono::steady_clock::now() - started).count();
        // The pace so far, over what is left; nothing to say until the work has moved.
        const std::string left = share > 0 ? clockText(seconds * (1 - share) / share) : "-:--:--";
        std::fprintf(stderr, "\r\033[K%5.1f%%  %s  %s elapsed  %s left", 100.0 * share,
                     now.counts.c_str(), clockText(seconds).c_str(), left.c_str());
        std::fflush(stderr);
    }
}

std::function<ProgressSample()> jobSample(const JobProgress& progress, std::int64_t from,
                                          std::int64_t limit) {
    return [&progress, from, limit] {
        const std::int64_t at = progress.candidate.load(std::memory_order_relaxed);
        const std::int64_t primes = progress.primeCount.load(std::memory_order_relaxed);
        const double span = static_cast<double>(limit - from);
        return ProgressSample{span > 0 ? static_cast<double>(at - from) / span : 1.0,
                              std::to_string(primes) + " primes"};
    };
}

}  // namespace tarn::cli
