// Numerology set-up: geometry at the waveform rate, which numerologies carry the SS/PBCH block,
// the filter's guard from the bandwidth part name, and the filter centred on the block.

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <complex>
#include <numbers>
#include <stdexcept>

#include "carrier/nr5g_numerology_generator.h"
#include "models/nr5g_waveform_settings.h"

namespace {

using Models::Nr5g::CarrierType;
using Models::Nr5g::NR5GWaveformSettings;
using Models::Nr5g::NRCarrier;
using Models::Nr5g::Numerology;
using Orvalis_NR::NR5GNumerologyGenerator;

struct SsbCarrier {
    NR5GWaveformSettings settings;
    std::shared_ptr<NRCarrier> carrier;

    explicit SsbCarrier(double sampleRate = 122.88e6, int blockCentre = -600) {
        settings.SampleRateAuto->setValue(sampleRate);
        settings.NRCarriers->getValue()->resize(1);
        carrier = settings.NRCarriers->getValue()->getItem(0);
        carrier->CarrierType->setValue(CarrierType::DL);
        carrier->FrequencyOffsetOfPointA->setValue(-49140000.0);
        auto ssb = carrier->Downlink->getValue()->SSPBCH->getValue();
        ssb->Enabled->setValue(true);
        ssb->Numerology->setValue(Numerology::SCS30k);
        ssb->Mu->setValue(1);
        ssb->Lmax->setValue(8);
        ssb->PowerLevelStr->setValue("1");
        ssb->FrequencyOffset->setValue(blockCentre);
    }
    void setSecondBwpName(const std::string& name) {
        auto bwps = carrier->Downlink->getValue()->BWP->getValue();
        bwps->resize(2);
        bwps->getItem(1)->Name->setValue(name);
    }
};

TEST(NumerologySetup, GeometryAt122MHzFor30kHz) {
    SsbCarrier waveform;
    NR5GNumerologyGenerator generator;
    generator.Init(waveform.settings, *waveform.carrier, 1);
    EXPECT_TRUE(generator.hasValidChannel);
    EXPECT_EQ(generator.fftSize, 4096);
    EXPECT_EQ(generator.symbolsPerFrame, 280);
    ASSERT_EQ(generator.cpLengths.size(), 14u);
    EXPECT_EQ(generator.cpLengths[0], 288 + 64);
    EXPECT_EQ(generator.cpLengths[1], 288);
    EXPECT_EQ(generator.modulator.windowLength, 41);  // round(4096 x 0.01)
    ASSERT_EQ(generator.filters.size(), 1u);
    EXPECT_EQ(generator.filters[0]->getCoefficients().size(), 1025u);
}

TEST(NumerologySetup, OtherNumerologiesOnlyHoldAPlaceholderBlock) {
    SsbCarrier waveform;
    for (int n : {0, 2, 3, 4, 5}) {
        NR5GNumerologyGenerator generator;
        generator.Init(waveform.settings, *waveform.carrier, n);
        EXPECT_FALSE(generator.hasValidChannel) << n;
        ASSERT_EQ(generator.pbchGenerators.size(), 1u) << n;
        EXPECT_TRUE(generator.countChannels() == std::vector<int>(8, 0)) << n;
        EXPECT_TRUE(generator.grid.empty()) << n;  // idle: no frame store
    }
}

/// Centre frequency (in subcarriers) and width of the designed filter, read from its taps:
/// the phase advance between neighbouring taps and the number of taps above half the peak.
double filterCentre(const NR5GNumerologyGenerator& generator) {
    const auto& taps = generator.filters[0]->getCoefficients();
    const std::size_t middle = taps.size() / 2;
    const double step = std::arg(taps[middle + 1] / taps[middle]);
    return step * generator.fftSize / (2.0 * std::numbers::pi);
}

TEST(NumerologySetup, FilterIsCentredOnTheBlockAwayFromPointA) {
    for (int blockCentre : {-600, 0, 900}) {
        SsbCarrier waveform(122.88e6, blockCentre);
        NR5GNumerologyGenerator generator;
        generator.Init(waveform.settings, *waveform.carrier, 1);
        // The block spans blockCentre - 120 .. blockCentre + 119 around the carrier's centre.
        EXPECT_NEAR(filterCentre(generator), blockCentre - 0.5, 1e-6) << blockCentre;
    }
}

TEST(NumerologySetup, GuardComesFromTheBandwidthPartName) {
    SsbCarrier narrow;
    narrow.setSecondBwpName("BWP FB7");
    NR5GNumerologyGenerator withGuard;
    withGuard.Init(narrow.settings, *narrow.carrier, 1);
    SsbCarrier plain;
    NR5GNumerologyGenerator defaultGuard;
    defaultGuard.Init(plain.settings, *plain.carrier, 1);
    // A low-pass of relative width x normalised to unit energy and scaled by sqrt(x) peaks
    // near x: the peak tells the width, and so the guard.
    const auto peak = [](const NR5GNumerologyGenerator& g) {
        double best = 0.0;
        for (const auto& tap : g.filters[0]->getCoefficients()) best = std::max(best, std::abs(tap));
        return best;
    };
    const double x1 = (240.0 + 24.0 * 1) / 4096, x7 = (240.0 + 24.0 * 7) / 4096;
    EXPECT_NEAR(peak(withGuard) / peak(defaultGuard), x7 / x1, 0.02);

    SsbCarrier broken;
    broken.setSecondBwpName("BWP FB");
    NR5GNumerologyGenerator failing;
    EXPECT_THROW(failing.Init(broken.settings, *broken.carrier, 1), std::invalid_argument);
}

TEST(NumerologySetup, RealTimePhaseModesDropWindowAndFilter) {
    SsbCarrier waveform;
    waveform.settings.PhaseCompensation->setValue(Models::Nr5g::PhaseCompensationMode::AutoRT);
    NR5GNumerologyGenerator generator;
    generator.Init(waveform.settings, *waveform.carrier, 1);
    EXPECT_EQ(generator.modulator.windowLength, 0);
    EXPECT_TRUE(generator.filters.empty());
}

}  // namespace

