// PDSCH set-up: identities, ports, powers, resource allocation (TS 38.214 clause 5.1.2.2),
// VRB-to-PRB mapping (TS 38.211 clause 7.3.1.6), the code words (TS 38.212 clauses 5.1-5.4.2,
// 7.2), code block groups, slots and the rate-match resources.

#include <algorithm>
#include <climits>
#include <cmath>
#include <string>

#include "coding/ldpc_segmentation.h"
#include "coding/transport_block_size.h"
#include "common/failure.h"
#include "common/list_text.h"
#include "common/packed_bits.h"
#include "downlink/pdsch_generator.h"

namespace Orvalis_NR {

using namespace Models::Nr5g;

PDSCH_Generator::PDSCH_Generator() = default;

namespace {

std::string named(const NRDLSCH* settings, const std::string& setting, const std::string& value) {
    return "DLSCH \"" + settings->Name->getValue() + "\" " + setting + " " + value;
}

std::string named(const NRDLSCH* settings, const std::string& setting, long long value) {
    return named(settings, setting, std::to_string(value));
}

/// An identity whose -1 means the cell identity, checked against its range.
int identity(const NRDLSCH* settings, const char* name, int value, int cellId, int maximum) {
    const int v = value == -1 ? cellId : value;
    if (v < 0 || v > maximum)
        failWith("PDSCH identity out of range.", named(settings, name, value));
    return v;
}

}  // namespace

Numerology PDSCH_Generator::GetNumerology() { return static_cast<Numerology>(NumerologyValue); }

bool PDSCH_Generator::isCollided(std::vector<int>& map) {
    const std::size_t n = std::min(map.size(), RbMask.size());
    for (std::size_t i = 0; i < n; ++i)
        if (map[i] != 0 && RbMask[i] != 0) return true;
    return false;
}

bool PDSCH_Generator::Init(NRCarrier* carrier, NRDLSCH* settings, NRDLBWP* bwp, int gridWidth,
                           std::vector<PBCH_Generator*>& pbch, std::vector<PDCCH_Generator*>& pdcch,
                           std::vector<PRS_Generator*>& prs, std::vector<const CsiRsFootprint*> csiRs) {
    if (!carrier || !settings) fail("PDSCH_Generator::Init: no carrier or DLSCH settings.");
    Settings = settings;
    Carrier = carrier;
    if (!bwp) failWith("BWPIndex names no bandwidth part.", named(settings, "BWPIndex", settings->BWPIndex->getValue()));
    Bwp = bwp;
    PbchGenerators = pbch;
    PdcchGenerators = pdcch;
    PrsGenerators = prs;
    CsiRsGenerators = std::move(csiRs);
    GridWidth = gridWidth;
    if (gridWidth < 12) failWith("PDSCH grid width is too small.", std::to_string(gridWidth));

    readIdentities(carrier);

    // A DCI 1_0 in a common search space schedules in the bandwidth part of its CORESET.
    auto downlink = carrier->Downlink->getValue();
    auto bwps = downlink->BWP->getValue();
    if (settings->IsDCI10andCSS->getValue()) {
        auto coupled = bwps->getItem(settings->BWPIndexForCoupledDCI->getValue());
        if (coupled) Bwp = coupled.get();
    }

    Mu = Bwp->Mu->getValue();
    if (Mu < 0 || Mu > 4) failWith("Bandwidth part Mu out of range.", named(settings, "BWP Mu", Mu));
    NumerologyValue = static_cast<int>(Bwp->Numerology->getValue());
    SlotsPerSubframe = 1 << Mu;
    if (Bwp->CPType->getValue() == CyclicPrefixType::Extended) {
        SymbolsPerSlot = 12;
        SymbolsPerSubframe = 48;
    } else {
        SymbolsPerSlot = 14;
        SymbolsPerSubframe = 14 << Mu;
    }
    BwpSize = Bwp->RBNumber->getValue();
    if (BwpSize < 1 || BwpSize > 275)
        failWith("Bandwidth part RBNumber out of range.", named(settings, "BWP RBNumber", BwpSize));
    const double pointA = carrier->FrequencyOffsetOfPointA->getValue();
    if (!(std::abs(pointA) <= 1.0e10))
        failWith("FrequencyOffsetOfPointA out of range.", "FrequencyOffsetOfPointA " + std::to_string(pointA));
    const int bwpOffset = Bwp->RBOffset->getValue();
    if (bwpOffset < 0 || bwpOffset > 2200)
        failWith("Bandwidth part RBOffset out of range.", named(settings, "BWP RBOffset", bwpOffset));
    PointAOffset = static_cast<int>(pointA / 15000.0 / (1 << Mu)) + 12 * bwpOffset;
    BwpStart = bwpOffset;
    if (settings->DMRSMappingReference->getValue() == DMRSMappingReference::CORESET0) {
        int initialOffset = 0;
        std::shared_ptr<NRDLBWP> initial;
        for (int i = 0; i < bwps->getCount(); ++i)
            if (bwps->getItem(i)->InitialDLBWP->getValue()) {
                initial = bwps->getItem(i);
                break;
            }
        if (initial) initialOffset = initial->RBOffset->getValue();
        const auto& owner = initial ? initial : bwps->getItem(0);
        const int coreset0 = owner ? owner->Coreset0->getValue()->RBOffset->getValue() : 0;
        BwpStart = bwpOffset - coreset0 - initialOffset;
    }

    readPorts();

    const double boost = settings->PowerBoosting->getValue();
    const double dmrsBoost = settings->DMRSPowerBoosting->getValue();
    const double ptrsBoost = settings->PTRSPowerBoosting->getValue();
    if (!(std::abs(boost) <= 200.0) || !(std::abs(dmrsBoost) <= 200.0) || !(std::abs(ptrsBoost) <= 200.0))
        failWith("PDSCH power boosting out of range.", named(settings, "PowerBoosting", std::to_string(boost)));
    DataAmplitude = std::pow(10.0, boost / 20.0);
    DmrsAmplitude = DataAmplitude * std::pow(10.0, dmrsBoost / 20.0);
    PtrsAmplitude = DataAmplitude * std::pow(10.0, ptrsBoost / 20.0);
    PtrsOn = settings->PTRSEnabled->getValue();
    PtrsMapAll = settings->Name->getValue().find("PTRSMAPALL") != std::string::npos;

    buildAllocation();
    buildVrbToPrb();

    SlotList = intsFromCommaList(settings->SlotIndexArrayStr->getValue());
    const int first = settings->FirstSymbol->getValue();
    const int last = settings->LastSymbol->getValue();
    if (first < 0 || first >= SymbolsPerSlot) failWith("PDSCH FirstSymbol out of range.", named(settings, "FirstSymbol", first));
    if (last < first || last >= SymbolsPerSlot) failWith("PDSCH LastSymbol out of range.", named(settings, "LastSymbol", last));
    DataSymbols.clear();
    for (int s = first; s <= last; ++s) DataSymbols.push_back(s);

    buildCodeWords(carrier);
    buildCbg();
    buildCoresetRateMatching(carrier);
    buildDmrsSymbols(carrier);
    buildPtrs();
    buildSymbolClass();
    buildRateMatchPatterns();

    const auto bundle = settings->PRBBundleSize->getValue();
    BundledPrecoding = bundle != PRBBundleSize::Wideband;
    BundleSize = bundle == PRBBundleSize::_4RB ? 4 : 2;
    PrecodingMatrix.resize(static_cast<int>(Ports.size()), static_cast<int>(Ports.size()));
    for (int i = 0; i < PrecodingMatrix.rows(); ++i) PrecodingMatrix(i, i) = 1.0;

    buildLteCrs(carrier);
    reserveSlotStorage();
    return true;
}

void PDSCH_Generator::reserveSlotStorage() {
    // Per-slot storage at its largest, so that the slot path does not allocate.
    const std::size_t maxRe = static_cast<std::size_t>(AllocRbCount) * 12 * DataSymbols.size();
    for (auto& cw : CodeWords) {
        const std::size_t maxBits = maxRe * static_cast<std::size_t>(cw.Qm) * static_cast<std::size_t>(NumberOfLayers);
        if (!CodingOn) cw.CodedBits.reserve(maxBits);
        cw.CodedSymbols.reserve(maxBits / static_cast<std::size_t>(cw.Qm) + 1);
        cw.PnWords.reserve(maxBits / 64 + 1);
        cw.EncoderIn.reserve(static_cast<std::size_t>(cw.K));
        cw.Layers.reserve(8);
        for (auto& layer : cw.Layers) layer.reserve(maxRe);
    }
    // DM-RS and PT-RS sequences span at most the bandwidth part.
    const std::size_t maxValues = static_cast<std::size_t>(DmrsConfigType == 1 ? 6 : 4) * static_cast<std::size_t>(BwpSize);
    DmrsValues.assign(DmrsSymbols.size(), std::vector<std::vector<complex>>(Ports.size()));
    for (auto& symbol : DmrsValues)
        for (auto& port : symbol) port.reserve(maxValues);
    DmrsCInit.assign(DmrsSymbols.size(), std::vector<int>(Ports.size()));
    dmrsPortNumbers_.clear();
    for (int p : Ports) dmrsPortNumbers_.push_back(p + 1000);
    ptrsValues_.assign(1, {});
    ptrsValues_[0].reserve(maxValues);
    PtrsBase.reserve(maxValues);
    dmrsGold_.reserve(2 * maxValues);
    symbolHits_.assign(static_cast<std::size_t>(SymbolsPerSlot), 0);
}

void PDSCH_Generator::buildLteCrs(NRCarrier* carrier) {
    lteCrs_.clear();
    auto coexistence = carrier->Downlink->getValue()->LTECoexistence->getValue();
    if (!coexistence->Enabled->getValue() || NumerologyValue != 0) return;
    auto items = coexistence->LTECRS->getValue();
    static constexpr int kRb[6] = {6, 15, 25, 50, 75, 100};
    for (int i = 0; i < items->getCount(); ++i) {
        auto crs = items->getItem(i);
        const int bw = static_cast<int>(crs->LTEBandwidth->getValue());
        const int nrb = bw >= 1 && bw <= 5 ? kRb[bw] : 6;
        LteCrsItem item;
        item.mbsfnSubframes = intsFromCommaList(crs->MBSFNSubframeIndexArrayStr->getValue());
        item.centre = crs->OffsetToPointA->getValue();
        item.low = item.centre - 6 * nrb;
        item.high = item.centre + 1 + 6 * nrb;
        item.ports = crs->NumberOfCRSAntennaPorts->getValue();
        item.vShift = crs->VShift->getValue();
        lteCrs_.push_back(std::move(item));
    }
}

void PDSCH_Generator::readIdentities(NRCarrier* carrier) {
    const int cellId = carrier->CellID->getValue();
    Rnti = Settings->RNTI->getValue();
    if (Rnti < 0 || Rnti > 65535) failWith("PDSCH RNTI out of range.", named(Settings, "RNTI", Rnti));
    NId = identity(Settings, "n_ID", Settings->n_ID->getValue(), cellId, 1023);
    NId0 = identity(Settings, "N_ID_0", Settings->N_ID_0->getValue(), cellId, 65535);
    NId1 = identity(Settings, "N_ID_1", Settings->N_ID_1->getValue(), cellId, 65535);
    NIdNScid = identity(Settings, "N_ID_nSCID", Settings->N_ID_nSCID->getValue(), cellId, 65535);
    NScid = Settings->n_SCID->getValue();
    if (NScid != 0 && NScid != 1) failWith("PDSCH n_SCID must be 0 or 1.", named(Settings, "n_SCID", NScid));
    DmrsR16 = Settings->DMRSdownlink_r16->getValue();
}

void PDSCH_Generator::readPorts() {
    DmrsConfigType = Settings->DMRSConfigurationType->getValue() != DMRSConfigurationType::Type1 ? 2 : 1;
    DoubleSymbolDmrs = Settings->DMRSDuration->getValue() == DMRSDuration::DoubleSymbol;
    Ports = intsFromCommaList(Settings->DMRSports->getValue());
    PortArray = intsFromCommaList(Settings->AntennaPortArray->getValue());
    NumberOfLayers = Settings->NumberOfLayers->getValue();
    NumberOfCodewords = Settings->NumberOfCodewords->getValue();
    CdmGroups = Settings->NumberOfDMRSCDMGroup->getValue();
    if (NumberOfLayers < 1 || NumberOfLayers > 8)
        failWith("PDSCH NumberOfLayers out of range.", named(Settings, "NumberOfLayers", NumberOfLayers));
    if (NumberOfCodewords < 1 || NumberOfCodewords > 2 || NumberOfCodewords > NumberOfLayers)
        failWith("PDSCH NumberOfCodewords does not fit the layers.", named(Settings, "NumberOfCodewords", NumberOfCodewords));
    if (static_cast<int>(Ports.size()) != NumberOfLayers)
        failWith("DMRSports must hold one port per layer.",
                 named(Settings, "DMRSports", "\"" + Settings->DMRSports->getValue() + "\" for NumberOfLayers " +
                                                  std::to_string(NumberOfLayers)));
    const int maxPort = (DmrsConfigType == 1 ? 4 : 6) * (DoubleSymbolDmrs ? 2 : 1) - 1;
    for (int p : Ports)
        if (p < 0 || p > maxPort)
            failWith("DM-RS port out of range for the configuration type and duration.",
                     named(Settings, "DMRSports", "\"" + Settings->DMRSports->getValue() + "\""));
    for (std::size_t i = 0; i < Ports.size(); ++i)
        for (std::size_t j = 0; j < i; ++j)
            if (Ports[i] == Ports[j])
                failWith("DMRSports names a port twice.", named(Settings, "DMRSports", "\"" + Settings->DMRSports->getValue() + "\""));
    if (PortArray.empty()) failWith("AntennaPortArray is empty.", named(Settings, "AntennaPortArray", "\"\""));
    if (CdmGroups < 1 || CdmGroups > (DmrsConfigType == 1 ? 2 : 3))
        failWith("NumberOfDMRSCDMGroup out of range.", named(Settings, "NumberOfDMRSCDMGroup", CdmGroups));
}

void PDSCH_Generator::buildAllocation() {
    RbMask.assign(static_cast<std::size_t>(BwpSize), 0);
    if (Settings->RAType->getValue() == RAType::RAType1) {
        const int start = Settings->RBOffset->getValue();
        const int count = Settings->RBNumber->getValue();
        if (start < 0 || start >= BwpSize) failWith("PDSCH RB allocation lies past the bandwidth part.", named(Settings, "RBOffset", start));
        if (count < 1 || count > BwpSize - start)
            failWith("PDSCH RB allocation lies past the bandwidth part.",
                     named(Settings, "RBNumber", std::to_string(count) + " from RBOffset " + std::to_string(start) +
                                                     " in a bandwidth part of " + std::to_string(BwpSize)));
        AllocRbStart = start;
        AllocRbCount = count;
        for (int n = start; n < start + count; ++n) RbMask[static_cast<std::size_t>(n)] = 1;
        return;
    }
    // Type 0: resource block groups of P RBs aligned to common RB 0 (TS 38.214 clause 5.1.2.2.1).
    AllocRbStart = 0;
    AllocRbCount = BwpSize;
    const int p = Settings->RBGSize->getValue();
    if (p < 1 || p > 16) failWith("PDSCH RBGSize out of range.", named(Settings, "RBGSize", p));
    const int s = Bwp->RBOffset->getValue();
    const int groups = (BwpSize - 1 + (s % p) + p) / p;
    const std::string bitmap = Settings->RBGBitmap->getValue();
    if (static_cast<int>(bitmap.size()) > groups || bitmap.find_first_not_of("01") != std::string::npos)
        failWith("RBGBitmap must hold one '0' or '1' per resource block group.",
                 named(Settings, "RBGBitmap", "\"" + bitmap + "\" for " + std::to_string(groups) + " groups"));
    int rb = 0;
    for (int g = 0; g < groups; ++g) {
        int size = p;
        if (g == 0) size = p - (s % p);
        if (g == groups - 1 && g != 0) size = (s + BwpSize) % p == 0 ? p : (s + BwpSize) % p;
        for (int i = 0; i < size && rb < BwpSize; ++i, ++rb)
            if (g < static_cast<int>(bitmap.size()) && bitmap[static_cast<std::size_t>(g)] == '1')
                RbMask[static_cast<std::size_t>(rb)] = 1;
    }
}

void PDSCH_Generator::buildVrbToPrb() {
    VrbMapped = Settings->VRBtoPRBMapping->getValue() == VRBtoPRBMapping::Interleaved;
    VrbToPrb.resize(static_cast<std::size_t>(BwpSize));
    for (int n = 0; n < BwpSize; ++n) VrbToPrb[static_cast<std::size_t>(n)] = n;
    if (VrbMapped) {
        const int l = Settings->VRBtoPRBInterleaver->getValue();
        if (l != 2 && l != 4) failWith("VRBtoPRBInterleaver must be 2 or 4.", named(Settings, "VRBtoPRBInterleaver", l));
        // The span starts at the bandwidth part, or for a DCI 1_0 in a common search space at
        // the first RB of the CORESET of that DCI (TS 38.211 clause 7.3.1.6).
        int start = 0;
        if (Settings->IsDCI10andCSS->getValue()) {
            const int id = Settings->CoresetIdForCoupledDCI->getValue();
            const std::shared_ptr<NRCORESET> coresets[3] = {Bwp->Coreset0->getValue(), Bwp->Coreset1->getValue(),
                                                            Bwp->Coreset2->getValue()};
            for (const auto& c : coresets) {
                if (c->ID->getValue() != id) continue;
                if (Bwp->InitialDLBWP->getValue() && id == 0) {
                    start = c->RBOffset->getValue();
                } else if (c->RBOffset->getValue() == -1) {
                    const int o = Bwp->RBOffset->getValue();
                    start = (o + 5) / 6 * 6 - o;
                    const auto bits = c->FrequencyDomainBitmap->getValue();
                    const auto one = bits.find('1');
                    if (one != std::string::npos) start += 6 * static_cast<int>(one);
                } else {
                    start = c->RBOffset->getValue();
                    const auto bits = c->FrequencyDomainBitmap->getValue();
                    const auto one = bits.find('1');
                    if (one != std::string::npos) start += 6 * static_cast<int>(one);
                }
                break;
            }
        }
        if (start < 0 || start >= BwpSize) failWith("VRB-to-PRB span starts outside the bandwidth part.", named(Settings, "CoresetIdForCoupledDCI", start));
        const int size = BwpSize - start;
        const int crbStart = Bwp->RBOffset->getValue() + start;
        const int firstSize = l - crbStart % l;
        const int bundles = size <= firstSize ? 1 : 1 + (size - firstSize + l - 1) / l;
        auto bundleStart = [&](int j) { return j == 0 ? 0 : firstSize + (j - 1) * l; };
        const int c = bundles / 2;
        for (int j = 0; j < bundles; ++j) {
            const int target = j == bundles - 1 ? j : (j % 2) * c + j / 2;
            const int from = bundleStart(j);
            const int to = bundleStart(target);
            const int count = std::min(j == bundles - 1 ? size - from : (j == 0 ? firstSize : l), size - from);
            for (int i = 0; i < count; ++i)
                VrbToPrb[static_cast<std::size_t>(start + from + i)] = start + to + i;
        }
    }
    PrbIndex.assign(static_cast<std::size_t>(BwpSize), -1);
    std::vector<int> used(static_cast<std::size_t>(BwpSize), 0);
    for (int n = 0; n < BwpSize; ++n)
        if (RbMask[static_cast<std::size_t>(n)]) used[static_cast<std::size_t>(VrbToPrb[static_cast<std::size_t>(n)])] = 1;
    int rank = 0;
    for (int p = 0; p < BwpSize; ++p)
        if (used[static_cast<std::size_t>(p)]) PrbIndex[static_cast<std::size_t>(p)] = rank++;

    // Every allocated RB must land inside the store after the one wrap that the mapping does.
    for (int n = 0; n < BwpSize; ++n) {
        if (!RbMask[static_cast<std::size_t>(n)]) continue;
        const int p = VrbToPrb[static_cast<std::size_t>(n)];
        for (int edge : {12 * p + PointAOffset, 12 * p + 11 + PointAOffset}) {
            const int c = edge < 0 ? edge + GridWidth : edge >= GridWidth ? edge - GridWidth : edge;
            if (c < 0 || c >= GridWidth)
                failWith("PDSCH allocation lies outside the carrier's grid.",
                         named(Settings, "RB", std::to_string(n) + " at subcarrier " + std::to_string(edge) +
                                                   " of a grid of " + std::to_string(GridWidth)));
        }
    }
}

void PDSCH_Generator::buildCodeWords(NRCarrier* carrier) {
    CodingOn = Settings->ChannelCoding->getValue();
    CodeWords.clear();
    CodeWords.resize(static_cast<std::size_t>(NumberOfCodewords));
    int allocated = 0;
    for (int v : RbMask) allocated += v;
    for (auto& cw : CodeWords) {
        auto source = std::make_unique<DataSourceBlock>();
        source->Init(Settings->PayloadData->getValue());
        cw.Source = std::move(source);
        cw.Modulation = static_cast<int>(Settings->Modulation->getValue());
        GetPdschConstellation(cw.Modulation, cw.Qm, cw.Constellation);
        if (cw.Constellation.empty())
            failWith("PDSCH Modulation is not a known constellation.", named(Settings, "Modulation", cw.Modulation));
        cw.SymbolTable.resize(cw.Constellation.size());
        for (std::size_t i = 0; i < cw.SymbolTable.size(); ++i) {
            std::size_t msbFirst = 0;
            for (int b = 0; b < cw.Qm; ++b) msbFirst |= ((i >> b) & 1u) << (cw.Qm - 1 - b);
            cw.SymbolTable[i] = cw.Constellation[msbFirst];
        }
        cw.Layers.resize(static_cast<std::size_t>(NumberOfLayers / NumberOfCodewords));
        if (!CodingOn) continue;

        const int a = Settings->TransportBlockSize->getValue();
        const double rate = Settings->CodingRate->getValue();
        // No more information bits than the allocation can carry in one slot at code rate 1.
        const long long capacity = static_cast<long long>(allocated) * 12 * static_cast<long long>(DataSymbols.size()) *
                                   cw.Qm * (NumberOfLayers / NumberOfCodewords);
        if (a < 1 || a > capacity)
            failWith("TransportBlockSize cannot be coded in the allocation.",
                     named(Settings, "TransportBlockSize", std::to_string(a) + " for at most " + std::to_string(capacity) +
                                                               " coded bits"));
        if (!(rate >= 0.0 && rate <= 1.0)) failWith("PDSCH CodingRate out of range.", named(Settings, "CodingRate", std::to_string(rate)));
        cw.TbsBits = a;
        cw.Rv = Settings->RVIndex->getValue();
        if (cw.Rv < 0 || cw.Rv > 3) failWith("PDSCH RVIndex must be 0 to 3.", named(Settings, "RVIndex", cw.Rv));
        cw.TbCrcBits = a < 3825 ? 16 : 24;
        cw.CrcSelector = a < 3825 ? CRC_16 : CRC_24A;
        cw.TbWithCrcBits = a + cw.TbCrcBits;
        // TS 38.212 clause 7.2.2.
        if (a < 293) cw.BaseGraph = 2;
        else if (a < 3825) cw.BaseGraph = rate > 0.67 ? 1 : 2;
        else cw.BaseGraph = rate <= 0.25 ? 2 : 1;

        CodeBlockSegmentationLDPC segmentation;
        if (!segmentation.Init(cw.BaseGraph == 1 ? LDPC_BG1 : LDPC_BG2, cw.TbWithCrcBits))
            failWith("TransportBlockSize cannot be segmented.", named(Settings, "TransportBlockSize", a));
        cw.Blocks = segmentation.Blocks;
        cw.CeilBlockBits = segmentation.CeilBlockBits;
        cw.FloorBlockBits = segmentation.FloorBlockBits;
        cw.Z = segmentation.Z;
        cw.K = segmentation.K;
        cw.N = (cw.BaseGraph == 1 ? 66 : 50) * cw.Z;
        cw.CbCrcBits = segmentation.CrcPerBlock;

        // Limited buffer: TBS_LBRM for the largest bandwidth part, 4 layers, 256QAM, R 2/3.
        int maxRb = 0;
        auto bwps = carrier->Downlink->getValue()->BWP->getValue();
        for (int i = 0; i < bwps->getCount(); ++i) maxRb = std::max(maxRb, bwps->getItem(i)->RBNumber->getValue());
        int lbrm = 0;
        DeterminationTransportBlockSize(lbrm, cw.Blocks, 8, 4, maxRb);
        cw.Nref = static_cast<int>(lbrm / (cw.Blocks * 0.6666666666666666));
        if (!cw.Encoder.Initialize(cw.BaseGraph - 1, cw.Z))
            failWith("LDPC encoder set-up failed.", named(Settings, "TransportBlockSize", a));

        cw.TbBits.assign(static_cast<std::size_t>(a), 0);
        cw.TbWithCrc.assign(static_cast<std::size_t>(cw.TbWithCrcBits), 0);
        cw.CbCrc.assign(24, 0);
        cw.CbBits.assign(static_cast<std::size_t>(cw.K), 0);
        cw.EncoderOut.assign(static_cast<std::size_t>(cw.N), 0);
        cw.TbWords.assign(packedWords(static_cast<std::size_t>(cw.TbWithCrcBits)) + 1, 0);
        cw.CbWords.assign(packedWords(static_cast<std::size_t>(cw.K)) + 1, 0);
        cw.DWords.assign(packedWords(static_cast<std::size_t>(cw.N)) + 1, 0);
        cw.PerBlockE.assign(static_cast<std::size_t>(cw.Blocks), 0);
    }
}

void PDSCH_Generator::buildCbg() {
    CbgOn = Settings->CBGTransmission->getValue();
    CbgFlags.clear();
    CrcErrorFlags.clear();
    CodedBlocks = 0;
    if (!CodingOn || CodeWords.empty()) return;
    const int c = CodeWords[0].Blocks;
    MaxCbg = Settings->MaxCBGsPerTB->getValue();
    if (MaxCbg < 1) failWith("MaxCBGsPerTB must be positive.", named(Settings, "MaxCBGsPerTB", MaxCbg));
    const int m = std::min(MaxCbg, c);
    const std::string cbgti = Settings->CBGTI->getValue();
    const std::string errors = Settings->CRCErrorFlag->getValue();
    if (CbgOn && static_cast<int>(cbgti.size()) < m)
        failWith("CBGTI holds fewer flags than code block groups.",
                 named(Settings, "CBGTI", "\"" + cbgti + "\" for " + std::to_string(m) + " groups"));
    for (int g = 0; g < m; ++g) {
        const int size = g < c % m ? (c + m - 1) / m : c / m;
        const int flag = g < static_cast<int>(cbgti.size()) && cbgti[static_cast<std::size_t>(g)] != '0' ? 1 : 0;
        const int error = !errors.empty() && errors[static_cast<std::size_t>(g) % errors.size()] != '0' ? 1 : 0;
        for (int i = 0; i < size; ++i) {
            CbgFlags.push_back(flag);
            CrcErrorFlags.push_back(error);
        }
        CodedBlocks += CbgOn ? flag * size : 0;
    }
    if (!CbgOn) CodedBlocks = c;
}

void PDSCH_Generator::buildCoresetRateMatching(NRCarrier* carrier) {
    RmCoreset.reset();
    RmCoresetSlots.clear();
    RmCoresetSymbols.clear();
    const int id = Settings->CoresetIdForRM->getValue();
    if (id == -1) return;
    const int count = Bwp->NumberOfCoreset->getValue();
    const std::shared_ptr<NRCORESET> coresets[3] = {Bwp->Coreset0->getValue(), Bwp->Coreset1->getValue(),
                                                    Bwp->Coreset2->getValue()};
    int index = -1;
    for (int i = 0; i < 3; ++i) {
        if (i >= 1 && count < i + 1) break;
        if (coresets[i]->ID->getValue() == id) {
            index = i;
            break;
        }
    }
    if (index < 0) return;
    RmCoreset = coresets[index];
    // The CORESET's RBs in the BWP: from its RBOffset, or with -1 from the first multiple of 6.
    rmCoresetStart_ = RmCoreset->RBOffset->getValue();
    if (rmCoresetStart_ == -1) {
        const int o = Bwp->RBOffset->getValue();
        rmCoresetStart_ = (o + 5) / 6 * 6 - o;
    }
    rmCoresetBitmap_ = RmCoreset->FrequencyDomainBitmap->getValue();
    const int symbols = RmCoreset->SymbolNumber->getValue();
    if (symbols < 0 || symbols > 3) failWith("CORESET SymbolNumber out of range.", named(Settings, "CoresetIdForRM", id));
    auto dcis = carrier->Downlink->getValue()->DCI->getValue();
    for (int i = 0; i < dcis->getCount(); ++i) {
        auto dci = dcis->getItem(i);
        if (dci->CoresetIndex->getValue() != index) continue;
        for (int s : intsFromCommaList(dci->SlotIndexArrayStr->getValue())) RmCoresetSlots.push_back(s);
        for (int k = 0; k < symbols; ++k) RmCoresetSymbols.push_back(dci->FirstSymbol->getValue() + k);
    }
}

void PDSCH_Generator::buildSymbolClass() {
    SymbolClass.assign(static_cast<std::size_t>(SymbolsPerSlot), 0);
    auto add = [this](const std::vector<int>& list, int weight) {
        for (int s : list)
            if (s >= 0 && s < SymbolsPerSlot) SymbolClass[static_cast<std::size_t>(s)] += weight;
    };
    add(DataSymbols, 2);
    add(DmrsSymbols, 1);
    add(PtrsSymbols, 4);
}

void PDSCH_Generator::buildRateMatchPatterns() {
    auto patterns = Settings->RateMatchPatterns->getValue();
    const int count = patterns->getCount();
    RmPatternRbs.assign(static_cast<std::size_t>(count), {});
    RmPatternSymbols.assign(static_cast<std::size_t>(count), {});
    static constexpr int kSpacingOf[6] = {0, 1, 2, 2, 3, 4};
    for (int i = 0; i < count; ++i) {
        auto item = patterns->getItem(i);
        if (!item->Enabled->getValue()) continue;
        const bool bwpLevel = item->Level->getValue() != RateMatchPatternLevel::Cell;
        const int scs = static_cast<int>(item->SubcarrierSpacing->getValue());
        if (!bwpLevel && scs != kSpacingOf[NumerologyValue < 0 || NumerologyValue > 5 ? 1 : NumerologyValue]) continue;

        const int v = SymbolsPerSlot * (item->SymbolBitmapSpan->getValue() == SymbolBitmapSpan::TwoSlots ? 2 : 1);
        const int z = item->Periodicity->getValue();
        const std::string where = "RateMatchPatterns[" + std::to_string(i) + "]";
        if (z < 1 || z > 80) failWith("Rate-match pattern Periodicity out of range.", named(Settings, where + ".Periodicity", z));
        const std::string slots = item->getPeriodicityPatternBitmap();
        const std::string symbols = item->getSymbolBitmap();
        if (static_cast<int>(slots.size()) < z)
            failWith("PeriodicityPatternBitmap is shorter than Periodicity.", named(Settings, where + ".PeriodicityPatternBitmap", "\"" + slots + "\""));
        if (static_cast<int>(symbols.size()) < v)
            failWith("SymbolBitmap is shorter than its span.", named(Settings, where + ".SymbolBitmap", "\"" + symbols + "\""));
        auto& table = RmPatternSymbols[static_cast<std::size_t>(i)];
        table.assign(static_cast<std::size_t>(SymbolsPerSlot) * 80, 0);
        const int repeats = 80 * SymbolsPerSlot / (v * z);
        for (int t = 0; t < repeats; ++t)
            for (int q = 0; q < z; ++q) {
                if (slots[static_cast<std::size_t>(q)] == '0') continue;
                for (int u = 0; u < v; ++u)
                    if (symbols[static_cast<std::size_t>(u)] != '0')
                        table[static_cast<std::size_t>(t * v * z + q * v + u)] = 1;
            }
        auto& rbs = RmPatternRbs[static_cast<std::size_t>(i)];
        rbs.assign(static_cast<std::size_t>(BwpSize), 0);
        const std::string bitmap = item->getRBBitmap();
        const int shift = bwpLevel ? 0 : Bwp->RBOffset->getValue();
        for (int j = 0; j < BwpSize; ++j) {
            const std::size_t at = static_cast<std::size_t>(j + shift);
            if (at < bitmap.size() && bitmap[at] == '1') rbs[static_cast<std::size_t>(j)] = 1;
        }
    }
}

}  // namespace Orvalis_NR
