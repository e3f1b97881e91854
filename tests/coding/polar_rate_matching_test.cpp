// Polar rate matching against the direct form of TS 38.212 clause 5.4.1 in polar_reference.h:
// sub-block interleaver, repetition / puncturing / shortening and the triangular interleaver.

#include "coding/polar_rate_matching.h"

#include <gtest/gtest.h>

#include <set>
#include <sstream>
#include <stdexcept>
#include <vector>

#include "coding/polar_mother_code.h"
#include "polar_reference.h"

using Orvalis_NR::RateMatchingPolar;

namespace {

struct RateCase {
    int K, E, nMax, iBIL;
};

std::vector<RateCase> rateCases() {
    std::vector<RateCase> cases;
    for (int nMax : {9, 10})
        for (int iBIL : {0, 1})
            for (int K : {12, 20, 41, 56, 64, 100, 140, 411})
                for (int E : {18, 45, 64, 70, 100, 127, 128, 200, 400, 864, 1023, 1100, 3000})
                    if (E >= K) cases.push_back({K, E, nMax, iBIL});
    return cases;
}

std::string caseName(const ::testing::TestParamInfo<RateCase>& info) {
    const auto& p = info.param;
    std::ostringstream s;
    s << "K" << p.K << "_E" << p.E << "_nMax" << p.nMax << "_iBIL" << p.iBIL;
    return s.str();
}

class PolarRateMatching : public ::testing::TestWithParam<RateCase> {};

TEST_P(PolarRateMatching, MatchesDirectForm) {
    const auto& p = GetParam();
    const int N = polar_ref::codeLength(p.K, p.E, p.nMax);
    RateMatchingPolar rm;
    ASSERT_TRUE(rm.Init(p.K, p.E, p.nMax, p.iBIL));
    EXPECT_EQ(rm.K, p.K);
    EXPECT_EQ(rm.Pattern, polar_ref::subBlockPattern());
    ASSERT_EQ(rm.SelectionMap.size(), static_cast<std::size_t>(p.E));

    std::mt19937 rng(static_cast<unsigned>(p.E * 131 + p.K));
    for (int trial = 0; trial < 2; ++trial) {
        const auto d = polar_ref::randomBits(static_cast<std::size_t>(N), rng);
        BitSequence f(static_cast<std::size_t>(p.E), 7);
        ASSERT_TRUE(rm.Go(d, f));
        EXPECT_EQ(f, polar_ref::rateMatch(d, p.K, p.E, p.iBIL));
    }
    // Selecting positions (d(n) = n would not fit in a byte): without repetition each
    // position is sent at most once; with it every position is sent.
    const std::set<int> distinct(rm.SelectionMap.begin(), rm.SelectionMap.end());
    EXPECT_EQ(distinct.size(), static_cast<std::size_t>(std::min(p.E, N)));
    EXPECT_GE(*distinct.begin(), 0);
    EXPECT_LT(*distinct.rbegin(), N);
}

INSTANTIATE_TEST_SUITE_P(Grid, PolarRateMatching, ::testing::ValuesIn(rateCases()), caseName);

// The three selections on the worked examples: the map without the bit interleaver is J(i)
// shifted by N - E (puncturing), J(i) (shortening) or J(i mod N) (repetition).
struct SelectionCase {
    int K, E, nMax, N, start;
};

class PolarSelection : public ::testing::TestWithParam<SelectionCase> {};

TEST_P(PolarSelection, MapFollowsTheSubBlockInterleaver) {
    const auto& p = GetParam();
    RateMatchingPolar rm;
    ASSERT_TRUE(rm.Init(p.K, p.E, p.nMax, 0));
    ASSERT_EQ(rm.SelectionMap.size(), static_cast<std::size_t>(p.E));
    for (int i = 0; i < p.E; ++i)
        ASSERT_EQ(rm.SelectionMap[i], polar_ref::subBlockJ((i + p.start) % p.N, p.N)) << i;
}

INSTANTIATE_TEST_SUITE_P(Cases, PolarSelection,
                         ::testing::Values(SelectionCase{56, 864, 9, 512, 0},    // repetition
                                           SelectionCase{64, 100, 10, 128, 0},   // shortening
                                           SelectionCase{64, 200, 10, 256, 56},  // puncturing
                                           SelectionCase{40, 100, 10, 128, 28},  // puncturing
                                           SelectionCase{56, 128, 9, 128, 0}));  // E = N

TEST(PolarRateMatchingShape, BitInterleaverReadsTheTriangleByColumns) {
    // E = 10, T = 4: rows 0..3 hold e0-e3, e4-e6, e7-e8, e9; columns read e0 e4 e7 e9 | e1 e5
    // e8 | e2 e6 | e3.
    RateMatchingPolar plain, interleaved;
    ASSERT_TRUE(plain.Init(4, 10, 10, 0));
    ASSERT_TRUE(interleaved.Init(4, 10, 10, 1));
    const std::vector<int> order = {0, 4, 7, 9, 1, 5, 8, 2, 6, 3};
    for (std::size_t i = 0; i < order.size(); ++i)
        EXPECT_EQ(interleaved.SelectionMap[i], plain.SelectionMap[order[i]]) << i;
}

TEST(PolarRateMatchingErrors, WrongSizesThrow) {
    RateMatchingPolar rm;
    ASSERT_TRUE(rm.Init(56, 864, 9, 0));
    BitSequence d(512, 1), f(864);
    EXPECT_TRUE(rm.Go(d, f));
    BitSequence shortF(863);
    EXPECT_THROW(rm.Go(d, shortF), std::invalid_argument);
    EXPECT_THROW(rm.Go(BitSequence(511, 0), f), std::invalid_argument);
    EXPECT_THROW(rm.Init(0, 864, 9, 0), std::invalid_argument);
    EXPECT_THROW(rm.Init(56, 0, 9, 0), std::invalid_argument);
}

TEST(PolarRateMatchingErrors, BrokenPatternTextThrows) {
    RateMatchingPolar rm;
    rm.Table54111Text = "0 0 1 1 2";
    EXPECT_THROW(rm.Init(56, 864, 9, 0), std::invalid_argument);
}

}  // namespace
