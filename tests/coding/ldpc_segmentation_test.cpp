#include "coding/ldpc_segmentation.h"

#include <gtest/gtest.h>

#include <map>
#include <random>
#include <sstream>
#include <string>
#include <vector>

#include "coding/crc.h"
#include "coding/ldpc_encoder.h"
#include "coding/ldpc_rate_match.h"
#include "ldpc_test_support.h"

namespace {

using Orvalis_NR::CodeBlockSegmentationLDPC;
using namespace nrsynth_test;

constexpr char kFiller = static_cast<char>(254);

struct SegmentationCase {
    LDPC_BaseGraphTypeEnumList bg;
    int b;
    int blocks, bitsWithCrc, kb, z, k;
    std::vector<int> blockBits;
};

// Worked by hand from TS 38.212 clause 5.2.2: the block limits of both graphs, and the K_b
// steps of graph 2 at 192, 560 and 640 bits.
const SegmentationCase kSegmentationCases[] = {
    {LDPC_BG1, 8448, 1, 8448, 22, 384, 8448, {8448}},
    {LDPC_BG1, 8449, 2, 8497, 22, 208, 4576, {4249, 4248}},
    {LDPC_BG1, 16848, 2, 16896, 22, 384, 8448, {8448, 8448}},
    {LDPC_BG1, 16849, 3, 16921, 22, 288, 6336, {5641, 5640, 5640}},
    {LDPC_BG1, 40, 1, 40, 22, 2, 44, {40}},
    {LDPC_BG2, 3840, 1, 3840, 10, 384, 3840, {3840}},
    {LDPC_BG2, 3841, 2, 3889, 10, 208, 2080, {1945, 1944}},
    {LDPC_BG2, 192, 1, 192, 6, 32, 320, {192}},
    {LDPC_BG2, 193, 1, 193, 8, 26, 260, {193}},
    {LDPC_BG2, 560, 1, 560, 8, 72, 720, {560}},
    {LDPC_BG2, 561, 1, 561, 9, 64, 640, {561}},
    {LDPC_BG2, 640, 1, 640, 9, 72, 720, {640}},
    {LDPC_BG2, 641, 1, 641, 10, 72, 720, {641}},
    {LDPC_BG2, 0, 1, 0, 6, 2, 20, {0}},
};

class LdpcSegmentationSizes : public ::testing::TestWithParam<SegmentationCase> {};

TEST_P(LdpcSegmentationSizes, MatchTheHandWorkedValues) {
    const auto& c = GetParam();
    CodeBlockSegmentationLDPC seg;
    ASSERT_TRUE(seg.Init(c.bg, c.b));
    EXPECT_EQ(seg.Blocks, c.blocks);
    EXPECT_EQ(seg.CrcPerBlock, c.blocks > 1 ? 24 : 0);
    EXPECT_EQ(seg.BitsWithCrc, c.bitsWithCrc);
    EXPECT_EQ(seg.Kb, c.kb);
    EXPECT_EQ(seg.Z, c.z);
    EXPECT_EQ(seg.K, c.k);
    EXPECT_EQ(seg.Kcb, c.bg == LDPC_BG1 ? 8448 : 3840);
    EXPECT_EQ(seg.BlockBits, c.blockBits);
    ASSERT_EQ(seg.FillerBits.size(), c.blockBits.size());
    for (std::size_t r = 0; r < c.blockBits.size(); ++r) {
        EXPECT_EQ(seg.FillerBits[r], c.k - c.blockBits[r]);
    }
}

INSTANTIATE_TEST_SUITE_P(Limits, LdpcSegmentationSizes, ::testing::ValuesIn(kSegmentationCases),
                         [](const auto& info) {
                             return "BG" + std::to_string(info.param.bg + 1) + "_B" +
                                    std::to_string(info.param.b);
                         });

TEST(LdpcSegmentation, LiftingListIsTheAscendingUnionOfTheSets) {
    CodeBlockSegmentationLDPC seg;
    ASSERT_EQ(seg.Lifting.size(), 51u);
    for (std::size_t i = 0; i < seg.Lifting.size(); ++i) {
        EXPECT_GE(liftingSetOf(seg.Lifting[i]), 0);
        if (i > 0) {
            EXPECT_LT(seg.Lifting[i - 1], seg.Lifting[i]);
        }
    }
    EXPECT_EQ(seg.Lifting.front(), 2);
    EXPECT_EQ(seg.Lifting.back(), 384);
}

// Blocks carry consecutive input bits, their CRC24B when split (so the CRC over the block is
// zero) and fillers to K.
TEST(LdpcSegmentation, BlocksCarryBitsCheckAndFillers) {
    std::mt19937 rng(3);
    for (int b : {100, 8449, 20000}) {
        CodeBlockSegmentationLDPC seg;
        ASSERT_TRUE(seg.Init(LDPC_BG1, b));
        BitSequence in(static_cast<std::size_t>(b));
        for (auto& bit : in) bit = static_cast<char>(rng() & 1);
        std::vector<BitSequence> blocks;
        ASSERT_TRUE(seg.Go(in, blocks));
        ASSERT_EQ(blocks.size(), static_cast<std::size_t>(seg.Blocks));
        std::size_t next = 0;
        for (int r = 0; r < seg.Blocks; ++r) {
            const auto& block = blocks[r];
            ASSERT_EQ(block.size(), static_cast<std::size_t>(seg.K));
            const int payload = seg.BlockBits[r] - seg.CrcPerBlock;
            EXPECT_TRUE(std::equal(block.begin(), block.begin() + payload, in.begin() + next));
            next += static_cast<std::size_t>(payload);
            if (seg.Blocks > 1) {
                BitSequence check(24, 9);
                ASSERT_TRUE(NR_CRC(CRC_24B, seg.BlockBits[r], block, check));
                EXPECT_EQ(check, BitSequence(24, 0)) << "block " << r;
            }
            EXPECT_EQ(std::count(block.begin() + seg.BlockBits[r], block.end(), kFiller),
                      seg.FillerBits[r]);
        }
        EXPECT_EQ(next, in.size());
    }
}

TEST(LdpcSegmentation, WrongInputSizeIsRefusedWithItsText) {
    CodeBlockSegmentationLDPC seg;
    ASSERT_TRUE(seg.Init(LDPC_BG2, 300));
    std::vector<BitSequence> blocks;
    EXPECT_FALSE(seg.Go(BitSequence(299, 0), blocks));
    EXPECT_EQ(seg.ErrorMessage, "The input size of CodeBlockSegmentationLDPC is wrong! ");
    EXPECT_TRUE(blocks.empty());
    EXPECT_THROW(seg.Init(LDPC_BG1, -1), std::invalid_argument);
}

TEST(LdpcSegmentation, PublishedSegmentationVectors) {
    NRSYNTH_REQUIRE_SHARED();
    const auto cases =
        readVectorCases(vectorPath("ldpc/py5gphy_ldpc_cbsegment.txt"),
                        [](const auto& header) { return 1 + std::stoi(header.at(2)); });
    if (cases.empty()) GTEST_SKIP() << "vector file absent";
    for (const auto& c : cases) {
        const int b = std::stoi(c.header.at(0));
        const auto bg = std::stoi(c.header.at(1)) == 1 ? LDPC_BG1 : LDPC_BG2;
        CodeBlockSegmentationLDPC seg;
        ASSERT_TRUE(seg.Init(bg, b));
        EXPECT_EQ(seg.Blocks, std::stoi(c.header.at(2)));
        EXPECT_EQ(seg.K, std::stoi(c.header.at(3)));
        EXPECT_EQ(seg.Z, std::stoi(c.header.at(4)));
        std::vector<BitSequence> blocks;
        ASSERT_TRUE(seg.Go(bitsOf(c.lines.at(0)), blocks));
        for (int r = 0; r < seg.Blocks; ++r) {
            BitSequence expected;
            for (char ch : c.lines.at(1 + r)) expected.push_back(ch == '-' ? kFiller : ch - '0');
            EXPECT_EQ(blocks[r], expected) << "B " << b << " block " << r;
        }
    }
}

// Whole UL-SCH chain up to rate matching: TB CRC, segmentation with CB CRC, LDPC, bit
// selection and interleaving with the E_r of TS 38.212 clause 5.4.2.1, concatenation.
class TransportBlockChain : public ::testing::TestWithParam<int> {};

TEST_P(TransportBlockChain, CodedBitsMatchTheReference) {
    NRSYNTH_REQUIRE_SHARED();
    const auto cases = readVectorCases(
        vectorPath("tb/sionna_tb_testcase_" + std::to_string(GetParam()) + ".txt"),
        [](const auto&) { return 3; });
    if (cases.empty()) GTEST_SKIP() << "vector file absent";
    std::map<std::string, std::string> key;
    for (const auto& token : cases.at(0).header) {
        const auto eq = token.find('=');
        key[token.substr(0, eq)] = token.substr(eq + 1);
    }
    const int a = std::stoi(key.at("TBS"));
    const int g = std::stoi(key.at("G"));
    const int qm = std::stoi(key.at("Qm"));
    const int layers = std::stoi(key.at("NL"));
    const auto bg = key.at("bg") == "1" ? LDPC_BG1 : LDPC_BG2;

    BitSequence tb = bitsOf(cases[0].lines.at(0));
    ASSERT_EQ(static_cast<int>(tb.size()), a);
    const auto tbCrcType = a > 3824 ? CRC_24A : CRC_16;
    BitSequence tbCrc(a > 3824 ? 24 : 16);
    ASSERT_TRUE(NR_CRC(tbCrcType, a, tb, tbCrc));
    tb.insert(tb.end(), tbCrc.begin(), tbCrc.end());

    CodeBlockSegmentationLDPC seg;
    ASSERT_TRUE(seg.Init(bg, static_cast<int>(tb.size())));
    EXPECT_EQ(seg.Blocks, std::stoi(key.at("C")));
    EXPECT_EQ(seg.Z, std::stoi(key.at("Zc")));
    std::vector<BitSequence> blocks;
    ASSERT_TRUE(seg.Go(tb, blocks));

    Orvalis_NR::LDPC_Encoder encoder;
    ASSERT_TRUE(encoder.Initialize(bg == LDPC_BG1 ? 0 : 1, seg.Z));
    const int c = seg.Blocks;
    const int symbols = g / (layers * qm);
    std::vector<int> coded;
    std::vector<int> in(static_cast<std::size_t>(encoder.K));
    std::vector<int> d(static_cast<std::size_t>(encoder.N));
    std::istringstream eList(key.at("E_list"));
    for (int r = 0; r < c; ++r) {
        for (int i = 0; i < encoder.K; ++i) in[i] = blocks[r][i] == kFiller ? -2 : blocks[r][i];
        ASSERT_TRUE(encoder.Run(in, d));
        const int e = layers * qm * (r <= c - symbols % c - 1 ? symbols / c : (symbols + c - 1) / c);
        std::string stated;
        std::getline(eList, stated, ',');
        EXPECT_EQ(e, std::stoi(stated)) << "block " << r;
        Orvalis_NR::LDPC_RateMatch rm;
        ASSERT_TRUE(rm.Initialize(bg, seg.Z, c, encoder.N, encoder.N, e, 0, qm));
        std::vector<int> f(static_cast<std::size_t>(e));
        ASSERT_TRUE(rm.Run(d, f));
        coded.insert(coded.end(), f.begin(), f.end());
    }
    EXPECT_EQ(coded, parseBits(cases[0].lines.at(1)));
}

INSTANTIATE_TEST_SUITE_P(Sionna, TransportBlockChain, ::testing::Range(0, 8));

}  // namespace
