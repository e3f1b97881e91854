#pragma once
// Channel coding of small block lengths (UCI of 1 to 11 bits), TS 38.212 clauses 5.3.3 and
// 5.4.3.

#include <vector>

#include "coding/coding_types.h"

namespace Orvalis_NR {

class SmallBlockCoding {
  public:
    /// Builds `Basis` from TS 38.212 Table 5.3.3.3-1.
    SmallBlockCoding();

    /// k: payload bits (1..11); qm: bits per modulation symbol. N is qm for K of 1, 3 qm for K
    /// of 2, otherwise 32. Always true.
    bool Init(int k, int qm);

    /// c (K bits) to d (N elements): the repetition tables of clauses 5.3.3.1 and 5.3.3.2 with
    /// placeholders x = -1 and y = -2, or the (32, K) code of clause 5.3.3.3. False when c has
    /// not K elements or d not N. Throws std::out_of_range for K above 11 (no basis column).
    bool Encode(BitSequence& c, BitSequence& d);

    /// Rate matching by repetition, clause 5.4.3: f(i) = d(i mod N) for every element of f.
    /// Throws std::out_of_range when f is not empty and d holds fewer than N (>= 1) elements.
    bool RateMatch(BitSequence& d, BitSequence& f);

    int K = 0;
    int N = 0;
    char PlaceholderX = -1;
    char PlaceholderY = -2;
    std::vector<std::vector<int>> Basis;
};

}  // namespace Orvalis_NR
