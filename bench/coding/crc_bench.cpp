// CRC throughput in input bits per second: transport-block sizes through the selector form
// (which copies its input, as its signature asks) and the raw register.

#include <benchmark/benchmark.h>

#include <random>

#include "coding/crc.h"

namespace {

BitSequence randomBits(int n) {
    std::mt19937 rng(1);
    BitSequence bits(static_cast<std::size_t>(n));
    for (auto& b : bits) b = static_cast<char>(rng() & 1u);
    return bits;
}

void nrCrc(benchmark::State& state, CRC_LengthEnumList type) {
    const int n = static_cast<int>(state.range(0));
    const BitSequence data = randomBits(n);
    BitSequence crc(static_cast<std::size_t>(CrcLength(type)));
    for (auto _ : state) {
        benchmark::DoNotOptimize(NR_CRC(type, n, data, crc));
        benchmark::ClobberMemory();
    }
    state.SetItemsProcessed(state.iterations() * n);
    state.SetLabel("items = bits");
}

void rawCrc(benchmark::State& state) {
    const int n = static_cast<int>(state.range(0));
    BitSequence data = randomBits(n);
    char out[24];
    for (auto _ : state) {
        CRC(24, 0x1864CFB, 0, n, data.data(), out);
        benchmark::ClobberMemory();
    }
    state.SetItemsProcessed(state.iterations() * n);
}

}  // namespace

BENCHMARK_CAPTURE(nrCrc, CRC24A, CRC_24A)->Arg(8424)->Arg(100000);
BENCHMARK_CAPTURE(nrCrc, CRC24B, CRC_24B)->Arg(8424);
BENCHMARK_CAPTURE(nrCrc, CRC16, CRC_16)->Arg(3824);
BENCHMARK_CAPTURE(nrCrc, CRC11, CRC_11)->Arg(200);
BENCHMARK(rawCrc)->Arg(1000)->Arg(100000);
