#include "validator.h"

#include "rule_support.h"

namespace nrsynth_cli::validation {

FindingList validateWaveform(const Models::Nr5g::NR5GWaveformSettings& waveform) {
    FindingList findings;
    checkRanges(waveform, findings);
    checkGrid(waveform, findings);
    checkDmrs(waveform, findings);
    checkCollisions(waveform, findings);
    return findings;
}

}  // namespace nrsynth_cli::validation
