// The count of PDSCH data resource elements per layer in one slot, around SS/PBCH, CSI-RS,
// CORESETs, LTE CRS, DM-RS and PT-RS, and from it G per code word and E per code block
// (TS 38.212 clause 5.4.2.1).

#include <algorithm>

#include "downlink/pbch_generator.h"
#include "downlink/pdsch_generator.h"

namespace Orvalis_NR {

using namespace Models::Nr5g;

namespace {

bool contains(const std::vector<int>& list, int value) {
    return std::find(list.begin(), list.end(), value) != list.end();
}

}  // namespace

bool PDSCH_Generator::patternHit(int symbolInFrame, int frame, int prb) const {
    for (std::size_t i = 0; i < RmPatternSymbols.size(); ++i) {
        const auto& symbols = RmPatternSymbols[i];
        if (symbols.empty()) continue;
        const long long at = (static_cast<long long>(symbolInFrame) + 10LL * SymbolsPerSubframe * frame) %
                             static_cast<long long>(symbols.size());
        if (symbols[static_cast<std::size_t>(at)] != 0 && RmPatternRbs[i][static_cast<std::size_t>(prb)] != 0) return true;
    }
    return false;
}

bool PDSCH_Generator::coresetHit(int prb) const {
    if (prb < rmCoresetStart_) return false;
    const std::size_t g = static_cast<std::size_t>((prb - rmCoresetStart_) / 6);
    return g < rmCoresetBitmap_.size() && rmCoresetBitmap_[g] == '1';
}

bool PDSCH_Generator::ssbHit(int prb, int symbolInFrame, int firstOfSlot, int lastOfSlot) const {
    const int x = Bwp->RBOffset->getValue();
    for (const auto* pbch : PbchGenerators) {
        if (prb < pbch->RbStart - x || prb >= pbch->RbEnd - x) continue;
        const std::size_t blocks = std::min(pbch->FirstSymbol.size(), pbch->LastSymbol.size());
        for (std::size_t b = 0; b < blocks; ++b) {
            const int f = pbch->FirstSymbol[b], l = pbch->LastSymbol[b];
            if (pbch->SsbSymbolsOnly ? (f <= symbolInFrame && symbolInFrame <= l)
                                     : ((f >= firstOfSlot && f <= lastOfSlot) || (l >= firstOfSlot && l <= lastOfSlot)))
                return true;
        }
    }
    return false;
}

void PDSCH_Generator::CalculateRateMathingParameters(int frame, int subframe, int slot) {
    const int f = SymbolsPerSubframe * subframe + SymbolsPerSlot * slot;
    const int e = f + SymbolsPerSlot - 1;
    const long long absoluteSlot = (static_cast<long long>(subframe) + 10LL * frame) * SlotsPerSubframe + slot;
    const bool slotHit = absoluteSlot <= INT32_MAX && contains(RmCoresetSlots, static_cast<int>(absoluteSlot));

    // LTE carriers whose CRS the data avoids (TS 38.214 clause 5.1.4.2, lte-CRS-ToMatchAround).
    auto& lte = lteCrs_;
    for (auto& item : lte) item.mbsfn = contains(item.mbsfnSubframes, subframe);

    long long t = 0, crsSum = 0, ptrsSum = 0, csiSum = 0, dmrsSum = 0;
    for (int s : DataSymbols) {
        const int a = f + s;
        const int cls = SymbolClass[static_cast<std::size_t>(s)];
        const bool isDmrs = cls & 1;
        const bool isPtrs = cls & 4;
        const bool symbolHit = contains(RmCoresetSymbols, s);
        for (auto& item : lte) {
            item.adjust = 0;
            item.hasCrs = false;
            if (item.mbsfn) continue;
            const int m = (item.centre + item.vShift) % 6;
            if (item.ports == 1 && (s == 0 || s == 4 || s == 7 || s == 11)) {
                item.hasCrs = true;
                item.step = 6;
                item.shift = (s == 0 || s == 7) ? (m + 6) % 6 : (item.centre + item.vShift + 3) % 6;
            } else if (item.ports == 2 && (s == 0 || s == 4 || s == 7 || s == 11)) {
                item.hasCrs = true;
                item.step = 3;
                item.shift = (item.centre + item.vShift) % 3;
            } else if (item.ports == 4 && (s == 0 || s == 1 || s == 4 || s == 7 || s == 8 || s == 11)) {
                item.hasCrs = true;
                item.step = 3;
                item.shift = (item.centre + item.vShift) % 3;
            }
        }
        int rbCounter = 0;
        for (int n = AllocRbStart; n < AllocRbStart + AllocRbCount; ++n) {
            if (!RbMask[static_cast<std::size_t>(n)]) continue;
            const int p = VrbToPrb[static_cast<std::size_t>(n)];
            if (patternHit(a, frame, p)) continue;
            const int rbIndex = VrbMapped ? PrbIndex[static_cast<std::size_t>(p)] : rbCounter;
            const bool ssb = ssbHit(p, a, f, e);

            std::array<int, 12> csiMask{};
            bool csiHit = false;
            for (const auto* csi : CsiRsGenerators) {
                if (!csi || csi->ReUsedForPdsch) continue;
                if (!contains(csi->SlotList, (subframe << csi->Mu) + slot)) continue;
                if (n < csi->FirstRb || n >= csi->FirstRb + csi->RbCount) continue;
                if (n % std::max(csi->PrbStep, 1) != csi->OddPrbs) continue;
                if (!contains(csi->CsiSymbols, s)) continue;
                csiHit = true;
                for (int j = 0; j < 12; ++j) csiMask[static_cast<std::size_t>(j)] |= csi->ReWeights[static_cast<std::size_t>(j)];
            }
            int csiCount = 0;
            for (int v : csiMask) csiCount += v == 1 ? 1 : 0;

            const bool coreset = RmCoreset && slotHit && symbolHit && coresetHit(p);
            const bool ptrsRb = isPtrs && KPtrs > 0 && (rbIndex - PtrsRbOffset) % KPtrs == 0;
            if (!coreset) {
                for (auto& item : lte) {
                    if (!item.hasCrs) continue;
                    const int k0 = 12 * (p + Bwp->RBOffset->getValue());
                    for (int j = 0; j < 12; ++j) {
                        const int k = k0 + j;
                        if (k > item.centre) item.adjust = -1;
                        if (k < item.low || k >= item.high || k == item.centre) continue;
                        if (((k + item.adjust) % item.step + item.step) % item.step != item.shift) continue;
                        if (isDmrs && DmrsReMask[static_cast<std::size_t>(j)] != 0) continue;
                        if (ptrsRb && !PtrsReInRb.empty() && j == PtrsReInRb[0]) continue;
                        ++crsSum;
                    }
                }
            }
            if (!ssb && !coreset) {
                t += 12;
                if (isDmrs) {
                    int dm = DmrsRePerRb;
                    if (csiHit) {
                        dm = 0;
                        for (int j = 0; j < 12; ++j)
                            if (DmrsReMask[static_cast<std::size_t>(j)] == 1 && csiMask[static_cast<std::size_t>(j)] == 0) ++dm;
                        csiSum += csiCount;
                    }
                    dmrsSum += dm;
                } else if (ptrsRb) {
                    int q = static_cast<int>(PtrsPortList.size());
                    if (csiHit) {
                        q = 0;
                        for (int e2 : PtrsPortList)
                            if (csiMask[static_cast<std::size_t>(PtrsReInRb[static_cast<std::size_t>(e2)])] == 0) ++q;
                        csiSum += csiCount;
                    }
                    ptrsSum += q;
                } else if (csiHit) {
                    csiSum += csiCount;
                }
            }
            ++rbCounter;
        }
    }
    const long long r = std::max(0LL, t - crsSum - ptrsSum - csiSum - dmrsSum);
    DataRePerLayer = static_cast<int>(r);

    const int w = NumberOfCodewords;
    const int y = NumberOfLayers;
    const int l = y / w;
    for (auto& cw : CodeWords) {
        const long long g = static_cast<long long>(cw.Qm) * y * r / w;
        cw.G = g;
        if (!CodingOn) cw.CodedBits.assign(static_cast<std::size_t>(g), 0);
        // Blocks left out (CBG) keep coded bits 0.
        cw.CodedSymbols.assign(static_cast<std::size_t>((g + cw.Qm - 1) / cw.Qm), 0);
        // Scrambling bits of earlier slots stay: the sequence is the same while cInit is.
        if (cw.PnWords.size() < static_cast<std::size_t>((g + 63) / 64)) cw.PnWords.resize(static_cast<std::size_t>((g + 63) / 64));
        // Generate writes every symbol of every layer.
        cw.Layers.resize(static_cast<std::size_t>(l));
        for (auto& layer : cw.Layers) layer.resize(static_cast<std::size_t>(r));
        if (!CodingOn) continue;
        std::fill(cw.PerBlockE.begin(), cw.PerBlockE.end(), 0);
        const int coded = CodedBlocks;
        if (coded <= 0) continue;
        const long long p = g / (static_cast<long long>(l) * cw.Qm);
        for (int j = 0; j < coded && j < static_cast<int>(cw.PerBlockE.size()); ++j) {
            const long long blocks = j <= coded - (p % coded) - 1 ? p / coded : (p + coded - 1) / coded;
            cw.PerBlockE[static_cast<std::size_t>(j)] = static_cast<int>(static_cast<long long>(l) * cw.Qm * blocks);
        }
    }
}

}  // namespace Orvalis_NR
