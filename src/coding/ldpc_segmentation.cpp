#include "coding/ldpc_segmentation.h"

#include <algorithm>
#include <stdexcept>
#include <string>

#include "coding/crc.h"
#include "coding/ldpc_tables.h"

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
    if (B < 0) {
        throw std::invalid_argument("CodeBlockSegmentationLDPC::Init: B must not be negative, got " +
                                    std::to_string(B));
    }
    const bool graph1 = baseGraph == LDPC_BG1;
    BaseGraph = baseGraph;
    InputBits = B;
    Kcb = graph1 ? 8448 : 3840;
    if (B > Kcb) {
        CrcPerBlock = 24;
        Blocks = (B + (Kcb - 24) - 1) / (Kcb - 24);
        BitsWithCrc = B + 24 * Blocks;
    } else {
        CrcPerBlock = 0;
        Blocks = 1;
        BitsWithCrc = B;
    }
    CeilBlockBits = (BitsWithCrc + Blocks - 1) / Blocks;
    FloorBlockBits = BitsWithCrc / Blocks;

    if (graph1) {
        Kb = 22;
    } else {
        Kb = B > 640 ? 10 : B > 560 ? 9 : B > 192 ? 8 : 6;
    }
    const int minimum = (CeilBlockBits + Kb - 1) / Kb;
    const auto z = std::find_if(Lifting.begin(), Lifting.end(), [&](int v) { return v >= minimum; });
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
    if (BlockBits.size() != static_cast<std::size_t>(Blocks)) {
        throw std::logic_error("CodeBlockSegmentationLDPC::Go without a successful Init");
    }
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
