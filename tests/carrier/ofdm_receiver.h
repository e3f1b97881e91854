#pragma once
// A receiver's view of one generated frame: OFDM symbols at their positions, demodulated by a
// transform of the test's own, and the error vector magnitude against a reference.

#include <cmath>
#include <complex>
#include <numbers>
#include <utility>
#include <vector>

namespace nrsynth_test {

using Sample = std::complex<double>;

/// One frame of a normal-prefix numerology at 30.72 MHz times a power of two. The FFT window
/// starts halfway into each cyclic prefix, and the linear phase that this advance gives is
/// taken out again.
struct Receiver {
    std::vector<Sample> samples;
    int fftSize;
    std::vector<long> start;  // first sample of each symbol's prefix
    std::vector<int> prefix;

    Receiver(std::vector<Sample> frame, int size, int mu) : samples(std::move(frame)), fftSize(size) {
        const int up = static_cast<int>(samples.size() / 307200);  // times 30.72 MHz
        long position = 0;
        for (int l = 0; l < 140 << mu; ++l) {
            start.push_back(position);
            prefix.push_back(size * 9 / 128 + (l % (7 << mu) == 0 ? 16 * up : 0));
            position += prefix.back() + size;
        }
    }

    /// Subcarrier k (negative below the centre) of symbol l.
    Sample at(int l, int k) const {
        const int advance = prefix[l] / 2, bin = (k % fftSize + fftSize) % fftSize;
        const long begin = start[l] + prefix[l] - advance;
        Sample sum{};
        for (int n = 0; n < fftSize; ++n)
            sum += samples[begin + n] * std::polar(1.0, -2.0 * std::numbers::pi * bin * n / fftSize);
        return sum * std::polar(1.0, 2.0 * std::numbers::pi * bin * advance / fftSize);
    }

    /// All subcarriers of symbol l in transform order (bin k at index k, negative k at k +
    /// fftSize), by a radix-2 transform; fftSize must be a power of two.
    std::vector<Sample> symbol(int l) const {
        const int advance = prefix[l] / 2;
        const long begin = start[l] + prefix[l] - advance;
        std::vector<Sample> bins(samples.begin() + begin, samples.begin() + begin + fftSize);
        for (int i = 1, j = 0; i < fftSize; ++i) {  // bit-reversed order
            int bit = fftSize >> 1;
            for (; j & bit; bit >>= 1) j ^= bit;
            j ^= bit;
            if (i < j) std::swap(bins[i], bins[j]);
        }
        for (int length = 2; length <= fftSize; length <<= 1) {
            const Sample step = std::polar(1.0, -2.0 * std::numbers::pi / length);
            for (int i = 0; i < fftSize; i += length) {
                Sample w = 1.0;
                for (int k = 0; k < length / 2; ++k, w *= step) {
                    const Sample a = bins[i + k], b = bins[i + k + length / 2] * w;
                    bins[i + k] = a + b;
                    bins[i + k + length / 2] = a - b;
                }
            }
        }
        for (int bin = 0; bin < fftSize; ++bin) bins[bin] *= std::polar(1.0, 2.0 * std::numbers::pi * bin * advance / fftSize);
        return bins;
    }
};

/// Error vector magnitude in dB after the best complex gain, which is returned in `gain`.
template <class T>
double evmDb(const std::vector<Sample>& received, const std::vector<T>& reference, Sample& gain) {
    Sample cross{};
    double energy = 0.0, error = 0.0;
    for (std::size_t i = 0; i < reference.size(); ++i) {
        cross += received[i] * std::conj(Sample(reference[i]));
        energy += std::norm(Sample(reference[i]));
    }
    gain = cross / energy;
    for (std::size_t i = 0; i < reference.size(); ++i) error += std::norm(received[i] - gain * Sample(reference[i]));
    return 10.0 * std::log10(error / (std::norm(gain) * energy));
}

}  // namespace nrsynth_test
