#include "fuzz_run.h"

#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <memory>

#include "framework/model_collection.h"
#include "models/nr5g_waveform_settings.h"
#include "nrsynth/nrsynth.h"

// The tree of the last StartDeserialize, held by the host interface.
extern std::shared_ptr<Models::Nr5g::NR5GWaveformSettings> gSettings;

namespace nrsynth_fuzz {

namespace {

namespace fs = std::filesystem;
using Orvalis::Tessaline::IModel;
using Orvalis::Tessaline::ModelBase;
using Orvalis::Tessaline::ModelCollectionBase;

// Caps that keep one run to a fraction of a second under the sanitizers. They bound the
// cost of a run, not what the library accepts: the library sees the capped tree whole.
constexpr double kMaxSampleRate = 3.84e6;
constexpr int kMaxFrames = 1;
constexpr int kMaxSubframes = 20;
constexpr int kMaxAntennas = 2;
constexpr int kMaxCarriers = 2;
constexpr int kMaxItemsPerCollection = 4;

[[noreturn]] void finding(const char* what) {
    std::fprintf(stderr, "nrsynth fuzz finding: %s\nstatus %d, log:\n%s\n", what, GetStatus(),
                 GetLog());
    std::abort();
}

// Every step ends in status 0, or in -1 with the step's failure heading in the log.
void checkOutcome(const char* errorHeading, Expect expect) {
    const int status = GetStatus();
    const char* log = GetLog();
    if (std::memchr(log, '\0', 4096) == nullptr) finding("log text is not NUL-terminated");
    if (status == 0) return;
    if (status != -1) finding("status is neither 0 nor -1");
    if (std::strncmp(log, errorHeading, std::strlen(errorHeading)) != 0)
        finding("failure without its heading in the log");
    if (expect == Expect::Success) finding("a valid document was refused");
}

void capCollections(IModel& model, int limit) {
    if (model.isCollection()) {
        auto& collection = static_cast<ModelCollectionBase&>(model);
        if (collection.getCount() > limit) collection.resize(limit);
        for (int i = 0; i < collection.getCount(); ++i)
            if (auto item = collection.getCommonItem(i))
                capCollections(*item, kMaxItemsPerCollection);
        return;
    }
    if (auto* base = dynamic_cast<ModelBase*>(&model))
        for (const auto& setting : base->settings)
            if (setting->isSubSetting())
                if (auto held = setting->getCommonValue())
                    capCollections(*held, kMaxItemsPerCollection);
}

void capRun(Models::Nr5g::NR5GWaveformSettings& settings) {
    if (settings.SampleRateAuto->getValue() > kMaxSampleRate)
        settings.SampleRateAuto->setValue(kMaxSampleRate);
    if (settings.NumberOfFrames->getValue() > kMaxFrames)
        settings.NumberOfFrames->setValue(kMaxFrames);
    if (settings.NumberOfSubframes->getValue() > kMaxSubframes)
        settings.NumberOfSubframes->setValue(kMaxSubframes);
    if (settings.NumberOfAntennas->getValue() > kMaxAntennas)
        settings.NumberOfAntennas->setValue(kMaxAntennas);
    capCollections(*settings.NRCarriers->getValue(), kMaxCarriers);
    capCollections(*settings.NRCarriersRT->getValue(), kMaxCarriers);
    capCollections(*settings.DefaultCarrier->getValue(), kMaxItemsPerCollection);
}

const fs::path& outputFolder() {
    static const fs::path folder = [] {
        const char* base = std::getenv("TMPDIR");
        fs::path p =
            fs::path(base && *base ? base : "/tmp") / ("nrsynth_fuzz_" + std::to_string(getpid()));
        fs::create_directories(p);
        return p;
    }();
    return folder;
}

// A finished run leaves sample and marker files of one length per antenna.
void checkFiles() {
    std::error_code error;
    for (const auto& entry : fs::directory_iterator(outputFolder(), error)) {
        const auto name = entry.path().string();
        if (entry.path().extension() != ".bin") continue;
        const auto samples = fs::file_size(entry.path(), error);
        const auto markers = fs::file_size(name + ".mkr", error);
        if (error) finding("a sample file has no marker file");
        if (samples != 16 * markers) finding("sample and marker files differ in length");
    }
}

void clearOutput() {
    std::error_code error;
    for (const auto& entry : fs::directory_iterator(outputFolder(), error))
        fs::remove(entry.path(), error);
}

}  // namespace

bool runDocument(const std::string& json, Expect expect) {
    StartDeserialize(json.c_str());
    checkOutcome("Deserialize Error! ", expect);
    if (GetStatus() != 0 || !gSettings) return false;
    // A valid document is run as it stands: its generator keeps it small.
    if (expect == Expect::AnyReportedOutcome) capRun(*gSettings);

    clearOutput();
    const std::string output = (outputFolder() / "wave.bin").string();
    InitEngine(output.c_str());
    checkOutcome("Init Engine Error! ", expect);
    if (GetStatus() == 0) {
        RunEngine();
        checkOutcome("Run Engine Error! ", expect);
        if (GetStatus() == 0) checkFiles();
    }
    // The engine keeps its files open until the next InitEngine; close them now.
    InitEngine("");
    clearOutput();
    return true;
}

}  // namespace nrsynth_fuzz
