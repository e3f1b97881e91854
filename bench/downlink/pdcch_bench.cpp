// PDCCH: Generate and Map of one aggregation-level-16 DCI into a 30 kHz store of 1024
// subcarriers on 2 antennas (coding, scrambling, DM-RS of two symbols, per-antenna mapping), and
// the PDCCH example waveform through the C interface, per 10 ms frame.

#include <benchmark/benchmark.h>
#include <unistd.h>

#include <algorithm>
#include <complex>
#include <filesystem>
#include <fstream>
#include <memory>
#include <sstream>
#include <string>
#include <vector>

#include "downlink/pdcch_generator.h"
#include "models/nr5g_waveform_settings.h"
#include "nrsynth/nrsynth.h"

namespace {

constexpr int kWidth = 1024;
constexpr int kSymbols = 280;
constexpr int kAntennas = 2;

struct Aggregation16 {
    std::shared_ptr<Models::Nr5g::NR5GWaveformSettings> waveform = std::make_shared<Models::Nr5g::NR5GWaveformSettings>();
    std::shared_ptr<Models::Nr5g::NRCarrier> carrier = std::make_shared<Models::Nr5g::NRCarrier>();
    std::shared_ptr<Models::Nr5g::NRDLBWP> bwp = std::make_shared<Models::Nr5g::NRDLBWP>();
    std::shared_ptr<Models::Nr5g::NRDCI> dci = std::make_shared<Models::Nr5g::NRDCI>();

    Aggregation16() {
        waveform->SampleRateAuto->setValue(30.72e6);
        carrier->CellID->setValue(42);
        carrier->FrequencyOffsetOfPointA->setValue(-9180000.0);
        bwp->Mu->setValue(1);
        bwp->RBNumber->setValue(51);
        auto coreset = bwp->Coreset1->getValue();
        coreset->ID->setValue(1);
        coreset->SymbolNumber->setValue(2);
        coreset->FrequencyDomainBitmap->setValue(std::string("11111111"));  // 96 REGs, 16 CCEs
        coreset->CceInterleaved->setValue(true);
        dci->CoresetIndex->setValue(1);
        dci->NumberOfCCE->setValue(16);
        dci->PayloadSize->setValue(60);
        dci->PDCCHDMRSScramblingID->setValue(500);
        dci->CRNTI->setValue(0x4601);
        dci->SlotIndexArrayStr->setValue(std::string("0"));
        dci->CCEOffsetStr->setValue(std::string("0"));
    }
};

// The store's two CORESET symbols are cleared inside the loop (4096 elements a row), as the
// slot loop clears the whole store once per frame.
void BM_PdcchAggregation16(benchmark::State& state) {
    Aggregation16 item;
    Orvalis_NR::PDCCH_Generator generator;
    generator.Init(item.waveform.get(), item.carrier.get(), item.dci.get(), item.bwp.get());
    const std::size_t size = static_cast<std::size_t>(kSymbols) * kWidth;
    Orvalis_NR::SlotGrid grid(kAntennas, std::vector<std::complex<double>>(size));
    Orvalis_NR::OccupancyGrid occupancy(kAntennas, std::vector<int>(size));
    Orvalis_NR::OccupancyGrid marks(kAntennas, std::vector<int>(kSymbols));
    for (auto _ : state) {
        for (auto& row : occupancy) std::fill(row.begin(), row.begin() + 2 * kWidth, 0);
        generator.Map(grid, occupancy, 0, marks, true);
        benchmark::DoNotOptimize(grid[0].data());
    }
    state.counters["DCI/s"] = benchmark::Counter(static_cast<double>(state.iterations()), benchmark::Counter::kIsRate);
    state.SetItemsProcessed(state.iterations() * generator.SymbolCount);
}
BENCHMARK(BM_PdcchAggregation16)->Unit(benchmark::kMicrosecond);

void BM_PdcchSetUp(benchmark::State& state) {
    Aggregation16 item;
    for (auto _ : state) {
        Orvalis_NR::PDCCH_Generator generator;
        generator.Init(item.waveform.get(), item.carrier.get(), item.dci.get(), item.bwp.get());
        benchmark::DoNotOptimize(generator.RegInterleaver.data());
    }
}
BENCHMARK(BM_PdcchSetUp)->Unit(benchmark::kMicrosecond);

// examples/pdcch_coresets_30khz.json (SS burst, four DCIs in three CORESETs, 20 MHz at
// 30.72 MHz), two frames per run; seconds per 10 ms frame and the real-time factor.
void BM_PdcchExampleWaveform(benchmark::State& state) {
    std::ifstream in(std::string(NRSYNTH_EXAMPLES_DIR) + "/pdcch_coresets_30khz.json");
    std::stringstream text;
    text << in.rdbuf();
    const auto path = (std::filesystem::temp_directory_path() /
                       ("nrsynth_bench_" + std::to_string(::getpid()) + "_pdcch.bin")).string();
    StartDeserialize(text.str().c_str());
    if (GetStatus() != 0) state.SkipWithError(GetLog());
    for (auto _ : state) {
        InitEngine(path.c_str());
        RunEngine();
        if (GetStatus() != 0) state.SkipWithError(GetLog());
    }
    std::error_code ignored;
    std::filesystem::remove(path, ignored);
    std::filesystem::remove(path + ".mkr", ignored);
    constexpr int kFrames = 2;
    state.counters["s_per_frame"] = benchmark::Counter(
        kFrames, benchmark::Counter::kIsIterationInvariantRate | benchmark::Counter::kInvert);
    state.counters["realtime"] = benchmark::Counter(0.01 * kFrames, benchmark::Counter::kIsIterationInvariantRate);
}
BENCHMARK(BM_PdcchExampleWaveform)->Unit(benchmark::kMillisecond)->UseRealTime();

}  // namespace
