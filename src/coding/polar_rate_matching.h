#pragma once
// Polar rate matching of TS 38.212 clause 5.4.1: sub-block interleaving (5.4.1.1), bit
// selection by repetition, puncturing or shortening (5.4.1.2) and the triangular coded-bit
// interleaver (5.4.1.3), folded into one map from output to input position.

#include <cstddef>
#include <string>
#include <vector>

#include "coding/coding_types.h"

namespace Orvalis_NR {

class RateMatchingPolar {
  public:
    std::vector<int> SelectionMap;  ///< E entries: the encoder output bit sent as f(i)
    std::vector<int> Pattern;       ///< Table 5.4.1.1-1, 32 entries
    int K = 0;
    /// Table 5.4.1.1-1 as "index value" pairs; empty, the default, reads the compiled table.
    std::string Table54111Text;

    /// K bits (CRC included) into E coded bits of a mother code limited by nMax (9 downlink,
    /// 10 uplink); bitInterleave 1 adds the coded-bit interleaver of the uplink.
    /// Throws std::invalid_argument when K or E is below 1.
    bool Init(int K, int E, int nMax, int bitInterleave);

    /// f(i) = d(SelectionMap(i)). f must hold E elements and d the N encoder output bits;
    /// otherwise std::invalid_argument is thrown.
    bool Go(const BitSequence& d, BitSequence& f);

  private:
    std::size_t codeLength_ = 0;  // N, the length d must have
};

}  // namespace Orvalis_NR
