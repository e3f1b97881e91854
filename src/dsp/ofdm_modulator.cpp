#include "dsp/ofdm_modulator.h"

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <stdexcept>
#include <string>

namespace Orvalis_NR {

namespace {

// The raised-cosine window is built with this truncated value of pi, not the full constant.
constexpr double kWindowPi = 3.1415926;

[[noreturn]] void fail(const std::string& what) {
    throw std::invalid_argument(what);
}

}  // namespace

OfdmModulator::OfdmModulator() : centred(1), oversampling(1) {}

bool OfdmModulator::Init(int fftSize_, std::vector<int> cpLengths_, int symbolCount_,
                         bool dcPunctured_, int numberOfAntennas_) {
    if (fftSize_ < 1) fail("fftSize: must be at least 1, got " + std::to_string(fftSize_));
    if (cpLengths_.empty()) fail("cpLengths: must hold at least one prefix length");
    if (symbolCount_ < 0)
        fail("symbolCount: must not be negative, got " + std::to_string(symbolCount_));
    if (numberOfAntennas_ < 0)
        fail("numberOfAntennas: must not be negative, got " + std::to_string(numberOfAntennas_));
    if (windowLength < 0 || windowLength > fftSize_)
        fail("windowLength: must be 0 .. fftSize (" + std::to_string(fftSize_) + "), got " +
             std::to_string(windowLength));
    if (oversampling < 1)
        fail("oversampling: must be at least 1, got " + std::to_string(oversampling));
    // After the crossfade the read position fftSize - h - cp + W must lie inside `work`.
    const int halfWindow = centred ? windowLength / 2 : 0;
    for (int cp : cpLengths_)
        if (cp < 0 || cp > fftSize_ - halfWindow + windowLength)
            fail("cpLengths: prefix " + std::to_string(cp) + " does not fit fftSize " +
                 std::to_string(fftSize_) + " and windowLength " + std::to_string(windowLength));

    fftSize = fftSize_;
    cpLengths = std::move(cpLengths_);
    maxSymbolLength =
        (*std::max_element(cpLengths.begin(), cpLengths.end()) + fftSize) * oversampling;
    symbolCount = symbolCount_;
    symbolLoopCount = symbolCount_;
    innerLoopCount = 1;
    innermostLoopCount = 1;
    numberOfAntennas = numberOfAntennas_;
    dcPunctured = dcPunctured_;

    if (isPowerOfTwo(fftSize)) {
        fft.Init(fftSize);
        dft = DFT();
    } else {
        dft.Init(fftSize);
        fft = FFT();
    }
    work.assign(static_cast<std::size_t>(fftSize), {});
    tails.assign(static_cast<std::size_t>(numberOfAntennas),
                 std::vector<std::complex<double>>(static_cast<std::size_t>(windowLength)));
    window.resize(static_cast<std::size_t>(windowLength));
    for (int i = 0; i < windowLength; ++i)
        window[i] = 0.5 - 0.5 * std::cos((i + 0.5) * kWindowPi / windowLength);
    return true;
}

void OfdmModulator::checkBuffers(
    const SlotGrid& grid, const std::vector<std::vector<std::complex<double>>>& output) const {
    if (static_cast<int>(window.size()) != windowLength ||
        static_cast<int>(tails.size()) != numberOfAntennas)
        fail("windowLength: changed after Init, call Init again");
    if (static_cast<int>(grid.size()) < numberOfAntennas)
        fail("grid: " + std::to_string(grid.size()) + " rows for " +
             std::to_string(numberOfAntennas) + " antennas");
    const auto gridLength = static_cast<std::int64_t>(symbolCount) * fftSize;
    std::size_t cpIndex = 0;
    for (int a = 0; a < numberOfAntennas; ++a) {
        if (static_cast<std::int64_t>(grid[a].size()) < gridLength)
            fail("grid: row " + std::to_string(a) + " holds " + std::to_string(grid[a].size()) +
                 " elements, needs " + std::to_string(gridLength));
        std::int64_t position = 0;
        std::int64_t needed = 0;
        for (int s = 0; s < symbolCount; ++s) {
            const int cp = cpLengths[cpIndex];
            cpIndex = cpIndex + 1 == cpLengths.size() ? 0 : cpIndex + 1;
            needed = std::max(needed, position + fftSize + cp);
            position += static_cast<std::int64_t>(fftSize + cp) * oversampling;
        }
        if (static_cast<std::int64_t>(output[a].size()) < needed)
            fail("output: row " + std::to_string(a) + " holds " + std::to_string(output[a].size()) +
                 " samples, needs " + std::to_string(needed));
    }
}

bool OfdmModulator::Go(SlotGrid& grid, std::vector<std::vector<std::complex<double>>>& output,
                       double phaseStep, int frame) {
    if (static_cast<int>(output.size()) != numberOfAntennas) return false;
    checkBuffers(grid, output);

    auto* workData = reinterpret_cast<double*>(work.data());
    std::size_t cpIndex = 0;  // carries on from one antenna to the next
    for (int a = 0; a < numberOfAntennas; ++a) {
        std::complex<double>* row = output[a].data();
        // The phase reference runs in 32-bit arithmetic and wraps on long waveforms.
        const auto rowLength = static_cast<std::uint32_t>(output[a].size());
        int position = 0;
        for (int s = 0; s < symbolLoopCount; ++s) {
            for (int inner = 0; inner < innerLoopCount; ++inner) {
                for (int innermost = 0; innermost < innermostLoopCount; ++innermost) {
                    const int cp = cpLengths[cpIndex];
                    cpIndex = cpIndex + 1 == cpLengths.size() ? 0 : cpIndex + 1;

                    std::complex<double>* symbol =
                        grid[a].data() + static_cast<std::size_t>(s) * fftSize;
                    if (dcPunctured) symbol[0] = 0.0;
                    const auto* in = reinterpret_cast<const double*>(symbol);
                    // Unscaled: the 1/N rides on the copy into the output.
                    if (fft.size() > 0)
                        fft.InverseFFTUnscaled(in, workData);
                    else
                        dft.InverseDFTUnscaled(in, workData);
                    if (phaseStep != 0.0) {
                        // Rotate so that the useful part starts with the phase a carrier at the
                        // compensation frequency has there (TS 38.211 clause 5.4).
                        const std::uint32_t start = rowLength * static_cast<std::uint32_t>(frame) +
                                                    static_cast<std::uint32_t>(position);
                        const auto offset = static_cast<std::int32_t>(
                            static_cast<std::uint32_t>(-static_cast<std::int64_t>(cp)) - start);
                        const double x = static_cast<double>(offset) * phaseStep;
                        writeSymbol(row + position, tails[a], cp,
                                    std::complex<double>(std::cos(x), std::sin(x)) / static_cast<double>(fftSize));
                    } else {
                        writeSymbol(row + position, tails[a], cp, 1.0 / static_cast<double>(fftSize));
                    }
                    position += (fftSize + cp) * oversampling;
                }
            }
        }
    }
    return false;
}

template <class Factor>
void OfdmModulator::writeSymbol(std::complex<double>* out, std::vector<std::complex<double>>& tail, int cp,
                                Factor factor) {
    const int n = fftSize;
    const int w = windowLength;
    const int h = centred ? w / 2 : 0;
    const int total = n + cp;
    const std::complex<double>* source = work.data();

    // Crossfade from the previous symbol's continuation; the mask wraps the read position
    // (exactly so for power-of-two lengths).
    int p = n - h - cp;
    const int mask = n - 1;
    const auto scaled = [factor](std::complex<double> value) { return value * factor; };
    for (int i = 0; i < w; ++i, ++p)
        out[i] = tail[i] * (1.0 - window[i]) + scaled(source[p & mask]) * window[i];
    int written = w;
    if (p < n) {
        const int count = std::min(n - p, total - written);
        std::transform(source + p, source + p + count, out + written, scaled);
        written += count;
        p = 0;
    } else {
        p -= n;
    }
    std::transform(source + p, source + p + (total - written), out + written, scaled);

    // The tail is this symbol's own cyclic continuation past its last output sample.
    if (centred) {
        const int half = w / 2;
        std::transform(source + n - half, source + n, tail.begin(), scaled);
        std::transform(source, source + (w - half), tail.begin() + half, scaled);
    } else {
        std::transform(source, source + w, tail.begin(), scaled);
    }
}

}  // namespace Orvalis_NR
