// Numerology set-up: which numerologies carry the SS/PBCH block, the filter centred on the block
// with its guard from the bandwidth part name, and the LTE CRS reservation.

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
};

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

TEST(NumerologySetup, FilterIsCentredOnTheBlockAwayFromPointA) {
    for (int blockCentre : {-600, 0, 900}) {
        SsbCarrier waveform(122.88e6, blockCentre);
        NR5GNumerologyGenerator generator;
        generator.Init(waveform.settings, *waveform.carrier, 1);
        // The phase step between the middle taps is the centre frequency; the block spans
        // blockCentre - 120 .. blockCentre + 119 around the carrier's centre.
        const auto& taps = generator.filters[0]->getCoefficients();
        const std::size_t middle = taps.size() / 2;
        const double centre = std::arg(taps[middle + 1] / taps[middle]) * generator.fftSize /
                              (2.0 * std::numbers::pi);
        EXPECT_NEAR(centre, blockCentre - 0.5, 1e-6) << blockCentre;
    }
}

TEST(NumerologySetup, GuardComesFromTheBandwidthPartName) {
    // A low-pass of relative width x normalised to unit energy and scaled by sqrt(x) peaks near
    // x: the peak tells the width, 240 subcarriers and 24 of guard per step of the "FB" suffix.
    const auto peak = [](const char* bwpName) {
        SsbCarrier waveform;
        if (bwpName) {
            auto bwps = waveform.carrier->Downlink->getValue()->BWP->getValue();
            bwps->resize(2);
            bwps->getItem(1)->Name->setValue(std::string(bwpName));
        }
        NR5GNumerologyGenerator generator;
        generator.Init(waveform.settings, *waveform.carrier, 1);
        double best = 0.0;
        for (const auto& tap : generator.filters[0]->getCoefficients())
            best = std::max(best, std::abs(tap));
        return best;
    };
    EXPECT_NEAR(peak("BWP FB7") / peak(nullptr), (240.0 + 24.0 * 7) / (240.0 + 24.0), 0.02);
    EXPECT_THROW(peak("BWP FB"), std::invalid_argument);
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
    std::vector<std::pair<int, int>> taken;  // (symbol, subcarrier from the centre)
    const int size = generator.fftSize;
    for (std::size_t i = 0; i < generator.occupancy[0].size(); ++i)
        if (generator.occupancy[0][i] == 1600) {
            const int k = static_cast<int>(i) % size;
            taken.emplace_back(static_cast<int>(i) / size, k >= size / 2 ? k - size : k);
        }
    std::sort(taken.begin(), taken.end());

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
    EXPECT_EQ(taken, expected);
}

}  // namespace
