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

/// sum_n x[n] exp(sign j 2 pi n k / N), in long double with the angle reduced exactly (n k mod N),
/// divided by N for the inverse (sign +1) as the transform wrappers do.
inline Samples directDft(const Samples& x, int sign = -1) {
    const std::size_t n = x.size();
    std::vector<std::complex<long double>> turn(n);
    for (std::size_t m = 0; m < n; ++m)
        turn[m] = std::polar(1.0L, sign * 2.0L * std::numbers::pi_v<long double> * m / n);
    Samples out(n);
    for (std::size_t k = 0; k < n; ++k) {
        std::complex<long double> sum = 0.0L;
        for (std::size_t i = 0; i < n; ++i)
            sum += std::complex<long double>(x[i].real(), x[i].imag()) * turn[(i * k) % n];
        out[k] = sign < 0 ? Complex(sum) : Complex(sum / static_cast<long double>(n));
    }
    return out;
}

inline Samples directIdft(const Samples& x) { return directDft(x, +1); }

/// Causal linear convolution from a zero history: y[n] = sum_k c[k] x[n - k].
inline Samples directConvolution(const Samples& coefficients, const Samples& x) {
    Samples y(x.size());
    for (std::size_t n = 0; n < x.size(); ++n)
        for (std::size_t k = 0; k < coefficients.size() && k <= n; ++k)
            y[n] += coefficients[k] * x[n - k];
    return y;
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
    double largest = 1.0;
    for (const auto& value : reference) largest = std::max(largest, std::abs(value));
    return 1e-12 * largest;
}

}  // namespace dsp_test
