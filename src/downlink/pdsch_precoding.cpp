// Precoders: the PDSCH's own per-bundle matrix for 1, 2 and 4 ports, and the uplink codebooks
// of TS 38.211 clause 6.3.1.5 for one and two antenna ports.

#include <cmath>

#include "downlink/pdsch_generator.h"

namespace Orvalis_NR {

void PDSCH_Generator::CalculatePrecodingMatrix(int rb) {
    const int m = rb / BundleSize;
    const int ports = static_cast<int>(Ports.size());
    const complex j(0.0, 1.0);
    if (ports == 1) {
        PrecodingMatrix.resize(1, 1);
        PrecodingMatrix(0, 0) = 1.0;
    } else if (ports == 2) {
        PrecodingMatrix.resize(2, 2);
        PrecodingMatrix(0, 0) = 0.5;
        PrecodingMatrix(0, 1) = 0.5;
        PrecodingMatrix(1, 0) = m % 2 == 0 ? complex(0.5) : 0.5 * j;
        PrecodingMatrix(1, 1) = m % 2 == 0 ? complex(-0.5) : -0.5 * j;
    } else if (ports == 4) {
        constexpr double pi = 3.141592653589793;
        const double phi = 2.0 * pi * ((m / 2) % 8) / 8.0;
        const double psi = phi + pi;
        const double theta = (m % 2) * pi / 2.0;
        auto e = [](double angle) { return std::polar(1.0, angle); };
        // Columns of power 0.5, as with two ports.
        const double scale = std::sqrt(0.5 / 4.0);
        const complex rows[4][4] = {{1.0, 1.0, 1.0, 1.0},
                                    {e(phi), e(psi), e(phi), e(psi)},
                                    {e(theta), e(theta), -e(theta), -e(theta)},
                                    {e(theta + phi), e(theta + psi), -e(theta + phi), -e(theta + psi)}};
        PrecodingMatrix.resize(4, 4);
        for (int r = 0; r < 4; ++r)
            for (int c = 0; c < 4; ++c) PrecodingMatrix(r, c) = rows[r][c] * scale;
    }
    // Other port counts keep the matrix they have.
}

void PDSCH_Generator::GetPrecodingMatrix(bool, int layers, int ports, int tpmi, brinecomm::matrix<complex>& w) {
    const complex j(0.0, 1.0);
    const double a = 0.7071067811865476;
    if (layers == 1 && ports == 1) {
        w.resize(1, 1);
        w(0, 0) = 1.0;
    } else if (layers == 1 && ports == 2 && tpmi >= 0 && tpmi <= 5) {
        // TS 38.211 Table 6.3.1.5-1.
        const complex second[6] = {0.0, 1.0, 1.0, -1.0, j, -j};
        w.resize(2, 1);
        w(0, 0) = tpmi == 1 ? 0.0 : a;
        w(1, 0) = second[tpmi] * a;
    } else if (layers == 2 && ports == 2 && tpmi >= 0 && tpmi <= 2) {
        // TS 38.211 Table 6.3.1.5-4.
        w.resize(2, 2);
        if (tpmi == 0) {
            w(0, 0) = a;
            w(1, 1) = a;
        } else {
            w(0, 0) = 0.5;
            w(0, 1) = 0.5;
            w(1, 0) = tpmi == 1 ? complex(0.5) : 0.5 * j;
            w(1, 1) = tpmi == 1 ? complex(-0.5) : -0.5 * j;
        }
    }
}

}  // namespace Orvalis_NR
