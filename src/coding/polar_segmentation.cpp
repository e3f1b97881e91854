#include "coding/polar_segmentation.h"

#include <algorithm>

#include "coding/crc.h"

namespace Orvalis_NR {

bool CodeBlockSegmentationPolar::Init(int segmented, CRC_LengthEnumList crc) {
    Segments = segmented == 1 ? 2 : 1;
    CrcType = crc;
    CrcLength = ::CrcLength(crc);  // 16, 11, 6 for CRC_16, CRC_11, CRC_6; 24 otherwise
    return true;
}

bool CodeBlockSegmentationPolar::Go(BitSequence a, std::vector<BitSequence>& blocks) {
    blocks.clear();
    if (a.empty()) {
        ErrorMessage = "The input size of CodeBlockSegmentationPolar is wrong! ";
        return false;
    }
    const int A = static_cast<int>(a.size());
    SegmentLength = (A + Segments - 1) / Segments;

    // The payload at the end of Segments * K' zeros: a filler bit leads the first block.
    BitSequence padded(static_cast<std::size_t>(SegmentLength * Segments), 0);
    std::copy(a.begin(), a.end(), padded.end() - A);

    BitSequence crc(static_cast<std::size_t>(CrcLength));
    for (int r = 0; r < Segments; ++r) {
        const auto first = padded.begin() + static_cast<std::ptrdiff_t>(r) * SegmentLength;
        BitSequence block(first, first + SegmentLength);
        if (!NR_CRC(CrcType, SegmentLength, block, crc)) {
            ErrorMessage = "CRC fail";
            return false;
        }
        block.insert(block.end(), crc.begin(), crc.end());
        blocks.push_back(std::move(block));
    }
    return true;
}

}  // namespace Orvalis_NR
