#include "downlink/ss_sequences.h"

#include <gtest/gtest.h>

#include <vector>

#include "downlink/ssb_reference.h"

namespace {

std::vector<int> asInts(const BitSequence& d) {
    return std::vector<int>(d.begin(), d.end());
}

TEST(SsSequences, PssAndSssMatchTheClauseRecurrencesAcrossTheCellIds) {
    // Cell ids on both sides of the N_ID^(1) = 112 and 224 steps of m0, the last of the 1008
    // physical ids, and ids past it, for which the formulas still hold (m0 mod 127 wraps).
    for (int cellId : {0, 1, 2, 5, 111 * 3, 112 * 3 + 1, 224 * 3 + 2, 500, 1007, 1008, 128017,
                       2147483647}) {
        const int nId1 = cellId / 3, nId2 = cellId % 3;
        BitSequence pss(127, 9), sss(127, 9);
        Generate_PSS_Signal(nId2, pss);
        Generate_SSS_Signal(nId1, nId2, sss);
        EXPECT_EQ(asInts(pss), ssb_ref::pss(nId2)) << "cellId=" << cellId;
        EXPECT_EQ(asInts(sss), ssb_ref::sss(nId1, nId2)) << "cellId=" << cellId;
    }
}

}  // namespace
