#include "common/sample_rate_guard.h"

#include <cstdio>

#include "common/failure.h"

namespace Orvalis_NR {

bool isGeneratingSampleRate(double sampleRate) {
    return sampleRate >= kLowestSampleRate && sampleRate <= kHighestSampleRate;
}

void requireGeneratingSampleRate(double sampleRate) {
    if (!isGeneratingSampleRate(sampleRate))
        failWith("SampleRateAuto must lie from 1 Hz to 2147483647 Hz for a carrier or noise: outside that range "
                 "the frame length in samples (the rate truncated to int) is undefined.",
                 "SampleRateAuto " + numberText(sampleRate));
}

std::string numberText(double value) {
    char text[32];
    std::snprintf(text, sizeof text, "%.17g", value);
    // Prefer the shorter form when it reads back as the same number.
    char shorter[32];
    std::snprintf(shorter, sizeof shorter, "%.15g", value);
    double back = 0.0;
    if (std::sscanf(shorter, "%lf", &back) == 1 && back == value) return shorter;
    return text;
}

}  // namespace Orvalis_NR
