// Numbers of up to 16 digits compared as text, for the fast path of the results scan. The 16
// bytes that end where a record's digits end, with all but the digits set to zero, form a key:
// because no digit is a zero byte and no record has a leading zero, keys order like the numbers
// they spell, whatever their lengths, when compared byte by byte from the first. With SSE2 (every
// x86-64) a key is one 16-byte register, checked for digits and compared with a few vector
// operations; elsewhere it is two 64-bit words read big-endian.
#pragma once

#include <charconv>
#include <cstddef>
#include <cstdint>
#include <cstring>

#if defined(__SSE2__) && !defined(TARN_SCAN_PORTABLE)
#define TARN_SCAN_SSE2 1
#include <emmintrin.h>
#else
#include <bit>
#endif

namespace tarn::scan {

inline constexpr std::int64_t kKeyLimit = 10'000'000'000'000'000;  // the first number of 17 digits

// Sixteen zero bytes then sixteen 0xFF: the 16 bytes from kMaskBytes + n keep the last n.
alignas(16) inline constexpr unsigned char kMaskBytes[32] = {
    0,    0,    0,    0,    0,    0,    0,    0,    0,    0,    0,    0,    0,    0,    0,    0,
    0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF};

#if TARN_SCAN_SSE2

struct Key {
    __m128i bytes;
};

inline Key loadKey(const void* p) { return {_mm_loadu_si128(static_cast<const __m128i*>(p))}; }
inline void storeKey(Key key, char* out) {
    _mm_storeu_si128(reinterpret_cast<__m128i*>(out), key.bytes);
}
// The 16 bytes before `end` (they must be readable), with those the mask drops set to zero.
inline Key keyBefore(const char* end, Key mask) {
    return {_mm_and_si128(loadKey(end - 16).bytes, mask.bytes)};
}
inline bool operator==(Key a, Key b) {
    return _mm_movemask_epi8(_mm_cmpeq_epi8(a.bytes, b.bytes)) == 0xFFFF;
}
// For keys of digits (bytes below 0x80, where the signed compares are right): the first byte
// that differs decides. Without a branch, as the outcome against the candidate is a coin toss.
inline bool operator<(Key a, Key b) {
    const unsigned less =
        static_cast<unsigned>(_mm_movemask_epi8(_mm_cmpgt_epi8(b.bytes, a.bytes)));
    const unsigned more =
        static_cast<unsigned>(_mm_movemask_epi8(_mm_cmpgt_epi8(a.bytes, b.bytes)));
    const unsigned differ = less | more;
    return (differ & (0u - differ) & less) != 0;
}
// True when every byte the mask keeps is an ASCII digit.
inline bool allDigits(Key key, Key mask) {
    const __m128i above9 =
        _mm_subs_epu8(_mm_sub_epi8(key.bytes, _mm_set1_epi8('0')), _mm_set1_epi8(9));
    const __m128i bad = _mm_and_si128(above9, mask.bytes);
    return _mm_movemask_epi8(_mm_cmpeq_epi8(bad, _mm_setzero_si128())) == 0xFFFF;
}
// Adds 1 to the last digit unless it is a 9.
inline bool bumpLastDigit(Key& key) {
    if ((_mm_extract_epi16(key.bytes, 7) >> 8) == '9') return false;
    key.bytes = _mm_add_epi8(key.bytes, _mm_slli_si128(_mm_cvtsi32_si128(1), 15));
    return true;
}

#else

struct Key {
    std::uint64_t hi = 0, lo = 0;  // the first and the last 8 bytes, read big-endian
    friend bool operator==(Key a, Key b) { return a.hi == b.hi && a.lo == b.lo; }
    friend bool operator<(Key a, Key b) { return a.hi < b.hi || (a.hi == b.hi && a.lo < b.lo); }
};

inline std::uint64_t loadBigEndian(const void* p) {
    std::uint64_t word;
    std::memcpy(&word, p, sizeof word);
    if constexpr (std::endian::native == std::endian::little) word = __builtin_bswap64(word);
    return word;
}
inline Key loadKey(const void* p) {
    return {loadBigEndian(p), loadBigEndian(static_cast<const char*>(p) + 8)};
}
inline void storeKey(Key key, char* out) {
    for (int i = 0; i < 8; ++i) {
        out[i] = static_cast<char>(key.hi >> (56 - 8 * i));
        out[8 + i] = static_cast<char>(key.lo >> (56 - 8 * i));
    }
}
inline Key keyBefore(const char* end, Key mask) {
    const Key key = loadKey(end - 16);
    return {key.hi & mask.hi, key.lo & mask.lo};
}
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
inline bool bumpLastDigit(Key& key) {
    if ((key.lo & 0xFF) == '9') return false;
    ++key.lo;
    return true;
}

#endif

// The mask that keeps the last n = 0 ... 16 bytes of a key.
inline Key keyMask(std::size_t n) { return loadKey(kMaskBytes + n); }

// The key of every byte: above any key of digits.
inline Key aboveEveryKey() {
    const char text[16] = {0x7F, 0x7F, 0x7F, 0x7F, 0x7F, 0x7F, 0x7F, 0x7F,
                           0x7F, 0x7F, 0x7F, 0x7F, 0x7F, 0x7F, 0x7F, 0x7F};
    return loadKey(text);
}

// Adds 1 to the number of `digits` digits a key spells; it must stay below kKeyLimit.
inline void increment(Key& key, int& digits) {
    if (bumpLastDigit(key)) return;  // nine times in ten
    char text[16];
    storeKey(key, text);
    int i = 15;
    for (; text[i] == '9'; --i) text[i] = '0';
    if (text[i] == 0) {
        text[i] = '1';
        ++digits;
    } else {
        ++text[i];
    }
    key = loadKey(text);
}

inline int digitCount(std::int64_t n) {
    int digits = 1;
    for (; n >= 10; n /= 10) ++digits;
    return digits;
}

// The key of 0 <= n < kKeyLimit.
inline Key keyOf(std::int64_t n) {
    char text[16] = {};
    const int digits = digitCount(n);
    std::to_chars(text + 16 - digits, text + 16, n);
    return loadKey(text);
}

inline std::int64_t valueOf(Key key) {
    char text[16];
    storeKey(key, text);
    std::int64_t value = 0;
    for (const char c : text)
        if (c != 0) value = value * 10 + (c - '0');
    return value;
}

// A bit for each '\n' among the 64 bytes from p.
inline std::uint64_t lineEnds(const char* p) {
#if TARN_SCAN_SSE2
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
