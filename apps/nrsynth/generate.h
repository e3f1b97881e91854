#pragma once
// `nrsynth generate`: drives the C interface exactly as a signal-generator host does.

#include <string>

namespace nrsynth_cli {

struct GenerateOptions {
    std::string wave;                        ///< waveform document (JSON)
    std::string output = "out/wave.bin";     ///< sample file path; markers go to PATH.mkr
    std::string exportFolder;                ///< intermediate data export, empty for none
};

/// Generates the waveform and prints log, status, files and a per-antenna summary.
/// Exit code 0, or 1 when any step reports status -1.
int generateWaveform(const GenerateOptions& options);

}  // namespace nrsynth_cli
