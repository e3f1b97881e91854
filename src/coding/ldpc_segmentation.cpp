#include "coding/ldpc_segmentation.h"

#include <algorithm>
#include <climits>
#include <string>

#include "coding/crc.h"
#include "coding/ldpc_tables.h"
#include "common/failure.h"

namespace Orvalis_NR {
namespace {

std::vector<int> allLiftingSizes() {
    std::vector<int> sizes;
    for (const auto& set : LiftingSizeSets) sizes.insert(sizes.end(), set.begin(), set.end());
    std::sort(sizes.begin(), sizes.end());
    return sizes;
}

constexpr char kFillerByte = static_cast<char>(254);

}  // namespace

CodeBlockSegmentationLDPC::CodeBlockSegmentationLDPC() : Lifting(allLiftingSizes()) {}

bool CodeBlockSegmentationLDPC::Init(LDPC_BaseGraphTypeEnumList baseGraph, int B) {
    if (B < 0) failWith("The transport block for LDPC segmentation has a negative size.", "B " + std::to_string(B));
    const bool graph1 = baseGraph == LDPC_BG1;
    const int kcb = graph1 ? 8448 : 3840;
    // Counted in 64 bits: near INT_MAX the block count and B' = B + 24 C pass int.
    const long long blocks = B > kcb ? (B + (kcb - 24LL) - 1) / (kcb - 24LL) : 1;
    const long long withCrc = B + (B > kcb ? 24 * blocks : 0);
    const long long ceilBits = (withCrc + blocks - 1) / blocks;
    const int kb = graph1 ? 22 : B > 640 ? 10 : B > 560 ? 9 : B > 192 ? 8 : 6;
    const long long minimum = (ceilBits + kb - 1) / kb;
    const auto z = std::find_if(Lifting.begin(), Lifting.end(), [&](int v) { return v >= minimum; });
    // Every code block is encoded to N = 66 Z or 50 Z bits, and the channels count all of them
    // in int: a transport block whose encoded blocks pass 2^31 bits cannot be coded.
    const long long liftingSize = z == Lifting.end() ? Lifting.back() : *z;
    if (blocks * (graph1 ? 66 : 50) * liftingSize > INT_MAX)
        failWith("The transport block is too large for LDPC coding: its encoded code blocks would pass 2^31 bits.",
                 "B " + std::to_string(B));

    BaseGraph = baseGraph;
    InputBits = B;
    Kcb = kcb;
    CrcPerBlock = B > kcb ? 24 : 0;
    Blocks = static_cast<int>(blocks);
    BitsWithCrc = static_cast<int>(withCrc);
    CeilBlockBits = static_cast<int>(ceilBits);
    FloorBlockBits = static_cast<int>(withCrc / blocks);
    Kb = kb;
    if (z == Lifting.end()) {
        BlockBits.clear();
        FillerBits.clear();
        return false;
    }
    Z = *z;
    K = (graph1 ? 22 : 10) * Z;

    // B' - B is a multiple of C, so B mod C blocks take the larger share.
    BlockBits.assign(static_cast<std::size_t>(Blocks), 0);
    FillerBits.assign(static_cast<std::size_t>(Blocks), 0);
    for (int r = 0; r < Blocks; ++r) {
        BlockBits[r] = r < B % Blocks ? CeilBlockBits : FloorBlockBits;
        FillerBits[r] = K - BlockBits[r];
    }
    return true;
}

bool CodeBlockSegmentationLDPC::Go(BitSequence in, std::vector<BitSequence>& blocks) {
    if (in.size() != static_cast<std::size_t>(InputBits)) {
        ErrorMessage = "The input size of CodeBlockSegmentationLDPC is wrong! ";
        return false;
    }
    if (BlockBits.size() != static_cast<std::size_t>(Blocks) || Blocks < 1)
        failWith("LDPC segmentation was run without a successful set-up.", "B " + std::to_string(InputBits));
    blocks.resize(static_cast<std::size_t>(Blocks));
    BitSequence crc(24, 0);
    std::size_t next = 0;
    for (int r = 0; r < Blocks; ++r) {
        BitSequence& block = blocks[r];
        block.assign(static_cast<std::size_t>(K), kFillerByte);
        const int payload = BlockBits[r] - CrcPerBlock;
        std::copy_n(in.begin() + static_cast<std::ptrdiff_t>(next), payload, block.begin());
        next += static_cast<std::size_t>(payload);
        if (Blocks > 1) {
            NR_CRC(CRC_24B, payload, block, crc);
            std::copy(crc.begin(), crc.end(), block.begin() + payload);
        }
    }
    return true;
}

}  // namespace Orvalis_NR
