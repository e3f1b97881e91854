#include "dsp/sinc_low_pass.h"

#include <gtest/gtest.h>

#include <cmath>
#include <complex>
#include <numbers>
#include <stdexcept>

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

TEST(SincLowPass, OddLengthIsSymmetricAboutItsMiddleTap) {
    const auto h = Generate_SincLowPass(0.5, 1025, 1, true);
    ASSERT_EQ(h.size(), 1025u);
    for (int k = 1; k <= 512; ++k) EXPECT_NEAR(h[512 - k], h[512 + k], 1e-15) << k;
    for (int i = 0; i < 1025; ++i)
        if (i != 512) {
            EXPECT_LT(h[i], h[512]);
        }
}

TEST(SincLowPass, EvenLengthIsSymmetricBetweenItsMiddleTaps) {
    const auto h = Generate_SincLowPass(0.3, 1024, 1, false);
    for (int i = 0; i < 512; ++i) EXPECT_NEAR(h[i], h[1023 - i], 1e-15) << i;
    EXPECT_NEAR(h[511], h[512], 1e-15);
}

TEST(SincLowPass, EnergyEqualsTheNormalisation) {
    for (int normalise : {1, 3, 4}) {
        for (bool window : {false, true}) {
            const auto h = Generate_SincLowPass(0.21, 301, normalise, window);
            EXPECT_NEAR(energy(h), normalise, 1e-12 * normalise);
        }
    }
    const auto one = Generate_SincLowPass(0.4, 65, 1, true);
    const auto four = Generate_SincLowPass(0.4, 65, 4, true);
    for (std::size_t i = 0; i < one.size(); ++i) EXPECT_NEAR(four[i], 2.0 * one[i], 1e-15);
}

TEST(SincLowPass, TapsFollowTheSincAndHammingShapes) {
    const double b = 0.3;
    const auto plain = Generate_SincLowPass(b, 9, 1, false);
    const auto windowed = Generate_SincLowPass(b, 9, 1, true);
    for (int i = 0; i < 9; ++i) {
        const double x = (i - 4) * b;
        const double sinc = i == 4 ? 1.0 : std::sin(kPi * x) / (kPi * x);
        const double hamming = 0.54 + 0.46 * std::cos((i - 4) * 2.0 * kPi / 9);
        EXPECT_NEAR(plain[i] / plain[4], sinc, 1e-12) << i;
        EXPECT_NEAR(windowed[i] / windowed[4], sinc * hamming, 1e-12) << i;
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

TEST(SincLowPass, WithoutWindowTheSidelobesStayHigh) {
    const auto h = Generate_SincLowPass(0.25, 1025, 1, false);
    double worst = 0.0;
    for (double f = 0.125 + 0.002; f <= 0.5; f += 0.0003)
        worst = std::max(worst, gainAt(h, f) * 0.5);
    EXPECT_GT(worst, std::pow(10.0, -30.0 / 20));  // rectangular window: about -21 dB
}

TEST(SincLowPass, RefusesDegenerateDesigns) {
    EXPECT_THROW(Generate_SincLowPass(0.5, 0, 1, true), std::invalid_argument);
    EXPECT_THROW(Generate_SincLowPass(0.5, 11, 0, true), std::invalid_argument);
    EXPECT_THROW(Generate_SincLowPass(0.0, 11, 1, true), std::invalid_argument);
    EXPECT_THROW(Generate_SincLowPass(NAN, 11, 1, true), std::invalid_argument);
    EXPECT_EQ(Generate_SincLowPass(0.5, 1, 1, true), std::vector<double>{1.0});
}

}  // namespace
