#include "coding/ldpc_encoder.h"

#include <gtest/gtest.h>

#include <climits>
#include <iterator>
#include <random>
#include <string>
#include <vector>

#include "ldpc_test_support.h"

namespace {

using Orvalis_NR::LDPC_Encoder;
using Orvalis_NR::LdpcKernel;
using namespace nrsynth_test;

std::vector<LdpcKernel> availableKernels() {
    std::vector<LdpcKernel> kernels;
    for (auto k : {LdpcKernel::List, LdpcKernel::Portable, LdpcKernel::Avx2}) {
        if (Orvalis_NR::ldpcKernelSupported(k)) kernels.push_back(k);
    }
    return kernels;
}

const char* kernelName(LdpcKernel k) {
    return k == LdpcKernel::List ? "list" : k == LdpcKernel::Portable ? "portable" : "avx2";
}

struct GeometryCase {
    int baseGraph;
    int z;
};

// Per lifting set the smallest, a middle and the largest size, for both graphs.
std::vector<GeometryCase> geometryCases() {
    static const int a[8] = {2, 3, 5, 7, 9, 11, 13, 15};
    std::vector<GeometryCase> cases;
    for (int bg = 0; bg < 2; ++bg) {
        for (int s = 0; s < 8; ++s) {
            std::vector<int> sizes;
            for (int z = a[s]; z <= 384; z *= 2) sizes.push_back(z);
            for (int z : {sizes.front(), sizes[sizes.size() / 2], sizes.back()}) {
                if (cases.empty() || cases.back().z != z || cases.back().baseGraph != bg) {
                    cases.push_back({bg, z});
                }
            }
        }
    }
    return cases;
}

class LdpcGeometry : public ::testing::TestWithParam<GeometryCase> {};

// Every code word satisfies every lifted parity check of the published base graph, in every
// kernel, with and without fillers, and the kernels agree bit for bit.
TEST_P(LdpcGeometry, CodeWordsSatisfyAllParityChecksInEveryKernel) {
    const auto [bg, z] = GetParam();
    LDPC_Encoder encoder;
    ASSERT_TRUE(encoder.Initialize(bg, z));
    std::mt19937 rng(static_cast<unsigned>(1000 * bg + z));

    for (int fillers : {0, 1, 3 * z + 5}) {
        auto info = randomBits(static_cast<std::size_t>(encoder.K), rng);
        for (int i = 0; i < fillers; ++i) info[encoder.K - 1 - i] = -2;
        std::vector<int> reference;
        for (LdpcKernel kernel : availableKernels()) {
            SCOPED_TRACE(std::string(kernelName(kernel)) + " fillers " + std::to_string(fillers));
            auto in = info;
            std::vector<int> out(static_cast<std::size_t>(encoder.N), 7);
            ASSERT_TRUE(encoder.RunWith(kernel, in, out));
            EXPECT_EQ(failedChecks(bg, z, fullCodeWord(info, out, z)), 0);
            for (int i = 2 * z; i < encoder.K; ++i) {
                ASSERT_EQ(out[i - 2 * z], info[i]) << "systematic bit " << i;
                ASSERT_EQ(in[i], info[i] == -2 ? 0 : info[i]) << "input bit " << i;
            }
            if (reference.empty()) {
                reference = out;
            } else {
                EXPECT_EQ(out, reference);
            }
        }
    }
}

INSTANTIATE_TEST_SUITE_P(BothGraphsAllSets, LdpcGeometry, ::testing::ValuesIn(geometryCases()),
                         [](const auto& info) {
                             return "BG" + std::to_string(info.param.baseGraph + 1) + "_Z" +
                                    std::to_string(info.param.z);
                         });

TEST(LdpcEncoder, SizesFollowTheBaseGraph) {
    LDPC_Encoder encoder;
    ASSERT_TRUE(encoder.Initialize(1, 2));
    EXPECT_EQ(encoder.N, 100);
    EXPECT_EQ(encoder.K, 20);
    EXPECT_EQ(encoder.M, 84);
    EXPECT_EQ(encoder.SetIndex, 1);
    EXPECT_EQ(encoder.ParityRows.size(), 84u);
    EXPECT_EQ(encoder.InfoBits.size(), 20u);
    EXPECT_EQ(encoder.CodedBits.size(), 100u);

    ASSERT_TRUE(encoder.Initialize(0, 208));
    EXPECT_EQ(encoder.N, 66 * 208);
    EXPECT_EQ(encoder.K, 22 * 208);
    EXPECT_EQ(encoder.M, 46 * 208);
    EXPECT_EQ(encoder.SetIndex, 7);
    EXPECT_EQ(encoder.BaseGraph, 0);
}

TEST(LdpcEncoder, RefusesUnknownGraphsSizesAndLiftings) {
    LDPC_Encoder encoder;
    EXPECT_FALSE(encoder.Initialize(2, 2));
    EXPECT_EQ(encoder.Z, 0);
    EXPECT_THROW(encoder.Initialize(0, 17), std::invalid_argument);

    ASSERT_TRUE(encoder.Initialize(0, 4));
    std::vector<int> in(static_cast<std::size_t>(encoder.K + 1), 1);
    std::vector<int> out(static_cast<std::size_t>(encoder.N), 9);
    EXPECT_FALSE(encoder.Run(in, out));
    EXPECT_EQ(out, std::vector<int>(static_cast<std::size_t>(encoder.N), 9));
    in.resize(static_cast<std::size_t>(encoder.K));
    out.resize(static_cast<std::size_t>(encoder.N - 1));
    EXPECT_FALSE(encoder.Run(in, out));
}

TEST(LdpcEncoder, ArgumentFreeRunUsesTheMemberVectors) {
    LDPC_Encoder encoder;
    ASSERT_TRUE(encoder.Initialize(0, 12));
    std::mt19937 rng(5);
    encoder.InfoBits = randomBits(static_cast<std::size_t>(encoder.K), rng);
    auto in = encoder.InfoBits;
    std::vector<int> expected(static_cast<std::size_t>(encoder.N));
    ASSERT_TRUE(encoder.RunWith(LdpcKernel::List, in, expected));
    ASSERT_TRUE(encoder.Run());
    EXPECT_EQ(encoder.CodedBits, expected);
}

// Inputs outside 0/1/-2, or fillers where the systematic bits are never sent, are not
// meaningful code blocks; the packed kernels must still give what the list form gives.
TEST(LdpcEncoder, PackedKernelsDeferOddInputsToTheListForm) {
    LDPC_Encoder encoder;
    ASSERT_TRUE(encoder.Initialize(1, 16));
    std::mt19937 rng(9);
    // Odd values whose low byte or low half-word would read as 0, 1 or -2 if a kernel narrowed
    // by truncation; K is 160, so the places lie in both halves of a packed word and the tail.
    const int oddValues[] = {5, -1, 2, 254, 256, 0x10001, -0x10002, INT_MIN, INT_MAX};
    const int places[] = {50, 100, 150};
    const int variants = static_cast<int>(std::size(oddValues) * std::size(places)) + 1;
    for (int variant = 0; variant < variants; ++variant) {
        auto info = randomBits(static_cast<std::size_t>(encoder.K), rng);
        if (variant + 1 == variants) {
            info[3] = -2;
        } else {
            info[static_cast<std::size_t>(places[variant % std::size(places)])] =
                oddValues[static_cast<std::size_t>(variant) / std::size(places)];
        }
        auto listIn = info;
        std::vector<int> expected(static_cast<std::size_t>(encoder.N));
        ASSERT_TRUE(encoder.RunWith(LdpcKernel::List, listIn, expected));
        for (LdpcKernel kernel : availableKernels()) {
            auto in = info;
            std::vector<int> out(static_cast<std::size_t>(encoder.N));
            ASSERT_TRUE(encoder.RunWith(kernel, in, out));
            EXPECT_EQ(out, expected) << kernelName(kernel) << " variant " << variant;
            EXPECT_EQ(in, listIn);
        }
    }
}

// Published encoder vectors: the d sequence (code word without its first 2Z bits), fillers
// marked '-' in message and code word.
class LdpcVectorFile : public ::testing::TestWithParam<const char*> {};

TEST_P(LdpcVectorFile, EncoderReproducesTheReference) {
    NRSYNTH_REQUIRE_SHARED();
    const auto cases =
        readVectorCases(vectorPath(std::string("ldpc/") + GetParam()), [](const auto&) { return 2; });
    if (cases.empty()) GTEST_SKIP() << "vector file absent";
    const int bg = std::string(GetParam()).find("bg1") != std::string::npos ? 0 : 1;
    LDPC_Encoder encoder;
    for (const auto& c : cases) {
        ASSERT_EQ(c.lines.size(), 2u);
        const int z = std::stoi(c.header.at(0));
        if (z != encoder.Z) {
            ASSERT_TRUE(encoder.Initialize(bg, z));
        }
        auto in = parseBits(c.lines[0]);
        const auto expected = parseBits(c.lines[1]);
        ASSERT_EQ(static_cast<int>(in.size()), encoder.K);
        std::vector<int> out(static_cast<std::size_t>(encoder.N));
        ASSERT_TRUE(encoder.Run(in, out));
        ASSERT_EQ(out, expected) << "Z " << z;
    }
}

INSTANTIATE_TEST_SUITE_P(Published, LdpcVectorFile,
                         ::testing::Values("py5gphy_ldpc_bg1.txt", "py5gphy_ldpc_bg2.txt",
                                           "srsran4g_ldpc_bg1.txt", "srsran4g_ldpc_bg2.txt"),
                         [](const auto& info) {
                             std::string name = info.param;
                             for (auto& c : name) {
                                 if (!isalnum(static_cast<unsigned char>(c))) c = '_';
                             }
                             return name;
                         });

}  // namespace
