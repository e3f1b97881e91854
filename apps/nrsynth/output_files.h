#pragma once
// The files `nrsynth generate` leaves behind: the library's complex-double file per antenna,
// converted to the asked sample format and, when asked, turned into a SigMF recording. Marker
// files are never touched.

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "sample_format.h"
#include "sigmf_recording.h"

namespace nrsynth_cli {

struct OutputRequest {
    SampleFormat format = SampleFormat::Cf64;
    std::optional<double> backoffDb;  ///< ci16 only; none: the largest component at full scale
    bool sigmf = false;
    /// True when the library's files stay as they are.
    bool keepsLibraryFiles() const { return format == SampleFormat::Cf64 && !sigmf; }
};

/// The request of the options `--format`, `--backoff-db` and `--sigmf`. Throws
/// std::invalid_argument with a message naming the option and the value.
OutputRequest outputRequest(const std::string& format, const std::string& backoffDb, bool sigmf);

/// One antenna's complex-double file as the library wrote it.
struct AntennaFile {
    std::string path;
    SampleLevels levels;
    std::string description;  ///< of its SigMF recording
};

struct ConvertedFile {
    std::string samplePath;  ///< the samples in the asked format
    std::string metaPath;    ///< the .sigmf-meta file, or empty
    std::uint64_t clipped = 0;
};

struct Conversion {
    double scale = 1.0;         ///< ci16: full-scale units per unit of the library's samples
    std::uint64_t clipped = 0;  ///< ci16: samples of all antennas of which I or Q saturated
    std::vector<ConvertedFile> files;
};

/// The ci16 scale of a run: one for all antennas, so that their relative levels stay.
/// By back-off, the RMS of the strongest antenna sits `backoffDb` below full scale.
double ci16Scale(const std::vector<AntennaFile>& antennas, std::optional<double> backoffDb);

/// SigMF data files take the sample file's name with the extension ".sigmf-data".
std::string sigmfDataPath(const std::string& samplePath);
std::string sigmfMetaPath(const std::string& samplePath);

/// Converts every antenna's file in place (by a temporary file beside it) or, for SigMF, into
/// its .sigmf-data file, removing the complex-double file, and writes the .sigmf-meta files from
/// `recording` (its datatype and description are set here). Throws std::runtime_error naming
/// the file on an I/O failure; a temporary file is removed again.
Conversion convertOutputs(const OutputRequest& request, const std::vector<AntennaFile>& antennas,
                          const RecordingFacts& recording);

}  // namespace nrsynth_cli
