#pragma once
// SigMF metadata for one antenna's samples: the global object, one capture for the waveform and
// annotations for its carriers (frequency edges) and its 10 ms frames.

#include <cstdint>
#include <nlohmann/json.hpp>
#include <string>
#include <vector>

namespace Models::Nr5g {
class NR5GWaveformSettings;
}

namespace nrsynth_cli {

/// The SigMF version the metadata follows.
inline constexpr const char* kSigmfVersion = "1.2.0";

/// What one enabled carrier occupies about the waveform's centre, in Hz of baseband.
struct CarrierBand {
    std::string label;    ///< short, for a GUI: "carrier 0 DL"
    std::string comment;  ///< its grid: "273 RB at 30 kHz"
    double lowerHz = 0.0;
    double upperHz = 0.0;
};

struct RecordingFacts {
    std::string datatype;         ///< "ci16_le" ...
    double sampleRate = 0.0;      ///< left out of the metadata when below 1 Hz
    double radioFrequency = 0.0;  ///< centre of the waveform at RF
    std::string description;
    std::uint64_t samples = 0;
    std::uint64_t frameLength = 0;  ///< samples of a 10 ms frame
    std::vector<CarrierBand> carriers;
};

/// The bands of the enabled carriers of the list the engine generates (`NRCarriers`, or
/// `NRCarriersRT` for a real-time waveform). A downlink, uplink or PRACH carrier occupies its
/// grid, NumberOfRB x 12 subcarriers of its numerology, centred on `FrequencyOffset`; a
/// continuous wave is a line at `FrequencyOffset`.
std::vector<CarrierBand> carrierBands(const Models::Nr5g::NR5GWaveformSettings& settings);

/// The description of one antenna's recording: `WaveformName` (or the document's file name when
/// it is empty), with the antenna when there are several.
std::string recordingDescription(const Models::Nr5g::NR5GWaveformSettings& settings,
                                 const std::string& documentPath, int antenna, int antennas);

/// The .sigmf-meta document. Annotations are sorted by sample_start: the carriers span the whole
/// recording from sample 0, then one per frame (the last one may be short).
nlohmann::ordered_json sigmfMetadata(const RecordingFacts& facts);

}  // namespace nrsynth_cli
