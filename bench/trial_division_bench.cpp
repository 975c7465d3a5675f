// The primality tests and the factorization on the hardest numbers of the entry range:
// TestPrime2 on primes (every wheel turn runs), isPrime on the same, and FactorizeNumber on
// balanced semiprimes, prime squares and random numbers. The worst single factorization is
// reported as a counter, to hold it well below a millisecond.
#include <benchmark/benchmark.h>

#include <algorithm>
#include <chrono>
#include <random>
#include <vector>

#include "core/factorization.hpp"
#include "core/miller_rabin.hpp"
#include "core/trial_division.hpp"

namespace {

using namespace tarn;

void BM_TestPrime2(benchmark::State& state) {
    const std::int64_t n = state.range(0);
    StopSignal stop;
    for (auto _ : state) benchmark::DoNotOptimize(TestPrime2(n, stop));
}
// The largest prime of the range; a prime near 10^12; a composite with a large smallest factor.
BENCHMARK(BM_TestPrime2)
    ->Arg(922337203685123)
    ->Arg(1000000000039)
    ->Arg(29999999 * 30000001LL)
    ->Unit(benchmark::kMillisecond);

void BM_IsPrime(benchmark::State& state) {
    const auto n = static_cast<std::uint64_t>(state.range(0));
    for (auto _ : state) benchmark::DoNotOptimize(isPrime(n));
}
BENCHMARK(BM_IsPrime)->Arg(922337203685123)->Arg(922337203685277)->Arg(1000000000039);

void BM_FactorizeNumber(benchmark::State& state) {
    const std::int64_t n = state.range(0);
    StopSignal stop;
    for (auto _ : state) benchmark::DoNotOptimize(FactorizeNumber(n, stop));
}
// Products of two primes near 3e7, a prime square, and the upper bound itself.
BENCHMARK(BM_FactorizeNumber)
    ->Arg(30369991LL * 30369979LL)
    ->Arg(29999999LL * 30000001LL)
    ->Arg(30369979LL * 30369979LL)
    ->Arg(922337203685277)
    ->Unit(benchmark::kMicrosecond);

std::vector<std::int64_t> semiprimes(int count) {
    std::mt19937_64 random(5);
    std::uniform_int_distribution<std::int64_t> pick(29000000, 30300000);
    std::vector<std::int64_t> out;
    auto prime = [&] {
        std::int64_t p = pick(random) | 1;
        while (!isPrime(static_cast<std::uint64_t>(p))) p += 2;
        return p;
    };
    while (static_cast<int>(out.size()) < count) {
        const std::int64_t n = prime() * prime();
        if (n <= 922337203685277) out.push_back(n);
    }
    return out;
}

// Many balanced semiprimes in turn: the mean per number, and the slowest one as a counter.
void BM_FactorizeSemiprimes(benchmark::State& state) {
    const std::vector<std::int64_t> numbers = semiprimes(1000);
    StopSignal stop;
    double worst = 0;
    for (auto _ : state) {
        for (std::int64_t n : numbers) {
            const auto start = std::chrono::steady_clock::now();
            benchmark::DoNotOptimize(FactorizeNumber(n, stop));
            const std::chrono::duration<double, std::micro> took =
                std::chrono::steady_clock::now() - start;
            worst = std::max(worst, took.count());
        }
    }
    state.SetItemsProcessed(state.iterations() * static_cast<std::int64_t>(numbers.size()));
    state.counters["worst_us"] = worst;
}
BENCHMARK(BM_FactorizeSemiprimes)->Unit(benchmark::kMillisecond)->Iterations(3);

}  // namespace
