// The eight plain functions of the host interface and LogStatus. They hold the only global
// state of a run. No exception leaves them: every failure becomes status -1 and a log entry.

#include <atomic>
#include <memory>
#include <mutex>
#include <string>
#include <utility>

#include "common/failure.h"
#include "engine/nr5g_engine.h"
#include "framework/json_serializer.h"
#include "interface/log_buffer.h"
#include "models/all_models.h"  // registers the model types when the library loads
#include "models/nr5g_waveform_settings.h"
#include "nrsynth/nrsynth.h"

using Models::Nr5g::NR5GWaveformSettings;
using Orvalis_NR::NR5GEngine;

std::shared_ptr<NR5GWaveformSettings> gSettings;
std::shared_ptr<NR5GEngine> gEngine;
char gLogBuffer[Orvalis_NR::kLogCapacity];
int gLogLength = 0;
std::atomic<int> gStatus{0};  // read by GetStatus from the host's polling thread
float gGenerationProgress = 0.0f;

namespace {

// The tree the current engine points into: kept alive with the engine, so that a later
// StartDeserialize cannot leave the engine dangling.
std::shared_ptr<NR5GWaveformSettings> engineSettings;

// Guards the shared pointers above (never held during generation), so that a call on one
// thread cannot free what a run on another is using: each call works on its own copies.
std::mutex globalsMutex;
// Guards the log buffer: a run and a failing call on another thread may both write it.
std::mutex logMutex;

struct EngineAndSettings {
    std::shared_ptr<NR5GEngine> engine;
    std::shared_ptr<NR5GWaveformSettings> settings;
};

EngineAndSettings currentEngine() {
    std::lock_guard<std::mutex> lock(globalsMutex);
    return {gEngine, engineSettings};
}

void reportSuccess(const char* text, bool restart) {
    std::lock_guard<std::mutex> lock(logMutex);
    Orvalis_NR::appendLog(gLogBuffer, gLogLength, text, restart);
    gStatus.store(0, std::memory_order_relaxed);
}

void reportFailure(const char* heading, const std::string& detail) {
    std::lock_guard<std::mutex> lock(logMutex);
    Orvalis_NR::appendLog(gLogBuffer, gLogLength, heading, true);
    if (!detail.empty()) Orvalis_NR::appendLog(gLogBuffer, gLogLength, detail.c_str(), false);
    gStatus.store(-1, std::memory_order_relaxed);
}

/// Runs `step`; a failure of any kind becomes `heading` plus the failure's own text. A throw
/// that carries no text adds `unknownText` (nothing when empty).
template <class Step>
void guarded(const char* heading, const char* unknownText, Step&& step) {
    try {
        step();
    } catch (const char* text) {
        reportFailure(heading, text ? text : "");
    } catch (const std::exception& e) {
        reportFailure(heading, e.what());
    } catch (...) {
        reportFailure(heading, unknownText);
    }
}

}  // namespace

extern "C" {

void StartDeserialize(const char* json) {
    guarded("Deserialize Error! ", "", [&] {
        if (json == nullptr) throw "No JSON text: StartDeserialize was called with a null pointer.";
        Orvalis::Tessaline::JsonSerializer serializer;
        auto root = std::dynamic_pointer_cast<NR5GWaveformSettings>(serializer.deserialize(std::string(json)));
        {
            std::lock_guard<std::mutex> lock(globalsMutex);
            gSettings.swap(root);
        }
        root.reset();  // the earlier tree goes here, outside the lock
        reportSuccess("Deserialize OK! ", true);
    });
}

void InitEngine(const char* outputPath) {
    guarded("Init Engine Error! ", "unknown failure", [&] {
        EngineAndSettings current{std::make_shared<NR5GEngine>(), nullptr};
        EngineAndSettings earlier;
        {
            std::lock_guard<std::mutex> lock(globalsMutex);
            current.settings = gSettings;
            earlier = {std::exchange(gEngine, current.engine), std::exchange(engineSettings, current.settings)};
        }
        earlier = {};  // the earlier engine closes its files here, unless a run still holds it
        if (!current.settings) throw "No waveform settings: call StartDeserialize with a waveform document first.";
        current.engine->Init(*current.settings, outputPath);
        reportSuccess("Init Engine OK! ", false);
    });
}

void InitTestVectorGenerator(bool enable, char* exportFolder) {
    try {
        const auto current = currentEngine();
        if (current.engine) current.engine->InitTestvectorGenerator(enable, exportFolder);
    } catch (...) {
        // No status of its own: the export stays off and the run goes on without it.
    }
}

void RunEngine(void) {
    guarded("Run Engine Error! ", "unknown failure", [&] {
        // The run holds its engine and the tree it reads: an InitEngine or StartDeserialize on
        // another thread replaces the globals but frees neither while the run lasts.
        const auto current = currentEngine();
        if (!current.engine) throw "No engine: call InitEngine first.";
        current.engine->Go();
        reportSuccess("Run Engine OK! ", false);
    });
}

void Cancel(void) {
    try {
        if (const auto current = currentEngine(); current.engine) current.engine->Cancel();
    } catch (...) {
        // Nothing to report: Cancel has neither status nor log.
    }
}

int GetStatus(void) { return gStatus.load(std::memory_order_relaxed); }

char* GetLog(void) { return gLogBuffer; }

double GetGenerationProgress(void) { return gGenerationProgress; }

void LogStatus(char* text, bool restart) {
    try {
        std::lock_guard<std::mutex> lock(logMutex);
        Orvalis_NR::appendLog(gLogBuffer, gLogLength, text, restart);
    } catch (...) {
        // A log entry that cannot be written is dropped.
    }
}

}  // extern "C"
