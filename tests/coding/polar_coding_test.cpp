// Polar encoder: code length, frozen/information/parity sets and the encoded bits against the
// plain reading of TS 38.212 clause 5.3.1 in polar_reference.h, and the matrix form.

#include "coding/polar_coding.h"

#include <gtest/gtest.h>

#include <set>
#include <sstream>
#include <stdexcept>
#include <string>
#include <vector>

#include "coding/polar_mother_code.h"
#include "polar_reference.h"

using Orvalis_NR::PolarCoding;

namespace {

struct CodeLengthCase {
    int K, E, nMax, N;
};

class PolarCodeLength : public ::testing::TestWithParam<CodeLengthCase> {};

TEST_P(PolarCodeLength, MatchesWorkedValues) {
    const auto& p = GetParam();
    EXPECT_EQ(Orvalis_NR::polarCodeLength(p.K, p.E, p.nMax), p.N);
    EXPECT_EQ(polar_ref::codeLength(p.K, p.E, p.nMax), p.N);
}

// Worked by hand from clause 5.3.1.
INSTANTIATE_TEST_SUITE_P(
    Cases, PolarCodeLength,
    ::testing::Values(CodeLengthCase{56, 864, 9, 512},   // PBCH: n1 10, n2 9
                      CodeLengthCase{56, 864, 10, 512},  // n2 limits
                      CodeLengthCase{64, 100, 10, 128},  // 100 > 1.125*64: n1 7
                      CodeLengthCase{64, 200, 10, 256},
                      CodeLengthCase{40, 144, 10, 128},   // 144 <= 1.125*128, K/E < 9/16: n1 7
                      CodeLengthCase{90, 144, 10, 256},   // K/E 0.625: n1 8
                      CodeLengthCase{81, 144, 10, 256},   // K/E 0.5625 is not below: n1 8
                      CodeLengthCase{100, 400, 10, 512},  // UCI
                      CodeLengthCase{12, 20, 10, 32},     // n at least 5
                      CodeLengthCase{400, 8192, 10, 1024}, CodeLengthCase{140, 8192, 9, 512},
                      CodeLengthCase{3, 8000, 10, 32}));  // n2 5

// Cases (K, E) for one link direction. Downlink: nMax 9, interleaver, no parity bits. Uplink:
// nMax 10, no interleaver, nPC 3 with nPCwm 0 and 1 for small K, nPC 0 otherwise.
struct EncoderCase {
    int K, E, nMax, iIL, nPC, nPCwm;
};

std::string caseName(const ::testing::TestParamInfo<EncoderCase>& info) {
    const auto& p = info.param;
    std::ostringstream s;
    s << "K" << p.K << "_E" << p.E << "_nMax" << p.nMax << "_iIL" << p.iIL << "_nPC" << p.nPC
      << "_wm" << p.nPCwm;
    return s.str();
}

std::vector<EncoderCase> encoderCases() {
    std::vector<EncoderCase> cases;
    auto add = [&](int K, int E, int nMax, int iIL, int nPC, int nPCwm) {
        // Keep only codes that exist: enough positions remain for K + nPC bits.
        try {
            polar_ref::sets(K, E, nMax, nPC, nPCwm);
        } catch (const std::invalid_argument&) {
            return;
        }
        cases.push_back({K, E, nMax, iIL, nPC, nPCwm});
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

TEST_P(PolarEncoder, SetsMatchClause5312) {
    const auto& p = GetParam();
    const auto ref = polar_ref::sets(p.K, p.E, p.nMax, p.nPC, p.nPCwm);
    PolarCoding code;
    ASSERT_TRUE(code.Init(p.K, p.E, p.nMax, p.iIL, p.nPC, p.nPCwm));
    ASSERT_EQ(code.N, ref.N);
    EXPECT_EQ(code.InfoSet, ref.info);
    EXPECT_EQ(std::set<int>(code.FrozenSet.begin(), code.FrozenSet.end()), ref.frozen);
    ASSERT_EQ(code.Status.size(), static_cast<std::size_t>(ref.N));
    for (int n = 0; n < ref.N; ++n) {
        const bool info = std::count(ref.info.begin(), ref.info.end(), n) != 0;
        const int expected = ref.frozen.count(n) ? 1 : ref.parity.count(n) ? 6 : info ? 2 : 0;
        EXPECT_EQ(code.Status[n], expected) << "position " << n;
        if (expected == 0) {
            EXPECT_TRUE(ref.preFrozen.count(n)) << "position " << n;
        }
    }
}

TEST_P(PolarEncoder, EncodesLikeButterflyAndMatrix) {
    const auto& p = GetParam();
    PolarCoding code;
    ASSERT_TRUE(code.Init(p.K, p.E, p.nMax, p.iIL, p.nPC, p.nPCwm));
    std::mt19937 rng(static_cast<unsigned>(p.K * 10007 + p.E));
    for (int trial = 0; trial < 3; ++trial) {
        const auto c = polar_ref::randomBits(static_cast<std::size_t>(p.K), rng);
        BitSequence d(static_cast<std::size_t>(code.N), 7);
        ASSERT_TRUE(code.Encode(c, d));

        const auto u = polar_ref::encoderInput(c, p.E, p.nMax, p.iIL, p.nPC, p.nPCwm);
        EXPECT_EQ(code.U, u);
        EXPECT_EQ(d, polar_ref::butterfly(u));

        // The matrix form: d(j) = u . column j of G_N, modulo 2.
        BitSequence matrixForm(d.size());
        for (std::size_t j = 0; j < d.size(); ++j) {
            int sum = 0;
            for (std::size_t i = 0; i < u.size(); ++i) sum += u[i] * code.GeneratorColumns[j][i];
            matrixForm[j] = static_cast<char>(sum & 1);
        }
        EXPECT_EQ(d, matrixForm);
    }
}

INSTANTIATE_TEST_SUITE_P(Grid, PolarEncoder, ::testing::ValuesIn(encoderCases()), caseName);

TEST(PolarEncoderCases, GridCoversEveryFormAndSelection) {
    // The grid above is only worth its name when every rate-matching branch and parity form
    // actually occurs in it.
    std::set<std::string> seen;
    for (const auto& c : encoderCases()) {
        const int N = polar_ref::codeLength(c.K, c.E, c.nMax);
        const auto sel = polar_ref::selection(c.K, c.E, N);
        const std::string form = c.iIL ? "DL" : c.nPC ? "UL-PC" + std::to_string(c.nPCwm) : "UL";
        seen.insert(form + "/" + std::to_string(static_cast<int>(sel)));
        if (sel == polar_ref::Selection::Puncturing)
            seen.insert(4 * c.E >= 3 * N ? "punct>=3N/4" : "punct<3N/4");
    }
    for (const char* form : {"DL", "UL", "UL-PC0", "UL-PC1"})
        for (int sel = 0; sel < 3; ++sel)
            EXPECT_TRUE(seen.count(std::string(form) + "/" + std::to_string(sel)))
                << form << " selection " << sel;
    EXPECT_TRUE(seen.count("punct>=3N/4"));
    EXPECT_TRUE(seen.count("punct<3N/4"));
}

TEST(PolarGenerator, ColumnsAreTheKroneckerPower) {
    // G_N(i, j) of [1 0; 1 1] to the n-th Kronecker power is 1 exactly when the bits of j are a
    // subset of the bits of i.
    for (int E : {32, 64, 128, 256, 512, 1024}) {
        PolarCoding code;
        ASSERT_TRUE(code.Init(E / 8, E, 10, 0, 0, 0));  // n2 = log2 E
        ASSERT_EQ(code.N, E);
        ASSERT_EQ(code.GeneratorColumns.size(), static_cast<std::size_t>(E));
        int wrong = 0;
        for (int j = 0; j < E; ++j) {
            ASSERT_EQ(code.GeneratorColumns[j].size(), static_cast<std::size_t>(E));
            for (int i = 0; i < E; ++i) wrong += code.GeneratorColumns[j][i] != ((i & j) == j);
        }
        EXPECT_EQ(wrong, 0) << "N " << E;
    }
}

TEST(PolarEncoderInterleaver, PatternIsTheTableSubsequence) {
    PolarCoding code;
    ASSERT_TRUE(code.Init(164, 864, 9, 1, 0, 0));
    EXPECT_EQ(code.InterleaverPattern, polar_ref::interleavingPattern());
    EXPECT_EQ(code.PiMax, polar_ref::interleavingPattern());
    ASSERT_TRUE(code.Init(56, 864, 9, 1, 0, 0));
    // Table 5.3.1.1-1 entries of at least 108, less 108, in table order.
    const std::vector<int> expected = {0,  2,  3,  5,  7,  10, 11, 12, 14, 15, 18, 19, 21, 24,
                                       26, 30, 31, 32, 1,  4,  6,  8,  13, 16, 20, 22, 25, 27,
                                       33, 9,  17, 23, 28, 34, 29, 35, 36, 37, 38, 39, 40, 41,
                                       42, 43, 44, 45, 46, 47, 48, 49, 50, 51, 52, 53, 54, 55};
    EXPECT_EQ(code.InterleaverPattern, expected);
    ASSERT_TRUE(code.Init(56, 864, 9, 0, 0, 0));
    for (int k = 0; k < 56; ++k) EXPECT_EQ(code.InterleaverPattern[k], k);
}

TEST(PolarEncoderErrors, WrongOutputSizeIsRefused) {
    PolarCoding code;
    ASSERT_TRUE(code.Init(56, 864, 9, 1, 0, 0));
    const BitSequence c(56, 1);
    for (std::size_t size : {0u, 511u, 513u, 864u}) {
        BitSequence d(size, 5);
        code.ErrorMessage.clear();
        EXPECT_FALSE(code.Encode(c, d));
        EXPECT_EQ(code.ErrorMessage, "u size error");
        EXPECT_EQ(d, BitSequence(size, 5));
    }
    BitSequence d(512);
    EXPECT_TRUE(code.Encode(c, d));
    EXPECT_TRUE(code.Decode());
}

TEST(PolarEncoderErrors, ImpossibleParametersThrow) {
    PolarCoding code;
    EXPECT_THROW(code.Init(0, 100, 9, 1, 0, 0), std::invalid_argument);
    EXPECT_THROW(code.Init(40, 0, 9, 1, 0, 0), std::invalid_argument);
    EXPECT_THROW(code.Init(165, 864, 9, 1, 0, 0), std::invalid_argument);  // interleaver max
    EXPECT_THROW(code.Init(20, 60, 10, 0, 3, 4), std::invalid_argument);   // nPCwm > nPC
    EXPECT_THROW(code.Init(20, 60, 10, 0, -1, 0), std::invalid_argument);
    EXPECT_THROW(code.Init(60, 40, 10, 0, 0, 0), std::invalid_argument);      // K > E
    EXPECT_THROW(code.Init(2000, 8192, 11, 0, 0, 0), std::invalid_argument);  // N 2048
    EXPECT_NO_THROW(code.Init(165, 864, 10, 0, 0, 0));
    ASSERT_TRUE(code.Init(56, 864, 9, 1, 0, 0));
    BitSequence d(512);
    EXPECT_THROW(code.Encode(BitSequence(55, 0), d), std::invalid_argument);
}

// The tables read from text: the same "index value" pairs as the JSON data give the same code,
// an altered text gives an altered code, and a broken text is refused.
std::string pairsText(const std::vector<int>& values) {
    std::ostringstream s;
    for (std::size_t i = 0; i < values.size(); ++i) s << i << ' ' << values[i] << '\n';
    return s.str();
}

TEST(PolarTablesText, TextFormReadsTheSameTables) {
    PolarCoding compiled, text;
    text.Table5311Text = pairsText(polar_ref::interleavingPattern());
    text.Table5312Text = pairsText(polar_ref::polarSequence());
    text.Table54111Text = pairsText(polar_ref::subBlockPattern());
    ASSERT_TRUE(compiled.Init(56, 300, 9, 1, 0, 0));
    ASSERT_TRUE(text.Init(56, 300, 9, 1, 0, 0));
    EXPECT_EQ(text.InfoSet, compiled.InfoSet);
    EXPECT_EQ(text.InterleaverPattern, compiled.InterleaverPattern);
    EXPECT_EQ(text.SubBlockPattern, polar_ref::subBlockPattern());

    std::vector<int> q, w;
    compiled.ReadTable5312(q, w);
    EXPECT_EQ(q, polar_ref::polarSequence());
    for (int W = 0; W < 1024; ++W) EXPECT_EQ(w[q[W]], W);
}

TEST(PolarTablesText, AlteredTextChangesTheCode) {
    auto sequence = polar_ref::polarSequence();
    PolarCoding code;
    ASSERT_TRUE(code.Init(20, 64, 10, 0, 0, 0));
    const int leastReliableInfo = code.InfoSet.front();
    const int mostReliableFrozen = code.FrozenSet.back();
    // Swap the two positions in the sequence: the information set follows the text.
    auto a = std::find(sequence.begin(), sequence.end(), leastReliableInfo);
    auto b = std::find(sequence.begin(), sequence.end(), mostReliableFrozen);
    std::iter_swap(a, b);
    code.Table5312Text = pairsText(sequence);
    ASSERT_TRUE(code.Init(20, 64, 10, 0, 0, 0));
    EXPECT_EQ(code.InfoSet.front(), mostReliableFrozen);
    EXPECT_EQ(code.Status[leastReliableInfo], 1);
}

TEST(PolarTablesText, BrokenTextThrows) {
    PolarCoding code;
    code.Table54111Text = "0 0 1";
    EXPECT_THROW(code.Init(20, 64, 10, 0, 0, 0), std::invalid_argument);
    code.Table54111Text = pairsText(std::vector<int>(31, 0));  // entry 31 missing
    EXPECT_THROW(code.Init(20, 64, 10, 0, 0, 0), std::invalid_argument);
    code.Table54111Text.clear();
    code.Table5311Text = "0 x";
    EXPECT_THROW(code.Init(20, 64, 10, 0, 0, 0), std::invalid_argument);
    code.Table5311Text.clear();
    auto sequence = polar_ref::polarSequence();
    sequence[5] = sequence[6];  // not a permutation
    code.Table5312Text = pairsText(sequence);
    EXPECT_THROW(code.Init(20, 64, 10, 0, 0, 0), std::invalid_argument);
}

}  // namespace
