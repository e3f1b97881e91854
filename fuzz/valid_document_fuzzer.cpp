// libFuzzer target: the fuzzer's bytes choose a VALID waveform document over the channels the
// library generates (carriers, SS/PBCH, noise), which must be read, set up and run with
// status 0 every time. A refusal or a crash is a finding.

#include <fuzzer/FuzzedDataProvider.h>

#include <array>
#include <cstddef>
#include <cstdint>
#include <nlohmann/json.hpp>
#include <string>

#include "fuzz_run.h"

namespace {

using nlohmann::json;

// A carrier geometry that fits its sample rate with the SS/PBCH block inside the carrier.
struct CarrierShape {
    int mu;
    const char* numerology;
    const char* bandwidth;
    int resourceBlocks;
    double minimumSampleRate;
};

constexpr std::array<CarrierShape, 3> kShapes{{
    {0, "SCS15k", "FR1_5M", 25, 7.68e6},
    {0, "SCS15k", "FR1_10M", 52, 15.36e6},
    {1, "SCS30k", "FR1_10M", 24, 15.36e6},
}};
// Rates that keep one run short under the sanitizers; the shapes above fit them.
constexpr std::array<double, 2> kSampleRates{7.68e6, 15.36e6};
constexpr std::array<const char*, 4> kMarkers{"WaveformStart", "FrameStart", "AlcControl",
                                              "RfBlanking"};
constexpr std::array<const char*, 3> kPhaseModes{"Auto", "Manual", "Off"};
constexpr std::array<const char*, 6> kPeriods{"HalfFrame", "OneFrame",   "TwoFrame",
                                              "FourFrame", "EightFrame", "SixteenFrame"};
constexpr std::array<const char*, 4> kPayloads{"PN9", "PN15", "PN23", "PN31"};

template <class T, std::size_t N>
T pick(FuzzedDataProvider& in, const std::array<T, N>& options) {
    return options[in.ConsumeIntegralInRange<std::size_t>(0, N - 1)];
}

// A list of active block indices below lmax: a range "a:b" or a comma list.
std::string activeBlocks(FuzzedDataProvider& in, int lmax) {
    if (in.ConsumeBool()) {
        const int first = in.ConsumeIntegralInRange(0, lmax - 1);
        return std::to_string(first) + ":" +
               std::to_string(in.ConsumeIntegralInRange(first, lmax - 1));
    }
    std::string list;
    for (int i = 0; i < lmax; ++i)
        if (in.ConsumeBool()) list += (list.empty() ? "" : ",") + std::to_string(i);
    return list.empty() ? "0" : list;
}

json ssBlock(FuzzedDataProvider& in, const CarrierShape& shape) {
    const bool caseA = shape.mu == 0;
    const int lmax = in.ConsumeBool() ? 4 : 8;
    // Centre of the block in subcarriers from the carrier centre, the block inside the carrier.
    const int room = shape.resourceBlocks * 6 - 120;
    std::string levels = "1";
    if (in.ConsumeBool()) levels += "," + std::to_string(in.ConsumeIntegralInRange(1, 10) / 10.0);
    return {
        {"Enabled", in.ConsumeProbability<double>() < 0.9},
        {"Numerology", shape.numerology},
        {"Mu", shape.mu},
        {"SSBlockPattern", caseA ? "CaseA" : (in.ConsumeBool() ? "CaseB" : "CaseC")},
        {"SSB30KSymbolIndex", in.ConsumeBool() ? "Option0" : "Option1"},
        {"SSBPeriod", pick(in, kPeriods)},
        {"HalfFrameIndex", in.ConsumeIntegralInRange(0, 1)},
        {"Lmax", lmax},
        {"SSBActiveIndex", activeBlocks(in, lmax)},
        {"PowerLevelStr", levels},
        {"PowerBoosting", in.ConsumeIntegralInRange(-60, 60) / 10.0},
        {"PSSPowerBoosting", in.ConsumeIntegralInRange(-30, 30) / 10.0},
        {"FrequencyOffset", in.ConsumeIntegralInRange(-room, room)},
        {"ChannelCoding", in.ConsumeProbability<double>() < 0.8},
        {"ScramblingBeforeChannelCoding", in.ConsumeBool()},
        {"ScramblingAfterChannelCoding", in.ConsumeBool()},
        {"AutoMIB", in.ConsumeBool()},
        {"PayloadDataLength", 24},
        {"PayloadData", {{"PayLoadDataType", pick(in, kPayloads)}}},
        {"SFNStart", in.ConsumeIntegralInRange(0, 1023)},
        {"MIB",
         {{"SubcarrierSpacingCommon", in.ConsumeBool() ? "SCS15k" : "SCS30k"},
          {"SsbSubcarrierOffset", in.ConsumeIntegralInRange(0, 23)},
          {"DmrstypeApos", in.ConsumeIntegralInRange(2, 3)},
          {"PdcchConfigSIB1", in.ConsumeIntegralInRange(0, 255)},
          {"CellBarred", in.ConsumeBool() ? "barred" : "notBarred"},
          {"IntraFreqReselection", in.ConsumeBool() ? "allowed" : "notAllowed"}}},
    };
}

json carrier(FuzzedDataProvider& in, double sampleRate) {
    CarrierShape shape = pick(in, kShapes);
    while (shape.minimumSampleRate > sampleRate) shape = kShapes[0];
    const double spacing = 15000.0 * (1 << shape.mu);
    const bool cw = in.ConsumeProbability<double>() < 0.1;
    return {
        {"Enabled", in.ConsumeProbability<double>() < 0.9},
        {"CarrierType", cw ? "CW" : "DL"},
        {"CellID", in.ConsumeIntegralInRange(0, 1007)},
        {"Bandwidth", shape.bandwidth},
        {"Numerology", shape.numerology},
        {"Mu", shape.mu},
        {"NumberOfRB", shape.resourceBlocks},
        {"FrequencyOffsetOfPointA", -shape.resourceBlocks * 6 * spacing},
        {"FrequencyOffset", in.ConsumeBool() ? 0.0 : in.ConsumeIntegralInRange(-20, 20) * 100000.0},
        {"TimingOffset", in.ConsumeBool() ? 0.0 : in.ConsumeIntegralInRange(0, 100) * 1e-6},
        {"PowerBoosting", in.ConsumeIntegralInRange(-100, 0) / 10.0},
        {"InitialPhase", in.ConsumeIntegralInRange(0, 359)},
        {"WindowBeta", in.ConsumeIntegralInRange(0, 10) / 100.0},
        {"WindowingMethod",
         in.ConsumeBool() ? "CenteredAtSymbolBoundary" : "StartingAtSymbolBoundary"},
        {"BasebandFilter", in.ConsumeBool()},
        {"DCPunctured", in.ConsumeBool()},
        {"Downlink", {{"SSPBCH", ssBlock(in, shape)}}},
    };
}

json document(FuzzedDataProvider& in) {
    const double sampleRate = pick(in, kSampleRates);
    const int subframes = in.ConsumeIntegralInRange(1, 10);
    json doc = {
        {"SampleRateAuto", sampleRate},
        {"NumberOfFrames", 1},
        {"NumberOfSubframes", subframes},
        {"SubframeOffset", in.ConsumeIntegralInRange(0, 10 - subframes)},
        {"NumberOfAntennas", in.ConsumeIntegralInRange(1, 2)},
        {"PhaseCompensation", pick(in, kPhaseModes)},
        {"RadioFrequency", in.ConsumeIntegralInRange(1, 60) * 1e8},
        {"Marker1", pick(in, kMarkers)},
        {"Marker2", pick(in, kMarkers)},
        {"Marker3", pick(in, kMarkers)},
        {"Marker4", pick(in, kMarkers)},
        {"AwgnEnabled", in.ConsumeProbability<double>() < 0.2},
        {"CarrierToNoiseRatio", in.ConsumeIntegralInRange(-10, 40)},
        {"NoiseBandwidth", sampleRate * in.ConsumeIntegralInRange(1, 8) / 10.0},
    };
    json carriers = json::array();
    const int count = in.ConsumeIntegralInRange(0, 2);
    for (int i = 0; i < count; ++i) carriers.push_back(carrier(in, sampleRate));
    doc["NRCarriers"] = carriers;
    return doc;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    FuzzedDataProvider in(data, size);
    nrsynth_fuzz::runDocument(document(in).dump(), nrsynth_fuzz::Expect::Success);
    return 0;
}
