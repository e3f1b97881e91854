#include <benchmark/benchmark.h>

#include <complex>
#include <random>
#include <vector>

#include "dsp/filter.h"
#include "dsp/sinc_low_pass.h"

namespace {

// The numerology's baseband filter: 1025 taps over one 10 ms frame at 122.88 MHz, in place;
// block 7000 through 8192-point transforms (argument 7000), or the frame form's choice (0).
void BM_Filter_1025Taps_Frame(benchmark::State& state) {
    constexpr int frameLength = 1228800;
    const auto prototype = Generate_SincLowPass(0.8, 1025, 1, true);
    std::vector<std::complex<double>> coefficients(prototype.begin(), prototype.end());
    auto filter = state.range(0) > 0 ? Orvalis_NR::FilterCreator::create(coefficients, static_cast<int>(state.range(0)))
                                     : Orvalis_NR::FilterCreator::createForFrames(coefficients);

    std::vector<std::complex<double>> samples(frameLength);
    std::mt19937 engine(2);
    std::normal_distribution<double> normal;
    for (auto& s : samples) s = {normal(engine), normal(engine)};
    for (auto _ : state) {
        filter->filter(gsl::span<std::complex<double>>(samples),
                       gsl::span<std::complex<double>>(samples));
        benchmark::DoNotOptimize(samples.data());
    }
    state.SetItemsProcessed(state.iterations() * frameLength);
    state.counters["frames_per_s"] =
        benchmark::Counter(static_cast<double>(state.iterations()), benchmark::Counter::kIsRate);
}
BENCHMARK(BM_Filter_1025Taps_Frame)->ArgName("block")->Arg(7000)->Arg(3072)->Arg(0)->Unit(benchmark::kMillisecond);

}  // namespace
