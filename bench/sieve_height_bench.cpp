// The generation sieve alone, on one thread, at 10^12, 10^14 and the top of the range: 64 chunks
// of 2^17 turns (about 250 million numbers) crossed off by the bucket sieve and the wheel sieve
// as a sieving thread does it, without the formatting and the writes. The buckets are filled
// before the clock starts.
#include <benchmark/benchmark.h>

#include <algorithm>
#include <cstdint>
#include <optional>
#include <vector>

#include "core/wheel.hpp"
#include "generation/bucket_sieve.hpp"
#include "generation/wheel_sieve.hpp"

namespace {

using namespace tarn;

constexpr std::int64_t kChunkTurns = 1 << 17;
constexpr std::int64_t kSegmentTurns = 1 << 15;
constexpr std::int64_t kChunks = 64;

void BM_SieveAtHeight(benchmark::State& state) {
    const std::int64_t height = state.range(0);
    const std::int64_t first = turnIndex(height - (height - kFirstTurnStart) % kWheelPeriod);
    const std::int64_t end = first + kChunks * kChunkTurns;
    const std::int64_t limit = std::min<std::int64_t>(turnStart(end), 922337203685277);
    std::vector<std::uint8_t> sieved(kChunkTurns);
    std::uint64_t composites = 0;
    for (auto _ : state) {
        state.PauseTiming();
        std::optional<BucketSieve> large(std::in_place, first, end, limit, kChunkTurns, 1);
        WheelSieve sieve(first, limit);
        state.ResumeTiming();
        for (std::int64_t chunk = 0; chunk < kChunks; ++chunk) {
            std::fill(sieved.begin(), sieved.end(), 0);
            if (large->groups() > 0) large->crossOffNext(0, sieved.data(), kChunkTurns);
            for (std::int64_t t = 0; t < kChunkTurns; t += kSegmentTurns)
                sieve.sieveNext(sieved.data() + t, kSegmentTurns);
            composites += sieved[kChunkTurns / 2];
        }
        state.PauseTiming();
        large.reset();
        state.ResumeTiming();
    }
    benchmark::DoNotOptimize(composites);
}
BENCHMARK(BM_SieveAtHeight)
    ->Arg(1000000000000)
    ->Arg(100000000000000)
    ->Arg(922337203685277 - 250000000)
    ->Iterations(1)
    ->Repetitions(7)
    ->ComputeStatistics("min",
                        [](const std::vector<double>& v) {
                            return *std::min_element(v.begin(), v.end());
                        })
    ->ReportAggregatesOnly(true)
    ->Unit(benchmark::kMillisecond);

}  // namespace
