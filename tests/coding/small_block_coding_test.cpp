#include "coding/small_block_coding.h"

#include <gtest/gtest.h>

#include <string>

#include "vector_file.h"

namespace {

using Orvalis_NR::SmallBlockCoding;

BitSequence bitsOfValue(unsigned value, int k) {
    BitSequence c(static_cast<std::size_t>(k));
    for (int i = 0; i < k; ++i)
        c[static_cast<std::size_t>(i)] = static_cast<char>((value >> i) & 1u);
    return c;
}

class SmallBlockLength : public ::testing::TestWithParam<int> {};

// Table 5.3.3.3-1 as committed in data/3gpp, read here independently of the generated header.
TEST_P(SmallBlockLength, EveryMessageEqualsTheBasisMatrixProduct) {
    const int k = GetParam();
    const auto basis =  // rows [i, M_i,0 .. M_i,10]
        nrsynth_test::dataTable("ts38212_table_5_3_3_3_1_small_block_basis_sequences.json")
            .at("rows");
    ASSERT_EQ(basis.size(), 32u);
    SmallBlockCoding code;
    ASSERT_TRUE(code.Init(k, 2));
    ASSERT_EQ(code.N, 32);
    for (unsigned value = 0; value < (1u << k); ++value) {
        BitSequence c = bitsOfValue(value, k);
        BitSequence d(32, 9);
        ASSERT_TRUE(code.Encode(c, d));
        for (std::size_t i = 0; i < 32; ++i) {
            int sum = 0;
            for (std::size_t n = 0; n < c.size(); ++n) sum += c[n] * basis[i][n + 1].get<int>();
            ASSERT_EQ(d[i], sum % 2) << "K=" << k << " value=" << value << " i=" << i;
        }
    }
}

INSTANTIATE_TEST_SUITE_P(K3to11, SmallBlockLength, ::testing::Range(3, 12));

// Tables of TS 38.212 clauses 5.3.3.1 and 5.3.3.2 for Qm 1, 2, 4, 6, 8. a, b: c0, c1;
// s: c0 xor c1; x, y: the placeholders -1 and -2.
TEST(SmallBlockCoding, RepetitionTablesOfOneAndTwoBits) {
    for (std::string pattern : {"a", "ay", "ayxx", "ayxxxx", "ayxxxxxx", "abs", "absabs",
                                "abxxsaxxbsxx", "abxxxxsaxxxxbsxxxx", "abxxxxxxsaxxxxxxbsxxxxxx"}) {
        const int k = pattern.find('b') == std::string::npos ? 1 : 2;
        const int qm = static_cast<int>(pattern.size()) / (2 * k - 1);  // N is Qm or 3 Qm
        SmallBlockCoding code;
        code.Init(k, qm);
        ASSERT_EQ(code.N, static_cast<int>(pattern.size()));
        for (unsigned value = 0; value < (1u << k); ++value) {
            BitSequence c = bitsOfValue(value, k), d(pattern.size(), 9), expected;
            ASSERT_TRUE(code.Encode(c, d));
            for (char p : pattern)
                expected.push_back(p == 'a'   ? c[0]
                                   : p == 'b' ? c[1]
                                   : p == 's' ? c[0] ^ c[1]
                                   : p == 'x' ? -1
                                              : -2);
            EXPECT_EQ(d, expected) << "Qm=" << qm << " " << pattern << " value=" << value;
        }
    }
}

TEST(SmallBlockCoding, RateMatchingRepeatsAndSizesAreChecked) {
    SmallBlockCoding code;
    code.Init(11, 2);
    BitSequence c11(11, 1), c12(12), d32(32), d31(31);
    EXPECT_FALSE(code.Encode(c11, d31));
    ASSERT_TRUE(code.Encode(c11, d32));
    BitSequence f(70, 9);
    ASSERT_TRUE(code.RateMatch(d32, f));
    for (std::size_t i = 0; i < f.size(); ++i) EXPECT_EQ(f[i], d32[i % 32]);
    EXPECT_THROW(code.RateMatch(d31, f), std::out_of_range);
    code.Init(12, 2);
    EXPECT_THROW(code.Encode(c12, d32), std::out_of_range);
}

TEST(SmallBlockCoding, PublishedVectors) {
    NRSYNTH_REQUIRE_SHARED();
    const auto cases = nrsynth_test::readVectorCases("smallblock/py5gphy_smallblock_encode.txt",
                                                     [](auto&) { return 2; });
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
