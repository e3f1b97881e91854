// The full-load 100 MHz example (273 PRB, 256QAM, 2 layers, 2 antennas, every slot) per 10 ms
// frame on one core: the PDSCH's own work (coding, rate matching, scrambling, modulation,
// mapping), the whole numerology frame (all channels, OFDM, filter), and beside them the
// frame's unavoidable transforms alone (its inverse FFTs and the filter's FFT convolution).

#include <benchmark/benchmark.h>

#include <algorithm>
#include <complex>
#include <fstream>
#include <memory>
#include <nlohmann/json.hpp>
#include <vector>

#include "carrier/nr5g_numerology_generator.h"
#include "downlink/pdsch_generator.h"
#include "framework/json_serializer.h"
#include "models/nr5g_waveform_settings.h"

namespace {

std::shared_ptr<Models::Nr5g::NR5GWaveformSettings> fullLoad() {
    std::ifstream in(std::string(NRSYNTH_EXAMPLES_DIR) + "/pdsch_full_load_100mhz.json");
    const auto text = nlohmann::json::parse(in).dump();
    Orvalis::Tessaline::JsonSerializer reader;
    return std::dynamic_pointer_cast<Models::Nr5g::NR5GWaveformSettings>(reader.deserialize(text));
}

struct Numerology {
    std::shared_ptr<Models::Nr5g::NR5GWaveformSettings> settings = fullLoad();
    Orvalis_NR::NR5GNumerologyGenerator generator;
    std::vector<std::vector<std::complex<double>>> output;
    std::vector<std::vector<int>> markers;
    Numerology() {
        auto carrier = settings->NRCarriers->getValue()->getItem(0);
        generator.Init(*settings, *carrier, 1);
        generator.isPrimary = true;
        output.assign(2, std::vector<std::complex<double>>(1228800));
        markers.assign(2, std::vector<int>(1228800));
    }
};

void clear(Orvalis_NR::NR5GNumerologyGenerator& g) {
    for (auto& row : g.grid) std::fill(row.begin(), row.end(), std::complex<double>());
    for (auto& row : g.occupancy) std::fill(row.begin(), row.end(), 0);
}

void BM_PdschFullLoadChannelWork(benchmark::State& state) {
    Numerology n;
    auto& g = n.generator;
    Orvalis_NR::OccupancyGrid marks(2, std::vector<int>(static_cast<std::size_t>(g.symbolsPerFrame)));
    int frame = 0;
    for (auto _ : state) {
        state.PauseTiming();
        clear(g);
        state.ResumeTiming();
        for (auto* pdsch : g.pdschGenerators) pdsch->Map(g.grid, g.occupancy, frame, marks, true);
        benchmark::DoNotOptimize(g.grid[0].data());
        frame = (frame + 1) % 1;
    }
    state.counters["ms/frame"] = benchmark::Counter(static_cast<double>(state.iterations()) * 1e-3,
                                                     benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
}

void BM_PdschFullLoadWholeFrame(benchmark::State& state) {
    Numerology n;
    for (auto _ : state) {
        n.generator.Go(0, 1, n.output, n.markers);
        benchmark::DoNotOptimize(n.output[0].data());
    }
    state.counters["ms/frame"] = benchmark::Counter(static_cast<double>(state.iterations()) * 1e-3,
                                                     benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
}

void BM_PdschFullLoadTransformsAlone(benchmark::State& state) {
    Numerology n;
    auto& g = n.generator;
    g.Go(0, 1, n.output, n.markers);  // a filled grid, as a real frame has
    for (auto _ : state) {
        g.modulator.Go(g.grid, n.output, 0.0, 0);
        for (std::size_t a = 0; a < g.filters.size() && a < n.output.size(); ++a)
            g.filters[a]->filter(n.output[a].data(), static_cast<int>(n.output[a].size()), n.output[a].data(),
                                 static_cast<int>(n.output[a].size()));
        benchmark::DoNotOptimize(n.output[0].data());
    }
    state.counters["ms/frame"] = benchmark::Counter(static_cast<double>(state.iterations()) * 1e-3,
                                                     benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
}

}  // namespace

BENCHMARK(BM_PdschFullLoadChannelWork)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_PdschFullLoadWholeFrame)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_PdschFullLoadTransformsAlone)->Unit(benchmark::kMillisecond);
