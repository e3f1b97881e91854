#pragma once
// The top of the generation pipeline: works out the waveform's length, opens one sample file
// and one marker file per antenna, and runs the carriers one after the other, accumulating
// them in the files. An extra pass of frame 0 makes the waveform cyclic.

#include <atomic>
#include <complex>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

#include "engine/file_buffer.h"
#include "common/log.h"
#include "models/nr5g_waveform_settings.h"

namespace Orvalis_NR {

class NR5GCarrierGenerator;
class AwgnGenerator;
class TestVectorGenerator;

/// Length of a waveform in samples, as the engine derives it from the settings.
struct WaveformLength {
    int totalSamples = 0;  ///< samples per antenna
    int startSample = 0;   ///< offset of the first kept sample inside a frame
};

/// Works out the waveform length (frames, subframes and the optional cut to slots).
WaveformLength ComputeWaveformLength(const Models::Nr5g::NR5GWaveformSettings& settings);

/// The sample file name of antenna `antenna`: the path split before its last four
/// characters, with the antenna number in between when there are several antennas.
std::string AntennaFileName(const std::string& outputPath, int antenna, int numberOfAntennas);

class NR5GEngine {
public:
    NR5GEngine();
    ~NR5GEngine();
    NR5GEngine(const NR5GEngine&) = delete;
    NR5GEngine& operator=(const NR5GEngine&) = delete;

    void Init(Models::Nr5g::NR5GWaveformSettings& settings, const char* outputPath);
    void InitTestvectorGenerator(bool enable, char* exportFolder);
    void Go();
    void Cancel();
    void Log(std::string text);

    /// True once Go has run: a further run needs a new engine.
    bool hasRun() const { return ran; }

    Models::Nr5g::NR5GWaveformSettings* settings = nullptr;
    std::vector<FileBuffer> fileBuffers;
    std::vector<std::unique_ptr<NR5GCarrierGenerator>> carrierGenerators;
    std::unique_ptr<AwgnGenerator> noiseGenerator;
    /// Present after InitTestvectorGenerator(true, ...): exports the stages of frame 0.
    std::unique_ptr<TestVectorGenerator> testVectorGenerator;
    int numberOfCarriers = 0;
    char blankingMask = 0;
    int numberOfAntennas = 0;
    std::atomic<bool> cancelled{false};
    int totalSamples = 0;
    int startSample = 0;

private:
    /// Both passes of one carrier (or the noise) into the files.
    template <class ComputeFrame>
    void runCarrier(NR5GCarrierGenerator& generator, int offset, ComputeFrame&& computeFrame, bool resetData,
                    bool& firstCarrier);
    void selectTableEdition();
    /// Fails naming the first file whose length is not that of the whole waveform.
    void requireFullFiles() const;

    // Atomic, so that a second Go on another thread (or one racing an Init) finds out safely.
    std::atomic<bool> ran{false};    // Go has started
    std::atomic<bool> ready{false};  // Init completed
    std::mutex generatorsMutex;  // Cancel may walk carrierGenerators from another thread
};

}  // namespace Orvalis_NR
