// PDSCH DM-RS positions and sequences (TS 38.211 clause 7.4.1.1) and the PT-RS pattern
// (TS 38.211 clause 7.4.1.2).

#include <algorithm>
#include <string>

#include "coding/gold_sequence.h"
#include "common/failure.h"
#include "downlink/pdsch_coreset_view.h"
#include "common/list_text.h"
#include "downlink/pdsch_generator.h"
#include "tables/pdsch_tables.h"

namespace Orvalis_NR {

using namespace Models::Nr5g;

bool GetLBar_PDSCH_DMRS(std::vector<int>& lBar, PDSCH_MappingTypeEnumList type, int l0, int addPos,
                        int duration, int length, int doubleSymbol) {
    lBar.clear();
    if (addPos < 0 || addPos > 3 || doubleSymbol < 0 || doubleSymbol > 1) return false;
    const int d = type == PDSCH_MappingTypeB ? length : duration;
    if (d < 0 || d > 14) return true;
    const auto& table = doubleSymbol ? tables::kPdschDmrsPositionsDouble : tables::kPdschDmrsPositionsSingle;
    const auto& cell = table[static_cast<std::size_t>(d)][static_cast<std::size_t>((type == PDSCH_MappingTypeB ? 4 : 0) + addPos)];
    if (!cell[0]) return true;
    lBar.push_back(l0);
    for (int i = 1; i < 4; ++i)
        if (cell[static_cast<std::size_t>(i)] >= 0) lBar.push_back(cell[static_cast<std::size_t>(i)]);
    return true;
}

namespace {

/// The DM-RS values of Generate_PDSCH_DMRS_Signal, with the Gold bits in `c`: the generator's
/// slot path calls this with its own storage, so that nothing is allocated per slot.
bool fillPdschDmrs(std::vector<std::vector<complex>>& dmrs, const std::vector<int>& ports, int firstRb, int rbCount,
                   int configType, int dmrsSymbol, const std::vector<int>& cInit, BitSequence& c) {
    if (firstRb < 0 || rbCount < 1 || firstRb > 4096 || rbCount > 4096) return false;
    if (configType != 1 && configType != 2) return false;
    if (dmrsSymbol < 0 || dmrsSymbol > 2 || cInit.size() < ports.size()) return false;
    const int perRb = configType == 1 ? 6 : 4;
    const int maxPort = (configType == 1 ? 4 : 6) * (dmrsSymbol == 0 ? 1 : 2) - 1;
    for (int p : ports)
        if (p - 1000 < 0 || p - 1000 > maxPort) return false;
    dmrs.resize(ports.size());
    const int values = perRb * rbCount;
    const int offset = 2 * perRb * firstRb;  // the sequence runs from common RB 0
    c.resize(static_cast<std::size_t>(2 * values));
    constexpr double a = 0.7071067811865476;
    for (std::size_t i = 0; i < ports.size(); ++i) {
        const int p = ports[i] - 1000;
        const auto& row = configType == 1 ? tables::kPdschDmrsPortsType1[static_cast<std::size_t>(p)]
                                          : tables::kPdschDmrsPortsType2[static_cast<std::size_t>(p)];
        const double wt = dmrsSymbol == 2 ? row[5] : row[4];
        PN_Generator(c, 2 * values, cInit[i], offset);
        auto& out = dmrs[i];
        out.resize(static_cast<std::size_t>(values));
        for (int m = 0; m < values; ++m) {
            const double wf = (m % 2) ? row[3] : row[2];  // k' is the parity of the index
            const double re = c[static_cast<std::size_t>(2 * m)] ? -a : a;
            const double im = c[static_cast<std::size_t>(2 * m + 1)] ? -a : a;
            out[static_cast<std::size_t>(m)] = complex(re, im) * (wf * wt);
        }
    }
    return true;
}

}  // namespace

bool Generate_PDSCH_DMRS_Signal(std::vector<std::vector<complex>>& dmrs, CP_TypeEnumList, std::vector<int> ports,
                                int firstRb, int rbCount, int configType, int dmrsSymbol, int, int,
                                std::vector<int> cInit) {
    BitSequence c;
    return fillPdschDmrs(dmrs, ports, firstRb, rbCount, configType, dmrsSymbol, cInit, c);
}

void PDSCH_Generator::buildDmrsSymbols(NRCarrier* carrier) {
    DmrsSymbols.clear();
    DmrsSymbolOffsets.clear();
    const bool typeB = Settings->PDSCHMappingType->getValue() == PDSCHMappingType::B;
    const int addPos = Settings->DMRSaddpos->getValue();
    if (addPos < 0 || addPos > 3) failWith("DMRSaddpos must be 0 to 3.", "DLSCH \"" + Settings->Name->getValue() + "\" DMRSaddpos " + std::to_string(addPos));
    const int first = DataSymbols.front();
    int l0 = 0;
    int d = 0;
    if (typeB) {
        d = static_cast<int>(DataSymbols.size());
    } else {
        l0 = Settings->DMRStypeApos->getValue() == 3 ? 3 : 2;
        d = DataSymbols.back() + 1;
    }
    std::vector<int> lBar;
    GetLBar_PDSCH_DMRS(lBar, typeB ? PDSCH_MappingTypeB : PDSCH_MappingTypeA, l0, addPos, d, d, DoubleSymbolDmrs ? 1 : 0);
    if (lBar.empty()) return;
    std::vector<int> additional(lBar.begin() + 1, lBar.end());

    auto coexistence = carrier->Downlink->getValue()->LTECoexistence->getValue();
    const bool lteOn = coexistence->Enabled->getValue();
    if (!DoubleSymbolDmrs && l0 == 3 && lteOn && coexistence->AdditionalDMRS_DL_Alt->getValue())
        for (int& p : additional)
            if (p == 11) p = 12;

    int upper = SymbolsPerSlot - 1;
    int second = SymbolsPerSlot - 1;
    const bool ecp = NumerologyValue == 3;
    if (typeB) {
        // A CORESET that overlaps the start of a type B allocation pushes the DM-RS behind it.
        int coresetFirst = 0, coresetLast = -1;
        std::vector<int> coresetMap;
        const bool lengthOk = ecp ? (d == 2 || d == 4 || d == 6) : (d >= 2 && d <= 13);
        if (lengthOk && latestCoreset(PdcchGenerators, Bwp, coresetFirst, coresetLast, coresetMap) && isCollided(coresetMap)) {
            const bool inside = (first >= coresetFirst && first <= coresetLast) ||
                                (DoubleSymbolDmrs && first + 1 >= coresetFirst && first + 1 <= coresetLast);
            if (inside) {
                const int shift = coresetLast - first + 1;
                l0 += shift;
                for (int& p : additional) p += shift;
                if (d == 2) upper = 1;
                else if (d == 5) upper = 4;
                else if ((d == 6 && ecp) || (d == 7 && !ecp)) upper = 3;
                else second = d - 2;
                if (d == 12 || d == 13) second = 12 - first;
                if (((d == 6 && ecp) || (d == 7 && !ecp)) && addPos == 1 && !DoubleSymbolDmrs) {
                    additional.clear();
                    if (shift == 0) additional.push_back(4);
                    else if (shift == 1) additional.push_back(5);
                }
            }
        }
    }
    if (NumerologyValue == 0 && lteOn && (d == 9 || d == 10) && !DoubleSymbolDmrs) {
        // LTE cell reference symbols push the additional DM-RS symbols one on.
        auto items = coexistence->LTECRS->getValue();
        for (int i = 0; i < items->getCount(); ++i) {
            auto crs = items->getItem(i);
            const auto mbsfn = intsFromCommaList(crs->MBSFNSubframeIndexArrayStr->getValue());
            bool allMbsfn = !SlotList.empty();
            for (int s : SlotList)
                if (std::find(mbsfn.begin(), mbsfn.end(), s % 10) == mbsfn.end()) allMbsfn = false;
            const int ports = crs->NumberOfCRSAntennaPorts->getValue();
            std::vector<int> crsSymbols;
            if (allMbsfn) crsSymbols = ports == 4 ? std::vector<int>{0, 1} : std::vector<int>{0};
            else crsSymbols = ports == 4 ? std::vector<int>{0, 1, 4, 7, 8, 11} : std::vector<int>{0, 4, 7, 11};
            const int reference = typeB ? first : 0;
            auto hit = [&](int p) { return std::find(crsSymbols.begin(), crsSymbols.end(), p + reference) != crsSymbols.end(); };
            bool any = hit(l0);
            for (int p : additional) any = any || hit(p);
            if (any) {
                for (int& p : additional) p += 1;
                break;
            }
        }
    }

    const int base = typeB ? first : 0;
    const int bound = std::min(upper, second);
    for (int o = 0; o < (DoubleSymbolDmrs ? 2 : 1); ++o) {
        if (l0 + o <= bound && l0 + o + base < SymbolsPerSlot) {
            DmrsSymbols.push_back(l0 + o + base);
            DmrsSymbolOffsets.push_back(o);
        }
        for (int p : additional)
            if (p >= 0 && p + o <= upper && p + o + base < SymbolsPerSlot) {
                DmrsSymbols.push_back(p + o + base);
                DmrsSymbolOffsets.push_back(o);
            }
    }
    // Keep the list in symbol order; the offsets travel with their symbols.
    std::vector<std::size_t> order(DmrsSymbols.size());
    for (std::size_t i = 0; i < order.size(); ++i) order[i] = i;
    std::stable_sort(order.begin(), order.end(), [&](std::size_t x, std::size_t y) { return DmrsSymbols[x] < DmrsSymbols[y]; });
    std::vector<int> symbols, offsets;
    for (std::size_t i : order) {
        symbols.push_back(DmrsSymbols[i]);
        offsets.push_back(DmrsSymbolOffsets[i]);
    }
    DmrsSymbols = symbols;
    DmrsSymbolOffsets = offsets;
}

void PDSCH_Generator::buildPtrs() {
    KPtrs = Settings->K_PTRS->getValue();
    LPtrs = Settings->L_PTRS->getValue();
    PtrsReOffset = static_cast<int>(Settings->PTRSREOffset->getValue());
    PtrsSymbols.clear();
    PtrsPortList.clear();
    PtrsReInRb.clear();
    PtrsCombIndex.clear();
    PtrsPhaseIndex.clear();
    PtrsPerRb = DmrsConfigType == 1 ? 6 : 4;

    // DM-RS resource elements of the CDM groups without data (TS 38.211 clause 7.4.1.1.2).
    const int period = DmrsConfigType == 1 ? 4 : 6;
    const int second = DmrsConfigType == 1 ? 2 : 1;
    DmrsReMask.fill(0);
    for (int g = 0; g < CdmGroups; ++g)
        for (int k = 0; k < 12; ++k) {
            const int w = k - g * DmrsConfigType;
            if (w % period == 0 || (w - second) % period == 0) DmrsReMask[static_cast<std::size_t>(k)] = 1;
        }
    DmrsRePerRb = 0;
    for (int v : DmrsReMask) DmrsRePerRb += v;

    if (!PtrsOn) return;
    const std::string who = "DLSCH \"" + Settings->Name->getValue() + "\" ";
    if (KPtrs != 2 && KPtrs != 4) failWith("K_PTRS must be 2 or 4.", who + "K_PTRS " + std::to_string(KPtrs));
    if (LPtrs != 1 && LPtrs != 2 && LPtrs != 4) failWith("L_PTRS must be 1, 2 or 4.", who + "L_PTRS " + std::to_string(LPtrs));

    // Time pattern, TS 38.211 clause 7.4.1.2.2, relative to the first data symbol b.
    const int b = DataSymbols.front();
    const int lastData = DataSymbols.back();
    int i = 0, r = 0;
    for (int guard = 0; b + r + LPtrs * i <= lastData && guard < 64; ++guard) {
        const int from = b + std::max(r + 1 + (i - 1) * LPtrs, r);
        const int to = b + r + LPtrs * i;
        bool found = false;
        for (std::size_t k = 0; k < DmrsSymbols.size(); ++k) {
            const int dm = DmrsSymbols[k];
            if (dm >= from && dm <= to) {
                r = dm - b + (DoubleSymbolDmrs && DmrsSymbolOffsets[k] == 0 ? 1 : 0);
                i = 1;
                found = true;
                break;
            }
        }
        if (!found) {
            PtrsSymbols.push_back(to);
            ++i;
        }
    }

    PtrsPortList = intsFromCommaList(Settings->getPTRSports());
    for (int p : PtrsPortList)
        if (p < 0 || p > 11) failWith("PTRSports names a port out of range.", who + "PTRSports \"" + Settings->getPTRSports() + "\"");
    int nrb = 0;
    for (int v : RbMask) nrb += v;
    const int rest = nrb % KPtrs;
    PtrsRbOffset = rest != 0 ? Rnti % rest : Rnti % KPtrs;
    const int entries = DmrsConfigType == 1 ? 4 : 6;
    const int o = DmrsConfigType == 1 ? 0 : 4;
    for (int e = 0; e < entries; ++e) {
        const int at = std::min(std::max(8 * e + o + PtrsReOffset, 0), 47);
        const int k = tables::kPtrsReferenceRe[static_cast<std::size_t>(at)];
        PtrsReInRb.push_back(k);
        if (DmrsConfigType == 1) {
            const int m = (e / 2) % 2;
            const int phase = ((k - m) % 4) / 2;
            PtrsPhaseIndex.push_back(phase);
            PtrsCombIndex.push_back((k - 2 * phase - m) / 4);
        } else {
            const int m = 2 * ((e / 2) % 3);
            const int phase = ((k - m) % 6) % 2;
            PtrsPhaseIndex.push_back(phase);
            PtrsCombIndex.push_back((k - phase - m) / 6);
        }
    }
    for (int p : PtrsPortList)
        if (p >= entries) failWith("PTRSports names a port out of range.", who + "PTRSports \"" + Settings->getPTRSports() + "\"");
}

void PDSCH_Generator::generateDmrs(int subframe, int slot) {
    const int t = subframe * SlotsPerSubframe + slot;
    const int span = HighestPrb - LowestPrb + 1;
    for (std::size_t d = 0; d < DmrsSymbols.size(); ++d) {
        const int s = DmrsSymbols[d];
        auto& cInit = DmrsCInit[d];
        for (std::size_t i = 0; i < Ports.size(); ++i) {
            const int p = Ports[i];
            int n = NScid;
            int id = NIdNScid;
            if (DmrsR16) {
                const int lambda = (p / 2) % (DmrsConfigType == 1 ? 2 : 3);
                if (lambda == 1) n = 1 - NScid;
                id = n == 1 ? NId1 : NId0;
            }
            const long long value = ((static_cast<long long>(SymbolsPerSlot) * t + 1 + s) * (2LL * id + 1) << 17) + 2LL * id + n;
            cInit[i] = static_cast<int>(value & 0x7FFFFFFF);
        }
        const int code = DoubleSymbolDmrs ? 1 + DmrsSymbolOffsets[d] : 0;
        fillPdschDmrs(DmrsValues[d], dmrsPortNumbers_, LowestPrb + BwpStart, span, DmrsConfigType, code, cInit, dmrsGold_);
    }
    if (PtrsOn && !DmrsSymbols.empty()) {
        ptrsCInit_[0] = DmrsCInit[0][0];
        fillPdschDmrs(ptrsValues_, ptrsPortNumber_, LowestPrb + BwpStart, span, DmrsConfigType, 0, ptrsCInit_, dmrsGold_);
        PtrsBase.assign(ptrsValues_[0].begin(), ptrsValues_[0].end());
    }
}

}  // namespace Orvalis_NR
