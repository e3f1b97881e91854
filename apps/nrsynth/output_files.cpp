#include "output_files.h"

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <stdexcept>
#include <system_error>

namespace nrsynth_cli {

namespace fs = std::filesystem;

namespace {

void renameFile(const std::string& from, const std::string& to) {
    std::error_code error;
    fs::rename(from, to, error);
    if (error)
        throw std::runtime_error("cannot rename " + from + " to " + to + ": " + error.message());
}

void writeMetadata(const std::string& path, const nlohmann::ordered_json& metadata) {
    std::ofstream out(path, std::ios::binary);
    out << metadata.dump(2) << "\n";
    out.flush();
    if (!out) throw std::runtime_error(path + ": cannot write the SigMF metadata");
}

/// The samples of `source` in `format` at `target`, through a temporary file so that a failure
/// leaves no half-written target.
ConversionResult convertInto(const std::string& source, const std::string& target,
                             SampleFormat format, double scale) {
    const std::string part = target + ".part";
    try {
        const auto result = convertSamples(source, part, format, scale);
        renameFile(part, target);
        return result;
    } catch (...) {
        std::error_code ignored;
        fs::remove(part, ignored);
        throw;
    }
}

}  // namespace

OutputRequest outputRequest(const std::string& format, const std::string& backoffDb, bool sigmf) {
    OutputRequest request;
    request.sigmf = sigmf;
    const auto parsed = parseSampleFormat(format);
    if (!parsed)
        throw std::invalid_argument("--format \"" + format +
                                    "\": unknown sample format; give cf64, cf32 or ci16");
    request.format = *parsed;
    if (backoffDb.empty()) return request;
    char* end = nullptr;
    const double value = std::strtod(backoffDb.c_str(), &end);
    if (end == backoffDb.c_str() || *end != '\0' || !std::isfinite(value))
        throw std::invalid_argument("--backoff-db \"" + backoffDb +
                                    "\": give a finite number of dB, e.g. 12");
    if (request.format != SampleFormat::Ci16)
        throw std::invalid_argument("--backoff-db " + backoffDb +
                                    ": a back-off applies to --format ci16 only");
    request.backoffDb = value;
    return request;
}

double ci16Scale(const std::vector<AntennaFile>& antennas, std::optional<double> backoffDb) {
    double peak = 0.0;
    double rms = 0.0;
    for (const auto& antenna : antennas) {
        peak = std::max(peak, antenna.levels.peakComponent);
        rms = std::max(rms, antenna.levels.rms());
    }
    return backoffDb ? ci16ScaleForBackoff(rms, *backoffDb) : ci16ScaleForPeak(peak);
}

std::string sigmfDataPath(const std::string& samplePath) {
    return fs::path(samplePath).replace_extension(".sigmf-data").string();
}

std::string sigmfMetaPath(const std::string& samplePath) {
    return fs::path(samplePath).replace_extension(".sigmf-meta").string();
}

Conversion convertOutputs(const OutputRequest& request, const std::vector<AntennaFile>& antennas,
                          const RecordingFacts& recording) {
    // The antenna number goes before the last four characters of the output path, so a path
    // without a short extension can give two antennas one SigMF name.
    if (request.sigmf)
        for (std::size_t a = 0; a < antennas.size(); ++a)
            for (std::size_t b = 0; b < a; ++b)
                if (sigmfDataPath(antennas[a].path) == sigmfDataPath(antennas[b].path))
                    throw std::runtime_error(
                        "--sigmf: " + antennas[b].path + " and " + antennas[a].path +
                        " would both become " + sigmfDataPath(antennas[a].path) +
                        "; give -o a name with a 3-letter extension such as out/wave.bin");
    Conversion conversion;
    if (request.format == SampleFormat::Ci16)
        conversion.scale = ci16Scale(antennas, request.backoffDb);
    for (const auto& antenna : antennas) {
        ConvertedFile file;
        file.samplePath = request.sigmf ? sigmfDataPath(antenna.path) : antenna.path;
        if (request.format == SampleFormat::Cf64) {
            if (file.samplePath != antenna.path) renameFile(antenna.path, file.samplePath);
        } else {
            file.clipped =
                convertInto(antenna.path, file.samplePath, request.format, conversion.scale)
                    .clipped;
            if (file.samplePath != antenna.path) {
                std::error_code ignored;
                fs::remove(antenna.path, ignored);
            }
        }
        conversion.clipped += file.clipped;
        if (request.sigmf) {
            RecordingFacts facts = recording;
            facts.datatype = sigmfDatatype(request.format);
            facts.description = antenna.description;
            facts.samples = antenna.levels.samples;
            file.metaPath = sigmfMetaPath(antenna.path);
            writeMetadata(file.metaPath, sigmfMetadata(facts));
        }
        conversion.files.push_back(std::move(file));
    }
    return conversion;
}

}  // namespace nrsynth_cli
