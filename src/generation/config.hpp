// Tuning of the generation engine: sizes and timers that trade memory and flushes for speed. The
// sieve's own sizes stay with the sieve.
#pragma once

#include <chrono>
#include <cstddef>
#include <cstdint>

namespace tarn {

// How often the job flushes the results file and rewrites the checkpoint while it runs; the first
// checkpoint comes as soon as the first records are written.
inline constexpr std::chrono::milliseconds kCheckpointInterval{2000};
inline constexpr std::int64_t kSegmentTurns = 32 * 1024;  // 32 KiB of sieve: the first-level cache
inline constexpr std::int64_t kSegmentsPerChunk = 4;  // 2 to 5 MiB of records per write, at most
// Memory for the sieve and the buffers, whatever the core count.
inline constexpr std::uint64_t kSieveBudget = 56u << 20;
inline constexpr double kChunkRecordBytes = 40;  // per turn at most, from the first turns on
inline constexpr std::uint64_t kSieveThreadBytes = 2u << 20;  // a wheel sieve, blocks, stack, heap
// The results file is read in blocks of this size when a resume checks it.
inline constexpr std::size_t kResultsScanBlockBytes = std::size_t{1} << 20;

}  // namespace tarn
