#include "dsp/sinc_low_pass.h"

#include <cmath>
#include <numbers>
#include <stdexcept>
#include <string>

std::vector<double> Generate_SincLowPass(double bandwidth, int taps, int normalise, bool window) {
    if (taps < 1)
        throw std::invalid_argument("taps: must be at least 1, got " + std::to_string(taps));
    if (normalise < 1)
        throw std::invalid_argument("normalise: must be at least 1, got " +
                                    std::to_string(normalise));
    if (!std::isfinite(bandwidth))
        throw std::invalid_argument("bandwidth: must be finite, got " + std::to_string(bandwidth));

    constexpr double pi = std::numbers::pi;
    const double centre = taps / 2.0;  // so that odd lengths have their peak on a tap
    std::vector<double> h(static_cast<std::size_t>(taps));
    for (int i = 0; i < taps; ++i) {
        const double offset = i - centre + 0.5;
        const double x = offset * bandwidth;
        h[i] = std::abs(x) < 1e-13 ? bandwidth : bandwidth * std::sin(pi * x) / (pi * x);
        if (window) h[i] *= 0.54 + 0.46 * std::cos(offset * 2.0 * pi / taps);
    }

    double energy = 0.0;
    for (double value : h) energy += value * value;
    if (energy == 0.0)
        throw std::invalid_argument("bandwidth: " + std::to_string(bandwidth) +
                                    " gives a filter of zero energy");
    const double scale = 1.0 / std::sqrt(energy / normalise);
    for (double& value : h) value *= scale;
    return h;
}
