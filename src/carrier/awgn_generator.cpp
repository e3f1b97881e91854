#include "carrier/awgn_generator.h"

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <random>

#include "dsp/filter.h"
#include "dsp/sinc_low_pass.h"
#include "dsp/ziggurat_normal.h"
#include "common/failure.h"
#include "common/large_buffer.h"
#include "common/sample_rate_guard.h"

namespace Orvalis_NR {

namespace {

// Samples of noise drawn before they are filtered: about a megabyte, rounded to filter blocks.
constexpr int kNoiseChunk = 1 << 16;

}  // namespace

void AwgnGenerator::InitAwgn(Models::Nr5g::NRCarrier&, Models::Nr5g::NR5GWaveformSettings& waveform, int totalSamples,
                             int) {
    settings = &waveform;
    NR5GCarrierGenerator::settings = &waveform;
    numberOfAntennas = waveform.NumberOfAntennas->getValue();
    NR5GCarrierGenerator::numberOfAntennas = numberOfAntennas;
    const double rate = waveform.SampleRateAuto->getValue();
    requireGeneratingSampleRate(rate);
    if (numberOfAntennas < 0)
        failWith("NumberOfAntennas is negative.", "NumberOfAntennas " + std::to_string(numberOfAntennas));
    const double noiseBandwidth = waveform.NoiseBandwidth->getValue();
    if (!(noiseBandwidth > 0.0))
        failWith("NoiseBandwidth must be above 0 Hz: the noise level is the square root of its share of the sample "
                 "rate, and the noise filter would have no pass band.",
                 "NoiseBandwidth " + numberText(noiseBandwidth));

    const double ratio = waveform.CarrierToNoiseRatio->getValue();
    if (!std::isfinite(ratio))
        failWith("CarrierToNoiseRatio must be a finite number: otherwise the noise has no standard deviation.",
                 "CarrierToNoiseRatio " + numberText(ratio));
    const double bandwidth = std::min(rate, noiseBandwidth * 1.25);
    const double x = bandwidth / rate;
    sigma = waveform.AwgnEnabled->getValue()
                ? std::sqrt(x) * std::pow(10.0, -waveform.CarrierToNoiseRatio->getValue() / 20.0) / std::sqrt(rate / 15000.0)
                : 0.0;

    const auto design = Generate_SincLowPass(x, 1024, 1, true);
    std::vector<std::complex<double>> coefficients(design.begin(), design.end());
    noiseFilters.clear();
    int block = 1;
    for (int a = 0; a < numberOfAntennas; ++a) {
        auto filter = FilterCreator::createForFrames(coefficients);
        block = filter->blockSize;
        noiseFilters.push_back(std::move(filter));
    }

    frameLength = std::min(static_cast<int>(rate) / 100, totalSamples);
    const auto rows = static_cast<std::size_t>(std::max(numberOfAntennas, 0));
    const auto length = static_cast<std::size_t>(std::max(frameLength, 0));
    assignZeroedRows(currentSamples, rows, length);
    assignZeroedRows(previousSamples, rows, length);
    // Whole filter blocks per chunk: the filter then cuts the frame as it would in one call.
    chunkLength = std::max(1, kNoiseChunk / block) * block;
    assignZeroed(rawNoise, std::min(length, static_cast<std::size_t>(chunkLength)));
    assignZeroedRows(currentMarkers, rows, length);
    assignZeroedRows(previousMarkers, rows, length);
    const int lines[4] = {static_cast<int>(waveform.Marker1->getValue()), static_cast<int>(waveform.Marker2->getValue()),
                          static_cast<int>(waveform.Marker3->getValue()), static_cast<int>(waveform.Marker4->getValue())};
    setMarkerLines(lines);
}

void AwgnGenerator::GoAwgn(int frame, int, bool secondPass, bool noiseOnly) {
    std::mt19937 engine;  // default seed 5489 unless reseeded below
    const ZigguratNormal& normal = zigguratNormal();
    if (secondPass) {
        engine.seed(seed);
    } else if (frame == 0) {
        seed = static_cast<unsigned int>(std::rand());
        engine.seed(seed);
    }
    // Frames 1 and on of the first pass keep the default seed and so repeat the same noise.

    for (std::size_t a = 0; a < currentSamples.size(); ++a) {
        previousSamples[a].swap(currentSamples[a]);
        auto* out = currentSamples[a].data();
        // A chunk at a time, drawn and filtered while it is in cache.
        for (int done = 0; done < frameLength; done += chunkLength) {
            const int length = std::min(chunkLength, frameLength - done);
            for (int i = 0; i < length; ++i) {
                const double inPhase = normal(engine) * sigma;
                const double quadrature = normal(engine) * sigma;
                rawNoise[static_cast<std::size_t>(i)] = {inPhase, quadrature};
            }
            noiseFilters[a]->filter(rawNoise.data(), length, out + done, length);
        }
    }

    // Frame start (and waveform start in frame 0) on the first sample; RF ALC and blanking on
    // every sample when the noise is the whole waveform.
    const int allSamples = noiseOnly ? 12 : 0;
    const char firstByte = markerByte((frame == 0 ? 3 : 2) | allSamples);
    const char otherBytes = markerByte(allSamples);
    if (frameLength < 1) return;
    for (std::size_t a = 0; a < currentMarkers.size(); ++a) {
        for (auto* row : {&currentMarkers[a], &previousMarkers[a]}) {
            (*row)[0] = static_cast<char>((*row)[0] | firstByte);
            if (otherBytes != 0)
                for (int i = 1; i < frameLength; ++i) (*row)[static_cast<std::size_t>(i)] |= otherBytes;
        }
    }
}

}  // namespace Orvalis_NR
