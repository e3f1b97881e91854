// Whole waveforms through the C interface: file lengths, names and contents of continuous-wave
// carriers, noise, the cyclic seam, carrier accumulation and cancelling.

#include <gtest/gtest.h>

#include <cmath>
#include <complex>
#include <cstdlib>
#include <filesystem>
#include <numbers>
#include <random>
#include <vector>

#include "dsp/sinc_low_pass.h"
#include "dsp/ziggurat_normal.h"
#include "output_files.h"
#include "waveform_test_support.h"

namespace {

using nrsynth_test::cwCarrier;
using nrsynth_test::generate;
using nrsynth_test::readMarkers;
using nrsynth_test::readSamples;
using nrsynth_test::waveform;
using Sample = std::complex<double>;

constexpr double kRate = 30.72e6;                    // 4 samples of frame-start marker at this rate
constexpr int kFrame = 307200;                       // samples per 10 ms frame
// Root mean power of 3276 unit subcarriers through a 1024-point (30 kHz at this rate) inverse
// transform scaled by 1 / 1024; checked by synthesis in ContinuousWaveLevel.
const double kCwLevel = std::sqrt(3276.0) / 1024.0;

// Marker bytes with the default lines: Marker1 waveform start, Marker2 frame start,
// Marker3 RF blanking (bit 2), Marker4 RF ALC (bit 3).
constexpr unsigned char kWaveformStart = 0x01, kFrameStart = 0x02, kBlanking = 0x04, kAlc = 0x08;

class WaveformOutput : public ::testing::Test {
  protected:
    nrsynth_test::ScratchFolder folder;
    std::string path = folder.file("wave.bin");
};

TEST_F(WaveformOutput, FrequencyOffsetPhaseAndGainContinueAcrossFramesAndTheLoop) {
    // 1 kHz fits 30 whole cycles into three frames, so the loop has no seam.
    auto carrier = cwCarrier(1000.0);
    carrier["InitialPhase"] = 30.0;
    carrier["PowerBoosting"] = 6.0;
    ASSERT_EQ(generate(waveform(kRate, 3, {carrier}), path), 0) << GetLog();
    const auto samples = readSamples(path);
    ASSERT_EQ(samples.size(), static_cast<std::size_t>(3 * kFrame));

    const double gain = std::pow(10.0, 6.0 / 20.0) * kCwLevel;
    double worst = 0.0;
    for (std::size_t n = 0; n < samples.size(); ++n) {
        const double phase = 2.0 * std::numbers::pi * 1000.0 * static_cast<double>(n) / kRate +
                             std::numbers::pi / 6.0;
        worst = std::max(worst, std::abs(samples[n] - std::polar(gain, phase)));
    }
    EXPECT_LT(worst, 1e-9);
    // Played in a loop, the step from the last sample to the first is the same rotation.
    const Sample step = samples.front() / samples.back();
    EXPECT_NEAR(std::arg(step), 2.0 * std::numbers::pi * 1000.0 / kRate, 1e-10);
}

// One file pair per antenna, numbered when there are several, at the continuous wave's level.
TEST_F(WaveformOutput, FileNamesAndLengths) {
    struct Case {
        nlohmann::json settings;
        std::vector<const char*> files;
        std::size_t length;
    };
    const Case cases[] = {
        {nlohmann::json::object(), {"wave.bin"}, kFrame},
        {{{"NumberOfAntennas", 2}}, {"wave0.bin", "wave1.bin"}, kFrame},
    };
    for (const auto& c : cases) {
        nrsynth_test::ScratchFolder out;
        auto document = waveform(kRate, 1, {cwCarrier()});
        document.update(c.settings);
        ASSERT_EQ(generate(document, out.file("wave.bin")), 0) << GetLog();
        const auto entries = std::filesystem::directory_iterator(out.path());
        EXPECT_EQ(std::distance(begin(entries), end(entries)), 2 * std::ssize(c.files));
        for (const char* name : c.files) {
            const auto samples = readSamples(out.file(name));
            ASSERT_EQ(samples.size(), c.length) << name;
            EXPECT_NEAR(std::abs(samples[c.length / 2] - kCwLevel), 0.0, 1e-12) << name;
            EXPECT_EQ(readMarkers(out.file(name) + ".mkr").size(), c.length) << name;
        }
    }
}

TEST_F(WaveformOutput, LaterCarrierWithTimingOffsetWrapsRoundTheFileEnd) {
    // Two equal carriers, the second 1.5 frames late in a two-frame waveform: every sample holds
    // both, also those before the second carrier's start, which it reaches by wrapping.
    auto late = cwCarrier();
    late["TimingOffset"] = 0.015;
    ASSERT_EQ(generate(waveform(kRate, 2, {cwCarrier(), late}), path), 0) << GetLog();
    const auto samples = readSamples(path);
    ASSERT_EQ(samples.size(), static_cast<std::size_t>(2 * kFrame));
    for (std::size_t i = 0; i < samples.size(); i += 311)
        ASSERT_NEAR(std::abs(samples[i] - 2.0 * kCwLevel), 0.0, 1e-12) << i;
    // Markers come from the first carrier (frame start 4 samples wide at this rate); the later one
    // only ORs its blanking line in.
    const auto markers = readMarkers(path + ".mkr");
    EXPECT_EQ(markers[3], kWaveformStart | kFrameStart | kBlanking | kAlc);
    EXPECT_EQ(markers[4], kBlanking | kAlc);
    EXPECT_EQ(markers[kFrame], kFrameStart | kBlanking | kAlc);
    EXPECT_EQ(markers[kFrame * 3 / 2], kBlanking | kAlc);
}

TEST_F(WaveformOutput, DisabledCarriersAreLeftOut) {
    auto disabled = cwCarrier(5000.0);
    disabled["Enabled"] = false;
    // Without an enabled carrier the files exist but stay empty.
    for (const auto& carriers : {nlohmann::json::array({disabled}), nlohmann::json::array()}) {
        ASSERT_EQ(generate(waveform(kRate, 1, carriers), path), 0) << GetLog();
        ASSERT_TRUE(std::filesystem::exists(path));
        EXPECT_EQ(std::filesystem::file_size(path), 0u);
        EXPECT_EQ(std::filesystem::file_size(path + ".mkr"), 0u);
    }
    // Before an enabled one, it adds nothing and the enabled one writes the markers first.
    ASSERT_EQ(generate(waveform(kRate, 1, {disabled, cwCarrier()}), path), 0) << GetLog();
    const auto samples = readSamples(path);
    ASSERT_EQ(samples.size(), static_cast<std::size_t>(kFrame));
    EXPECT_NEAR(std::abs(samples[777] - kCwLevel), 0.0, 1e-12);
    EXPECT_EQ(readMarkers(path + ".mkr")[0], kWaveformStart | kFrameStart | kBlanking | kAlc);
}

TEST_F(WaveformOutput, NoiseOnlyIsTheCircularlyFilteredNoiseWithFullMarkers) {
    // Noise only: the waveform played in a loop is the noise filtered as a circle, so the
    // filter's spill-over from the last frame lands at the start. A frame is longer than the
    // stretch of noise drawn and filtered at a time.
    constexpr double rate = 7.68e6;
    constexpr std::size_t frameLength = 76800, n = 2 * frameLength;
    auto disabled = cwCarrier();
    disabled["Enabled"] = false;
    auto document = waveform(rate, 2, {disabled});
    document["AwgnEnabled"] = true;
    document["CarrierToNoiseRatio"] = 10.0;
    document["NoiseBandwidth"] = 1.0e6;
    std::srand(4242);
    const auto seed = static_cast<unsigned int>(std::rand());
    std::srand(4242);
    ASSERT_EQ(generate(document, path), 0) << GetLog();
    const auto samples = readSamples(path);
    ASSERT_EQ(samples.size(), n);

    // The raw noise: frame 0 from the seed rand() gives, frame 1 from the default seed.
    const double x = 1.25e6 / rate;
    const double sigma = std::sqrt(x) * std::pow(10.0, -10.0 / 20.0) / std::sqrt(rate / 15000.0);
    std::vector<Sample> raw;
    for (int frame = 0; frame < 2; ++frame) {
        std::mt19937 engine;
        if (frame == 0) engine.seed(seed);
        const auto& normal = Orvalis_NR::zigguratNormal();
        for (std::size_t i = 0; i < frameLength; ++i) {
            const double re = normal(engine) * sigma;
            raw.emplace_back(re, normal(engine) * sigma);
        }
    }
    const auto taps = Generate_SincLowPass(x, 1024, 1, true);
    double worst = 0.0;
    for (std::size_t i = 0; i < n; i += 13) {  // every 13th sample keeps the convolution quick
        Sample expected{};
        for (std::size_t k = 0; k < taps.size(); ++k) expected += taps[k] * raw[(i + n - k) % n];
        worst = std::max(worst, std::abs(samples[i] - expected));
    }
    EXPECT_LT(worst, 1e-12 * 1e3 * sigma);

    const auto markers = readMarkers(path + ".mkr");
    ASSERT_EQ(markers.size(), n);
    EXPECT_EQ(markers[0], kWaveformStart | kFrameStart | kBlanking | kAlc);
    for (std::size_t i = 1; i < n; i += 101)
        ASSERT_EQ(markers[i] & (kBlanking | kAlc), kBlanking | kAlc) << i;
}

TEST_F(WaveformOutput, CancelFromAnotherThreadRemovesTheOutput) {
    // A long noisy run; the cancel comes once the first frame is on disk.
    auto document = waveform(kRate, 40, {cwCarrier(1000.0)});
    document["AwgnEnabled"] = true;
    StartDeserialize(document.dump().c_str());
    InitEngine(path.c_str());
    ASSERT_EQ(GetStatus(), 0) << GetLog();
    nrsynth_test::BackgroundRun run(path);
    EXPECT_FALSE(run.finished()) << "the run ended before the cancel came";
    Cancel();
    run.join();
    EXPECT_EQ(GetStatus(), 0);
    EXPECT_STREQ(GetLog(), "Deserialize OK! \r\nInit Engine OK! \r\nRun Engine OK! ");
    EXPECT_FALSE(std::filesystem::exists(path));
    EXPECT_FALSE(std::filesystem::exists(path + ".mkr"));
}

}  // namespace
