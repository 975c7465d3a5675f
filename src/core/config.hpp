// The core's tuning: how Pollard-Brent walks.
#pragma once

namespace tarn {

// Steps per gcd and per look at the stop: a binary gcd costs as much as a few dozen products,
// and a batch that overshoots is walked again one step at a time, so neither cost shows.
inline constexpr int kPollardBatch = 128;
// Walks that run side by side: each step of one walk waits on the last, so a few independent
// walks fill the multiplier, and the first of them to find a factor ends the search sooner.
inline constexpr int kPollardWalks = 2;

}  // namespace tarn
