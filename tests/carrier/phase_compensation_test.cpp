// Phase compensation seen from a receiver. TS 38.211 clause 5.4 upconverts symbol l as
// s_l(t) exp(j 2 pi f0 (t - t_start,l - N_CP,l Tc)): the carrier's phase restarts at the start of
// each symbol's useful part. An upconverter of continuous phase gets that only when the baseband
// symbol carries exp(-j 2 pi f0 (t_start,l + N_CP,l Tc)). The receiver here mixes the file down by
// the carrier's frequency offset, demodulates at the symbol positions, applies the upconversion
// term for f0 = RadioFrequency + FrequencyOffset itself, and fits one complex gain to all
// synchronisation symbols of the burst: it undoes nothing symbol by symbol.

#include <gtest/gtest.h>

#include <cmath>
#include <complex>
#include <numbers>
#include <string>
#include <vector>

#include "../downlink/ssb_reference.h"
#include "../engine/output_files.h"
#include "../engine/waveform_test_support.h"

namespace {

using Sample = std::complex<double>;

constexpr double kRate = 7.68e6;  // 15 kHz: 512-point symbols, prefix 36, 40 at l = 0 and 7
constexpr int kFft = 512;
constexpr int kCellId = 5;

struct PhaseCase {
    const char* name;
    const char* mode;
    double radioFrequency, frequencyOffset;
    bool compensated;  // whether the generator applies the upconversion term
};

class PhaseCompensation : public ::testing::TestWithParam<PhaseCase> {};

/// Error vector magnitude in dB of `received` against `reference` after one best complex gain.
double evmDb(const std::vector<Sample>& received, const std::vector<Sample>& reference) {
    Sample cross{};
    double energy = 0.0, error = 0.0;
    for (std::size_t i = 0; i < reference.size(); ++i) {
        cross += received[i] * std::conj(reference[i]);
        energy += std::norm(reference[i]);
    }
    const Sample gain = cross / energy;
    for (std::size_t i = 0; i < reference.size(); ++i) error += std::norm(received[i] - gain * reference[i]);
    return 10.0 * std::log10(error / (std::norm(gain) * energy));
}

TEST_P(PhaseCompensation, ReceiverApplyingTheUpconversionTermSeesTheGrid) {
    const auto& c = GetParam();
    const nlohmann::json ssb = {{"Enabled", true}, {"Numerology", "SCS15k"}, {"Mu", 0}, {"SSBlockPattern", "CaseA"},
                                {"Lmax", 4},      {"PowerLevelStr", "1"}};
    const nlohmann::json carrier = {{"CarrierType", "DL"},
                                    {"Numerology", "SCS15k"},
                                    {"CellID", kCellId},
                                    {"FrequencyOffset", c.frequencyOffset},
                                    {"Downlink", {{"SSPBCH", ssb}}}};
    auto document = nrsynth_test::waveform(kRate, 1, {carrier});
    document["PhaseCompensation"] = c.mode;
    document["RadioFrequency"] = c.radioFrequency;
    nrsynth_test::ScratchFolder folder;
    ASSERT_EQ(nrsynth_test::generate(document, folder.file("w.bin")), 0) << GetLog();
    auto samples = nrsynth_test::readSamples(folder.file("w.bin"));
    ASSERT_EQ(samples.size(), 76800u);
    for (std::size_t n = 0; n < samples.size(); ++n)
        samples[n] *= std::polar(1.0, -2.0 * std::numbers::pi * c.frequencyOffset * static_cast<double>(n) / kRate);

    // Prefix start and length of each symbol of the frame.
    std::vector<long> start;
    std::vector<int> prefix;
    for (long l = 0, position = 0; l < 140; ++l) {
        start.push_back(position);
        prefix.push_back(l % 7 == 0 ? 40 : 36);
        position += prefix.back() + kFft;
    }
    const double f0 = c.radioFrequency + c.frequencyOffset;
    // Subcarrier k of symbol l: the window starts halfway into the prefix, whose linear phase is
    // put back; then the upconversion term at the start of the useful part, when asked for.
    auto demodulate = [&](int l, int k, bool applyTerm) {
        const int advance = prefix[l] / 2;
        const long begin = start[l] + prefix[l] - advance;
        Sample sum{};
        for (int n = 0; n < kFft; ++n)
            sum += samples[static_cast<std::size_t>(begin + n)] * std::polar(1.0, -2.0 * std::numbers::pi * k * n / kFft);
        sum *= std::polar(1.0, 2.0 * std::numbers::pi * k * advance / kFft);
        const double usefulStart = static_cast<double>(start[l] + prefix[l]) / kRate;
        return applyTerm ? sum * std::polar(1.0, 2.0 * std::numbers::pi * std::fmod(f0 * usefulStart, 1.0)) : sum;
    };

    // PSS and SSS of the four blocks (first symbols 2, 8, 16, 22) on block subcarriers 56..182.
    const auto pss = ssb_ref::pss(kCellId % 3);
    const auto sss = ssb_ref::sss(kCellId / 3, kCellId % 3);
    auto burstEvm = [&](bool applyTerm) {
        std::vector<Sample> received, reference;
        for (int l : {2, 8, 16, 22})
            for (int n = 0; n < 127; ++n) {
                received.push_back(demodulate(l, n - 64, applyTerm));
                reference.emplace_back(pss[static_cast<std::size_t>(n)]);
                received.push_back(demodulate(l + 2, n - 64, applyTerm));
                reference.emplace_back(sss[static_cast<std::size_t>(n)]);
            }
        return evmDb(received, reference);
    };
    EXPECT_LT(burstEvm(c.compensated), -40.0);
    // The other receiver sees symbols turned against each other: the term is what matters.
    EXPECT_GT(burstEvm(!c.compensated), -10.0);
}

INSTANTIATE_TEST_SUITE_P(Cases, PhaseCompensation,
                         ::testing::Values(PhaseCase{"Auto", "Auto", 2.100007e9, 0.0, true},
                                           PhaseCase{"AutoWithCarrierOffset", "Auto", 2.100007e9, 960e3, true},
                                           PhaseCase{"Manual", "Manual", 3.5e9 + 11e3, -480e3, true},
                                           PhaseCase{"Off", "Off", 2.100007e9, 960e3, false}),
                         [](const auto& info) { return std::string(info.param.name); });

}  // namespace
