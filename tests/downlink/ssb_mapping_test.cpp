#include "downlink/ssb_mapping.h"

#include <gtest/gtest.h>

#include <stdexcept>
#include <vector>

#include "downlink/ss_sequences.h"

namespace {

constexpr int kWidth = 240;

struct Block {
    BitSequence pss = BitSequence(127), sss = BitSequence(127);
    std::vector<complex> data = std::vector<complex>(432), dmrs = std::vector<complex>(144);
    std::vector<complex> samples = std::vector<complex>(4 * kWidth, complex(9.0, 9.0));
    std::vector<int> occupancy = std::vector<int>(4 * kWidth, -1);

    // Mapped at amplitudes 3 (PSS), 0.25 (SSS), 0.5 (DM-RS) and 2 (data).
    explicit Block(int cellId) {
        Generate_PSS_Signal(cellId % 3, pss);
        Generate_SSS_Signal(cellId / 3, cellId % 3, sss);
        // Distinct values so that every element's place can be traced.
        for (int i = 0; i < 432; ++i) data[i] = complex(1000.0 + i, -1.0);
        for (int i = 0; i < 144; ++i) dmrs[i] = complex(-1.0, 2000.0 + i);
        Map_SSBlock_Signal(pss, sss, data, dmrs, samples, kWidth, 3.0, 0.25, 0.5, 2.0, cellId,
                           occupancy);
    }
    int occ(int l, int k) const { return occupancy[l * kWidth + k]; }
    complex at(int l, int k) const { return samples[l * kWidth + k]; }
};

// TS 38.211 Table 7.4.3.1-1 written out: the content of symbol l, subcarrier k, of an SS/PBCH
// block for v = cellId mod 4, as its occupancy value.
int expectedOccupancy(int l, int k, int v) {
    const bool dmrsComb = (k - v) % 4 == 0 && k >= v;
    switch (l) {
        case 0:
            return (k >= 56 && k <= 182) ? 380 : 370;
        case 1:
        case 3:
            return dmrsComb ? 410 : 400;
        default:
            if (k >= 56 && k <= 182) return 390;
            if ((k >= 48 && k <= 55) || (k >= 183 && k <= 191)) return 370;
            return dmrsComb ? 410 : 400;
    }
}

class SsBlockMapping : public ::testing::TestWithParam<int> {};

TEST_P(SsBlockMapping, EveryElementHoldsTheContentOfTheClauseTableInOrder) {
    const int cellId = GetParam();
    const Block block(cellId);
    // PBCH data and DM-RS are read back symbol by symbol, upwards in frequency; PSS and SSS
    // carry their signs, and the unused elements send nothing.
    std::vector<complex> data, dmrs;
    for (int l = 0; l < 4; ++l)
        for (int k = 0; k < kWidth; ++k) {
            const int occupancy = block.occ(l, k), n = k - 56;  // n: PSS or SSS element
            ASSERT_EQ(occupancy, expectedOccupancy(l, k, cellId % 4)) << "l=" << l << " k=" << k;
            if (occupancy == 400) data.push_back(block.at(l, k) / 2.0);
            if (occupancy == 410) dmrs.push_back(block.at(l, k) / 0.5);
            const double sync = occupancy == 380   ? 3.0 * block.pss[n]
                                : occupancy == 390 ? 0.25 * block.sss[n]
                                                   : 0.0;
            ASSERT_TRUE(occupancy >= 400 || block.at(l, k) == complex(sync, 0.0))
                << "l=" << l << " k=" << k;
        }
    EXPECT_EQ(data, block.data);
    EXPECT_EQ(dmrs, block.dmrs);
}

INSTANTIATE_TEST_SUITE_P(CombOffsets, SsBlockMapping, ::testing::Values(0, 1, 2, 3, 1005));

TEST(SsBlockMappingArguments, ARowNarrowerThanTheBlockIsRefused) {
    Block block(0);
    std::vector<complex> small(4 * 239);
    std::vector<int> smallOccupancy(4 * 239);
    EXPECT_THROW(Map_SSBlock_Signal(block.pss, block.sss, block.data, block.dmrs, small, 239, 1, 1,
                                    1, 1, 0, smallOccupancy),
                 std::invalid_argument);
}

}  // namespace
