#pragma once
// Reference forms for the SS/PBCH tests, written straight from the clauses of TS 38.211 and
// TS 38.212 with plain arrays, independent of the library's own code.

#include <cmath>
#include <complex>
#include <vector>

namespace ssb_ref {

using Bits = std::vector<char>;

/// c(n) of TS 38.211 clause 5.2.1, Nc = 1600, n = 0..length-1.
inline Bits goldSequence(long long cInit, int length) {
    const int nc = 1600;
    const std::size_t total = static_cast<std::size_t>(nc + length + 31);
    Bits x1(total, 0), x2(total, 0);
    x1[0] = 1;
    for (int i = 0; i < 31; ++i)
        x2[static_cast<std::size_t>(i)] = static_cast<char>((cInit >> i) & 1);
    for (std::size_t n = 0; n + 31 < total; ++n) {
        x1[n + 31] = static_cast<char>((x1[n + 3] + x1[n]) % 2);
        x2[n + 31] = static_cast<char>((x2[n + 3] + x2[n + 2] + x2[n + 1] + x2[n]) % 2);
    }
    Bits c(static_cast<std::size_t>(length));
    for (int n = 0; n < length; ++n)
        c[static_cast<std::size_t>(n)] = static_cast<char>((x1[n + nc] + x2[n + nc]) % 2);
    return c;
}

/// d_PSS(n) of TS 38.211 clause 7.4.2.2.
inline std::vector<int> pss(int nId2) {
    // [x(6) x(5) x(4) x(3) x(2) x(1) x(0)] = [1 1 1 0 1 1 0]
    std::vector<int> x{0, 1, 1, 0, 1, 1, 1};
    for (int i = 0; i + 7 < 127; ++i) x.push_back((x[i + 4] + x[i]) % 2);
    std::vector<int> d(127);
    for (int n = 0; n < 127; ++n) d[n] = 1 - 2 * x[(n + 43 * nId2) % 127];
    return d;
}

/// d_SSS(n) of TS 38.211 clause 7.4.2.3.
inline std::vector<int> sss(int nId1, int nId2) {
    // [x0(6) .. x0(0)] = [x1(6) .. x1(0)] = [0 0 0 0 0 0 1]
    std::vector<int> x0{1, 0, 0, 0, 0, 0, 0}, x1{1, 0, 0, 0, 0, 0, 0};
    for (int i = 0; i + 7 < 127; ++i) {
        x0.push_back((x0[i + 4] + x0[i]) % 2);
        x1.push_back((x1[i + 1] + x1[i]) % 2);
    }
    const int m0 = 15 * (nId1 / 112) + 5 * nId2;
    const int m1 = nId1 % 112;
    std::vector<int> d(127);
    for (int n = 0; n < 127; ++n)
        d[n] = (1 - 2 * x0[(n + m0) % 127]) * (1 - 2 * x1[(n + m1) % 127]);
    return d;
}

/// r(m), m = 0..143, of TS 38.211 clause 7.4.1.4.1 for the block index i-bar.
inline std::vector<std::complex<double>> pbchDmrs(int iBar, int cellId) {
    const long long cInit =
        (1LL << 11) * (iBar + 1) * (cellId / 4 + 1) + (1LL << 6) * (iBar + 1) + cellId % 4;
    const Bits c = goldSequence(cInit, 288);
    std::vector<std::complex<double>> r(144);
    for (int m = 0; m < 144; ++m)
        r[m] = std::complex<double>(1 - 2 * c[2 * m], 1 - 2 * c[2 * m + 1]) / std::sqrt(2.0);
    return r;
}

/// TS 38.212 Table 7.1.1-1, G(0..31).
inline const std::vector<int>& pbchInterleaver() {
    static const std::vector<int> g{16, 23, 18, 17, 8,  30, 10, 6,  24, 7,  0,  5,  3,  2,  1,  4,
                                    9,  11, 12, 13, 14, 15, 19, 20, 21, 22, 25, 26, 27, 28, 29, 31};
    return g;
}

/// Remainder of the long division by gCRC24C (TS 38.212 clause 5.1); zero for a valid code word.
inline unsigned crc24cRemainder(const Bits& bits) {
    const unsigned long long poly = 0x1B2B117;  // D^24 + D^23 + D^21 + D^20 + D^17 + ... + 1
    unsigned long long r = 0;
    for (char b : bits) {
        r = (r << 1) | static_cast<unsigned>(b & 1);
        if (r & (1ULL << 24)) r ^= poly;
    }
    for (int i = 0; i < 24; ++i) {
        r <<= 1;
        if (r & (1ULL << 24)) r ^= poly;
    }
    return static_cast<unsigned>(r);
}

}  // namespace ssb_ref
