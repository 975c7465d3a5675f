// Tuning of the generation engine: sizes and timers that trade memory, cache and flushes for
// speed.
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
// Primes from here on hit a segment at most once per progression: they wait in buckets.
inline constexpr std::uint32_t kMediumPrimeBound = 1u << 15;
// From here a prime hits a segment at most 32 times per progression: one walk along the wheel
// costs less than eight loops.
inline constexpr std::uint32_t kWalkerBound = 1u << 13;
// The buckets are kept by spans of about this many turns (a few chunks): a prime shorter than
// the span is visited once a span rather than once a chunk.
inline constexpr std::uint64_t kBucketSpanTurns = 1 << 18;
inline constexpr std::size_t kBucketSlabBlocks = 32;  // blocks allocated at once
// The results file is read in blocks of this size when a resume checks it.
inline constexpr std::size_t kResultsScanBlockBytes = std::size_t{1} << 20;

}  // namespace tarn
