// Where a carrier's content lands in the file. A waveform shorter than a frame is its piece of the
// full frame wrapped round its own length (the part of the frame outside it blanked), and a first
// carrier with a timing offset is its waveform rotated by that many samples. The references are
// the same carrier generated over the whole frame, with no offset.

#include <gtest/gtest.h>

#include <algorithm>
#include <complex>
#include <string>
#include <vector>

#include "output_files.h"
#include "waveform_test_support.h"

namespace {

using nrsynth_test::generate;
using nrsynth_test::readMarkers;
using nrsynth_test::readSamples;
using Sample = std::complex<double>;

constexpr double kRate = 7.68e6;  // 30 kHz symbols of 256 + 18 samples (22 for the long prefix)
constexpr int kSubframe = 7680;

// An SS burst, Case C, Lmax 8, at 30 kHz: blocks 0 to 3 in subframe 0 (symbols 2, 8, 16, 22),
// 4 to 7 in subframe 1 (30, 36, 44, 50). `levels` switches blocks on and off. The full-length
// window (256 samples) and the 1025-tap filter spread each block 640 samples beyond its symbols,
// a little past the two empty symbols at each slot's end, so every piece has something to wrap.
nlohmann::json ssbWaveform(const char* levels, int frames) {
    const nlohmann::json ssb = {{"Enabled", true},        {"Numerology", "SCS30k"}, {"Mu", 1},
                                {"SSBlockPattern", "CaseC"}, {"SSB30KSymbolIndex", "Option1"},
                                {"Lmax", 8},              {"PowerLevelStr", levels}};
    const nlohmann::json carrier = {{"CarrierType", "DL"}, {"Numerology", "SCS30k"}, {"CellID", 17},
                                    {"WindowBeta", 1.0},   {"Downlink", {{"SSPBCH", ssb}}}};
    return nrsynth_test::waveform(kRate, frames, {carrier});
}

struct PieceCase {
    const char* name;
    int subframeOffset, subframes, slotOffset, slotCount;
    const char* levels;           // blocks of the piece's waveform
    const char* referenceLevels;  // the blocks that lie inside the piece
    int start, length;            // where the piece lies in the frame
};

class WaveformPiece : public ::testing::TestWithParam<PieceCase> {};

TEST_P(WaveformPiece, IsTheFullFrameWrappedRoundThePiece) {
    const auto& c = GetParam();
    nrsynth_test::ScratchFolder folder;
    ASSERT_EQ(generate(ssbWaveform(c.referenceLevels, 1), folder.file("full.bin")), 0) << GetLog();
    auto document = ssbWaveform(c.levels, 1);
    document["SubframeOffset"] = c.subframeOffset;
    document["NumberOfSubframes"] = c.subframes;
    document["SlotOffsetInSubframe"] = c.slotOffset;
    document["NumberOfSlotsInSubframe"] = c.slotCount;
    ASSERT_EQ(generate(document, folder.file("piece.bin")), 0) << GetLog();

    const auto full = readSamples(folder.file("full.bin"));
    const auto piece = readSamples(folder.file("piece.bin"));
    ASSERT_EQ(full.size(), 10u * kSubframe);
    ASSERT_EQ(piece.size(), static_cast<std::size_t>(c.length));
    const long n = static_cast<long>(full.size()), p = c.length;
    auto at = [&](long index) { return full[static_cast<std::size_t>(((index % n) + n) % n)]; };
    double worst = 0.0, peak = 0.0, spill = 0.0;
    for (long k = 0; k < p; ++k) {
        const Sample wrapped = at(c.start + k - p) + at(c.start + k) + at(c.start + k + p);
        worst = std::max(worst, std::abs(piece[static_cast<std::size_t>(k)] - wrapped));
        peak = std::max(peak, std::abs(wrapped));
        spill = std::max({spill, std::abs(at(c.start + k - p)), std::abs(at(c.start + k + p))});
    }
    EXPECT_GT(peak, 0.01);
    EXPECT_GT(spill, 1e3 * 1e-12 * peak) << "nothing crosses the piece's edges: the wrap is untested";
    EXPECT_LT(worst, 1e-12 * peak);
}

INSTANTIATE_TEST_SUITE_P(
    Cases, WaveformPiece,
    ::testing::Values(
        PieceCase{"FirstSubframe", 0, 1, -1, -1, "1,1,1,1,0,0,0,0", "1,1,1,1,0,0,0,0", 0, kSubframe},
        PieceCase{"SecondSubframe", 1, 1, -1, -1, "0,0,0,0,1,1,1,1", "0,0,0,0,1,1,1,1", kSubframe, kSubframe},
        PieceCase{"TwoSubframes", 0, 2, -1, -1, "1", "1", 0, 2 * kSubframe},
        // The blocks of subframe 0 are blanked before they are modulated, so their spill into
        // subframe 1 does not reach the piece.
        PieceCase{"BlankedSubframes", 1, 1, -1, -1, "1", "0,0,0,0,1,1,1,1", kSubframe, kSubframe},
        // Slot 1 of subframe 0 (blocks 2 and 3); slot 0 and the other subframes are blanked.
        // The engine measures slots with a long prefix of 18 at this rate (its integer rate
        // ratio is 0), so slot 0 counts 14 x 274 = 3836 samples, and so does the piece.
        PieceCase{"SecondSlot", 0, 1, 1, 1, "1", "0,0,1,1,0,0,0,0", 3836, 3836}),
    [](const auto& info) { return std::string(info.param.name); });

// The first carrier with a timing offset: its samples are those without the offset, rotated
// forward by trunc(SampleRateAuto x TimingOffset); the file keeps its length and, as the burst's
// end is silent, opens with zeros. Frame start marks move with the carrier, while the waveform
// start stays at the file's first sample.
TEST(WaveformTimingOffset, FirstCarrierIsRotatedAndTheFileFull) {
    nrsynth_test::ScratchFolder folder;
    ASSERT_EQ(generate(ssbWaveform("1", 2), folder.file("plain.bin")), 0) << GetLog();
    auto document = ssbWaveform("1", 2);
    const double timing = 0.0001;
    document["NRCarriers"][0]["TimingOffset"] = timing;
    ASSERT_EQ(generate(document, folder.file("late.bin")), 0) << GetLog();

    const auto plain = readSamples(folder.file("plain.bin"));
    const auto late = readSamples(folder.file("late.bin"));
    const auto plainMarkers = readMarkers(folder.file("plain.bin.mkr"));
    const auto lateMarkers = readMarkers(folder.file("late.bin.mkr"));
    const std::size_t n = 2 * 10 * kSubframe, offset = static_cast<std::size_t>(kRate * timing);
    ASSERT_EQ(offset, 768u);
    ASSERT_EQ(late.size(), n);
    ASSERT_EQ(lateMarkers.size(), n);
    double peak = 0.0;
    for (const auto& sample : plain) peak = std::max(peak, std::abs(sample));
    for (std::size_t i = 0; i < offset; ++i) ASSERT_LT(std::abs(late[i]), 1e-6 * peak) << i;  // only far filter tails
    constexpr unsigned char kWaveformStart = 0x01, kFrameStart = 0x02, kRf = 0x0C;
    for (std::size_t i = 0; i < n; ++i) {
        const std::size_t source = (i + n - offset) % n;
        ASSERT_EQ(late[i], plain[source]) << i;
        ASSERT_EQ(lateMarkers[i] & kRf, plainMarkers[source] & kRf) << i;
        ASSERT_EQ((lateMarkers[i] & kWaveformStart) != 0, i == 0) << i;
        ASSERT_EQ((lateMarkers[i] & kFrameStart) != 0, i == offset || i == offset + n / 2) << i;
    }
}

}  // namespace
