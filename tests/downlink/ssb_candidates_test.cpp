#include "downlink/ssb_candidates.h"

#include <gtest/gtest.h>

#include <ostream>
#include <stdexcept>
#include <string>
#include <vector>

#include "downlink/pbch_test_support.h"
#include "test_support.h"

namespace {

// TS 38.213 clause 4.1: first symbols of the candidate SS/PBCH blocks, {base} + step n.
std::vector<int> expand(const std::vector<int>& base, int step, const std::vector<int>& ns) {
    std::vector<int> symbols;
    for (int n : ns)
        for (int b : base) symbols.push_back(b + step * n);
    return symbols;
}

struct CandidateCase {
    std::string name;
    int mu;
    int option30k;  // SSB30KSymbolIndex: 1 is Case C
    int lmax;
    std::vector<int> expected;
    friend void PrintTo(const CandidateCase& c, std::ostream* os) { *os << c.name; }
};

const std::vector<CandidateCase> kCases = {
    {"CaseA_L4", 0, 0, 4, expand({2, 8}, 14, {0, 1})},
    {"CaseA_L8", 0, 0, 8, expand({2, 8}, 14, {0, 1, 2, 3})},
    {"CaseB_L4", 1, 0, 4, expand({4, 8, 16, 20}, 28, {0})},
    {"CaseB_L8", 1, 0, 8, expand({4, 8, 16, 20}, 28, {0, 1})},
    {"CaseC_L4", 1, 1, 4, expand({2, 8}, 14, {0, 1})},
    {"CaseC_L8", 1, 1, 8, expand({2, 8}, 14, {0, 1, 2, 3})},
    {"CaseD_L64", 3, 0, 64,
     expand({4, 8, 16, 20}, 28, {0, 1, 2, 3, 5, 6, 7, 8, 10, 11, 12, 13, 15, 16, 17, 18})},
    {"CaseE_L64", 4, 0, 64, expand({8, 12, 16, 20, 32, 36, 40, 44}, 56, {0, 1, 2, 3, 5, 6, 7, 8})},
};

class SsbCandidates : public ::testing::TestWithParam<CandidateCase> {};

// Both the generator and the half-frame flags of the numerology take the first Lmax candidates.
TEST_P(SsbCandidates, GeneratorAndHalfFrameFlagsTakeTheFirstLmaxCandidatesOfTheCase) {
    const CandidateCase& c = GetParam();
    ssb_test::SsbItem setup(c.mu, c.lmax);
    setup.ssb->SSB30KSymbolIndex->setValue(
        static_cast<Models::Nr5g::SSB30KSymbolIndex>(c.option30k));
    auto generator = setup.make(4096);
    ASSERT_TRUE(setup.initResult) << generator->ErrorMessage;
    EXPECT_EQ(generator->CandidateSymbols, c.expected);

    BitSequence flags;
    ASSERT_TRUE(Gen_SSflag_HalfFrame(c.lmax, c.mu, static_cast<SSOption30K_EnumList>(c.option30k),
                                     CP_Normal, flags));
    ASSERT_EQ(flags.size(), static_cast<std::size_t>(70 << c.mu));  // 5 ms of 14-symbol slots
    std::vector<int> marked;
    for (std::size_t s = 0; s < flags.size(); ++s)
        if (flags[s]) marked.push_back(static_cast<int>(s));
    EXPECT_EQ(marked, c.expected);
}

INSTANTIATE_TEST_SUITE_P(Ts38213, SsbCandidates, ::testing::ValuesIn(kCases),
                         [](const auto& info) { return info.param.name; });

TEST(SsbCandidatesTable, UnknownPairingsAreRefused) {
    // 60 kHz has no pattern: Init reports it, and a block that falls due is refused.
    ssb_test::SsbItem sixty(2, 4);
    auto generator = sixty.make(4096);
    EXPECT_FALSE(sixty.initResult);
    EXPECT_EQ(generator->ErrorMessage, "SSBlock Position Calculation Error");
    EXPECT_EQ(nrsynth_test::failureText([&] { generator->Generate(0); }),
              "SSBlock Position Calculation Error SSPBCH.Lmax 4 with SSPBCH.Mu 2");
    BitSequence flags;
    EXPECT_FALSE(Gen_SSflag_HalfFrame(64, 0, SSOption30K_Option0, CP_Normal, flags));
    ASSERT_TRUE(Gen_SSflag_HalfFrame(4, 0, SSOption30K_Option0, CP_Extended, flags));
    EXPECT_EQ(flags.size(), 60u);  // 5 ms of 12-symbol slots
}

}  // namespace
