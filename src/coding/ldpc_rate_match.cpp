#include "coding/ldpc_rate_match.h"

#include <algorithm>
#include <string>

#include "common/failure.h"

namespace Orvalis_NR {
namespace {

// f(i + j Qm) = e(i R + j), R = E / Qm: Qm row reads, one sequential write stream.
template <int Q>
void interleave(const int* e, int rows, int* f) {
    for (int j = 0; j < rows; ++j) {
        for (int i = 0; i < Q; ++i) f[i + j * Q] = e[i * rows + j];
    }
}

}  // namespace

bool LDPC_RateMatch::Initialize(LDPC_BaseGraphTypeEnumList baseGraph, int z, int blocks, int ncb,
                                int n, int e, int rv, int qm) {
    Blocks = blocks;
    E = e;
    N = n;
    Ncb = ncb;
    if (rv < 0 || rv > 3) {
        ErrorMessage = "RV is out of range.";
        return false;
    }
    if (qm != 1 && qm != 2 && qm != 4 && qm != 6 && qm != 8) {
        ErrorMessage = "Qm should be 1, 2, 4, 6 or 8.";
        return false;
    }
    // The selection reads the first Ncb of the N encoder outputs, circularly.
    if (e < 0) failWith("The LDPC rate-matching output length is negative.", "E " + std::to_string(e));
    if (e > 0 && (ncb < 1 || ncb > n))
        failWith("The LDPC circular buffer must hold 1 to N bits.",
                 "Ncb " + std::to_string(ncb) + ", N " + std::to_string(n));
    if (rv != 0 && z <= 0) failWith("The LDPC lifting size must be positive.", "Z " + std::to_string(z));
    Qm = qm;
    // TS 38.212 Table 5.4.2.1-2: k0 = floor(w Ncb / (m Zc)) Zc. w Ncb passes int from Ncb of
    // about 38 million on, so the product is formed in 64 bits; k0 itself is below Ncb.
    static constexpr int kWeights[2][4] = {{0, 17, 33, 56}, {0, 13, 25, 43}};
    const bool graph1 = baseGraph == LDPC_BG1;
    const long long m = graph1 ? 66 : 50;
    K0 = rv == 0 ? 0 : static_cast<int>(kWeights[graph1 ? 0 : 1][rv] * static_cast<long long>(ncb) / (m * z) * z);
    return true;
}

bool LDPC_RateMatch::Run(std::vector<int>& d, std::vector<int>& f) {
    if (d.size() != static_cast<std::size_t>(N)) {
        ErrorMessage = "input d sequence is of wrong length.";
        return false;
    }
    if (f.size() != static_cast<std::size_t>(E)) {
        ErrorMessage = "output f sequence is of wrong length.";
        return false;
    }
    if (E > 0 && Ncb > N)
        failWith("The LDPC circular buffer must hold 1 to N bits.",
                 "Ncb " + std::to_string(Ncb) + ", N " + std::to_string(N));
    selectAndInterleave(d.data(), -2, f.data());
    return true;
}

bool LDPC_RateMatch::GetPattern(const int* d, int* f) {
    if (E > 0 && (d == nullptr || f == nullptr)) failWith("LDPC rate matching was given no arrays.", "E " + std::to_string(E));
    selectAndInterleave(d, -1, f);
    return true;
}

void LDPC_RateMatch::selectAndInterleave(const int* d, int skip, int* f) {
    if (E <= 0) return;
    if (Ncb <= 0 || Qm <= 0)
        failWith("LDPC rate matching needs a circular buffer and a modulation order.",
                 "Ncb " + std::to_string(Ncb) + ", Qm " + std::to_string(Qm));
    // With Qm = 1 the interleaver is the identity and e is written straight into f.
    int* e = f;
    if (Qm != 1) {
        Selected.resize(static_cast<std::size_t>(E));
        e = Selected.data();
    }

    // Bit selection, clause 5.4.2.1: a run of `length` positions yields at most `length`
    // values, so each run is bounded by the values still missing and nothing overshoots.
    int pos = K0 % Ncb;
    if (pos < 0) pos += Ncb;
    int gathered = 0;
    int barren = 0;  // positions read since the last value: a buffer of fillers never ends
    while (gathered < E) {
        const int length = std::min(Ncb - pos, E - gathered);
        const int before = gathered;
        const int* run = d + pos;
        for (int i = 0; i < length; ++i) {
            const int v = run[i];
            e[gathered] = v;
            gathered += v != skip;
        }
        barren = gathered == before ? barren + length : 0;
        if (barren >= Ncb)
            failWith("The LDPC circular buffer holds only filler bits: the selection would never end.",
                     "Ncb " + std::to_string(Ncb));
        pos += length;
        if (pos == Ncb) pos = 0;
    }

    // Bit interleaving, clause 5.4.2.2.
    const int rows = E / Qm;
    switch (Qm) {
        case 1: break;
        case 2: interleave<2>(e, rows, f); break;
        case 4: interleave<4>(e, rows, f); break;
        case 6: interleave<6>(e, rows, f); break;
        case 8: interleave<8>(e, rows, f); break;
        default: break;
    }
}

}  // namespace Orvalis_NR
