// LTE cell reference signals reserved for spectrum sharing, with two and four CRS ports and
// point A away from the carrier's centre. The expected positions are built port by port from
// TS 36.211 clause 6.10.1.2, not from the combined comb that the generator uses.

#include <gtest/gtest.h>

#include <algorithm>
#include <ostream>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include "carrier/nr5g_numerology_generator.h"
#include "models/nr5g_waveform_settings.h"

namespace {

using Models::Nr5g::LTEBandwidth;

struct CrsCase {
    std::string name;
    int ports;
    LTEBandwidth bandwidth;
    int resourceBlocks;
    int vShift;
    int offsetToPointA;      // LTE carrier centre above point A, in subcarriers
    double pointAHz;         // FrequencyOffsetOfPointA
    int pointA;              // the same in whole subcarriers, truncated toward zero
    std::set<int> mbsfn;     // MBSFN subframes
    std::string mbsfnText;
    friend void PrintTo(const CrsCase& c, std::ostream* os) { *os << c.name; }
};

using Element = std::pair<int, int>;  // (symbol of the frame, subcarrier from the centre)

// Antenna port p of TS 36.211 clause 6.10.1.2, normal prefix: symbols l = 0 and 4 of each slot
// for ports 0 and 1, l = 1 for ports 2 and 3; subcarriers 6m + (v + v_shift) mod 6 with
// v = 0 / 3 (port 0 on l = 0 / otherwise), 3 / 0 (port 1), 3 (n_s mod 2) (port 2),
// 3 + 3 (n_s mod 2) (port 3). An MBSFN subframe keeps only its first two symbols.
std::vector<Element> expectedElements(const CrsCase& c) {
    std::set<Element> elements;
    const int halfWidth = 6 * c.resourceBlocks;
    for (int subframe = 0; subframe < 10; ++subframe)
        for (int slot = 0; slot < 2; ++slot)
            for (int port = 0; port < c.ports; ++port)
                for (int l : port < 2 ? std::vector<int>{0, 4} : std::vector<int>{1}) {
                    const int symbol = 7 * slot + l;
                    if (c.mbsfn.count(subframe) && symbol >= 2) continue;
                    const int ns = 2 * subframe + slot;
                    const int v = port == 0   ? (l == 0 ? 0 : 3)
                                  : port == 1 ? (l == 0 ? 3 : 0)
                                  : port == 2 ? 3 * (ns % 2)
                                              : 3 + 3 * (ns % 2);
                    for (int m = 0; m < 2 * c.resourceBlocks; ++m) {
                        const int k = 6 * m + (v + c.vShift) % 6;  // across the LTE carrier
                        // Relative to point A; subcarriers below point A are not reserved.
                        const int fromPointA = c.offsetToPointA - halfWidth + k;
                        if (fromPointA < 0) continue;
                        // The LTE carrier leaves out its DC subcarrier, in its middle.
                        const int fromCentre = c.pointA + fromPointA + (k >= halfWidth ? 1 : 0);
                        elements.insert({14 * subframe + symbol, fromCentre});
                    }
                }
    return {elements.begin(), elements.end()};
}

class LteCrsReservation : public ::testing::TestWithParam<CrsCase> {};

TEST_P(LteCrsReservation, TakesTheResourceElementsOfEveryPort) {
    const CrsCase& c = GetParam();
    Models::Nr5g::NR5GWaveformSettings settings;
    settings.SampleRateAuto->setValue(30.72e6);
    settings.NRCarriers->getValue()->resize(1);
    auto carrier = settings.NRCarriers->getValue()->getItem(0);
    carrier->CarrierType->setValue(Models::Nr5g::CarrierType::DL);
    carrier->FrequencyOffsetOfPointA->setValue(c.pointAHz);
    auto downlink = carrier->Downlink->getValue();
    auto ssb = downlink->SSPBCH->getValue();  // a 15 kHz block gives numerology 0 its store
    ssb->Enabled->setValue(true);
    ssb->Numerology->setValue(Models::Nr5g::Numerology::SCS15k);
    ssb->Mu->setValue(0);
    ssb->PowerLevelStr->setValue("1");
    auto coexistence = downlink->LTECoexistence->getValue();
    coexistence->Enabled->setValue(true);
    coexistence->LTECRS->getValue()->resize(1);
    auto crs = coexistence->LTECRS->getValue()->getItem(0);
    crs->LTEBandwidth->setValue(c.bandwidth);
    crs->OffsetToPointA->setValue(c.offsetToPointA);
    crs->NumberOfCRSAntennaPorts->setValue(c.ports);
    crs->VShift->setValue(c.vShift);
    crs->MBSFNSubframeIndexArrayStr->setValue(c.mbsfnText);

    Orvalis_NR::NR5GNumerologyGenerator generator;
    generator.Init(settings, *carrier, 0);
    ASSERT_TRUE(generator.hasValidChannel);
    generator.MarkUnavailable();
    const int size = generator.fftSize;
    for (const auto& row : generator.occupancy) {
        std::vector<Element> taken;
        for (std::size_t i = 0; i < row.size(); ++i)
            if (row[i] == 1600) {
                const int k = static_cast<int>(i % static_cast<std::size_t>(size));
                taken.emplace_back(static_cast<int>(i / static_cast<std::size_t>(size)),
                                   k >= size / 2 ? k - size : k);
            }
        std::sort(taken.begin(), taken.end());
        EXPECT_EQ(taken, expectedElements(c));
    }
}

INSTANTIATE_TEST_SUITE_P(
    Ports, LteCrsReservation,
    ::testing::Values(
        // 5 MHz LTE 10 subcarriers above point A, point A 150.5 subcarriers below the centre.
        CrsCase{"TwoPorts", 2, LTEBandwidth::BW5M_25RB, 25, 4, 160, -2257500.0, -150, {2, 7},
                "2,7"},
        // 3 MHz LTE whose lowest resource block lies below point A, point A above the centre.
        CrsCase{"FourPorts", 4, LTEBandwidth::BW3M_15RB, 15, 2, 78, 1035000.0, 69, {5}, "5"}),
    [](const auto& info) { return info.param.name; });

}  // namespace
