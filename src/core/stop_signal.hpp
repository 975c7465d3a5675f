// A stop request shared between the thread that asks and the worker that looks.
// The worker reads it at the same points where a long loop would otherwise hand control
// back to the window: once per wheel turn or per batch of turns.
#pragma once

#include <atomic>

namespace tarn {

class StopSignal {
public:
    void request() noexcept { flag_.store(true, std::memory_order_relaxed); }
    void clear() noexcept { flag_.store(false, std::memory_order_relaxed); }
    bool requested() const noexcept { return flag_.load(std::memory_order_relaxed); }

private:
    std::atomic<bool> flag_{false};
};

}  // namespace tarn
