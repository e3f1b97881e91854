// Gold sequence (TS 38.211 clause 5.2.1) in output bits per second, warm-up included: a DM-RS
// symbol's worth, a PDSCH code word's worth, and a late offset.

#include <benchmark/benchmark.h>

#include "coding/gold_sequence.h"

namespace {

void goldSequence(benchmark::State& state) {
    const int n = static_cast<int>(state.range(0));
    BitSequence c(static_cast<std::size_t>(n));
    int cInit = 12345;
    for (auto _ : state) {
        PN_Generator(c, n, cInit);
        cInit = (cInit + 1) & 0x7FFFFFFF;
        benchmark::ClobberMemory();
    }
    state.SetItemsProcessed(state.iterations() * n);
}

void goldSequenceOffset(benchmark::State& state) {
    const int n = 1000;
    const int offset = static_cast<int>(state.range(0));
    BitSequence c(n);
    for (auto _ : state) {
        benchmark::DoNotOptimize(PN_Generator(c, n, 777, offset));
        benchmark::ClobberMemory();
    }
    state.SetItemsProcessed(state.iterations() * n);
}

}  // namespace

BENCHMARK(goldSequence)->Arg(96)->Arg(1320)->Arg(100000)->Arg(1000000);
BENCHMARK(goldSequenceOffset)->Arg(10000)->Arg(100000);
