#include "coding/crc.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <map>
#include <random>
#include <string>

#include "vector_file.h"

namespace {

using nrsynth_test::randomBits;

struct PolyCase {
    CRC_LengthEnumList type;
    int length;
    std::uint32_t patternWithLeadingTerm;
};

// Patterns as printed in TS 38.212 clause 5.1, leading term included.
const PolyCase kPolys[] = {
    {CRC_24A, 24, 0x1864CFB}, {CRC_24B, 24, 0x1800063}, {CRC_24C, 24, 0x1B2B117},
    {CRC_16, 16, 0x11021},    {CRC_11, 11, 0xE21},      {CRC_6, 6, 0x61},
};

// Long division of a(D) D^L by g(D), one bit at a time, on a 64-bit remainder.
std::uint64_t referenceRemainder(const PolyCase& p, const BitSequence& bits, std::uint64_t preset) {
    std::uint64_t r = preset;
    for (char b : bits) {
        r = (r << 1) ^ (static_cast<std::uint64_t>(b != 0) << p.length);
        if (r >> p.length) r ^= p.patternWithLeadingTerm;
    }
    return r;
}

// Joined copy; written out because g++ 12 warns falsely on vector::insert of small vectors.
BitSequence concat(const BitSequence& a, const BitSequence& b) {
    BitSequence out(a.size() + b.size());
    std::copy(b.begin(), b.end(), std::copy(a.begin(), a.end(), out.begin()));
    return out;
}

std::uint64_t valueOf(const BitSequence& crc) {
    std::uint64_t v = 0;
    for (char b : crc) v = (v << 1) | static_cast<std::uint64_t>(b);
    return v;
}

class CrcPolynomial : public ::testing::TestWithParam<PolyCase> {};

// The table-driven selector, the raw register (table path from 5000 bits) and the packed
// form (preset 0) against the bit-serial division; ones stored as 0xFF bytes and bits past n must not change the check.
TEST_P(CrcPolynomial, MatchesBitSerialDivisionAndLeavesZeroAfterItsCheck) {
    const PolyCase p = GetParam();
    std::mt19937 rng(17u + static_cast<unsigned>(p.type));
    for (int n : {1, 7, 8, 9, 63, 64, 65, 71, 127, 1000, 5000, 8448}) {
        const BitSequence data = randomBits(static_cast<std::size_t>(n), rng);
        BitSequence noisy = concat(data, randomBits(5, rng));
        for (auto& b : noisy) b = static_cast<char>(b ? -1 : 0);
        for (std::uint32_t preset :
             {0u, 1u, (1u << p.length) - 1u, 3334721u & ((1u << p.length) - 1u)}) {
            const std::uint64_t expected = referenceRemainder(p, data, preset);
            BitSequence crc(static_cast<std::size_t>(p.length), 7);
            ASSERT_TRUE(NR_CRC(p.type, n, noisy, crc, static_cast<int>(preset)));
            EXPECT_EQ(valueOf(crc), expected) << "n=" << n << " preset=" << preset;
            BitSequence raw(static_cast<std::size_t>(p.length));
            CRC(p.length, static_cast<int>(p.patternWithLeadingTerm), static_cast<int>(preset), n,
                noisy.data(), raw.data());
            EXPECT_EQ(valueOf(raw), expected) << "raw n=" << n << " preset=" << preset;
        }
        // The packed form over the same bits, its words dirty past n.
        std::vector<std::uint64_t> words((static_cast<std::size_t>(n) + 63) / 64 + 1, ~std::uint64_t{0});
        for (int i = 0; i < n; ++i)
            if (!data[static_cast<std::size_t>(i)]) words[static_cast<std::size_t>(i / 64)] &= ~(std::uint64_t{1} << (i % 64));
        EXPECT_EQ(PackedCrc(p.type, words.data(), static_cast<std::size_t>(n)), referenceRemainder(p, data, 0))
            << "packed n=" << n;
        // Data followed by its own check leaves a zero remainder.
        BitSequence crc(static_cast<std::size_t>(p.length)), check(crc.size(), 1);
        ASSERT_TRUE(NR_CRC(p.type, n, data, crc));
        const BitSequence word = concat(data, crc);
        ASSERT_TRUE(NR_CRC(p.type, static_cast<int>(word.size()), word, check));
        EXPECT_EQ(valueOf(check), 0u) << "n=" << n;
    }
}

INSTANTIATE_TEST_SUITE_P(All, CrcPolynomial, ::testing::ValuesIn(kPolys), [](const auto& info) {
    return "L" + std::to_string(info.param.length) + "_" + std::to_string(info.index);
});

TEST(Crc, Refusals) {
    const BitSequence data(10, 1);
    BitSequence crc(24, 5), wrongLength(16, 5);
    EXPECT_FALSE(NR_CRC(CRC_24A, 11, data, crc));  // longer than the input
    EXPECT_FALSE(NR_CRC(CRC_24A, 10, data, wrongLength));
    EXPECT_EQ(crc, BitSequence(24, 5));
    char in[1] = {1}, out[33];
    EXPECT_THROW(CRC(33, 3, 0, 1, in, out), std::invalid_argument);  // register of 1..32 bits
}

TEST(Crc, PublishedVectors) {
    NRSYNTH_REQUIRE_SHARED();
    const std::map<std::string, CRC_LengthEnumList> selector = {
        {"CRC24A", CRC_24A}, {"CRC24B", CRC_24B}, {"CRC24C", CRC_24C},
        {"CRC16", CRC_16},   {"CRC11", CRC_11},   {"CRC6", CRC_6}};
    int checked = 0;
    for (const char* file : {"crc/sionna_crc.txt", "crc/py5gphy_crc.txt"}) {
        for (const auto& c : nrsynth_test::readVectorCases(file, [](auto&) { return 2; })) {
            ASSERT_EQ(c.lines.size(), 2u);
            const int length = std::stoi(c.header[2]);
            const long mask = std::stol(c.header[3]);
            const BitSequence input = nrsynth_test::bitsOf(c.lines[0]);
            BitSequence crc(static_cast<std::size_t>(length));
            ASSERT_TRUE(
                NR_CRC(selector.at(c.header[0]), static_cast<int>(input.size()), input, crc));
            for (int k = 0; k < length; ++k)
                crc[static_cast<std::size_t>(k)] ^=
                    static_cast<char>((mask >> (length - 1 - k)) & 1);
            EXPECT_EQ(crc, nrsynth_test::bitsOf(c.lines[1]))
                << file << " " << c.header[0] << " " << c.lines[0];
            ++checked;
        }
    }
    EXPECT_EQ(checked, 25);
}

}  // namespace
