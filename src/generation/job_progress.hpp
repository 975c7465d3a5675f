// What a running generation job shows; the window reads it a few times a second.
#pragma once

#include <atomic>
#include <cstdint>

namespace tarn {

struct JobProgress {
    std::atomic<std::int64_t> candidate{0};   // start of the wheel turn in progress
    std::atomic<std::int64_t> primeCount{0};  // records written so far
};

}  // namespace tarn
