// The medium primes cross off along fixed-bit progressions, which the compiler turns into tight
// store loops.
#include "generation/wheel_sieve.hpp"

#include <algorithm>

#include "core/wheel.hpp"
#include "generation/sieving_primes.hpp"

namespace tarn {
namespace {

constexpr std::array<std::uint32_t, 5> kPatternPrimes{7, 11, 13, 17, 19};
constexpr std::size_t kPatternTurns = 7 * 11 * 13 * 17 * 19;
// The next primes come from smaller patterns, one for each pair, which stay in the first-level
// cache beside the segment: a pass over the segment costs less than their progressions.
constexpr std::array<std::array<std::uint32_t, 2>, WheelSieve::kPairPatterns> kPairPrimes{
    {{23, 29}, {31, 37}, {41, 43}, {47, 53}, {59, 61}}};

// The marks of the multiples of `primes`, turn by turn from turn 0 for `turns` turns: the primes
// themselves are marked too, and unmarked where turns 0 and 1 are sieved.
template <std::size_t kCount>
std::vector<std::uint8_t> marksOf(const std::array<std::uint32_t, kCount>& primes,
                                  std::size_t turns) {
    std::vector<std::uint8_t> bytes(turns, 0);
    for (const std::uint32_t p : primes) {
        for (std::uint32_t b = 0; b < 8; ++b) {
            // Bit b of turn t is a multiple of p for every p-th turn from the first one.
            std::size_t t = 0;
            while ((kSievePeriod * t + kSieveFirst + kTurnOffsets[b]) % p != 0) ++t;
            for (; t < turns; t += p) bytes[t] |= static_cast<std::uint8_t>(1u << b);
        }
    }
    return bytes;
}

const std::vector<std::uint8_t>& pattern() {
    static const std::vector<std::uint8_t> marks = marksOf(kPatternPrimes, kPatternTurns);
    return marks;
}

const std::array<std::vector<std::uint8_t>, WheelSieve::kPairPatterns>& pairPatterns() {
    static const auto marks = [] {
        std::array<std::vector<std::uint8_t>, WheelSieve::kPairPatterns> all;
        for (std::size_t i = 0; i < WheelSieve::kPairPatterns; ++i)
            all[i] = marksOf(kPairPrimes[i], std::size_t{kPairPrimes[i][0]} * kPairPrimes[i][1]);
        return all;
    }();
    return marks;
}

// The bits of the pattern primes themselves, in turns 0 and 1 (7 lies before turn 0).
constexpr std::array<std::uint8_t, 2> kPatternPrimesInTurn = [] {
    std::array<std::uint8_t, 2> bits{};
    const auto mark = [&bits](std::uint32_t p) {
        if (p >= kSieveFirst)
            bits[(p - kSieveFirst) / kSievePeriod] |=
                kBitOfOffset[(p - kSieveFirst) % kSievePeriod];
    };
    for (const std::uint32_t p : kPatternPrimes) mark(p);
    for (const auto& pair : kPairPrimes)
        for (const std::uint32_t p : pair) mark(p);
    return bits;
}();

// ORs the pattern `marks` into `turns` bytes from its place `at`, and moves that on.
void orPattern(std::uint8_t* bytes, std::size_t turns, const std::vector<std::uint8_t>& marks,
               std::size_t& at) {
    const std::size_t length = marks.size();
    for (std::size_t done = 0; done < turns;) {
        const std::size_t run = std::min(turns - done, length - at);
        std::uint8_t* const out = bytes + done;
        const std::uint8_t* const in = marks.data() + at;
        for (std::size_t i = 0; i < run; ++i) out[i] |= in[i];
        done += run;
        at += run;
        if (at == length) at = 0;
    }
}

}  // namespace

WheelSieve::WheelSieve(std::int64_t firstTurn, std::int64_t limit) : turn_(firstTurn) {
    placePatterns();
    const std::uint64_t root = limit > 0 ? wholeSqrt(static_cast<std::uint64_t>(limit)) : 0;
    const std::vector<std::uint32_t> primes = sievingPrimes(
        kPairPrimes.back().back() + 1,
        static_cast<std::uint32_t>(std::min<std::uint64_t>(root, kMediumPrimeBound - 1)));
    const auto start = static_cast<std::uint64_t>(turnStart(firstTurn));
    for (const std::uint32_t p : primes) {
        std::uint32_t wheel = 0;
        std::uint64_t m = firstMultiple(p, start, wheel);
        if (p >= kWalkerBound) {
            walkers_.push_back(
                Walker{packPrime(p), wheel,
                       (m - kSieveFirst) / kSievePeriod - static_cast<std::uint64_t>(firstTurn)});
            continue;
        }
        Medium s{p, {}};
        // Eight consecutive multipliers cover every bit once; each repeats every p bytes.
        for (int k = 0; k < 8; ++k) {
            const std::uint64_t t = (m - kSieveFirst) / kSievePeriod;
            const int bit = __builtin_ctz(kBitOfOffset[(m - kSieveFirst) % kSievePeriod]);
            s.next[bit] = t - static_cast<std::uint64_t>(firstTurn);
            m += std::uint64_t{p} * kWheelSteps[wheel];
            wheel = (wheel + 1) & 7;
        }
        medium_.push_back(s);
    }
}

void WheelSieve::skipTo(std::int64_t turn) {
    if (turn <= turn_) return;
    const auto gap = static_cast<std::uint64_t>(turn - turn_);
    for (Medium& s : medium_) {
        // One remainder per prime: offsets below p (all of them once the prime's square is
        // behind) move back by it, modulo p.
        const std::uint64_t back = gap % s.p;
        for (std::uint64_t& next : s.next) {
            if (next >= gap)
                next -= gap;
            else if (next < s.p)
                next = next >= back ? next - back : next + s.p - back;
            else
                next = (s.p - (gap - next) % s.p) % s.p;
        }
    }
    const auto start = static_cast<std::uint64_t>(turnStart(turn));
    for (Walker& w : walkers_) {
        if (w.next >= gap) {
            w.next -= gap;
            continue;
        }
        const std::uint32_t p = (w.prime >> 3) * kSievePeriod + kWheelNumbers[w.prime & 7];
        const std::uint64_t m = firstMultiple(p, start, w.wheel);
        w.next = (m - kSieveFirst) / kSievePeriod - static_cast<std::uint64_t>(turn);
    }
    turn_ = turn;
    placePatterns();
}

void WheelSieve::placePatterns() {
    const auto turn = static_cast<std::uint64_t>(turn_);
    patternAt_ = turn % kPatternTurns;
    for (std::size_t i = 0; i < kPairPatterns; ++i)
        pairAt_[i] = turn % (std::uint64_t{kPairPrimes[i][0]} * kPairPrimes[i][1]);
}

void WheelSieve::sieveNext(std::uint8_t* bytes, std::size_t turns) {
    orPattern(bytes, turns, pattern(), patternAt_);
    const auto& pairs = pairPatterns();
    for (std::size_t i = 0; i < kPairPatterns; ++i) orPattern(bytes, turns, pairs[i], pairAt_[i]);
    for (std::int64_t t = turn_; t < 2 && t < turn_ + static_cast<std::int64_t>(turns); ++t)
        bytes[t - turn_] &=
            static_cast<std::uint8_t>(~kPatternPrimesInTurn[static_cast<std::size_t>(t)]);
    const std::uint64_t length = turns;
    for (Medium& s : medium_) {
        // The eight progressions lie within p bytes of each other, so they go on together, eight
        // stores a round and one loop end a prime, and each has one multiple left at most after
        // the last whole round.
        const std::uint64_t p = s.p;
        const auto [n0, n1, n2, n3, n4, n5, n6, n7] = s.next;
        const std::uint64_t last = std::max({n0, n1, n2, n3, n4, n5, n6, n7});
        std::uint64_t base = 0;
        for (; base + last < length; base += p) {
            std::uint8_t* const at = bytes + base;
            at[n0] |= 0x01;
            at[n1] |= 0x02;
            at[n2] |= 0x04;
            at[n3] |= 0x08;
            at[n4] |= 0x10;
            at[n5] |= 0x20;
            at[n6] |= 0x40;
            at[n7] |= 0x80;
        }
        for (int b = 0; b < 8; ++b) {
            std::uint64_t j = base + s.next[b];
            if (j < length) {
                bytes[j] |= static_cast<std::uint8_t>(1u << b);
                j += p;
            }
            s.next[b] = j - length;
        }
    }
    for (Walker& w : walkers_) {
        const std::uint64_t a = w.prime >> 3;
        const auto& bit = kCrossing.bit[w.prime & 7];
        const auto& carry = kCrossing.carry[w.prime & 7];
        std::uint64_t t = w.next;
        std::uint32_t wheel = w.wheel;
        for (; t < length; wheel = (wheel + 1) & 7) {
            bytes[t] |= bit[wheel];
            t += a * kWheelSteps[wheel] + carry[wheel];
        }
        w.next = t - length;
        w.wheel = wheel;
    }
    turn_ += static_cast<std::int64_t>(turns);
}

}  // namespace tarn
