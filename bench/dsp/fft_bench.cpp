#include <benchmark/benchmark.h>

#include <complex>
#include <vector>

#include "dsp/fft.h"
#include "dsp/ipp_dft.h"

namespace {

// One 4096-point transform, the symbol length of 30 kHz spacing at 122.88 MHz; range(1) picks
// the inverse (with its 1/N pass) or the forward transform.
void BM_FFT(benchmark::State& state) {
    const int n = static_cast<int>(state.range(0));
    const bool inverse = state.range(1) != 0;
    Orvalis_NR::FFT fft;
    fft.Init(n);
    std::vector<std::complex<double>> in(n, {0.5, -0.25}), out(n);
    const auto* source = reinterpret_cast<const double*>(in.data());
    auto* target = reinterpret_cast<double*>(out.data());
    for (auto _ : state) {
        inverse ? fft.InverseFFT(source, target) : fft.ForwardFFT(source, target);
        benchmark::DoNotOptimize(out.data());
    }
    state.SetItemsProcessed(state.iterations() * n);
}
BENCHMARK(BM_FFT)
    ->ArgNames({"size", "inverse"})
    ->Args({4096, 1})
    ->Args({4096, 0})
    ->Unit(benchmark::kMicrosecond);

// A transform-precoding length (273 RBs x 12), through the general transform.
void BM_DFT_Forward(benchmark::State& state) {
    const int n = static_cast<int>(state.range(0));
    Orvalis_NR::IppDft dft(n);
    std::vector<std::complex<double>> in(n, {0.5, -0.25}), out(n);
    for (auto _ : state) {
        dft.dft(in.data(), out.data());
        benchmark::DoNotOptimize(out.data());
    }
    state.SetItemsProcessed(state.iterations() * n);
}
BENCHMARK(BM_DFT_Forward)->Arg(3276)->Unit(benchmark::kMicrosecond);

}  // namespace
