// An SS burst end to end: the example waveform generated through the C interface and
// demodulated as a receiver does, with the synchronisation signals computed here from
// TS 38.211 clause 7.4.2.

#include <gtest/gtest.h>

#include <cmath>
#include <complex>
#include <fstream>
#include <numbers>
#include <sstream>
#include <vector>

#include "../engine/output_files.h"
#include "../engine/waveform_test_support.h"
#include "test_support.h"

namespace {

using Sample = std::complex<double>;

std::vector<int> mSequence(std::vector<int> x, int tapA, int tapB) {  // x(i+7) = x(i+tapA) + x(i+tapB)
    for (int i = 0; i + 7 < 127; ++i) x.push_back((x[static_cast<std::size_t>(i + tapA)] + x[static_cast<std::size_t>(i + tapB)]) % 2);
    return x;
}

std::vector<double> pss(int nId2) {  // clause 7.4.2.2
    const auto x = mSequence({0, 1, 1, 0, 1, 1, 1}, 4, 0);
    std::vector<double> d(127);
    for (int n = 0; n < 127; ++n) d[static_cast<std::size_t>(n)] = 1 - 2 * x[static_cast<std::size_t>((n + 43 * nId2) % 127)];
    return d;
}

std::vector<double> sss(int nId1, int nId2) {  // clause 7.4.2.3
    const auto x0 = mSequence({1, 0, 0, 0, 0, 0, 0}, 4, 0);
    const auto x1 = mSequence({1, 0, 0, 0, 0, 0, 0}, 1, 0);
    const int m0 = 15 * (nId1 / 112) + 5 * nId2;
    const int m1 = nId1 % 112;
    std::vector<double> d(127);
    for (int n = 0; n < 127; ++n)
        d[static_cast<std::size_t>(n)] = (1 - 2 * x0[static_cast<std::size_t>((n + m0) % 127)]) *
                                         (1 - 2 * x1[static_cast<std::size_t>((n + m1) % 127)]);
    return d;
}

/// Receiver view of one OFDM symbol: the FFT window starts halfway into the cyclic prefix, and
/// the linear phase that this advance gives is taken out again. Returns subcarrier k.
struct Demodulator {
    const std::vector<Sample>& samples;
    int fftSize;
    std::vector<long> symbolStart;  // first sample of each symbol's prefix
    std::vector<int> prefix;

