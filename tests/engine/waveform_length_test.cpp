// Length of a waveform from frames, subframes and slot cuts.

#include <gtest/gtest.h>

#include <cmath>
#include <string>

#include "engine/nr5g_engine.h"
#include "models/nr5g_waveform_settings.h"

namespace {

using Models::Nr5g::NR5GWaveformSettings;
using Models::Nr5g::Numerology;
using Orvalis_NR::ComputeWaveformLength;

// Gives `settings` one carrier of `numerology` and the given length settings.
void setLength(NR5GWaveformSettings& settings, double sampleRate, int frames, int subframeOffset, int subframes,
               int slotOffset, int slotCount, Numerology numerology = Numerology::SCS15k) {
    settings.SampleRateAuto->setValue(sampleRate);
    settings.NumberOfFrames->setValue(frames);
    settings.SubframeOffset->setValue(subframeOffset);
    settings.NumberOfSubframes->setValue(subframes);
    settings.SlotOffsetInSubframe->setValue(slotOffset);
    settings.NumberOfSlotsInSubframe->setValue(slotCount);
    auto carriers = settings.NRCarriers->getValue();
    carriers->resize(1);
    carriers->getItem(0)->Numerology->setValue(numerology);
}

struct LengthCase {
    const char* name;
    double sampleRate;
    int frames, subframeOffset, subframes;
    Numerology numerology;
    int slotOffset, slotCount;  // -1: no cut
    int expectedTotal, expectedStart;
};

class WaveformLength : public ::testing::TestWithParam<LengthCase> {};

TEST_P(WaveformLength, FollowsFramesSubframesAndSlots) {
    const auto& c = GetParam();
    NR5GWaveformSettings settings;
    setLength(settings, c.sampleRate, c.frames, c.subframeOffset, c.subframes, c.slotOffset, c.slotCount,
              c.numerology);

    const auto length = ComputeWaveformLength(settings);
    EXPECT_EQ(length.totalSamples, c.expectedTotal);
    EXPECT_EQ(length.startSample, c.expectedStart);
}

// Worked by hand. At 122.88 MHz and 30 kHz: fft 4096, cp 288, long cp 352, slot 61376 samples,
// slots 0 and 1 (= slots / 2) are long (61440). At 30.72 MHz and 15 kHz: fft 2048, cp 144,
// long cp 160, slot 30688; a cut counts every 15 kHz slot as 30688 + 2 x 16 = 30720, while the
// offset before it counts slot 0 as a long slot only (30704).
INSTANTIATE_TEST_SUITE_P(
    Cases, WaveformLength,
    ::testing::Values(
        LengthCase{"OneFrame", 122.88e6, 1, 0, 10, Numerology::SCS30k, -1, -1, 1228800, 0},
        LengthCase{"SubframesWithOffset", 30.72e6, 1, 2, 3, Numerology::SCS15k, -1, -1, 92160,
                   61440},
        LengthCase{"CutSecondSlot30k", 122.88e6, 1, 0, 10, Numerology::SCS30k, 1, 1, 61440, 61440},
        LengthCase{"CutTwoSlots15k", 30.72e6, 1, 0, 10, Numerology::SCS15k, 1, 2, 61440, 30704},
        LengthCase{"CutAfterSubframeOffset60k", 122.88e6, 1, 1, 10, Numerology::SCS60kNCP, 1, 2,
                   // 60 kHz: fft 2048, cp 144, long cp 208; slot 30688, slots 0 and 2 long
                   30752 + 30688, 122880 + 30752},
        LengthCase{"CutExtendedPrefix", 122.88e6, 1, 0, 10, Numerology::SCS60kECP, 0, 1,
                   // extended prefix 512: 12 x (2048 + 512), long cp = cp
                   30720, 0},
        // Slot offset -1 (its default): no slot before the cut, and the cut counts slots -1 and
        // 0. At 3.84 MHz and 30 kHz: fft 128, cp 9, no longer prefix (ratio 0), slot 1918.
        LengthCase{"CutFromSlotMinusOne", 3.84e6, 1, 0, 10, Numerology::SCS30k, -1, 2, 3836, 0},
        // At 30.72 MHz and 30 kHz (fft 1024, cp 72, long cp 88, slot 15344): slots -1 and 0,
        // of which slot 0 is long.
        LengthCase{"CutFromSlotMinusOneLongSlot", 30.72e6, 1, 0, 10, Numerology::SCS30k, -1, 2,
                   15344 + 15360, 0},
        // A count below -1 keeps no slot.
        LengthCase{"CutOfNoSlot", 30.72e6, 1, 0, 10, Numerology::SCS30k, 0, -3, 0, 0},
        // No carrier and no sample rate: an empty waveform.
        LengthCase{"NothingAtRateZero", 0.0, 1, 0, 10, Numerology::SCS30k, -1, -1, 0, 0}),
    [](const auto& info) { return std::string(info.param.name); });

// Lengths that no int holds, negative ones, and rates that give none: refused with the settings
// named, never truncated into a wrong length.
struct RefusedCase {
    const char* name;
    double sampleRate;
    int frames, subframeOffset, subframes, slotOffset, slotCount;
    const char* named;  // must appear in the failure text
};

class RefusedWaveformLength : public ::testing::TestWithParam<RefusedCase> {};

TEST_P(RefusedWaveformLength, NamesTheSettings) {
    const auto& c = GetParam();
    NR5GWaveformSettings settings;
    setLength(settings, c.sampleRate, c.frames, c.subframeOffset, c.subframes, c.slotOffset, c.slotCount);
    try {
        ComputeWaveformLength(settings);
        ADD_FAILURE() << "no failure";
    } catch (const char* text) {
        EXPECT_NE(std::string(text).find(c.named), std::string::npos) << text;
    }
}

INSTANTIATE_TEST_SUITE_P(
    Cases, RefusedWaveformLength,
    ::testing::Values(
        RefusedCase{"BeyondAnInt", 1e9, 1000, 0, 10, -1, -1, "NumberOfFrames 1000"},
        RefusedCase{"NegativeFrames", 3.84e6, -1, 0, 10, -1, -1, "NumberOfFrames -1"},
        RefusedCase{"NegativeSubframeOffset", 3.84e6, 1, -1, 10, -1, -1, "SubframeOffset -1"},
        RefusedCase{"NegativeRate", -3.84e6, 1, 0, 10, -1, -1, "SampleRateAuto -3840000"},
        RefusedCase{"RateNotANumber", std::nan(""), 1, 0, 10, -1, -1, "SampleRateAuto nan"},
        RefusedCase{"SlotCountBeyondAnInt", 122.88e6, 1, 0, 10, 0, 2147483647,
                    "NumberOfSlotsInSubframe 2147483647"},
        RefusedCase{"SlotOffsetBeyondAnInt", 122.88e6, 1, 0, 10, 2147483647, 1,
                    "SlotOffsetInSubframe 2147483647"},
        RefusedCase{"CutAtARateBeyondAnInt", 3e9, 1, 0, 1, 0, 1, "SampleRateAuto 3000000000"}),
    [](const auto& info) { return std::string(info.param.name); });

}  // namespace
