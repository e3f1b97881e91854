// One radio frame of an SS burst of 8 blocks (Case B, 30 kHz, 10 ms period) generated and
// mapped into a 30 kHz store of 4096 subcarriers on 2 antennas; the store is cleared between
// frames as the slot loop does. Reported as frames per second; set-up is measured apart.

#include <benchmark/benchmark.h>

#include <algorithm>
#include <complex>
#include <memory>
#include <vector>

#include "downlink/pbch_generator.h"
#include "models/nr_carrier.h"
#include "models/nr_sspbch.h"

namespace {

constexpr int kFftSize = 4096;
constexpr int kMu = 1;
constexpr int kAntennas = 2;
constexpr int kSymbols = 140 << kMu;

struct Burst {
    std::shared_ptr<Models::Nr5g::NRSSPBCH> ssb = std::make_shared<Models::Nr5g::NRSSPBCH>();
    std::shared_ptr<Models::Nr5g::NRCarrier> carrier = std::make_shared<Models::Nr5g::NRCarrier>();

    explicit Burst(bool coded) {
        ssb->Mu->setValue(kMu);
        ssb->Lmax->setValue(8);
        ssb->PowerLevelStr->setValue(std::string("1"));
        ssb->ChannelCoding->setValue(coded);
        carrier->CellID->setValue(301);
    }
};

void generateAndMapFrame(benchmark::State& state, bool coded) {
    Burst burst(coded);
    Orvalis_NR::PBCH_Generator generator;
    generator.Init(burst.ssb.get(), burst.carrier.get(), kFftSize);
    const std::size_t size = static_cast<std::size_t>(kSymbols) * kFftSize;
    Orvalis_NR::SlotGrid grid(kAntennas, std::vector<std::complex<double>>(size));
    Orvalis_NR::OccupancyGrid occupancy(kAntennas, std::vector<int>(size));
    Orvalis_NR::OccupancyGrid marks(kAntennas, std::vector<int>(kSymbols));
    int frame = 0;
    for (auto _ : state) {
        state.PauseTiming();
        for (int a = 0; a < kAntennas; ++a) {
            std::fill(grid[a].begin(), grid[a].end(), std::complex<double>());
            std::fill(occupancy[a].begin(), occupancy[a].end(), 0);
            std::fill(marks[a].begin(), marks[a].end(), 0);
        }
        state.ResumeTiming();
        generator.Generate(frame);
        generator.Map(grid, occupancy, marks, true, kMu, false);
        benchmark::DoNotOptimize(grid[0].data());
        ++frame;
    }
    state.counters["frames/s"] =
        benchmark::Counter(static_cast<double>(state.iterations()), benchmark::Counter::kIsRate);
    state.counters["blocks/s"] =
        benchmark::Counter(static_cast<double>(state.iterations()) * generator.ActiveCount,
                           benchmark::Counter::kIsRate);
}

void setUp(benchmark::State& state) {
    Burst burst(true);
    for (auto _ : state) {
        Orvalis_NR::PBCH_Generator generator;
        generator.Init(burst.ssb.get(), burst.carrier.get(), kFftSize);
        benchmark::DoNotOptimize(generator.Pss.data());
    }
}

BENCHMARK_CAPTURE(generateAndMapFrame, Lmax8_Coded, true)->Unit(benchmark::kMicrosecond);
BENCHMARK_CAPTURE(generateAndMapFrame, Lmax8_Uncoded, false)->Unit(benchmark::kMicrosecond);
BENCHMARK(setUp)->Unit(benchmark::kMicrosecond);

}  // namespace
