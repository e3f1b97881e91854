#pragma once
// Polar encoder of TS 38.212 clause 5.3.1: input bit interleaver (5.3.1.1), frozen and
// information sets with parity check bits (5.3.1.2, with the pre-freezing of 5.4.1.1) and the
// transform d = u G_N.

#include <string>
#include <vector>

#include "coding/coding_types.h"

namespace Orvalis_NR {

class PolarCoding {
  public:
    std::string ErrorMessage;
    int N = 0;    ///< mother code length
    int nPC = 0;  ///< parity check bits
    /// K entries: the input bit placed at the k-th information position.
    std::vector<int> InterleaverPattern;
    std::vector<int> PiMax;      ///< Table 5.3.1.1-1, 164 entries
    std::vector<int> FrozenSet;  ///< frozen positions not pre-frozen by rate matching
    std::vector<int> InfoSet;    ///< K + nPC positions, ascending reliability
    /// The tables as whitespace-separated "index value" pairs (Table 5.3.1.2-1 as "W Q").
    /// Empty, the default, reads the compiled tables; a text given here replaces them.
    std::string Table5311Text;
    std::string Table5312Text;
    std::string Table54111Text;
    std::vector<int> SubBlockPattern;  ///< Table 5.4.1.1-1, 32 entries
    /// Per position: 1 frozen, 2 information, 2 + 4 parity check; 0 for a pre-frozen position.
    std::vector<int> Status;
    /// Column j of the generator matrix G_N (the n-fold Kronecker power of [1 0; 1 1]).
    std::vector<BitSequence> GeneratorColumns;
    BitSequence U;  ///< encoder input u of the last Encode, N elements
    char FrozenValue = 0;

    /// Sets up the code for K bits (CRC included) sent in E coded bits. nMax: 9 downlink, 10
    /// uplink; interleave: 1 applies the input interleaver (K <= 164); nPC parity check bits of
    /// which nPCwm sit at the minimum row weight position. Throws std::invalid_argument for
    /// parameters that leave no valid code (K or E below 1, more K + nPC than free positions,
    /// nPCwm outside 0..nPC, N above 1024).
    bool Init(int K, int E, int nMax, int interleave, int nPC, int nPCwm);

    /// d = u G_N for the K bits of c; d must hold N elements, else "u size error" and false.
    /// Throws std::invalid_argument when c holds fewer than K bits.
    bool Encode(const BitSequence& c, BitSequence& d);

    /// There is no receiver in this library.
    bool Decode() { return true; }

    void ReadTable5311();
    /// q[W] = Q and w[Q] = W for the 1024 rows (W, Q) of Table 5.3.1.2-1.
    void ReadTable5312(std::vector<int>& q, std::vector<int>& w);
    void ReadTable54111();

  private:
    void buildGeneratorColumns();
    std::vector<int> minimumWeightPositions(int K, int nPCwm) const;
};

}  // namespace Orvalis_NR
