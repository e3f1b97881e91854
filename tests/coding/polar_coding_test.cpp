// The polar chain against the plain reading of TS 38.212 in polar_reference.h: encoder (code
// length, frozen/information/parity sets, generator matrix, clause 5.3.1), rate matching with
// sub-block interleaver, repetition / puncturing / shortening and coded-bit interleaver
// (clause 5.4.1), and UCI code block segmentation with CRC attachment (clauses 5.2.1,
// 6.3.1.2.1); then the whole chain against published vectors.

#include "coding/polar_coding.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cctype>
#include <ostream>
#include <set>
#include <sstream>
#include <stdexcept>
#include <string>
#include <vector>

#include "coding/crc.h"
#include "coding/polar_mother_code.h"
#include "coding/polar_rate_matching.h"
#include "coding/polar_segmentation.h"
#include "polar_reference.h"

using Orvalis_NR::CodeBlockSegmentationPolar;
using Orvalis_NR::PolarCoding;
using Orvalis_NR::RateMatchingPolar;

namespace {

TEST(PolarCodeLength, MatchesWorkedValues) {
    struct Case {
        int K, E, nMax, N;
    };
    // Worked by hand from clause 5.3.1.
    const Case cases[] = {{56, 864, 9, 512},      // PBCH: n1 10, n2 9
                          {56, 864, 10, 512},     // n2 limits
                          {64, 100, 10, 128},     // 100 > 1.125*64: n1 7
                          {40, 144, 10, 128},     // 144 <= 1.125*128, K/E < 9/16: n1 7
                          {90, 144, 10, 256},     // K/E 0.625: n1 8
                          {81, 144, 10, 256},     // K/E 0.5625 is not below: n1 8
                          {12, 20, 10, 32},       // n at least 5
                          {400, 8192, 10, 1024},  // nMax limits
                          {140, 8192, 9, 512},   {3, 8000, 10, 32}};  // n2 5
    for (const auto& c : cases) {
        EXPECT_EQ(Orvalis_NR::polarCodeLength(c.K, c.E, c.nMax), c.N) << c.K << " " << c.E;
        EXPECT_EQ(polar_ref::codeLength(c.K, c.E, c.nMax), c.N) << c.K << " " << c.E;
    }
}

// Cases (K, E) for one link direction. Downlink: nMax 9, interleaver, no parity bits. Uplink:
// nMax 10, no interleaver, nPC 3 with nPCwm 0 and 1 for small K, nPC 0 otherwise. Together
// they reach repetition, puncturing (E above and below 3N/4) and shortening in every form.
struct EncoderCase {
    int K, E, nMax, iIL, nPC, nPCwm;
    friend void PrintTo(const EncoderCase& p, std::ostream* os) {
        *os << "K " << p.K << " E " << p.E << " nMax " << p.nMax << " iIL " << p.iIL << " nPC "
            << p.nPC << " nPCwm " << p.nPCwm;
    }
};

std::vector<EncoderCase> encoderCases() {
    std::vector<EncoderCase> cases;
    auto add = [&](int K, int E, int nMax, int iIL, int nPC, int nPCwm) {
        try {  // keep only codes that exist: enough positions remain for K + nPC bits
            polar_ref::sets(K, E, nMax, nPC, nPCwm);
            cases.push_back({K, E, nMax, iIL, nPC, nPCwm});
        } catch (const std::invalid_argument&) {
        }
    };
    for (int K : {36, 40, 43, 56, 64, 81, 100, 128, 140, 164})
        for (int E : {K + 3, 72, 100, 108, 144, 200, 216, 300, 432, 500, 864, 1728, 5000})
            if (E >= K) add(K, E, 9, 1, 0, 0);
    for (int K : {18, 20, 25})
        for (int E : {K + 3, 40, 60, 90, 150, 200, 220, 300, 500, 1000})
            for (int nPCwm : {0, 1}) add(K, E, 10, 0, 3, nPCwm);
    for (int K : {12, 30, 41, 100, 200, 411, 700, 1013})
        for (int E : {K + 2, 45, 127, 400, 900, 1023, 1100, 2000, 8192})
            if (E >= K) add(K, E, 10, 0, 0, 0);
    return cases;
}

class PolarEncoder : public ::testing::TestWithParam<EncoderCase> {};

TEST_P(PolarEncoder, SetsCodeWordsAndRateMatchingFollowTheClauses) {
    const auto& p = GetParam();
    const auto ref = polar_ref::sets(p.K, p.E, p.nMax, p.nPC, p.nPCwm);
    PolarCoding code;
    ASSERT_TRUE(code.Init(p.K, p.E, p.nMax, p.iIL, p.nPC, p.nPCwm));
    ASSERT_EQ(code.N, ref.N);
    EXPECT_EQ(code.InfoSet, ref.info);
    EXPECT_EQ(std::set<int>(code.FrozenSet.begin(), code.FrozenSet.end()), ref.frozen);

    // G_N(i, j), the n-th Kronecker power of [1 0; 1 1], is 1 when j's bits lie in i's.
    ASSERT_EQ(code.GeneratorColumns.size(), static_cast<std::size_t>(ref.N));
    int wrong = 0;
    for (int j = 0; j < ref.N; ++j) {
        ASSERT_EQ(code.GeneratorColumns[j].size(), static_cast<std::size_t>(ref.N));
        for (int i = 0; i < ref.N; ++i) wrong += code.GeneratorColumns[j][i] != ((i & j) == j);
    }
    EXPECT_EQ(wrong, 0);

    std::mt19937 rng(static_cast<unsigned>(p.K * 10007 + p.E));
    for (int trial = 0; trial < 3; ++trial) {
        const auto c = nrsynth_test::randomBits(static_cast<std::size_t>(p.K), rng);
        BitSequence d(static_cast<std::size_t>(code.N), 7);
        ASSERT_TRUE(code.Encode(c, d));
        const auto u = polar_ref::encoderInput(c, p.E, p.nMax, p.iIL, p.nPC, p.nPCwm);
        EXPECT_EQ(code.U, u);
        EXPECT_EQ(d, polar_ref::butterfly(u));
        // Rate matching of the code word with and without the coded-bit interleaver.
        for (int iBIL : {0, 1}) {
            RateMatchingPolar rm;
            ASSERT_TRUE(rm.Init(p.K, p.E, p.nMax, iBIL));
            BitSequence f(static_cast<std::size_t>(p.E), 7);
            ASSERT_TRUE(rm.Go(d, f));
            EXPECT_EQ(f, polar_ref::rateMatch(d, p.K, p.E, iBIL)) << "iBIL " << iBIL;
        }
    }
}

INSTANTIATE_TEST_SUITE_P(Grid, PolarEncoder, ::testing::ValuesIn(encoderCases()));

// The tables read from text: an altered sequence changes the code, a broken one is refused.
TEST(PolarTablesText, TextReplacesTheCompiledSequence) {
    auto sequence = polar_ref::polarSequence();
    auto text = [&] {
        std::ostringstream s;
        for (std::size_t i = 0; i < sequence.size(); ++i) s << i << ' ' << sequence[i] << '\n';
        return s.str();
    };
    PolarCoding code;
    ASSERT_TRUE(code.Init(20, 64, 10, 0, 0, 0));
    const int leastReliableInfo = code.InfoSet.front();
    const int mostReliableFrozen = code.FrozenSet.back();
    // Swap the two positions in the sequence: the information set follows the text.
    std::iter_swap(std::find(sequence.begin(), sequence.end(), leastReliableInfo),
                   std::find(sequence.begin(), sequence.end(), mostReliableFrozen));
    code.Table5312Text = text();
    ASSERT_TRUE(code.Init(20, 64, 10, 0, 0, 0));
    EXPECT_EQ(code.InfoSet.front(), mostReliableFrozen);
    EXPECT_EQ(code.Status[leastReliableInfo], 1);

    sequence[5] = sequence[6];  // not a permutation
    code.Table5312Text = text();
    EXPECT_THROW(code.Init(20, 64, 10, 0, 0, 0), std::invalid_argument);
}

struct GoCase {
    int A, segmented;
    CRC_LengthEnumList crc;
    int crcLength;
};

class PolarSegmentationGo : public ::testing::TestWithParam<GoCase> {};

// Segmentation: C blocks of K' = ceil(A / C) data bits, each followed by its check; their
// data bits, joined, are the payload behind C K' - A leading zeros.
TEST_P(PolarSegmentationGo, BlocksCarryPayloadAndCheck) {
    const auto& p = GetParam();
    std::mt19937 rng(static_cast<unsigned>(p.A));
    const BitSequence a = nrsynth_test::randomBits(static_cast<std::size_t>(p.A), rng);

    CodeBlockSegmentationPolar seg;
    seg.Init(p.segmented, p.crc);
    std::vector<BitSequence> blocks(5, BitSequence(3, 1));  // stale content is replaced
    ASSERT_TRUE(seg.Go(a, blocks));

    const int C = p.segmented == 1 ? 2 : 1;
    const int kPrime = (p.A + C - 1) / C;
    ASSERT_EQ(blocks.size(), static_cast<std::size_t>(C));
    BitSequence joined;
    for (const auto& block : blocks) {
        ASSERT_EQ(block.size(), static_cast<std::size_t>(kPrime + p.crcLength));
        joined.insert(joined.end(), block.begin(), block.begin() + kPrime);
        BitSequence remainder(static_cast<std::size_t>(p.crcLength), 1);
        ASSERT_TRUE(NR_CRC(p.crc, static_cast<int>(block.size()), block, remainder));
        EXPECT_EQ(remainder, BitSequence(remainder.size(), 0));
    }
    BitSequence expected(static_cast<std::size_t>(C * kPrime - p.A), 0);
    expected.insert(expected.end(), a.begin(), a.end());
    EXPECT_EQ(joined, expected);
}

INSTANTIATE_TEST_SUITE_P(Cases, PolarSegmentationGo,
                         ::testing::Values(GoCase{12, 0, CRC_6, 6}, GoCase{19, 0, CRC_6, 6},
                                           GoCase{1, 1, CRC_6, 6}, GoCase{360, 0, CRC_11, 11},
                                           GoCase{361, 1, CRC_11, 11}, GoCase{1706, 1, CRC_11, 11},
                                           GoCase{140, 0, CRC_24C, 24}));

// One refusal per error path of the three steps.
TEST(PolarErrors, RefusalsOfSizesAndParameters) {
    PolarCoding code;
    ASSERT_TRUE(code.Init(56, 864, 9, 1, 0, 0));
    BitSequence c(56, 1), wrong(511, 5), d(512, 1);
    EXPECT_FALSE(code.Encode(c, wrong));
    EXPECT_EQ(wrong, BitSequence(511, 5));
    c.resize(55);
    EXPECT_THROW(code.Encode(c, d), std::invalid_argument);
    EXPECT_THROW(code.Init(165, 864, 9, 1, 0, 0), std::invalid_argument);  // interleaver max
    EXPECT_THROW(code.Init(60, 40, 10, 0, 0, 0), std::invalid_argument);   // K > E

    RateMatchingPolar rm;
    ASSERT_TRUE(rm.Init(56, 864, 9, 0));
    EXPECT_THROW(rm.Go(d, wrong), std::invalid_argument);
    EXPECT_THROW(rm.Init(0, 864, 9, 0), std::invalid_argument);
    rm.Table54111Text = "0 0 1 1 2";
    EXPECT_THROW(rm.Init(56, 864, 9, 0), std::invalid_argument);

    CodeBlockSegmentationPolar seg;
    seg.Init(1, CRC_11);
    std::vector<BitSequence> blocks(2);
    EXPECT_FALSE(seg.Go({}, blocks));
    EXPECT_TRUE(blocks.empty());
}

// The public test vectors in ../shared/testvectors/polar/ (made by other implementations).
// A case of a polar vector file: the numbers of its header (a trailing word such as "CRC11"
// is dropped) and its bit lines; linesOf(header) says how many bit lines follow.
struct PolarCase {
    std::vector<int> header;
    std::vector<BitSequence> lines;
};

template <typename LinesOf>
std::vector<PolarCase> readCases(const std::string& name, LinesOf linesOf) {
    auto numbers = [](const std::vector<std::string>& words) {
        std::vector<int> values;
        for (const auto& w : words)
            if (std::isdigit(static_cast<unsigned char>(w[0]))) values.push_back(std::stoi(w));
        return values;
    };
    std::vector<PolarCase> cases;
    for (const auto& c : nrsynth_test::readVectorCases(
             "polar/" + name, [&](const auto& h) { return linesOf(numbers(h)); })) {
        cases.push_back({numbers(c.header), {}});
        for (const auto& line : c.lines) cases.back().lines.push_back(nrsynth_test::bitsOf(line));
    }
    return cases;
}

const auto kTwoLines = [](const std::vector<int>&) { return 2; };

TEST(PolarVectors, EncoderMatchesPy5gphy) {
    NRSYNTH_REQUIRE_SHARED();
    // K E N nMax iIL nPC nPCwm; c; d.
    const auto cases = readCases("py5gphy_polar_encode.txt", kTwoLines);
    ASSERT_EQ(cases.size(), 6u);
    for (const auto& c : cases) {
        const auto& h = c.header;
        PolarCoding code;
        ASSERT_TRUE(code.Init(h[0], h[1], h[3], h[4], h[5], h[6]));
        ASSERT_EQ(code.N, h[2]);
        BitSequence d(static_cast<std::size_t>(code.N));
        ASSERT_TRUE(code.Encode(c.lines[0], d));
        EXPECT_EQ(d, c.lines[1]) << "K " << h[0] << " E " << h[1];
    }
}

TEST(PolarVectors, RateMatchingMatchesPy5gphy) {
    NRSYNTH_REQUIRE_SHARED();
    // K E N iBIL; d; f. The vectors do not say nMax: it is the one of 9 and 10 that gives N.
    const auto cases = readCases("py5gphy_polar_ratematch.txt", kTwoLines);
    ASSERT_EQ(cases.size(), 6u);
    for (const auto& c : cases) {
        const auto& h = c.header;
        const int nMax = Orvalis_NR::polarCodeLength(h[0], h[1], 10) == h[2] ? 10 : 9;
        ASSERT_EQ(Orvalis_NR::polarCodeLength(h[0], h[1], nMax), h[2]);
        RateMatchingPolar rm;
        ASSERT_TRUE(rm.Init(h[0], h[1], nMax, h[3]));
        BitSequence f(static_cast<std::size_t>(h[1]));
        ASSERT_TRUE(rm.Go(c.lines[0], f));
        EXPECT_EQ(f, c.lines[1]) << "K " << h[0] << " E " << h[1] << " iBIL " << h[3];
    }
}

TEST(PolarVectors, SegmentationMatchesPy5gphy) {
    NRSYNTH_REQUIRE_SHARED();
    // A E_UCI C E_r K_r L; a; C blocks.
    const auto cases = readCases("py5gphy_polar_cbsegment.txt",
                                 [](const std::vector<int>& h) { return 1 + h[2]; });
    ASSERT_EQ(cases.size(), 6u);
    for (const auto& c : cases) {
        const auto& h = c.header;
        CodeBlockSegmentationPolar seg;
        seg.Init(h[2] == 2 ? 1 : 0, h[5] == 11 ? CRC_11 : CRC_6);
        std::vector<BitSequence> blocks;
        ASSERT_TRUE(seg.Go(c.lines[0], blocks));
        EXPECT_EQ(blocks, std::vector<BitSequence>(c.lines.begin() + 1, c.lines.end()))
            << "A " << h[0];
    }
}

TEST(PolarVectors, UplinkChainMatchesSionna) {
    NRSYNTH_REQUIRE_SHARED();
    // A K E N nMax iIL iBIL nPC nPCwm; a; c = a + CRC11; f.
    const auto cases = readCases("sionna_polar5g.txt", [](const auto&) { return 3; });
    ASSERT_EQ(cases.size(), 500u);
    PolarCoding code;
    RateMatchingPolar rm;
    std::vector<int> current;
    for (const auto& c : cases) {
        const auto& h = c.header;
        if (h != current) {  // five configurations of 100 payloads each
            ASSERT_TRUE(code.Init(h[1], h[2], h[4], h[5], h[7], h[8]));
            ASSERT_EQ(code.N, h[3]);
            ASSERT_TRUE(rm.Init(h[1], h[2], h[4], h[6]));
            current = h;
        }
        CodeBlockSegmentationPolar seg;
        seg.Init(0, CRC_11);
        std::vector<BitSequence> blocks;
        ASSERT_TRUE(seg.Go(c.lines[0], blocks));
        ASSERT_EQ(blocks.size(), 1u);
        EXPECT_EQ(blocks[0], c.lines[1]);

        BitSequence d(static_cast<std::size_t>(code.N)), f(static_cast<std::size_t>(h[2]));
        ASSERT_TRUE(code.Encode(blocks[0], d));
        ASSERT_TRUE(rm.Go(d, f));
        EXPECT_EQ(f, c.lines[2]) << "A " << h[0] << " E " << h[2];
    }
}

}  // namespace
