// Whole waveforms through the C interface, and the output files' write speed.

#include <benchmark/benchmark.h>
#include <unistd.h>

#include <complex>
#include <filesystem>
#include <string>
#include <vector>

#include "engine/file_buffer.h"
#include "nrsynth/nrsynth.h"

namespace {

std::string scratchPath(const char* name) {
    return (std::filesystem::temp_directory_path() / (std::string("nrsynth_bench_") + std::to_string(::getpid()) + name))
        .string();
}

void removeOutput(const std::string& path) {
    std::error_code ignored;
    std::filesystem::remove(path, ignored);
    std::filesystem::remove(path + ".mkr", ignored);
}

// Generates `document` through the C interface once per iteration; reports seconds per 10 ms
// frame (printed with an SI prefix: "45m" is 45 ms) and "realtime", the waveform's duration
// over the time it took.
void runWaveform(benchmark::State& state, const std::string& document, int frames, const char* fileName) {
    const auto path = scratchPath(fileName);
    StartDeserialize(document.c_str());
    for (auto _ : state) {
        InitEngine(path.c_str());
        RunEngine();
        if (GetStatus() != 0) state.SkipWithError(GetLog());
    }
    removeOutput(path);
    state.counters["s_per_frame"] = benchmark::Counter(
        static_cast<double>(frames), benchmark::Counter::kIsIterationInvariantRate | benchmark::Counter::kInvert);
    state.counters["realtime"] = benchmark::Counter(0.01 * frames, benchmark::Counter::kIsIterationInvariantRate);
}

// Ten frames of two continuous-wave carriers with frequency offsets and noise at 122.88 MHz.
void BM_TwoCarrierCwWithNoise(benchmark::State& state) {
    const int frames = static_cast<int>(state.range(0));
    const std::string document =
        R"({"SampleRateAuto": 122880000, "NumberOfFrames": )" + std::to_string(frames) +
        R"(, "AwgnEnabled": true, "CarrierToNoiseRatio": 20, "NRCarriers": [)"
        R"({"CarrierType": "CW", "FrequencyOffset": -20000000},)"
        R"({"CarrierType": "CW", "FrequencyOffset": 15000000, "InitialPhase": 45}]})";
    runWaveform(state, document, frames, "_wave.bin");
    state.SetItemsProcessed(state.iterations() * frames * 1228800LL);
}
BENCHMARK(BM_TwoCarrierCwWithNoise)->Arg(10)->Unit(benchmark::kMillisecond)->UseRealTime();

// An SS burst (Case C, Lmax 8) on a 100 MHz 30 kHz downlink carrier at 122.88 MHz, as in
// examples/ssb_case_c_30khz.json: OFDM, 1025-tap filter and markers per frame.
void BM_SsBurstCarrier(benchmark::State& state) {
    const int frames = static_cast<int>(state.range(0));
    const std::string document =
        R"({"SampleRateAuto": 122880000, "NumberOfFrames": )" + std::to_string(frames) +
        R"(, "NRCarriers": [{"CarrierType": "DL", "Numerology": "SCS30k", "Mu": 1, "NumberOfRB": 273,)"
        R"( "CellID": 17, "FrequencyOffsetOfPointA": -49140000, "Downlink": {"SSPBCH": {"Enabled": true,)"
        R"( "Numerology": "SCS30k", "Mu": 1, "SSB30KSymbolIndex": "Option1", "Lmax": 8, "PowerLevelStr": "1",)"
        R"( "FrequencyOffset": -600}}}]})";
    runWaveform(state, document, frames, "_ssb.bin");
}
BENCHMARK(BM_SsBurstCarrier)->Arg(4)->Unit(benchmark::kMillisecond)->UseRealTime();

// One frame row at 122.88 MHz written straight out (first carrier) or read, added and written
// back (later carriers); bytes per second of sample and marker data.
void BM_FileBufferSave(benchmark::State& state) {
    const bool accumulate = state.range(0) != 0;
    const auto path = scratchPath("_buffer.bin");
    constexpr int kRow = 1228800;
    std::vector<std::complex<double>> row(kRow, {0.25, -0.5});
    std::vector<char> markers(kRow, 3);
    Orvalis_NR::FileBuffer buffer;
    buffer.Init(path.c_str());
    buffer.totalSamples = 4 * kRow;
    buffer.Reset();
    buffer.Seek(0, true);
    for (int i = 0; i < 4; ++i) buffer.Save(row, markers, true, false, true, 4, 0);
    for (auto _ : state) buffer.Save(row, markers, !accumulate, false, true, 4, 0);
    buffer.Close();
    removeOutput(path);
    state.SetBytesProcessed(state.iterations() * kRow * static_cast<std::int64_t>(sizeof(row[0]) + 1));
}
BENCHMARK(BM_FileBufferSave)->ArgName("accumulate")->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond)->UseRealTime();

}  // namespace
