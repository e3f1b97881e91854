#include "dsp/ziggurat_normal.h"

#include <cmath>

namespace Orvalis_NR {

namespace {

constexpr double kTailStart = 3.442619855899;    // right edge of the base layer, r
constexpr double kLayerArea = 9.91256303526217e-3;  // area of each of the 128 layers, v
constexpr double kScale = 16777216.0;             // 2^24, the range of |j|

// Uniform in (0, 1), never 0, so that its logarithm is finite.
double openUniform(std::mt19937& engine) {
    return (static_cast<double>(engine()) + 0.5) * (1.0 / 4294967296.0);
}

}  // namespace

ZigguratNormal::ZigguratNormal() {
    double x = kTailStart;
    const double q = kLayerArea / std::exp(-0.5 * x * x);
    // The base layer is a rectangle of width q holding the tail's area beside the strip [0, r].
    inner[0] = static_cast<std::uint32_t>(x / q * kScale);
    inner[1] = 0;
    width[0] = q / kScale;
    width[127] = x / kScale;
    height[0] = 1.0;
    height[127] = std::exp(-0.5 * x * x);
    for (int i = 126; i >= 1; --i) {
        const double next = std::sqrt(-2.0 * std::log(kLayerArea / x + std::exp(-0.5 * x * x)));
        inner[i + 1] = static_cast<std::uint32_t>(next / x * kScale);
        x = next;
        height[i] = std::exp(-0.5 * x * x);
        width[i] = x / kScale;
    }
}

bool ZigguratNormal::edge(std::mt19937& engine, std::uint32_t layer, std::int32_t j, double& value) const {
    if (layer == 0) {
        // Tail beyond r (Marsaglia's method): exact for the normal density conditioned on |x| > r.
        double x = 0.0;
        double y = 0.0;
        do {
            x = -std::log(openUniform(engine)) / kTailStart;
            y = -std::log(openUniform(engine));
        } while (y + y < x * x);
        value = j > 0 ? kTailStart + x : -kTailStart - x;
        return true;
    }
    // Wedge between the layer's inner rectangle and the one above: accept under the curve.
    const double x = j * width[layer];
    const double level = height[layer] + openUniform(engine) * (height[layer - 1] - height[layer]);
    if (level < std::exp(-0.5 * x * x)) {
        value = x;
        return true;
    }
    return false;
}

const ZigguratNormal& zigguratNormal() {
    static const ZigguratNormal tables;
    return tables;
}

}  // namespace Orvalis_NR
