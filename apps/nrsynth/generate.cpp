#include "generate.h"

#include <algorithm>
#include <cmath>
#include <complex>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <limits>
#include <vector>

#include "commands.h"
#include "engine/nr5g_engine.h"
#include "framework/json_serializer.h"
#include "models/nr5g_waveform_settings.h"
#include "nrsynth/nrsynth.h"
#include "output_files.h"
#include "sigmf_recording.h"
#include "validation/document_check.h"

namespace nrsynth_cli {

namespace {

/// The log with its CR LF separators as plain lines.
std::string logText() {
    std::string text = GetLog();
    text.erase(std::remove(text.begin(), text.end(), '\r'), text.end());
    return text;
}

/// True when a file can be made in `folder` (the probe is removed again).
bool folderIsWritable(const std::filesystem::path& folder) {
    const auto probe = folder / ".nrsynth_write_probe";
    bool writable = false;
    {
        std::ofstream out(probe);
        writable = static_cast<bool>(out);
    }
    std::error_code ignored;
    std::filesystem::remove(probe, ignored);
    return writable;
}

std::size_t countFiles(const std::filesystem::path& folder) {
    std::size_t count = 0;
    std::error_code error;
    for (const auto& entry : std::filesystem::directory_iterator(folder, error))
        if (entry.is_regular_file()) ++count;
    return count;
}

bool step(const char* name) {
    const int status = GetStatus();
    if (status == 0) return true;
    std::cerr << "nrsynth generate: " << name << " failed (status " << status << ")\n" << logText() << "\n";
    return false;
}

/// The validator's pass before generation: errors stop it unless --force, warnings are printed.
bool passesChecks(const GenerateOptions& options, const std::string& json) {
    validation::DocumentCheck check;
    try {
        check = validation::checkDocument(json);
    } catch (const std::exception&) {
        return true;  // not JSON at all: the library's reader names the fault
    }
    if (check.errorCount() == 0 && check.warningCount() == 0) return true;
    validation::printDocumentCheck(std::cerr, options.wave, check);
    if (check.errorCount() == 0 || options.force) return true;
    std::cerr << "nrsynth generate: refused: correct the errors above, or give --force to generate anyway\n";
    return false;
}

/// Converts the library's files as asked and says what became of them.
bool writeRequestedFiles(const OutputRequest& request, const std::vector<AntennaFile>& files,
                         const Models::Nr5g::NR5GWaveformSettings& settings) {
    RecordingFacts recording;
    recording.sampleRate = settings.SampleRateAuto->getValue();
    recording.radioFrequency = settings.RadioFrequency->getValue();
    recording.frameLength = static_cast<std::uint64_t>(std::max(0.0, std::trunc(recording.sampleRate))) / 100;
    recording.carriers = carrierBands(settings);
    Conversion conversion;
    try {
        conversion = convertOutputs(request, files, recording);
    } catch (const std::exception& e) {
        std::cerr << "nrsynth generate: " << e.what() << "\n";
        return false;
    }
    if (request.format == SampleFormat::Ci16) {
        double rms = 0.0;
        double peak = 0.0;
        std::uint64_t samples = 0;
        for (const auto& file : files) {
            rms = std::max(rms, file.levels.rms());
            peak = std::max(peak, file.levels.peakComponent);
            samples += file.levels.samples;
        }
        // dBFS of a level of the library's samples; 0 rounds to 0.00, never to -0.00.
        const auto dbfs = [&](double level) {
            if (!(level > 0.0)) return -std::numeric_limits<double>::infinity();
            const double db = 20.0 * std::log10(level * conversion.scale / kCi16FullScale);
            return std::abs(db) < 0.005 ? 0.0 : db;
        };
        std::printf("ci16: samples scaled by %.6g, RMS %.2f dBFS (back-off %.2f dB), largest |I|/|Q| "
                    "%.2f dBFS, %llu of %llu samples clipped\n",
                    conversion.scale, dbfs(rms), 0.0 - dbfs(rms), dbfs(peak),
                    static_cast<unsigned long long>(conversion.clipped), static_cast<unsigned long long>(samples));
    }
    for (std::size_t a = 0; a < files.size(); ++a) {
        const auto& file = conversion.files[a];
        const std::string meta = file.metaPath.empty() ? "" : " + " + file.metaPath;
        std::printf("antenna %zu as %s: %s%s, markers %s.mkr\n", a, formatName(request.format), file.samplePath.c_str(),
                    meta.c_str(), files[a].path.c_str());
    }
    return true;
}

}  // namespace

int generateWaveform(const GenerateOptions& options) {
    OutputRequest request;
    try {
        request = outputRequest(options.format, options.backoffDb, options.sigmf);
    } catch (const std::invalid_argument& e) {
        std::cerr << "nrsynth generate: " << e.what() << "\n";
        return 1;
    }
    std::string json;
    try {
        if (options.asIs) {
            json = readTextFile(options.wave);
        } else {
            const auto completed = completedDocumentText(options.wave, "nrsynth generate");
            if (completed.problems > 0 && !options.force) {
                std::cerr << "nrsynth generate: " << completed.problems
                          << " host value(s) could not be worked out; give them in the document, or use --as-is "
                             "or --force\n";
                return 1;
            }
            if (completed.derived > 0)
                std::cout << "worked out " << completed.derived << " host value(s) the document leaves out"
                          << " (nrsynth show --derived prints them)\n";
            json = completed.text;
        }
    } catch (const std::exception& e) {
        std::cerr << "nrsynth generate: " << options.wave << ": " << e.what() << "\n";
        return 1;
    }
    if (!passesChecks(options, json)) return 1;
    StartDeserialize(json.c_str());
    if (!step("StartDeserialize")) return 1;

    // A convenience for people: the folder of the output is created when missing.
    const auto folder = std::filesystem::path(options.output).parent_path();
    std::error_code ignored;
    if (!folder.empty()) std::filesystem::create_directories(folder, ignored);

    InitEngine(options.output.c_str());
    if (!step("InitEngine")) return 1;
    // The library writes the export into DIR/Intermediate Data and creates nothing itself;
    // the tool makes the folder for the user and tells where the files went.
    std::filesystem::path exportFiles;
    bool exportWritable = false;
    if (!options.exportFolder.empty()) {
        exportFiles = std::filesystem::path(options.exportFolder) / "Intermediate Data";
        std::filesystem::create_directories(exportFiles, ignored);
        exportWritable = folderIsWritable(exportFiles);
        std::vector<char> exportFolder(options.exportFolder.begin(), options.exportFolder.end());
        exportFolder.push_back('\0');
        InitTestVectorGenerator(true, exportFolder.data());
    }
    RunEngine();
    if (!step("RunEngine")) return 1;

    std::cout << logText() << "\nstatus " << GetStatus() << "\n";
    if (!exportFiles.empty()) {
        if (exportWritable)
            std::printf("intermediate data: %zu files in %s\n", countFiles(exportFiles), exportFiles.string().c_str());
        else
            std::fprintf(stderr, "nrsynth generate: cannot write the intermediate data to %s: no export was made\n",
                         exportFiles.string().c_str());
    }

    // The summary reads the document again: the library keeps its tree to itself.
    Orvalis::Tessaline::JsonSerializer reader;
    const auto settings =
        std::dynamic_pointer_cast<Models::Nr5g::NR5GWaveformSettings>(reader.deserialize(json));
    if (!settings) return request.keepsLibraryFiles() ? 0 : 1;
    const double sampleRate = settings->SampleRateAuto->getValue();
    const int antennas = settings->NumberOfAntennas->getValue();
    std::printf("sample rate %.0f Hz\n", sampleRate);
    std::vector<AntennaFile> files;
    try {
        for (int a = 0; a < antennas; ++a) {
            const auto name = Orvalis_NR::AntennaFileName(options.output, a, antennas);
            files.push_back({name, measureLevels(name), recordingDescription(*settings, options.wave, a, antennas)});
        }
    } catch (const std::exception& e) {
        std::cerr << "nrsynth generate: " << e.what() << "\n";
        return 1;
    }
    for (int a = 0; a < antennas; ++a) {
        const auto& levels = files[static_cast<std::size_t>(a)].levels;
        const double rms = levels.rms();
        const double papr = rms > 0.0 ? 20.0 * std::log10(levels.peakMagnitude / rms) : 0.0;
        std::printf("antenna %d: %s (+ .mkr)\n  length %llu samples (%.3f ms), RMS %.6f, peak %.6f, PAPR %.2f dB\n", a,
                    files[static_cast<std::size_t>(a)].path.c_str(), static_cast<unsigned long long>(levels.samples),
                    sampleRate > 0 ? 1000.0 * static_cast<double>(levels.samples) / sampleRate : 0.0, rms,
                    levels.peakMagnitude, papr);
    }
    if (request.keepsLibraryFiles()) return 0;
    return writeRequestedFiles(request, files, *settings) ? 0 : 1;
    return 0;
}

}  // namespace nrsynth_cli
