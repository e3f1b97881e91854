#include "coding/gold_sequence.h"

#include <gtest/gtest.h>

#include <fstream>
#include <random>
#include <sstream>
#include <string>

#include "test_support.h"

namespace {

// TS 38.211 clause 5.2.1 written out with one byte per register bit.
BitSequence referenceGold(long long cInit, long long offset, int n) {
    const long long total = 1600 + offset + n + 31;
    std::vector<char> x1(static_cast<std::size_t>(total), 0),
        x2(static_cast<std::size_t>(total), 0);
    x1[0] = 1;
    for (int i = 0; i < 31; ++i)
        x2[static_cast<std::size_t>(i)] = static_cast<char>((cInit >> i) & 1);
    for (long long k = 0; k + 31 < total; ++k) {
        const auto i = static_cast<std::size_t>(k);
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

TEST(GoldSequence, MatchesRegisterReferenceForManyInitialisations) {
    std::mt19937 rng(2024u);
    std::vector<int> inits{0, 1, 2, 0x7FFFFFFF, 0x40000000, 12345};
    for (int i = 0; i < 40; ++i) inits.push_back(static_cast<int>(rng() & 0x7FFFFFFFu));
    for (int cInit : inits) {
        for (int n : {1, 27, 28, 29, 55, 56, 57, 200, 1001}) {
            BitSequence c(static_cast<std::size_t>(n), 9);
            PN_Generator(c, n, cInit);
            ASSERT_EQ(c, referenceGold(cInit, 0, n)) << "cInit=" << cInit << " n=" << n;
        }
    }
}

TEST(GoldSequence, OffsetFormMatchesReferenceAndShiftedPlainForm) {
    std::mt19937 rng(7u);
    for (int trial = 0; trial < 30; ++trial) {
        const int cInit = static_cast<int>(rng() & 0x7FFFFFFFu);
        const int offset = static_cast<int>(rng() % 5000);
        const int n = 1 + static_cast<int>(rng() % 300);
        BitSequence c(static_cast<std::size_t>(n), 9);
        ASSERT_TRUE(PN_Generator(c, n, cInit, offset));
        EXPECT_EQ(c, referenceGold(cInit, offset, n)) << "offset=" << offset;
        BitSequence longer(static_cast<std::size_t>(n + offset));
        PN_Generator(longer, n + offset, cInit);
        EXPECT_TRUE(std::equal(c.begin(), c.end(), longer.begin() + offset));
    }
}

TEST(GoldSequence, InitialisationIsTakenModulo2To31) {
    BitSequence a(100), b(100);
    PN_Generator(a, 100, 0x12345678);
    PN_Generator(b, 100, static_cast<int>(0x92345678u));  // bit 31 set
    EXPECT_EQ(a, b);
}

TEST(GoldSequence, ZeroInitialisationLeavesTheX1SequenceAlone) {
    const int n = 64;
    BitSequence c(n);
    PN_Generator(c, n, 0);
    std::vector<char> x1(1600 + n + 31, 0);
    x1[0] = 1;
    for (std::size_t k = 0; k + 31 < x1.size(); ++k)
        x1[k + 31] = static_cast<char>(x1[k + 3] ^ x1[k]);
    EXPECT_TRUE(std::equal(c.begin(), c.end(), x1.begin() + 1600));
}

TEST(GoldSequence, SizeAndRangeRules) {
    BitSequence c(10, 9);
    EXPECT_FALSE(PN_Generator(c, 9, 5, 0));  // size differs from n
    EXPECT_EQ(c, BitSequence(10, 9));
    EXPECT_TRUE(PN_Generator(c, 10, 5, -1611));  // n + 1600 + offset below 1
    EXPECT_EQ(c, BitSequence(10, 9));
    // Below -1600 only the existing elements are written, from the register's first output.
    ASSERT_TRUE(PN_Generator(c, 10, 5, -1604));
    EXPECT_EQ(BitSequence(c.begin(), c.begin() + 4), BitSequence(4, 9));
    const BitSequence head = referenceGold(5, -1600, 6);
    EXPECT_TRUE(std::equal(head.begin(), head.end(), c.begin() + 4));
    // Negative offsets within the warm-up reach the elements before c(0).
    BitSequence early(20);
    ASSERT_TRUE(PN_Generator(early, 20, 77, -10));
    EXPECT_EQ(early, referenceGold(77, -10, 20));

    BitSequence small(3);
    EXPECT_THROW(PN_Generator(small, 4, 1), std::out_of_range);
    PN_Generator(small, 0, 1);  // nothing to do
    PN_Generator(small, -5, 1);
}

TEST(GoldSequence, ScramblingOfPublishedTransportBlocks) {
    NRSYNTH_REQUIRE_SHARED();
    int checked = 0;
    for (int index : {0, 3, 7}) {
        const auto path = nrsynth_test::sharedDir() / "testvectors" / "tb" /
                          ("sionna_tb_testcase_" + std::to_string(index) + ".txt");
        std::ifstream in(path);
        if (!in) continue;
        std::vector<std::string> lines;
        for (std::string line; std::getline(in, line);)
            if (!line.empty() && line[0] != '#') lines.push_back(line);
        ASSERT_EQ(lines.size(), 4u);
        long long rnti = -1, nId = -1;
        std::istringstream keys(lines[0]);
        for (std::string kv; keys >> kv;) {
            if (kv.rfind("n_RNTI=", 0) == 0) rnti = std::stoll(kv.substr(7));
            if (kv.rfind("n_ID=", 0) == 0) nId = std::stoll(kv.substr(5));
        }
        ASSERT_GE(rnti, 0);
        ASSERT_GE(nId, 0);
        const std::string& coded = lines[2];
        const std::string& scrambled = lines[3];
        ASSERT_EQ(coded.size(), scrambled.size());
        const int g = static_cast<int>(coded.size());
        BitSequence c(static_cast<std::size_t>(g));
        PN_Generator(c, g, static_cast<int>(rnti * 32768 + nId));
        for (int i = 0; i < g; ++i) {
            const auto k = static_cast<std::size_t>(i);
            ASSERT_EQ((coded[k] - '0') ^ c[k], scrambled[k] - '0')
                << "case " << index << " bit " << i;
        }
        ++checked;
    }
    if (checked == 0) GTEST_SKIP() << "no transport block vectors";
}

}  // namespace
