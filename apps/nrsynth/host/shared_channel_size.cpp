#include "host/shared_channel_size.h"

#include <optional>

#include "host/transport_block.h"
#include "tables/mcs_tables.h"
#include "tables/pdsch_tables.h"

namespace nrsynth_host {

using namespace Models::Nr5g;

namespace {

/// What a shared channel's size depends on, read from either link's model.
struct Allocation {
    McsTable table = McsTable::Table51311;
    int mcs = 0;
    bool pi2Bpsk = false;
    int resourceBlocks = 0;
    int firstSymbol = 0;
    int lastSymbol = 0;
    bool mappingTypeB = false;
    bool doubleSymbolDmrs = false;
    int additionalPositions = 0;
    int dmrsPerSymbol = 0;  // REs per PRB of one DM-RS symbol that carry no data
    int overhead = 0;
    int layers = 1;
    double scaling = 1.0;
};

/// DM-RS symbols of the slot from a position table laid out [l_d][type A pos0..3, type B pos0..3].
template <typename Table>
std::optional<int> dmrsSymbolCount(const Table& table, const Allocation& a) {
    const int duration = a.mappingTypeB ? a.lastSymbol - a.firstSymbol + 1 : a.lastSymbol + 1;
    if (duration < 0 || duration > 14 || a.additionalPositions < 0 || a.additionalPositions > 3) return std::nullopt;
    const auto& cell = table[static_cast<std::size_t>(duration)][static_cast<std::size_t>((a.mappingTypeB ? 4 : 0) + a.additionalPositions)];
    if (cell[0] == 0) return std::nullopt;
    int positions = 1;
    for (int i = 1; i < 4; ++i) positions += cell[static_cast<std::size_t>(i)] >= 0 ? 1 : 0;
    return positions * (a.doubleSymbolDmrs ? 2 : 1);
}

ModulationType modulationOfOrder(int order) {
    switch (order) {
        case 1: return ModulationType::BPSK;
        case 4: return ModulationType::QAM16;
        case 6: return ModulationType::QAM64;
        case 8: return ModulationType::QAM256;
        case 10: return ModulationType::QAM1024;
        default: return ModulationType::QPSK;
    }
}

template <typename Table>
SharedChannelSize sizeOf(const Allocation& a, const Table& dmrsTable, const char* dmrsTableName) {
    SharedChannelSize size;
    const auto entry = mcsEntry(a.table, a.mcs, a.pi2Bpsk);
    if (!entry) {
        size.reason = "MCS " + std::to_string(a.mcs) + " is reserved or outside 0..31 in its MCSTable";
        return size;
    }
    const auto dmrsSymbols = dmrsSymbolCount(dmrsTable, a);
    if (!dmrsSymbols) {
        size.reason = std::string("TS 38.211 ") + dmrsTableName + " has no DM-RS positions for symbols " +
                      std::to_string(a.firstSymbol) + " to " + std::to_string(a.lastSymbol) + " with DMRSaddpos " +
                      std::to_string(a.additionalPositions);
        return size;
    }
    if (a.resourceBlocks < 1) {
        size.reason = "the allocation holds no resource block";
        return size;
    }
    TransportBlockInput input;
    input.resourceBlocks = a.resourceBlocks;
    input.symbols = a.lastSymbol - a.firstSymbol + 1;
    input.dmrsPerPrb = *dmrsSymbols * a.dmrsPerSymbol;
    input.overheadPerPrb = a.overhead;
    input.layers = a.layers;
    input.scaling = a.scaling;
    input.mcs = *entry;
    size.transportBlockSize = transportBlockSize(input);
    if (size.transportBlockSize <= 0) {
        size.reason = "the allocation leaves no resource element for data";
        return size;
    }
    size.valid = true;
    size.modulation = modulationOfOrder(entry->modulationOrder);
    size.codeRate = entry->rateX1024 / 1024.0;
    return size;
}

int dmrsPerSymbol(DMRSConfigurationType type, int cdmGroupsWithoutData) {
    return (type == DMRSConfigurationType::Type1 ? 6 : 4) * cdmGroupsWithoutData;
}

/// The fields both links name alike. False when allocation type 0 has no bandwidth part.
template <typename Channel, typename Bwp>
bool readCommon(const Channel& channel, const Bwp* bwp, Allocation& a) {
    a.mcs = channel.MCS->getValue();
    const bool type0 = channel.RAType->getValue() == RAType::RAType0;
    if (type0 && !bwp) return false;
    a.resourceBlocks = allocatedResourceBlocks(type0, channel.RBNumber->getValue(), channel.RBGSize->getValue(),
                                               channel.RBGBitmap->getValue(), bwp ? bwp->RBOffset->getValue() : 0,
                                               bwp ? bwp->RBNumber->getValue() : 0);
    a.firstSymbol = channel.FirstSymbol->getValue();
    a.lastSymbol = channel.LastSymbol->getValue();
    a.doubleSymbolDmrs = channel.DMRSDuration->getValue() == DMRSDuration::DoubleSymbol;
    a.additionalPositions = channel.DMRSaddpos->getValue();
    a.dmrsPerSymbol = dmrsPerSymbol(channel.DMRSConfigurationType->getValue(), channel.NumberOfDMRSCDMGroup->getValue());
    a.overhead = channel.XOverhead->getValue();
    return true;
}

constexpr const char* kNoBwpForType0 = "allocation type 0 needs the bandwidth part BWPIndex names";

}  // namespace

int allocatedResourceBlocks(bool type0, int rbNumber, int rbgSize, const std::string& bitmap, int bwpStart, int bwpSize) {
    if (!type0) return rbNumber;
    if (rbgSize < 1 || bwpSize < 1 || bwpStart < 0) return 0;
    const int firstGroup = rbgSize - bwpStart % rbgSize;
    const int groups = (bwpSize + bwpStart % rbgSize + rbgSize - 1) / rbgSize;
    const int lastGroup = (bwpStart + bwpSize) % rbgSize == 0 ? rbgSize : (bwpStart + bwpSize) % rbgSize;
    int blocks = 0;
    for (int g = 0; g < groups && g < static_cast<int>(bitmap.size()); ++g) {
        if (bitmap[static_cast<std::size_t>(g)] != '1') continue;
        blocks += g == 0 ? std::min(firstGroup, bwpSize) : g == groups - 1 ? lastGroup : rbgSize;
    }
    return blocks;
}

SharedChannelSize downlinkSharedChannelSize(const NRDLSCH& channel, const NRDLBWP* bwp) {
    Allocation a;
    static constexpr McsTable kTables[] = {McsTable::Table51311, McsTable::Table51312, McsTable::Table51313};
    const int table = static_cast<int>(channel.MCSTable->getValue());
    a.table = table >= 0 && table < 3 ? kTables[table] : McsTable::Table51311;
    if (!readCommon(channel, bwp, a)) return {false, kNoBwpForType0};
    a.mappingTypeB = channel.PDSCHMappingType->getValue() == PDSCHMappingType::B;
    const int layers = channel.NumberOfLayers->getValue();
    a.layers = channel.NumberOfCodewords->getValue() == 2 ? layers / 2 : layers;
    a.scaling = channel.TBScalingFactor->getValue();
    const auto& positions = a.doubleSymbolDmrs ? Orvalis_NR::tables::kPdschDmrsPositionsDouble
                                               : Orvalis_NR::tables::kPdschDmrsPositionsSingle;
    return sizeOf(a, positions, a.doubleSymbolDmrs ? "Table 7.4.1.1.2-4" : "Table 7.4.1.1.2-3");
}

SharedChannelSize uplinkSharedChannelSize(const NRULSCH& channel, const NRULBWP* bwp, bool pi2Bpsk) {
    Allocation a;
    static constexpr McsTable kTables[] = {McsTable::Table51311, McsTable::Table51312, McsTable::Table61411,
                                           McsTable::Table51313, McsTable::Table61412};
    const int table = static_cast<int>(channel.MCSTable->getValue());
    a.table = table >= 0 && table < 5 ? kTables[table] : McsTable::Table51311;
    if (!readCommon(channel, bwp, a)) return {false, kNoBwpForType0};
    a.pi2Bpsk = pi2Bpsk;
    a.mappingTypeB = channel.PUSCHMappingType->getValue() == PUSCHMappingType::B;
    // With transform precoding a DM-RS symbol carries no data at all (TS 38.211 clause 6.4.1.1.3).
    if (channel.TransformPrecoding->getValue()) a.dmrsPerSymbol = 12;
    a.layers = channel.NumberOfLayers->getValue();
    const auto& positions = a.doubleSymbolDmrs ? Orvalis_NR::tables::kPuschDmrsPositionsDouble
                                               : Orvalis_NR::tables::kPuschDmrsPositionsSingle;
    return sizeOf(a, positions, a.doubleSymbolDmrs ? "Table 6.4.1.1.3-4" : "Table 6.4.1.1.3-3");
}

}  // namespace nrsynth_host
