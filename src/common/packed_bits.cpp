#include "common/packed_bits.h"

namespace Orvalis_NR {

namespace {

constexpr std::uint64_t lowMask(std::size_t n) { return n >= 64 ? ~std::uint64_t{0} : (std::uint64_t{1} << n) - 1; }

// `count` (1..64) bits from bit `at`; the second word is read only when the bits reach it.
inline std::uint64_t fetch(const std::uint64_t* from, std::size_t at, std::size_t count) {
    const std::size_t word = at / 64;
    const unsigned shift = static_cast<unsigned>(at % 64);
    std::uint64_t v = from[word] >> shift;
    if (shift != 0 && shift + count > 64) v |= from[word + 1] << (64 - shift);
    return v & lowMask(count);
}

template <typename T>
void packInto(const T* from, std::size_t n, std::uint64_t* to) {
    const std::size_t whole = n / 64;
    for (std::size_t w = 0; w < whole; ++w) {
        std::uint64_t v = 0;
        const T* chunk = from + 64 * w;
        for (unsigned b = 0; b < 64; ++b) v |= static_cast<std::uint64_t>(chunk[b] != 0) << b;
        to[w] = v;
    }
    if (n % 64 != 0) {
        std::uint64_t v = 0;
        for (std::size_t b = 0; b < n % 64; ++b) v |= static_cast<std::uint64_t>(from[64 * whole + b] != 0) << b;
        to[whole] = v;
    }
}

template <typename T>
void unpackFrom(const std::uint64_t* from, std::size_t fromBit, std::size_t n, T* to) {
    for (std::size_t i = 0; i < n; ++i) {
        const std::size_t at = fromBit + i;
        to[i] = static_cast<T>((from[at / 64] >> (at % 64)) & 1u);
    }
}

}  // namespace

void copyBits(std::uint64_t* to, std::size_t toBit, const std::uint64_t* from, std::size_t fromBit,
              std::size_t n) {
    if (n == 0) return;
    const std::size_t end = toBit + n;
    std::size_t at = toBit;
    // A leading part word of the destination.
    if (at % 64 != 0) {
        const std::size_t low = at % 64;
        const std::size_t count = end - at < 64 - low ? end - at : 64 - low;
        const std::uint64_t bits = fetch(from, fromBit, count);
        std::uint64_t& word = to[at / 64];
        word = (word & ~(lowMask(count) << low)) | (bits << low);
        at += count;
        fromBit += count;
    }
    // Whole destination words.
    const unsigned shift = static_cast<unsigned>(fromBit % 64);
    const std::uint64_t* source = from + fromBit / 64;
    std::uint64_t* target = to + at / 64;
    const std::size_t whole = (end - at) / 64;
    if (shift == 0) {
        for (std::size_t w = 0; w < whole; ++w) target[w] = source[w];
    } else {
        for (std::size_t w = 0; w < whole; ++w) target[w] = (source[w] >> shift) | (source[w + 1] << (64 - shift));
    }
    at += 64 * whole;
    fromBit += 64 * whole;
    // A trailing part word.
    if (at < end) {
        const std::size_t count = end - at;
        std::uint64_t& word = to[at / 64];
        word = (word & ~lowMask(count)) | fetch(from, fromBit, count);
    }
}

void flipBits(std::uint64_t* words, std::size_t begin, std::size_t end) {
    for (std::size_t at = begin; at < end;) {
        const std::size_t low = at % 64;
        const std::size_t count = end - at < 64 - low ? end - at : 64 - low;
        words[at / 64] ^= lowMask(count) << low;
        at += count;
    }
}

void clearBits(std::uint64_t* words, std::size_t begin, std::size_t end) {
    for (std::size_t at = begin; at < end;) {
        const std::size_t low = at % 64;
        const std::size_t count = end - at < 64 - low ? end - at : 64 - low;
        words[at / 64] &= ~(lowMask(count) << low);
        at += count;
    }
}

void packBits(const char* from, std::size_t n, std::uint64_t* to) { packInto(from, n, to); }
void packBits(const int* from, std::size_t n, std::uint64_t* to) { packInto(from, n, to); }

void unpackBits(const std::uint64_t* from, std::size_t fromBit, std::size_t n, char* to) {
    unpackFrom(from, fromBit, n, to);
}
void unpackBits(const std::uint64_t* from, std::size_t fromBit, std::size_t n, int* to) {
    unpackFrom(from, fromBit, n, to);
}

}  // namespace Orvalis_NR
