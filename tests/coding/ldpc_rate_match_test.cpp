#include "coding/ldpc_rate_match.h"

#include <gtest/gtest.h>

#include <cmath>
#include <random>
#include <stdexcept>
#include <string>
#include <vector>

#include "coding/ldpc_encoder.h"
#include "ldpc_test_support.h"

namespace {

using Orvalis_NR::LDPC_RateMatch;
using namespace nrsynth_test;

// TS 38.212 clause 5.4.2 written out directly: k0 of Table 5.4.2.1-2, the bit selection loop
// of clause 5.4.2.1 and the interleaver of clause 5.4.2.2, onto a copy of `f`.
std::vector<int> directRateMatch(const std::vector<int>& d, int bg, int z, int ncb, int e, int rv,
                                 int qm, std::vector<int> f) {
    const double numerator[2][4] = {{0, 17, 33, 56}, {0, 13, 25, 43}};
    const double denominator = bg == 0 ? 66 : 50;
    const int k0 = static_cast<int>(std::floor(numerator[bg][rv] * ncb / (denominator * z))) * z;
    std::vector<int> selected;
    for (int j = 0; static_cast<int>(selected.size()) < e; ++j) {
        const int bit = d[(k0 + j) % ncb];
        if (bit != -2) selected.push_back(bit);
    }
    for (int j = 0; j < e / qm; ++j) {
        for (int i = 0; i < qm; ++i) f[i + j * qm] = selected[i * (e / qm) + j];
    }
    return f;
}

struct RateMatchCase {
    int bg;
    int rv;
    int qm;
};

std::vector<RateMatchCase> rateMatchCases() {
    std::vector<RateMatchCase> cases;
    for (int bg = 0; bg < 2; ++bg) {
        for (int rv = 0; rv < 4; ++rv) {
            for (int qm : {1, 2, 4, 6, 8}) cases.push_back({bg, rv, qm});
        }
    }
    return cases;
}

class LdpcRateMatchDirect : public ::testing::TestWithParam<RateMatchCase> {};

// A real code word with fillers, full and limited circular buffers, outputs shorter than the
// buffer, as long, with repetition, and of lengths Qm does not divide.
TEST_P(LdpcRateMatchDirect, EqualsTheClauseForEveryBufferAndLength) {
    const auto [bg, rv, qm] = GetParam();
    const int z = bg == 0 ? 26 : 36;
    Orvalis_NR::LDPC_Encoder encoder;
    ASSERT_TRUE(encoder.Initialize(bg, z));
    std::mt19937 rng(static_cast<unsigned>(100 * bg + 10 * rv + qm));
    auto info = randomBits(static_cast<std::size_t>(encoder.K), rng);
    const int fillers = 2 * z + 3;
    for (int i = 0; i < fillers; ++i) info[encoder.K - 1 - i] = -2;
    std::vector<int> d(static_cast<std::size_t>(encoder.N));
    ASSERT_TRUE(encoder.Run(info, d));

    const int n = encoder.N;
    for (int ncb : {n, n * 2 / 3, 10 * z + 1}) {
        for (int e : {ncb / 3, ncb - fillers, ncb - fillers + 1, 2 * ncb + 7, qm * 37 + 1}) {
            SCOPED_TRACE("Ncb " + std::to_string(ncb) + " E " + std::to_string(e));
            LDPC_RateMatch rm;
            ASSERT_TRUE(rm.Initialize(bg == 0 ? LDPC_BG1 : LDPC_BG2, z, 1, ncb, n, e, rv, qm));
            std::vector<int> f(static_cast<std::size_t>(e), 7);
            ASSERT_TRUE(rm.Run(d, f));
            EXPECT_EQ(f, directRateMatch(d, bg, z, ncb, e, rv, qm, std::vector<int>(e, 7)));

            // The pattern form skips -1 instead of -2 and gives the same selection.
            auto marked = d;
            for (auto& v : marked) v = v == -2 ? -1 : v;
            std::vector<int> pattern(static_cast<std::size_t>(e), 7);
            ASSERT_TRUE(rm.GetPattern(marked.data(), pattern.data()));
            EXPECT_EQ(pattern, f);
        }
    }
}

INSTANTIATE_TEST_SUITE_P(AllRvAndQm, LdpcRateMatchDirect, ::testing::ValuesIn(rateMatchCases()),
                         [](const auto& info) {
                             return "BG" + std::to_string(info.param.bg + 1) + "_rv" +
                                    std::to_string(info.param.rv) + "_Qm" +
                                    std::to_string(info.param.qm);
                         });

TEST(LdpcRateMatch, StartPositionsOfTable5421_2) {
    struct Case {
        LDPC_BaseGraphTypeEnumList bg;
        int z, ncb;
        int k0[4];
    };
    const Case cases[] = {
        {LDPC_BG1, 384, 25344, {0, 6528, 12672, 21504}},
        {LDPC_BG2, 384, 19200, {0, 4992, 9600, 16512}},
        {LDPC_BG1, 384, 10000, {0, 2304, 4992, 8448}},
        {LDPC_BG2, 2, 100, {0, 26, 50, 86}},
    };
    for (const auto& c : cases) {
        for (int rv = 0; rv < 4; ++rv) {
            LDPC_RateMatch rm;
            ASSERT_TRUE(rm.Initialize(c.bg, c.z, 1, c.ncb, c.ncb, 100, rv, 2));
            EXPECT_EQ(rm.K0, c.k0[rv]) << "Z " << c.z << " Ncb " << c.ncb << " rv " << rv;
        }
    }
}

TEST(LdpcRateMatch, RefusalsCarryTheirTextsAndKeepTheOldStart) {
    LDPC_RateMatch rm;
    ASSERT_TRUE(rm.Initialize(LDPC_BG1, 384, 1, 25344, 25344, 100, 2, 4));
    EXPECT_FALSE(rm.Initialize(LDPC_BG1, 384, 1, 25344, 25344, 100, 4, 6));
    EXPECT_EQ(rm.ErrorMessage, "RV is out of range.");
    EXPECT_FALSE(rm.Initialize(LDPC_BG1, 384, 1, 25344, 25344, 100, -1, 6));
    EXPECT_FALSE(rm.Initialize(LDPC_BG1, 384, 1, 25344, 25344, 100, 1, 3));
    EXPECT_EQ(rm.ErrorMessage, "Qm should be 1, 2, 4, 6 or 8.");
    EXPECT_EQ(rm.K0, 12672);
    EXPECT_EQ(rm.Qm, 4);

    ASSERT_TRUE(rm.Initialize(LDPC_BG2, 2, 1, 100, 100, 10, 0, 2));
    std::vector<int> d(99, 1), f(10, 0);
    EXPECT_FALSE(rm.Run(d, f));
    EXPECT_EQ(rm.ErrorMessage, "input d sequence is of wrong length.");
    d.resize(100);
    f.resize(11);
    EXPECT_FALSE(rm.Run(d, f));
    EXPECT_EQ(rm.ErrorMessage, "output f sequence is of wrong length.");
}

TEST(LdpcRateMatch, ABufferOfFillersIsReportedInsteadOfLoopingForever) {
    LDPC_RateMatch rm;
    ASSERT_TRUE(rm.Initialize(LDPC_BG2, 2, 1, 100, 100, 10, 0, 2));
    std::vector<int> d(100, -2), f(10, 0);
    EXPECT_THROW(rm.Run(d, f), std::invalid_argument);
    ASSERT_TRUE(rm.Initialize(LDPC_BG2, 2, 1, 120, 100, 10, 0, 2));
    d.assign(100, 1);
    EXPECT_THROW(rm.Run(d, f), std::out_of_range);
}

TEST(LdpcRateMatch, PublishedSelectionAndInterleavingVectors) {
    NRSYNTH_REQUIRE_SHARED();
    const auto cases = readVectorCases(vectorPath("ldpc_ratematch/py5gphy_ldpc_ratematch.txt"),
                                       [](const auto&) { return 2; });
    if (cases.empty()) GTEST_SKIP() << "vector file absent";
    for (const auto& c : cases) {
        const int ncb = std::stoi(c.header.at(0));
        const int e = std::stoi(c.header.at(1));
        const int qm = std::stoi(c.header.at(2));
        LDPC_RateMatch rm;
        ASSERT_TRUE(rm.Initialize(LDPC_BG1, 2, 1, ncb, ncb, e, 0, qm));
        rm.K0 = std::stoi(c.header.at(3));  // the vectors state k0 itself, not rv
        auto d = parseBits(c.lines.at(0));
        std::vector<int> f(static_cast<std::size_t>(e));
        ASSERT_TRUE(rm.Run(d, f));
        EXPECT_EQ(f, parseBits(c.lines.at(1))) << "Ncb " << ncb << " E " << e << " Qm " << qm;
    }
}

}  // namespace
