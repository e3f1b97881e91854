#include "coding/ldpc_segmentation.h"

#include <gtest/gtest.h>

#include <map>
#include <utility>
#include <string>
#include <vector>

#include "coding/crc.h"
#include "coding/gold_sequence.h"
#include "coding/ldpc_encoder.h"
#include "coding/ldpc_rate_match.h"
#include "test_support.h"
#include "vector_file.h"

namespace {

using Orvalis_NR::CodeBlockSegmentationLDPC;
using namespace nrsynth_test;

constexpr char kFiller = static_cast<char>(254);

struct SegmentationCase {
    LDPC_BaseGraphTypeEnumList bg;
    int b, kb, z;
    std::vector<int> blockBits;  // per block, with its CRC
};

// Worked by hand from TS 38.212 clause 5.2.2: the block limits of both graphs, and the K_b
// steps of graph 2 at 192, 560 and 640 bits.
const SegmentationCase kSegmentationCases[] = {
    {LDPC_BG1, 8448, 22, 384, {8448}},
    {LDPC_BG1, 8449, 22, 208, {4249, 4248}},
    {LDPC_BG1, 16849, 22, 288, {5641, 5640, 5640}},
    {LDPC_BG1, 40, 22, 2, {40}},
    {LDPC_BG2, 3841, 10, 208, {1945, 1944}},
    {LDPC_BG2, 192, 6, 32, {192}},
    {LDPC_BG2, 193, 8, 26, {193}},
    {LDPC_BG2, 560, 8, 72, {560}},
    {LDPC_BG2, 561, 9, 64, {561}},
    {LDPC_BG2, 640, 9, 72, {640}},
    {LDPC_BG2, 641, 10, 72, {641}},
    {LDPC_BG2, 0, 6, 2, {0}},
};

class LdpcSegmentationSizes : public ::testing::TestWithParam<SegmentationCase> {};

TEST_P(LdpcSegmentationSizes, MatchTheHandWorkedValues) {
    const auto& c = GetParam();
    CodeBlockSegmentationLDPC seg;
    ASSERT_TRUE(seg.Init(c.bg, c.b));
    const int blocks = static_cast<int>(c.blockBits.size());
    EXPECT_EQ(seg.Blocks, blocks);
    EXPECT_EQ(seg.BitsWithCrc, c.b + (blocks > 1 ? 24 * blocks : 0));
    EXPECT_EQ(seg.Kb, c.kb);
    EXPECT_EQ(seg.Z, c.z);
    EXPECT_EQ(seg.BlockBits, c.blockBits);
    ASSERT_EQ(seg.FillerBits.size(), c.blockBits.size());
    for (std::size_t r = 0; r < c.blockBits.size(); ++r)
        EXPECT_EQ(seg.FillerBits[r], seg.K - c.blockBits[r]);
}

INSTANTIATE_TEST_SUITE_P(Limits, LdpcSegmentationSizes, ::testing::ValuesIn(kSegmentationCases));

TEST(LdpcSegmentation, WrongSizesAreRefused) {
    CodeBlockSegmentationLDPC seg;
    ASSERT_TRUE(seg.Init(LDPC_BG2, 300));
    std::vector<BitSequence> blocks;
    EXPECT_FALSE(seg.Go(BitSequence(299, 0), blocks));
    EXPECT_EQ(failureText([&] { seg.Init(LDPC_BG1, -1); }),
              "The transport block for LDPC segmentation has a negative size. B -1");
}

TEST(LdpcSegmentation, HugeBlocksAreSegmentedWhileTheirCodeFitsAndRefusedBeyond) {
    // Up to about 7 10^8 bits the C code blocks of N = 66 Z bits stay below 2^31 bits: the
    // clause's segmentation, every block at most K_cb with its CRC, the shares differing by one.
    for (int b : {12345678, 700000000}) {
        CodeBlockSegmentationLDPC seg;
        ASSERT_TRUE(seg.Init(LDPC_BG1, b));
        const long long c = (b + 8423LL) / 8424;
        EXPECT_EQ(seg.Blocks, c);
        EXPECT_EQ(seg.BitsWithCrc, b + 24 * c);
        long long total = 0;
        for (int bits : seg.BlockBits) {
            total += bits;
            EXPECT_LE(bits, seg.K);
            EXPECT_LE(seg.K, 8448);
        }
        EXPECT_EQ(total, seg.BitsWithCrc);
        EXPECT_LE(seg.CeilBlockBits - seg.FloorBlockBits, 1);
    }
    const std::string tooLarge =
        "The transport block is too large for LDPC coding: its encoded code blocks would pass "
        "2^31 bits. B ";
    for (auto [bg, b] : {std::pair{LDPC_BG1, 800000000}, std::pair{LDPC_BG1, 2147483647},
                         std::pair{LDPC_BG2, 2147483647}}) {
        CodeBlockSegmentationLDPC seg;
        // Copies: clang 14 cannot capture structured bindings in a lambda.
        const auto graph = bg;
        const int size = b;
        EXPECT_EQ(failureText([&] { seg.Init(graph, size); }), tooLarge + std::to_string(size));
    }
}

TEST(LdpcSegmentation, PublishedSegmentationVectors) {
    NRSYNTH_REQUIRE_SHARED();
    const auto cases = readVectorCases("ldpc/py5gphy_ldpc_cbsegment.txt", [](const auto& header) {
        return 1 + std::stoi(header.at(2));
    });
    ASSERT_EQ(cases.size(), 8u);
    for (const auto& c : cases) {
        const int b = std::stoi(c.header.at(0));
        const auto bg = std::stoi(c.header.at(1)) == 1 ? LDPC_BG1 : LDPC_BG2;
        CodeBlockSegmentationLDPC seg;
        ASSERT_TRUE(seg.Init(bg, b));
        EXPECT_EQ(seg.Blocks, std::stoi(c.header.at(2)));
        EXPECT_EQ(seg.K, std::stoi(c.header.at(3)));
        EXPECT_EQ(seg.Z, std::stoi(c.header.at(4)));
        std::vector<BitSequence> blocks;  // with CB CRCs and fillers
        ASSERT_TRUE(seg.Go(bitsOf(c.lines.at(0)), blocks));
        for (int r = 0; r < seg.Blocks; ++r)
            EXPECT_EQ(blocks[r], bitsOf(c.lines.at(1 + r))) << "B " << b << " block " << r;
    }
}

// Whole UL-SCH chain: TB CRC, segmentation with CB CRC, LDPC, bit selection and interleaving
// with the E_r of TS 38.212 clause 5.4.2.1, concatenation, and the scrambling of TS 38.211
// clause 6.3.1.1 with the Gold sequence of c_init = n_RNTI 2^15 + n_ID.
class TransportBlockChain : public ::testing::TestWithParam<int> {};

TEST_P(TransportBlockChain, CodedAndScrambledBitsMatchTheReference) {
    NRSYNTH_REQUIRE_SHARED();
    const auto cases = readVectorCases(
        "tb/sionna_tb_testcase_" + std::to_string(GetParam()) + ".txt", [](auto&) { return 3; });
    ASSERT_EQ(cases.size(), 1u);
    std::map<std::string, std::string> key;
    for (const auto& token : cases.at(0).header)
        key[token.substr(0, token.find('='))] = token.substr(token.find('=') + 1);
    auto number = [&](const char* name) { return std::stoi(key.at(name)); };
    const int a = number("TBS"), g = number("G"), qm = number("Qm"), layers = number("NL");
    const auto bg = number("bg") == 1 ? LDPC_BG1 : LDPC_BG2;

    BitSequence tb = bitsOf(cases[0].lines.at(0));
    BitSequence tbCrc(a > 3824 ? 24 : 16);
    ASSERT_TRUE(NR_CRC(a > 3824 ? CRC_24A : CRC_16, a, tb, tbCrc));
    tb.insert(tb.end(), tbCrc.begin(), tbCrc.end());

    CodeBlockSegmentationLDPC seg;
    ASSERT_TRUE(seg.Init(bg, static_cast<int>(tb.size())));
    std::vector<BitSequence> blocks;
    ASSERT_TRUE(seg.Go(tb, blocks));

    Orvalis_NR::LDPC_Encoder encoder;
    ASSERT_TRUE(encoder.Initialize(bg == LDPC_BG1 ? 0 : 1, seg.Z));
    const int c = seg.Blocks, symbols = g / (layers * qm);
    BitSequence coded;
    std::vector<int> in(static_cast<std::size_t>(encoder.K)), d(encoder.N);
    for (int r = 0; r < c; ++r) {
        for (int i = 0; i < encoder.K; ++i) in[i] = blocks[r][i] == kFiller ? -2 : blocks[r][i];
        ASSERT_TRUE(encoder.Run(in, d));
        const int e =
            layers * qm * (r <= c - symbols % c - 1 ? symbols / c : (symbols + c - 1) / c);
        Orvalis_NR::LDPC_RateMatch rm;
        ASSERT_TRUE(rm.Initialize(bg, seg.Z, c, encoder.N, encoder.N, e, 0, qm));
        std::vector<int> f(static_cast<std::size_t>(e));
        ASSERT_TRUE(rm.Run(d, f));
        for (int bit : f) coded.push_back(static_cast<char>(bit));
    }
    const BitSequence stated = bitsOf(cases[0].lines.at(1));
    ASSERT_EQ(coded, stated);
    ASSERT_EQ(static_cast<int>(stated.size()), g);
    // Scrambling of the coded bits.
    BitSequence scrambled(static_cast<std::size_t>(g));
    PN_Generator(scrambled, g, number("n_RNTI") * 32768 + number("n_ID"));
    for (int i = 0; i < g; ++i) scrambled[i] = static_cast<char>(scrambled[i] ^ stated[i]);
    EXPECT_EQ(scrambled, bitsOf(cases[0].lines.at(2)));
}

INSTANTIATE_TEST_SUITE_P(Sionna, TransportBlockChain, ::testing::Range(0, 8));

}  // namespace
