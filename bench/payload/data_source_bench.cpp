// Payload sources in bits per second: stored PN9 and PN23 blocks handed out per frame-sized
// request, and PN31 generated on the fly; plus building the stored PN23 block.

#include <benchmark/benchmark.h>

#include <vector>

#include "payload/data_source.h"

namespace {

using Models::Nr5g::PayloadData;
using Models::Nr5g::PayloadDataType;

void dataSource(benchmark::State& state, PayloadDataType type) {
    auto payload = std::make_shared<PayloadData>();
    payload->PayLoadDataType->setValue(type);
    Orvalis_NR::DataSourceBlock source;
    source.Init(payload);
    const int count = static_cast<int>(state.range(0));
    std::vector<char> bits(static_cast<std::size_t>(count));
    for (auto _ : state) {
        source.GetOneFrame(bits, count);
        benchmark::ClobberMemory();
    }
    state.SetItemsProcessed(state.iterations() * count);
}

void pnGenerator(benchmark::State& state) {
    const int degree = static_cast<int>(state.range(0));
    Orvalis_NR::PN pn;
    std::vector<char> seed, bits;
    pn.Init(degree, seed, 0);
    for (auto _ : state) {
        pn.Generate(bits, 100000);
        benchmark::ClobberMemory();
    }
    state.SetItemsProcessed(state.iterations() * 100000);
}

void storePn23(benchmark::State& state) {
    for (auto _ : state)
        benchmark::DoNotOptimize(Orvalis_NR::StoredPnSequence(23, 0x7fffff).data());
    state.SetItemsProcessed(state.iterations() * 0x7fffff);
}

}  // namespace

BENCHMARK_CAPTURE(dataSource, PN9, PayloadDataType::PN9)->Arg(8424)->Arg(100000);
BENCHMARK_CAPTURE(dataSource, PN23, PayloadDataType::PN23)->Arg(100000);
BENCHMARK_CAPTURE(dataSource, PN31, PayloadDataType::PN31)->Arg(8424)->Arg(100000);
BENCHMARK(pnGenerator)->Arg(9)->Arg(12)->Arg(31);
BENCHMARK(storePn23)->Unit(benchmark::kMillisecond);
