// The eight plain functions of the host interface and LogStatus. They hold the only global
// state of a run. No exception leaves them: every failure becomes status -1 and a log entry.

#include <atomic>
#include <memory>
#include <string>

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

void reportSuccess(const char* text, bool restart) {
    Orvalis_NR::appendLog(gLogBuffer, gLogLength, text, restart);
    gStatus.store(0, std::memory_order_relaxed);
}

void reportFailure(const char* heading, const std::string& detail) {
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
        auto root = serializer.deserialize(std::string(json));
        gSettings = std::dynamic_pointer_cast<NR5GWaveformSettings>(root);
        reportSuccess("Deserialize OK! ", true);
    });
}

void InitEngine(const char* outputPath) {
    guarded("Init Engine Error! ", "unknown failure", [&] {
        gEngine = std::make_shared<NR5GEngine>();
        engineSettings = gSettings;
        if (!engineSettings) throw "No waveform settings: call StartDeserialize with a waveform document first.";
        gEngine->Init(*engineSettings, outputPath);
        reportSuccess("Init Engine OK! ", false);
    });
}

void InitTestVectorGenerator(bool enable, char* exportFolder) {
    if (!gEngine) return;
    try {
        gEngine->InitTestvectorGenerator(enable, exportFolder);
    } catch (...) {
        // No status of its own: the export stays off and the run goes on without it.
    }
}

void RunEngine(void) {
    guarded("Run Engine Error! ", "unknown failure", [&] {
        if (!gEngine) throw "No engine: call InitEngine first.";
        gEngine->Go();
        reportSuccess("Run Engine OK! ", false);
    });
}

void Cancel(void) {
    if (auto engine = gEngine) engine->Cancel();
}

int GetStatus(void) { return gStatus.load(std::memory_order_relaxed); }

char* GetLog(void) { return gLogBuffer; }

double GetGenerationProgress(void) { return gGenerationProgress; }

void LogStatus(char* text, bool restart) { Orvalis_NR::appendLog(gLogBuffer, gLogLength, text, restart); }

}  // extern "C"
