// Numbers of up to 16 digits compared as text, for the fast path of the results scan. The digits
// of a record, right-aligned in 16 bytes with zero bytes in front and read big-endian as two
// 64-bit words, form a key; because a digit is never a zero byte and records have no leading
// zero, keys order like the numbers they spell, whatever their lengths. Reading a key costs two
// loads and two byte swaps, and checking it holds only digits a few word operations.
#pragma once

#include <array>
#include <bit>
#include <charconv>
#include <cstdint>
#include <cstring>

#if defined(__SSE2__)
#include <emmintrin.h>
#endif

namespace tarn::scan {

struct Key {
    std::uint64_t hi = 0, lo = 0;
    friend bool operator==(Key a, Key b) { return a.hi == b.hi && a.lo == b.lo; }
    friend bool operator<(Key a, Key b) { return a.hi < b.hi || (a.hi == b.hi && a.lo < b.lo); }
};

inline constexpr std::int64_t kKeyLimit = 10'000'000'000'000'000;  // 10^16: 17 digits
inline constexpr Key kAboveEveryKey{~std::uint64_t{0}, ~std::uint64_t{0}};

// The bytes a key of n digits keeps, n = 0 ... 16.
inline constexpr auto kKeyMasks = [] {
    std::array<Key, 17> masks{};
    for (int n = 0; n <= 16; ++n) {
        const auto low = [](int bytes) {
            return bytes >= 8 ? ~std::uint64_t{0} : (std::uint64_t{1} << (8 * bytes)) - 1;
        };
        masks[n] = {n > 8 ? low(n - 8) : 0, low(n)};
    }
    return masks;
}();

inline std::uint64_t loadBigEndian(const char* p) {
    std::uint64_t word;
    std::memcpy(&word, p, sizeof word);
    if constexpr (std::endian::native == std::endian::little) word = __builtin_bswap64(word);
    return word;
}

// The `mask` bytes before `end` (mask from kKeyMasks); the 16 bytes before `end` must be readable.
inline Key keyBefore(const char* end, Key mask) {
    return {loadBigEndian(end - 16) & mask.hi, loadBigEndian(end - 8) & mask.lo};
}

// True when every byte the mask keeps is an ASCII digit.
inline bool allDigits(Key key, Key mask) {
    constexpr std::uint64_t kZeros = 0x3030303030303030, kHigh = 0xF0F0F0F0F0F0F0F0;
    constexpr std::uint64_t kSixes = 0x0606060606060606;
    // A digit is 0x3N with N <= 9: its high half is 3, also after adding 6. A carry out of a
    // byte only comes from a byte that already fails the first test.
    const auto bad = [](std::uint64_t w) {
        return ((w & kHigh) ^ kZeros) | (((w + kSixes) & kHigh) ^ kZeros);
    };
    return (bad(key.hi | (kZeros & ~mask.hi)) | bad(key.lo | (kZeros & ~mask.lo))) == 0;
}

inline int digitCount(std::int64_t n) {
    int digits = 1;
    for (; n >= 10; n /= 10) ++digits;
    return digits;
}

// The key of 0 <= n < kKeyLimit.
inline Key keyOf(std::int64_t n) {
    char text[32] = {};
    const int digits = digitCount(n);
    std::to_chars(text + 32 - digits, text + 32, n);
    return keyBefore(text + 32, kKeyMasks[digits]);
}

inline std::int64_t valueOf(Key key) {
    std::int64_t value = 0;
    for (const std::uint64_t word : {key.hi, key.lo})
        for (int shift = 56; shift >= 0; shift -= 8)
            if (const auto byte = static_cast<int>((word >> shift) & 0xFF))
                value = value * 10 + (byte - '0');
    return value;
}

// A bit for each '\n' among the 64 bytes from p.
inline std::uint64_t lineEnds(const char* p) {
#if defined(__SSE2__)
    const __m128i newline = _mm_set1_epi8('\n');
    std::uint64_t bits = 0;
    for (int i = 0; i < 4; ++i) {
        const __m128i bytes = _mm_loadu_si128(reinterpret_cast<const __m128i*>(p + 16 * i));
        const auto found =
            static_cast<std::uint32_t>(_mm_movemask_epi8(_mm_cmpeq_epi8(bytes, newline)));
        bits |= std::uint64_t{found} << (16 * i);
    }
    return bits;
#else
    std::uint64_t bits = 0;
    for (int i = 0; i < 64; ++i) bits |= std::uint64_t{p[i] == '\n'} << i;
    return bits;
#endif
}

}  // namespace tarn::scan
