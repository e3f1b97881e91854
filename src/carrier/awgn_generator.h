#pragma once
// White Gaussian noise as a pseudo-carrier: the engine runs it after the real carriers and adds
// its samples to the files like theirs. The noise is shaped by a low-pass to NoiseBandwidth.

#include <complex>
#include <memory>
#include <vector>

#include "carrier/nr5g_carrier_generator.h"

namespace Orvalis_NR {

class BlockFilter;

class AwgnGenerator : public NR5GCarrierGenerator {
public:
    /// `carrier` and `startSample` are not used: the noise spans the whole sample rate.
    void InitAwgn(Models::Nr5g::NRCarrier& carrier, Models::Nr5g::NR5GWaveformSettings& settings, int totalSamples,
                  int startSample);
    void GoAwgn(int frame, int numberOfFrames, bool secondPass, bool noiseOnly);

    std::vector<std::complex<double>> rawNoise;  // one chunk of unfiltered noise
    std::vector<std::shared_ptr<BlockFilter>> noiseFilters;
    Models::Nr5g::NR5GWaveformSettings* settings = nullptr;
    double sigma = 0.0;
    int numberOfAntennas = 0;
    int frameLength = 0;
    int chunkLength = 1;  // samples drawn and filtered at a time
    unsigned int seed = 0;
};

}  // namespace Orvalis_NR
