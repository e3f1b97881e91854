#include "downlink/ss_sequences.h"

#include <gtest/gtest.h>

#include <stdexcept>
#include <vector>

#include "downlink/ssb_reference.h"

namespace {

std::vector<int> asInts(const BitSequence& d) {
    return std::vector<int>(d.begin(), d.end());
}

TEST(SsSequences, PssOfEachNId2MatchesTheClauseRecurrence) {
    for (int nId2 = 0; nId2 < 3; ++nId2) {
        BitSequence d(127, 9);
        Generate_PSS_Signal(nId2, d);
        EXPECT_EQ(asInts(d), ssb_ref::pss(nId2)) << "nId2=" << nId2;
    }
}

TEST(SsSequences, PssSequencesAreDistinctCyclicShifts) {
    // The three PSS are the same m-sequence shifted by 43: a receiver tells N_ID^(2) apart by
    // correlation, so the cross-correlation at zero lag must be small.
    BitSequence a(127), b(127);
    Generate_PSS_Signal(0, a);
    Generate_PSS_Signal(1, b);
    int cross = 0, self = 0;
    for (int n = 0; n < 127; ++n) {
        cross += a[n] * b[n];
        self += a[n] * a[n];
    }
    EXPECT_EQ(self, 127);
    EXPECT_EQ(cross, -1);  // an m-sequence against a shift of itself
}

TEST(SsSequences, SssMatchesTheClauseForCellIdsAcrossTheRange) {
    for (int cellId :
         {0, 1, 2, 3, 5, 111 * 3, 112 * 3, 112 * 3 + 1, 224 * 3 + 2, 500, 1006, 1007}) {
        const int nId1 = cellId / 3, nId2 = cellId % 3;
        BitSequence d(127, 9);
        Generate_SSS_Signal(nId1, nId2, d);
        EXPECT_EQ(asInts(d), ssb_ref::sss(nId1, nId2)) << "cellId=" << cellId;
    }
}

TEST(SsSequences, SidelinkFormsShiftThePssAndKeepTheSss) {
    for (int nId2 = 0; nId2 < 2; ++nId2) {
        BitSequence d(127);
        Generate_S_PSS_Signal(nId2, d);
        const std::vector<int> base = ssb_ref::pss(0);
        for (int n = 0; n < 127; ++n)
            ASSERT_EQ(d[n], base[(n + 22 + 43 * nId2) % 127]) << "n=" << n;
    }
    BitSequence s(127), ref(127);
    Generate_S_SSS_Signal(200, 1, s);
    Generate_SSS_Signal(200, 1, ref);
    EXPECT_EQ(s, ref);
}

TEST(SsSequences, ShortOutputOrNegativeIdentityIsRefused) {
    BitSequence shortVector(126);
    EXPECT_THROW(Generate_PSS_Signal(0, shortVector), std::invalid_argument);
    EXPECT_THROW(Generate_SSS_Signal(0, 0, shortVector), std::invalid_argument);
    BitSequence d(127);
    EXPECT_THROW(Generate_PSS_Signal(-1, d), std::invalid_argument);
    EXPECT_THROW(Generate_SSS_Signal(-3, 0, d), std::invalid_argument);
    std::vector<complex> dmrs(143);
    EXPECT_THROW(Generate_PBCH_DMRS_Signal(0, 1, 0, dmrs, false), std::invalid_argument);
}

struct DmrsCase {
    int iSsb, nHf, cellId;
};

class PbchDmrs : public ::testing::TestWithParam<DmrsCase> {};

TEST_P(PbchDmrs, MatchesTheClauseWithIBarFromBlockIndexAndHalfFrame) {
    const DmrsCase p = GetParam();
    std::vector<complex> dmrs(144);
    Generate_PBCH_DMRS_Signal(p.iSsb, p.cellId, p.nHf, dmrs, false);
    const auto ref = ssb_ref::pbchDmrs(p.iSsb + 4 * p.nHf, p.cellId);
    for (int m = 0; m < 144; ++m) {
        ASSERT_NEAR(dmrs[m].real(), ref[m].real(), 1e-15) << "m=" << m;
        ASSERT_NEAR(dmrs[m].imag(), ref[m].imag(), 1e-15) << "m=" << m;
    }
}

TEST_P(PbchDmrs, SwappedFormTakesIBarAsNHfPlusFourISsb) {
    const DmrsCase p = GetParam();
    std::vector<complex> dmrs(144);
    Generate_PBCH_DMRS_Signal(p.iSsb, p.cellId, p.nHf, dmrs, true);
    const auto ref = ssb_ref::pbchDmrs(p.nHf + 4 * p.iSsb, p.cellId);
    for (int m = 0; m < 144; ++m) ASSERT_NEAR(std::abs(dmrs[m] - ref[m]), 0.0, 1e-15) << "m=" << m;
}

INSTANTIATE_TEST_SUITE_P(Cases, PbchDmrs,
                         ::testing::Values(DmrsCase{0, 0, 0}, DmrsCase{3, 1, 1}, DmrsCase{1, 0, 2},
                                           DmrsCase{2, 1, 3}, DmrsCase{7, 0, 501},
                                           DmrsCase{5, 0, 1007}, DmrsCase{0, 1, 4}));

}  // namespace
