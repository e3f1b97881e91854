#include "coding/gold_sequence.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <random>
#include <vector>

namespace {

// TS 38.211 clause 5.2.1 written out with one byte per register bit; bit 31 of cInit is unused.
BitSequence referenceGold(long long cInit, long long offset, int n) {
    const auto total = static_cast<std::size_t>(1600 + offset + n + 31);
    std::vector<char> x1(total, 0), x2(total, 0);
    x1[0] = 1;
    for (int i = 0; i < 31; ++i)
        x2[static_cast<std::size_t>(i)] = static_cast<char>((cInit >> i) & 1);
    for (std::size_t i = 0; i + 31 < total; ++i) {
        x1[i + 31] = static_cast<char>((x1[i + 3] + x1[i]) % 2);
        x2[i + 31] = static_cast<char>((x2[i + 3] + x2[i + 2] + x2[i + 1] + x2[i]) % 2);
    }
    BitSequence c(static_cast<std::size_t>(n));
    for (int i = 0; i < n; ++i) {
        const auto k = static_cast<std::size_t>(1600 + offset + i);
        c[static_cast<std::size_t>(i)] = static_cast<char>((x1[k] + x2[k]) % 2);
    }
    return c;
}

// Edge initialisations, then random ones with offsets from -1600 (the first register output)
// to well past the start; lengths around the 28-bit word boundaries.
TEST(GoldSequence, MatchesRegisterReference) {
    std::mt19937 rng(2024u);
    for (int cInit : {0, 1, 0x7FFFFFFF, static_cast<int>(0x92345678u)}) {
        for (int n : {1, 27, 28, 29, 56, 57, 63, 64, 65, 1001}) {
            BitSequence c(static_cast<std::size_t>(n), 9);
            PN_Generator(c, n, cInit);
            ASSERT_EQ(c, referenceGold(cInit, 0, n)) << "cInit=" << cInit << " n=" << n;
            // The packed form: the same bits, 64 to a word, and nothing past n.
            std::vector<std::uint64_t> words(static_cast<std::size_t>((n + 63) / 64), ~0ull);
            PN_GeneratorWords(words, n, cInit);
            for (int i = 0; i < 64 * static_cast<int>(words.size()); ++i)
                ASSERT_EQ((words[static_cast<std::size_t>(i / 64)] >> (i % 64)) & 1u,
                          i < n ? static_cast<unsigned>(c[static_cast<std::size_t>(i)]) : 0u)
                    << "cInit=" << cInit << " n=" << n << " bit " << i;
        }
    }
    for (int trial = 0; trial < 40; ++trial) {
        const int cInit = static_cast<int>(rng() & 0x7FFFFFFFu);
        const int offset = trial == 0 ? -1600 : static_cast<int>(rng() % 6600) - 1600;
        const int n = 1 + static_cast<int>(rng() % 300);
        BitSequence c(static_cast<std::size_t>(n), 9);
        ASSERT_TRUE(PN_Generator(c, n, cInit, offset));
        EXPECT_EQ(c, referenceGold(cInit, offset, n)) << "offset=" << offset;
    }
}

TEST(GoldSequence, SizeAndRangeRules) {
    BitSequence c(10, 9);
    EXPECT_FALSE(PN_Generator(c, 9, 5, 0));      // size differs from n
    EXPECT_TRUE(PN_Generator(c, 10, 5, -1611));  // n + 1600 + offset below 1: nothing to do
    EXPECT_EQ(c, BitSequence(10, 9));
    BitSequence small(3);
    EXPECT_THROW(PN_Generator(small, 4, 1), std::out_of_range);
    std::vector<std::uint64_t> word(1);
    EXPECT_THROW(PN_GeneratorWords(word, 65, 1), std::out_of_range);
}

}  // namespace
