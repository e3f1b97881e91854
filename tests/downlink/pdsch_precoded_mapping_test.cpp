// PDSCH mapping with PRB-bundle precoding: every resource element of every antenna row equals
// W of its bundle times the unprecoded layer values (data) or the per-port DM-RS values of TS
// 38.211 clause 7.4.1.1 (reference signal), all worked out here from the Gold sequence and the
// bundle's matrix, in the order of TS 38.211 clause 7.3.1.5.

#include <gtest/gtest.h>

#include <cmath>
#include <complex>
#include <numbers>
#include <string>
#include <vector>

#include "downlink/pdsch_receiver.h"
#include "downlink/pdsch_test_setup.h"

namespace {

using Cx = std::complex<double>;
using Matrix = std::vector<std::vector<Cx>>;  // [antenna row][layer]

constexpr int kPointA = -300, kBwpOffset = 3, kBwpSize = 52;

/// The bundle precoder for PRB p of the BWP with bundle size b and `ports` ports: for 2 ports
/// (1 1; 1 -1)/2 in even bundles and (1 1; j -j)/2 in odd ones; for 4 ports the product of
/// phases phi = 2 pi ((m/2) mod 8)/8, psi = phi + pi, theta = (m mod 2) pi/2, columns of the
/// same power (1/2) as with 2 ports.
Matrix bundlePrecoder(int ports, int p, int b) {
    const int m = p / b;
    const Cx j(0, 1);
    if (ports == 2) return {{0.5, 0.5}, m % 2 == 0 ? std::vector<Cx>{0.5, -0.5} : std::vector<Cx>{0.5 * j, -0.5 * j}};
    const double phi = 2 * std::numbers::pi * ((m / 2) % 8) / 8, psi = phi + std::numbers::pi,
                 theta = (m % 2) * std::numbers::pi / 2;
    auto e = [](double a) { return std::polar(1.0, a); };
    Matrix w = {{1.0, 1.0, 1.0, 1.0},
                {e(phi), e(psi), e(phi), e(psi)},
                {e(theta), e(theta), -e(theta), -e(theta)},
                {e(theta + phi), e(theta + psi), -e(theta + phi), -e(theta + psi)}};
    const double scale = std::sqrt(0.5 / 4);
    for (auto& row : w)
        for (auto& v : row) v *= scale;
    return w;
}

struct PrecodingCase {
    const char* name;
    int layers;
    const char* bundle;  // PRBBundleSize
    int bundleRbs;
    int cdmGroups;
};

const PrecodingCase kCases[] = {
    {"TwoPortsBundle2", 2, "_2RB", 2, 1},
    {"TwoPortsBundle4", 2, "_4RB", 4, 1},
    {"FourPortsBundle2TwoCdmGroups", 4, "_2RB", 2, 2},
    {"FourPortsBundle4TwoCdmGroups", 4, "_4RB", 4, 2},
};

class PdschPrecodedMapping : public ::testing::TestWithParam<PrecodingCase> {};

TEST_P(PdschPrecodedMapping, EveryElementIsTheBundleMatrixTimesTheLayers) {
    const auto& c = GetParam();
    std::string ports, antennas;
    for (int x = 0; x < c.layers; ++x) {
        ports += (x ? "," : "") + std::to_string(x);
        antennas += (x ? "," : "") + std::to_string(1000 + x);
    }
    pdsch_setup::Patch patch;
    patch.dlsch = {{"NumberOfLayers", c.layers}, {"DMRSports", ports}, {"AntennaPortArray", antennas},
                   {"NumberOfDMRSCDMGroup", c.cdmGroups}, {"PRBBundleSize", c.bundle}, {"Modulation", "QAM16"},
                   {"TransportBlockSize", 8000}, {"RBOffset", 0}, {"RBNumber", 24}};
    pdsch_setup::PdschUnderTest setup(pdsch_setup::document(patch));
    setup.init();
    pdsch_setup::Store store(c.layers, setup.fft);
    auto& gen = setup.generator;
    gen.Map(store.grid, store.occupancy, 0, store.flags, true);
    const auto& layers = gen.CodeWords[0].Layers;
    ASSERT_EQ(static_cast<int>(layers.size()), c.layers);

    // DM-RS of port 1000 + x (TS 38.211 Table 7.4.1.1.2-1): CDM group x / 2, Delta = group,
    // w_f(k') = -1 for k' = 1 on the odd ports; r(2n + k') at subcarrier 4n + 2k' + Delta.
    const pdsch_rx::Bits gold = pdsch_rx::gold(pdsch_rx::dmrsCInit(14, 0, 2, pdsch_setup::kCellId, 0), 2 * 12 * (kBwpOffset + kBwpSize));
    std::size_t read = 0;
    int checked = 0;
    for (int l = 0; l < 14; ++l) {
        const bool dmrsSymbol = l == 2;
        for (int p = 0; p < 24; ++p) {
            const Matrix w = bundlePrecoder(c.layers, p, c.bundleRbs);
            for (int j = 0; j < 12; ++j) {
                const int k = 12 * (kBwpOffset + p) + j;
                const std::size_t at = store.at(l, k, kPointA);
                std::vector<Cx> portValues(static_cast<std::size_t>(c.layers), Cx{});
                bool reference = false;
                if (dmrsSymbol) {
                    const int group = j % 2;
                    if (group < c.cdmGroups) {
                        reference = true;
                        const int index = (k - group) / 2;
                        for (int x = 0; x < c.layers; ++x)
                            if (x / 2 == group)
                                portValues[static_cast<std::size_t>(x)] =
                                    pdsch_rx::dmrsValue(gold, index) * (x % 2 == 1 && index % 2 == 1 ? -1.0 : 1.0);
                    }
                }
                if (!reference) {
                    ASSERT_LT(read, layers[0].size());
                    for (int x = 0; x < c.layers; ++x) portValues[static_cast<std::size_t>(x)] = layers[static_cast<std::size_t>(x)][read];
                    ++read;
                }
                for (int a = 0; a < c.layers; ++a) {
                    Cx expected{};
                    for (int x = 0; x < c.layers; ++x)
                        expected += w[static_cast<std::size_t>(a)][static_cast<std::size_t>(x)] * portValues[static_cast<std::size_t>(x)];
                    EXPECT_LT(std::abs(store.grid[static_cast<std::size_t>(a)][at] - expected), 1e-12)
                        << "row " << a << " symbol " << l << " RB " << p << " RE " << j;
                    EXPECT_EQ(store.occupancy[static_cast<std::size_t>(a)][at], reference ? 113 : 7);
                    ++checked;
                }
            }
        }
    }
    EXPECT_EQ(read, layers[0].size()) << "every layer value is mapped once";
    EXPECT_EQ(checked, c.layers * 14 * 24 * 12);
}

INSTANTIATE_TEST_SUITE_P(Cases, PdschPrecodedMapping, ::testing::ValuesIn(kCases),
                         [](const auto& info) { return std::string(info.param.name); });

}  // namespace
