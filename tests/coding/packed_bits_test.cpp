#include "common/packed_bits.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <random>
#include <vector>

namespace {

using Orvalis_NR::clearBits;
using Orvalis_NR::copyBits;
using Orvalis_NR::flipBits;

bool bitOf(const std::vector<std::uint64_t>& w, std::size_t i) { return (w[i / 64] >> (i % 64)) & 1u; }

std::vector<std::uint64_t> randomWords(std::size_t n, std::mt19937_64& rng) {
    std::vector<std::uint64_t> w(n);
    for (auto& x : w) x = rng();
    return w;
}

struct Span {
    std::size_t to, from, n;
};

class PackedBitRuns : public ::testing::TestWithParam<Span> {};

// Copies, flips and clears against one bit at a time: every offset class within a word, runs
// shorter than a word, inside one word, across several; nothing outside the run changes and
// nothing past the source's last word is read (the source is exactly as long as it must be).
TEST_P(PackedBitRuns, ChangeTheirRunAndNothingElse) {
    const Span s = GetParam();
    std::mt19937_64 rng(s.to * 1000 + s.from * 7 + s.n);
    auto source = randomWords(Orvalis_NR::packedWords(s.from + s.n), rng);
    const auto before = randomWords(Orvalis_NR::packedWords(s.to + s.n) + 1, rng);
    auto target = before;
    copyBits(target.data(), s.to, source.data(), s.from, s.n);
    for (std::size_t i = 0; i < 64 * target.size(); ++i) {
        const bool inside = i >= s.to && i < s.to + s.n;
        ASSERT_EQ(bitOf(target, i), inside ? bitOf(source, s.from + i - s.to) : bitOf(before, i)) << "bit " << i;
    }
    auto flipped = before, cleared = before;
    flipBits(flipped.data(), s.to, s.to + s.n);
    clearBits(cleared.data(), s.to, s.to + s.n);
    for (std::size_t i = 0; i < 64 * before.size(); ++i) {
        const bool inside = i >= s.to && i < s.to + s.n;
        ASSERT_EQ(bitOf(flipped, i), inside != bitOf(before, i)) << "flip bit " << i;
        ASSERT_EQ(bitOf(cleared, i), !inside && bitOf(before, i)) << "clear bit " << i;
    }
}

INSTANTIATE_TEST_SUITE_P(Offsets, PackedBitRuns,
                         ::testing::Values(Span{0, 0, 1}, Span{0, 0, 64}, Span{0, 0, 200}, Span{5, 0, 3},
                                           Span{0, 5, 59}, Span{0, 5, 60}, Span{63, 1, 2}, Span{1, 63, 130},
                                           Span{37, 11, 500}, Span{64, 3, 128}, Span{3, 64, 61},
                                           Span{100, 250, 777}));

TEST(PackedBits, PackAndUnpackRoundTripAnyNonZeroAsOne) {
    std::vector<int> values(131);
    for (std::size_t i = 0; i < values.size(); ++i) values[i] = i % 3 == 0 ? 0 : (i % 3 == 1 ? 1 : -2);
    std::vector<std::uint64_t> words(3, ~std::uint64_t{0});
    Orvalis_NR::packBits(values.data(), values.size(), words.data());
    EXPECT_EQ(words[2] >> 3, 0u);  // cleared past the last value
    std::vector<char> back(values.size() - 9);
    Orvalis_NR::unpackBits(words.data(), 9, back.size(), back.data());
    for (std::size_t i = 0; i < back.size(); ++i) ASSERT_EQ(back[i], values[i + 9] != 0 ? 1 : 0) << i;
}

}  // namespace
