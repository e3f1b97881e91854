// The polar chain against the public test vectors in ../shared/testvectors/polar/ (made by
// other implementations); skipped when the folder is absent.

#include <gtest/gtest.h>

#include <cctype>
#include <string>
#include <vector>

#include "coding/crc.h"
#include "coding/polar_coding.h"
#include "coding/polar_mother_code.h"
#include "coding/polar_rate_matching.h"
#include "coding/polar_segmentation.h"
#include "test_support.h"
#include "vector_file.h"

using namespace Orvalis_NR;

namespace {

/// A case of a polar vector file: the numbers of its header (a trailing word such as "CRC11"
/// is dropped) and its bit lines.
struct PolarCase {
    std::vector<int> header;
    std::vector<BitSequence> lines;
};

/// The cases of testvectors/polar/<name>; linesOf(header) says how many bit lines follow.
template <typename LinesOf>
std::vector<PolarCase> readCases(const std::string& name, LinesOf linesOf) {
    const auto path = nrsynth_test::sharedDir() / "testvectors" / "polar" / name;
    auto numbers = [](const std::vector<std::string>& words) {
        std::vector<int> values;
        for (const auto& w : words)
            if (std::isdigit(static_cast<unsigned char>(w[0]))) values.push_back(std::stoi(w));
        return values;
    };
    std::vector<PolarCase> cases;
    for (const auto& c : nrsynth_test::readVectorCases(
             path.string(),
             [&](const std::vector<std::string>& h) { return linesOf(numbers(h)); })) {
        PolarCase polar{numbers(c.header), {}};
        for (const auto& line : c.lines) polar.lines.push_back(nrsynth_test::bitsOf(line));
        cases.push_back(std::move(polar));
    }
    return cases;
}

TEST(PolarVectors, EncoderMatchesPy5gphy) {
    NRSYNTH_REQUIRE_SHARED();
    // K E N nMax iIL nPC nPCwm; c; d.
    const auto cases =
        readCases("py5gphy_polar_encode.txt", [](const std::vector<int>&) { return 2; });
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
    const auto cases =
        readCases("py5gphy_polar_ratematch.txt", [](const std::vector<int>&) { return 2; });
    ASSERT_EQ(cases.size(), 6u);
    for (const auto& c : cases) {
        const auto& h = c.header;
        const int nMax = polarCodeLength(h[0], h[1], 10) == h[2] ? 10 : 9;
        ASSERT_EQ(polarCodeLength(h[0], h[1], nMax), h[2]);
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
    const auto cases = readCases("sionna_polar5g.txt", [](const std::vector<int>&) { return 3; });
    ASSERT_EQ(cases.size(), 500u);
    PolarCoding code;
    RateMatchingPolar rm;
    std::vector<int> current;
    int compared = 0;
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
        ++compared;
    }
    EXPECT_EQ(compared, 500);
}

}  // namespace
