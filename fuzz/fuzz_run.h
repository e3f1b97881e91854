#pragma once
// One waveform document through the host interface, as a signal generator would drive it,
// with the checks that every fuzz input must pass.

#include <string>

namespace nrsynth_fuzz {

/// What the run must end in; anything else is a finding and aborts the process.
enum class Expect {
    AnyReportedOutcome,  ///< status 0 or -1 with a log text, never a crash
    Success,             ///< a valid document: every step reports status 0
};

/// StartDeserialize, then (when the tree was read) the run caps, InitEngine and RunEngine.
/// Returns false when the document was refused at the first step.
bool runDocument(const std::string& json, Expect expect);

}  // namespace nrsynth_fuzz
