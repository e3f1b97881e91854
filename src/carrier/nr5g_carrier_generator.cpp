#include "carrier/nr5g_carrier_generator.h"

#include <algorithm>
#include <cmath>
#include <numbers>
#include <numeric>

#include "common/failure.h"
#include "common/large_buffer.h"
#include "common/sample_rate_guard.h"
#include "downlink/pdsch_generator.h"

namespace Orvalis_NR {

using Models::Nr5g::CarrierType;

NR5GCarrierGenerator::NR5GCarrierGenerator() : numerologies(6) {}

NR5GCarrierGenerator::~NR5GCarrierGenerator() = default;

void NR5GCarrierGenerator::Init(Models::Nr5g::NRCarrier& carrierSettings, Models::Nr5g::NR5GWaveformSettings& waveform,
                                int totalSamples, int start) {
    carrier = &carrierSettings;
    settings = &waveform;
    multiCarrier = waveform.NRCarriers->getValue()->getCount() > 1;
    numberOfAntennas = waveform.NumberOfAntennas->getValue();
    startSample = start;
    requireGeneratingSampleRate(waveform.SampleRateAuto->getValue());
    if (numberOfAntennas < 0)
        failWith("NumberOfAntennas is negative.", "NumberOfAntennas " + std::to_string(numberOfAntennas));

    const auto type = carrierSettings.CarrierType->getValue();
    numerologyCount = (type == CarrierType::DL || type == CarrierType::UL) ? 6 : 0;
    for (int i = 0; i < static_cast<int>(numerologies.size()); ++i) numerologies[static_cast<std::size_t>(i)].Init(waveform, carrierSettings, i);

    // Channel totals over all numerologies; the first numerology with a channel drives RF ALC.
    std::vector<int> totals(6, 0);
    for (const auto& numerology : numerologies) {
        const auto counts = numerology.countChannels();
        for (std::size_t k = 0; k < totals.size(); ++k) totals[k] += counts[k];
    }
    for (auto& numerology : numerologies) numerology.channelCounts = totals;
    for (auto& numerology : numerologies) {
        const auto counts = numerology.countChannels();
        if (std::accumulate(counts.begin(), counts.end(), 0) > 0) {
            numerology.isPrimary = true;
            break;
        }
    }

    const double rate = waveform.SampleRateAuto->getValue();
    const int wholeRate = static_cast<int>(rate);
    frameLength = wholeRate / 100;
    outputLength = std::min(totalSamples, frameLength);
    samplesPerMillisecond = wholeRate / 1000;
    if (startSample < 0 || (startSample > 0 && startSample >= frameLength))
        failWith("SubframeOffset puts the waveform start outside the frame.",
                 "SubframeOffset " + std::to_string(waveform.SubframeOffset->getValue()));
    if (type == CarrierType::CW && static_cast<int>(rate / 30000) == 0)
        failWith("A continuous-wave carrier needs SampleRateAuto of at least 30000 Hz: its level divides by the "
                 "rate over 30 kHz, truncated.",
                 "SampleRateAuto " + numberText(rate));

    const auto rows = static_cast<std::size_t>(numberOfAntennas);
    const auto kept = static_cast<std::size_t>(outputLength);
    const auto frame = static_cast<std::size_t>(frameLength);
    assignZeroedRows(currentSamples, rows, kept);
    assignZeroedRows(previousSamples, rows, kept);
    assignZeroedRows(currentMarkers, rows, kept);
    assignZeroedRows(previousMarkers, rows, kept);
    assignZeroedRows(sampleMarkers, rows, frame);
    assignZeroedRows(frameSamples, rows, frame);

    frequencyOffset = carrierSettings.FrequencyOffset->getValue();
    powerBoosting = carrierSettings.PowerBoosting->getValue();
    initialPhase = carrierSettings.InitialPhase->getValue();
    phaseStep = 2.0 * std::numbers::pi * frequencyOffset / rate;
    phase = initialPhase / 180.0 * std::numbers::pi;
    powerFactor = 1.0;
    const int lines[4] = {static_cast<int>(waveform.Marker1->getValue()), static_cast<int>(waveform.Marker2->getValue()),
                          static_cast<int>(waveform.Marker3->getValue()), static_cast<int>(waveform.Marker4->getValue())};
    setMarkerLines(lines);
}

bool NR5GCarrierGenerator::takeCancel() { return cancelled.exchange(0, std::memory_order_relaxed) != 0; }

char NR5GCarrierGenerator::markerByte(int word) const {
    int byte = 0;
    for (int line = 0; line < 4; ++line)
        if (markerLine[line] >= 0 && markerLine[line] < 31 && ((word >> markerLine[line]) & 1)) byte |= 1 << line;
    return static_cast<char>(byte);
}

void NR5GCarrierGenerator::setFrameMarkers(int frame, int numberOfFrames) {
    const double rate = settings->SampleRateAuto->getValue();
    const int width = static_cast<int>(rate / 3.072e7 * 4);
    const int timing = static_cast<int>(rate * carrier->TimingOffset->getValue());
    auto increment = [&](std::vector<int>& words, long from, long to) {
        from = std::max(from, 0L);
        to = std::min(to, static_cast<long>(frameLength));
        for (long i = from; i < to; ++i) ++words[static_cast<std::size_t>(i)];
    };
    for (int a = 0; a < numberOfAntennas; ++a) {
        auto& words = sampleMarkers[static_cast<std::size_t>(a)];
        std::fill(words.begin(), words.begin() + std::min(width, frameLength), 2);  // Frame Start
        if (frame == 0)
            increment(words, std::max(startSample - timing, startSample), static_cast<long>(startSample) - timing + width);
        if (frame == numberOfFrames - 1) {
            const long first = static_cast<long>(frameLength) - timing + startSample;
            increment(words, first, std::min(first + width, static_cast<long>(frameLength)));
        }
    }
}

void NR5GCarrierGenerator::addNumerology(NR5GNumerologyGenerator& numerology, bool first) {
    const int delay = std::clamp(numerology.sampleDelay, 0, outputLength);
    const auto wrap = [this](long index) { return static_cast<std::size_t>(index % frameLength); };
    for (int a = 0; a < numberOfAntennas && !cancelled.load(std::memory_order_relaxed); ++a) {
        auto& frameRow = frameSamples[static_cast<std::size_t>(a)];
        if (settings->NumberOfSubframes->getValue() < 10) {
            // Fold what runs past the kept part back to its start: the kept part is cyclic.
            const int fold = std::min(samplesPerMillisecond, 1024);
            for (int j = 0; j < fold; ++j)
                frameRow[wrap(startSample + j)] += frameRow[wrap(static_cast<long>(outputLength) + startSample + j)];
        }
        auto& current = currentSamples[static_cast<std::size_t>(a)];
        auto& previous = previousSamples[static_cast<std::size_t>(a)];
        // Source index startSample + delay + k, wrapped once at the frame's end.
        const int head = std::min(outputLength - delay, std::max(0, frameLength - startSample - delay));
        const auto* unwrapped = frameRow.data() + startSample + delay;
        const auto* wrapped = frameRow.data() + (static_cast<long>(startSample) + delay + head) % frameLength;
        if (first) {
            std::copy(unwrapped, unwrapped + head, current.begin());
            std::copy(wrapped, wrapped + (outputLength - delay - head), current.begin() + head);
            // The rows were swapped, not copied: the end that only later numerologies add to
            // keeps what it held after the last frame.
            std::copy(previous.begin() + (outputLength - delay), previous.end(), current.begin() + (outputLength - delay));
        } else {
            for (int k = 0; k < head; ++k) current[static_cast<std::size_t>(k)] += unwrapped[k];
            for (int k = head; k < outputLength - delay; ++k) current[static_cast<std::size_t>(k)] += wrapped[k - head];
        }
        // The head of this frame finishes the previous one.
        for (int j = 0; j < delay; ++j) previous[static_cast<std::size_t>(outputLength - delay + j)] += frameRow[wrap(startSample + j)];
    }
}

void NR5GCarrierGenerator::rotate(std::vector<std::complex<double>>& row, double startPhase, double gain,
                                  double& endPhase) const {
    const double stepCos = std::cos(phaseStep);
    const double stepSin = std::sin(phaseStep);
    double ph = startPhase;
    double c = 1.0;
    double s = 0.0;
    for (std::size_t i = 0; i < row.size(); ++i) {
        if (i % 4096 == 0) {  // exact values now and then bound the drift of the recurrence
            c = std::cos(ph);
            s = std::sin(ph);
        } else {
            const double nc = c * stepCos - s * stepSin;
            s = s * stepCos + c * stepSin;
            c = nc;
        }
        row[i] *= std::complex<double>(gain * c, gain * s);
        ph += phaseStep;
    }
    endPhase = ph;
}

void NR5GCarrierGenerator::Go(int frame, int numberOfFrames, bool secondPass) {
    for (int a = 0; a < numberOfAntennas; ++a) {
        const auto row = static_cast<std::size_t>(a);
        // Swapped rather than copied; addNumerology restores what the first numerology leaves.
        previousSamples[row].swap(currentSamples[row]);
        previousMarkers[row].swap(currentMarkers[row]);
        std::fill(currentMarkers[row].begin(), currentMarkers[row].end(), 0);
        std::fill(sampleMarkers[row].begin(), sampleMarkers[row].end(), 0);
    }
    setFrameMarkers(frame, numberOfFrames);

    bool firstWithContent = true;
    for (int i = 0; i < numerologyCount; ++i) {
        if (cancelled.load(std::memory_order_relaxed)) break;
        auto& numerology = numerologies[static_cast<std::size_t>(i)];
        if (!numerology.hasValidChannel) continue;
        numerology.Go(frame, numberOfFrames, frameSamples, sampleMarkers);  // writes every sample
        addNumerology(numerology, firstWithContent);
        firstWithContent = false;
    }
    if (firstWithContent)  // nothing was added: the frame being built stays as it was
        for (int a = 0; a < numberOfAntennas; ++a)
            currentSamples[static_cast<std::size_t>(a)] = previousSamples[static_cast<std::size_t>(a)];
    if (takeCancel()) return;

    if (carrier->CarrierType->getValue() == CarrierType::CW) {
        const int n = static_cast<int>(settings->SampleRateAuto->getValue() / 30000);
        const double level = (1.0 / std::sqrt(n)) * std::sqrt(3276.0 / n);
        for (auto& row : currentSamples) std::fill(row.begin(), row.end(), std::complex<double>(level, 0.0));
        for (auto& row : sampleMarkers)
            for (auto& word : row) word += 12;  // RF ALC and RF blanking on
    }
    if (takeCancel()) return;

    if (frequencyOffset != 0.0 || powerBoosting != 0.0 || initialPhase != 0.0 || powerFactor != 1.0) {
        const double gain = std::pow(10.0, powerBoosting / 20.0) / std::sqrt(powerFactor);
        if (frame != 0 || secondPass) {
            double reached = phase;
            for (auto& row : previousSamples) rotate(row, phase, gain, reached);
            phase = reached;
        }
        if (frame == 0 && secondPass) {
            double ignored = 0.0;
            for (auto& row : currentSamples) rotate(row, initialPhase / 180.0 * std::numbers::pi, gain, ignored);
        }
    }

    if (takeCancel()) return;
    // Marker words are almost always below 16: map those through a table.
    char byteOf[16];
    for (int word = 0; word < 16; ++word) byteOf[word] = markerByte(word);
    for (int a = 0; a < numberOfAntennas; ++a) {
        const auto row = static_cast<std::size_t>(a);
        const auto& words = sampleMarkers[row];
        auto& bytes = currentMarkers[row];
        for (int i = 0, at = startSample % frameLength; i < outputLength; ++i, at = at + 1 == frameLength ? 0 : at + 1) {
            const int word = words[static_cast<std::size_t>(at)];
            bytes[static_cast<std::size_t>(i)] = (word & ~15) == 0 ? byteOf[word] : markerByte(word);
        }
        if (takeCancel()) return;
    }
}

void NR5GCarrierGenerator::Cancel() {
    cancelled.store(1, std::memory_order_relaxed);
    for (auto& numerology : numerologies) {
        numerology.cancelRequested.store(1, std::memory_order_relaxed);
        for (auto* pdsch : numerology.pdschGenerators) pdsch->CancelRequested.store(1, std::memory_order_relaxed);
    }
}

void NR5GCarrierGenerator::ResetDataSource() {
    for (int i = 0; i < numerologyCount; ++i) numerologies[static_cast<std::size_t>(i)].ResetDataSource();
}

void NR5GCarrierGenerator::SetTestVector(bool enabled) {
    for (auto& numerology : numerologies) numerology.testVectorEnabled = enabled ? 1 : 0;
}

}  // namespace Orvalis_NR
