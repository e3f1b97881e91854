#pragma once
// The 3GPP-aware checks of a waveform document, beyond keys and kinds of values.

#include "findings.h"
#include "models/nr5g_waveform_settings.h"

namespace nrsynth_cli::validation {

/// Every rule over the settings tree as the library will receive it.
FindingList validateWaveform(const Models::Nr5g::NR5GWaveformSettings& waveform);

}  // namespace nrsynth_cli::validation
