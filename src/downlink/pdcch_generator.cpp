#include "downlink/pdcch_generator.h"

#include <algorithm>
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <stdexcept>

#include "coding/crc.h"
#include "coding/gold_sequence.h"
#include "common/failure.h"
#include "common/log.h"
#include "downlink/integer_list.h"

namespace Orvalis_NR {

using Models::Nr5g::PDCCHSearchSpace;

namespace {

constexpr double kQpsk = 0.7071067811865476;
constexpr int kPolarNMax = 9;
constexpr int kCrcLength = 24;
constexpr int kGCrc24C = 0x1B2B117;  // TS 38.212 clause 5.1
constexpr int kMaxDciBits = 140;    // K = A + 24 within the 164 of the input interleaver
constexpr int kBitsPerReg = 18;     // 9 QPSK data symbols beside 3 DM-RS, TS 38.211 7.3.2.5

std::string quoted(const std::string& text) { return "\"" + text + "\""; }

}  // namespace

void PDCCH_Generator::Init(Models::Nr5g::NR5GWaveformSettings* waveform,
                           Models::Nr5g::NRCarrier* carrier, Models::Nr5g::NRDCI* dci,
                           Models::Nr5g::NRDLBWP* bwp) {
    if (!waveform || !carrier || !dci) fail("PDCCH_Generator::Init: missing settings.");
    path_ = "DCI " + quoted(dci->Name->getValue());
    if (!bwp) failWith("The DCI has no bandwidth part.", path_ + " BWPIndex " + std::to_string(dci->BWPIndex->getValue()));
    Bwp = bwp;
    numerology_ = bwp->Numerology->getValue();
    InitialBwp = bwp->InitialDLBWP->getValue();
    const int mu = bwp->Mu->getValue();
    if (mu < 0 || mu > 4) failWith("The bandwidth part's Mu is outside 0..4.", path_ + " Mu " + std::to_string(mu));
    Mu2 = 1 << mu;
    SymbolsPerSlot = numerology_ == Models::Nr5g::Numerology::SCS60kECP ? 12 : 14;

    readCoreset(dci);

    // Identities of TS 38.211 clauses 7.3.2.3 and 7.4.1.3.1: -1 stands for the cell identity,
    // and a common search space scrambles its data with the cell identity and n_RNTI 0.
    const bool common = dci->SearchSpace->getValue() == PDCCHSearchSpace::Common;
    const int cellId = carrier->CellID->getValue();
    const int scramblingId = dci->PDCCHDMRSScramblingID->getValue();
    DmrsScramblingId = scramblingId == -1 ? cellId : scramblingId;
    DataScramblingId = (scramblingId == -1 || common) ? cellId : scramblingId;
    ScrambleRnti = (common || scramblingId == -1) ? 0 : dci->CRNTI->getValue();
    Rnti = dci->RNTI->getValue();
    CodingOn = dci->ChannelCoding->getValue();
    ScramblingOn = dci->Scrambling->getValue();

    // Payload source: the DCIBits string under AutoDCI, else the PayloadData stream.
    auto source = std::make_unique<DataSourceBlock>();
    const bool autoDci = dci->AutoDCI->getValue();
    if (autoDci) {
        const std::string text = dci->DCIBits->getValue();
        if (text.empty()) failWith("AutoDCI is on but DCIBits is empty.", path_ + " DCIBits \"\"");
        std::vector<char> bits(text.size());
        std::transform(text.begin(), text.end(), bits.begin(), [](char c) { return static_cast<char>(c == '1'); });
        source->Init(std::move(bits));
    } else {
        source->Init(dci->PayloadData->getValue());
    }
    Source = std::move(source);

    SlotList = parseIntegerList(dci->SlotIndexArrayStr->getValue(), path_ + " SlotIndexArrayStr");
    CceOffsets = parseIntegerList(dci->CCEOffsetStr->getValue(), path_ + " CCEOffsetStr");
    for (int slot : SlotList)
        if (slot < 0) failWith("A slot number is negative.", path_ + " SlotIndexArrayStr " + quoted(dci->SlotIndexArrayStr->getValue()));

    NumberOfCCE = dci->NumberOfCCE->getValue();
    if (NumberOfCCE < 1 || NumberOfCCE > 16 * 16)
        failWith("NumberOfCCE must be 1 to 256.", path_ + " NumberOfCCE " + std::to_string(NumberOfCCE));
    RegsPerSymbol = NumberOfCCE * 6 / CoresetSymbols;
    CodedBits = (LastSymbol - FirstSymbol + 1) * RegsPerSymbol * kBitsPerReg;
    SymbolCount = CodedBits / 2;

    if (CodingOn) {
        PayloadLength = autoDci ? dci->DCIBitsLength->getValue() : dci->PayloadSize->getValue();
        const char* lengthName = autoDci ? " DCIBitsLength " : " PayloadSize ";
        if (PayloadLength < 1 || PayloadLength > kMaxDciBits)
            failWith("The DCI size must be 1 to 140 bits.", path_ + lengthName + std::to_string(PayloadLength));
        const int k = PayloadLength + kCrcLength;
        if (k > CodedBits)
            failWith("The DCI and its CRC do not fit the coded bits of its CCEs.",
                     path_ + lengthName + std::to_string(PayloadLength) + ", NumberOfCCE " + std::to_string(NumberOfCCE));
        Polar.Init(k, CodedBits, kPolarNMax, 1, 0, 0);
        RateMatch.Init(k, CodedBits, kPolarNMax, 0);
        PayloadBits.assign(static_cast<std::size_t>(PayloadLength), 0);
        CrcBits.assign(kCrcLength, 0);
        CrcAttachedBits.assign(static_cast<std::size_t>(k), 0);
        PolarBits.assign(static_cast<std::size_t>(Polar.N), 0);
    } else {
        PayloadLength = CodedBits;
    }
    RateMatchedBits.assign(static_cast<std::size_t>(CodedBits), 0);
    ScrambledBits.assign(static_cast<std::size_t>(CodedBits), 0);
    DataSymbols.assign(static_cast<std::size_t>(SymbolCount), complex{});

    // The data scrambling of TS 38.211 clause 7.3.2.3 does not depend on the slot.
    ScramblingBits.assign(static_cast<std::size_t>(CodedBits), 0);
    const auto dataInit = (static_cast<std::uint64_t>(static_cast<std::uint32_t>(ScrambleRnti)) << 16) +
                          static_cast<std::uint64_t>(static_cast<std::uint32_t>(DataScramblingId));
    PN_Generator(ScramblingBits, CodedBits, static_cast<int>(dataInit & 0x7FFFFFFFu));

    DataAmplitude = std::pow(10.0, dci->PowerBoosting->getValue() / 20.0);
    DmrsAmplitude = DataAmplitude * std::pow(10.0, dci->DMRSPowerBoosting->getValue() / 20.0);

    buildInterleaver();
    buildOccasionMasks();
    RbMask.assign(static_cast<std::size_t>(CoresetSymbols), std::vector<int>(static_cast<std::size_t>(CoresetRbs)));

    const double pointA = carrier->FrequencyOffsetOfPointA->getValue();
    if (!(std::abs(pointA) <= 1.0e10))
        failWith("FrequencyOffsetOfPointA out of range.", "FrequencyOffsetOfPointA " + std::to_string(pointA));
    BwpCarrierOffset = static_cast<int>(pointA / 15000.0 / Mu2) + 12 * Bwp->RBOffset->getValue();
    const double rate = waveform->SampleRateAuto->getValue();
    const double width = rate / (15000.0 * Mu2);
    if (!(width >= 12.0 && width <= 1.0e6))
        failWith("SampleRateAuto gives no usable grid for the PDCCH.", "SampleRateAuto " + std::to_string(rate));
    GridWidth = static_cast<int>(width);
    for (const auto& rb : walk_) {
        const int low = BwpCarrierOffset + 12 * rb.bwpRb, high = low + 11;
        if (low < -GridWidth || high >= 2 * GridWidth)
            failWith("The CORESET lies outside the band of the sample rate.",
                     path_ + " CORESET RB " + std::to_string(rb.bwpRb) + ", SampleRateAuto " + std::to_string(rate));
    }

    dmrsBits_.assign(static_cast<std::size_t>(2 * dmrsLength_), 0);
    Dmrs.assign(static_cast<std::size_t>(CoresetSymbols), std::vector<complex>(static_cast<std::size_t>(dmrsLength_)));
}

void PDCCH_Generator::readCoreset(Models::Nr5g::NRDCI* dci) {
    const int index = dci->CoresetIndex->getValue();
    std::shared_ptr<Models::Nr5g::NRCORESET> chosen;
    if (index == 0) chosen = Bwp->Coreset0->getValue();
    if (index == 1) chosen = Bwp->Coreset1->getValue();
    if (index == 2) chosen = Bwp->Coreset2->getValue();
    if (!chosen) failWith("CoresetIndex names no CORESET of the bandwidth part.", path_ + " CoresetIndex " + std::to_string(index));
    Coreset = chosen.get();

    const int id = Coreset->ID->getValue();
    const std::string where = path_ + " Coreset" + std::to_string(index);
    CoresetSymbols = Coreset->SymbolNumber->getValue();
    if (CoresetSymbols < 1 || CoresetSymbols > 3)
        failWith("The CORESET must have 1 to 3 symbols.", where + ".SymbolNumber " + std::to_string(CoresetSymbols));
    FirstSymbol = dci->FirstSymbol->getValue();
    LastSymbol = FirstSymbol + CoresetSymbols - 1;
    if (FirstSymbol < 0 || LastSymbol >= SymbolsPerSlot)
        failWith("The CORESET does not fit the slot.", path_ + " FirstSymbol " + std::to_string(FirstSymbol));

    FrequencyBitmap = Coreset->FrequencyDomainBitmap->getValue();
    Interleaved = Coreset->CceInterleaved->getValue();
    RegBundle = Coreset->RegBundleSize->getValue();
    const int bwpRbs = Bwp->RBNumber->getValue();
    const int bwpStart = Bwp->RBOffset->getValue();
    if (bwpRbs < 1 || bwpRbs > 275 || bwpStart < 0 || bwpStart > 275 * 16)
        failWith("The bandwidth part has no usable RB range.", path_ + " RBOffset " + std::to_string(bwpStart) +
                                                                   ", RBNumber " + std::to_string(bwpRbs));

    walk_.clear();
    if (id == 0 && InitialBwp) {
        // CORESET 0 of the initial BWP: contiguous RBs, DM-RS counted from its own first RB.
        CoresetRbs = Coreset->RBNumber->getValue();
        const int start = coresetStart();  // an offset of -1 starts on the six-RB grid
        if (CoresetRbs < 1 || start < 0 || start + CoresetRbs > bwpRbs)
            failWith("CORESET 0 does not fit the bandwidth part.", where + ".RBOffset " + std::to_string(Coreset->RBOffset->getValue()) +
                                                                       ", RBNumber " + std::to_string(CoresetRbs));
        for (int i = 0; i < CoresetRbs; ++i) walk_.push_back({start + i, 3 * i});
    } else {
        for (char c : FrequencyBitmap)
            if (c != '0' && c != '1')
                failWith("FrequencyDomainBitmap holds a character other than 0 and 1.",
                         where + ".FrequencyDomainBitmap " + quoted(FrequencyBitmap));
        const int ones = static_cast<int>(std::count(FrequencyBitmap.begin(), FrequencyBitmap.end(), '1'));
        CoresetRbs = id == 0 ? Coreset->RBNumber->getValue() : 6 * ones;
        // Groups of six RBs from the start; gaps keep the DM-RS aligned to common RBs.
        const int start = coresetStart();
        if (start < 0 || start > bwpRbs)
            failWith("The CORESET starts outside the bandwidth part.", where + ".RBOffset " + std::to_string(start));
        for (std::size_t g = 0; g < FrequencyBitmap.size(); ++g) {
            if (FrequencyBitmap[g] != '1') continue;
            const int first = start + 6 * static_cast<int>(g);
            if (first + 6 > bwpRbs)
                failWith("FrequencyDomainBitmap does not fit the bandwidth part.",
                         where + ".FrequencyDomainBitmap " + quoted(FrequencyBitmap) + ", BWP RBNumber " + std::to_string(bwpRbs));
            for (int r = first; r < first + 6; ++r) walk_.push_back({r, 3 * (bwpStart + r)});
        }
        if (CoresetRbs < 1) failWith("The CORESET has no resource block.", where + ".FrequencyDomainBitmap " + quoted(FrequencyBitmap));
    }

    // DM-RS from common RB 0 over the BWP start and the bitmap's reach, TS 38.211 7.4.1.3.2.
    const int reach = bwpStart + 6 * (static_cast<int>(FrequencyBitmap.size()) + 1);
    int needed = 0;
    for (const auto& rb : walk_) needed = std::max(needed, rb.dmrsIndex / 3 + 1);
    dmrsLength_ = 3 * std::max(reach, needed);

    // REG bundles of TS 38.211 clause 7.3.2.2.
    if (Interleaved) {
        interleaverSize_ = Coreset->InterleaverSize->getValue();
        shiftIndex_ = Coreset->ShiftIndex->getValue();
        if (RegBundle != 2 && RegBundle != 3 && RegBundle != 6)
            failWith("RegBundleSize must be 2, 3 or 6.", where + ".RegBundleSize " + std::to_string(RegBundle));
        if (interleaverSize_ != 2 && interleaverSize_ != 3 && interleaverSize_ != 6)
            failWith("InterleaverSize must be 2, 3 or 6.", where + ".InterleaverSize " + std::to_string(interleaverSize_));
        if (shiftIndex_ < 0 || shiftIndex_ > 274)
            failWith("ShiftIndex must be 0 to 274.", where + ".ShiftIndex " + std::to_string(shiftIndex_));
    }
}

int PDCCH_Generator::coresetStart() const {
    const int offset = Coreset->RBOffset->getValue();
    if (offset != -1) return offset;
    // The first RB group starts at the first common RB of the BWP that is a multiple of 6.
    const int bwpStart = Bwp->RBOffset->getValue();
    return (6 - bwpStart % 6) % 6;
}

void PDCCH_Generator::buildInterleaver() {
    const int l = Interleaved ? RegBundle : 6;
    const int r = Interleaved ? interleaverSize_ : 1;
    const int n = Interleaved ? shiftIndex_ : 0;
    const int total = CoresetRbs * CoresetSymbols;
    const int c = total / (l * r);
    if (c < 1)
        failWith("The CORESET is too small for its REG bundles.",
                 path_ + " CORESET REGs " + std::to_string(total) + ", RegBundleSize " + std::to_string(l) +
                     ", InterleaverSize " + std::to_string(r));
    RegInterleaver.resize(static_cast<std::size_t>(c * r));
    for (int j = 0; j < c * r; ++j) RegInterleaver[static_cast<std::size_t>(j)] = (j / r + (j % r) * c + n) % (total / l);
    bundleSize_ = l;
}

void PDCCH_Generator::fillMask(int cceOffset, std::vector<std::vector<int>>::iterator rows) const {
    for (int s = 0; s < CoresetSymbols; ++s) std::fill(rows[s].begin(), rows[s].end(), 0);
    const int bundles = 6 / bundleSize_;
    const int tableSize = static_cast<int>(RegInterleaver.size());
    const int rbCount = std::min(CoresetRbs, static_cast<int>(walk_.size()));
    for (int cce = cceOffset; cce < cceOffset + NumberOfCCE; ++cce) {
        for (int b = 0; b < bundles; ++b) {
            const int x = cce * 6 / bundleSize_ + b;
            if (cce < 0 || x >= tableSize)
                failWith("The DCI's CCEs run past the CORESET.",
                         path_ + " CCE offset " + std::to_string(cceOffset) + ", NumberOfCCE " + std::to_string(NumberOfCCE) +
                             ", CCEs in the CORESET " + std::to_string(tableSize * bundleSize_ / 6));
            const int f = RegInterleaver[static_cast<std::size_t>(x)];
            for (int g = f * bundleSize_; g < (f + 1) * bundleSize_; ++g) {
                const int rb = g / CoresetSymbols;
                if (rb >= rbCount)
                    failWith("The DCI's CCEs run past the CORESET's resource blocks.",
                             path_ + " CCE offset " + std::to_string(cceOffset) + ", CORESET RBs " + std::to_string(rbCount));
                rows[g % CoresetSymbols][static_cast<std::size_t>(rb)] = 1;
            }
        }
    }
}

void PDCCH_Generator::buildOccasionMasks() {
    // A mask depends on the CCE offset only, so one block of rows per entry of CceOffsets
    // serves every slot entry that takes that offset (entry i uses offset i mod size).
    const std::size_t rows = static_cast<std::size_t>(CoresetSymbols);
    OccasionMasks.assign(CceOffsets.size() * rows, std::vector<int>(static_cast<std::size_t>(CoresetRbs)));
    for (std::size_t i = 0; i < CceOffsets.size(); ++i)
        fillMask(CceOffsets[i], OccasionMasks.begin() + static_cast<std::ptrdiff_t>(i * rows));
}

void PDCCH_Generator::Generate(int slotInFrame) {
    // DM-RS of TS 38.211 clause 7.4.1.3.1, one sequence per CORESET symbol, from point A.
    for (int l = 0; l < CoresetSymbols; ++l) {
        const auto symbol = static_cast<std::uint64_t>(SymbolsPerSlot * slotInFrame + 1 + FirstSymbol + l);
        const auto id2 = 2 * static_cast<std::uint64_t>(static_cast<std::uint32_t>(DmrsScramblingId));
        const std::uint64_t cInit = (((symbol * (id2 + 1)) << 17) + id2) & 0x7FFFFFFFu;
        PN_Generator(dmrsBits_, 2 * dmrsLength_, static_cast<int>(cInit));
        auto& row = Dmrs[static_cast<std::size_t>(l)];
        for (int m = 0; m < dmrsLength_; ++m)
            row[static_cast<std::size_t>(m)] = complex(1.0 - 2.0 * dmrsBits_[static_cast<std::size_t>(2 * m)],
                                                       1.0 - 2.0 * dmrsBits_[static_cast<std::size_t>(2 * m + 1)]) *
                                               kQpsk;
    }

    if (CodingOn) {
        // CRC24C over 24 leading ones and the payload, the last 16 check bits masked by the
        // RNTI, most significant bit first (TS 38.212 clause 7.3.2).
        Source->GetOneFrame(PayloadBits, PayloadLength);
        CRC(kCrcLength, kGCrc24C, CrcPreset, PayloadLength, PayloadBits.data(), CrcBits.data());
        for (int i = 0; i < 16; ++i) CrcBits[static_cast<std::size_t>(8 + i)] ^= static_cast<char>((Rnti >> (15 - i)) & 1);
        std::copy(PayloadBits.begin(), PayloadBits.end(), CrcAttachedBits.begin());
        std::copy(CrcBits.begin(), CrcBits.end(), CrcAttachedBits.begin() + PayloadLength);
        Polar.Encode(CrcAttachedBits, PolarBits);
        RateMatch.Go(PolarBits, RateMatchedBits);
    } else {
        Source->GetOneFrame(RateMatchedBits, CodedBits);
    }

    for (int i = 0; i < CodedBits; ++i) {
        const auto at = static_cast<std::size_t>(i);
        ScrambledBits[at] = ScramblingOn ? static_cast<char>((RateMatchedBits[at] ^ ScramblingBits[at]) & 1)
                                         : RateMatchedBits[at];
    }
    for (int m = 0; m < SymbolCount; ++m) {
        const auto at = static_cast<std::size_t>(2 * m);
        DataSymbols[static_cast<std::size_t>(m)] =
            complex(ScrambledBits[at] ? -kQpsk : kQpsk, ScrambledBits[at + 1] ? -kQpsk : kQpsk);
    }
}

void PDCCH_Generator::Map(SlotGrid& grid, OccupancyGrid& occupancy, int frame, OccupancyGrid& symbolFlags,
                          bool firstChannel) {
    const int slotsPerFrame = 10 * Mu2;
    const std::size_t symbolsPerFrame = static_cast<std::size_t>(SymbolsPerSlot * slotsPerFrame);
    const std::size_t rowLength = symbolsPerFrame * static_cast<std::size_t>(GridWidth);
    const std::size_t antennas = grid.size();
    if (occupancy.size() != antennas || symbolFlags.size() < antennas)
        fail("PDCCH_Generator::Map: frame stores of different antenna counts.");
    for (std::size_t a = 0; a < antennas; ++a)
        if (grid[a].size() != rowLength || occupancy[a].size() != rowLength || symbolFlags[a].size() < symbolsPerFrame)
            failWith("The frame store does not match the PDCCH's numerology and sample rate.",
                     path_ + " Mu " + std::to_string(Bwp->Mu->getValue()) + ", grid width " + std::to_string(GridWidth));

    const std::size_t rows = static_cast<std::size_t>(CoresetSymbols);
    for (std::size_t entry = 0; entry < SlotList.size(); ++entry) {
        const int slot = SlotList[entry];
        if (slot / Mu2 / 10 != frame) continue;
        const int t = slot % slotsPerFrame;
        Generate(t);
        const std::size_t block = (entry % CceOffsets.size()) * rows;
        for (std::size_t l = 0; l < rows; ++l) RbMask[l] = OccasionMasks[block + l];

        for (int l = 0; l < CoresetSymbols; ++l) {
            const auto symbol = static_cast<std::size_t>(t * SymbolsPerSlot + FirstSymbol + l);
            for (std::size_t a = 0; a < antennas; ++a) symbolFlags[a][symbol] |= firstChannel ? 3 : 1;
        }

        // Data frequency first, then time (TS 38.211 clause 7.3.2.5); DM-RS on k mod 4 = 1.
        int dataIndex = 0;
        for (int l = 0; l < CoresetSymbols; ++l) {
            const auto& mask = RbMask[static_cast<std::size_t>(l)];
            const auto& dmrs = Dmrs[static_cast<std::size_t>(l)];
            const std::size_t rowBase = static_cast<std::size_t>(t * SymbolsPerSlot + FirstSymbol + l) *
                                        static_cast<std::size_t>(GridWidth);
            const int rbCount = std::min(CoresetRbs, static_cast<int>(walk_.size()));
            for (int i = 0; i < rbCount; ++i) {
                if (!mask[static_cast<std::size_t>(i)]) continue;
                const auto& rb = walk_[static_cast<std::size_t>(i)];
                for (int k = 0; k < 12; ++k) {
                    int column = BwpCarrierOffset + 12 * rb.bwpRb + k;
                    if (column >= GridWidth) column -= GridWidth;
                    if (column < 0) column += GridWidth;
                    const std::size_t at = rowBase + static_cast<std::size_t>(column);
                    if (k % 4 == 1) {
                        const complex value = dmrs[static_cast<std::size_t>(rb.dmrsIndex + k / 4)] * DmrsAmplitude;
                        for (std::size_t a = 0; a < antennas; ++a) {
                            grid[a][at] = value;
                            occupancy[a][at] = 6;
                        }
                        continue;
                    }
                    if (dataIndex >= SymbolCount) continue;
                    const complex value = DataSymbols[static_cast<std::size_t>(dataIndex)] * DataAmplitude;
                    bool taken = false;
                    for (std::size_t a = 0; a < antennas; ++a) {
                        if (occupancy[a][at] != 0) continue;  // an earlier channel holds it here
                        occupancy[a][at] = 5;
                        grid[a][at] = value;
                        taken = true;
                    }
                    if (taken) ++dataIndex;
                }
            }
        }
    }
}

void PDCCH_Generator::GetCoresetMap(std::vector<int>& rbMap) {
    const int bwpRbs = Bwp ? Bwp->RBNumber->getValue() : 0;
    rbMap.assign(static_cast<std::size_t>(std::max(bwpRbs, 0)), 0);
    if (!Coreset || Coreset->ID->getValue() == 0) return;
    const int start = coresetStart();
    for (int r = std::max(start, 0); r < bwpRbs; ++r) {
        const auto group = static_cast<std::size_t>((r - start) / 6);
        if (group < FrequencyBitmap.size() && FrequencyBitmap[group] != '0') rbMap[static_cast<std::size_t>(r)] = 1;
    }
}

void PDCCH_Generator::GetCoresetSymbol(int& first, int& last) {
    first = FirstSymbol;
    last = FirstSymbol + CoresetSymbols - 1;
}

void PDCCH_Generator::GetScAllocation(int& first, int& last) {
    const int bwpStart = Bwp ? Bwp->RBOffset->getValue() : 0;
    int low = 0, high = -1;
    for (const auto& rb : walk_) {
        if (high < low) low = high = rb.bwpRb;
        low = std::min(low, rb.bwpRb);
        high = std::max(high, rb.bwpRb);
    }
    first = 12 * (bwpStart + low);
    last = 12 * (bwpStart + high) + 11;
}

Models::Nr5g::Numerology PDCCH_Generator::GetNumerology() { return numerology_; }

}  // namespace Orvalis_NR
