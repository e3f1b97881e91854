#include "downlink/ssb_mapping.h"

#include <gtest/gtest.h>

#include <map>
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

    explicit Block(int cellId) {
        Generate_PSS_Signal(cellId % 3, pss);
        Generate_SSS_Signal(cellId / 3, cellId % 3, sss);
        // Distinct values so that every element's place can be traced.
        for (int i = 0; i < 432; ++i) data[i] = complex(1000.0 + i, -1.0);
        for (int i = 0; i < 144; ++i) dmrs[i] = complex(-1.0, 2000.0 + i);
    }
    void map(int cellId, double pssAmp = 1, double sssAmp = 1, double dmrsAmp = 1,
             double dataAmp = 1) {
        Map_SSBlock_Signal(pss, sss, data, dmrs, samples, kWidth, pssAmp, sssAmp, dmrsAmp, dataAmp,
                           cellId, occupancy);
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

TEST_P(SsBlockMapping, EveryElementHoldsTheContentOfTheClauseTable) {
    const int cellId = GetParam();
    Block block(cellId);
    block.map(cellId);
    for (int l = 0; l < 4; ++l)
        for (int k = 0; k < kWidth; ++k)
            ASSERT_EQ(block.occ(l, k), expectedOccupancy(l, k, cellId % 4))
                << "l=" << l << " k=" << k;
}

TEST_P(SsBlockMapping, DataAndDmrsAreReadBackInOrderSymbolBySymbolAndUpwards) {
    const int cellId = GetParam();
    Block block(cellId);
    block.map(cellId, 1.0, 1.0, 0.5, 2.0);
    std::vector<complex> data, dmrs;
    for (int l = 1; l < 4; ++l)
        for (int k = 0; k < kWidth; ++k) {
            if (block.occ(l, k) == 400) data.push_back(block.at(l, k) / 2.0);
            if (block.occ(l, k) == 410) dmrs.push_back(block.at(l, k) / 0.5);
        }
    EXPECT_EQ(data, block.data);
    EXPECT_EQ(dmrs, block.dmrs);
}

INSTANTIATE_TEST_SUITE_P(CombOffsets, SsBlockMapping, ::testing::Values(0, 1, 2, 3, 1005));

TEST(SsBlockMappingSync, PssAndSssCarryTheirSignsAtTheirOwnAmplitudesAndNothingElseIsSent) {
    Block block(301);
    block.map(301, 3.0, 0.25, 1.0, 1.0);
    for (int n = 0; n < 127; ++n) {
        EXPECT_EQ(block.at(0, 56 + n), complex(block.pss[n] * 3.0, 0.0)) << n;
        EXPECT_EQ(block.at(2, 56 + n), complex(block.sss[n] * 0.25, 0.0)) << n;
    }
    for (int k = 0; k < kWidth; ++k) {
        for (int l : {0, 2}) {
            if (block.occ(l, k) != 370) continue;
            EXPECT_EQ(block.at(l, k), complex(0.0, 0.0)) << "l=" << l << " k=" << k;
        }
    }
}

TEST(SsBlockMappingSync, EachRowIsRebuiltFromZeroAndAWiderRowLeavesItsTailAlone) {
    const int width = 256;
    Block block(7);
    std::vector<complex> samples(4 * width, complex(5.0, 5.0));
    std::vector<int> occupancy(4 * width, 77);
    Map_SSBlock_Signal(block.pss, block.sss, block.data, block.dmrs, samples, width, 1, 1, 1, 1, 7,
                       occupancy);
    for (int l = 0; l < 4; ++l) {
        EXPECT_EQ(occupancy[l * width + 240], 77);
        EXPECT_EQ(occupancy[l * width + 255], 77);
        for (int k = 0; k < 240; ++k) ASSERT_NE(occupancy[l * width + k], 77) << l << " " << k;
    }
    EXPECT_EQ(samples[0], complex(0.0, 0.0));  // symbol 0, below the PSS
}

TEST(SsBlockMappingSync, SeparateMappersMatchTheBlockRows) {
    Block block(42);
    block.map(42, 2.0, 3.0, 1.0, 1.0);
    std::vector<complex> symbol(240, complex(7.0, 7.0));
    std::vector<int> occupancy(240, 0);
    Map_PSS_Signal(block.pss, symbol, 2.0, occupancy);
    for (int k = 0; k < 240; ++k) {
        EXPECT_EQ(symbol[k], block.at(0, k));
        EXPECT_EQ(occupancy[k], block.occ(0, k));
    }
    std::fill(symbol.begin(), symbol.end(), complex(0.0, 0.0));
    std::fill(occupancy.begin(), occupancy.end(), 0);
    Map_SSS_Signal(block.sss, symbol, 3.0, occupancy);
    Map_PBCH_Signal(block.data, block.dmrs, symbol, 1.0, 1.0, 42, 2, occupancy);
    for (int k = 0; k < 240; ++k) {
        EXPECT_EQ(symbol[k], block.at(2, k));
        EXPECT_EQ(occupancy[k], block.occ(2, k));
    }
}

TEST(SsBlockMappingSync, MalformedArgumentsAreRefused) {
    Block block(0);
    std::vector<complex> symbol(240);
    std::vector<int> occupancy(240, 0);
    EXPECT_THROW(Map_PBCH_Signal(block.data, block.dmrs, symbol, 1, 1, 0, 0, occupancy),
                 std::invalid_argument);
    EXPECT_THROW(Map_PBCH_Signal(block.data, block.dmrs, symbol, 1, 1, 0, 4, occupancy),
                 std::invalid_argument);
    std::vector<complex> small(4 * 239);
    std::vector<int> smallOccupancy(4 * 239);
    EXPECT_THROW(Map_SSBlock_Signal(block.pss, block.sss, block.data, block.dmrs, small, 239, 1, 1,
                                    1, 1, 0, smallOccupancy),
                 std::invalid_argument);
}

}  // namespace
