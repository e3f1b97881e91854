#include "dsp/ziggurat_normal.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <random>
#include <vector>

namespace dsp_test {
namespace {

// One million deviates from a fixed seed: the checks below are deterministic, and their bounds
// sit at several standard errors of a true N(0, 1) sample of that size.
std::vector<double> draws(unsigned seed, std::size_t count) {
    std::mt19937 engine(seed);
    const auto& normal = Orvalis_NR::zigguratNormal();
    std::vector<double> values(count);
    for (auto& value : values) value = normal(engine);
    return values;
}

double normalCdf(double x) { return 0.5 * std::erfc(-x / std::sqrt(2.0)); }

TEST(ZigguratNormal, MomentsAreThoseOfTheStandardNormal) {
    const auto values = draws(5489u, 1000000);
    double mean = 0.0, second = 0.0, third = 0.0, fourth = 0.0;
    for (double v : values) {
        mean += v;
        second += v * v;
        third += v * v * v;
        fourth += v * v * v * v;
    }
    const double n = static_cast<double>(values.size());
    mean /= n, second /= n, third /= n, fourth /= n;
    // Standard errors: 1e-3 for the mean, 1.4e-3 for the variance, 3.9e-3 for the skewness,
    // 1e-2 for the kurtosis.
    EXPECT_NEAR(mean, 0.0, 5e-3);
    EXPECT_NEAR(second, 1.0, 7e-3);
    EXPECT_NEAR(third, 0.0, 2e-2);
    EXPECT_NEAR(fourth, 3.0, 5e-2);
}

TEST(ZigguratNormal, DistributionMatchesTheNormalCdfIntoTheTails) {
    auto values = draws(20260u, 1000000);
    std::sort(values.begin(), values.end());
    const double n = static_cast<double>(values.size());
    // Kolmogorov-Smirnov distance; 1.95 / sqrt(n) is its 0.1 % point.
    double distance = 0.0;
    for (std::size_t i = 0; i < values.size(); i += 97) {
        const double cdf = normalCdf(values[i]);
        distance = std::max({distance, std::abs(cdf - i / n), std::abs(cdf - (i + 1) / n)});
    }
    EXPECT_LT(distance, 1.95 / std::sqrt(n));
    // The base layer's tail beyond r = 3.4426 and the wedges: counts beyond 3 and 4 sigma.
    for (const double edge : {2.0, 3.0, 3.5, 4.0}) {
        const auto beyond = static_cast<double>(
            std::count_if(values.begin(), values.end(), [edge](double v) { return std::abs(v) > edge; }));
        const double expected = 2.0 * normalCdf(-edge) * n;
        EXPECT_NEAR(beyond, expected, 5.0 * std::sqrt(expected) + 1.0) << "beyond " << edge;
    }
}

TEST(ZigguratNormal, SuccessiveDrawsAreUncorrelated) {
    // A flat spectrum: the autocorrelation at every small lag is zero within 5 standard errors.
    const auto values = draws(77u, 400000);
    const double n = static_cast<double>(values.size());
    for (std::size_t lag = 1; lag <= 16; ++lag) {
        double sum = 0.0;
        for (std::size_t i = lag; i < values.size(); ++i) sum += values[i] * values[i - lag];
        EXPECT_NEAR(sum / n, 0.0, 5.0 / std::sqrt(n)) << "lag " << lag;
    }
}

}  // namespace
}  // namespace dsp_test
