// An SS burst end to end: the example waveforms generated through the C interface and
// demodulated as a receiver does, against PSS, SSS and PBCH DM-RS computed from TS 38.211.

#include <gtest/gtest.h>

#include <cmath>
#include <complex>
#include <fstream>
#include <vector>

#include "../engine/output_files.h"
#include "../engine/waveform_test_support.h"
#include "downlink/ssb_reference.h"
#include "ofdm_receiver.h"
#include "test_support.h"

namespace {

using nrsynth_test::evmDb;
using nrsynth_test::Receiver;
using nrsynth_test::Sample;

nlohmann::json example(const char* name) {
    std::ifstream in(nrsynth_test::sourceDir() / "examples" / name);
    auto document = nlohmann::json::parse(in);
    document["NumberOfFrames"] = 1;
    return document;
}

/// Checks PSS and SSS of the block whose first symbol is `l` and whose centre is subcarrier
/// `centre` (block subcarrier 120); returns the PSS gain.
Sample checkSync(const Receiver& rx, int cellId, int centre, int l) {
    std::vector<Sample> pss, sss;
    for (int n = 0; n < 127; ++n) {  // block subcarriers 56..182
        pss.push_back(rx.at(l, centre - 64 + n));
        sss.push_back(rx.at(l + 2, centre - 64 + n));
    }
    Sample pssGain, sssGain;
    EXPECT_LT(evmDb(pss, ssb_ref::pss(cellId % 3), pssGain), -40.0) << "PSS at symbol " << l;
    EXPECT_LT(evmDb(sss, ssb_ref::sss(cellId / 3, cellId % 3), sssGain), -40.0) << l;
    EXPECT_NEAR(std::abs(sssGain), std::abs(pssGain), 0.01) << "SSS at symbol " << l;
    return pssGain;
}

TEST(SsBurstWaveform, CaseABurstIsScaledWhenSeveralCarriersAreSummed) {
    // 15 kHz is scaled by 1 / sqrt(2^0 x 0.5) once a second carrier exists, enabled or not.
    const auto single = example("ssb_case_a_15khz.json");
    auto withSecond = single;
    withSecond["NRCarriers"].push_back({{"CarrierType", "CW"}, {"Enabled", false}});
    double levels[2] = {};
    for (int i = 0; i < 2; ++i) {
        const auto& document = i ? withSecond : single;
        nrsynth_test::ScratchFolder folder;
        ASSERT_EQ(nrsynth_test::generate(document, folder.file("a.bin")), 0) << GetLog();
        const Receiver rx(nrsynth_test::readSamples(folder.file("a.bin")), 2048, 0);
        ASSERT_EQ(rx.samples.size(), 307200u);
        const auto& carrier = document["NRCarriers"][0];
        for (int l : {2, 8, 16, 22})  // Case A, Lmax 4
            levels[i] = std::abs(checkSync(rx, carrier["CellID"],
                                           carrier["Downlink"]["SSPBCH"]["FrequencyOffset"], l));
    }
    EXPECT_NEAR(levels[0], 1.0, 0.05);
    EXPECT_NEAR(levels[1] / levels[0], std::sqrt(2.0), 1e-6);
}

TEST(SsBurstWaveform, CaseCBurstAwayFromTheCentreCarriesItsBlocksAndMarkers) {
    const auto document = example("ssb_case_c_30khz.json");
    nrsynth_test::ScratchFolder folder;
    const auto path = folder.file("ssb.bin");
    ASSERT_EQ(nrsynth_test::generate(document, path), 0) << GetLog();
    // 30 kHz at 122.88 MHz: 4096-point symbols, prefix 288, 352 on the first of each half subframe.
    const Receiver rx(nrsynth_test::readSamples(path), 4096, 1);
    ASSERT_EQ(rx.samples.size(), 1228800u);
    ASSERT_EQ(rx.start.back() + rx.prefix.back() + 4096, 1228800);

    const int cellId = document["NRCarriers"][0]["CellID"];
    const int centre = document["NRCarriers"][0]["Downlink"]["SSPBCH"]["FrequencyOffset"];
    const int blockStart = centre - 120, v = cellId % 4;
    // Case C, Lmax 8: first symbols {2, 8} + 14 n, n = 0..3 (TS 38.213 clause 4.1).
    const int firsts[] = {2, 8, 16, 22, 30, 36, 44, 50};
    for (int i = 0; i < 8; ++i) {
        const int l = firsts[i];
        const Sample pssGain = checkSync(rx, cellId, centre, l);
        EXPECT_NEAR(std::abs(pssGain), 1.0, 0.05) << l;  // level 1, filter passband near 1
        // DM-RS r(m) of symbol l + 1 on subcarrier 4 m + v, every fourth one, i-bar = i.
        const auto ref = ssb_ref::pbchDmrs(i, cellId);
        std::vector<Sample> dmrs, expected;
        for (int m = 0; m < 60; m += 4) {
            dmrs.push_back(rx.at(l + 1, blockStart + 4 * m + v));
            expected.push_back(ref[m]);
        }
        Sample gain;
        EXPECT_LT(evmDb(dmrs, expected, gain), -40.0) << "DM-RS at symbol " << l + 1;
        EXPECT_NEAR(std::abs(gain), std::abs(pssGain), 0.02) << l;
    }
    // Symbols without a block stay empty at the block's columns.
    for (int l : {0, 1, 6, 60, 200}) EXPECT_LT(std::abs(rx.at(l, centre)), 1e-3) << l;

    // Markers (default lines): bit 0 waveform start, bit 1 frame start, bit 2 RF blanking,
    // bit 3 RF ALC. Blanking covers the block symbols widened on both sides by the filter's
    // delay and half the window, 512 + 40 / 2 samples, plus the one sample the comparison
    // "at most" takes in.
    const auto markers = nrsynth_test::readMarkers(path + ".mkr");
    ASSERT_EQ(markers.size(), rx.samples.size());
    constexpr unsigned char kStarts = 0x03, kBlanking = 0x04, kAlc = 0x08;
    EXPECT_EQ(markers[0] & kStarts, kStarts);
    EXPECT_EQ(markers[15] & kStarts, kStarts);  // 4 samples at 30.72 MHz, 16 here
    EXPECT_EQ(markers[16] & kStarts, 0);
    constexpr int kExtension = 532;
    const auto& start = rx.start;
    const std::pair<long, bool> edges[] = {
        {start[2] - kExtension - 2, false},  {start[2] - kExtension - 1, true},
        {start[6] + kExtension, true},       {start[6] + kExtension + 1, false},
        {start[8] - kExtension - 1, true},   {start[54] + kExtension, true},
        {start[54] + kExtension + 1, false}, {1228799, false}};
    for (auto [sample, blanked] : edges)
        EXPECT_EQ((markers[sample] & kBlanking) != 0, blanked) << sample;
    // RF ALC follows the burst's symbols exactly, without the widening.
    EXPECT_EQ(markers[start[3]] & kAlc, kAlc);
    EXPECT_EQ(markers[start[2] - 1] & kAlc, 0);
    EXPECT_EQ(markers[start[6]] & kAlc, 0);
}

}  // namespace
