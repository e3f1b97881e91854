#pragma once
// Waveform documents for engine tests, and a run through the C interface as a host does it.

#include <nlohmann/json.hpp>

#include <string>

#include "nrsynth/nrsynth.h"

namespace nrsynth_test {

/// A continuous-wave carrier with the given frequency offset (Hz).
inline nlohmann::json cwCarrier(double frequencyOffset = 0.0) {
    return {{"CarrierType", "CW"}, {"FrequencyOffset", frequencyOffset}};
}

/// A waveform at `sampleRate` with `frames` frames and the given carriers.
inline nlohmann::json waveform(double sampleRate, int frames, nlohmann::json carriers) {
    return {{"SampleRateAuto", sampleRate}, {"NumberOfFrames", frames}, {"NRCarriers", std::move(carriers)}};
}

/// StartDeserialize, InitEngine, RunEngine; stops at the first failure. Returns the status.
inline int generate(const nlohmann::json& document, const std::string& outputPath) {
    StartDeserialize(document.dump().c_str());
    if (GetStatus() != 0) return GetStatus();
    InitEngine(outputPath.c_str());
    if (GetStatus() != 0) return GetStatus();
    RunEngine();
    return GetStatus();
}

}  // namespace nrsynth_test
