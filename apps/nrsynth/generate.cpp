#include "generate.h"

#include <algorithm>
#include <cmath>
#include <complex>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <vector>

#include "commands.h"
#include "engine/nr5g_engine.h"
#include "framework/json_serializer.h"
#include "models/nr5g_waveform_settings.h"
#include "nrsynth/nrsynth.h"
#include "validation/document_check.h"

namespace nrsynth_cli {

namespace {

struct SignalSummary {
    std::uint64_t samples = 0;
    double rms = 0.0;
    double peak = 0.0;
};

/// RMS and peak magnitude of a raw complex-double file, read in blocks.
SignalSummary summarise(const std::string& path) {
    SignalSummary summary;
    std::ifstream in(path, std::ios::binary);
    std::vector<std::complex<double>> block(1 << 16);
    double energy = 0.0;
    double peakPower = 0.0;
    while (in) {
        in.read(reinterpret_cast<char*>(block.data()), static_cast<std::streamsize>(block.size() * sizeof(block[0])));
        const auto count = static_cast<std::size_t>(in.gcount()) / sizeof(block[0]);
        for (std::size_t i = 0; i < count; ++i) {
            const double power = std::norm(block[i]);
            energy += power;
            peakPower = std::max(peakPower, power);
        }
        summary.samples += count;
    }
    if (summary.samples > 0) summary.rms = std::sqrt(energy / static_cast<double>(summary.samples));
    summary.peak = std::sqrt(peakPower);
    return summary;
}

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

}  // namespace

int generateWaveform(const GenerateOptions& options) {
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
    if (!settings) return 0;
    const double sampleRate = settings->SampleRateAuto->getValue();
    const int antennas = settings->NumberOfAntennas->getValue();
    std::printf("sample rate %.0f Hz\n", sampleRate);
    for (int a = 0; a < antennas; ++a) {
        const auto name = Orvalis_NR::AntennaFileName(options.output, a, antennas);
        const auto summary = summarise(name);
        const double papr = summary.rms > 0.0 ? 20.0 * std::log10(summary.peak / summary.rms) : 0.0;
        std::printf("antenna %d: %s (+ .mkr)\n  length %llu samples (%.3f ms), RMS %.6f, peak %.6f, PAPR %.2f dB\n", a,
                    name.c_str(), static_cast<unsigned long long>(summary.samples),
                    sampleRate > 0 ? 1000.0 * static_cast<double>(summary.samples) / sampleRate : 0.0, summary.rms,
                    summary.peak, papr);
    }
    return 0;
}

}  // namespace nrsynth_cli
