#include "coding/gold_sequence.h"

#include <array>
#include <bit>
#include <cstdint>
#include <cstring>
#include <stdexcept>
#include <string>

namespace {

constexpr int kNc = 1600;

// Both m-sequences are held as 31-bit words, bit i being x(n + i). The recurrences
// x1(n+31) = x1(n+3) + x1(n) and x2(n+31) = x2(n+3) + x2(n+2) + x2(n+1) + x2(n) reach back at
// most 31 - 3 = 28 positions, so 28 new bits come out of one word operation.
constexpr int kStride = 28;

static_assert(std::endian::native == std::endian::little,
              "bit packing assumes little-endian bytes");

// Byte b spread to eight bytes of 0/1, bit 0 first (little-endian memory order).
constexpr std::array<std::uint64_t, 256> kSpread = [] {
    std::array<std::uint64_t, 256> t{};
    for (unsigned b = 0; b < 256; ++b)
        for (unsigned i = 0; i < 8; ++i)
            t[b] |= static_cast<std::uint64_t>((b >> i) & 1u) << (8 * i);
    return t;
}();

struct GoldRegisters {
    std::uint32_t x1 = 1;  // 1 followed by thirty zeros
    std::uint32_t x2;

    explicit GoldRegisters(int cInit) : x2(static_cast<std::uint32_t>(cInit) & 0x7FFFFFFFu) {}

    // Current output bits c(n..n+k-1), k <= 28, in bits 0..k-1.
    std::uint32_t output(int k) const { return (x1 ^ x2) & ((1u << k) - 1u); }

    void advance(int k) {
        const std::uint32_t mask = (1u << k) - 1u;
        const std::uint32_t new1 = ((x1 >> 3) ^ x1) & mask;
        const std::uint32_t new2 = ((x2 >> 3) ^ (x2 >> 2) ^ (x2 >> 1) ^ x2) & mask;
        x1 = (x1 >> k) | (new1 << (31 - k));
        x2 = (x2 >> k) | (new2 << (31 - k));
    }

    void skip(long long steps) {
        for (; steps >= kStride; steps -= kStride) advance(kStride);
        if (steps > 0) advance(static_cast<int>(steps));
    }

    // Writes `count` further output bits, one per byte; 56 at a time through the spread table.
    void emit(char* out, long long count) {
        for (; count >= 2 * kStride; count -= 2 * kStride, out += 2 * kStride) {
            std::uint64_t w = output(kStride);
            advance(kStride);
            w |= static_cast<std::uint64_t>(output(kStride)) << kStride;
            advance(kStride);
            for (int j = 0; j < 7; ++j, w >>= 8) std::memcpy(out + 8 * j, &kSpread[w & 0xFFu], 8);
        }
        while (count > 0) {
            const int k = count < kStride ? static_cast<int>(count) : kStride;
            const std::uint32_t bits = output(k);
            for (int i = 0; i < k; ++i) out[i] = static_cast<char>((bits >> i) & 1u);
            advance(k);
            out += k;
            count -= k;
        }
    }

    // Writes `count` further output bits packed 64 to a word, the first in bit 0.
    void emitWords(std::uint64_t* out, long long count) {
        std::uint64_t word = 0;
        int fill = 0;
        while (count > 0) {
            const int k = count < kStride ? static_cast<int>(count) : kStride;
            const std::uint64_t bits = output(k);
            advance(k);
            count -= k;
            word |= bits << fill;
            fill += k;
            if (fill >= 64) {
                *out++ = word;
                fill -= 64;
                word = fill > 0 ? bits >> (k - fill) : 0;
            }
        }
        if (fill > 0) *out = word;
    }
};

// The common run: `warmUp` silent steps (may be negative), then n outputs of which those at
// step index below 0 do not exist.
void runGold(char* c, long long n, int cInit, long long warmUp) {
    GoldRegisters reg(cInit);
    if (warmUp >= 0) {
        reg.skip(warmUp);
        reg.emit(c, n);
    } else {
        reg.emit(c - warmUp, n + warmUp);
    }
}

}  // namespace

void PN_Generator(BitSequence& c, int n, int cInit) {
    if (n <= 0) return;
    if (c.size() < static_cast<std::size_t>(n))
        throw std::out_of_range("PN_Generator: c holds " + std::to_string(c.size()) +
                                " elements, n is " + std::to_string(n));
    runGold(c.data(), n, cInit, kNc);
}

bool PN_Generator(BitSequence& c, int n, int cInit, int offset) {
    if (n < 0 || c.size() != static_cast<std::size_t>(n)) return false;
    const long long warmUp = static_cast<long long>(kNc) + offset;
    if (n + warmUp < 1) return true;
    runGold(c.data(), n, cInit, warmUp);
    return true;
}

void PN_GeneratorWords(std::vector<std::uint64_t>& words, int n, int cInit) {
    if (n <= 0) return;
    const std::size_t need = (static_cast<std::size_t>(n) + 63) / 64;
    if (words.size() < need)
        throw std::out_of_range("PN_GeneratorWords: words holds " + std::to_string(words.size()) +
                                " words, n is " + std::to_string(n));
    GoldRegisters reg(cInit);
    reg.skip(kNc);
    reg.emitWords(words.data(), n);
}
