// Low-PAPR base sequence generation in sequences per second: table lengths, Zadoff-Chu
// lengths of a few to 273 resource blocks, and the type-2 sequences with their DFT.

#include <benchmark/benchmark.h>

#include <vector>

#include "coding/base_sequences.h"

namespace {

void lowPaprType1(benchmark::State& state) {
    const int M = static_cast<int>(state.range(0));
    std::vector<complex> r;
    for (auto _ : state) {
        LowPaprSequenceGenerate(r, M, 0.5, 0, 7, 0);
        benchmark::DoNotOptimize(r.data());
    }
    state.SetItemsProcessed(state.iterations() * M);
    state.SetLabel("items = samples");
}

void lowPaprType2(benchmark::State& state) {
    const int M = static_cast<int>(state.range(0));
    std::vector<complex> r;
    for (auto _ : state) {
        LowPapr2SequenceGenerate(r, M, 0, 0, 7, 0, 4321);
        benchmark::DoNotOptimize(r.data());
    }
    state.SetItemsProcessed(state.iterations() * M);
}

void zadoffChu(benchmark::State& state) {
    const int M = static_cast<int>(state.range(0));
    std::vector<complex> r;
    for (auto _ : state) {
        ZC_Generator(r, M, 1, 7, 0, 0.5, 1.0);
        benchmark::DoNotOptimize(r.data());
    }
    state.SetItemsProcessed(state.iterations() * M);
}

}  // namespace

BENCHMARK(lowPaprType1)->Arg(12)->Arg(30)->Arg(288)->Arg(3276);
BENCHMARK(lowPaprType2)->Arg(12)->Arg(48)->Arg(288)->Arg(3240);
BENCHMARK(zadoffChu)->Arg(12)->Arg(192);
