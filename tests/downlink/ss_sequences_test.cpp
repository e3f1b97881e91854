#include "downlink/ss_sequences.h"

#include <gtest/gtest.h>

#include <stdexcept>
#include <vector>

#include "downlink/ssb_reference.h"

namespace {

std::vector<int> asInts(const BitSequence& d) {
    return std::vector<int>(d.begin(), d.end());
}

TEST(SsSequences, PssAndSssMatchTheClauseRecurrencesAcrossTheCellIds) {
    // Cell ids on both sides of the N_ID^(1) = 112 and 224 steps of m0, and the last one.
    for (int cellId : {0, 1, 2, 5, 111 * 3, 112 * 3 + 1, 224 * 3 + 2, 500, 1007}) {
        const int nId1 = cellId / 3, nId2 = cellId % 3;
        BitSequence pss(127, 9), sss(127, 9);
        Generate_PSS_Signal(nId2, pss);
        Generate_SSS_Signal(nId1, nId2, sss);
        EXPECT_EQ(asInts(pss), ssb_ref::pss(nId2)) << "cellId=" << cellId;
        EXPECT_EQ(asInts(sss), ssb_ref::sss(nId1, nId2)) << "cellId=" << cellId;
    }
}

TEST(SsSequences, SidelinkFormsShiftThePssAndKeepTheSss) {
    const std::vector<int> base = ssb_ref::pss(0);
    for (int nId2 = 0; nId2 < 2; ++nId2) {
        BitSequence d(127);
        Generate_S_PSS_Signal(nId2, d);
        for (int n = 0; n < 127; ++n)
            ASSERT_EQ(d[n], base[(n + 22 + 43 * nId2) % 127]) << "n=" << n;
    }
    BitSequence s(127);
    Generate_S_SSS_Signal(200, 1, s);
    EXPECT_EQ(asInts(s), ssb_ref::sss(200, 1));
}

TEST(SsSequences, ShortOutputOrNegativeIdentityIsRefused) {
    BitSequence shortVector(126), d(127);
    EXPECT_THROW(Generate_PSS_Signal(0, shortVector), std::invalid_argument);
    EXPECT_THROW(Generate_SSS_Signal(-3, 0, d), std::invalid_argument);
    std::vector<complex> dmrs(143);
    EXPECT_THROW(Generate_PBCH_DMRS_Signal(0, 1, 0, dmrs, false), std::invalid_argument);
}

struct DmrsCase {
    int iSsb, nHf, cellId;
};

class PbchDmrs : public ::testing::TestWithParam<DmrsCase> {};

// i-bar is iSsb + 4 nHf; the swapped form used by "F00" channels takes nHf + 4 iSsb.
TEST_P(PbchDmrs, MatchesTheClauseInBothIndexForms) {
    const DmrsCase p = GetParam();
    for (bool swapped : {false, true}) {
        std::vector<complex> dmrs(144);
        Generate_PBCH_DMRS_Signal(p.iSsb, p.cellId, p.nHf, dmrs, swapped);
        const int iBar = swapped ? p.nHf + 4 * p.iSsb : p.iSsb + 4 * p.nHf;
        const auto ref = ssb_ref::pbchDmrs(iBar, p.cellId);
        for (int m = 0; m < 144; ++m)
            ASSERT_NEAR(std::abs(dmrs[m] - ref[m]), 0.0, 1e-15)
                << "swapped=" << swapped << " m=" << m;
    }
}

INSTANTIATE_TEST_SUITE_P(Cases, PbchDmrs,
                         ::testing::Values(DmrsCase{0, 0, 0}, DmrsCase{3, 1, 1},
                                           DmrsCase{7, 0, 501}, DmrsCase{1, 1, 1007}));

}  // namespace
