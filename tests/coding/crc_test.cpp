#include "coding/crc.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <random>
#include <string>

#include "test_support.h"
#include "vector_file.h"

namespace {

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

BitSequence randomBits(std::mt19937& rng, int n) {
    BitSequence bits(static_cast<std::size_t>(n));
    for (auto& b : bits) b = static_cast<char>(rng() & 1u);
    return bits;
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

TEST_P(CrcPolynomial, MatchesBitSerialDivisionForManyLengthsAndPresets) {
    const PolyCase p = GetParam();
    std::mt19937 rng(17u + static_cast<unsigned>(p.type));
    for (int n : {1, 2, 7, 8, 9, 15, 16, 17, 63, 64, 65, 100, 1000, 8448}) {
        const BitSequence data = randomBits(rng, n);
        for (std::uint32_t preset :
             {0u, 1u, (1u << p.length) - 1u, 3334721u & ((1u << p.length) - 1u)}) {
            BitSequence crc(static_cast<std::size_t>(p.length), 7);
            ASSERT_TRUE(NR_CRC(p.type, n, data, crc, static_cast<int>(preset)));
            EXPECT_EQ(valueOf(crc), referenceRemainder(p, data, preset))
                << "n=" << n << " preset=" << preset;
        }
    }
}

TEST_P(CrcPolynomial, DataFollowedByItsCheckLeavesZero) {
    const PolyCase p = GetParam();
    std::mt19937 rng(99u + static_cast<unsigned>(p.type));
    for (int n : {1, 5, 24, 31, 120, 3825}) {
        BitSequence data = randomBits(rng, n);
        BitSequence crc(static_cast<std::size_t>(p.length));
        ASSERT_TRUE(NR_CRC(p.type, n, data, crc));
        data = concat(data, crc);
        BitSequence check(static_cast<std::size_t>(p.length), 1);
        ASSERT_TRUE(NR_CRC(p.type, static_cast<int>(data.size()), data, check));
        EXPECT_EQ(valueOf(check), 0u) << "n=" << n;
    }
}

TEST_P(CrcPolynomial, RawRegisterAgreesWithSelector) {
    const PolyCase p = GetParam();
    std::mt19937 rng(5u);
    for (int n : {3, 64, 5000}) {  // 5000 takes the table path of the raw form
        BitSequence data = randomBits(rng, n);
        BitSequence viaSelector(static_cast<std::size_t>(p.length));
        ASSERT_TRUE(NR_CRC(p.type, n, data, viaSelector, 12345));
        BitSequence raw(static_cast<std::size_t>(p.length));
        // The leading term is masked off by the raw form.
        CRC(p.length, static_cast<int>(p.patternWithLeadingTerm), 12345, n, data.data(),
            raw.data());
        EXPECT_EQ(raw, viaSelector) << "n=" << n;
    }
}

INSTANTIATE_TEST_SUITE_P(All, CrcPolynomial, ::testing::ValuesIn(kPolys), [](const auto& info) {
    return "L" + std::to_string(info.param.length) + "_" + std::to_string(info.index);
});

BitSequence asciiBits(const std::string& text) {
    BitSequence bits;
    for (unsigned char ch : text)
        for (int k = 7; k >= 0; --k) bits.push_back(static_cast<char>((ch >> k) & 1));
    return bits;
}

TEST(Crc, PublishedCheckValuesOfTheCcittPolynomial) {
    // CRC-16/XMODEM (preset 0) and CRC-16/CCITT-FALSE (preset 0xFFFF) of "123456789".
    const BitSequence bits = asciiBits("123456789");
    BitSequence crc(16);
    ASSERT_TRUE(NR_CRC(CRC_16, static_cast<int>(bits.size()), bits, crc));
    EXPECT_EQ(valueOf(crc), 0x31C3u);
    ASSERT_TRUE(NR_CRC(CRC_16, static_cast<int>(bits.size()), bits, crc, 0xFFFF));
    EXPECT_EQ(valueOf(crc), 0x29B1u);
}

TEST(Crc, DciPresetEqualsTwentyFourLeadingOnes) {
    std::mt19937 rng(3u);
    const BitSequence dci = randomBits(rng, 39);
    const BitSequence withOnes = concat(BitSequence(24, 1), dci);
    BitSequence a(24), b(24);
    ASSERT_TRUE(NR_CRC(CRC_24C, 39, dci, a, 3334721));
    ASSERT_TRUE(NR_CRC(CRC_24C, 63, withOnes, b));
    EXPECT_EQ(a, b);
}

TEST(Crc, RefusalsLeaveTheCheckUntouched) {
    const BitSequence data(10, 1);
    BitSequence crc(24, 5);
    EXPECT_FALSE(NR_CRC(CRC_24A, 0, data, crc));
    EXPECT_FALSE(NR_CRC(CRC_24A, -3, data, crc));
    EXPECT_FALSE(NR_CRC(CRC_24A, 11, data, crc));  // longer than the input
    BitSequence wrongLength(16, 5);
    EXPECT_FALSE(NR_CRC(CRC_24A, 10, data, wrongLength));
    EXPECT_EQ(crc, BitSequence(24, 5));
    EXPECT_EQ(wrongLength, BitSequence(16, 5));
}

TEST(Crc, OnlyTheFirstNBitsCountAndAnyNonZeroByteIsAOne) {
    std::mt19937 rng(8u);
    BitSequence data = randomBits(rng, 40);
    BitSequence expected(11);
    ASSERT_TRUE(NR_CRC(CRC_11, 30, BitSequence(data.begin(), data.begin() + 30), expected));
    BitSequence noisy = data;
    for (int i = 30; i < 40; ++i) noisy[static_cast<std::size_t>(i)] ^= 1;  // tail differs
    for (auto& b : noisy)
        if (b) b = static_cast<char>(-1);  // 0xFF bytes count as ones
    BitSequence crc(11);
    ASSERT_TRUE(NR_CRC(CRC_11, 30, noisy, crc));
    EXPECT_EQ(crc, expected);
}

TEST(Crc, UnknownSelectorActsAsCrc24A) {
    std::mt19937 rng(4u);
    const BitSequence data = randomBits(rng, 77);
    BitSequence a(24), unknown(24), negative(24);
    ASSERT_TRUE(NR_CRC(CRC_24A, 77, data, a));
    ASSERT_TRUE(NR_CRC(static_cast<CRC_LengthEnumList>(9), 77, data, unknown));
    ASSERT_TRUE(NR_CRC(static_cast<CRC_LengthEnumList>(-1), 77, data, negative));
    EXPECT_EQ(unknown, a);
    EXPECT_EQ(negative, a);
    EXPECT_EQ(CrcLength(static_cast<CRC_LengthEnumList>(9)), 24);
}

TEST(Crc, RawRegisterRejectsImpossibleLengths) {
    char in[1] = {1};
    char out[33];
    EXPECT_THROW(CRC(0, 3, 0, 1, in, out), std::invalid_argument);
    EXPECT_THROW(CRC(33, 3, 0, 1, in, out), std::invalid_argument);
    EXPECT_THROW(CRC(8, 3, 0, 1, nullptr, out), std::invalid_argument);
    CRC(8, 0x107, 0xA5, 0, nullptr, out);  // no input: the preset comes out
    EXPECT_EQ(valueOf(BitSequence(out, out + 8)), 0xA5u);
}

CRC_LengthEnumList selectorNamed(const std::string& name) {
    if (name == "CRC24A") return CRC_24A;
    if (name == "CRC24B") return CRC_24B;
    if (name == "CRC24C") return CRC_24C;
    if (name == "CRC16") return CRC_16;
    if (name == "CRC11") return CRC_11;
    return CRC_6;
}

TEST(Crc, PublishedVectors) {
    NRSYNTH_REQUIRE_SHARED();
    int checked = 0;
    for (const char* file : {"sionna_crc.txt", "py5gphy_crc.txt"}) {
        const auto path = nrsynth_test::sharedDir() / "testvectors" / "crc" / file;
        for (const auto& c :
             nrsynth_test::readVectorCases(path.string(), [](auto&) { return 2; })) {
            ASSERT_EQ(c.header.size(), 4u);
            ASSERT_EQ(c.lines.size(), 2u);
            const int length = std::stoi(c.header[2]);
            const long mask = std::stol(c.header[3]);
            const BitSequence input = nrsynth_test::bitsOf(c.lines[0]);
            BitSequence crc(static_cast<std::size_t>(length));
            ASSERT_TRUE(
                NR_CRC(selectorNamed(c.header[0]), static_cast<int>(input.size()), input, crc));
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
