#pragma once
// Plain reference forms of the polar chain of TS 38.212 (clauses 5.3.1, 5.4.1), read from the
// clause text with the tables of data/3gpp rather than the generated header.

#include <algorithm>
#include <bit>
#include <cmath>
#include <set>
#include <stdexcept>
#include <vector>

#include "vector_file.h"

namespace polar_ref {

using Bits = std::vector<char>;

using nrsynth_test::tableColumn;

inline const std::vector<int>& interleavingPattern() {
    static const auto t = tableColumn("ts38212_table_5_3_1_1_1_polar_interleaving_pattern.json");
    return t;
}
inline const std::vector<int>& polarSequence() {  // Q by ascending W
    static const auto t = tableColumn("ts38212_table_5_3_1_2_1_polar_sequence.json");
    return t;
}
inline const std::vector<int>& subBlockPattern() {
    static const auto t = tableColumn("ts38212_table_5_4_1_1_1_subblock_interleaver_pattern.json");
    return t;
}

/// The parity bits of clause 5.1: the remainder of a(D) D^L by the generator `poly` (degree L,
/// bit i the coefficient of D^i), MSB first.
inline Bits crcParity(const Bits& a, unsigned long long poly, int L) {
    unsigned long long r = 0;
    const unsigned long long top = 1ULL << L;
    auto step = [&](int bit) {
        r = (r << 1) | static_cast<unsigned>(bit & 1);
        if (r & top) r ^= poly;
    };
    for (char b : a) step(b);
    for (int i = 0; i < L; ++i) step(0);
    Bits p(static_cast<std::size_t>(L));
    for (int i = 0; i < L; ++i) p[static_cast<std::size_t>(i)] = static_cast<char>((r >> (L - 1 - i)) & 1);
    return p;
}

/// Code block segmentation of UCI, clause 5.2.1: A' = ceil(A / C) C, a'_i = 0 for the first
/// A' - A places and a_(i - (A' - A)) after them; block r is the r-th A' / C bits of a' with
/// its CRC of generator `poly` and length L appended.
inline std::vector<Bits> segmentUci(const Bits& a, int C, unsigned long long poly, int L) {
    const int A = static_cast<int>(a.size());
    const int aPrime = (A + C - 1) / C * C;
    Bits padded;
    for (int i = 0; i < aPrime; ++i) padded.push_back(i < aPrime - A ? 0 : a[static_cast<std::size_t>(i - (aPrime - A))]);
    std::vector<Bits> blocks;
    for (int r = 0; r < C; ++r) {
        Bits block(padded.begin() + r * (aPrime / C), padded.begin() + (r + 1) * (aPrime / C));
        const Bits parity = crcParity(block, poly, L);
        block.insert(block.end(), parity.begin(), parity.end());
        blocks.push_back(block);
    }
    return blocks;
}

/// N of clause 5.3.1 with logarithms in double, as the clause writes it.
inline int codeLength(int K, int E, int nMax) {
    const double logE = std::ceil(std::log2(static_cast<double>(E)));
    double n1 = logE;
    if (E <= (9.0 / 8.0) * std::pow(2.0, logE - 1) && static_cast<double>(K) / E < 9.0 / 16.0)
        n1 = logE - 1;
    const double n2 = std::ceil(std::log2(K / (1.0 / 8.0)));
    const double n = std::max(std::min({n1, n2, static_cast<double>(nMax)}), 5.0);
    return static_cast<int>(std::pow(2.0, n));
}

/// J(n) of clause 5.4.1.1.
inline int subBlockJ(int n, int N) {
    const int i = 32 * n / N;
    return subBlockPattern()[static_cast<std::size_t>(i)] * (N / 32) + n % (N / 32);
}

enum class Selection { Repetition, Puncturing, Shortening };

inline Selection selection(int K, int E, int N) {
    if (E >= N) return Selection::Repetition;
    return static_cast<double>(K) / E <= 7.0 / 16.0 ? Selection::Puncturing : Selection::Shortening;
}

struct Sets {
    int N = 0;
    std::vector<int> info;            // Q_I, ascending reliability
    std::set<int> frozen, preFrozen;  // Q_F apart from the rate-matching ones, and those
    std::set<int> parity;             // Q_PC
};

/// Clause 5.3.1.2 with the Q_F,tmp of clause 5.4.1.1.
inline Sets sets(int K, int E, int nMax, int nPC, int nPCwm) {
    Sets s;
    const int N = s.N = codeLength(K, E, nMax);
    if (E < N) {
        if (selection(K, E, N) == Selection::Puncturing) {
            for (int n = 0; n <= N - E - 1; ++n) s.preFrozen.insert(subBlockJ(n, N));
            const int limit = E >= 3 * N / 4 ? static_cast<int>(std::ceil(3.0 * N / 4 - E / 2.0))
                                             : static_cast<int>(std::ceil(9.0 * N / 16 - E / 4.0));
            for (int n = 0; n <= limit - 1; ++n) s.preFrozen.insert(n);
        } else {
            for (int n = E; n <= N - 1; ++n) s.preFrozen.insert(subBlockJ(n, N));
        }
    }
    std::vector<int> remaining;
    for (int q : polarSequence())
        if (q < N && !s.preFrozen.count(q)) remaining.push_back(q);
    const int count = K + nPC;
    if (count > static_cast<int>(remaining.size())) throw std::invalid_argument("too many bits");
    s.info.assign(remaining.end() - count, remaining.end());
    s.frozen.insert(remaining.begin(), remaining.end() - count);

    // Q_PC: the nPC - nPCwm least reliable of Q_I, and nPCwm of minimum row weight
    // 2^popcount(i) among the K most reliable, the most reliable first at equal weight.
    for (int i = 0; i < nPC - nPCwm; ++i) s.parity.insert(s.info[static_cast<std::size_t>(i)]);
    std::vector<int> tilde(s.info.begin() + nPC, s.info.end());
    std::reverse(tilde.begin(), tilde.end());  // most reliable first
    std::stable_sort(tilde.begin(), tilde.end(), [](int a, int b) {
        return std::popcount(static_cast<unsigned>(a)) < std::popcount(static_cast<unsigned>(b));
    });
    for (int i = 0; i < nPCwm; ++i) s.parity.insert(tilde[static_cast<std::size_t>(i)]);
    return s;
}

/// u of clause 5.3.1.2 (with the interleaver of 5.3.1.1 when iIL is 1).
inline Bits encoderInput(const Bits& c, int E, int nMax, int iIL, int nPC, int nPCwm) {
    const int K = static_cast<int>(c.size());
    const Sets s = sets(K, E, nMax, nPC, nPCwm);
    Bits cPrime(c);
    if (iIL == 1) {
        int k = 0;
        for (int m = 0; m <= 163; ++m) {
            const int pi = interleavingPattern()[static_cast<std::size_t>(m)];
            if (pi >= 164 - K) cPrime[static_cast<std::size_t>(k++)] = c[pi - (164 - K)];
        }
    }
    const std::set<int> info(s.info.begin(), s.info.end());
    Bits u(static_cast<std::size_t>(s.N), 0);
    int k = 0;
    Bits y(5, 0);  // the cyclic parity register y0..y4
    for (int n = 0; n < s.N; ++n) {
        std::rotate(y.begin(), y.begin() + 1, y.end());
        if (!info.count(n)) continue;
        u[n] = s.parity.count(n) ? y[0] : cPrime[k++];
        if (!s.parity.count(n)) y[0] = static_cast<char>(y[0] ^ u[n]);
    }
    return u;
}

/// d = u G_N by the recursive butterfly: G_2m = [G_m 0; G_m G_m], so the first half of the
/// output is (u_a + u_b) G_m and the second half u_b G_m.
inline Bits butterfly(const Bits& u) {
    if (u.size() == 1) return u;
    const std::size_t m = u.size() / 2;
    Bits sum(m), upper(u.begin() + m, u.end());
    for (std::size_t i = 0; i < m; ++i) sum[i] = static_cast<char>(u[i] ^ u[i + m]);
    Bits d = butterfly(sum);
    const Bits b = butterfly(upper);
    d.insert(d.end(), b.begin(), b.end());
    return d;
}

/// Clause 5.4.1: sub-block interleaver, bit selection and (iBIL 1) coded-bit interleaver.
inline Bits rateMatch(const Bits& d, int K, int E, int iBIL) {
    const int N = static_cast<int>(d.size());
    Bits y(d.size());
    for (int n = 0; n < N; ++n) y[n] = d[subBlockJ(n, N)];
    const Selection sel = selection(K, E, N);
    Bits e(static_cast<std::size_t>(E));
    for (int k = 0; k < E; ++k)
        e[k] = sel == Selection::Repetition   ? y[k % N]
               : sel == Selection::Puncturing ? y[k + N - E]
                                              : y[k];  // shortening
    if (iBIL != 1) return e;
    int T = 0;
    while (T * (T + 1) / 2 < E) ++T;
    constexpr char kNull = 9;
    std::vector<Bits> v(static_cast<std::size_t>(T), Bits(static_cast<std::size_t>(T), kNull));
    int k = 0;
    for (int i = 0; i < T; ++i)
        for (int j = 0; j < T - i; ++j, ++k)
            if (k < E) v[i][j] = e[k];
    Bits f;
    for (int j = 0; j < T; ++j)
        for (int i = 0; i < T - j; ++i)
            if (v[i][j] != kNull) f.push_back(v[i][j]);
    return f;
}

}  // namespace polar_ref
