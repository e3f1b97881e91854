// Precoders: the PDSCH's own per-bundle matrix for 1, 2 and 4 ports, and the uplink codebooks
// of TS 38.211 clause 6.3.1.5 (Tables 6.3.1.5-1 to -7) for the PUSCH.

#include <cmath>
#include <string>

#include "common/failure.h"
#include "downlink/pdsch_generator.h"
#include "tables/uplink_codebook_tables.h"

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

void PDSCH_Generator::GetPrecodingMatrix(bool transformPrecoded, int layers, int ports, int tpmi,
                                         brinecomm::matrix<complex>& w) {
    if (layers == 1 && ports == 1) {
        w.resize(1, 1);
        w(0, 0) = 1.0;
        return;
    }
    // Transform precoding only tells Tables 6.3.1.5-2 and -3 apart; multi-layer transmission is
    // without it, so every other (layers, ports) pair has one table whatever the flag says.
    const tables::UplinkCodebook* codebook = nullptr;
    for (const auto& candidate : tables::kUplinkCodebooks) {
        if (candidate.layers != layers || candidate.ports != ports) continue;
        if (codebook == nullptr || candidate.transformPrecoding == (transformPrecoded ? 1 : 0))
            codebook = &candidate;
    }
    if (codebook == nullptr)
        failWith("Precoding: TS 38.211 clause 6.3.1.5 has no codebook for these layers and ports:",
                 "NumberOfLayers " + std::to_string(layers) + ", NumberOfAntennaPorts " +
                     std::to_string(ports));
    if (tpmi < 0 || tpmi >= codebook->count)
        failWith("Precoding: TPMI outside the codebook:",
                 "TPMIIndex " + std::to_string(tpmi) + " (" + codebook->table + " holds 0.." +
                     std::to_string(codebook->count - 1) + ")");
    const tables::UplinkPrecoder& precoder = codebook->matrices[tpmi];
    w.resize(ports, layers);
    for (int row = 0; row < ports; ++row)
        for (int column = 0; column < layers; ++column) {
            const auto& unit = precoder.units[static_cast<std::size_t>(row * layers + column)];
            w(row, column) = complex(unit[0], unit[1]) * precoder.scale;
        }
}

}  // namespace Orvalis_NR
