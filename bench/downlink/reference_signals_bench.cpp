// The CSI-RS/TRS/PRS example (20 MHz, 30 kHz, 4 antennas: a 4-layer PDSCH, a 32-port CDM8
// CSI-RS, a TRS burst, a muted PRS) per 10 ms frame on one core: the reference signals' own
// work, the whole numerology frame, and the cost that the CSI-RS adds to the PDSCH's count of
// data elements in a slot that holds it (the same count without any CSI-RS beside it).

#include <benchmark/benchmark.h>

#include <algorithm>
#include <complex>
#include <fstream>
#include <memory>
#include <nlohmann/json.hpp>
#include <vector>

#include "carrier/nr5g_numerology_generator.h"
#include "downlink/csi_rs_generator.h"
#include "downlink/pdsch_generator.h"
#include "downlink/prs_generator.h"
#include "framework/json_serializer.h"
#include "models/nr5g_waveform_settings.h"

namespace {

std::shared_ptr<Models::Nr5g::NR5GWaveformSettings> example(bool withCsiRs) {
    std::ifstream in(std::string(NRSYNTH_EXAMPLES_DIR) + "/csirs_trs_prs_30khz.json");
    auto document = nlohmann::json::parse(in);
    if (!withCsiRs) document["NRCarriers"][0]["Downlink"]["CSIRS"] = nlohmann::json::array();
    Orvalis::Tessaline::JsonSerializer reader;
    return std::dynamic_pointer_cast<Models::Nr5g::NR5GWaveformSettings>(reader.deserialize(document.dump()));
}

struct Numerology {
    std::shared_ptr<Models::Nr5g::NR5GWaveformSettings> settings;
    Orvalis_NR::NR5GNumerologyGenerator generator;
    std::vector<std::vector<std::complex<double>>> output;
    std::vector<std::vector<int>> markers;
    explicit Numerology(bool withCsiRs = true) : settings(example(withCsiRs)) {
        auto carrier = settings->NRCarriers->getValue()->getItem(0);
        generator.Init(*settings, *carrier, 1);
        generator.isPrimary = true;
        output.assign(4, std::vector<std::complex<double>>(307200));
        markers.assign(4, std::vector<int>(307200));
    }
};

void perFrame(benchmark::State& state) {
    state.counters["ms/frame"] = benchmark::Counter(static_cast<double>(state.iterations()) * 1e-3,
                                                     benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
}

void BM_ReferenceSignalsChannelWork(benchmark::State& state) {
    Numerology n;
    auto& g = n.generator;
    Orvalis_NR::OccupancyGrid marks(4, std::vector<int>(static_cast<std::size_t>(g.symbolsPerFrame)));
    for (auto _ : state) {
        for (auto* csiRs : g.csiRsGenerators) csiRs->GenerateAndMap(g.grid, g.occupancy, 0, marks, false);
        for (auto* prs : g.prsGenerators) prs->Map(g.grid, g.occupancy, 0, marks, false);
        benchmark::DoNotOptimize(g.grid[0].data());
        state.PauseTiming();
        for (auto& row : g.occupancy) std::fill(row.begin(), row.end(), 0);
        state.ResumeTiming();
    }
    perFrame(state);
}

void BM_ReferenceSignalsExampleWholeFrame(benchmark::State& state) {
    Numerology n;
    for (auto _ : state) {
        n.generator.Go(0, 1, n.output, n.markers);
        benchmark::DoNotOptimize(n.output[0].data());
    }
    perFrame(state);
}

// Slot 5 (subframe 2, slot 1) holds the 32-port CSI-RS on four symbols of every RB.
void BM_PdschCountBesideCsiRs(benchmark::State& state) {
    Numerology n(state.range(0) != 0);
    auto* pdsch = n.generator.pdschGenerators.front();
    for (auto _ : state) {
        pdsch->CalculateRateMathingParameters(0, 2, 1);
        benchmark::DoNotOptimize(pdsch->DataRePerLayer);
    }
    state.counters["data REs"] = pdsch->DataRePerLayer;
}

}  // namespace

BENCHMARK(BM_ReferenceSignalsChannelWork)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_ReferenceSignalsExampleWholeFrame)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_PdschCountBesideCsiRs)->Arg(1)->Arg(0)->ArgName("csirs")->Unit(benchmark::kMicrosecond);
