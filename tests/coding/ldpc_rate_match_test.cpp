#include "coding/ldpc_rate_match.h"

#include <gtest/gtest.h>

#include <array>
#include <cmath>
#include <cstdint>
#include <random>
#include <stdexcept>
#include <string>
#include <tuple>
#include <vector>

#include "coding/ldpc_encoder.h"
#include "coding/ldpc_symbol_rate_match.h"
#include "common/packed_bits.h"
#include "test_support.h"
#include "vector_file.h"

namespace {

using Orvalis_NR::LDPC_RateMatch;
using namespace nrsynth_test;

// TS 38.212 clause 5.4.2 written out directly: k0 of Table 5.4.2.1-2, the bit selection loop
// of clause 5.4.2.1 and the interleaver of clause 5.4.2.2, onto a copy of `f`.
std::vector<int> directRateMatch(const std::vector<int>& d, int bg, int z, int ncb, int e, int rv,
                                 int qm, std::vector<int> f) {
    const double numerator[2][4] = {{0, 17, 33, 56}, {0, 13, 25, 43}};
    const double denominator = bg == 0 ? 66 : 50;
    const int k0 = static_cast<int>(std::floor(numerator[bg][rv] * ncb / (denominator * z))) * z;
    std::vector<int> selected;
    for (int j = 0; static_cast<int>(selected.size()) < e; ++j) {
        const int bit = d[(k0 + j) % ncb];
        if (bit != -2) selected.push_back(bit);
    }
    for (int j = 0; j < e / qm; ++j)
        for (int i = 0; i < qm; ++i) f[i + j * qm] = selected[i * (e / qm) + j];
    return f;
}

// (base graph index, rv, Qm)
class LdpcRateMatchDirect : public ::testing::TestWithParam<std::tuple<int, int, int>> {};

// A real code word with fillers, full and limited circular buffers, outputs shorter than the
// buffer, as long, with repetition, and of lengths Qm does not divide.
TEST_P(LdpcRateMatchDirect, EqualsTheClauseForEveryBufferAndLength) {
    const auto [bg, rv, qm] = GetParam();
    const int z = bg == 0 ? 26 : 36;
    Orvalis_NR::LDPC_Encoder encoder;
    ASSERT_TRUE(encoder.Initialize(bg, z));
    std::mt19937 rng(static_cast<unsigned>(100 * bg + 10 * rv + qm));
    auto info = randomBits<int>(static_cast<std::size_t>(encoder.K), rng);
    const int fillers = 2 * z + 3;
    for (int i = 0; i < fillers; ++i) info[encoder.K - 1 - i] = -2;
    std::vector<int> d(static_cast<std::size_t>(encoder.N));
    ASSERT_TRUE(encoder.Run(info, d));

    const int n = encoder.N;
    for (int ncb : {n, n * 2 / 3, 10 * z + 1}) {
        for (int e : {ncb / 3, ncb - fillers, ncb - fillers + 1, 2 * ncb + 7, qm * 37 + 1}) {
            SCOPED_TRACE("Ncb " + std::to_string(ncb) + " E " + std::to_string(e));
            LDPC_RateMatch rm;
            ASSERT_TRUE(rm.Initialize(bg == 0 ? LDPC_BG1 : LDPC_BG2, z, 1, ncb, n, e, rv, qm));
            std::vector<int> f(static_cast<std::size_t>(e), 7);
            ASSERT_TRUE(rm.Run(d, f));
            EXPECT_EQ(f, directRateMatch(d, bg, z, ncb, e, rv, qm, std::vector<int>(e, 7)));

            // The pattern form skips -1 instead of -2 and gives the same selection.
            auto marked = d;
            for (auto& v : marked) v = v == -2 ? -1 : v;
            std::vector<int> pattern(static_cast<std::size_t>(e), 7);
            ASSERT_TRUE(rm.GetPattern(marked.data(), pattern.data()));
            EXPECT_EQ(pattern, f);
        }
    }
}

INSTANTIATE_TEST_SUITE_P(AllRvAndQm, LdpcRateMatchDirect,
                         ::testing::Combine(::testing::Values(0, 1), ::testing::Range(0, 4),
                                            ::testing::Values(1, 2, 4, 6, 8)));

// (base graph index, rv, Qm): the symbol form against the clause for every modulation order,
// 8PSK and 1024QAM included.
class LdpcSymbolRateMatchDirect : public ::testing::TestWithParam<std::tuple<int, int, int>> {};

// Fillers inside and at the end of limited buffers, k0 inside the filler run, outputs of
// lengths that are not whole words, shorter than the buffer and wrapping it; int and packed
// buffers alike.
TEST_P(LdpcSymbolRateMatchDirect, SymbolsCarryTheInterleavedBits) {
    const auto [bg, rv, qm] = GetParam();
    const int z = bg == 0 ? 26 : 36;
    Orvalis_NR::LDPC_Encoder encoder;
    ASSERT_TRUE(encoder.Initialize(bg, z));
    std::mt19937 rng(static_cast<unsigned>(300 + 100 * bg + 10 * rv + qm));
    Orvalis_NR::LdpcSymbolRateMatch fast;
    for (int kPrime : {encoder.K, encoder.K - 5 * z - 3, 2 * z + 1}) {
        auto info = randomBits<int>(static_cast<std::size_t>(encoder.K), rng);
        for (int i = kPrime; i < encoder.K; ++i) info[static_cast<std::size_t>(i)] = -2;
        std::vector<int> d(static_cast<std::size_t>(encoder.N));
        ASSERT_TRUE(encoder.Run(info, d));
        const int n = encoder.N;
        std::vector<std::uint64_t> packed((n + 63) / 64);
        Orvalis_NR::packBits(d.data(), d.size(), packed.data());
        for (int i = 0; i < n; ++i)
            if (d[static_cast<std::size_t>(i)] == -2) packed[i / 64] &= ~(std::uint64_t{1} << (i % 64));
        for (int ncb : {n, encoder.K - 2 * z - 1, kPrime - 2 * z + 3}) {
            for (int symbols : {1, 7, 8, 9, 333, (2 * ncb) / qm + 5}) {
                const int e = symbols * qm;
                SCOPED_TRACE("K' " + std::to_string(kPrime) + " Ncb " + std::to_string(ncb) + " E " + std::to_string(e));
                const auto f = directRateMatch(d, bg, z, ncb, e, rv, qm, std::vector<int>(static_cast<std::size_t>(e)));
                LDPC_RateMatch geometry;  // k0 from the direct form's table, qm only for the check
                ASSERT_TRUE(geometry.Initialize(bg == 0 ? LDPC_BG1 : LDPC_BG2, z, 1, ncb, n, e, rv, 1));
                Orvalis_NR::LdpcCircularBuffer buffer{d.data(), ncb, geometry.K0, kPrime - 2 * z, encoder.K - 2 * z};
                std::vector<std::uint16_t> out(static_cast<std::size_t>(symbols) + 1, 0xFFFF);
                fast.run(buffer, e, qm, out.data());
                for (int j = 0; j < symbols; ++j) {
                    unsigned expected = 0;
                    for (int i = 0; i < qm; ++i) expected |= static_cast<unsigned>(f[static_cast<std::size_t>(j * qm + i)]) << i;
                    ASSERT_EQ(out[static_cast<std::size_t>(j)], expected) << "symbol " << j;
                }
                EXPECT_EQ(out.back(), 0xFFFF);  // nothing past the last symbol
                // The packed buffer, fillers 0 as the packed encoder leaves them.
                const Orvalis_NR::LdpcPackedCircularBuffer packedBuffer{packed.data(), ncb, geometry.K0, kPrime - 2 * z,
                                                                        encoder.K - 2 * z};
                std::vector<std::uint16_t> fromPacked(out.size(), 0xFFFF);
                fast.run(packedBuffer, e, qm, fromPacked.data());
                EXPECT_EQ(fromPacked, out);
            }
        }
    }
}

INSTANTIATE_TEST_SUITE_P(AllRvAndQm, LdpcSymbolRateMatchDirect,
                         ::testing::Combine(::testing::Values(0, 1), ::testing::Range(0, 4),
                                            ::testing::Values(1, 2, 3, 4, 6, 8, 10)));

TEST(LdpcRateMatch, Refusals) {
    LDPC_RateMatch rm;
    EXPECT_FALSE(rm.Initialize(LDPC_BG1, 384, 1, 25344, 25344, 100, 4, 6));  // rv
    EXPECT_FALSE(rm.Initialize(LDPC_BG1, 384, 1, 25344, 25344, 100, 1, 3));  // Qm

    ASSERT_TRUE(rm.Initialize(LDPC_BG2, 2, 1, 100, 100, 10, 0, 2));
    std::vector<int> d(99, 1), f(10, 0);
    EXPECT_FALSE(rm.Run(d, f));
    // A buffer of fillers is reported instead of looping forever; Ncb above N at set-up.
    d.assign(100, -2);
    EXPECT_EQ(failureText([&] { rm.Run(d, f); }),
              "The LDPC circular buffer holds only filler bits: the selection would never end. "
              "Ncb 100");
    Orvalis_NR::LdpcSymbolRateMatch fast;
    std::vector<std::uint16_t> symbols(5);
    const Orvalis_NR::LdpcCircularBuffer fillers{d.data(), 100, 30, 0, 100};
    EXPECT_EQ(failureText([&] { fast.run(fillers, 10, 2, symbols.data()); }),
              "The LDPC circular buffer holds only filler bits: the selection would never end. "
              "Ncb 100");
    EXPECT_EQ(failureText([&] { rm.Initialize(LDPC_BG2, 2, 1, 120, 100, 10, 0, 2); }),
              "The LDPC circular buffer must hold 1 to N bits. Ncb 120, N 100");
}

TEST(LdpcRateMatch, RedundancyVersionStartsStayInsideBuffersOfAnySize) {
    // w Ncb passes 2^31 from Ncb of about 38 million on (w = 56 for rv 3 of graph 1). The start
    // k0 of Table 5.4.2.1-2 is a multiple of Z below Ncb, at the fraction w / m of the buffer.
    for (int ncb : {38347923, 50000000, 2147483647}) {
        for (int rv = 1; rv < 4; ++rv) {
            for (int bg : {0, 1}) {
                const long long w = (bg == 0 ? std::array{17, 33, 56} : std::array{13, 25, 43})[rv - 1];
                const long long m = bg == 0 ? 66 : 50;
                LDPC_RateMatch rm;
                ASSERT_TRUE(rm.Initialize(bg == 0 ? LDPC_BG1 : LDPC_BG2, 384, 1, ncb, ncb, 1, rv, 2));
                // k0 / Ncb <= w / m < (k0 + Z) / Ncb, in exact integers.
                EXPECT_EQ(rm.K0 % 384, 0);
                EXPECT_LE(rm.K0 * m, w * ncb);
                EXPECT_GT((rm.K0 + 384LL) * m, w * ncb) << "Ncb " << ncb << " rv " << rv;
            }
        }
    }
}

TEST(LdpcRateMatch, PublishedSelectionAndInterleavingVectors) {
    NRSYNTH_REQUIRE_SHARED();
    const auto cases =
        readVectorCases("ldpc_ratematch/py5gphy_ldpc_ratematch.txt", [](auto&) { return 2; });
    ASSERT_FALSE(cases.empty());
    for (const auto& c : cases) {
        const int ncb = std::stoi(c.header.at(0));
        const int e = std::stoi(c.header.at(1));
        const int qm = std::stoi(c.header.at(2));
        LDPC_RateMatch rm;
        ASSERT_TRUE(rm.Initialize(LDPC_BG1, 2, 1, ncb, ncb, e, 0, qm));
        rm.K0 = std::stoi(c.header.at(3));  // the vectors state k0 itself, not rv
        auto d = bitsOf<int>(c.lines.at(0));
        std::vector<int> f(static_cast<std::size_t>(e));
        ASSERT_TRUE(rm.Run(d, f));
        EXPECT_EQ(f, bitsOf<int>(c.lines.at(1))) << "Ncb " << ncb << " E " << e << " Qm " << qm;
    }
}

}  // namespace
