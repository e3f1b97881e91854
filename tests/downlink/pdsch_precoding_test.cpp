// Uplink codebooks of TS 38.211 clause 6.3.1.5 as GetPrecodingMatrix serves them: the size of
// each table, entries read off the tables, the power every table's scaling gives, and refusals
// of a TPMI or a layer/port pair that no table holds.

#include <gtest/gtest.h>

#include <cmath>
#include <complex>
#include <string>
#include <vector>

#include "downlink/pdsch_generator.h"
#include "test_support.h"

namespace {

using Orvalis_NR::PDSCH_Generator;
using Cx = std::complex<double>;
using Matrix = brinecomm::matrix<Cx>;

const Cx j{0.0, 1.0};

Matrix precoder(bool transformPrecoded, int layers, int ports, int tpmi) {
    PDSCH_Generator generator;
    Matrix w;
    generator.GetPrecodingMatrix(transformPrecoded, layers, ports, tpmi, w);
    return w;
}

// One codebook: the TPMI count of its table and, per TPMI range, the scale in front of W.
struct Codebook {
    const char* table;
    bool transformPrecoded;
    int layers;
    int ports;
    int count;
    std::vector<std::pair<int, double>> scaleFrom;  // (first TPMI, scale) in rising order
    double scale(int tpmi) const {
        double s = 0.0;
        for (const auto& [first, value] : scaleFrom)
            if (tpmi >= first) s = value;
        return s;
    }
};

const double r2 = std::sqrt(2.0);
const double r3 = std::sqrt(3.0);
const Codebook kCodebooks[] = {
    {"Table_6_3_1_5_1", false, 1, 2, 6, {{0, 1 / r2}}},
    {"Table_6_3_1_5_1_TransformPrecoded", true, 1, 2, 6, {{0, 1 / r2}}},
    {"Table_6_3_1_5_2", true, 1, 4, 28, {{0, 0.5}}},
    {"Table_6_3_1_5_3", false, 1, 4, 28, {{0, 0.5}}},
    {"Table_6_3_1_5_4", false, 2, 2, 3, {{0, 1 / r2}, {1, 0.5}}},
    {"Table_6_3_1_5_5", false, 2, 4, 22, {{0, 0.5}, {14, 1 / (2 * r2)}}},
    {"Table_6_3_1_5_6", false, 3, 4, 7, {{0, 0.5}, {3, 1 / (2 * r3)}}},
    {"Table_6_3_1_5_7", false, 4, 4, 5, {{0, 0.5}, {1, 1 / (2 * r2)}, {3, 0.25}}},
};

class UplinkCodebook : public ::testing::TestWithParam<Codebook> {};

TEST_P(UplinkCodebook, HoldsTheTableTpmisAndRefusesTheNext) {
    const Codebook& book = GetParam();
    for (int tpmi = 0; tpmi < book.count; ++tpmi) {
        const Matrix w = precoder(book.transformPrecoded, book.layers, book.ports, tpmi);
        EXPECT_EQ(w.rows(), book.ports);
        EXPECT_EQ(w.columns(), book.layers);
    }
    for (int bad : {book.count, -1}) {
        const std::string text = nrsynth_test::failureText(
            [&] { precoder(book.transformPrecoded, book.layers, book.ports, bad); });
        EXPECT_NE(text.find("TPMIIndex " + std::to_string(bad)), std::string::npos) << text;
        EXPECT_NE(text.find("0.." + std::to_string(book.count - 1)), std::string::npos) << text;
    }
}

// Every entry is 0 or a unit (1, -1, j, -j) times the table's scale, so each layer leaves with
// the scale's power once per antenna port it uses; the columns of one matrix are orthogonal.
TEST_P(UplinkCodebook, ColumnsHaveThePowerOfTheScaling) {
    const Codebook& book = GetParam();
    for (int tpmi = 0; tpmi < book.count; ++tpmi) {
        SCOPED_TRACE("TPMI " + std::to_string(tpmi));
        const Matrix w = precoder(book.transformPrecoded, book.layers, book.ports, tpmi);
        const double s = book.scale(tpmi);
        for (int c = 0; c < book.layers; ++c) {
            int nonZero = 0;
            double power = 0.0;
            for (int r = 0; r < book.ports; ++r) {
                const Cx v = w(r, c) / s;
                const bool unit = std::abs(std::abs(v.real()) + std::abs(v.imag()) - 1.0) < 1e-12 &&
                                  std::abs(v.real() * v.imag()) < 1e-12;
                EXPECT_TRUE(unit || std::abs(v) < 1e-12) << "entry " << r << "," << c << " = " << v;
                nonZero += unit ? 1 : 0;
                power += std::norm(w(r, c));
            }
            EXPECT_GT(nonZero, 0);
            EXPECT_NEAR(power, s * s * nonZero, 1e-12);
            for (int d = c + 1; d < book.layers; ++d) {
                Cx inner = 0.0;
                for (int r = 0; r < book.ports; ++r) inner += std::conj(w(r, c)) * w(r, d);
                EXPECT_LT(std::abs(inner), 1e-12) << "columns " << c << " and " << d;
            }
        }
    }
}

TEST_P(UplinkCodebook, NoTwoTpmisGiveTheSameMatrix) {
    const Codebook& book = GetParam();
    for (int a = 0; a < book.count; ++a)
        for (int b = a + 1; b < book.count; ++b) {
            const Matrix wa = precoder(book.transformPrecoded, book.layers, book.ports, a);
            const Matrix wb = precoder(book.transformPrecoded, book.layers, book.ports, b);
            double difference = 0.0;
            for (int r = 0; r < book.ports; ++r)
                for (int c = 0; c < book.layers; ++c) difference += std::abs(wa(r, c) - wb(r, c));
            EXPECT_GT(difference, 1e-9) << "TPMI " << a << " and " << b;
        }
}

INSTANTIATE_TEST_SUITE_P(Tables, UplinkCodebook, ::testing::ValuesIn(kCodebooks),
                         [](const auto& info) { return std::string(info.param.table); });

// Entries read off TS 38.211 Tables 6.3.1.5-1 to -7 (rows: antenna ports, columns: layers),
// before their scale.
struct Entry {
    const char* name;
    bool transformPrecoded;
    int layers;
    int ports;
    int tpmi;
    double scale;
    std::vector<Cx> w;  // row-major
};

const Entry kEntries[] = {
    {"T1_Tpmi1", false, 1, 2, 1, 1 / r2, {0.0, 1.0}},
    {"T1_Tpmi5", false, 1, 2, 5, 1 / r2, {1.0, -j}},
    {"T2_Tpmi12", true, 1, 4, 12, 0.5, {1.0, 1.0, 1.0, -1.0}},
    {"T2_Tpmi19", true, 1, 4, 19, 0.5, {1.0, j, -j, -1.0}},
    {"T2_Tpmi25", true, 1, 4, 25, 0.5, {1.0, -j, j, -1.0}},
    {"T3_Tpmi7", false, 1, 4, 7, 0.5, {1.0, 0.0, -j, 0.0}},
    {"T3_Tpmi19", false, 1, 4, 19, 0.5, {1.0, j, -j, 1.0}},
    {"T3_Tpmi27", false, 1, 4, 27, 0.5, {1.0, -j, -j, -1.0}},
    {"T4_Tpmi0", false, 2, 2, 0, 1 / r2, {1.0, 0.0, 0.0, 1.0}},
    {"T4_Tpmi2", false, 2, 2, 2, 0.5, {1.0, 1.0, j, -j}},
    {"T5_Tpmi3", false, 2, 4, 3, 0.5, {0.0, 0.0, 1.0, 0.0, 0.0, 1.0, 0.0, 0.0}},
    {"T5_Tpmi8", false, 2, 4, 8, 0.5, {1.0, 0.0, 0.0, 1.0, -j, 0.0, 0.0, 1.0}},
    {"T5_Tpmi17", false, 2, 4, 17, 1 / (2 * r2), {1.0, 1.0, j, j, j, -j, -1.0, 1.0}},
    {"T5_Tpmi21", false, 2, 4, 21, 1 / (2 * r2), {1.0, 1.0, -j, -j, j, -j, 1.0, -1.0}},
    {"T6_Tpmi2", false, 3, 4, 2, 0.5, {1.0, 0.0, 0.0, 0.0, 1.0, 0.0, -1.0, 0.0, 0.0, 0.0, 0.0, 1.0}},
    {"T6_Tpmi6", false, 3, 4, 6, 1 / (2 * r3), {1.0, 1.0, 1.0, -1.0, 1.0, -1.0, j, j, -j, -j, j, j}},
    {"T7_Tpmi2", false, 4, 4, 2, 1 / (2 * r2),
     {1.0, 1.0, 0.0, 0.0, 0.0, 0.0, 1.0, 1.0, j, -j, 0.0, 0.0, 0.0, 0.0, j, -j}},
    {"T7_Tpmi4", false, 4, 4, 4, 0.25,
     {1.0, 1.0, 1.0, 1.0, 1.0, -1.0, 1.0, -1.0, j, j, -j, -j, j, -j, -j, j}},
};

class UplinkCodebookEntry : public ::testing::TestWithParam<Entry> {};

TEST_P(UplinkCodebookEntry, EqualsTheTable) {
    const Entry& e = GetParam();
    const Matrix w = precoder(e.transformPrecoded, e.layers, e.ports, e.tpmi);
    ASSERT_EQ(w.rows(), e.ports);
    ASSERT_EQ(w.columns(), e.layers);
    for (int r = 0; r < e.ports; ++r)
        for (int c = 0; c < e.layers; ++c) {
            const Cx expected = e.w[static_cast<std::size_t>(r * e.layers + c)] * e.scale;
            EXPECT_LT(std::abs(w(r, c) - expected), 1e-12) << "entry " << r << "," << c;
        }
}

INSTANTIATE_TEST_SUITE_P(Tables, UplinkCodebookEntry, ::testing::ValuesIn(kEntries),
                         [](const auto& info) { return std::string(info.param.name); });

// The fully coherent part of Table 6.3.1.5-3 is the product codebook (1, a, b, ab)/2 with a
// and b stepping through 1, j, -1, -j; Table 6.3.1.5-2 shares TPMIs 0 to 11 with it.
TEST(UplinkCodebookStructure, CoherentSingleLayerFourPorts) {
    const Cx steps[4] = {1.0, j, -1.0, -j};
    for (int tpmi = 12; tpmi < 28; ++tpmi) {
        const Cx a = steps[(tpmi - 12) / 4], b = steps[(tpmi - 12) % 4];
        const Cx expected[4] = {1.0, a, b, a * b};
        const Matrix w = precoder(false, 1, 4, tpmi);
        for (int r = 0; r < 4; ++r) EXPECT_LT(std::abs(w(r, 0) - 0.5 * expected[r]), 1e-12) << tpmi;
    }
    for (int tpmi = 0; tpmi < 12; ++tpmi) {
        const Matrix on = precoder(true, 1, 4, tpmi), off = precoder(false, 1, 4, tpmi);
        for (int r = 0; r < 4; ++r) EXPECT_EQ(on(r, 0), off(r, 0)) << tpmi;
    }
}

TEST(UplinkCodebookStructure, OneLayerOnOnePortIsTheUnitWhateverTheTpmi) {
    for (int tpmi : {0, 5, 99}) {
        const Matrix w = precoder(false, 1, 1, tpmi);
        ASSERT_EQ(w.rows(), 1);
        ASSERT_EQ(w.columns(), 1);
        EXPECT_EQ(w(0, 0), Cx(1.0));
    }
}

TEST(UplinkCodebookStructure, PairsWithoutATableFailNamingLayersAndPorts) {
    for (const auto& pair : {std::pair{3, 2}, std::pair{2, 1}, std::pair{1, 3}, std::pair{8, 8}}) {
        const int layers = pair.first, ports = pair.second;  // clang 14 cannot capture bindings
        const std::string text = nrsynth_test::failureText([&] { precoder(false, layers, ports, 0); });
        EXPECT_NE(text.find("NumberOfLayers " + std::to_string(layers) + ", NumberOfAntennaPorts " +
                            std::to_string(ports)),
                  std::string::npos)
            << text;
    }
}

}  // namespace
