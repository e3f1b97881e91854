// PDSCH mapping to resource elements (TS 38.211 clause 7.3.1.5) with its DM-RS (clause
// 7.4.1.1.2) and PT-RS (clause 7.4.1.2.2), one store row per antenna port. What an earlier
// channel holds in the occupancy grid is respected RE by RE.

#include <algorithm>
#include <array>

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
    walkAllocation(grid, occupancy, frame, symbolFlags, firstChannel, false);
    return true;
}

bool PDSCH_Generator::MapWithPrecoding(SlotGrid& grid, OccupancyGrid& occupancy, int frame, OccupancyGrid& symbolFlags,
                                       bool firstChannel) {
    walkAllocation(grid, occupancy, frame, symbolFlags, firstChannel, true);
    return true;
}

void PDSCH_Generator::walkAllocation(SlotGrid& grid, OccupancyGrid& occupancy, int frame, OccupancyGrid& symbolFlags,
                                     bool firstChannel, bool precoded) {
    const std::size_t width = static_cast<std::size_t>(GridWidth);
    // Store rows that carry a port of this channel, with the port's position and layer.
    rows_.clear();
    const std::size_t limit = std::min({grid.size(), occupancy.size(), symbolFlags.size(), PortArray.size()});
    for (std::size_t a = 0; a < limit; ++a) {
        if (PortArray[a] == -1) continue;
        const auto found = std::find(Ports.begin(), Ports.end(), PortArray[a] - 1000);
        if (found == Ports.end()) continue;
        MappedRow row;
        row.store = a;
        row.position = static_cast<int>(found - Ports.begin());
        row.port = PortArray[a] - 1000;
        row.groupOffset = portGroupOffset(*found);
        rows_.push_back(row);
    }
    layers_.assign(Ports.size(), nullptr);
    for (std::size_t x = 0; x < Ports.size(); ++x) layers_[x] = portLayer(static_cast<int>(x));

    // Store index of each element of an RB, and whether they lie side by side.
    auto rbElements = [this](std::size_t line, int prb, std::array<std::size_t, 12>& at) {
        for (int j = 0; j < 12; ++j) {
            int column = 12 * prb + j + PointAOffset;
            if (column < 0) column += GridWidth;
            else if (column >= GridWidth) column -= GridWidth;
            at[static_cast<std::size_t>(j)] = line + static_cast<std::size_t>(column);
        }
        return at[11] == at[0] + 11;
    };

    // One RB of a data-only symbol without precoding: the rules of mapElement, with a whole-RB
    // copy where no earlier channel holds any of its elements.
    auto mapPlainDataRb = [this, &rbElements](std::size_t line, int prb) {
        std::array<std::size_t, 12> at{};
        const bool contiguous = rbElements(line, prb, at);
        for (auto& row : rows_) {
            const auto* layer = layers_[static_cast<std::size_t>(row.position)];
            const std::size_t available = layer ? layer->size() : 0;
            if (contiguous && row.read + 12 <= available) {
                int* o = row.occupancy + at[0];
                int taken = 0;
                for (int j = 0; j < 12; ++j) taken |= o[j];
                if (taken == 0) {  // the common case: nothing else in this RB
                    complex* v = row.values + at[0];
                    const complex* from = layer->data() + row.read;
                    for (int j = 0; j < 12; ++j) {
                        v[j] = from[j] * DataAmplitude;
                        o[j] = kData;
                    }
                    row.read += 12;
                    continue;
                }
            }
            for (std::size_t j = 0; j < 12; ++j) {
                int& o = row.occupancy[at[j]];
                if (o == 0) {
                    if (row.read < available) row.values[at[j]] = (*layer)[row.read++] * DataAmplitude;
                    o = kData;
                } else if (o != kDmrs && o != kPtrs && o != kCdmReserved && !isSsb(o)) {
                    o = kData;
                }
            }
        }
    };

    // One RB of a DM-RS symbol without precoding and without PT-RS: where no earlier channel
    // holds any of a row's elements, the row's pattern for the symbol (rowPattern) places DM-RS,
    // CDM-reserved and data elements; otherwise mapElement's rules go element by element.
    auto mapDmrsRb = [this, &rbElements](std::size_t line, ElementPlace& e) {
        std::array<std::size_t, 12> at{};
        const bool contiguous = rbElements(line, e.prb, at);
        const int perRb = DmrsConfigType == 1 ? 6 : 4;
        const long long base = static_cast<long long>(e.prb - LowestPrb) * perRb;
        for (std::size_t r = 0; r < rows_.size(); ++r) {
            MappedRow& row = rows_[r];
            int* o = row.occupancy + at[0];
            int taken = 0;
            if (contiguous)
                for (int j = 0; j < 12; ++j) taken |= o[j];
            if (!contiguous || taken != 0) {
                for (int j = 0; j < 12; ++j) {
                    e.at = at[static_cast<std::size_t>(j)];
                    e.re = j;
                    mapElementRow(e, r, false);
                }
                continue;
            }
            const std::vector<complex>* sequence = nullptr;
            if (e.dmrsIndex >= 0) {
                const auto& symbol = DmrsValues[static_cast<std::size_t>(e.dmrsIndex)];
                if (static_cast<std::size_t>(row.position) < symbol.size()) sequence = &symbol[static_cast<std::size_t>(row.position)];
            }
            const auto* layer = layers_[static_cast<std::size_t>(row.position)];
            const std::size_t available = layer ? layer->size() : 0;
            complex* v = row.values + at[0];
            for (int j = 0; j < 12; ++j) {
                const int action = row.pattern[static_cast<std::size_t>(j)];
                if (action >= 0) {
                    const long long k = base + action;
                    if (sequence && k >= 0 && k < static_cast<long long>(sequence->size()))
                        v[j] = (*sequence)[static_cast<std::size_t>(k)] * DmrsAmplitude;
                    o[j] = kDmrs;
                } else if (action == kPatternData) {
                    if (row.read < available) v[j] = (*layer)[row.read++] * DataAmplitude;
                    o[j] = kData;
                } else if (action == kPatternReserved) {
                    o[j] = kCdmReserved;
                }
            }
        }
    };

    for (int entry : SlotList) {
        if (CancelRequested.load(std::memory_order_relaxed)) break;
        SlotPlace place;
        if (!readSlot(entry, frame, place)) continue;
        Generate(place.frame, place.subframe, place.slot);
        const bool slotHit = std::find(RmCoresetSlots.begin(), RmCoresetSlots.end(), entry) != RmCoresetSlots.end();
        const int f = SymbolsPerSubframe * place.subframe + SymbolsPerSlot * place.slot;
        bool fits = true;
        for (const auto& row : rows_)
            if (grid[row.store].size() < static_cast<std::size_t>(f + SymbolsPerSlot) * width ||
                occupancy[row.store].size() < grid[row.store].size() ||
                symbolFlags[row.store].size() < static_cast<std::size_t>(f + SymbolsPerSlot))
                fits = false;
        if (!fits) continue;
        for (auto& row : rows_) {
            row.read = 0;
            row.values = grid[row.store].data();
            row.occupancy = occupancy[row.store].data();
        }
        commonRead_ = 0;

        ElementPlace e;
        int dmrsIndex = -1;
        for (int s = 0; s < SymbolsPerSlot; ++s) {
            if (CancelRequested.load(std::memory_order_relaxed)) break;
            const int cls = SymbolClass[static_cast<std::size_t>(s)];
            if (cls == 0) continue;
            for (const auto& row : rows_) symbolFlags[row.store][static_cast<std::size_t>(f + s)] |= firstChannel ? 3 : 1;
            e.isDmrs = cls & 1;
            e.isData = cls & 2;
            const bool isPtrs = cls & 4;
            if (e.isDmrs) ++dmrsIndex;
            e.dmrsIndex = dmrsIndex < static_cast<int>(DmrsValues.size()) ? dmrsIndex : -1;
            const bool symbolHit = std::find(RmCoresetSymbols.begin(), RmCoresetSymbols.end(), s) != RmCoresetSymbols.end();
            const std::size_t line = static_cast<std::size_t>(f + s) * width;
            // Data alone on an unprecoded symbol: each row takes its layer RB by RB.
            const bool plainData = !precoded && cls == 2;
            if (!precoded && e.isDmrs) setRowPatterns(e.isData);
            int rbCounter = 0;
            for (int n = AllocRbStart; n < AllocRbStart + AllocRbCount; ++n) {
                if (!RbMask[static_cast<std::size_t>(n)]) continue;
                const int p = VrbToPrb[static_cast<std::size_t>(n)];
                if (patternHit(f + s, frame, p)) continue;
                const int rbIndex = VrbMapped ? PrbIndex[static_cast<std::size_t>(p)] : rbCounter;
                ++rbCounter;
                if (RmCoreset && slotHit && symbolHit && coresetHit(p)) continue;
                if (precoded) CalculatePrecodingMatrix(p);
                if (plainData) {
                    mapPlainDataRb(line, p);
                    continue;
                }
                e.prb = p;
                e.ptrsRb = isPtrs && (rbIndex - PtrsRbOffset) % KPtrs == 0;
                if (!precoded && !e.ptrsRb) {
                    if (e.isDmrs) {
                        mapDmrsRb(line, e);
                        continue;
                    }
                    if (e.isData) {  // a PT-RS symbol's RB without PT-RS
                        mapPlainDataRb(line, p);
                        continue;
                    }
                }
                for (int j = 0; j < 12; ++j) {
                    int column = 12 * p + j + PointAOffset;
                    if (column < 0) column += GridWidth;
                    else if (column >= GridWidth) column -= GridWidth;
                    e.at = line + static_cast<std::size_t>(column);
                    e.re = j;
                    mapElement(e, precoded);
                }
            }
        }
    }
    CancelRequested.store(0, std::memory_order_relaxed);
}

