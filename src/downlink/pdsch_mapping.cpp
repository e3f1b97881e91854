// PDSCH mapping to resource elements (TS 38.211 clause 7.3.1.5) with its DM-RS (clause
// 7.4.1.1.2) and PT-RS (clause 7.4.1.2.2), one store row per antenna port. What an earlier
// channel holds in the occupancy grid is respected RE by RE.

#include <algorithm>

#include "downlink/pdsch_generator.h"

namespace Orvalis_NR {

namespace {

constexpr int kData = 7;
constexpr int kDmrs = 113;
constexpr int kPtrs = 219;
constexpr int kCdmReserved = 420;

bool isSsb(int o) {
    const int v = o - 370;
    return v == 0 || v == 10 || v == 20 || v == 30 || v == 40;
}

bool freeOrReserved(int o) { return o == 0 || o == kCdmReserved; }

/// The resource element's DM-RS place for a port whose group starts at `offset`.
struct DmrsPlace {
    bool u1 = false, u2 = false;
    int m = 0;
};

DmrsPlace dmrsPlace(int j, int offset, int period, int second) {
    const int w = j - offset;
    DmrsPlace place;
    place.u1 = w % period == 0;
    place.u2 = (w - second) % period == 0;
    place.m = place.u2 ? (w - second) / period : place.u1 ? w / period : 0;
    return place;
}

}  // namespace

int PDSCH_Generator::portGroupOffset(int port) const {
    const int c = port / 2;
    return DmrsConfigType == 1 ? c % 2 : 2 * (c % 3);
}

bool PDSCH_Generator::readSlot(int entry, int frame, SlotPlace& place) const {
    if (entry < 0) return false;
    const int perFrame = 10 * SlotsPerSubframe;
    if (entry / perFrame != frame) return false;
    const int inFrame = entry % perFrame;
    place.frame = frame;
    place.subframe = inFrame / SlotsPerSubframe;
    place.slot = inFrame % SlotsPerSubframe;
    return true;
}

const std::vector<complex>* PDSCH_Generator::portLayer(int position) const {
    // With five layers or more the upper half of the positions reads the second code word;
    // position NumberOfLayers / 2 itself stays with the first.
    const SchCodeWord* cw = &CodeWords[0];
    int index = position;
    if (NumberOfLayers >= 5 && position > NumberOfLayers / 2 && CodeWords.size() > 1) {
        cw = &CodeWords[1];
        index = position - NumberOfLayers / 2;
    }
    if (index < 0 || index >= static_cast<int>(cw->Layers.size())) return nullptr;
    return &cw->Layers[static_cast<std::size_t>(index)];
}

bool PDSCH_Generator::Map(SlotGrid& grid, OccupancyGrid& occupancy, int frame, OccupancyGrid& symbolFlags,
                          bool firstChannel) {
    if (BundledPrecoding) return MapWithPrecoding(grid, occupancy, frame, symbolFlags, firstChannel);
    const int period = DmrsConfigType == 1 ? 4 : 6;
    const int second = DmrsConfigType == 1 ? 2 : 1;
    const int perRb = DmrsConfigType == 1 ? 6 : 4;
    const std::size_t rows = std::min({grid.size(), occupancy.size(), symbolFlags.size(), PortArray.size()});
    const std::size_t width = static_cast<std::size_t>(GridWidth);

    for (int entry : SlotList) {
        if (CancelRequested.load(std::memory_order_relaxed)) break;
        SlotPlace place;
        if (!readSlot(entry, frame, place)) continue;
        Generate(place.frame, place.subframe, place.slot);
        const long long absoluteSlot = static_cast<long long>(entry);
        const bool slotHit = std::find(RmCoresetSlots.begin(), RmCoresetSlots.end(), absoluteSlot) != RmCoresetSlots.end();
        const int f = SymbolsPerSubframe * place.subframe + SymbolsPerSlot * place.slot;

        for (std::size_t a = 0; a < rows; ++a) {
            if (CancelRequested.load(std::memory_order_relaxed)) break;
            const int port = PortArray[a];
            if (port == -1) continue;
            const auto found = std::find(Ports.begin(), Ports.end(), port - 1000);
            if (found == Ports.end()) continue;
            const int x = static_cast<int>(found - Ports.begin());
            const std::vector<complex>* layer = portLayer(x);
            const int groupOffset = portGroupOffset(Ports[static_cast<std::size_t>(x)]);
            std::size_t read = 0;
            auto& values = grid[a];
            auto& occ = occupancy[a];
            auto& flags = symbolFlags[a];
            if (values.size() < static_cast<std::size_t>(f + SymbolsPerSlot) * width || occ.size() < values.size() ||
                flags.size() < static_cast<std::size_t>(f + SymbolsPerSlot))
                continue;

            int dmrsIndex = -1;
            for (int s = 0; s < SymbolsPerSlot; ++s) {
                if (CancelRequested.load(std::memory_order_relaxed)) break;
                const int cls = SymbolClass[static_cast<std::size_t>(s)];
                if (cls == 0) continue;
                flags[static_cast<std::size_t>(f + s)] |= firstChannel ? 3 : 1;
                const bool isDmrs = cls & 1;
                const bool isData = cls & 2;
                const bool isPtrs = cls & 4;
                if (isDmrs) ++dmrsIndex;
                const bool symbolHit = std::find(RmCoresetSymbols.begin(), RmCoresetSymbols.end(), s) != RmCoresetSymbols.end();
                const std::size_t line = static_cast<std::size_t>(f + s) * width;
                const std::vector<complex>* dmrs =
                    isDmrs && dmrsIndex < static_cast<int>(DmrsValues.size()) ? &DmrsValues[static_cast<std::size_t>(dmrsIndex)][static_cast<std::size_t>(x)] : nullptr;

                int rbCounter = 0;
                for (int n = AllocRbStart; n < AllocRbStart + AllocRbCount; ++n) {
                    if (!RbMask[static_cast<std::size_t>(n)]) continue;
                    const int p = VrbToPrb[static_cast<std::size_t>(n)];
                    if (patternHit(f + s, frame, p)) continue;
                    const int rbIndex = VrbMapped ? PrbIndex[static_cast<std::size_t>(p)] : rbCounter;
                    ++rbCounter;
                    if (RmCoreset && slotHit && symbolHit && coresetHit(p)) continue;
                    const bool ptrsRb = isPtrs && (rbIndex - PtrsRbOffset) % KPtrs == 0;
                    for (int j = 0; j < 12; ++j) {
                        int column = 12 * p + j + PointAOffset;
                        if (column < 0) column += GridWidth;
                        else if (column >= GridWidth) column -= GridWidth;
                        const std::size_t at = line + static_cast<std::size_t>(column);
                        if (isDmrs) {
                            const DmrsPlace place2 = dmrsPlace(j, groupOffset, period, second);
                            const int o = occ[at];
                            if (!place2.u1 && !place2.u2) {
                                if (CdmGroups >= 2)
                                    for (int g = 0; g < CdmGroups; ++g) {
                                        const int w = j - g * DmrsConfigType;
                                        if ((w % period == 0 || (w - second) % period == 0) && freeOrReserved(occ[at]))
                                            occ[at] = kCdmReserved;
                                    }
                            } else if (!isSsb(o)) {
                                if (freeOrReserved(o) && dmrs) {
                                    const std::size_t k = static_cast<std::size_t>((p - LowestPrb) * perRb + (place2.u1 ? 0 : 1) + 2 * place2.m);
                                    if (k < dmrs->size()) values[at] = (*dmrs)[k] * DmrsAmplitude;
                                }
                                occ[at] = kDmrs;
                            }
                        }
                        if (ptrsRb) {
                            for (int e : PtrsPortList) {
                                if ((j - PtrsReInRb[static_cast<std::size_t>(e)]) % 12 != 0) continue;
                                if (!freeOrReserved(occ[at])) continue;
                                const std::size_t i = static_cast<std::size_t>((p - LowestPrb) * PtrsPerRb +
                                                                               2 * PtrsCombIndex[static_cast<std::size_t>(e)] +
                                                                               PtrsPhaseIndex[static_cast<std::size_t>(e)]);
                                if ((e == port - 1000 || PtrsMapAll) && i < PtrsBase.size()) values[at] = PtrsBase[i] * PtrsAmplitude;
                                occ[at] = kPtrs;
                            }
                        }
                        if (isData) {
                            const int o = occ[at];
                            if (o == 0) {
                                if (layer && read < layer->size()) values[at] = (*layer)[read++] * DataAmplitude;
                                occ[at] = kData;
                            } else if (o != kDmrs && o != kPtrs && o != kCdmReserved && !isSsb(o)) {
                                occ[at] = kData;
                            }
                        }
                    }
                }
            }
        }
    }
    CancelRequested.store(0, std::memory_order_relaxed);
    return true;
}

bool PDSCH_Generator::MapWithPrecoding(SlotGrid& grid, OccupancyGrid& occupancy, int frame, OccupancyGrid& symbolFlags,
                                       bool firstChannel) {
    const int period = DmrsConfigType == 1 ? 4 : 6;
    const int second = DmrsConfigType == 1 ? 2 : 1;
    const int perRb = DmrsConfigType == 1 ? 6 : 4;
    const std::size_t width = static_cast<std::size_t>(GridWidth);
    const int ports = static_cast<int>(Ports.size());
    // Store rows that carry a port of this channel, and the layer of each port position.
    std::vector<std::size_t>& rows = layerPositionsRows_;
    rows.clear();
    const std::size_t limit = std::min({grid.size(), occupancy.size(), symbolFlags.size(), PortArray.size()});
    for (std::size_t a = 0; a < limit; ++a)
        if (PortArray[a] != -1 && std::find(Ports.begin(), Ports.end(), PortArray[a] - 1000) != Ports.end()) rows.push_back(a);
    layers_.assign(static_cast<std::size_t>(ports), nullptr);
    for (int x = 0; x < ports; ++x) layers_[static_cast<std::size_t>(x)] = portLayer(x);

    for (int entry : SlotList) {
        if (CancelRequested.load(std::memory_order_relaxed)) break;
        SlotPlace place;
        if (!readSlot(entry, frame, place)) continue;
        Generate(place.frame, place.subframe, place.slot);
        const bool slotHit = std::find(RmCoresetSlots.begin(), RmCoresetSlots.end(), entry) != RmCoresetSlots.end();
        const int f = SymbolsPerSubframe * place.subframe + SymbolsPerSlot * place.slot;
        bool fits = true;
        for (std::size_t a : rows)
            if (grid[a].size() < static_cast<std::size_t>(f + SymbolsPerSlot) * width || occupancy[a].size() < grid[a].size() ||
                symbolFlags[a].size() < static_cast<std::size_t>(f + SymbolsPerSlot))
                fits = false;
        if (!fits) continue;
        std::size_t read = 0;
        int dmrsIndex = -1;
        for (int s = 0; s < SymbolsPerSlot; ++s) {
            if (CancelRequested.load(std::memory_order_relaxed)) break;
            const int cls = SymbolClass[static_cast<std::size_t>(s)];
            if (cls == 0) continue;
            for (std::size_t a : rows) symbolFlags[a][static_cast<std::size_t>(f + s)] |= firstChannel ? 3 : 1;
            const bool isDmrs = cls & 1, isData = cls & 2, isPtrs = cls & 4;
            if (isDmrs) ++dmrsIndex;
            const bool symbolHit = std::find(RmCoresetSymbols.begin(), RmCoresetSymbols.end(), s) != RmCoresetSymbols.end();
            const std::size_t line = static_cast<std::size_t>(f + s) * width;
            int rbCounter = 0;
            for (int n = AllocRbStart; n < AllocRbStart + AllocRbCount; ++n) {
                if (!RbMask[static_cast<std::size_t>(n)]) continue;
                const int p = VrbToPrb[static_cast<std::size_t>(n)];
                if (patternHit(f + s, frame, p)) continue;
                const int rbIndex = VrbMapped ? PrbIndex[static_cast<std::size_t>(p)] : rbCounter;
                ++rbCounter;
                if (RmCoreset && slotHit && symbolHit && coresetHit(p)) continue;
                CalculatePrecodingMatrix(p);
                const bool ptrsRb = isPtrs && (rbIndex - PtrsRbOffset) % KPtrs == 0;
                for (int j = 0; j < 12; ++j) {
                    int column = 12 * p + j + PointAOffset;
                    if (column < 0) column += GridWidth;
                    else if (column >= GridWidth) column -= GridWidth;
                    const std::size_t at = line + static_cast<std::size_t>(column);
                    bool took = false;
                    for (std::size_t r = 0; r < rows.size(); ++r) {
                        const std::size_t a = rows[r];
                        auto& occ = occupancy[a][at];
                        auto& value = grid[a][at];
                        const int row = static_cast<int>(r) < PrecodingMatrix.rows() ? static_cast<int>(r) : -1;
                        if (isDmrs) {
                            bool covered = false;
                            complex sum{};
                            for (int x = 0; x < ports; ++x) {
                                const DmrsPlace pl = dmrsPlace(j, portGroupOffset(Ports[static_cast<std::size_t>(x)]), period, second);
                                if (!pl.u1 && !pl.u2) continue;
                                covered = true;
                                const auto& seq = DmrsValues[static_cast<std::size_t>(dmrsIndex)][static_cast<std::size_t>(x)];
                                const std::size_t k = static_cast<std::size_t>((p - LowestPrb) * perRb + (pl.u1 ? 0 : 1) + 2 * pl.m);
                                if (row >= 0 && k < seq.size() && x < PrecodingMatrix.columns()) sum += PrecodingMatrix(row, x) * seq[k];
                            }
                            if (!covered) {
                                if (CdmGroups >= 2)
                                    for (int g = 0; g < CdmGroups; ++g) {
                                        const int w = j - g * DmrsConfigType;
                                        if ((w % period == 0 || (w - second) % period == 0) && occ == 0) occ = kCdmReserved;
                                    }
                            } else if (!isSsb(occ)) {
                                if (occ == 0) value = sum * DmrsAmplitude;
                                occ = kDmrs;
                            }
                        }
                        if (ptrsRb) {
                            for (int e : PtrsPortList) {
                                if ((j - PtrsReInRb[static_cast<std::size_t>(e)]) % 12 != 0 || !freeOrReserved(occ)) continue;
                                const std::size_t i = static_cast<std::size_t>((p - LowestPrb) * PtrsPerRb +
                                                                               2 * PtrsCombIndex[static_cast<std::size_t>(e)] +
                                                                               PtrsPhaseIndex[static_cast<std::size_t>(e)]);
                                if ((e == PortArray[a] - 1000 || PtrsMapAll) && i < PtrsBase.size()) value = PtrsBase[i] * PtrsAmplitude;
                                occ = kPtrs;
                            }
                        }
                        if (isData) {
                            if (occ == 0) {
                                complex sum{};
                                for (int x = 0; x < ports && row >= 0 && x < PrecodingMatrix.columns(); ++x) {
                                    const auto* layer = layers_[static_cast<std::size_t>(x)];
                                    if (layer && read < layer->size()) sum += PrecodingMatrix(row, x) * (*layer)[read];
                                }
                                value = sum * DataAmplitude;
                                occ = kData;
                                took = true;
                            } else if (occ != kDmrs && occ != kPtrs && occ != kCdmReserved && !isSsb(occ)) {
                                occ = kData;
                            }
                        }
                    }
                    if (took) ++read;
                }
            }
        }
    }
    CancelRequested.store(0, std::memory_order_relaxed);
    return true;
}

}  // namespace Orvalis_NR
