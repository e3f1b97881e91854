#include "coding/ldpc_rate_match.h"

#include <algorithm>
#include <stdexcept>
#include <string>

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
    if (rv != 0 && z <= 0) {
        throw std::invalid_argument("LDPC_RateMatch::Initialize: z must be positive, got " +
                                    std::to_string(z));
    }
    Qm = qm;
    // TS 38.212 Table 5.4.2.1-2: k0 = floor(w Ncb / (m Zc)) Zc.
    static constexpr int kWeights[2][4] = {{0, 17, 33, 56}, {0, 13, 25, 43}};
    const bool graph1 = baseGraph == LDPC_BG1;
    const int m = graph1 ? 66 : 50;
    K0 = rv == 0 ? 0 : kWeights[graph1 ? 0 : 1][rv] * ncb / (m * z) * z;
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
    if (E > 0 && Ncb > N) {
        throw std::out_of_range("LDPC_RateMatch::Run: Ncb = " + std::to_string(Ncb) +
                                " exceeds the " + std::to_string(N) + " elements of d");
    }
    selectAndInterleave(d.data(), -2, f.data());
    return true;
}

bool LDPC_RateMatch::GetPattern(const int* d, int* f) {
    if (E > 0 && (d == nullptr || f == nullptr)) {
        throw std::invalid_argument("LDPC_RateMatch::GetPattern: null array");
    }
    selectAndInterleave(d, -1, f);
    return true;
}

void LDPC_RateMatch::selectAndInterleave(const int* d, int skip, int* f) {
    if (E <= 0) return;
    if (Ncb <= 0 || Qm <= 0) {
        throw std::invalid_argument("LDPC_RateMatch: Ncb = " + std::to_string(Ncb) +
                                    " and Qm = " + std::to_string(Qm) + " must be positive");
    }
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
        if (barren >= Ncb) {
            throw std::invalid_argument("LDPC_RateMatch: the " + std::to_string(Ncb) +
                                        " positions of the circular buffer are all skipped");
        }
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
