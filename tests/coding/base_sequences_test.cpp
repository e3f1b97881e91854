#include "coding/base_sequences.h"

#include <gtest/gtest.h>

#include <cmath>
#include <fstream>
#include <nlohmann/json.hpp>
#include <numbers>
#include <sstream>
#include <string>

#include "coding/constellation.h"
#include "coding/gold_sequence.h"
#include "coding/table_edition.h"
#include "test_support.h"
#include "vector_file.h"

namespace {

constexpr double kPi = std::numbers::pi;
const complex kJ(0, 1);

// Sets specVersion for one test and puts the load value back afterwards.
struct EditionGuard {
    explicit EditionGuard(int version) { Orvalis_NR::specVersion = version; }
    ~EditionGuard() { Orvalis_NR::specVersion = 152; }
};

nlohmann::json dataTable(const std::string& name) {
    std::ifstream in(nrsynth_test::sourceDir() / "data" / "3gpp" / name);
    return nlohmann::json::parse(in);
}

std::vector<int> tableRow(const nlohmann::json& doc, const std::string& key, int u) {
    const auto& row = doc.at(key).at(static_cast<std::size_t>(u));
    return {row.begin() + 1, row.end()};
}

bool isPrimeReference(int x) {
    if (x < 2) return false;
    for (int d = 2; d * d <= x; ++d)
        if (x % d == 0) return false;
    return true;
}

// Zadoff-Chu root of TS 38.211 clause 5.2.2.1 for the largest prime N below M.
std::vector<complex> zadoffChu(int M, int u, int v, double alpha) {
    int N = M - 1;
    while (!isPrimeReference(N)) --N;
    const double qBar = (u + 1.0) * N / 31.0;
    const int q = static_cast<int>(std::floor(qBar + 0.5)) +
                  v * ((static_cast<int>(std::floor(2 * qBar)) % 2) ? -1 : 1);
    std::vector<complex> r(static_cast<std::size_t>(M));
    for (int n = 0; n < M; ++n) {
        const int m = n % N;
        r[static_cast<std::size_t>(n)] =
            std::exp(-kJ * kPi * static_cast<double>(q) * static_cast<double>(m) * (m + 1.0) /
                     static_cast<double>(N)) *
            std::exp(kJ * alpha * static_cast<double>(n));
    }
    return r;
}

double maxDifference(const std::vector<complex>& a, const std::vector<complex>& b) {
    if (a.size() != b.size()) return 1e9;
    double worst = 0;
    for (std::size_t i = 0; i < a.size(); ++i) worst = std::max(worst, std::abs(a[i] - b[i]));
    return worst;
}

struct EditionCase {
    int version;
    const char* file;
    int M;
};

class LowPaprEdition : public ::testing::TestWithParam<EditionCase> {};

TEST_P(LowPaprEdition, RowsOfTheSelectedEditionWithShift) {
    const auto p = GetParam();
    EditionGuard guard(p.version);
    const auto doc = dataTable(p.file);
    const double alpha = 2 * kPi * 5 / 12;
    for (int u = 0; u < 30; ++u) {
        const auto phi = tableRow(doc, "M" + std::to_string(p.M), u);
        std::vector<complex> r;
        LowPaprSequenceGenerate(r, p.M, alpha, 0, u, 1);
        ASSERT_EQ(r.size(), static_cast<std::size_t>(p.M));
        std::vector<complex> expected(static_cast<std::size_t>(p.M));
        for (int n = 0; n < p.M; ++n)
            expected[static_cast<std::size_t>(n)] =
                std::exp(kJ * (phi[static_cast<std::size_t>(n)] * kPi / 4 + alpha * n));
        EXPECT_LT(maxDifference(r, expected), 1e-12) << "u=" << u;
    }
}

INSTANTIATE_TEST_SUITE_P(
    Tables, LowPaprEdition,
    ::testing::Values(
        EditionCase{152, "ts38211_tables_5_2_2_2_low_papr_type1.json", 6},
        EditionCase{151, "ts38211_tables_5_2_2_2_low_papr_type1.json", 6},
        EditionCase{152, "ts38211_tables_5_2_2_2_low_papr_type1.json", 12},
        EditionCase{152, "ts38211_tables_5_2_2_2_low_papr_type1.json", 18},
        EditionCase{152, "ts38211_tables_5_2_2_2_low_papr_type1.json", 24},
        EditionCase{151, "ts38211_tables_5_2_2_2_low_papr_type1_first_edition.json", 12},
        EditionCase{151, "ts38211_tables_5_2_2_2_low_papr_type1_first_edition.json", 18},
        EditionCase{151, "ts38211_tables_5_2_2_2_low_papr_type1_first_edition.json", 24}),
    [](const auto& info) {
        return "V" + std::to_string(info.param.version) + "_M" + std::to_string(info.param.M);
    });

std::vector<int> phasesOf(const std::vector<complex>& r) {
    std::vector<int> phi;
    for (const auto& x : r) phi.push_back(static_cast<int>(std::lround(std::arg(x) * 4 / kPi)) % 8);
    for (auto& p : phi) p = p > 4 ? p - 8 : p < -4 ? p + 8 : p;
    return phi;
}

TEST(LowPapr, FirstRowsOfBothEditionsAsPrinted) {
    std::vector<complex> r;
    LowPaprSequenceGenerate(r, 12, 0, 0, 0, 0);
    EXPECT_EQ(phasesOf(r), (std::vector<int>{-3, 1, -3, -3, -3, 3, -3, -1, 1, 1, 1, -3}));
    {
        EditionGuard guard(151);
        LowPaprSequenceGenerate(r, 12, 0, 0, 0, 0);
        // phase 4 (pi) would read as -4; none occurs in these tables.
        EXPECT_EQ(phasesOf(r), (std::vector<int>{1, -1, 3, 1, 1, -1, -1, -1, 1, 3, -3, 1}));
    }
}

TEST(LowPapr, LengthThirtyFollowsTheClosedFormulaAndIgnoresV) {
    for (int u : {0, 7, 29}) {
        std::vector<complex> r0, r1;
        LowPaprSequenceGenerate(r0, 30, 0.3, 0, u, 0);
        LowPaprSequenceGenerate(r1, 30, 0.3, 0, u, 1);
        EXPECT_EQ(r0, r1);
        for (int n = 0; n < 30; ++n) {
            const complex expected = std::exp(kJ * (0.3 * n)) *
                                     std::exp(-kJ * kPi * (u + 1.0) * (n + 1.0) * (n + 2.0) / 31.0);
            EXPECT_NEAR(std::abs(r0[static_cast<std::size_t>(n)] - expected), 0, 1e-12);
        }
    }
}

TEST(LowPapr, LengthsWithoutTableGiveThePureRamp) {
    std::vector<complex> r(3, complex(9, 9));
    LowPaprSequenceGenerate(r, 10, 0.25, 0, 3, 0);
    ASSERT_EQ(r.size(), 10u);
    for (int n = 0; n < 10; ++n)
        EXPECT_NEAR(std::abs(r[static_cast<std::size_t>(n)] - std::exp(kJ * (0.25 * n))), 0, 1e-15);
    LowPaprSequenceGenerate(r, 0, 0.25, 0, 3, 0);
    EXPECT_TRUE(r.empty());
    EXPECT_THROW(LowPaprSequenceGenerate(r, -1, 0, 0, 0, 0), std::invalid_argument);
    EXPECT_THROW(LowPaprSequenceGenerate(r, 12, 0, 0, 30, 0), std::out_of_range);
}

TEST(LowPapr, LongSequencesAreZadoffChuOfThePrimeBelow) {
    for (int M : {36, 48, 60, 72, 96, 120, 144, 192, 288, 600, 1200, 3276}) {
        for (int u : {0, 13, 29}) {
            for (int v : {0, 1}) {
                std::vector<complex> r;
                LowPaprSequenceGenerate(r, M, 0.7, 0, u, v);
                // The phase grows to about M^2, so equal formulas part by its rounding.
                EXPECT_LT(maxDifference(r, zadoffChu(M, u, v, 0.7)), 4e-15 * M * M)
                    << "M=" << M << " u=" << u << " v=" << v;
                for (const auto& x : r) ASSERT_NEAR(std::abs(x), 1.0, 1e-12);
            }
        }
    }
    // M of 36: N is 31 and elements 31..35 repeat the root, the ramp going on.
    std::vector<complex> r;
    LowPaprSequenceGenerate(r, 36, 0.5, 0, 4, 0);
    for (int n = 31; n < 36; ++n)
        EXPECT_NEAR(std::abs(r[static_cast<std::size_t>(n)] -
                             r[static_cast<std::size_t>(n - 31)] * std::exp(kJ * (0.5 * 31))),
                    0, 1e-12);
}

TEST(LowPapr, PublishedTypeOneVectors) {
    NRSYNTH_REQUIRE_SHARED();
    const auto path =
        nrsynth_test::sharedDir() / "testvectors" / "lowpapr" / "py5gphy_lowpapr_type1.txt";
    const auto cases = nrsynth_test::readVectorCases(
        path.string(), [](const auto& h) { return std::stoi(h.at(0)); });
    for (const auto& tc : cases) {
        const int M = std::stoi(tc.header.at(0));
        std::vector<complex> r;
        LowPaprSequenceGenerate(r, M, std::stod(tc.header.at(3)), 0, std::stoi(tc.header.at(1)),
                                std::stoi(tc.header.at(2)));
        std::vector<complex> expected;
        for (const auto& line : tc.lines) {
            std::istringstream words(line);
            double re = 0, im = 0;
            words >> re >> im;
            expected.emplace_back(re, im);
        }
        EXPECT_LT(maxDifference(r, expected), 1e-9) << "M=" << M;
    }
    EXPECT_EQ(cases.size(), 10u);
}

// x(n) = (1/sqrt(M)) sum_k r(k) exp(j 2 pi k n / M): undoes the scaled forward DFT.
std::vector<complex> timeSequence(const std::vector<complex>& r) {
    const auto M = r.size();
    std::vector<complex> x(M);
    for (std::size_t n = 0; n < M; ++n)
        for (std::size_t k = 0; k < M; ++k)
            x[n] +=
                r[k] *
                std::exp(kJ * (2 * kPi * static_cast<double>(k * n % M) / static_cast<double>(M)));
    for (auto& v : x) v /= std::sqrt(static_cast<double>(M));
    return x;
}

std::vector<complex> halfPi(BitSequence bits) {
    std::vector<complex> x(bits.size());
    HalfPiBPSK(bits, x);
    return x;
}

TEST(LowPaprType2, TableLengthsAreTheDftOfTheTableSequences) {
    const auto doc = dataTable("ts38211_tables_5_2_3_2_low_papr_type2.json");
    for (int u = 0; u < 30; ++u) {
        std::vector<complex> r;
        LowPapr2SequenceGenerate(r, 6, 1.0, 0, u, 1, 0);
        std::vector<complex> x6;
        for (int phi : tableRow(doc, "M6_phi", u)) x6.push_back(std::exp(kJ * (kPi * phi / 8)));
        EXPECT_LT(maxDifference(timeSequence(r), x6), 1e-12) << "M=6 u=" << u;
        for (int M : {12, 18, 24}) {
            LowPapr2SequenceGenerate(r, M, 0, 0, u, 0, 0);
            BitSequence bits;
            for (int b : tableRow(doc, "M" + std::to_string(M) + "_b", u))
                bits.push_back(static_cast<char>(b));
            EXPECT_LT(maxDifference(timeSequence(r), halfPi(bits)), 1e-12)
                << "M=" << M << " u=" << u;
            double energy = 0;
            for (const auto& v : r) energy += std::norm(v);
            EXPECT_NEAR(energy, M, 1e-9);
        }
    }
}

TEST(LowPaprType2, LongLengthsUseTheGoldSequence) {
    for (int M : {30, 36, 48, 60, 96, 180}) {
        const int cInit = 1000 + M;
        std::vector<complex> r;
        LowPapr2SequenceGenerate(r, M, 0, 0, 0, 0, cInit);
        BitSequence bits(static_cast<std::size_t>(M));
        PN_Generator(bits, M, cInit);
        EXPECT_LT(maxDifference(timeSequence(r), halfPi(bits)), 1e-11) << "M=" << M;
        // Same length again reuses the cached plan and gives the same result.
        std::vector<complex> again;
        LowPapr2SequenceGenerate(again, M, 0, 0, 0, 0, cInit);
        EXPECT_EQ(again, r);
    }
    std::vector<complex> zeros(2, complex(1, 1));
    LowPapr2SequenceGenerate(zeros, 10, 0, 0, 0, 0, 5);
    EXPECT_EQ(zeros, std::vector<complex>(10));
}

TEST(ZadoffChu, TableLengthsReadTheFirstEditionAndTheLteTable) {
    const auto first = dataTable("ts38211_tables_5_2_2_2_low_papr_type1_first_edition.json");
    const auto lte = dataTable("ts36211_tables_5_5_1_2_lte_low_papr.json");
    for (int u : {0, 11, 29}) {
        for (auto [M, doc, key] : {std::tuple{12, &first, "M12"}, std::tuple{24, &lte, "N24"}}) {
            std::vector<complex> r;
            ZC_Generator(r, M, 1, u, 0, 0.4, 0.5);  // s = 0.25
            const auto phi = tableRow(*doc, key, u);
            std::vector<complex> expected;
            for (int n = 0; n < M; ++n)
                expected.push_back(std::exp(kJ * (phi[static_cast<std::size_t>(n)] * kPi / 4)) *
                                   std::exp(kJ * ((n + 0.25) * 0.4)));
            EXPECT_LT(maxDifference(r, expected), 1e-12) << "M=" << M << " u=" << u;
        }
    }
    // Unlike the type-1 generator under the current edition, length 12 keeps the first edition.
    std::vector<complex> zc, lowPapr;
    ZC_Generator(zc, 12, 0, 0, 0, 0, 0);
    LowPaprSequenceGenerate(lowPapr, 12, 0, 0, 0, 0);
    EXPECT_GT(maxDifference(zc, lowPapr), 0.5);
}

TEST(ZadoffChu, LongLengthsAndTheHalfStep) {
    for (int M : {36, 37, 48, 96, 144, 1249}) {
        std::vector<complex> r;
        ZC_Generator(r, M, 0, 9, 1, 0.3, 0.0);
        EXPECT_LT(maxDifference(r, zadoffChu(M, 9, 1, 0.3)), 1e-9) << "M=" << M;
    }
    std::vector<complex> base, minusOne, plusThree;
    ZC_Generator(base, 48, 0, 2, 0, 0.6, 1.0);
    ZC_Generator(minusOne, 48, -1, 2, 0, 0.6, 1.0);  // s = -delta / 2
    ZC_Generator(plusThree, 48, 3, 2, 0, 0.6, 1.0);  // s = +delta / 2
    for (std::size_t n = 0; n < base.size(); ++n) {
        EXPECT_NEAR(std::abs(minusOne[n] - base[n] * std::exp(kJ * (-0.5 * 0.6))), 0, 1e-12);
        EXPECT_NEAR(std::abs(plusThree[n] - base[n] * std::exp(kJ * (0.5 * 0.6))), 0, 1e-12);
    }
    std::vector<complex> r;
    for (int M : {6, 18, 30}) {
        ZC_Generator(r, M, 0, 0, 0, 0.1, 0);
        EXPECT_EQ(r, std::vector<complex>(static_cast<std::size_t>(M))) << "M=" << M;
    }
    EXPECT_THROW(ZC_Generator(r, 1250, 0, 0, 0, 0, 0), std::out_of_range);
    EXPECT_THROW(ZC_Generator(r, 24, 0, -1, 0, 0, 0), std::out_of_range);
}

TEST(IsPrime, KeepsItsShortDivisorRange) {
    const std::pair<int, bool> cases[] = {
        {-7, false}, {0, false},  {1, false},  {2, true},    {3, true},    {4, true},
        {6, true},   {9, true},   {10, false}, {25, true},   {49, true},   {31, true},
        {35, true},  {21, false}, {121, true}, {1249, true}, {1251, false}};
    for (auto [x, expected] : cases) EXPECT_EQ(IsPrime(x), expected) << x;
}

}  // namespace
