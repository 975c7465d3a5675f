// TestPrime2 and isPrime against a plain sieve, against each other across the whole entry
// range, on strong pseudoprimes and the top of the range, and with stop requests.
#include "core/trial_division.hpp"

#include <gtest/gtest.h>

#include <atomic>
#include <cmath>
#include <thread>
#include <vector>

#include "core/miller_rabin.hpp"
#include "support/plain_sieve.hpp"

using namespace tarn;

constexpr std::int64_t kUpper = 922337203685277;

TEST(TestPrime2, AgreesWithASieveBelowOneMillion) {
    const std::int64_t limit = 1000000;
    const std::vector<bool> prime = test::plainSieve(limit);
    StopSignal stop;
    for (std::int64_t n = 1; n < limit; ++n) {
        // 1 and the primes from 3 up pass, 2 does not.
        const int expected = (n == 1 || (n != 2 && prime[n])) ? kPrime : kComposite;
        ASSERT_EQ(TestPrime2(n, stop), expected) << "n = " << n;
        ASSERT_EQ(isPrime(n), prime[n]) << "n = " << n;
    }
}

TEST(IsPrime, AgreesWithASegmentSieveAtTheTopOfTheRange) {
    // Every number of the last 200 000 below the upper bound, sieved by the primes up to its
    // square root: a differential check where the pseudoprimes of the strong tests would live.
    const std::int64_t low = kUpper - 200000;
    const auto root = static_cast<std::size_t>(std::sqrt(static_cast<double>(kUpper))) + 1;
    const std::vector<bool> base = test::plainSieve(root);
    std::vector<bool> prime(static_cast<std::size_t>(kUpper - low + 1), true);
    for (std::size_t p = 2; p <= root; ++p) {
        if (!base[p]) continue;
        const std::int64_t pp = static_cast<std::int64_t>(p);
        for (std::int64_t m = (low + pp - 1) / pp * pp; m <= kUpper; m += pp)
            prime[static_cast<std::size_t>(m - low)] = false;
    }
    int primes = 0;
    for (std::int64_t n = low; n <= kUpper; ++n) {
        const bool expected = prime[static_cast<std::size_t>(n - low)];
        primes += expected ? 1 : 0;
        ASSERT_EQ(isPrime(n), expected) << "n = " << n;
    }
    EXPECT_GT(primes, 5000);
}

TEST(TestPrime2, StrongPseudoprimesAndTheTopOfTheRange) {
    // Beyond the sieve: strong pseudoprimes to the first several prime bases, the upper bound
    // (composite) and a prime just below it.
    StopSignal stop;
    for (const std::int64_t n :
         std::initializer_list<std::int64_t>{kUpper, 1373653, 25326001, 3215031751, 2152302898747,
                                             3474749660383, 341550071728321}) {
        EXPECT_EQ(TestPrime2(n, stop), kComposite) << n;
        EXPECT_FALSE(isPrime(n)) << n;
    }
    EXPECT_EQ(TestPrime2(922337203685123, stop), kPrime);
}

TEST(TestPrime2, StopsAtAWheelTurnOnceAsked) {
    StopSignal stop;
    stop.request();
    EXPECT_EQ(TestPrime2(97, stop), kPrime);  // decided without a turn
    EXPECT_EQ(TestPrime2(1000003, stop), kStopped);
    EXPECT_TRUE(stop.requested());
    stop.clear();
    // A prime near the upper bound keeps the wheel busy for a million turns while another
    // thread keeps asking; should a call end before the asker runs, the next one is asked.
    std::atomic<bool> done = false;
    std::thread asker([&] {
        while (!done) stop.request();
    });
    int code = kPrime;
    for (int calls = 0; calls < 20 && code == kPrime; ++calls)
        code = TestPrime2(922337203685123, stop);
    done = true;
    asker.join();
    EXPECT_EQ(code, kStopped);
    EXPECT_TRUE(stop.requested());
}
