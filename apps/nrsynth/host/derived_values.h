#pragma once
// The host values of a waveform document worked out as a host application does: a key that the
// document leaves out (absent, not merely at its default) is filled in; a key that is present
// is never changed. The library itself never recomputes these values.

#include <nlohmann/json.hpp>

#include <string>
#include <vector>

namespace nrsynth_host {

struct DerivedValue {
    std::string path;      // NRCarriers[0].Downlink.DLSCH[1].TransportBlockSize
    nlohmann::ordered_json value;
};

struct Completion {
    nlohmann::ordered_json document;           // the input with the derived keys added
    std::vector<DerivedValue> derived;   // what was added, in document order
    std::vector<std::string> problems;   // values that could not be worked out, with the reason
};

/// Completes `document`. Throws std::runtime_error with the reader's text when the document
/// cannot be read as a waveform.
Completion completeDocument(const nlohmann::ordered_json& document);

/// The sample rate rule: the smallest rate 30.72 MHz x 2^n (n from -4 to 4) that is at least
/// 1.25 times the span the enabled carriers occupy about the centre, 2 x max over carriers of
/// (|FrequencyOffset| + NumberOfRB x 12 x subcarrier spacing / 2). 0 when no rate holds it.
double autoSampleRate(const std::vector<double>& carrierOffsetsHz, const std::vector<double>& carrierWidthsHz);

/// µ of a `Numerology` position (SCS15k 0, SCS30k 1, SCS60kNCP and SCS60kECP 2, SCS120k 3,
/// SCS240k 4).
int muOfNumerology(int numerologyPosition);

}  // namespace nrsynth_host
