#include "engine/nr5g_engine.h"

#include <cmath>
#include <limits>

#include "carrier/awgn_generator.h"
#include "carrier/nr5g_carrier_generator.h"
#include "coding/table_edition.h"
#include "common/failure.h"
#include "framework/tools.h"

namespace Orvalis_NR {

using Models::Nr5g::CapabilityEnum;
using Models::Nr5g::CarrierType;
using Models::Nr5g::MarkerType;
using Models::Nr5g::NR5GWaveformSettings;

namespace {

int toSampleCount(double value, const char* what) {
    if (!(value >= 0.0) || value > static_cast<double>(std::numeric_limits<int>::max()))
        failWith("Waveform length out of range.", std::string(what) + " " + std::to_string(value) + " samples");
    return static_cast<int>(value);
}

}  // namespace

WaveformLength ComputeWaveformLength(const NR5GWaveformSettings& settings) {
    const double sampleRate = settings.SampleRateAuto->getValue();
    if (!(sampleRate > 0.0) || !(sampleRate <= 2.0e9))
        failWith("SampleRateAuto is not a usable sample rate.", "SampleRateAuto " + std::to_string(sampleRate));
    WaveformLength length;
    length.totalSamples = toSampleCount(
        settings.NumberOfFrames->getValue() * sampleRate / 1000 * settings.NumberOfSubframes->getValue(), "total");
    length.startSample = toSampleCount(settings.SubframeOffset->getValue() * sampleRate / 1000, "start");

    const auto carriers = settings.NRCarriers->getValue();
    if (settings.NumberOfSlotsInSubframe->getValue() == -1 || carriers->getCount() == 0) return length;

    // Cut to slots, in the first carrier's numerology.
    const int n = static_cast<int>(carriers->getItem(0)->Numerology->getValue());
    static constexpr int kSlots[6] = {1, 2, 4, 4, 8, 16};
    if (n < 0 || n > 5) failWith("Numerology out of range.", "NRCarriers[0].Numerology " + std::to_string(n));
    const int slots = kSlots[n];
    const bool extended = n == 3;
    const long fft = static_cast<long>(sampleRate / (slots * 15000));
    const long ratio = static_cast<long>(sampleRate / 15000 / 2048);
    long cp = fft * 144 / 2048;
    long cpLong = ratio * 16 + cp;
    if (extended) cpLong = cp = fft * 512 / 2048;
    const long slotLength = (fft + cp) * (extended ? 12 : 14);
    const long longSlot = slotLength - cp + cpLong;
    const int offset = settings.SlotOffsetInSubframe->getValue();
    const int count = settings.NumberOfSlotsInSubframe->getValue();
    if (offset < 0 || count < 0 || offset > 1 << 20 || count > 1 << 20)
        failWith("Slot cut out of range.", "SlotOffsetInSubframe " + std::to_string(offset) + ", NumberOfSlotsInSubframe " +
                                                std::to_string(count));
    double start = length.startSample;
    for (int i = 0; i < offset; ++i) start += (i == 0 || i == slots / 2) ? longSlot : slotLength;
    double total = 0;
    for (int i = offset; i < offset + count; ++i) {
        if (n == 0)
            total += slotLength + (cpLong - cp) * 2;
        else
            total += (i == 0 || i == slots / 2) ? longSlot : slotLength;
    }
    length.startSample = toSampleCount(start, "start");
    length.totalSamples = toSampleCount(total, "total");
    return length;
}

std::string AntennaFileName(const std::string& outputPath, int antenna, int numberOfAntennas) {
    const auto split = outputPath.size() - 4;
    return outputPath.substr(0, split) + (numberOfAntennas > 1 ? std::to_string(antenna) : std::string{}) +
           outputPath.substr(split);
}

NR5GEngine::NR5GEngine() = default;
NR5GEngine::~NR5GEngine() = default;

void NR5GEngine::Init(NR5GWaveformSettings& waveform, const char* outputPath) {
    ready = false;
    settings = &waveform;
    numberOfAntennas = waveform.NumberOfAntennas->getValue();
    if (numberOfAntennas < 0 || numberOfAntennas > 1024)
        failWith("NumberOfAntennas out of range.", "NumberOfAntennas " + std::to_string(numberOfAntennas));
    fileBuffers.clear();
    fileBuffers.resize(static_cast<std::size_t>(numberOfAntennas));

    const auto length = ComputeWaveformLength(waveform);
    totalSamples = length.totalSamples;
    startSample = length.startSample;

    const std::string path = outputPath ? outputPath : "";
    if (path.size() < 4) failWith("Output path shorter than four characters.", "\"" + path + "\"");
    for (int a = 0; a < numberOfAntennas; ++a) {
        auto& buffer = fileBuffers[static_cast<std::size_t>(a)];
        buffer.Init(AntennaFileName(path, a, numberOfAntennas).c_str());
        buffer.totalSamples = static_cast<std::uint64_t>(totalSamples);
    }

    if (waveform.Capability->getValue() == CapabilityEnum::Realtime)
        failWith("Real-time Uplink waveforms are not available in this version.", "Capability Realtime");
    numberOfCarriers = waveform.NRCarriers->getValue()->getCount();
    carrierGenerators.clear();
    for (int c = 0; c < numberOfCarriers; ++c) carrierGenerators.push_back(std::make_unique<NR5GCarrierGenerator>());

    blankingMask = 0;
    const MarkerType markers[4] = {waveform.Marker1->getValue(), waveform.Marker2->getValue(),
                                   waveform.Marker3->getValue(), waveform.Marker4->getValue()};
    for (int line = 0; line < 4; ++line)
        if (markers[line] == MarkerType::RfBlanking) blankingMask = static_cast<char>(blankingMask | (1 << line));

    noiseGenerator.reset();
    if (waveform.AwgnEnabled->getValue()) noiseGenerator = std::make_unique<AwgnGenerator>();

    selectTableEdition();
    ready = true;
}

void NR5GEngine::selectTableEdition() {
    if (numberOfCarriers < 1 || settings->Capability->getValue() != CapabilityEnum::Arb) return;
    auto first = settings->NRCarriers->getValue()->getItem(0);
    std::string name;
    if (first->CarrierType->getValue() == CarrierType::DL) {
        auto bwps = first->Downlink->getValue()->BWP->getValue();
        if (bwps->getCount() > 0) {
            auto bwp = bwps->getItem(0);
            if (bwp->InitialDLBWP->getValue() && bwps->getCount() >= 2) bwp = bwps->getItem(1);
            name = bwp->Name->getValue();
        }
    } else if (first->CarrierType->getValue() == CarrierType::UL) {
        auto bwps = first->Uplink->getValue()->BWP->getValue();
        if (bwps->getCount() > 0) name = bwps->getItem(0)->Name->getValue();
    }
    if (name.find("15.1") != std::string::npos) specVersion = 151;  // sticky for the process
}

void NR5GEngine::InitTestvectorGenerator(bool, char*) {
    // The intermediate data export joins with its own generator; nothing to switch on yet.
}

void NR5GEngine::Cancel() {
    cancelled.store(true, std::memory_order_relaxed);
    std::lock_guard<std::mutex> lock(generatorsMutex);
    for (auto& generator : carrierGenerators)
        if (generator) generator->Cancel();
}

void NR5GEngine::Log(std::string text) {
    static const std::string libraryName =
        Orvalis::Tessaline::Library::getLibraryName(reinterpret_cast<const void*>(&ComputeWaveformLength));
    Orvalis::Tessaline::Log::writeLogText(libraryName, 1, text);
}

template <class ComputeFrame>
void NR5GEngine::runCarrier(NR5GCarrierGenerator& generator, int offset, ComputeFrame&& computeFrame, bool resetData,
                            bool& firstCarrier) {
    const int numberOfFrames = settings->NumberOfFrames->getValue();
    auto isCancelled = [this] { return cancelled.load(std::memory_order_relaxed); };
    // Saves the completed frame; `skipHalf` leaves out its first half for a later carrier.
    auto saveRows = [&](bool skipHalf) {
        for (int a = 0; a < numberOfAntennas && !isCancelled(); ++a) {
            const auto row = static_cast<std::size_t>(a);
            auto& samples = generator.previousSamples[row];
            const int skip = skipHalf ? static_cast<int>(samples.size() / 2) : 0;
            fileBuffers[row].Save(samples, generator.previousMarkers[row], firstCarrier, false, true, blankingMask, skip);
        }
    };

    for (auto& buffer : fileBuffers) {
        buffer.Reset();
        buffer.Seek(offset, firstCarrier);
    }
    // First pass: each frame is saved once the next one has completed it.
    for (int frame = 0; frame < numberOfFrames && !isCancelled(); ++frame) {
        computeFrame(frame, false);
        if (frame > 0) saveRows(frame == 1);
    }
    if (isCancelled()) return;
    if (resetData) generator.ResetDataSource();

    // Second pass: frame 0 again, which completes the last frame.
    computeFrame(0, true);
    saveRows(numberOfFrames == 1);
    if (isCancelled()) return;
    for (auto& buffer : fileBuffers) {
        buffer.Reset();
        buffer.Seek(offset, false);
    }

    // The first half of frame 0, now complete with what came over from the last frame.
    static std::vector<char> halfMarkers;
    const auto half = generator.currentSamples.empty() ? 0 : generator.currentSamples[0].size() / 2;
    halfFrame.resize(half);
    if (halfMarkers.size() != half) halfMarkers.resize(half);
    for (int a = 0; a < numberOfAntennas; ++a) {
        const auto& samples = generator.currentSamples[static_cast<std::size_t>(a)];
        const auto& markers = generator.currentMarkers[static_cast<std::size_t>(a)];
        std::copy(samples.begin(), samples.begin() + static_cast<long>(half), halfFrame.begin());
        std::copy(markers.begin(), markers.begin() + static_cast<long>(half), halfMarkers.begin());
        fileBuffers[static_cast<std::size_t>(a)].Save(halfFrame, halfMarkers, false, firstCarrier, true, blankingMask, 0);
    }
    firstCarrier = false;
}

void NR5GEngine::Go() {
    if (!ready) failWith("The engine is not set up: InitEngine did not complete.");
    if (ran) failWith("The engine has already run: call InitEngine first.");
    ran = true;
    auto carriers = settings->NRCarriers->getValue();
    numberOfCarriers = carriers->getCount();
    const int numberOfFrames = settings->NumberOfFrames->getValue();
    const bool hasNoise = settings->AwgnEnabled->getValue();
    bool anyEnabled = false;
    for (int c = 0; c < numberOfCarriers; ++c) anyEnabled = anyEnabled || carriers->getItem(c)->Enabled->getValue();
    const bool noiseOnly = hasNoise && !anyEnabled;
    bool firstCarrier = true;
    try {
        for (int c = 0; c < numberOfCarriers && !cancelled.load(std::memory_order_relaxed); ++c) {
            auto carrier = carriers->getItem(c);
            if (!carrier->Enabled->getValue()) continue;
            auto& generator = carrierGenerators[static_cast<std::size_t>(c)];
            generator->Init(*carrier, *settings, totalSamples, startSample);
            const double offset = settings->SampleRateAuto->getValue() * carrier->TimingOffset->getValue();
            if (!(offset >= 0.0) || offset > totalSamples)
                failWith("TimingOffset out of range.", "NRCarriers[" + std::to_string(c) + "].TimingOffset " +
                                                           std::to_string(carrier->TimingOffset->getValue()));
            generator->SetTestVector(false);
            auto computeFrame = [&](int frame, bool secondPass) { generator->Go(frame, numberOfFrames, secondPass); };
            runCarrier(*generator, static_cast<int>(offset), computeFrame, true, firstCarrier);
            std::lock_guard<std::mutex> lock(generatorsMutex);
            generator.reset();
        }
        if (hasNoise && noiseGenerator && !cancelled.load(std::memory_order_relaxed)) {
            {
                Models::Nr5g::NRCarrier temporary;
                noiseGenerator->InitAwgn(temporary, *settings, totalSamples, startSample);
            }
            auto computeFrame = [&](int frame, bool secondPass) {
                noiseGenerator->GoAwgn(frame, numberOfFrames, secondPass, noiseOnly);
            };
            runCarrier(*noiseGenerator, 0, computeFrame, false, firstCarrier);
        }
    } catch (...) {
        for (auto& buffer : fileBuffers) buffer.Close();
        throw;
    }
    for (auto& buffer : fileBuffers) buffer.Close();
    if (cancelled.exchange(false, std::memory_order_relaxed))
        for (auto& buffer : fileBuffers) buffer.Delete();
}

}  // namespace Orvalis_NR
