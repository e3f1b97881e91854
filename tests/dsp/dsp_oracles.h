#pragma once
// Plain reference forms used as oracles by the dsp suites: the defining sums, computed directly.

#include <algorithm>
#include <cmath>
#include <complex>
#include <numbers>
#include <random>
#include <vector>

namespace dsp_test {

using Complex = std::complex<double>;
using Samples = std::vector<Complex>;

inline Samples randomSamples(std::size_t count, unsigned seed) {
    std::mt19937 engine(seed);
    std::uniform_real_distribution<double> uniform(-1.0, 1.0);
    Samples out(count);
    for (auto& value : out) value = {uniform(engine), uniform(engine)};
    return out;
}

/// sum_n x[n] exp(sign j 2 pi n k / N), in long double with the angle reduced exactly (n k mod N).
inline Samples directDft(const Complex* x, std::size_t n, int sign) {
    const long double twoPi = 2.0L * std::numbers::pi_v<long double>;
    std::vector<long double> cosine(n), sine(n);
    for (std::size_t m = 0; m < n; ++m) {
        cosine[m] = std::cos(twoPi * m / n);
        sine[m] = sign * std::sin(twoPi * m / n);
    }
    Samples out(n);
    for (std::size_t k = 0; k < n; ++k) {
        long double re = 0.0L, im = 0.0L;
        for (std::size_t i = 0; i < n; ++i) {
            const std::size_t m = (i * k) % n;
            re += x[i].real() * cosine[m] - x[i].imag() * sine[m];
            im += x[i].real() * sine[m] + x[i].imag() * cosine[m];
        }
        out[k] = {static_cast<double>(re), static_cast<double>(im)};
    }
    return out;
}

inline Samples directDft(const Samples& x) {
    return directDft(x.data(), x.size(), -1);
}

/// Inverse with the 1/N of the transform wrappers.
inline Samples directIdft(const Samples& x) {
    Samples out = directDft(x.data(), x.size(), +1);
    for (auto& value : out) value /= static_cast<double>(x.size());
    return out;
}

/// Causal linear convolution from a zero history: y[n] = sum_k c[k] x[n - k].
inline Samples directConvolution(const Samples& coefficients, const Samples& x) {
    Samples y(x.size());
    for (std::size_t n = 0; n < x.size(); ++n) {
        Complex sum = 0.0;
        for (std::size_t k = 0; k < coefficients.size() && k <= n; ++k)
            sum += coefficients[k] * x[n - k];
        y[n] = sum;
    }
    return y;
}

inline double maxAbs(const Samples& x) {
    double m = 0.0;
    for (const auto& value : x) m = std::max(m, std::abs(value));
    return m;
}

inline double maxAbsDifference(const Complex* a, const Complex* b, std::size_t n) {
    double m = 0.0;
    for (std::size_t i = 0; i < n; ++i) m = std::max(m, std::abs(a[i] - b[i]));
    return m;
}

inline double maxAbsDifference(const Samples& a, const Samples& b) {
    return a.size() == b.size() ? maxAbsDifference(a.data(), b.data(), a.size()) : INFINITY;
}

/// 1e-12 relative to the reference's largest magnitude, and never below 1e-12.
inline double tolerance(const Samples& reference) {
    return 1e-12 * std::max(1.0, maxAbs(reference));
}

}  // namespace dsp_test
