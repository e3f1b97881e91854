#include "dsp/sinc_low_pass.h"

#include <gtest/gtest.h>

#include <cmath>
#include <complex>
#include <numbers>
#include <stdexcept>
#include <vector>

namespace {

constexpr double kPi = std::numbers::pi;

double energy(const std::vector<double>& h) {
    double sum = 0.0;
    for (double v : h) sum += v * v;
    return sum;
}

/// Gain at frequency f (fraction of the sample rate), phase taken about the filter's centre.
double gainAt(const std::vector<double>& h, double f) {
    std::complex<double> sum = 0.0;
    const double centre = (h.size() - 1) / 2.0;
    for (std::size_t i = 0; i < h.size(); ++i)
        sum += h[i] * std::polar(1.0, -2.0 * kPi * f * (i - centre));
    return std::abs(sum);
}

// Linear phase: symmetric about (taps - 1) / 2, for odd and even lengths; the energy is the
// normalisation, windowed or not.
TEST(SincLowPass, SymmetricWithTheEnergyOfTheNormalisation) {
    for (int taps : {1024, 1025}) {
        const auto h = Generate_SincLowPass(0.3, taps, 1, taps % 2 == 1);
        for (int i = 0; i < taps / 2; ++i) EXPECT_NEAR(h[i], h[taps - 1 - i], 1e-15) << taps;
    }
    for (int normalise : {1, 3, 4})
        for (bool window : {false, true})
            EXPECT_NEAR(energy(Generate_SincLowPass(0.21, 301, normalise, window)), normalise,
                        1e-12 * normalise);
}

// The design pinned by value: h[i] = b sinc(b x_i) (0.54 + 0.46 cos(2 pi x_i / n)) with
// x_i = i - n/2 + 1/2, scaled to unit energy. The values were computed apart from this code
// (40-digit arithmetic). A Hann window, or a Hamming window stretched over n - 1 points or
// centred on n/2, gives coefficients that differ by 0.01 or more.
TEST(SincLowPass, WindowedDesignHasThePinnedCoefficients) {
    struct Pinned {
        double b;
        std::vector<double> h;
    };
    const Pinned cases[] = {
        {0.3,
         {-0.0036338794742028472877, 0.072770511584226217456, 0.33328257913522461022,
          0.61936578046313610531, 0.61936578046313610531, 0.33328257913522461022,
          0.072770511584226217456, -0.0036338794742028472877}},
        {0.45,
         {-0.020391078547500133678, 0.03697589123452513092, 0.4465520515248859928,
          0.77305659904304266006, 0.4465520515248859928, 0.03697589123452513092,
          -0.020391078547500133678}},
    };
    for (const auto& c : cases) {
        const auto h = Generate_SincLowPass(c.b, static_cast<int>(c.h.size()), 1, true);
        ASSERT_EQ(h.size(), c.h.size());
        for (std::size_t i = 0; i < h.size(); ++i)
            EXPECT_NEAR(h[i], c.h[i], 1e-15) << "b " << c.b << " i " << i;
    }
}

class SincLowPassResponse : public ::testing::TestWithParam<double> {};

TEST_P(SincLowPassResponse, PassbandNearUnityAfterSqrtBandwidthAndStopbandDeep) {
    const double b = GetParam();
    const auto h = Generate_SincLowPass(b, 1025, 1, true);
    const double scale = std::sqrt(b);  // as the numerology's filter design applies it
    for (double f = 0.0; f <= b / 2 - 0.005; f += 0.0013)
        EXPECT_NEAR(gainAt(h, f) * scale, 1.0, 0.01) << "passband f " << f;
    for (double f = b / 2 + 0.005; f <= 0.5; f += 0.0013)
        EXPECT_LT(gainAt(h, f) * scale, std::pow(10.0, -50.0 / 20)) << "stopband f " << f;
    EXPECT_NEAR(gainAt(h, b / 2) * scale, 0.5, 0.05);  // half amplitude at the cut-off
}

INSTANTIATE_TEST_SUITE_P(Bandwidths, SincLowPassResponse, ::testing::Values(0.1, 0.25, 0.5, 0.8));

TEST(SincLowPass, RefusesDegenerateDesigns) {
    EXPECT_THROW(Generate_SincLowPass(0.5, 0, 1, true), std::invalid_argument);
    EXPECT_THROW(Generate_SincLowPass(0.5, 11, 0, true), std::invalid_argument);
    EXPECT_THROW(Generate_SincLowPass(NAN, 11, 1, true), std::invalid_argument);
}

}  // namespace
