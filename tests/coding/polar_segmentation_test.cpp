// UCI code block segmentation and CRC attachment (TS 38.212 clauses 5.2.1, 6.3.1.2.1).

#include "coding/polar_segmentation.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <random>
#include <vector>

#include "coding/crc.h"

using Orvalis_NR::CodeBlockSegmentationPolar;

namespace {

struct InitCase {
    int segmented;
    CRC_LengthEnumList crc;
    int segments, crcLength;
};

TEST(PolarSegmentationInit, SegmentsAndCrcLength) {
    const InitCase cases[] = {
        {0, CRC_6, 1, 6},   {1, CRC_6, 2, 6},    {1, CRC_11, 2, 11},
        {0, CRC_16, 1, 16}, {0, CRC_24A, 1, 24}, {0, CRC_24C, 1, 24},
        {2, CRC_11, 1, 11}, {-1, CRC_11, 1, 11}, {0, static_cast<CRC_LengthEnumList>(9), 1, 24},
    };
    for (const auto& c : cases) {
        CodeBlockSegmentationPolar seg;
        EXPECT_TRUE(seg.Init(c.segmented, c.crc));
        EXPECT_EQ(seg.Segments, c.segments) << c.segmented;
        EXPECT_EQ(seg.CrcLength, c.crcLength) << static_cast<int>(c.crc);
        EXPECT_EQ(seg.CrcType, c.crc);
    }
}

struct GoCase {
    int A, segmented;
    CRC_LengthEnumList crc;
};

class PolarSegmentationGo : public ::testing::TestWithParam<GoCase> {};

TEST_P(PolarSegmentationGo, BlocksCarryPayloadAndCheck) {
    const auto& p = GetParam();
    std::mt19937 rng(static_cast<unsigned>(p.A));
    BitSequence a(static_cast<std::size_t>(p.A));
    for (auto& b : a) b = static_cast<char>(rng() & 1);

    CodeBlockSegmentationPolar seg;
    seg.Init(p.segmented, p.crc);
    std::vector<BitSequence> blocks(5, BitSequence(3, 1));  // stale content is replaced
    ASSERT_TRUE(seg.Go(a, blocks));

    const int C = p.segmented == 1 ? 2 : 1;
    const int kPrime = (p.A + C - 1) / C;
    EXPECT_EQ(seg.SegmentLength, kPrime);
    ASSERT_EQ(blocks.size(), static_cast<std::size_t>(C));

    // The data parts, joined, are the payload behind C K' - A leading zeros.
    BitSequence joined;
    for (const auto& block : blocks) {
        ASSERT_EQ(block.size(), static_cast<std::size_t>(kPrime + seg.CrcLength));
        joined.insert(joined.end(), block.begin(), block.begin() + kPrime);
        // A block followed by its own check leaves a zero remainder.
        BitSequence remainder(static_cast<std::size_t>(seg.CrcLength), 1);
        ASSERT_TRUE(NR_CRC(p.crc, static_cast<int>(block.size()), block, remainder));
        EXPECT_EQ(remainder, BitSequence(remainder.size(), 0));
    }
    BitSequence expected(static_cast<std::size_t>(C * kPrime - p.A), 0);
    expected.insert(expected.end(), a.begin(), a.end());
    EXPECT_EQ(joined, expected);
}

INSTANTIATE_TEST_SUITE_P(Cases, PolarSegmentationGo,
                         ::testing::Values(GoCase{12, 0, CRC_6}, GoCase{19, 0, CRC_6},
                                           GoCase{1, 0, CRC_6}, GoCase{1, 1, CRC_6},
                                           GoCase{360, 0, CRC_11}, GoCase{361, 1, CRC_11},
                                           GoCase{1013, 1, CRC_11}, GoCase{1706, 1, CRC_11},
                                           GoCase{140, 0, CRC_24C}));

TEST(PolarSegmentationEdges, OddPayloadInTwoSegmentsGetsOneLeadingZero) {
    CodeBlockSegmentationPolar seg;
    seg.Init(1, CRC_11);
    const BitSequence a(361, 1);
    std::vector<BitSequence> blocks;
    ASSERT_TRUE(seg.Go(a, blocks));
    ASSERT_EQ(blocks.size(), 2u);
    EXPECT_EQ(blocks[0][0], 0);
    EXPECT_EQ(std::count(blocks[0].begin(), blocks[0].begin() + 181, 1), 180);
    EXPECT_EQ(std::count(blocks[1].begin(), blocks[1].begin() + 181, 1), 181);
}

TEST(PolarSegmentationEdges, EmptyPayloadIsRefused) {
    CodeBlockSegmentationPolar seg;
    seg.Init(1, CRC_11);
    std::vector<BitSequence> blocks(2);
    EXPECT_FALSE(seg.Go({}, blocks));
    EXPECT_EQ(seg.ErrorMessage, "The input size of CodeBlockSegmentationPolar is wrong! ");
    EXPECT_TRUE(blocks.empty());
}

}  // namespace
