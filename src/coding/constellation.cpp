#include "coding/constellation.h"

#include <cmath>
#include <stdexcept>
#include <string>

namespace {

// Level on one axis of square QAM, TS 38.211 clause 5.1: with s_k = 1 - 2 a_k for the axis
// bits a_0 (sign) .. a_(m-1), the level is s_0 (2^(m-1) - s_1 (2^(m-2) - ... (2 - s_(m-1)))).
// The in-phase axis takes the even bits of the symbol, the quadrature axis the odd ones.
int axisLevel(unsigned index, int qm, int firstBit) {
    const int m = qm / 2;
    auto sign = [&](int k) {
        const unsigned bit = (index >> (qm - 1 - (firstBit + 2 * k))) & 1u;
        return bit ? -1 : 1;
    };
    int inner = 1;
    for (int j = 1; j < m; ++j) inner = (1 << j) - sign(m - j) * inner;
    return sign(0) * inner;
}

void fillQam(complex* table, int qm, double scale) {
    for (unsigned index = 0; index < (1u << qm); ++index)
        table[index] = complex(axisLevel(index, qm, 0), axisLevel(index, qm, 1)) * scale;
}

}  // namespace

void GetConstellation(complex* bpsk, complex* qpsk, complex* qam16, complex* qam64, complex* qam256,
                      bool normalise) {
    if (!bpsk || !qpsk || !qam16 || !qam64 || !qam256)
        throw std::invalid_argument("GetConstellation: a table pointer is null");
    // Mean power of the odd-integer grid is 2, 10, 42, 170 for 2, 4, 6, 8 bits.
    auto scale = [normalise](double meanPower) {
        return normalise ? 1.0 / std::sqrt(meanPower) : 1.0;
    };
    bpsk[0] = complex(1, 1) * scale(2);
    bpsk[1] = complex(-1, -1) * scale(2);
    fillQam(qpsk, 2, scale(2));
    fillQam(qam16, 4, scale(10));
    fillQam(qam64, 6, scale(42));
    fillQam(qam256, 8, scale(170));
}

void HalfPiBPSK(BitSequence& bits, std::vector<complex>& symbols) {
    if (symbols.size() < bits.size())
        throw std::out_of_range("HalfPiBPSK: symbols holds " + std::to_string(symbols.size()) +
                                " elements for " + std::to_string(bits.size()) + " bits");
    const double a = 1.0 / std::sqrt(2.0);
    for (std::size_t n = 0; n < bits.size(); ++n) {
        const double v = bits[n] == 1 ? -a : a;
        // v (1 + j), rotated by j on odd symbols: j v (1 + j) = v (-1 + j).
        symbols[n] = (n % 2 == 0) ? complex(v, v) : complex(-v, v);
    }
}
