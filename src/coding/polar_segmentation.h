#pragma once
// Code block segmentation and CRC attachment of polar-coded UCI, TS 38.212 clauses 5.2.1 and
// 6.3.1.2.1.

#include <string>
#include <vector>

#include "coding/coding_types.h"

namespace Orvalis_NR {

class CodeBlockSegmentationPolar {
  public:
    std::string ErrorMessage;
    int CrcLength = 24;     ///< L of CrcType
    int Segments = 1;       ///< 1 or 2
    int SegmentLength = 0;  ///< K' = ceil(A / Segments), the bits of a block before its CRC
    CRC_LengthEnumList CrcType = CRC_24A;

    /// segmented: 1 splits the payload into two blocks; crc: the check attached to each block
    /// (CRC_11 or CRC_6 for UCI). Always true.
    bool Init(int segmented, CRC_LengthEnumList crc);

    /// Splits a into Segments blocks of K' bits (zeros lead the first block when A is not a
    /// multiple of Segments) and appends the check to each. False for an empty payload.
    bool Go(BitSequence a, std::vector<BitSequence>& blocks);
};

}  // namespace Orvalis_NR
