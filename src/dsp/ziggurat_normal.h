#pragma once
// Standard normal deviates from 32-bit uniform words by the ziggurat method (Marsaglia and Tsang,
// 128 layers). Most draws cost one word, a multiply and a compare; the exact density is kept by
// the wedge and tail corrections, so the distribution is the normal one to the resolution of a
// 25-bit signed uniform.

#include <cstdint>
#include <random>

namespace Orvalis_NR {

class ZigguratNormal {
  public:
    ZigguratNormal();

    /// One N(0, 1) deviate drawn from `engine`.
    double operator()(std::mt19937& engine) const {
        for (;;) {
            const std::uint32_t word = engine();
            const std::uint32_t layer = word & 127u;
            // Arithmetic shift of the signed word: a uniform integer in [-2^24, 2^24).
            const std::int32_t j = static_cast<std::int32_t>(word) >> 7;
            const std::uint32_t magnitude = static_cast<std::uint32_t>(j < 0 ? -j : j);
            if (magnitude < inner[layer]) return j * width[layer];
            double value = 0.0;
            if (edge(engine, layer, j, value)) return value;
        }
    }

  private:
    /// The rare draws outside a layer's inner rectangle: the tail beyond the base layer, or a
    /// wedge under the curve. True with `value` set when the draw is accepted.
    bool edge(std::mt19937& engine, std::uint32_t layer, std::int32_t j, double& value) const;

    std::uint32_t inner[128];  // |j| below this lies inside layer i's rectangle under the curve
    double width[128];         // layer i's right edge over 2^24
    double height[128];        // exp(-x^2 / 2) at layer i's right edge
};

/// The one table set, built at first use.
const ZigguratNormal& zigguratNormal();

}  // namespace Orvalis_NR