    Sample resourceElement(int symbol, int k) const {
        const int advance = prefix[static_cast<std::size_t>(symbol)] / 2;
        const long begin = symbolStart[static_cast<std::size_t>(symbol)] + prefix[static_cast<std::size_t>(symbol)] - advance;
        Sample sum{};
        for (int n = 0; n < fftSize; ++n)
            sum += samples[static_cast<std::size_t>(begin + n)] *
                   std::polar(1.0, -2.0 * std::numbers::pi * k * n / fftSize);
        return sum * std::polar(1.0, 2.0 * std::numbers::pi * k * advance / fftSize);
    }
};

/// Error vector magnitude in dB after the best complex gain; the gain is returned in `gain`.
double evmDb(const std::vector<Sample>& received, const std::vector<double>& reference, Sample& gain) {
    Sample cross{};
    double energy = 0.0;
    for (std::size_t i = 0; i < reference.size(); ++i) {
        cross += received[i] * reference[i];
        energy += reference[i] * reference[i];
    }
    gain = cross / energy;
    double error = 0.0;
    for (std::size_t i = 0; i < reference.size(); ++i) error += std::norm(received[i] - gain * reference[i]);
    return 10.0 * std::log10(error / (std::norm(gain) * energy));
}

nlohmann::json readExample(const char* name) {
    const auto example = nrsynth_test::sourceDir() / "examples" / name;
    std::ifstream in(example);
    std::stringstream text;
    text << in.rdbuf();
    auto document = nlohmann::json::parse(text.str());
    document["NumberOfFrames"] = 1;
    return document;
}

/// Symbol starts of one frame at 30.72 MHz times `up`, for 15 kHz (`mu` 0) or 30 kHz.
Demodulator frameDemodulator(const std::vector<Sample>& samples, int fftSize, int up, int mu) {
    Demodulator demodulator{samples, fftSize, {}, {}};
    long position = 0;
    const int symbolsPerHalfSubframe = 7 << mu;
    for (int s = 0; s < 140 << mu; ++s) {
        demodulator.symbolStart.push_back(position);
        demodulator.prefix.push_back(fftSize * 9 / 128 + (s % symbolsPerHalfSubframe == 0 ? 16 * up : 0));
        position += demodulator.prefix.back() + fftSize;
    }
    return demodulator;
}

/// Gain of the PSS of the block whose first symbol is `first`, after checking its EVM.
double pssLevel(const Demodulator& demodulator, int cellId, int blockStart, int first) {
    std::vector<Sample> received;
    for (int n = 0; n < 127; ++n)
        received.push_back(demodulator.resourceElement(first, ((blockStart + 56 + n) % demodulator.fftSize + demodulator.fftSize) % demodulator.fftSize));
    Sample gain;
    EXPECT_LT(evmDb(received, pss(cellId % 3), gain), -40.0) << "PSS at symbol " << first;
    return std::abs(gain);
}

TEST(SsBurstWaveform, CaseABurstIsScaledWhenSeveralCarriersAreSummed) {
    // 15 kHz is scaled by 1 / sqrt(2^0 x 0.5) once a second carrier exists, enabled or not.
    auto single = readExample("ssb_case_a_15khz.json");
    auto withSecond = single;
    withSecond["NRCarriers"].push_back({{"CarrierType", "CW"}, {"Enabled", false}});
    double levels[2] = {};
    int index = 0;
    for (const auto* document : {&single, &withSecond}) {
        nrsynth_test::ScratchFolder folder;
        const auto path = folder.file("a.bin");
        ASSERT_EQ(nrsynth_test::generate(*document, path), 0) << GetLog();
        const auto samples = nrsynth_test::readSamples(path);
        ASSERT_EQ(samples.size(), 307200u);
        const auto demodulator = frameDemodulator(samples, 2048, 1, 0);
        const int cellId = (*document)["NRCarriers"][0]["CellID"];
        const int blockStart = (*document)["NRCarriers"][0]["Downlink"]["SSPBCH"]["FrequencyOffset"].get<int>() - 120;
        // Case A, Lmax 4: first symbols 2, 8, 16, 22.
        for (int first : {2, 8, 16, 22}) levels[index] = pssLevel(demodulator, cellId, blockStart, first);
        ++index;
    }
    EXPECT_NEAR(levels[0], 1.0, 0.05);
    EXPECT_NEAR(levels[1] / levels[0], std::sqrt(2.0), 1e-6);
}

TEST(SsBurstWaveform, CaseCBurstCarriesPssAndSssAtItsCandidateSymbols) {
    auto document = readExample("ssb_case_c_30khz.json");

    nrsynth_test::ScratchFolder folder;
    const auto path = folder.file("ssb.bin");
    ASSERT_EQ(nrsynth_test::generate(document, path), 0) << GetLog();
    const auto samples = nrsynth_test::readSamples(path);
    ASSERT_EQ(samples.size(), 1228800u);

    // 30 kHz at 122.88 MHz: 4096-point symbols, prefix 288, 352 on the first of each half subframe.
    const auto demodulator = frameDemodulator(samples, 4096, 4, 1);
    ASSERT_EQ(demodulator.symbolStart.back() + demodulator.prefix.back() + 4096, 1228800);

    const int cellId = document["NRCarriers"][0]["CellID"];
    const int blockStart = document["NRCarriers"][0]["Downlink"]["SSPBCH"]["FrequencyOffset"].get<int>() - 120;
    const auto expectedPss = pss(cellId % 3);
    const auto expectedSss = sss(cellId / 3, cellId % 3);
    auto column = [&](int n) { return ((blockStart + 56 + n) % 4096 + 4096) % 4096; };

    // Case C, Lmax 8: first symbols {2, 8} + 14 n, n = 0..3 (TS 38.213 clause 4.1).
    for (int first : {2, 8, 16, 22, 30, 36, 44, 50}) {
        std::vector<Sample> pssReceived, sssReceived;
        for (int n = 0; n < 127; ++n) {
            pssReceived.push_back(demodulator.resourceElement(first, column(n)));
            sssReceived.push_back(demodulator.resourceElement(first + 2, column(n)));
        }
        Sample pssGain, sssGain;
        EXPECT_LT(evmDb(pssReceived, expectedPss, pssGain), -40.0) << "PSS of the block at symbol " << first;
        EXPECT_LT(evmDb(sssReceived, expectedSss, sssGain), -40.0) << "SSS of the block at symbol " << first;
        EXPECT_NEAR(std::abs(pssGain), 1.0, 0.05) << first;  // level 1, filter passband near 1
        EXPECT_NEAR(std::abs(sssGain), std::abs(pssGain), 0.01) << first;

        // PBCH DM-RS sit on every fourth subcarrier from v = cell id mod 4, unit magnitude.
        const int v = cellId % 4;
        for (int k = v; k < 240; k += 4 * 17) {
            const auto dmrs = demodulator.resourceElement(first + 1, ((blockStart + k) % 4096 + 4096) % 4096);
            EXPECT_NEAR(std::abs(dmrs), std::abs(pssGain), 0.02) << "DM-RS at block column " << k;
        }
    }
    // Symbols without a block stay empty at the block's columns.
    for (int symbol : {0, 1, 6, 60, 200}) EXPECT_LT(std::abs(demodulator.resourceElement(symbol, column(60))), 1e-3) << symbol;

    // Markers (default lines): bit 0 waveform start, bit 1 frame start, bit 2 RF blanking,
    // bit 3 RF ALC. Blanking covers the block symbols widened on both sides by the filter's
    // delay and half the window, 512 + 40 / 2 samples, plus the one sample the comparison
    // "at most" takes in.
    const auto markers = nrsynth_test::readMarkers(path + ".mkr");
    ASSERT_EQ(markers.size(), samples.size());
    constexpr unsigned char kStarts = 0x03, kBlanking = 0x04, kAlc = 0x08;
    EXPECT_EQ(markers[0] & kStarts, kStarts);
    EXPECT_EQ(markers[15] & kStarts, kStarts);  // 4 samples at 30.72 MHz, 16 here
    EXPECT_EQ(markers[16] & kStarts, 0);
    constexpr int kExtension = 532;
    auto start = [&](int symbol) { return demodulator.symbolStart[static_cast<std::size_t>(symbol)]; };
    struct Edge {
        long sample;
        bool blanked;
    } edges[] = {{start(2) - kExtension - 2, false}, {start(2) - kExtension - 1, true}, {start(6) + kExtension, true},
                 {start(6) + kExtension + 1, false}, {start(8) - kExtension - 1, true}, {start(54) + kExtension, true},
                 {start(54) + kExtension + 1, false}, {1228799, false}};
    for (const auto& edge : edges)
        EXPECT_EQ((markers[static_cast<std::size_t>(edge.sample)] & kBlanking) != 0, edge.blanked) << edge.sample;
    // RF ALC follows the burst's symbols exactly, without the widening.
    EXPECT_EQ(markers[static_cast<std::size_t>(start(3))] & kAlc, kAlc);
    EXPECT_EQ(markers[static_cast<std::size_t>(start(2) - 1)] & kAlc, 0);
    EXPECT_EQ(markers[static_cast<std::size_t>(start(6))] & kAlc, 0);
}

}  // namespace
