// The windows' tuning: how often a job's progress is shown, the worker threads, the progress
// bar's resolution.
#pragma once

#include <chrono>

namespace tarn::ui {

// The progress of a running job is drawn four times a second.
inline constexpr std::chrono::milliseconds kProgressInterval{250};
// A job, a test and a split may all run at once; the job's own sieving threads come on top.
inline constexpr int kWorkerThreads = 6;
// The bar's own range is an int; the job's range is scaled onto it.
inline constexpr int kBarSteps = 1'000'000;
// How often the main thread looks whether a termination signal has come.
inline constexpr std::chrono::milliseconds kSignalPollInterval{100};

}  // namespace tarn::ui
