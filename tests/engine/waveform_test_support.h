#pragma once
// Waveform documents for engine tests, and a run through the C interface as a host does it.

#include <nlohmann/json.hpp>

#include <atomic>
#include <chrono>
#include <filesystem>
#include <string>
#include <thread>

#include "nrsynth/nrsynth.h"

namespace nrsynth_test {

/// A continuous-wave carrier with the given frequency offset (Hz).
inline nlohmann::json cwCarrier(double frequencyOffset = 0.0) {
    return {{"CarrierType", "CW"}, {"FrequencyOffset", frequencyOffset}};
}

/// A waveform at `sampleRate` with `frames` frames and the given carriers.
/// A braced single carrier, `{cwCarrier()}`, arrives as that object under clang (the copy
/// constructor wins over the list) and as a one-item array under g++: both mean one carrier.
inline nlohmann::json waveform(double sampleRate, int frames, nlohmann::json carriers) {
    if (carriers.is_object()) carriers = nlohmann::json::array({carriers});
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

/// A long run started on its own thread (the document already deserialized and the engine
/// initialised for `outputPath`); the constructor returns once the first bytes are on disk or the
/// run has ended. The destructor joins the thread.
class BackgroundRun {
  public:
    explicit BackgroundRun(const std::string& outputPath)
        : thread_([this] {
              RunEngine();
              finished_ = true;
          }) {
        while (!finished_ && (!std::filesystem::exists(outputPath) || std::filesystem::file_size(outputPath) == 0))
            std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }
    ~BackgroundRun() { join(); }
    BackgroundRun(const BackgroundRun&) = delete;
    BackgroundRun& operator=(const BackgroundRun&) = delete;

    bool finished() const { return finished_; }
    void join() {
        if (thread_.joinable()) thread_.join();
    }

  private:
    std::atomic<bool> finished_{false};
    std::thread thread_;
};

}  // namespace nrsynth_test
