// The segmented wheel sieve. Small primes cross off along fixed-bit progressions, which the
// compiler turns into tight store loops; large ones keep their next multiple and wheel position.
#include "generation/wheel_sieve.hpp"

#include <algorithm>
#include <cmath>
#include <cstring>

namespace tarn {
namespace {

constexpr auto kPeriod = static_cast<std::uint64_t>(kWheelPeriod);
constexpr auto kFirst = static_cast<std::uint64_t>(kFirstTurnStart);

// Numbers prime to 30 in one period, and the steps from one to the next.
constexpr std::array<std::uint32_t, 8> kWheel{1, 7, 11, 13, 17, 19, 23, 29};
constexpr std::array<std::uint32_t, 8> kWheelStep{6, 4, 2, 4, 2, 4, 6, 2};

// The segment length the generation sieves in (32 Ki turns, the first-level cache). Primes below
// it hit every segment on each of their eight progressions of step p bytes, so they keep those
// progressions; larger ones hit a segment a few times at most and walk their multiples instead.
constexpr std::uint32_t kSmallBound = 1u << 15;

// Bit of a number m prime to 30 inside its turn, by (m - 11) mod 30 (= (m + 19) mod 30).
constexpr std::array<std::uint8_t, kPeriod> bitTable() {
    std::array<std::uint8_t, kPeriod> table{};
    for (std::uint32_t b = 0; b < kTurnOffsets.size(); ++b)
        table[kTurnOffsets[b]] = static_cast<std::uint8_t>(1u << b);
    return table;
}
constexpr std::array<std::uint8_t, kPeriod> kBitOf = bitTable();

// The smallest multiplier q >= from that is prime to 30, and its wheel position.
std::uint64_t nextWheelNumber(std::uint64_t from, std::uint32_t& wheel) {
    for (;; ++from) {
        const auto r = static_cast<std::uint32_t>(from % kPeriod);
        for (std::uint32_t i = 0; i < 8; ++i) {
            if (kWheel[i] == r) {
                wheel = i;
                return from;
            }
        }
    }
}

// The whole part of the square root, exact for every 64-bit value.
std::uint64_t wholeSqrt(std::uint64_t n) {
    auto r = static_cast<std::uint64_t>(std::sqrt(static_cast<double>(n)));
    while (r * r > n) --r;
    while ((r + 1) * (r + 1) <= n) ++r;
    return r;
}

// The odd primes from 7 up to `bound`, by a plain sieve of odd numbers.
std::vector<std::uint32_t> sievingPrimes(std::uint32_t bound) {
    std::vector<std::uint32_t> primes;
    if (bound < 7) return primes;
    // Index i stands for 2i + 1; one bit each keeps this under 2 MB at the top of the range.
    std::vector<bool> composite(bound / 2 + 1, false);
    for (std::uint64_t i = 1; (2 * i + 1) * (2 * i + 1) <= bound; ++i) {
        if (composite[i]) continue;
        const std::uint64_t p = 2 * i + 1;
        for (std::uint64_t j = p * p / 2; j < composite.size(); j += p) composite[j] = true;
    }
    // pi(x) < 1.26 x / ln x for every x > 1, so one allocation holds them all; below 100 the
    // estimate is loose and 25 primes fit anyway.
    primes.reserve(bound < 100 ? 32 : static_cast<std::size_t>(1.3 * bound / std::log(bound)));
    for (std::uint64_t i = 3; 2 * i + 1 <= bound; ++i)
        if (!composite[i]) primes.push_back(static_cast<std::uint32_t>(2 * i + 1));
    return primes;
}

}  // namespace

WheelSieve::WheelSieve(std::int64_t firstTurn, std::int64_t limit) : turn_(firstTurn) {
    const std::uint64_t root = limit > 0 ? wholeSqrt(static_cast<std::uint64_t>(limit)) : 0;
    const std::vector<std::uint32_t> primes = sievingPrimes(static_cast<std::uint32_t>(root));
    const auto start = static_cast<std::uint64_t>(turnStart(firstTurn));
    large_.reserve(static_cast<std::size_t>(std::count_if(
        primes.begin(), primes.end(), [](std::uint32_t p) { return p >= kSmallBound; })));
    for (const std::uint32_t p : primes) {
        // The first multiple to cross off: p * q with q prime to 30, q >= p and p * q >= start.
        const std::uint64_t lowest = std::max<std::uint64_t>(p, (start + p - 1) / p);
        std::uint32_t wheel = 0;
        std::uint64_t q = nextWheelNumber(lowest, wheel);
        if (p < kSmallBound) {
            Small s{p, {}};
            // Eight consecutive multipliers cover every bit once; each repeats every p bytes.
            for (int k = 0; k < 8; ++k) {
                const std::uint64_t m = p * q;
                const std::uint64_t t = (m - kFirst) / kPeriod;
                const int bit = __builtin_ctz(kBitOf[(m - kFirst) % kPeriod]);
                s.next[bit] = t - static_cast<std::uint64_t>(firstTurn);
                q += kWheelStep[wheel];
                wheel = (wheel + 1) & 7;
            }
            small_.push_back(s);
        } else {
            large_.push_back(Large{p * q, p, wheel});
        }
    }
}

void WheelSieve::skipTo(std::int64_t turn) {
    if (turn <= turn_) return;
    const auto gap = static_cast<std::uint64_t>(turn - turn_);
    for (Small& s : small_) {
        for (std::uint64_t& next : s.next)
            next = next >= gap ? next - gap : (s.p - (gap - next) % s.p) % s.p;
    }
    const auto start = static_cast<std::uint64_t>(turnStart(turn));
    for (Large& l : large_) {
        if (l.multiple >= start) continue;
        std::uint32_t wheel = 0;
        const std::uint64_t q =
            nextWheelNumber(std::max<std::uint64_t>(l.p, (start + l.p - 1) / l.p), wheel);
        l.multiple = l.p * q;
        l.wheel = wheel;
    }
    turn_ = turn;
}

void WheelSieve::sieveNext(std::uint8_t* bytes, std::size_t turns) {
    std::memset(bytes, 0, turns);
    const std::uint64_t length = turns;
    for (Small& s : small_) {
        const std::uint64_t p = s.p;
        for (int b = 0; b < 8; ++b) {
            std::uint64_t j = s.next[b];
            const auto mask = static_cast<std::uint8_t>(1u << b);
            for (; j < length; j += p) bytes[j] |= mask;
            s.next[b] = j - length;
        }
    }
    const auto first = static_cast<std::uint64_t>(turn_);
    const std::uint64_t end =
        static_cast<std::uint64_t>(turnStart(turn_ + static_cast<std::int64_t>(turns)));
    for (Large& l : large_) {
        std::uint64_t m = l.multiple;
        if (m >= end) continue;
        std::uint32_t wheel = l.wheel;
        const std::uint64_t p = l.p;
        do {
            const std::uint64_t shifted = m - kFirst;
            bytes[shifted / kPeriod - first] |= kBitOf[shifted % kPeriod];
            m += p * kWheelStep[wheel];
            wheel = (wheel + 1) & 7;
        } while (m < end);
        l.multiple = m;
        l.wheel = wheel;
    }
    turn_ += static_cast<std::int64_t>(turns);
}

}  // namespace tarn
