// Modulation tables of the PDSCH, TS 38.211 clause 5.1, indexed by the bits of one symbol with
// the first bit most significant.

#include <cmath>

#include "downlink/pdsch_generator.h"

namespace Orvalis_NR {
namespace {

// One axis of square QAM (TS 38.211 clauses 5.1.4-5.1.7): with s_k = 1 - 2 b_k for the axis bits,
// the level is s_0 (2^(m-1) - s_1 (2^(m-2) - ... (2 - s_(m-1)))). In-phase takes the even bits.
int qamLevel(unsigned index, int qm, int firstBit) {
    const int m = qm / 2;
    auto sign = [&](int k) { return ((index >> (qm - 1 - (firstBit + 2 * k))) & 1u) ? -1 : 1; };
    int inner = 1;
    for (int j = 1; j < m; ++j) inner = (1 << j) - sign(m - j) * inner;
    return sign(0) * inner;
}

}  // namespace

void GetPdschConstellation(int modulation, int& qm, std::vector<complex>& table) {
    static constexpr int kQm[7] = {1, 2, 3, 4, 6, 8, 10};
    static constexpr double kMeanPower[7] = {0, 2, 0, 10, 42, 170, 682};
    table.clear();
    qm = 1;
    if (modulation < 0 || modulation > 6) return;
    qm = kQm[modulation];
    table.resize(static_cast<std::size_t>(1) << qm);
    const double a = 0.7071067811865476;
    if (modulation == 0) {  // real-valued, one bit per symbol
        table[0] = complex(a, 0.0);
        table[1] = complex(-a, 0.0);
        return;
    }
    if (modulation == 2) {  // eight phases, index i at angle i pi / 4
        const complex points[8] = {{1, 0}, {a, a}, {0, 1}, {-a, a}, {-1, 0}, {-a, -a}, {0, -1}, {a, -a}};
        for (int i = 0; i < 8; ++i) table[static_cast<std::size_t>(i)] = points[i];
        return;
    }
    const double scale = 1.0 / std::sqrt(kMeanPower[modulation]);
    for (unsigned i = 0; i < table.size(); ++i)
        table[i] = complex(qamLevel(i, qm, 0), qamLevel(i, qm, 1)) * scale;
}

}  // namespace Orvalis_NR
