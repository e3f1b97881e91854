#pragma once
// LDPC code block segmentation and code block CRC attachment, TS 38.212 clause 5.2.2.

#include <string>
#include <vector>

#include "coding/coding_types.h"

namespace Orvalis_NR {

class CodeBlockSegmentationLDPC {
public:
    std::string ErrorMessage;
    int InputBits = 0;       // B: transport block with its CRC
    int CrcPerBlock = 0;     // L: 24 when the block is split, else 0
    int Blocks = 0;          // C
    int BitsWithCrc = 0;     // B' = B + C L
    int CeilBlockBits = 0;   // ceil(B' / C)
    int FloorBlockBits = 0;  // floor(B' / C)
    int Kb = 0;              // information columns used for the choice of Z
    int Z = 0;               // lifting size
    int K = 0;               // code block length: 22 Z or 10 Z
    std::vector<int> FillerBits;  // per block: K minus its bits
    int Kcb = 0;                  // largest code block: 8448 or 3840
    std::vector<int> BlockBits;   // per block: bits with code block CRC
    LDPC_BaseGraphTypeEnumList BaseGraph = LDPC_BG1;
    std::vector<int> Lifting;  // all 51 lifting sizes of TS 38.212 Table 5.3.2-1, ascending

    CodeBlockSegmentationLDPC();

    /// Works out the segmentation of B bits (B >= 0) for the base graph. False when no
    /// lifting size is large enough.
    bool Init(LDPC_BaseGraphTypeEnumList baseGraph, int B);

    /// Splits `in` (B bits) into Blocks code blocks of K elements: the block's bits, its
    /// CRC24B when Blocks > 1, then fillers as the byte 254 (-2 as a signed char).
    bool Go(BitSequence in, std::vector<BitSequence>& blocks);
};

}  // namespace Orvalis_NR