void PDSCH_Generator::setRowPatterns(bool withData) {
    const int period = DmrsConfigType == 1 ? 4 : 6;
    const int second = DmrsConfigType == 1 ? 2 : 1;
    for (auto& row : rows_)
        for (int j = 0; j < 12; ++j) {
            auto& action = row.pattern[static_cast<std::size_t>(j)];
            const DmrsPlace place = dmrsPlace(j, row.groupOffset, period, second);
            if (place.u1 || place.u2) {
                action = static_cast<signed char>((place.u1 ? 0 : 1) + 2 * place.m);
                continue;
            }
            bool reserved = false;
            if (CdmGroups >= 2)
                for (int g = 0; g < CdmGroups; ++g) {
                    const int w = j - g * DmrsConfigType;
                    reserved = reserved || w % period == 0 || (w - second) % period == 0;
                }
            action = reserved ? kPatternReserved : withData ? kPatternData : kPatternNothing;
        }
}

inline void PDSCH_Generator::mapElement(const ElementPlace& e, bool precoded) {
    bool took = false;
    for (std::size_t r = 0; r < rows_.size(); ++r) took = mapElementRow(e, r, precoded) || took;
    if (precoded && took) ++commonRead_;
}

// One row's part of mapElement; true when the row took a data value.
inline bool PDSCH_Generator::mapElementRow(const ElementPlace& e, std::size_t r, bool precoded) {
    const int period = DmrsConfigType == 1 ? 4 : 6;
    const int second = DmrsConfigType == 1 ? 2 : 1;
    bool took = false;
    MappedRow& row = rows_[r];
    int& o = row.occupancy[e.at];
    complex& value = row.values[e.at];
    if (e.isDmrs) {
        // A precoded element carries every port whose CDM group covers it; otherwise the
        // row's own port decides.
        bool covered = false;
        if (precoded) {
            for (int p : Ports) {
                const DmrsPlace place = dmrsPlace(e.re, portGroupOffset(p), period, second);
                covered = covered || place.u1 || place.u2;
            }
        } else {
            const DmrsPlace place = dmrsPlace(e.re, row.groupOffset, period, second);
            covered = place.u1 || place.u2;
        }
        if (!covered) {
            if (CdmGroups >= 2)
                for (int g = 0; g < CdmGroups; ++g) {
                    const int w = e.re - g * DmrsConfigType;
                    if ((w % period == 0 || (w - second) % period == 0) && (precoded ? o == 0 : freeOrReserved(o)))
                        o = kCdmReserved;
                }
        } else if (!isSsb(o)) {
            complex v;
            if ((precoded ? o == 0 : freeOrReserved(o)) && dmrsPortValue(e, r, precoded, v)) value = v * DmrsAmplitude;
            o = kDmrs;
        }
    }
    if (e.ptrsRb) {
        for (int q : PtrsPortList) {
            if ((e.re - PtrsReInRb[static_cast<std::size_t>(q)]) % 12 != 0 || !freeOrReserved(o)) continue;
            const std::size_t i = static_cast<std::size_t>((e.prb - LowestPrb) * PtrsPerRb +
                                                           2 * PtrsCombIndex[static_cast<std::size_t>(q)] +
                                                           PtrsPhaseIndex[static_cast<std::size_t>(q)]);
            if ((q == row.port || PtrsMapAll) && i < PtrsBase.size()) value = PtrsBase[i] * PtrsAmplitude;
            o = kPtrs;
        }
    }
    if (e.isData) {
        if (o == 0) {
            complex v;
            if (dataPortValue(r, precoded, v)) value = v * DataAmplitude;
            o = kData;
            took = true;
        } else if (o != kDmrs && o != kPtrs && o != kCdmReserved && !isSsb(o)) {
            o = kData;
        }
    }
    return took;
}

