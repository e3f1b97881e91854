#pragma once
// The one check of SampleRateAuto for everything that generates samples (carriers, their
// numerologies, the noise). Frame and transform lengths are the rate truncated to int, so a rate
// outside the int range, or one below 1 Hz (whose transform ratio to 30.72 MHz is no int either),
// has no defined frame.

#include <string>

namespace Orvalis_NR {

inline constexpr double kLowestSampleRate = 1.0;
inline constexpr double kHighestSampleRate = 2147483647.0;

/// True when `sampleRate` lies from kLowestSampleRate to kHighestSampleRate.
bool isGeneratingSampleRate(double sampleRate);

/// Fails naming SampleRateAuto unless isGeneratingSampleRate(sampleRate).
void requireGeneratingSampleRate(double sampleRate);

/// A number as a message shows it: shortest exact form, no trailing zeros.
std::string numberText(double value);

}  // namespace Orvalis_NR
