#pragma once
// A PDCCH receiver written from the 3GPP text alone: the Gold sequence of TS 38.211 clause
// 5.2.1, the DM-RS of clause 7.4.1.3.1, the CCE-to-REG mapping of clause 7.3.2.2, the CRC of
// TS 38.212 clause 7.3.2 and a successive-cancellation polar decoder undoing clauses 7.3.3,
// 7.3.4 (5.3.1, 5.4.1) for noise-free hard bits.

#include <algorithm>
#include <complex>
#include <cstdint>
#include <set>
#include <string>
#include <vector>

#include "../coding/polar_reference.h"

namespace pdcch_ref {

using Bits = std::vector<char>;

/// c(0..n-1) of TS 38.211 clause 5.2.1: x1 from 1 0 0 ..., x2 from the bits of cInit, Nc 1600.
inline Bits gold(std::uint32_t cInit, int n) {
    const int total = 1600 + n + 31;
    Bits x1(static_cast<std::size_t>(total), 0), x2(static_cast<std::size_t>(total), 0);
    x1[0] = 1;
    for (int i = 0; i < 31; ++i) x2[i] = static_cast<char>((cInit >> i) & 1);
    for (int i = 0; i + 31 < total; ++i) {
        x1[i + 31] = static_cast<char>((x1[i + 3] + x1[i]) % 2);
        x2[i + 31] = static_cast<char>((x2[i + 3] + x2[i + 2] + x2[i + 1] + x2[i]) % 2);
    }
    Bits c(static_cast<std::size_t>(n));
    for (int i = 0; i < n; ++i) c[i] = static_cast<char>((x1[i + 1600] + x2[i + 1600]) % 2);
    return c;
}

/// r_l(m), m = 0..count-1, of TS 38.211 clause 7.4.1.3.1 for symbol l of slot n_s.
inline std::vector<std::complex<double>> dmrs(int slot, int l, int nId, int count, int symbolsPerSlot = 14) {
    const std::uint64_t cInit =
        ((std::uint64_t{1} << 17) * static_cast<std::uint64_t>(symbolsPerSlot * slot + l + 1) * (2 * nId + 1) +
         2 * static_cast<std::uint64_t>(nId)) % (std::uint64_t{1} << 31);
    const Bits c = gold(static_cast<std::uint32_t>(cInit), 2 * count);
    std::vector<std::complex<double>> r;
    for (int m = 0; m < count; ++m)
        r.emplace_back((1 - 2 * c[2 * m]) / std::sqrt(2.0), (1 - 2 * c[2 * m + 1]) / std::sqrt(2.0));
    return r;
}

/// f(x) of TS 38.211 clause 7.3.2.2 for a CORESET of `regs` REGs: bundles of L, R rows.
inline int interleave(int x, int regs, int L, int R, int nShift) {
    const int C = regs / (L * R);
    const int c = x / R, r = x % R;
    return (r * C + c + nShift) % (regs / L);
}

/// The REGs (numbered time first in the CORESET) of CCEs first..first+count-1.
inline std::set<int> cceRegs(int first, int count, int regs, bool interleaved, int L, int R, int nShift) {
    std::set<int> out;
    if (!interleaved) L = 6;
    for (int j = first; j < first + count; ++j)
        for (int i = 0; i < 6 / L; ++i) {
            const int x = 6 * j / L + i;
            const int bundle = interleaved ? interleave(x, regs, L, R, nShift) : x;
            for (int g = L * bundle; g < L * bundle + L; ++g) out.insert(g);
        }
    return out;
}

/// gCRC24C over 24 ones followed by `a`: the remainder of the polynomial division, MSB first
/// (TS 38.212 clauses 5.1 and 7.3.2).
inline Bits crc24c(const Bits& a) {
    static const int g[25] = {1, 1, 0, 1, 1, 0, 0, 1, 0, 1, 0, 1, 1, 0, 0, 0, 1, 0, 0, 0, 1, 0, 1, 1, 1};
    Bits work(a.size() + 48, 0);
    std::fill(work.begin(), work.begin() + 24, 1);
    std::copy(a.begin(), a.end(), work.begin() + 24);
    for (std::size_t i = 0; i + 24 < work.size(); ++i)
        if (work[i])
            for (int j = 0; j < 25; ++j) work[i + j] = static_cast<char>(work[i + j] ^ g[j]);
    return Bits(work.end() - 24, work.end());
}

/// The 16 bits of the RNTI, most significant first: the mask of the last 16 CRC bits.
inline Bits rntiBits(int rnti) {
    Bits x(16);
    for (int i = 0; i < 16; ++i) x[i] = static_cast<char>((rnti >> (15 - i)) & 1);
    return x;
}

namespace detail {

// Successive cancellation over LLRs (positive means 0). Returns u and fills x = u G.
inline void decode(const std::vector<double>& llr, const std::vector<char>& frozen, std::size_t offset, Bits& u,
                   Bits& x) {
    const std::size_t n = llr.size();
    if (n == 1) {
        const char bit = frozen[offset] ? 0 : static_cast<char>(llr[0] < 0.0);
        u[offset] = bit;
        x.assign(1, bit);
        return;
    }
    const std::size_t m = n / 2;
    // d = [(u_a + u_b) G_m, u_b G_m]: first a = u_a G_m = d_1 + d_2, then b = u_b G_m.
    std::vector<double> upper(m), lower(m);
    for (std::size_t i = 0; i < m; ++i) {
        const double p = llr[i], q = llr[i + m];
        upper[i] = (p < 0) != (q < 0) ? -std::min(std::abs(p), std::abs(q)) : std::min(std::abs(p), std::abs(q));
    }
    Bits a, b;
    decode(upper, frozen, offset, u, a);
    for (std::size_t i = 0; i < m; ++i) lower[i] = llr[i + m] + (a[i] ? -llr[i] : llr[i]);
    decode(lower, frozen, offset + m, u, b);
    x.resize(n);
    for (std::size_t i = 0; i < m; ++i) {
        x[i] = static_cast<char>(a[i] ^ b[i]);
        x[i + m] = b[i];
    }
}

}  // namespace detail

/// The K = A + 24 bits c of a DCI from its E rate-matched hard bits (TS 38.212 clauses 7.3.3
/// and 7.3.4: polar code with the input interleaver, nMax 9, no coded-bit interleaver).
inline Bits polarDecode(const Bits& e, int K) {
    const int E = static_cast<int>(e.size());
    const polar_ref::Sets sets = polar_ref::sets(K, E, 9, 0, 0);
    const int N = sets.N;
    // Undo the bit selection into y (sub-block interleaved d), then the sub-block interleaver.
    std::vector<double> y(static_cast<std::size_t>(N), 0.0);
    const auto sel = polar_ref::selection(K, E, N);
    if (sel == polar_ref::Selection::Shortening)
        for (int k = E; k < N; ++k) y[k] = 1e9;  // shortened bits are known zeros
    for (int k = 0; k < E; ++k) {
        const int at = sel == polar_ref::Selection::Repetition ? k % N
                       : sel == polar_ref::Selection::Puncturing ? k + N - E
                                                                 : k;
        y[at] += e[k] ? -1.0 : 1.0;
    }
    std::vector<double> llr(static_cast<std::size_t>(N));
    for (int n = 0; n < N; ++n) llr[polar_ref::subBlockJ(n, N)] = y[n];

    std::vector<char> frozen(static_cast<std::size_t>(N), 1);
    for (int q : sets.info) frozen[q] = 0;
    Bits u(static_cast<std::size_t>(N)), x;
    detail::decode(llr, frozen, 0, u, x);

    // c' in ascending information positions, then the inverse of the input interleaver.
    Bits cPrime;
    for (int n = 0; n < N; ++n)
        if (!frozen[n]) cPrime.push_back(u[n]);
    Bits c(static_cast<std::size_t>(K));
    int k = 0;
    for (int m = 0; m <= 163; ++m) {
        const int pi = polar_ref::interleavingPattern()[static_cast<std::size_t>(m)];
        if (pi >= 164 - K) c[pi - (164 - K)] = cPrime[k++];
    }
    return c;
}

/// A decoded DCI: its payload and whether CRC and RNTI mask check.
struct Dci {
    Bits payload;
    bool crcOk = false;
};

/// Descrambles E hard bits with cInit = (nRnti 2^16 + nId) mod 2^31 (TS 38.211 clause
/// 7.3.2.3), decodes A payload bits and checks the RNTI-masked CRC.
inline Dci decodeDci(const Bits& hard, int A, int nRnti, int nId, int rnti) {
    const Bits c = gold(static_cast<std::uint32_t>((static_cast<std::uint64_t>(nRnti) * 65536 + nId) % (1u << 31)),
                        static_cast<int>(hard.size()));
    Bits e(hard.size());
    for (std::size_t i = 0; i < hard.size(); ++i) e[i] = static_cast<char>(hard[i] ^ c[i]);
    const Bits decoded = polarDecode(e, A + 24);
    Dci dci;
    dci.payload.assign(decoded.begin(), decoded.begin() + A);
    Bits parity = crc24c(dci.payload);
    const Bits mask = rntiBits(rnti);
    for (int i = 0; i < 16; ++i) parity[8 + i] = static_cast<char>(parity[8 + i] ^ mask[i]);
    dci.crcOk = Bits(decoded.begin() + A, decoded.end()) == parity;
    return dci;
}

}  // namespace pdcch_ref
