#pragma once
// LDPC encoder of TS 38.212 clause 5.3.2 for one code block geometry (base graph, Z).

#include <cstdint>
#include <vector>

#include "coding/ldpc_packed_encoder.h"

namespace Orvalis_NR {

class LDPC_Encoder {
public:
    std::vector<int> InfoBits;   // K input bits of the argument-free Run
    std::vector<int> CodedBits;  // N output bits of the argument-free Run
    std::vector<std::vector<int>> ParityRows;  // row lists of LdpcParityMatrix::GetNRMatrix
    int N = 0;         // 66 Z (base graph 1) or 50 Z (base graph 2)
    int K = 0;         // 22 Z or 10 Z
    int M = 0;         // parity rows: 2 Z + N - K
    int Z = 0;         // lifting size
    int SetIndex = 0;  // one-based lifting set index (iLS + 1)
    int BaseGraph = 0; // 0 for base graph 1, 1 for base graph 2

    /// baseGraph: 0 or 1 (false above 1); z: a lifting size of TS 38.212 Table 5.3.2-1.
    /// Builds the row lists and the packed plan; a set-up cost, once per geometry.
    bool Initialize(int baseGraph, int z);

    /// Encodes in (K ints: 0, 1, -2 for a filler) to out (N ints, the d sequence: the code
    /// word without its first 2Z systematic bits, fillers as -2). Fillers in `in` from
    /// position 2Z on are set to 0. False when the sizes differ from K and N.
    bool Run(std::vector<int>& in, std::vector<int>& out);

    /// Encodes packed bits: `in` K bits, fillers cleared to 0 and none among the first 2Z;
    /// `out` (words for N bits) the d sequence with fillers as 0. The same bits as Run gives
    /// for 0/1 inputs, fillers aside.
    void RunPacked(const std::uint64_t* in, std::uint64_t* out);

    /// Run over InfoBits and CodedBits.
    bool Run();

    /// Run with a chosen kernel; the packed kernels hand inputs they do not take to the list
    /// form. Throws std::invalid_argument for a kernel this CPU lacks.
    bool RunWith(LdpcKernel kernel, std::vector<int>& in, std::vector<int>& out);

private:
    LdpcPackedEncoder Packed;
    std::vector<int> Work;  // N + 2Z ints of the list form
    bool runList(std::vector<int>& in, std::vector<int>& out);
};

}  // namespace Orvalis_NR
