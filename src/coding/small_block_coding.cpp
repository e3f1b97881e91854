#include "coding/small_block_coding.h"

#include <stdexcept>
#include <string>

#include "tables/small_block_tables.h"

namespace Orvalis_NR {

SmallBlockCoding::SmallBlockCoding() {
    Basis.reserve(tables::kSmallBlockBasis.size());
    for (const auto& row : tables::kSmallBlockBasis) Basis.emplace_back(row.begin(), row.end());
}

bool SmallBlockCoding::Init(int k, int qm) {
    K = k;
    N = k == 1 ? qm : k == 2 ? 3 * qm : 32;
    return true;
}

bool SmallBlockCoding::Encode(BitSequence& c, BitSequence& d) {
    if (K < 0 || c.size() != static_cast<std::size_t>(K) || N < 0 ||
        d.size() != static_cast<std::size_t>(N))
        return false;
    if (K == 1) {
        // Clause 5.3.3.1: c0, then y, then x up to the qm bits of one symbol.
        for (int i = 0; i < N; ++i) d[i] = i == 0 ? c[0] : i == 1 ? PlaceholderY : PlaceholderX;
    } else if (K == 2) {
        // Clause 5.3.3.2: (c0 c1), (c2 c0), (c1 c2), each pair padded with x to qm bits, so
        // that every symbol carries one pair; with qm of 1 the plain triple.
        const char c2 = static_cast<char>(c[0] ^ c[1]);
        const char triple[3] = {c[0], c[1], c2};
        const int qm = N / 3;
        if (qm == 1) {
            for (int i = 0; i < 3; ++i) d[i] = triple[i];
        } else {
            int next = 0;
            for (int symbol = 0; symbol < 3; ++symbol)
                for (int j = 0; j < qm; ++j)
                    d[symbol * qm + j] = j < 2 ? triple[next++ % 3] : PlaceholderX;
        }
    } else {
        if (K > 11)
            throw std::out_of_range("SmallBlockCoding::Encode: K " + std::to_string(K) +
                                    " exceeds the 11 basis sequences");
        // Clause 5.3.3.3: d(i) = sum over k of c(k) M(i, k), modulo 2.
        for (int i = 0; i < 32; ++i) {
            int sum = 0;
            for (int k = 0; k < K; ++k) sum += c[k] * Basis[i][k];
            d[i] = static_cast<char>(sum & 1);
        }
    }
    return true;
}

bool SmallBlockCoding::RateMatch(BitSequence& d, BitSequence& f) {
    if (f.empty()) return true;
    if (N < 1 || d.size() < static_cast<std::size_t>(N))
        throw std::out_of_range("SmallBlockCoding::RateMatch: N is " + std::to_string(N) +
                                " and d holds " + std::to_string(d.size()) + " elements");
    for (std::size_t i = 0; i < f.size(); ++i) f[i] = d[i % static_cast<std::size_t>(N)];
    return true;
}

}  // namespace Orvalis_NR
