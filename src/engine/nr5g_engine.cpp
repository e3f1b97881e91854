#include "engine/nr5g_engine.h"

#include <algorithm>
#include <cmath>
#include <filesystem>
#include <limits>

#if defined(__unix__) || defined(__APPLE__)
#include <sys/resource.h>
#endif

#include "carrier/awgn_generator.h"
#include "carrier/nr5g_carrier_generator.h"
#include "coding/table_edition.h"
#include "common/failure.h"
#include "common/sample_rate_guard.h"
#include "engine/test_vector_generator.h"
#include "framework/tools.h"

namespace Orvalis_NR {

using Models::Nr5g::CapabilityEnum;
using Models::Nr5g::CarrierType;
using Models::Nr5g::MarkerType;
using Models::Nr5g::NR5GWaveformSettings;

namespace {

// A length or offset in samples: the engine keeps them as int, and a negative one is no length.
int toSampleCount(long double value, const char* what, const std::string& settingsText) {
    if (!(value >= 0.0L) || value > static_cast<long double>(std::numeric_limits<int>::max()))
        failWith(what, settingsText + " give " + numberText(static_cast<double>(value)) + " samples");
    return static_cast<int>(value);
}

constexpr const char* kTotalOutOfRange = "The waveform length is out of range: it must be 0 to 2147483647 samples.";
constexpr const char* kStartOutOfRange = "The waveform start is out of range: it must be 0 to 2147483647 samples.";

// How many of the slots first .. first + count - 1 are 0 or slots / 2, the slots whose first
// symbol has the longer prefix (one slot when slots / 2 is 0 too).
long long longSlotsAmong(long long first, long long count, int slots) {
    if (count <= 0) return 0;
    auto contains = [&](long long slot) { return slot >= first && slot < first + count; };
    long long found = contains(0) ? 1 : 0;
    if (slots / 2 != 0 && contains(slots / 2)) ++found;
    return found;
}

// Each antenna keeps a sample file and a marker file open for the whole run: more antennas
// than the process may open files for cannot be written.
void requireOpenFiles(int antennas) {
#if defined(__unix__) || defined(__APPLE__)
    rlimit limit{};
    if (getrlimit(RLIMIT_NOFILE, &limit) != 0 || limit.rlim_cur == RLIM_INFINITY) return;
    if (2 * static_cast<unsigned long long>(antennas) > static_cast<unsigned long long>(limit.rlim_cur))
        failWith("NumberOfAntennas needs more open files than this process may have: two per antenna.",
                 "NumberOfAntennas " + std::to_string(antennas) + ", open-file limit " +
                     std::to_string(static_cast<unsigned long long>(limit.rlim_cur)));
#else
    (void)antennas;
#endif
}

// The frame rows of a carrier that has finished, kept for the next carrier and the noise: their
// set-up then reuses this memory instead of touching fresh pages.
struct SpareRows {
    NR5GCarrierGenerator::Rows current, previous, frame;
    std::vector<std::vector<char>> currentMarkers, previousMarkers;
    std::vector<std::vector<int>> sampleMarkers;