bool PDSCH_Generator::dmrsPortValue(const ElementPlace& e, std::size_t r, bool precoded, complex& value) const {
    if (e.dmrsIndex < 0) return false;
    const int period = DmrsConfigType == 1 ? 4 : 6;
    const int second = DmrsConfigType == 1 ? 2 : 1;
    const int perRb = DmrsConfigType == 1 ? 6 : 4;
    const auto& symbol = DmrsValues[static_cast<std::size_t>(e.dmrsIndex)];
    auto portValue = [&](int x, complex& v) {
        const DmrsPlace place = dmrsPlace(e.re, portGroupOffset(Ports[static_cast<std::size_t>(x)]), period, second);
        if (!place.u1 && !place.u2) return false;
        const auto& seq = symbol[static_cast<std::size_t>(x)];
        const std::size_t k = static_cast<std::size_t>((e.prb - LowestPrb) * perRb + (place.u1 ? 0 : 1) + 2 * place.m);
        if (k >= seq.size()) return false;
        v = seq[k];
        return true;
    };
    if (!precoded) return portValue(rows_[r].position, value);
    // The matrix row of this antenna times each port's value, where the port's group covers it.
    const int row = static_cast<int>(r) < PrecodingMatrix.rows() ? static_cast<int>(r) : -1;
    value = complex{};
    for (int x = 0; x < static_cast<int>(Ports.size()) && row >= 0 && x < PrecodingMatrix.columns(); ++x) {
        complex v;
        if (portValue(x, v)) value += PrecodingMatrix(row, x) * v;
    }
    return true;
}

inline bool PDSCH_Generator::dataPortValue(std::size_t r, bool precoded, complex& value) {
    MappedRow& mapped = rows_[r];
    if (!precoded) {
        // The row's own layer, each row reading on at its own pace.
        const auto* layer = layers_[static_cast<std::size_t>(mapped.position)];
        if (!layer || mapped.read >= layer->size()) return false;
        value = (*layer)[mapped.read++];
        return true;
    }
    // All layers at the common read position through the bundle's matrix row.
    const int row = static_cast<int>(r) < PrecodingMatrix.rows() ? static_cast<int>(r) : -1;
    value = complex{};
    for (int x = 0; x < static_cast<int>(Ports.size()) && row >= 0 && x < PrecodingMatrix.columns(); ++x) {
        const auto* layer = layers_[static_cast<std::size_t>(x)];
        if (layer && commonRead_ < layer->size()) value += PrecodingMatrix(row, x) * (*layer)[commonRead_];
    }
    return true;
}

}  // namespace Orvalis_NR
