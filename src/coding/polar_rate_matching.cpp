#include "coding/polar_rate_matching.h"

#include <stdexcept>

#include "coding/polar_mother_code.h"

namespace Orvalis_NR {

namespace {

/// Coded-bit interleaver of TS 38.212 clause 5.4.1.3: the E bits are written row by row into a
/// triangle whose row r holds T - r places, and read column by column, skipping the places
/// past the E-th bit.
std::vector<int> triangularInterleave(const std::vector<int>& in) {
    const int E = static_cast<int>(in.size());
    int T = 0;  // smallest T with T(T+1)/2 >= E
    while (T * (T + 1) / 2 < E) ++T;
    // Row r starts at rowStart(r) = r T - r(r-1)/2 in the row-by-row writing order.
    std::vector<int> out;
    out.reserve(in.size());
    for (int column = 0; column < T; ++column) {
        for (int row = 0; row < T - column; ++row) {
            const int k = row * T - row * (row - 1) / 2 + column;
            if (k < E) out.push_back(in[static_cast<std::size_t>(k)]);
        }
    }
    return out;
}

}  // namespace

bool RateMatchingPolar::Init(int K, int E, int nMax, int bitInterleave) {
    const int N = polarCodeLength(K, E, nMax);
    this->K = K;
    Pattern = readPolarSubBlockPattern(Table54111Text);
    const std::vector<int> J = polarSubBlockInterleaver(Pattern, N);

    // Bit selection, TS 38.212 clause 5.4.1.2, on the sub-block interleaved sequence y(n) =
    // d(J(n)): repetition for E >= N, else the last E bits (puncturing) or the first E
    // (shortening).
    SelectionMap.resize(static_cast<std::size_t>(E));
    const int start = (E < N && polarPuncturing(K, E)) ? N - E : 0;
    for (int i = 0; i < E; ++i)
        SelectionMap[static_cast<std::size_t>(i)] = J[static_cast<std::size_t>((i + start) % N)];

    if (bitInterleave == 1) SelectionMap = triangularInterleave(SelectionMap);
    codeLength_ = static_cast<std::size_t>(N);
    return true;
}

bool RateMatchingPolar::Go(const BitSequence& d, BitSequence& f) {
    if (f.size() != SelectionMap.size())
        throw std::invalid_argument("f holds " + std::to_string(f.size()) + " bits, E is " +
                                    std::to_string(SelectionMap.size()));
    if (d.size() < codeLength_)
        throw std::invalid_argument("d holds " + std::to_string(d.size()) + " bits, N is " +
                                    std::to_string(codeLength_));
    for (std::size_t i = 0; i < f.size(); ++i) f[i] = d[static_cast<std::size_t>(SelectionMap[i])];
    return true;
}

}  // namespace Orvalis_NR
