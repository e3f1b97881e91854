#pragma once
// Helpers for tests that make waveform files: a scratch folder and readers of the raw formats.

#include <unistd.h>

#include <atomic>
#include <complex>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <string>
#include <vector>

namespace nrsynth_test {

/// A fresh folder under the system's temporary folder, removed with the object.
class ScratchFolder {
  public:
    ScratchFolder() {
        static std::atomic<int> counter{0};
        path_ = std::filesystem::temp_directory_path() /
                ("nrsynth_test_" + std::to_string(::getpid()) + "_" + std::to_string(counter++));
        std::filesystem::remove_all(path_);
        std::filesystem::create_directories(path_);
    }
    ~ScratchFolder() {
        std::error_code ignored;
        std::filesystem::remove_all(path_, ignored);
    }
    ScratchFolder(const ScratchFolder&) = delete;
    ScratchFolder& operator=(const ScratchFolder&) = delete;

    std::string file(const std::string& name) const { return (path_ / name).string(); }
    const std::filesystem::path& path() const { return path_; }

  private:
    std::filesystem::path path_;
};

/// The bytes of a marker file, one a sample.
inline std::vector<unsigned char> readMarkers(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>()};
}

/// The samples of a raw sample file (complex double).
inline std::vector<std::complex<double>> readSamples(const std::string& path) {
    const std::vector<unsigned char> bytes = readMarkers(path);
    std::vector<std::complex<double>> samples(bytes.size() / sizeof(std::complex<double>));
    if (!samples.empty()) std::memcpy(samples.data(), bytes.data(), samples.size() * sizeof(std::complex<double>));
    return samples;
}

}  // namespace nrsynth_test
