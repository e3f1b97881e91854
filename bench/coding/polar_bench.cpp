// Polar encoding and rate matching of one block, set up once: the PBCH size (K 56, E 864,
// downlink form) and a UCI size (K 100, E 400, uplink form with the coded-bit interleaver).
// Reported as blocks per second; the set-up is measured apart.

#include <benchmark/benchmark.h>

#include <random>

#include "coding/polar_coding.h"
#include "coding/polar_rate_matching.h"

namespace {

struct PolarForm {
    int K, E, nMax, interleave, bitInterleave;
};

constexpr PolarForm kPbch{56, 864, 9, 1, 0};
constexpr PolarForm kUci{100, 400, 10, 0, 1};

void encodeAndRateMatch(benchmark::State& state, PolarForm form) {
    Orvalis_NR::PolarCoding code;
    Orvalis_NR::RateMatchingPolar rm;
    code.Init(form.K, form.E, form.nMax, form.interleave, 0, 0);
    rm.Init(form.K, form.E, form.nMax, form.bitInterleave);
    std::mt19937 rng(1);
    BitSequence c(static_cast<std::size_t>(form.K));
    for (auto& b : c) b = static_cast<char>(rng() & 1);
    BitSequence d(static_cast<std::size_t>(code.N)), f(static_cast<std::size_t>(form.E));
    for (auto _ : state) {
        code.Encode(c, d);
        rm.Go(d, f);
        benchmark::DoNotOptimize(f.data());
        c[0] ^= 1;
    }
    state.counters["blocks/s"] =
        benchmark::Counter(static_cast<double>(state.iterations()), benchmark::Counter::kIsRate);
}

void setUp(benchmark::State& state, PolarForm form) {
    for (auto _ : state) {
        Orvalis_NR::PolarCoding code;
        Orvalis_NR::RateMatchingPolar rm;
        code.Init(form.K, form.E, form.nMax, form.interleave, 0, 0);
        rm.Init(form.K, form.E, form.nMax, form.bitInterleave);
        benchmark::DoNotOptimize(code.Status.data());
    }
}

BENCHMARK_CAPTURE(encodeAndRateMatch, PBCH_K56_E864, kPbch);
BENCHMARK_CAPTURE(encodeAndRateMatch, UCI_K100_E400, kUci);
BENCHMARK_CAPTURE(setUp, PBCH_K56_E864, kPbch);
BENCHMARK_CAPTURE(setUp, UCI_K100_E400, kUci);

}  // namespace
