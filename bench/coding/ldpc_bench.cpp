// LDPC encoding and rate matching throughput: information bits (encoder) and output bits
// (rate matching) per second, for the largest lifting size of each base graph.

#include <benchmark/benchmark.h>

#include <cstdint>
#include <random>
#include <vector>

#include "coding/ldpc_encoder.h"
#include "coding/ldpc_rate_match.h"
#include "coding/ldpc_symbol_rate_match.h"

namespace {

using Orvalis_NR::LdpcKernel;

std::vector<int> randomBits(std::size_t n, unsigned seed) {
    std::mt19937 rng(seed);
    std::vector<int> bits(n);
    for (auto& b : bits) b = static_cast<int>(rng() & 1);
    return bits;
}

void encode(benchmark::State& state, int baseGraph, int z, LdpcKernel kernel) {
    if (!Orvalis_NR::ldpcKernelSupported(kernel)) {
        state.SkipWithError("kernel not supported on this CPU");
        return;
    }
    Orvalis_NR::LDPC_Encoder encoder;
    encoder.Initialize(baseGraph, z);
    auto in = randomBits(static_cast<std::size_t>(encoder.K), 1);
    std::vector<int> out(static_cast<std::size_t>(encoder.N));
    for (auto _ : state) {
        encoder.RunWith(kernel, in, out);
        benchmark::DoNotOptimize(out.data());
        benchmark::ClobberMemory();
    }
    state.counters["info_Mbit/s"] = benchmark::Counter(
        static_cast<double>(encoder.K) * static_cast<double>(state.iterations()) / 1e6,
        benchmark::Counter::kIsRate);
}

void BM_LdpcEncode_BG1_Z384_List(benchmark::State& s) { encode(s, 0, 384, LdpcKernel::List); }
void BM_LdpcEncode_BG1_Z384_Portable(benchmark::State& s) { encode(s, 0, 384, LdpcKernel::Portable); }
void BM_LdpcEncode_BG1_Z384_Avx2(benchmark::State& s) { encode(s, 0, 384, LdpcKernel::Avx2); }
void BM_LdpcEncode_BG2_Z384_List(benchmark::State& s) { encode(s, 1, 384, LdpcKernel::List); }
void BM_LdpcEncode_BG2_Z384_Portable(benchmark::State& s) { encode(s, 1, 384, LdpcKernel::Portable); }
void BM_LdpcEncode_BG2_Z384_Avx2(benchmark::State& s) { encode(s, 1, 384, LdpcKernel::Avx2); }
BENCHMARK(BM_LdpcEncode_BG1_Z384_List);
BENCHMARK(BM_LdpcEncode_BG1_Z384_Portable);
BENCHMARK(BM_LdpcEncode_BG1_Z384_Avx2);
BENCHMARK(BM_LdpcEncode_BG2_Z384_List);
BENCHMARK(BM_LdpcEncode_BG2_Z384_Portable);
BENCHMARK(BM_LdpcEncode_BG2_Z384_Avx2);

// Set-up cost of one geometry: row lists and packed plan.
void BM_LdpcInitialize_BG1_Z384(benchmark::State& state) {
    for (auto _ : state) {
        Orvalis_NR::LDPC_Encoder encoder;
        encoder.Initialize(0, 384);
        benchmark::DoNotOptimize(encoder.ParityRows.data());
    }
}
BENCHMARK(BM_LdpcInitialize_BG1_Z384);

// One BG1 Z 384 code block with 200 fillers, rv 2, E near a 64QAM share of the buffer.
void BM_LdpcRateMatch_BG1_Z384(benchmark::State& state) {
    const int qm = static_cast<int>(state.range(0));
    Orvalis_NR::LDPC_Encoder encoder;
    encoder.Initialize(0, 384);
    auto in = randomBits(static_cast<std::size_t>(encoder.K), 2);
    for (int i = 0; i < 200; ++i) in[encoder.K - 1 - i] = -2;
    std::vector<int> d(static_cast<std::size_t>(encoder.N));
    encoder.Run(in, d);
    const int e = 12000 / qm * qm;
    Orvalis_NR::LDPC_RateMatch rm;
    rm.Initialize(LDPC_BG1, 384, 1, encoder.N, encoder.N, e, 2, qm);
    std::vector<int> f(static_cast<std::size_t>(e));
    for (auto _ : state) {
        rm.Run(d, f);
        benchmark::DoNotOptimize(f.data());
        benchmark::ClobberMemory();
    }
    state.counters["out_Mbit/s"] = benchmark::Counter(
        static_cast<double>(e) * static_cast<double>(state.iterations()) / 1e6,
        benchmark::Counter::kIsRate);
}
BENCHMARK(BM_LdpcRateMatch_BG1_Z384)->Arg(2)->Arg(6)->Arg(8);

// The shared channel's form: one BG1 Z 384 block with 200 fillers, rv 0, E 9120 at the given Qm,
// rate matched straight into symbol indices from the packed encoder output, as the slot path
// does; beside it the bit form at the same E.
void rateMatchE9120(benchmark::State& state, bool symbols) {
    const int qm = static_cast<int>(state.range(0));
    Orvalis_NR::LDPC_Encoder encoder;
    encoder.Initialize(0, 384);
    auto in = randomBits(static_cast<std::size_t>(encoder.K), 3);
    const int kPrime = encoder.K - 200;
    for (int i = kPrime; i < encoder.K; ++i) in[static_cast<std::size_t>(i)] = -2;
    std::vector<int> d(static_cast<std::size_t>(encoder.N));
    encoder.Run(in, d);
    const int e = 9120 / qm * qm;
    Orvalis_NR::LDPC_RateMatch rm;
    rm.Initialize(LDPC_BG1, 384, 1, encoder.N, encoder.N, e, 0, qm);
    std::vector<int> f(static_cast<std::size_t>(e));
    Orvalis_NR::LdpcSymbolRateMatch fast;
    std::vector<std::uint64_t> packedIn((encoder.K + 63) / 64), packedD((encoder.N + 63) / 64 + 1);
    for (int i = 0; i < kPrime; ++i) packedIn[static_cast<std::size_t>(i / 64)] |= std::uint64_t(in[static_cast<std::size_t>(i)] & 1) << (i % 64);
    encoder.RunPacked(packedIn.data(), packedD.data());
    const Orvalis_NR::LdpcPackedCircularBuffer buffer{packedD.data(), encoder.N, rm.K0, kPrime - 768, encoder.K - 768};
    std::vector<std::uint16_t> out(static_cast<std::size_t>(e / qm));
    for (auto _ : state) {
        if (symbols) fast.run(buffer, e, qm, out.data());
        else rm.Run(d, f);
        benchmark::DoNotOptimize(out.data());
        benchmark::DoNotOptimize(f.data());
        benchmark::ClobberMemory();
    }
    state.counters["out_Mbit/s"] = benchmark::Counter(
        static_cast<double>(e) * static_cast<double>(state.iterations()) / 1e6,
        benchmark::Counter::kIsRate);
}
void BM_LdpcRateMatchE9120_Bits(benchmark::State& s) { rateMatchE9120(s, false); }
void BM_LdpcRateMatchE9120_Symbols(benchmark::State& s) { rateMatchE9120(s, true); }
BENCHMARK(BM_LdpcRateMatchE9120_Bits)->Arg(8);
BENCHMARK(BM_LdpcRateMatchE9120_Symbols)->Arg(2)->Arg(4)->Arg(6)->Arg(8);

}  // namespace
