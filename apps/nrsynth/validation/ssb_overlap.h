#pragma once
// The resource elements an SS/PBCH burst takes, in time and frequency, so that channels of any
// numerology can be tested against them.

#include <string>
#include <vector>

#include "models/nr_carrier.h"
#include "models/nr_sspbch.h"

namespace nrsynth_cli::validation {

/// One block: its symbols in units of 1/16 of a 15 kHz symbol from the waveform start (prefixes
/// left out, which is exact enough to tell whether two channels meet), and its band in Hz from
/// point A.
struct SsbBlock {
    int index = 0;
    int frame = 0;
    long long timeStart = 0;
    long long timeEnd = 0;  ///< one past
    double lowHz = 0.0;
    double highHz = 0.0;  ///< one past
};

/// Every block of an enabled burst in the `frames` generated frames (TS 38.213 clause 4.1).
std::vector<SsbBlock> ssbBlocks(const Models::Nr5g::NRSSPBCH& ssb, const Models::Nr5g::NRCarrier& carrier, int frames);

/// Time span of symbol `symbol` of slot `slot` (from the waveform start) in numerology `mu`,
/// in the units of SsbBlock.
long long symbolStart(int mu, int slot, int symbol, int symbolsPerSlot);
long long symbolLength(int mu);

}  // namespace nrsynth_cli::validation
