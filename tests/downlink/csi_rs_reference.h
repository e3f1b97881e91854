#pragma once
// CSI-RS as a receiver sees it, worked from TS 38.211 clauses 7.4.1.5.2 and 7.4.1.5.3 alone:
// the sequence r(m), the CDM codes w_f and w_t, and the resource elements of a resource given
// its (k-bar, l-bar) entries. Nothing here calls the library.

#include <bit>
#include <cmath>
#include <complex>
#include <cstdint>
#include <vector>

#include "downlink/pdsch_receiver.h"

namespace csirs_ref {

using Sample = std::complex<double>;

/// r(0..count-1) of clause 7.4.1.5.2 for symbol l of slot n_s (within the frame).
inline std::vector<Sample> sequence(int slot, int l, int nId, int count, int symbolsPerSlot = 14) {
    const std::uint64_t cInit = ((std::uint64_t{1} << 10) * static_cast<std::uint64_t>(symbolsPerSlot * slot + l + 1) *
                                     (2 * static_cast<std::uint64_t>(nId) + 1) +
                                 static_cast<std::uint64_t>(nId)) %
                                (std::uint64_t{1} << 31);
    const auto c = pdsch_rx::gold(static_cast<std::uint32_t>(cInit), 2 * count);
    std::vector<Sample> r;
    for (int m = 0; m < count; ++m)
        r.push_back(pdsch_rx::dmrsValue(c, m));  // QPSK of TS 38.211 clause 5.1.3
    return r;
}

/// CDM types of clause 7.4.1.5.3 with their k' and l' counts.
enum Cdm { NoCdm, FdCdm2, Cdm4, Cdm8 };
inline int kPrimes(Cdm cdm) { return cdm == NoCdm ? 1 : 2; }
inline int lPrimes(Cdm cdm) { return cdm == Cdm8 ? 4 : cdm == Cdm4 ? 2 : 1; }
inline int groupSize(Cdm cdm) { return kPrimes(cdm) * lPrimes(cdm); }

/// Tables 7.4.1.5.3-2 to -5 are Walsh codes: w_f(k') = (-1)^(s0 k') with s0 the low bit of s,
/// w_t(l') = (-1)^popcount((s >> 1) & l').
inline int wf(int s, int kPrime) { return ((s & 1) & kPrime) ? -1 : 1; }
inline int wt(int s, int lPrime) { return std::popcount(static_cast<unsigned>((s >> 1) & lPrime)) % 2 ? -1 : 1; }

/// One (k-bar, l-bar) entry of Table 7.4.1.5.3-1 with its CDM group j.
struct Entry {
    int group, kBar, lBar;
};

/// One resource element of a resource: common RB n, subcarrier k within the RB plus k',
/// symbol l, sequence index m' and its codes' arguments.
struct Element {
    int group, crb, k, l, m, kPrime, lPrime;
};

/// Every element of a resource over common RBs first..last: k = 12 n + k-bar + k', l = l-bar + l',
/// m' = floor(n alpha) + k' + floor(k-bar rho / 12), alpha = rho for one port, 2 rho else; with
/// rho 0.5 only the RBs of parity `odd`.
inline std::vector<Element> elements(const std::vector<Entry>& entries, Cdm cdm, int ports, double rho, bool odd,
                                     int first, int last) {
    const double alpha = ports == 1 ? rho : 2 * rho;
    std::vector<Element> out;
    for (int n = first; n <= last; ++n) {
        if (rho == 0.5 && n % 2 != (odd ? 1 : 0)) continue;
        for (const auto& e : entries)
            for (int kp = 0; kp < kPrimes(cdm); ++kp)
                for (int lp = 0; lp < lPrimes(cdm); ++lp) {
                    const int m = static_cast<int>(std::floor(n * alpha)) + kp + static_cast<int>(std::floor(e.kBar * rho / 12));
                    out.push_back({e.group, n, 12 * n + e.kBar + kp, e.lBar + lp, m, kp, lp});
                }
    }
    return out;
}

}  // namespace csirs_ref
