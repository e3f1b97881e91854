#pragma once
// One carrier, frame by frame: runs its six numerology generators, adds their outputs at the
// waveform's sample rate, and applies gain, frequency offset and initial phase. A numerology's
// output comes out late by its filter and window delay, so the generator keeps two frames: the
// one being built and the one just completed (which the engine saves).

#include <algorithm>
#include <atomic>
#include <complex>
#include <vector>

#include "carrier/nr5g_numerology_generator.h"
#include "models/nr5g_waveform_settings.h"

namespace Orvalis_NR {

class NR5GCarrierGenerator {
public:
    NR5GCarrierGenerator();
    virtual ~NR5GCarrierGenerator();

    void Init(Models::Nr5g::NRCarrier& carrier, Models::Nr5g::NR5GWaveformSettings& settings, int totalSamples,
              int startSample);
    /// Frame `frame` of `numberOfFrames`; `secondPass` only in the extra run of frame 0.
    void Go(int frame, int numberOfFrames, bool secondPass);
    void Cancel();
    void ResetDataSource();
    void SetTestVector(bool enabled);

    using Rows = std::vector<std::vector<std::complex<double>>>;
    Rows currentSamples;
    Rows previousSamples;
    std::vector<std::vector<char>> previousMarkers;
    std::vector<std::vector<char>> currentMarkers;
    std::vector<std::vector<int>> sampleMarkers;
    double powerFactor = 1.0;
    bool multiCarrier = false;
    Models::Nr5g::NRCarrier* carrier = nullptr;
    Models::Nr5g::NR5GWaveformSettings* settings = nullptr;
    std::vector<NR5GNumerologyGenerator> numerologies;
    int numerologyCount = 0;
    int numberOfAntennas = 0;
    Rows frameSamples;
    double frequencyOffset = 0.0;
    double phaseStep = 0.0;
    double phase = 0.0;
    double powerBoosting = 0.0;
    double initialPhase = 0.0;
    int samplesPerMillisecond = 0;
    std::atomic<char> cancelled{0};
    int outputLength = 0;
    int startSample = 0;

protected:
    /// Maps a marker word (bit per MarkerType) to the four output lines Marker1..Marker4.
    char markerByte(int word) const;
    /// Polls and clears the cancel flag.
    bool takeCancel();
    /// The MarkerType values of the settings Marker1..Marker4.
    void setMarkerLines(const int lines[4]) { std::copy(lines, lines + 4, markerLine); }

private:
    void setFrameMarkers(int frame, int numberOfFrames);
    void addNumerology(NR5GNumerologyGenerator& numerology, bool first);
    void rotate(std::vector<std::complex<double>>& row, double startPhase, double gain, double& endPhase) const;
    int frameLength = 0;
    int markerLine[4] = {0, 1, 3, 2};
};

}  // namespace Orvalis_NR
