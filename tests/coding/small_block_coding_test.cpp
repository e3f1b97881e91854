#include "coding/small_block_coding.h"

#include <gtest/gtest.h>

#include <fstream>
#include <nlohmann/json.hpp>
#include <random>
#include <string>

#include "test_support.h"
#include "vector_file.h"

namespace {

using Orvalis_NR::SmallBlockCoding;

// Table 5.3.3.3-1 as committed in data/3gpp, read here independently of the generated header.
std::vector<std::vector<int>> basisFromData() {
    std::ifstream in(nrsynth_test::sourceDir() / "data" / "3gpp" /
                     "ts38212_table_5_3_3_3_1_small_block_basis_sequences.json");
    const auto doc = nlohmann::json::parse(in);
    std::vector<std::vector<int>> rows;
    for (const auto& row : doc.at("rows")) rows.emplace_back(row.begin() + 1, row.end());
    return rows;
}

BitSequence bitsOfValue(unsigned value, int k) {
    BitSequence c(static_cast<std::size_t>(k));
    for (int i = 0; i < k; ++i)
        c[static_cast<std::size_t>(i)] = static_cast<char>((value >> i) & 1u);
    return c;
}

class SmallBlockLength : public ::testing::TestWithParam<int> {};

TEST_P(SmallBlockLength, EveryMessageEqualsTheBasisMatrixProduct) {
    const int k = GetParam();
    const auto basis = basisFromData();
    ASSERT_EQ(basis.size(), 32u);
    SmallBlockCoding code;
    ASSERT_TRUE(code.Init(k, 2));
    ASSERT_EQ(code.N, 32);
    for (unsigned value = 0; value < (1u << k); ++value) {
        BitSequence c = bitsOfValue(value, k);
        BitSequence d(32, 9);
        ASSERT_TRUE(code.Encode(c, d));
        for (int i = 0; i < 32; ++i) {
            int sum = 0;
            for (int n = 0; n < k; ++n)
                sum += c[static_cast<std::size_t>(n)] *
                       basis[static_cast<std::size_t>(i)][static_cast<std::size_t>(n)];
            ASSERT_EQ(d[static_cast<std::size_t>(i)], sum % 2)
                << "K=" << k << " value=" << value << " i=" << i;
        }
    }
}

INSTANTIATE_TEST_SUITE_P(K3to11, SmallBlockLength, ::testing::Range(3, 12));

struct RepetitionCase {
    int k;
    int qm;
    std::string pattern;  // a, b: c0, c1; s: c0 xor c1; x, y: placeholders
};

// Tables of TS 38.212 clauses 5.3.3.1 and 5.3.3.2.
const RepetitionCase kRepetitions[] = {
    {1, 1, "a"},
    {1, 2, "ay"},
    {1, 4, "ayxx"},
    {1, 6, "ayxxxx"},
    {1, 8, "ayxxxxxx"},
    {2, 1, "abs"},
    {2, 2, "absabs"},
    {2, 4, "abxxsaxxbsxx"},
    {2, 6, "abxxxxsaxxxxbsxxxx"},
    {2, 8, "abxxxxxxsaxxxxxxbsxxxxxx"},
};

TEST(SmallBlockCoding, RepetitionTablesOfOneAndTwoBits) {
    for (const auto& rc : kRepetitions) {
        for (unsigned value = 0; value < (1u << rc.k); ++value) {
            SmallBlockCoding code;
            code.Init(rc.k, rc.qm);
            ASSERT_EQ(code.N, static_cast<int>(rc.pattern.size()));
            BitSequence c = bitsOfValue(value, rc.k);
            BitSequence d(rc.pattern.size(), 9);
            ASSERT_TRUE(code.Encode(c, d));
            for (std::size_t i = 0; i < d.size(); ++i) {
                const char p = rc.pattern[i];
                const int expected = p == 'a'   ? c[0]
                                     : p == 'b' ? c[1]
                                     : p == 's' ? (c[0] ^ c[1])
                                     : p == 'x' ? -1
                                                : -2;
                EXPECT_EQ(d[i], expected) << "K=" << rc.k << " qm=" << rc.qm << " i=" << i;
            }
        }
    }
}

TEST(SmallBlockCoding, SizeChecksAndRateMatching) {
    SmallBlockCoding code;
    code.Init(11, 2);
    BitSequence c12(12), c11(11, 1), d32(32), d31(31);
    EXPECT_FALSE(code.Encode(c12, d32));
    EXPECT_FALSE(code.Encode(c11, d31));
    ASSERT_TRUE(code.Encode(c11, d32));
    BitSequence f(70, 9);
    ASSERT_TRUE(code.RateMatch(d32, f));
    for (std::size_t i = 0; i < f.size(); ++i) EXPECT_EQ(f[i], d32[i % 32]);
    BitSequence empty;
    EXPECT_TRUE(code.RateMatch(d32, empty));
    BitSequence shortD(5);
    EXPECT_THROW(code.RateMatch(shortD, f), std::out_of_range);
    code.Init(12, 2);
    BitSequence c(12);
    EXPECT_THROW(code.Encode(c, d32), std::out_of_range);
}

TEST(SmallBlockCoding, PublishedVectors) {
    NRSYNTH_REQUIRE_SHARED();
    const auto path =
        nrsynth_test::sharedDir() / "testvectors" / "smallblock" / "py5gphy_smallblock_encode.txt";
    const auto cases = nrsynth_test::readVectorCases(path.string(), [](auto&) { return 2; });
    for (const auto& tc : cases) {
        const int k = std::stoi(tc.header.at(0));
        const int qm = std::stoi(tc.header.at(1));
        SmallBlockCoding code;
        code.Init(k, qm);
        ASSERT_EQ(code.N, std::stoi(tc.header.at(2)));
        BitSequence c = nrsynth_test::bitsOf(tc.lines.at(0));
        BitSequence d(static_cast<std::size_t>(code.N));
        ASSERT_TRUE(code.Encode(c, d));
        std::string text;
        for (char b : d) text += b == -1 ? 'x' : b == -2 ? 'y' : static_cast<char>('0' + b);
        EXPECT_EQ(text, tc.lines.at(1)) << "K=" << k << " Qm=" << qm;
    }
    EXPECT_EQ(cases.size(), 19u);
}

}  // namespace
