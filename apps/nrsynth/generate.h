#pragma once
// `nrsynth generate`: drives the C interface exactly as a signal-generator host does.

#include <string>

namespace nrsynth_cli {

struct GenerateOptions {
    std::string wave;                        ///< waveform document (JSON)
    std::string output = "out/wave.bin";     ///< sample file path; markers go to PATH.mkr
    std::string exportFolder;                ///< intermediate data export, empty for none
    bool force = false;                      ///< generate even when the validator finds errors
    bool asIs = false;                       ///< hand the document over without derived values
    std::string format = "cf64";             ///< sample format of the files: cf64, cf32 or ci16
    std::string backoffDb;                   ///< ci16: RMS this many dB below full scale; empty: peak at full scale
    bool sigmf = false;                      ///< write SigMF recordings (.sigmf-data + .sigmf-meta)
};

/// Runs the validator first (errors refuse unless `force`, warnings are printed), then generates
/// the waveform and prints log, status, files and a per-antenna summary. A format other than
/// cf64, or SigMF, converts each antenna's file afterwards (see `convertOutputs`).
/// Exit code 0, or 1 when the validator refuses or any step reports status -1.
int generateWaveform(const GenerateOptions& options);

}  // namespace nrsynth_cli
