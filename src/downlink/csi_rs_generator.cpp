#include "downlink/csi_rs_generator.h"

#include <algorithm>
#include <cmath>
#include <cstdint>

#include "coding/gold_sequence.h"
#include "common/failure.h"
#include "common/log.h"
#include "downlink/integer_list.h"
#include "tables/csirs_prs_tables.h"

namespace Orvalis_NR {

namespace {

constexpr double kQpsk = 0.7071067811865476;
constexpr int kFirstPort = 3000;  // CSI-RS antenna ports are 3000 + s + j L
constexpr int kCdmSizes[4] = {1, 2, 4, 8};
constexpr int kLPrimes[4] = {1, 1, 2, 4};

std::string quoted(const std::string& text) { return "\"" + text + "\""; }

/// The list setting's integers; an empty text is an empty list.
std::vector<int> listOrEmpty(const std::string& text, const std::string& setting) {
    if (text.find_first_not_of(" \t") == std::string::npos) return {};
    return parseIntegerList(text, setting);
}

}  // namespace

bool CSI_RS_Generator::Init(Models::Nr5g::NR5GWaveformSettings* waveform, Models::Nr5g::NRCarrier* carrier,
                            Models::Nr5g::NRDLBWP* bwp, Models::Nr5g::NRCSIRS* settings) {
    if (!waveform || !carrier || !settings) fail("CSI_RS_Generator::Init: missing settings.");
    Settings = settings;
    path_ = "CSI-RS " + quoted(settings->Name->getValue());
    if (!bwp)
        failWith("The CSI-RS has no bandwidth part.", path_ + " BWPIndex " + std::to_string(settings->BWPIndex->getValue()));
    Bwp = bwp;
    numerology_ = bwp->Numerology->getValue();
    Mu = bwp->Mu->getValue();
    if (Mu < 0 || Mu > 4) failWith("The bandwidth part's Mu is outside 0..4.", path_ + " Mu " + std::to_string(Mu));
    SlotsPerSubframe = 1 << Mu;
    SymbolsPerSlot = numerology_ == Models::Nr5g::Numerology::SCS60kECP ? 12 : 14;

    readSlotsAndPorts();
    const int id = settings->n_ID->getValue();
    NId = id == -1 ? carrier->CellID->getValue() : id;
    Amplitude = settings->ZeroPower->getValue() ? 0.0 : std::pow(10.0, settings->PowerBoosting->getValue() / 20.0);

    // Density 3 belongs to row 1 (the TRS row) whatever the setting says.
    Row = settings->RowIndex->getValue();
    static constexpr double kDensities[3] = {0.5, 1.0, 3.0};
    const int density = static_cast<int>(settings->Density->getValue());
    Density = density >= 0 && density < 3 ? kDensities[density] : 1.0;
    if (Row == 1) Density = 3.0;
    OddPrbs = settings->PRBAllocation->getValue() != Models::Nr5g::PRBAllocation::EvenPRBs;

    FirstSymbol = settings->FirstSymbol->getValue();
    FirstSymbol2 = settings->FirstSymbol2->getValue();
    std::vector<int> cdm;
    CalculateCsiLocations(Row, FirstSymbol, FirstSymbol2, settings->FrequencyDomainBitmap->getValue(), PortCount,
                          CdmSize, CsiLocations, CsiGroups, cdm);
    CdmType = cdm.front();
    InitWfWt(CdmType, CdmSize, Wf, Wt);

    for (int port : PortList)
        if (port != -1 && (port < kFirstPort || port >= kFirstPort + PortCount))
            failWith("AntennaPortArray names a port that the row does not have.",
                     path_ + " AntennaPortArray " + quoted(settings->AntennaPortArray->getValue()) + ", port " +
                         std::to_string(port) + ", RowIndex " + std::to_string(Row) + " has ports 3000 to " +
                         std::to_string(kFirstPort + PortCount - 1));

    // The symbols and subcarriers of an RB that the resource takes.
    CsiSymbols.clear();
    ReWeights.fill(0);
    const int lPrimes = static_cast<int>(Wt.front().size()), kPrimes = static_cast<int>(Wf.front().size());
    for (const auto& [kBar, lBar] : CsiLocations) {
        for (int lp = 0; lp < lPrimes; ++lp) {
            const int l = lBar + lp;
            if (l < 0 || l >= SymbolsPerSlot)
                failWith("The CSI-RS symbols do not fit the slot.",
                         path_ + " FirstSymbol " + std::to_string(FirstSymbol) + ", FirstSymbol2 " +
                             std::to_string(FirstSymbol2) + ", RowIndex " + std::to_string(Row) + ": symbol " +
                             std::to_string(l) + " of " + std::to_string(SymbolsPerSlot));
            CsiSymbols.insert(l);
        }
        for (int kp = 0; kp < kPrimes; ++kp) ReWeights[static_cast<std::size_t>((kBar + kp) % 12)] = 1;
    }
    symbolList_.assign(CsiSymbols.begin(), CsiSymbols.end());

    // m' = floor(n alpha) + k' + floor(k-bar rho / 12), alpha = rho for one port and 2 rho else
    // (TS 38.211 clause 7.4.1.5.3); both kept doubled to stay in integers.
    rhoTwice_ = static_cast<int>(Density * 2.0);
    alphaTwice_ = PortCount == 1 ? rhoTwice_ : 2 * rhoTwice_;

    // Point A and the resource's common RBs, clipped to the bandwidth part.
    const double pointA = carrier->FrequencyOffsetOfPointA->getValue();
    if (!(std::abs(pointA) <= 1.0e10))
        failWith("FrequencyOffsetOfPointA out of range.", "FrequencyOffsetOfPointA " + std::to_string(pointA));
    PointOffset = static_cast<int>(pointA / 15000.0 / SlotsPerSubframe);
    const long long bwpStart = bwp->RBOffset->getValue(), bwpSize = bwp->RBNumber->getValue();
    if (bwpStart < 0 || bwpStart > 275 * 16)
        failWith("The bandwidth part has no usable RB range.", path_ + " BWP RBOffset " + std::to_string(bwpStart));
    BwpOffset = PointOffset + 12 * static_cast<int>(bwpStart);
    const long long first = std::max<long long>(settings->RBOffset->getValue(), bwpStart);
    const long long last = std::min<long long>(first + settings->RBNumber->getValue(), bwpStart + bwpSize) - 1;
    checkBand(waveform->SampleRateAuto->getValue(), first, last);
    firstCrb_ = last < first ? static_cast<int>(bwpStart) : static_cast<int>(first);
    lastCrb_ = last < first ? firstCrb_ - 1 : static_cast<int>(last);
    RbOffset = firstCrb_ - static_cast<int>(bwpStart);
    RbNumber = lastCrb_ - firstCrb_ + 1;

    sequenceLength_ = RbNumber > 0 ? sequenceIndex(lastCrb_, 11, 1) + 1 : 0;
    Pn.assign(static_cast<std::size_t>(2 * sequenceLength_), 0);
    Values.assign(symbolList_.size(), std::vector<complex>(static_cast<std::size_t>(sequenceLength_)));
    buildFootprint();
    return true;
}

void CSI_RS_Generator::readSlotsAndPorts() {
    PortList = listOrEmpty(Settings->AntennaPortArray->getValue(), path_ + " AntennaPortArray");
    SlotList = listOrEmpty(Settings->SlotIndexArrayStr->getValue(), path_ + " SlotIndexArrayStr");
    for (int slot : SlotList)
        if (slot < 0)
            failWith("A slot number is negative.", path_ + " SlotIndexArrayStr " + quoted(Settings->SlotIndexArrayStr->getValue()));
}

void CSI_RS_Generator::checkBand(double sampleRate, long long first, long long last) {
    const double width = sampleRate / (15000.0 * SlotsPerSubframe);
    if (!(width >= 12.0 && width <= 1.0e6))
        failWith("SampleRateAuto gives no usable grid for the CSI-RS.", "SampleRateAuto " + std::to_string(sampleRate));
    GridWidth = static_cast<int>(width);
    if (last < first) return;
    const long long low = PointOffset + 12 * first, high = PointOffset + 12 * (last + 1) - 1;
    if (low < -GridWidth || high >= 2LL * GridWidth || high - low >= GridWidth)
        failWith("The CSI-RS lies outside the band of the sample rate.",
                 path_ + " RBOffset " + std::to_string(Settings->RBOffset->getValue()) + ", RBNumber " +
                     std::to_string(Settings->RBNumber->getValue()) + ", SampleRateAuto " + std::to_string(sampleRate));
}

void CSI_RS_Generator::buildFootprint() {
    Footprint.ReUsedForPdsch = Settings->REUsedForPDSCH->getValue();
    Footprint.Mu = Mu;
    Footprint.FirstRb = RbOffset;
    Footprint.RbCount = std::max(RbNumber, 0);
    Footprint.PrbStep = Density == 0.5 ? 2 : 1;
    // The even/odd choice is on the common RB grid; the PDSCH counts RBs from its BWP.
    const int bwpStart = Bwp->RBOffset->getValue();
    Footprint.OddPrbs = Density == 0.5 ? ((OddPrbs ? 1 : 0) + bwpStart) % 2 : 0;
    Footprint.SlotList = SlotList;
    Footprint.CsiSymbols = symbolList_;
    Footprint.ReWeights = ReWeights;
}

int CSI_RS_Generator::sequenceIndex(int crb, int kBar, int kPrime) const {
    return crb * alphaTwice_ / 2 + kPrime + kBar * rhoTwice_ / 24;
}

void CSI_RS_Generator::CalculateCsiLocations(int row, int l0, int l1, std::string bitmap, int& portCount, int& cdmSize,
                                             std::vector<std::pair<int, int>>& locations, std::vector<int>& groups,
                                             std::vector<int>& cdmType) {
    if (row < 1 || row > 18)
        failWith("RowIndex must be 1 to 18 (TS 38.211 Table 7.4.1.5.3-1).", path_ + " RowIndex " + std::to_string(row));
    const auto& entry = tables::kCsiRsLocations[static_cast<std::size_t>(row - 1)];
    const int bits = entry.bitmapBits;
    const std::string where = path_ + " FrequencyDomainBitmap " + quoted(bitmap) + ", RowIndex " + std::to_string(row);
    if (bitmap.find_first_not_of("01") != std::string::npos)
        failWith("FrequencyDomainBitmap holds a character other than 0 and 1.", where);
    // The row's own length, or the 12-character form with the bits above the row's width clear.
    const int length = static_cast<int>(bitmap.size());
    const bool fullWidth = length == 12 && bitmap.find('1') >= static_cast<std::size_t>(12 - bits);
    if (length != bits && !fullWidth)
        failWith("FrequencyDomainBitmap has the wrong length for its row.",
                 where + " takes " + std::to_string(bits) + " bits");
    // k_(i-1) = factor f(i), f(i) the number of the i-th set bit counted from b0, the last character.
    std::vector<int> k;
    for (int b = 0; b < bits; ++b)
        if (bitmap[static_cast<std::size_t>(length - 1 - b)] == '1') k.push_back(entry.kFactor * b);
    if (static_cast<int>(k.size()) != entry.kCount)
        failWith("FrequencyDomainBitmap sets a number of bits that its row does not take.",
                 where + " takes " + std::to_string(entry.kCount) + " set bits");

    portCount = entry.ports;
    cdmSize = entry.kPrimes * entry.lPrimes;
    locations.clear();
    groups.clear();
    for (int i = 0; i < entry.entryCount; ++i) {
        const auto& e = entry.entries[static_cast<std::size_t>(i)];
        locations.emplace_back(k[static_cast<std::size_t>(e.kIndex)] + e.kOffset, (e.lIndex == 0 ? l0 : l1) + e.lOffset);
        groups.push_back(e.cdmGroup);
    }
    cdmType.assign(1, entry.cdmType);
}

void CSI_RS_Generator::InitWfWt(int cdmType, int cdmSize, std::vector<std::vector<int>>& wf,
                                std::vector<std::vector<int>>& wt) {
    if (cdmType < 0 || cdmType > 3 || cdmSize != kCdmSizes[cdmType])
        failWith("No CDM sequences for this CDM type and size (TS 38.211 Tables 7.4.1.5.3-2 to -5).",
                 path_ + " CDM type " + std::to_string(cdmType) + ", size " + std::to_string(cdmSize));
    const int kPrimes = cdmType == CsiRsNoCdm ? 1 : 2, lPrimes = kLPrimes[cdmType];
    wf.assign(static_cast<std::size_t>(cdmSize), {});
    wt.assign(static_cast<std::size_t>(cdmSize), {});
    for (int s = 0; s < cdmSize; ++s) {
        const auto& f = tables::kCsiRsWf[static_cast<std::size_t>(cdmType)][static_cast<std::size_t>(s)];
        const auto& t = tables::kCsiRsWt[static_cast<std::size_t>(cdmType)][static_cast<std::size_t>(s)];
        wf[static_cast<std::size_t>(s)].assign(f.begin(), f.begin() + kPrimes);
        wt[static_cast<std::size_t>(s)].assign(t.begin(), t.begin() + lPrimes);
    }
}

bool CSI_RS_Generator::GenerateAndMap(SlotGrid& grid, OccupancyGrid& occupancy, int frame, OccupancyGrid& symbolFlags,
                                      bool firstChannel) {
    const int slotsPerFrame = 10 * SlotsPerSubframe;
    const std::size_t symbolsPerFrame = static_cast<std::size_t>(SymbolsPerSlot * slotsPerFrame);
    const std::size_t rowLength = symbolsPerFrame * static_cast<std::size_t>(GridWidth);
    const std::size_t antennas = grid.size();
    if (occupancy.size() != antennas || symbolFlags.size() < antennas)
        fail("CSI_RS_Generator::GenerateAndMap: frame stores of different antenna counts.");
    for (std::size_t a = 0; a < antennas; ++a)
        if (grid[a].size() != rowLength || occupancy[a].size() != rowLength || symbolFlags[a].size() < symbolsPerFrame)
            failWith("The frame store does not match the CSI-RS's numerology and sample rate.",
                     path_ + " Mu " + std::to_string(Mu) + ", grid width " + std::to_string(GridWidth));

    const int lPrimes = static_cast<int>(Wt.front().size()), kPrimes = static_cast<int>(Wf.front().size());
    std::array<int, 14> symbolIndex{};
    for (std::size_t i = 0; i < symbolList_.size(); ++i) symbolIndex[static_cast<std::size_t>(symbolList_[i])] = static_cast<int>(i);

    for (const int slot : SlotList) {
        if (slot / slotsPerFrame != frame) continue;
        const int t = slot % slotsPerFrame;
        for (const int l : symbolList_)
            for (std::size_t a = 0; a < antennas; ++a)
                symbolFlags[a][static_cast<std::size_t>(t * SymbolsPerSlot + l)] |= firstChannel ? 3 : 1;
        if (RbNumber <= 0) continue;

        // r(m) of TS 38.211 clause 7.4.1.5.2 for each symbol of the slot, scaled by beta.
        for (std::size_t i = 0; i < symbolList_.size(); ++i) {
            const std::uint64_t symbol = static_cast<std::uint64_t>(symbolList_[i] + 1 + SymbolsPerSlot * t);
            const std::uint64_t id = static_cast<std::uint32_t>(NId);
            const std::uint64_t cInit = ((((2 * id + 1) * symbol) << 10) + id) & 0x7FFFFFFFu;
            PN_Generator(Pn, 2 * sequenceLength_, static_cast<int>(cInit));
            auto& values = Values[i];
            for (int m = 0; m < sequenceLength_; ++m)
                values[static_cast<std::size_t>(m)] = complex(1.0 - 2.0 * Pn[static_cast<std::size_t>(2 * m)],
                                                              1.0 - 2.0 * Pn[static_cast<std::size_t>(2 * m + 1)]) *
                                                      (kQpsk * Amplitude);
        }

        for (int n = firstCrb_; n <= lastCrb_; ++n) {
            if (Density == 0.5 && n % 2 != (OddPrbs ? 1 : 0)) continue;
            for (std::size_t e = 0; e < CsiLocations.size(); ++e) {
                const auto [kBar, lBar] = CsiLocations[e];
                const int group = CsiGroups[e];
                for (int kp = 0; kp < kPrimes; ++kp) {
                    int column = PointOffset + 12 * n + kBar + kp;
                    if (column >= GridWidth) column -= GridWidth;
                    if (column < 0) column += GridWidth;
                    const int m = sequenceIndex(n, kBar, kp);
                    for (int lp = 0; lp < lPrimes; ++lp) {
                        const int l = lBar + lp;
                        const complex value = Values[static_cast<std::size_t>(symbolIndex[static_cast<std::size_t>(l)])]
                                                    [static_cast<std::size_t>(m)];
                        const std::size_t at = static_cast<std::size_t>(t * SymbolsPerSlot + l) * static_cast<std::size_t>(GridWidth) +
                                               static_cast<std::size_t>(column);
                        for (std::size_t a = 0; a < antennas; ++a) {
                            const int port = a < PortList.size() ? PortList[a] - kFirstPort : -1;
                            if (port >= 0 && port / CdmSize == group) {
                                const auto s = static_cast<std::size_t>(port % CdmSize);
                                grid[a][at] = value * static_cast<double>(Wf[s][static_cast<std::size_t>(kp)] *
                                                                          Wt[s][static_cast<std::size_t>(lp)]);
                                occupancy[a][at] = 1400;
                            } else if (occupancy[a][at] == 0) {
                                occupancy[a][at] = 1401;  // another port's element: nothing sent here
                            }
                        }
                    }
                }
            }
        }
    }
    return true;
}

void CSI_RS_Generator::GetScAllocation(int& first, int& last) const {
    first = 12 * firstCrb_;
    last = 12 * (lastCrb_ + 1) - 1;
}

}  // namespace Orvalis_NR
