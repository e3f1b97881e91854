// The polar chain of TS 38.212 (clauses 5.2.1, 5.3.1, 5.4.1) against polar_reference.h and
// against published vectors.

#include "coding/polar_coding.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cctype>
#include <ostream>
#include <random>
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
    const Case cases[] = {{56, 864, 9, 512},       // PBCH: n1 10, n2 9
                          {64, 100, 10, 128},      // 100 > 1.125*64: n1 7
                          {40, 144, 10, 128},      // 144 <= 1.125*128, K/E < 9/16: n1 7
                          {81, 144, 10, 256},      // K/E 0.5625 is not below: n1 8
                          {12, 20, 10, 32},        // n at least 5
                          {400, 8192, 10, 1024}};  // nMax limits
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
        *os << "K " << p.K << " E " << p.E << " nPC " << p.nPC << " nPCwm " << p.nPCwm;
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

    std::mt19937 rng(static_cast<unsigned>(p.K * 10007 + p.E));
    for (int trial = 0; trial < 2; ++trial) {
        const auto c = nrsynth_test::randomBits(static_cast<std::size_t>(p.K), rng);
        BitSequence d(static_cast<std::size_t>(code.N), 7);
        ASSERT_TRUE(code.Encode(c, d));
        const auto u = polar_ref::encoderInput(c, p.E, p.nMax, p.iIL, p.nPC, p.nPCwm);
        EXPECT_EQ(code.U, u);
        EXPECT_EQ(d, polar_ref::butterfly(u));
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
    const int info = code.InfoSet.front(), frozen = code.FrozenSet.back();
    // Swap the least reliable information and the most reliable frozen position.
    std::iter_swap(std::find(sequence.begin(), sequence.end(), info),
                   std::find(sequence.begin(), sequence.end(), frozen));
    code.Table5312Text = text();
    ASSERT_TRUE(code.Init(20, 64, 10, 0, 0, 0));
    EXPECT_EQ(code.InfoSet.front(), frozen);
    EXPECT_EQ(code.Status[info], 1);
    sequence[5] = sequence[6];  // not a permutation
    code.Table5312Text = text();
    EXPECT_THROW(code.Init(20, 64, 10, 0, 0, 0), std::invalid_argument);
}

// One refusal per error path of the three steps.
TEST(PolarErrors, RefusalsOfSizesAndParameters) {
    PolarCoding code;
    ASSERT_TRUE(code.Init(56, 864, 9, 1, 0, 0));
    BitSequence c(55, 1), wrong(511, 5), d(512, 1);
    EXPECT_FALSE(code.Encode(BitSequence(56, 1), wrong));
    EXPECT_EQ(wrong, BitSequence(511, 5));
    EXPECT_THROW(code.Encode(c, d), std::invalid_argument);
    EXPECT_THROW(code.Init(165, 864, 9, 1, 0, 0), std::invalid_argument);  // interleaver max

    RateMatchingPolar rm;
    ASSERT_TRUE(rm.Init(56, 864, 9, 0));
    EXPECT_THROW(rm.Go(d, wrong), std::invalid_argument);
    rm.Table54111Text = "0 0 1 1 2";
    EXPECT_THROW(rm.Init(56, 864, 9, 0), std::invalid_argument);

    CodeBlockSegmentationPolar seg;
    seg.Init(1, CRC_11);
    std::vector<BitSequence> blocks(2);
    EXPECT_FALSE(seg.Go({}, blocks));
}

// Two-segment UCI (clause 5.2.1 with I_seg = 1, CRC11): an odd payload gets one leading zero
// in the first block; each block is then polar coded and rate matched on its own (uplink: nMax
// 10, coded-bit interleaver). All against the reference forms, without the shared vectors.
TEST(PolarTwoSegments, PaddedBlocksAndTheirCodeWordsFollowTheClauses) {
    constexpr unsigned long long kCrc11 = 0xE21;  // D^11 + D^10 + D^9 + D^5 + 1
    struct Case {
        int A, Er;
    };
    for (const Case c : {Case{361, 1200}, Case{1013, 1200}, Case{1706, 1800}, Case{1705, 1800}}) {
        SCOPED_TRACE("A " + std::to_string(c.A));
        std::mt19937 rng(static_cast<unsigned>(c.A));
        const auto a = nrsynth_test::randomBits(static_cast<std::size_t>(c.A), rng);
        CodeBlockSegmentationPolar seg;
        ASSERT_TRUE(seg.Init(1, CRC_11));
        std::vector<BitSequence> blocks;
        ASSERT_TRUE(seg.Go(a, blocks));
        const auto ref = polar_ref::segmentUci(a, 2, kCrc11, 11);
        ASSERT_EQ(blocks, ref);
        // The padding: the first block opens with a zero, then the payload's first bits.
        const int padding = c.A % 2;
        EXPECT_TRUE(std::equal(a.begin(), a.begin() + 100, blocks[0].begin() + padding));
        if (padding) {
            EXPECT_EQ(blocks[0][0], 0);
        }

        const int K = static_cast<int>(ref[0].size());
        PolarCoding code;
        ASSERT_TRUE(code.Init(K, c.Er, 10, 0, 0, 0));
        RateMatchingPolar rm;
        ASSERT_TRUE(rm.Init(K, c.Er, 10, 1));
        for (std::size_t r = 0; r < 2; ++r) {
            BitSequence d(static_cast<std::size_t>(code.N)), f(static_cast<std::size_t>(c.Er));
            ASSERT_TRUE(code.Encode(blocks[r], d));
            ASSERT_TRUE(rm.Go(d, f));
            const auto u = polar_ref::encoderInput(ref[r], c.Er, 10, 0, 0, 0);
            EXPECT_EQ(f, polar_ref::rateMatch(polar_ref::butterfly(u), K, c.Er, 1)) << "block " << r;
        }
    }
}

// A case of ../shared/testvectors/polar/: the numbers of its header (words such as "CRC11"
// dropped) and its bit lines; linesOf(header) says how many bit lines follow.
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

TEST(PolarVectors, EncoderMatchesPy5gphy) {
    NRSYNTH_REQUIRE_SHARED();
    // K E N nMax iIL nPC nPCwm; c; d.
    const auto cases = readCases("py5gphy_polar_encode.txt", [](const auto&) { return 2; });
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
    const auto cases = readCases("py5gphy_polar_ratematch.txt", [](const auto&) { return 2; });
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
    CodeBlockSegmentationPolar seg;
    seg.Init(0, CRC_11);
    std::vector<int> current;
    for (const auto& c : cases) {
        const auto& h = c.header;
        if (h != current) {  // five configurations of 100 payloads each
            ASSERT_TRUE(code.Init(h[1], h[2], h[4], h[5], h[7], h[8]));
            ASSERT_EQ(code.N, h[3]);
            ASSERT_TRUE(rm.Init(h[1], h[2], h[4], h[6]));
            current = h;
        }
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