    /// Gives the kept rows to `generator` and keeps its own; the same call takes them back.
    void swapWith(NR5GCarrierGenerator& generator) {
        current.swap(generator.currentSamples);
        previous.swap(generator.previousSamples);
        frame.swap(generator.frameSamples);
        currentMarkers.swap(generator.currentMarkers);
        previousMarkers.swap(generator.previousMarkers);
        sampleMarkers.swap(generator.sampleMarkers);
    }
};

}  // namespace

WaveformLength ComputeWaveformLength(const NR5GWaveformSettings& settings) {
    const double sampleRate = settings.SampleRateAuto->getValue();
    if (!(sampleRate >= 0.0) || std::isinf(sampleRate))
        failWith("SampleRateAuto must be a number from 0 up: the waveform would have no length.",
                 "SampleRateAuto " + numberText(sampleRate));
    const int frames = settings.NumberOfFrames->getValue();
    const int subframes = settings.NumberOfSubframes->getValue();
    const int subframeOffset = settings.SubframeOffset->getValue();
    WaveformLength length;
    length.totalSamples = toSampleCount(frames * sampleRate / 1000 * subframes,
                                        kTotalOutOfRange,
                                        "NumberOfFrames " + std::to_string(frames) + ", NumberOfSubframes " +
                                            std::to_string(subframes) + " and SampleRateAuto " + numberText(sampleRate));
    length.startSample = toSampleCount(subframeOffset * sampleRate / 1000, kStartOutOfRange,
                                       "SubframeOffset " + std::to_string(subframeOffset) + " and SampleRateAuto " +
                                           numberText(sampleRate));

    const auto carriers = settings.NRCarriers->getValue();
    const int count = settings.NumberOfSlotsInSubframe->getValue();
    if (count == -1 || carriers->getCount() == 0) return length;

    // Cut to slots, in the first carrier's numerology. The slot sizes come from integer
    // arithmetic on the rate, which must therefore be an int.
    if (sampleRate > kHighestSampleRate) requireGeneratingSampleRate(sampleRate);
    const int n = static_cast<int>(carriers->getItem(0)->Numerology->getValue());
    static constexpr int kSlots[6] = {1, 2, 4, 4, 8, 16};
    if (n < 0 || n > 5) failWith("Numerology out of range.", "NRCarriers[0].Numerology " + std::to_string(n));
    const int slots = kSlots[n];
    const bool extended = n == 3;
    const long long fft = static_cast<long long>(sampleRate / (slots * 15000));
    const long long ratio = static_cast<long long>(sampleRate / 15000 / 2048);
    long long cp = fft * 144 / 2048;
    long long cpLong = ratio * 16 + cp;
    if (extended) cpLong = cp = fft * 512 / 2048;
    const long long slotLength = (fft + cp) * (extended ? 12 : 14);
    const int offset = settings.SlotOffsetInSubframe->getValue();

    // Slots before the offset (none for an offset of -1 or below), then the slots kept. For
    // 15 kHz only the kept slots all count the longer prefix twice.
    const long long before = std::max(offset, 0);
    const long double start =
        length.startSample + static_cast<long double>(before) * slotLength + longSlotsAmong(0, before, slots) * (cpLong - cp);
    const long long kept = std::max(count, 0);
    const long double total = n == 0 ? static_cast<long double>(kept) * (slotLength + (cpLong - cp) * 2)
                                     : static_cast<long double>(kept) * slotLength +
                                           longSlotsAmong(offset, kept, slots) * (cpLong - cp);
    const std::string cut = "SlotOffsetInSubframe " + std::to_string(offset) + ", NumberOfSlotsInSubframe " +
                            std::to_string(count) + " and SampleRateAuto " + numberText(sampleRate);
    length.startSample = toSampleCount(start, kStartOutOfRange, "SubframeOffset " + std::to_string(subframeOffset) + ", " + cut);
    length.totalSamples = toSampleCount(total, kTotalOutOfRange, cut);
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
    ready.store(false, std::memory_order_release);
    ran.store(false, std::memory_order_relaxed);  // a new Init makes the engine ready for one more run
    settings = &waveform;
    numberOfAntennas = waveform.NumberOfAntennas->getValue();
    if (numberOfAntennas < 0)
        failWith("NumberOfAntennas is negative.", "NumberOfAntennas " + std::to_string(numberOfAntennas));
    requireOpenFiles(numberOfAntennas);
    fileBuffers.clear();
    fileBuffers.resize(static_cast<std::size_t>(numberOfAntennas));

    const auto length = ComputeWaveformLength(waveform);
    // Whatever generates samples needs a rate with a defined frame length; an empty waveform
    // (no enabled carrier, no noise) needs none.
    auto carriers = waveform.NRCarriers->getValue();
    bool generates = waveform.AwgnEnabled->getValue();
    for (int c = 0; c < carriers->getCount(); ++c) generates = generates || carriers->getItem(c)->Enabled->getValue();
    if (generates) requireGeneratingSampleRate(waveform.SampleRateAuto->getValue());
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
    numberOfCarriers = carriers->getCount();
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
    ready.store(true, std::memory_order_release);
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

void NR5GEngine::InitTestvectorGenerator(bool enable, char* exportFolder) {
    if (!enable) return;  // an earlier export stays on
    if (!exportFolder) failWith("The export folder is missing.", "exportFolder null");
    auto generator = std::make_unique<TestVectorGenerator>();
    generator->Init(this, exportFolder);
    testVectorGenerator = std::move(generator);
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
    const auto half = generator.currentSamples.empty() ? 0 : generator.currentSamples[0].size() / 2;
    for (int a = 0; a < numberOfAntennas; ++a) {
        const auto row = static_cast<std::size_t>(a);
        fileBuffers[row].Save(generator.currentSamples[row].data(), generator.currentMarkers[row].data(), half, false,
                              firstCarrier, true, blankingMask, 0);
    }
    firstCarrier = false;
}

void NR5GEngine::Go() {
    if (!ready.load(std::memory_order_acquire)) failWith("The engine is not set up: InitEngine did not complete.");
    if (ran.exchange(true)) failWith("The engine has already run: call InitEngine first.");
    auto carriers = settings->NRCarriers->getValue();
    numberOfCarriers = carriers->getCount();
    // Generators and files were made for the tree as Init saw it.
    if (numberOfCarriers != static_cast<int>(carrierGenerators.size()))
        failWith("NRCarriers changed between Init and Go: a new Init is needed.",
                 "NRCarriers " + std::to_string(carrierGenerators.size()) + " at Init, " +
                     std::to_string(numberOfCarriers) + " now");
    if (settings->NumberOfAntennas->getValue() != numberOfAntennas)
        failWith("NumberOfAntennas changed between Init and Go: a new Init is needed.",
                 "NumberOfAntennas " + std::to_string(numberOfAntennas) + " at Init, " +
                     std::to_string(settings->NumberOfAntennas->getValue()) + " now");
    const int numberOfFrames = settings->NumberOfFrames->getValue();
    const bool hasNoise = settings->AwgnEnabled->getValue();
    bool anyEnabled = false;
    for (int c = 0; c < numberOfCarriers; ++c) anyEnabled = anyEnabled || carriers->getItem(c)->Enabled->getValue();
    const bool noiseOnly = hasNoise && !anyEnabled;
    bool firstCarrier = true;
    SpareRows spare;
    try {
        for (int c = 0; c < numberOfCarriers && !cancelled.load(std::memory_order_relaxed); ++c) {
            auto carrier = carriers->getItem(c);
            if (!carrier->Enabled->getValue()) continue;
            auto& generator = carrierGenerators[static_cast<std::size_t>(c)];
            spare.swapWith(*generator);
            generator->Init(*carrier, *settings, totalSamples, startSample);
            const double offset = settings->SampleRateAuto->getValue() * carrier->TimingOffset->getValue();
            if (!(offset >= 0.0) || offset > totalSamples)
                failWith("TimingOffset out of range.", "NRCarriers[" + std::to_string(c) + "].TimingOffset " +
                                                           std::to_string(carrier->TimingOffset->getValue()));
            generator->SetTestVector(testVectorGenerator != nullptr);
            auto computeFrame = [&](int frame, bool secondPass) {
                generator->Go(frame, numberOfFrames, secondPass);
                // The stages of frame 0, before any of it is saved.
                if (testVectorGenerator && frame == 0 && !secondPass) testVectorGenerator->GenerateOneFrame(c, frame);
            };
            runCarrier(*generator, static_cast<int>(offset), computeFrame, true, firstCarrier);
            spare.swapWith(*generator);
            std::lock_guard<std::mutex> lock(generatorsMutex);
            generator.reset();
        }
        if (hasNoise && noiseGenerator && !cancelled.load(std::memory_order_relaxed)) {
            spare.swapWith(*noiseGenerator);
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
    if (cancelled.exchange(false, std::memory_order_relaxed)) {
        for (auto& buffer : fileBuffers) buffer.Delete();
        return;
    }
    if (!firstCarrier) requireFullFiles();
}

void NR5GEngine::requireFullFiles() const {
    const auto expected = static_cast<std::uintmax_t>(totalSamples);
    for (const auto& buffer : fileBuffers) {
        const std::pair<const std::string*, std::uintmax_t> files[] = {
            {&buffer.sampleFileName, expected * sizeof(std::complex<double>)}, {&buffer.markerFileName, expected}};
        for (const auto& [name, bytes] : files) {
            std::error_code error;
            const auto size = std::filesystem::file_size(*name, error);
            if (error || size != bytes)
                failWith("An output file does not hold the whole waveform.",
                         *name + ": " + (error ? error.message() : std::to_string(size) + " bytes, " + std::to_string(bytes) + " expected"));
        }
    }
}

}  // namespace Orvalis_NR
