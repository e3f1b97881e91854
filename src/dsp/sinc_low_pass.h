#pragma once
// Windowed-sinc low-pass prototype for the baseband and noise filters.

#include <vector>

/// Low-pass of `taps` (>= 1) coefficients, centred at (taps - 1) / 2, with cut-off at
/// bandwidth / 2 (bandwidth: fraction of the sample rate, 1 = the whole rate, > 0).
/// h[i] = b sin(pi x) / (pi x) with x = (i - taps / 2 + 0.5) b, b where |x| < 1e-13; with
/// `window`, times a Hamming window; then scaled so that sum h[i]^2 == normalise (>= 1).
/// The passband gain comes out near 1 / sqrt(bandwidth) for normalise 1.
std::vector<double> Generate_SincLowPass(double bandwidth, int taps, int normalise, bool window);
