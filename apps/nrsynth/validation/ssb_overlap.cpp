#include "ssb_overlap.h"

#include <cmath>

#include "downlink/ssb_candidates.h"

namespace nrsynth_cli::validation {

namespace {
constexpr int kUnitsPer15kSymbol = 16;  // a 240 kHz symbol is one unit
constexpr int kSsbSymbols = 4;
constexpr int kSsbSubcarriers = 240;
}  // namespace

long long symbolLength(int mu) { return kUnitsPer15kSymbol >> mu; }

long long symbolStart(int mu, int slot, int symbol, int symbolsPerSlot) {
    return (static_cast<long long>(slot) * symbolsPerSlot + symbol) * symbolLength(mu);
}

std::vector<SsbBlock> ssbBlocks(const Models::Nr5g::NRSSPBCH& ssb, const Models::Nr5g::NRCarrier& carrier, int frames) {
    std::vector<SsbBlock> blocks;
    const int mu = ssb.Mu->getValue();
    if (!ssb.Enabled->getValue() || mu < 0 || mu > 4 || frames < 1 || frames > 1024) return blocks;
    auto candidates = GetSSBCandidateSymbols(mu, static_cast<int>(ssb.SSB30KSymbolIndex->getValue()));
    const int lmax = ssb.Lmax->getValue();
    if (lmax < 1 || lmax > static_cast<int>(candidates.size())) return blocks;
    candidates.resize(static_cast<std::size_t>(lmax));

    const int period = static_cast<int>(ssb.SSBPeriod->getValue());
    const int halfFrameIndex = ssb.HalfFrameIndex->getValue();
    if (halfFrameIndex < 0 || halfFrameIndex > 1) return blocks;  // no burst of the radio frame  // HalfFrame, OneFrame, 2, 4, 8, 16 frames
    const int halfFrame = 70 << mu;                                   // symbols of a half frame
    const int frameSymbols = 2 * halfFrame;
    const double scs = 15000.0 * std::ldexp(1.0, mu);
    // The block's centre is FrequencyOffset subcarriers from the carrier centre; point A lies
    // FrequencyOffsetOfPointA from it.
    const double low = (ssb.FrequencyOffset->getValue() - kSsbSubcarriers / 2) * scs - carrier.FrequencyOffsetOfPointA->getValue();
    for (int frame = 0; frame < frames; ++frame) {
        if (period >= 2 && frame % (1 << (period - 1)) != 0) continue;
        const int repeats = period == 0 ? 2 : 1;
        const int offset = period == 0 ? 0 : halfFrame * halfFrameIndex;
        for (int r = 0; r < repeats; ++r)
            for (int i = 0; i < lmax; ++i) {
                const long long first = static_cast<long long>(frame) * frameSymbols + candidates[static_cast<std::size_t>(i)] +
                                        offset + r * halfFrame;
                blocks.push_back({i, frame, first * symbolLength(mu), (first + kSsbSymbols) * symbolLength(mu), low,
                                  low + kSsbSubcarriers * scs});
            }
    }
    return blocks;
}

}  // namespace nrsynth_cli::validation
