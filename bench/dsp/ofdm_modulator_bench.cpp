#include <benchmark/benchmark.h>

#include <complex>
#include <random>
#include <vector>

#include "dsp/ofdm_modulator.h"

namespace {

// One 10 ms frame at 122.88 MHz, 30 kHz spacing: 4096-point symbols, 14 per slot, 20 slots,
// prefixes 352 then 13 x 288 per half subframe; 1,228,800 samples per antenna.
void BM_OfdmModulator_Frame(benchmark::State& state) {
    const int window = static_cast<int>(state.range(0));
    const double phaseStep = state.range(1) ? 3.5e9 * 6.283185307179586 / 122.88e6 : 0.0;
    constexpr int fftSize = 4096, symbols = 280, frameLength = 1228800;
    std::vector<int> cpLengths(14, 288);
    cpLengths[0] = 352;

    Orvalis_NR::OfdmModulator modulator;
    modulator.windowLength = window;
    modulator.Init(fftSize, cpLengths, symbols, true, 1);

    Orvalis_NR::SlotGrid grid(1, std::vector<std::complex<double>>(symbols * fftSize));
    std::mt19937 engine(1);
    std::uniform_int_distribution<int> bit(0, 1);
    // A full 273-RB allocation of QPSK around DC.
    for (int s = 0; s < symbols; ++s)
        for (int k = -1638; k < 1638; ++k)
            grid[0][s * fftSize + (k + fftSize) % fftSize] = {bit(engine) ? 0.7071 : -0.7071,
                                                              bit(engine) ? 0.7071 : -0.7071};
    std::vector<std::vector<std::complex<double>>> output(
        1, std::vector<std::complex<double>>(frameLength));
    int frame = 0;
    for (auto _ : state) {
        modulator.Go(grid, output, phaseStep, frame++);
        benchmark::DoNotOptimize(output[0].data());
    }
    state.SetItemsProcessed(state.iterations() * frameLength);
    state.counters["frames_per_s"] =
        benchmark::Counter(static_cast<double>(state.iterations()), benchmark::Counter::kIsRate);
}
BENCHMARK(BM_OfdmModulator_Frame)
    ->ArgNames({"window", "phase"})
    ->Args({0, 0})
    ->Args({123, 1})
    ->Unit(benchmark::kMillisecond);

}  // namespace
