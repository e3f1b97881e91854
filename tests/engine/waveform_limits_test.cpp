// Where waveforms end: settings that look odd but have a defined result run, those whose result
// would be undefined (or a file shorter than the waveform) fail with a text that says why.

#include <gtest/gtest.h>

#include <climits>
#include <complex>
#include <filesystem>
#include <numbers>
#include <random>
#include <string>
#include <vector>

#include "output_files.h"
#include "waveform_test_support.h"

namespace {

using nrsynth_test::cwCarrier;
using nrsynth_test::generate;
using nrsynth_test::readSamples;
using nrsynth_test::waveform;
using Sample = std::complex<double>;

const nlohmann::json kSsb = {{"Enabled", true}, {"Numerology", "SCS15k"}, {"Mu", 0}, {"Lmax", 4},
                             {"PowerLevelStr", "1"}};

nlohmann::json downlinkCarrier(bool withSsb, nlohmann::json extra = nlohmann::json::object()) {
    nlohmann::json carrier = {{"CarrierType", "DL"}, {"Numerology", "SCS15k"}};
    if (withSsb) carrier["Downlink"] = {{"SSPBCH", kSsb}};
    carrier.update(extra);
    return carrier;
}

struct LimitCase {
    const char* name;
    nlohmann::json document;
    std::size_t samples;   // file length when the run succeeds
    const char* failure;   // start of the failure text after the heading, or null
};

class WaveformLimits : public ::testing::TestWithParam<LimitCase> {
  protected:
    nrsynth_test::ScratchFolder folder;
    std::string path = folder.file("wave.bin");
};

TEST_P(WaveformLimits, RunOrFailWithAReason) {
    const auto& c = GetParam();
    const int status = generate(c.document, path);
    if (c.failure == nullptr) {
        ASSERT_EQ(status, 0) << GetLog();
        EXPECT_EQ(readSamples(path).size(), c.samples);
        EXPECT_EQ(nrsynth_test::readMarkers(path + ".mkr").size(), c.samples);
        return;
    }
    EXPECT_EQ(status, -1);
    const std::string log = GetLog();
    const auto body = log.find("Error! \r\n");
    ASSERT_NE(body, std::string::npos) << log;
    EXPECT_EQ(log.substr(body + 9, std::string(c.failure).size()), c.failure) << log;
}

INSTANTIATE_TEST_SUITE_P(
    Cases, WaveformLimits,
    ::testing::Values(
        // Slots cut without a slot offset: the slots -1 and 0 at 30 kHz, 2 x 1918 at 3.84 MHz.
        LimitCase{"SlotCutWithDefaultOffset",
                  {{"SampleRateAuto", 3840000}, {"NumberOfSlotsInSubframe", 2}, {"NRCarriers", {cwCarrier()}}},
                  3836, nullptr},
        LimitCase{"NothingToGenerateAtRateZero", waveform(0.0, 1, {{{"CarrierType", "CW"}, {"Enabled", false}}}),
                  0, nullptr},
        // A carrier with no channel builds no transform and no window: any rate from 1 Hz and
        // any window factor are fine; it gives zeros.
        LimitCase{"IdleDownlinkAtALowRate", waveform(10000.0, 1, {downlinkCarrier(false)}), 100, nullptr},
        LimitCase{"WindowFactorOfAnIdleCarrier",
                  waveform(7.68e6, 1, {downlinkCarrier(false, {{"WindowBeta", 5.0}})}), 76800, nullptr},
        LimitCase{"WindowFactorOfAContinuousWave",
                  waveform(7.68e6, 1, {{{"CarrierType", "CW"}, {"WindowBeta", -3.0}}}), 76800, nullptr},
        // In real-time phase compensation no window is built either.
        LimitCase{"WindowFactorWithoutWindow",
                  [] {
                      auto document = waveform(7.68e6, 1, {downlinkCarrier(true, {{"WindowBeta", 5.0}})});
                      document["PhaseCompensation"] = "AutoRT";
                      return document;
                  }(),
                  76800, nullptr},
        // No antenna: nothing to write, no file.
        LimitCase{"NoAntenna",
                  [] {
                      auto document = waveform(7.68e6, 1, {downlinkCarrier(true)});
                      document["NumberOfAntennas"] = 0;
                      return document;
                  }(),
                  0, nullptr},
        // A rate not a multiple of 100 Hz over one frame still fills it.
        LimitCase{"OddRateOneFrame", waveform(3840050.0, 1, {cwCarrier()}), 38400, nullptr},

        LimitCase{"CarrierAtRateZero", waveform(0.0, 1, {cwCarrier()}), 0,
                  "SampleRateAuto must lie from 1 Hz to 2147483647 Hz"},
        LimitCase{"NoiseAboveAnIntOfRate", {{"SampleRateAuto", 3e9}, {"AwgnEnabled", true}}, 0,
                  "SampleRateAuto must lie from 1 Hz to 2147483647 Hz"},
        LimitCase{"ContinuousWaveBelow30kHz", waveform(20000.0, 1, {cwCarrier()}), 0,
                  "A continuous-wave carrier needs SampleRateAuto of at least 30000 Hz"},
        LimitCase{"WindowLongerThanTheSymbol",
                  waveform(7.68e6, 1, {downlinkCarrier(true, {{"WindowBeta", 5.0}})}), 0,
                  "WindowBeta must lie from 0 to 1"},
        LimitCase{"MoreAntennasThanFiles", {{"SampleRateAuto", 3.84e6}, {"NumberOfAntennas", INT_MAX}}, 0,
                  "NumberOfAntennas needs more open files"},
        // Files that would end short of the waveform's length.
        LimitCase{"MoreThanTenSubframes",
                  [] {
                      auto document = waveform(3.84e6, 1, {cwCarrier()});
                      document["NumberOfSubframes"] = 20;
                      return document;
                  }(),
                  0, "An output file does not hold the whole waveform."},
        LimitCase{"OddRateTwoFrames", waveform(3840099.0, 2, {cwCarrier()}), 0,
                  "An output file does not hold the whole waveform."}),
    [](const auto& info) { return std::string(info.param.name); });

// The level of a continuous wave means the mean power of an OFDM carrier of 3276 subcarriers
// (273 resource blocks) of unit elements, at 30 kHz spacing, at the waveform's rate: an inverse
// transform of N = rate / 30 kHz points, scaled by 1 / N. The OFDM symbol is synthesised here
// from its definition, with random phases, at rates whose transform holds all 3276 subcarriers.
TEST(ContinuousWaveLevel, HasThePowerOfAFullOfdmCarrier) {
    std::mt19937 random(7);
    std::uniform_real_distribution<double> angle(0.0, 2.0 * std::numbers::pi);
    for (int n : {3276, 3300, 4096}) {
        std::vector<Sample> roots(static_cast<std::size_t>(n));
        for (int t = 0; t < n; ++t) roots[static_cast<std::size_t>(t)] = std::polar(1.0, 2.0 * std::numbers::pi * t / n);
        std::vector<Sample> elements;
        for (int k = 0; k < 3276; ++k) elements.push_back(std::polar(1.0, angle(random)));
        double power = 0.0;
        for (int t = 0; t < n; ++t) {
            Sample x{};
            for (int k = -1638; k < 1638; ++k) {
                const long index = (static_cast<long>(k) * t % n + n) % n;
                x += elements[static_cast<std::size_t>(k + 1638)] * roots[static_cast<std::size_t>(index)];
            }
            power += std::norm(x / static_cast<double>(n));
        }
        power /= n;

        nrsynth_test::ScratchFolder folder;
        auto document = waveform(30000.0 * n, 1, {cwCarrier()});
        document["NumberOfSubframes"] = 1;
        ASSERT_EQ(generate(document, folder.file("cw.bin")), 0) << GetLog();
        const auto samples = readSamples(folder.file("cw.bin"));
        ASSERT_EQ(samples.size(), static_cast<std::size_t>(30 * n));
        EXPECT_NEAR(std::norm(samples[0]) / power, 1.0, 1e-9) << "N " << n;
        EXPECT_NEAR(std::norm(samples.back()) / power, 1.0, 1e-9) << "N " << n;
    }
}

}  // namespace
