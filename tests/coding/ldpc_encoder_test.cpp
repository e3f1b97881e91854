#include "coding/ldpc_encoder.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <bit>
#include <climits>
#include <iterator>
#include <random>
#include <string>
#include <vector>

#include "common/packed_bits.h"
#include "vector_file.h"

namespace {

using Orvalis_NR::LDPC_Encoder;
using Orvalis_NR::LdpcKernel;
using namespace nrsynth_test;

// Base graph 1 (bg 0) or 2 (bg 1) read straight from the committed JSON in data/3gpp as rows
// [row, column, shift of each of the eight sets], apart from the generated tables.
const nlohmann::json& jsonBaseGraph(int bg) {
    static const auto bg1 = dataTable("ts38212_table_5_3_2_2_ldpc_bg1.json").at("rows");
    static const auto bg2 = dataTable("ts38212_table_5_3_2_3_ldpc_bg2.json").at("rows");
    return bg == 0 ? bg1 : bg2;
}

// Number of unsatisfied lifted parity checks of the code word made of the encoder input
// (fillers read as 0) and its d sequence output.
int failedChecks(int bg, int z, const std::vector<int>& in, const std::vector<int>& d) {
    std::vector<int> word(d.size() + 2 * static_cast<std::size_t>(z), 0);
    for (std::size_t i = 0; i < in.size(); ++i) word[i] = in[i] == -2 ? 0 : in[i];
    for (std::size_t i = in.size() - 2 * z; i < d.size(); ++i) word[i + 2 * z] = d[i];
    // Z = a 2^j of TS 38.212 Table 5.3.2-1, a in {2, 3, 5, .., 15}: set (a' - 1) / 2 with a'
    // the odd part of Z.
    const int set = ((z >> std::countr_zero(static_cast<unsigned>(z))) - 1) / 2;
    std::vector<int> sums(static_cast<std::size_t>((bg == 0 ? 46 : 42) * z), 0);
    for (const auto& e : jsonBaseGraph(bg)) {
        const int row = e.at(0), column = e.at(1), shift = e.at(2 + set).get<int>() % z;
        for (int r = 0; r < z; ++r) sums[row * z + r] ^= word[column * z + (shift + r) % z] & 1;
    }
    return static_cast<int>(std::count(sums.begin(), sums.end(), 1));
}

std::vector<LdpcKernel> availableKernels() {
    std::vector<LdpcKernel> kernels;
    for (auto k : {LdpcKernel::List, LdpcKernel::Portable, LdpcKernel::Avx2})
        if (Orvalis_NR::ldpcKernelSupported(k)) kernels.push_back(k);
    return kernels;
}

const char* kernelName(LdpcKernel k) {
    return k == LdpcKernel::List ? "list" : k == LdpcKernel::Portable ? "portable" : "avx2";
}

struct GeometryCase {
    int baseGraph;
    int z;
};

// Per lifting set the smallest and the largest size, for both graphs.
std::vector<GeometryCase> geometryCases() {
    std::vector<GeometryCase> cases;
    for (int bg = 0; bg < 2; ++bg) {
        for (int a : {2, 3, 5, 7, 9, 11, 13, 15}) {
            int z = a;
            while (2 * z <= 384) z *= 2;
            cases.push_back({bg, a});
            cases.push_back({bg, z});
        }
    }
    return cases;
}

class LdpcGeometry : public ::testing::TestWithParam<GeometryCase> {};

// Every code word satisfies every lifted parity check of the published base graph, in every
// kernel, with and without fillers (which come out as -2), and the kernels and the packed
// form agree bit for bit.
TEST_P(LdpcGeometry, CodeWordsSatisfyAllParityChecksInEveryKernel) {
    const auto [bg, z] = GetParam();
    ASSERT_EQ(jsonBaseGraph(bg).size(), bg == 0 ? 316u : 197u);  // the oracle is loaded
    LDPC_Encoder encoder;
    ASSERT_TRUE(encoder.Initialize(bg, z));
    std::mt19937 rng(static_cast<unsigned>(1000 * bg + z));

    for (int fillers : {0, 1, 3 * z + 5}) {
        auto info = randomBits<int>(static_cast<std::size_t>(encoder.K), rng);
        for (int i = 0; i < fillers; ++i) info[encoder.K - 1 - i] = -2;
        std::vector<int> reference;
        for (LdpcKernel kernel : availableKernels()) {
            SCOPED_TRACE(std::string(kernelName(kernel)) + " fillers " + std::to_string(fillers));
            auto in = info;
            std::vector<int> out(static_cast<std::size_t>(encoder.N), 7);
            ASSERT_TRUE(encoder.RunWith(kernel, in, out));
            EXPECT_EQ(failedChecks(bg, z, info, out), 0);
            for (int i = 2 * z; i < encoder.K; ++i) {
                ASSERT_EQ(out[i - 2 * z], info[i]) << "systematic bit " << i;
                ASSERT_EQ(in[i], info[i] == -2 ? 0 : info[i]) << "input bit " << i;
            }
            if (reference.empty()) reference = out;
            EXPECT_EQ(out, reference);
        }
        // The packed form: the same bits, fillers as 0, nothing written past N.
        std::vector<std::uint64_t> packedIn((encoder.K + 63) / 64, ~std::uint64_t{0});
        Orvalis_NR::clearBits(packedIn.data(), 0, static_cast<std::size_t>(encoder.K));
        for (int i = 0; i < encoder.K; ++i)
            if (info[i] == 1) packedIn[i / 64] |= std::uint64_t{1} << (i % 64);
        const std::size_t outWords = (encoder.N + 63) / 64;
        std::vector<std::uint64_t> packedOut(outWords + 1, 0x5A5A5A5A5A5A5A5Aull);
        encoder.RunPacked(packedIn.data(), packedOut.data());
        for (int i = 0; i < encoder.N; ++i)
            ASSERT_EQ(static_cast<int>((packedOut[i / 64] >> (i % 64)) & 1u), reference[i] == -2 ? 0 : reference[i])
                << "packed output " << i << " fillers " << fillers;
        EXPECT_EQ(packedOut[outWords], 0x5A5A5A5A5A5A5A5Aull);
    }
}

INSTANTIATE_TEST_SUITE_P(BothGraphsAllSets, LdpcGeometry, ::testing::ValuesIn(geometryCases()),
                         [](const auto& info) {
                             return "BG" + std::to_string(info.param.baseGraph + 1) + "_Z" +
                                    std::to_string(info.param.z);
                         });

TEST(LdpcEncoder, RefusesUnknownGraphsSizesAndLiftings) {
    LDPC_Encoder encoder;
    EXPECT_FALSE(encoder.Initialize(2, 2));
    EXPECT_EQ(nrsynth_test::failureText([&] { encoder.Initialize(0, 17); }),
              "The LDPC lifting size is not one of TS 38.212 Table 5.3.2-1. Z 17");
    ASSERT_TRUE(encoder.Initialize(0, 4));
    std::vector<int> in(static_cast<std::size_t>(encoder.K + 1), 1), out(encoder.N, 9);
    EXPECT_FALSE(encoder.Run(in, out));
    EXPECT_EQ(out, std::vector<int>(static_cast<std::size_t>(encoder.N), 9));
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
        auto info = randomBits<int>(static_cast<std::size_t>(encoder.K), rng);
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
    const std::string name = GetParam();
    const auto cases = readVectorCases("ldpc/" + name + ".txt", [](const auto&) { return 2; });
    ASSERT_FALSE(cases.empty());
    const int bg = name.find("bg1") != std::string::npos ? 0 : 1;
    LDPC_Encoder encoder;
    for (const auto& c : cases) {
        const int z = std::stoi(c.header.at(0));
        ASSERT_TRUE(z == encoder.Z || encoder.Initialize(bg, z)) << "Z " << z;
        auto in = bitsOf<int>(c.lines[0]);
        ASSERT_EQ(static_cast<int>(in.size()), encoder.K);
        std::vector<int> out(static_cast<std::size_t>(encoder.N));
        ASSERT_TRUE(encoder.Run(in, out));
        ASSERT_EQ(out, bitsOf<int>(c.lines[1])) << "Z " << z;
    }
}

INSTANTIATE_TEST_SUITE_P(Published, LdpcVectorFile,
                         ::testing::Values("py5gphy_ldpc_bg1", "py5gphy_ldpc_bg2",
                                           "srsran4g_ldpc_bg1", "srsran4g_ldpc_bg2"));

}  // namespace