namespace {

/// Resource elements that the LTE reservation took, as (symbol, subcarrier number).
std::vector<std::pair<int, int>> reservedElements(const NR5GNumerologyGenerator& generator) {
    std::vector<std::pair<int, int>> taken;
    const auto& row = generator.occupancy[0];
    for (std::size_t i = 0; i < row.size(); ++i)
        if (row[i] == 1600) {
            const int k = static_cast<int>(i % static_cast<std::size_t>(generator.fftSize));
            taken.emplace_back(static_cast<int>(i) / generator.fftSize, k >= generator.fftSize / 2 ? k - generator.fftSize : k);
        }
    return taken;
}

TEST(NumerologySetup, LteCrsOfOnePortIsReservedOnItsSymbolsAndCombs) {
    // A 15 kHz carrier (block on numerology 0), 1.4 MHz LTE with one CRS port, v-shift 1,
    // subframe 3 an MBSFN subframe. LTE port 0 (TS 36.211 clause 6.10.1.2): symbols 0 and 4
    // of each slot, subcarriers 6 m + (v + v_shift) mod 6 with v 0 on symbol 0, 3 on symbol 4.
    SsbCarrier waveform(30.72e6, 0);
    waveform.carrier->FrequencyOffsetOfPointA->setValue(0.0);  // point A at the carrier's centre
    auto ssb = waveform.carrier->Downlink->getValue()->SSPBCH->getValue();
    ssb->Numerology->setValue(Numerology::SCS15k);
    ssb->Mu->setValue(0);
    auto coexistence = waveform.carrier->Downlink->getValue()->LTECoexistence->getValue();
    coexistence->Enabled->setValue(true);
    coexistence->LTECRS->getValue()->resize(1);
    auto crs = coexistence->LTECRS->getValue()->getItem(0);
    crs->LTEBandwidth->setValue(static_cast<Models::Nr5g::LTEBandwidth>(0));  // 6 resource blocks
    crs->OffsetToPointA->setValue(36);  // the LTE carrier's centre 36 subcarriers above point A
    crs->VShift->setValue(1);
    crs->MBSFNSubframeIndexArrayStr->setValue("3");

    NR5GNumerologyGenerator generator;
    generator.Init(waveform.settings, *waveform.carrier, 0);
    ASSERT_TRUE(generator.hasValidChannel);
    generator.MarkUnavailable();
    const auto taken = reservedElements(generator);

    std::vector<std::pair<int, int>> expected;
    for (int subframe = 0; subframe < 10; ++subframe)
        for (int l : {0, 4, 7, 11}) {
            if (subframe == 3 && l != 0) continue;  // MBSFN: only the control region
            const int v = (l == 0 || l == 7) ? 0 : 3;
            for (int m = 0; m < 12; ++m) {
                const int lteSubcarrier = 6 * m + (v + 1) % 6;  // 0..71 across the LTE carrier
                // The LTE carrier's lowest subcarrier sits at OffsetToPointA - 36 = 0 from point A;
                // above its middle, its unused DC subcarrier shifts the grid by one.
                const int k = lteSubcarrier + (lteSubcarrier >= 36 ? 1 : 0);
                expected.emplace_back(14 * subframe + l, k);
            }
        }
    std::sort(expected.begin(), expected.end());
    auto sortedTaken = taken;
    std::sort(sortedTaken.begin(), sortedTaken.end());
    EXPECT_EQ(sortedTaken, expected);
}

}  // namespace
