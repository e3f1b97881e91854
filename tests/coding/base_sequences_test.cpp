#include "coding/base_sequences.h"

#include <gtest/gtest.h>

#include <cmath>
#include <numbers>
#include <string>
#include <tuple>

#include "coding/constellation.h"
#include "coding/gold_sequence.h"
#include "coding/table_edition.h"
#include "vector_file.h"

namespace {

constexpr double kPi = std::numbers::pi;
const complex kJ(0, 1);

// Selects the table edition for one test.
struct EditionGuard {
    explicit EditionGuard(int version) { Orvalis_NR::specVersion = version; }
    ~EditionGuard() { Orvalis_NR::specVersion = 152; }
};

// Row u of a table in data/3gpp, without its leading index.
std::vector<int> tableRow(const std::string& file, const std::string& key, int u) {
    const auto row = nrsynth_test::dataTable(file).at(key).at(static_cast<std::size_t>(u));
    return {row.begin() + 1, row.end()};
}

// Zadoff-Chu root of TS 38.211 clause 5.2.2.1 for the largest prime N below M.
std::vector<complex> zadoffChu(int M, int u, int v, double alpha) {
    auto prime = [](int x) {
        for (int d = 2; d * d <= x; ++d)
            if (x % d == 0) return false;
        return x >= 2;
    };
    int N = M - 1;
    while (!prime(N)) --N;
    const double qBar = (u + 1.0) * N / 31.0;
    const int q = static_cast<int>(std::floor(qBar + 0.5)) +
                  v * ((static_cast<int>(std::floor(2 * qBar)) % 2) ? -1 : 1);
    std::vector<complex> r;
    for (int n = 0; n < M; ++n)
        r.push_back(std::exp(-kJ * kPi * double(q) * double(n % N) * (n % N + 1.0) / double(N)) *
                    std::exp(kJ * alpha * double(n)));
    return r;
}

double maxDifference(const std::vector<complex>& a, const std::vector<complex>& b) {
    if (a.size() != b.size()) return 1e9;
    double worst = 0;
    for (std::size_t i = 0; i < a.size(); ++i) worst = std::max(worst, std::abs(a[i] - b[i]));
    return worst;
}

const char* const kType1 = "ts38211_tables_5_2_2_2_low_papr_type1.json";
const char* const kType1First = "ts38211_tables_5_2_2_2_low_papr_type1_first_edition.json";

// (edition, M): lengths 12 to 24 read the first-edition tables under edition 151.
class LowPaprEdition : public ::testing::TestWithParam<std::tuple<int, int>> {};

TEST_P(LowPaprEdition, RowsOfTheSelectedEditionWithShift) {
    const auto [version, M] = GetParam();
    EditionGuard guard(version);
    const double alpha = 2 * kPi * 5 / 12;
    for (int u = 0; u < 30; ++u) {
        const auto phi =
            tableRow(version == 151 && M > 6 ? kType1First : kType1, "M" + std::to_string(M), u);
        std::vector<complex> r, expected;
        LowPaprSequenceGenerate(r, M, alpha, 0, u, 1);
        for (int n = 0; n < M; ++n)
            expected.push_back(
                std::exp(kJ * (phi[static_cast<std::size_t>(n)] * kPi / 4 + alpha * n)));
        EXPECT_LT(maxDifference(r, expected), 1e-12) << "u=" << u;
    }
}

INSTANTIATE_TEST_SUITE_P(Tables, LowPaprEdition,
                         ::testing::Combine(::testing::Values(151, 152),
                                            ::testing::Values(6, 12, 18, 24)));

TEST(LowPapr, LengthsBeyondTheTables) {
    std::vector<complex> r, expected;
    LowPaprSequenceGenerate(r, 30, 0.3, 0, 29, 1);  // 30: the closed formula
    for (int n = 0; n < 30; ++n)
        expected.push_back(std::exp(kJ * (0.3 * n)) *
                           std::exp(-kJ * kPi * 30.0 * (n + 1.0) * (n + 2.0) / 31.0));
    EXPECT_LT(maxDifference(r, expected), 1e-12);
    for (int M : {36, 144, 3276}) {  // Zadoff-Chu
        for (int v : {0, 1}) {
            LowPaprSequenceGenerate(r, M, 0.7, 0, 13, v);
            // The phase grows to about M^2, so equal formulas part by its rounding.
            EXPECT_LT(maxDifference(r, zadoffChu(M, 13, v, 0.7)), 4e-15 * M * M)
                << "M=" << M << " v=" << v;
        }
    }
    EXPECT_THROW(LowPaprSequenceGenerate(r, -1, 0, 0, 0, 0), std::invalid_argument);
    EXPECT_THROW(LowPaprSequenceGenerate(r, 12, 0, 0, 30, 0), std::out_of_range);
}

TEST(LowPapr, PublishedTypeOneVectors) {
    NRSYNTH_REQUIRE_SHARED();
    const auto cases = nrsynth_test::readVectorCases(
        "lowpapr/py5gphy_lowpapr_type1.txt", [](const auto& h) { return std::stoi(h.at(0)); });
    for (const auto& tc : cases) {
        const int M = std::stoi(tc.header.at(0));
        std::vector<complex> r, expected;
        LowPaprSequenceGenerate(r, M, std::stod(tc.header.at(3)), 0, std::stoi(tc.header.at(1)),
                                std::stoi(tc.header.at(2)));
        for (const auto& line : tc.lines) expected.push_back(nrsynth_test::complexOf(line));
        EXPECT_LT(maxDifference(r, expected), 1e-9) << "M=" << M;
    }
    EXPECT_EQ(cases.size(), 10u);
}

// x(n) = (1/sqrt(M)) sum_k r(k) exp(j 2 pi k n / M): undoes the scaled forward DFT.
std::vector<complex> timeSequence(const std::vector<complex>& r) {
    const auto M = r.size();
    std::vector<complex> x(M);
    for (std::size_t n = 0; n < M; ++n) {
        for (std::size_t k = 0; k < M; ++k)
            x[n] += r[k] * std::exp(kJ * (2 * kPi * double(k * n % M) / double(M)));
        x[n] /= std::sqrt(double(M));
    }
    return x;
}

std::vector<complex> halfPi(BitSequence bits) {
    std::vector<complex> x(bits.size());
    HalfPiBPSK(bits, x);
    return x;
}

TEST(LowPaprType2, TimeSequencesAreTheTablesOrTheGoldSequence) {
    const char* file = "ts38211_tables_5_2_3_2_low_papr_type2.json";
    std::vector<complex> r;
    for (int u = 0; u < 30; ++u) {
        LowPapr2SequenceGenerate(r, 6, 1.0, 0, u, 1, 0);
        std::vector<complex> x6;
        for (int phi : tableRow(file, "M6_phi", u)) x6.push_back(std::exp(kJ * (kPi * phi / 8)));
        EXPECT_LT(maxDifference(timeSequence(r), x6), 1e-12) << "M=6 u=" << u;
        for (int M : {12, 18, 24}) {
            LowPapr2SequenceGenerate(r, M, 0, 0, u, 0, 0);
            const auto row = tableRow(file, "M" + std::to_string(M) + "_b", u);
            EXPECT_LT(maxDifference(timeSequence(r), halfPi(BitSequence(row.begin(), row.end()))),
                      1e-12)
                << "M=" << M << " u=" << u;
        }
    }
    for (int M : {30, 48, 180}) {
        LowPapr2SequenceGenerate(r, M, 0, 0, 0, 0, 1000 + M);
        BitSequence bits(static_cast<std::size_t>(M));
        PN_Generator(bits, M, 1000 + M);
        EXPECT_LT(maxDifference(timeSequence(r), halfPi(bits)), 1e-11) << "M=" << M;
    }
}

// Lengths 12 and 24 read the first-edition table and TS 36.211 Table 5.5.1.2-2, longer ones
// the Zadoff-Chu root; element n turned by exp(j (n + s) alpha), s = (k mod 2) delta / 2 with
// the sign of k.
TEST(ZadoffChu, TablesLongLengthsAndTheHalfStep) {
    std::vector<complex> r;
    for (int u : {0, 29}) {
        for (auto [M, file, key] :
             {std::tuple{12, kType1First, "M12"},
              std::tuple{24, "ts36211_tables_5_5_1_2_lte_low_papr.json", "N24"}}) {
            std::vector<complex> expected;
            ZC_Generator(r, M, 1, u, 0, 0.4, 0.5);  // s = 0.25
            const auto phi = tableRow(file, key, u);
            for (int n = 0; n < M; ++n)
                expected.push_back(std::exp(kJ * (phi[static_cast<std::size_t>(n)] * kPi / 4)) *
                                   std::exp(kJ * ((n + 0.25) * 0.4)));
            EXPECT_LT(maxDifference(r, expected), 1e-12) << "M=" << M << " u=" << u;
        }
    }
    for (int M : {36, 37, 1249}) {
        for (auto [k, s] :
             {std::pair{0, 0.0}, std::pair{2, 0.0}, std::pair{-1, -0.5}, std::pair{3, 0.5}}) {
            ZC_Generator(r, M, k, 9, 1, 0.3, 1.0);
            auto expected = zadoffChu(M, 9, 1, 0.3);
            for (auto& x : expected) x *= std::exp(kJ * (0.3 * s));
            EXPECT_LT(maxDifference(r, expected), 1e-9) << "M=" << M << " k=" << k;
        }
    }
    EXPECT_THROW(ZC_Generator(r, 1250, 0, 0, 0, 0, 0), std::out_of_range);
}

}  // namespace
