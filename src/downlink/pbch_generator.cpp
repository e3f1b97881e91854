#include "downlink/pbch_generator.h"

#include <algorithm>
#include <cmath>
#include <sstream>
#include <stdexcept>

#include "coding/crc.h"
#include "coding/gold_sequence.h"
#include "common/failure.h"
#include "downlink/pbch_payload.h"
#include "downlink/ss_sequences.h"
#include "downlink/ssb_candidates.h"
#include "downlink/ssb_mapping.h"
#include "tables/pbch_tables.h"

namespace Orvalis_NR {

namespace {

constexpr int kCodedBits = 864;    // E of the PBCH, TS 38.212 clause 7.1.5
constexpr int kPbchSymbols = 432;  // QPSK symbols of one block
constexpr int kPolarNMax = 9;
constexpr int kMaxBlockIndexBits = 8;  // the second scrambling uses at most 3 index bits
constexpr double kQpsk = 0.7071067811865476;
// The payload interleaver of TS 38.212 Table 7.1.1-1 places at most 32 bits: A + 8 <= 32.
constexpr int kMaxPayloadLength = 24;
// No frame store is 2^22 subcarriers wide (the transform is at most 2048 times 2048 points), so
// a block centre further out than this can never be mapped; the bound also keeps the column
// arithmetic of the block and of its reservation, scaled by up to 2^6, within int.
constexpr int kMaxBlockOffset = 1 << 24;

std::string setting(const char* name, long long value) {
    return std::string(name) + " " + std::to_string(value);
}

/// The comma list of PowerLevelStr as doubles, with the texts of the list settings on failure.
std::vector<double> parseLevels(const std::string& list) {
    std::vector<double> levels;
    std::istringstream stream(list);
    std::string token;
    while (std::getline(stream, token, ',')) {
        try {
            levels.push_back(std::stod(token));
        } catch (const std::invalid_argument&) {
            throw std::invalid_argument("invalid stod argument");
        } catch (const std::out_of_range&) {
            throw std::out_of_range("stod argument out of range");
        }
    }
    return levels;
}

void requireMu(const char* name, int mu) {
    if (mu < 0 || mu > 6) failWith("The SS/PBCH numerology is out of range (mu 0 to 6).", setting(name, mu));
}

}  // namespace

PBCH_Generator::PBCH_Generator()
    : InterleaverTable(tables::kPbchPayloadInterleaver.begin(),
                       tables::kPbchPayloadInterleaver.end()) {}

bool PBCH_Generator::Init(Models::Nr5g::NRSSPBCH* settings, Models::Nr5g::NRCarrier* carrier,
                          int gridWidth) {
    if (!settings || !carrier) failWith("The SS/PBCH generator has no settings.");

    Name = settings->Name->getValue();
    SsbSymbolsOnly = Name.find("ALLSLOT") == std::string::npos;
    SwapDmrsIndex = Name.find("F00") != std::string::npos || Name.find("f00") != std::string::npos;
    ChannelCodingOn = settings->ChannelCoding->getValue();
    AutoMib = settings->AutoMIB->getValue();
    ScrambleBefore = settings->ScramblingBeforeChannelCoding->getValue();
    ScrambleAfter = settings->ScramblingAfterChannelCoding->getValue();
    Period = static_cast<int>(settings->SSBPeriod->getValue());
    HalfFrame = settings->HalfFrameIndex->getValue();
    CellId = carrier->CellID->getValue();
    Lmax = settings->Lmax->getValue();
    NumerologyValue = static_cast<int>(settings->Numerology->getValue());
    Mu = settings->Mu->getValue();
    Mib = settings->MIB->getValue();
    GridWidth = gridWidth;
    K0 = settings->k0->getValue();
    FreqOffset = settings->FrequencyOffset->getValue();
    SfnStart = settings->SFNStart->getValue();
    Boost = std::pow(10.0, settings->PowerBoosting->getValue() / 20.0);
    if (Lmax < 0) failWith("Lmax is negative.", setting("SSPBCH.Lmax", Lmax));
    // nId1 = CellID / 3 and nId2 = CellID mod 3 index the sequences as shifts: any value from 0
    // up is defined, a negative one would read before them.
    if (CellId < 0) failWith("CellID is negative: the PSS and SSS have no shift for it.", setting("CellID", CellId));
    requireMu("SSPBCH.Mu", Mu);
    if (FreqOffset < -kMaxBlockOffset || FreqOffset > kMaxBlockOffset)
        failWith("FrequencyOffset puts the SS/PBCH block outside every frame store.",
                 setting("SSPBCH.FrequencyOffset", FreqOffset));
    const double pointA = carrier->FrequencyOffsetOfPointA->getValue() / 15000.0 / std::ldexp(1.0, Mu);
    if (!(std::abs(pointA) < kMaxBlockOffset))
        failWith("FrequencyOffsetOfPointA out of range.",
                 "FrequencyOffsetOfPointA " + std::to_string(carrier->FrequencyOffsetOfPointA->getValue()));

    auto source = std::make_unique<DataSourceBlock>();
    source->Init(settings->PayloadData->getValue());
    Source = std::move(source);

    // Without channel coding the block carries 864 source bits and the payload length is unused.
    const int a = ChannelCodingOn ? settings->PayloadDataLength->getValue() : 0;
    if (ChannelCodingOn) {
        if (a < 0 || a > kMaxPayloadLength)
            failWith("PayloadDataLength does not fit the PBCH payload interleaver.",
                     setting("SSPBCH.PayloadDataLength", a));
        InterleavedLength = a + 8;
        PayloadLength = a;
        Polar.Init(a + 32, kCodedBits, kPolarNMax, 1, 0, 0);
        RateMatch.Init(a + 32, kCodedBits, kPolarNMax, 0);
        const PbchInterleaving interleaving = GetPbchInterleaving(a, Lmax, InterleaverTable);
        InterleaverMap = interleaving.destination;
        ScrambleMask = interleaving.scrambleMask;
        PayloadBits.assign(static_cast<std::size_t>(a + 8), 0);
        InterleavedBits.assign(static_cast<std::size_t>(a + 8), 0);
        CrcAttachedBits.assign(static_cast<std::size_t>(a + 32), 0);
        PolarBits.assign(static_cast<std::size_t>(Polar.N), 0);
        CrcBits.assign(static_cast<std::size_t>(CrcLength), 0);
    } else {
        InterleavedLength = 0;
        PayloadLength = kCodedBits;
    }
    RateMatchedBits.assign(kCodedBits, 0);
    ScrambledBits.assign(kCodedBits, 0);

    // Both scramblings draw from the Gold sequence of cInit = CellId: the first up to
    // (v+1)M + 3 bits with v <= 3, the second up to 8 x 864. Drawn once here.
    const int m = ChannelCodingOn ? InterleavedLength - ((Lmax == 4 || Lmax == 8) ? 3 : 6) : 0;
    const int sequenceLength = std::max(kMaxBlockIndexBits * kCodedBits, 4 * m + 3);
    ScramblingSequence.assign(static_cast<std::size_t>(sequenceLength), 0);
    PN_Generator(ScramblingSequence, sequenceLength, CellId);

    Pss.assign(kSyncSequenceLength, 0);
    Sss.assign(kSyncSequenceLength, 0);
    Generate_PSS_Signal(CellId % 3, Pss);
    Generate_SSS_Signal(CellId / 3, CellId % 3, Sss);

    BlockSamples.assign(1152, complex(0.0, 0.0));
    BlockOccupancy.assign(1152, 0);

    const double pssBoost = std::pow(10.0, settings->PSSPowerBoosting->getValue() / 20.0);
    const std::vector<double> levels = parseLevels(settings->PowerLevelStr->getValue());
    PssAmplitude.clear();
    SssAmplitude.clear();
    DmrsAmplitude.clear();
    DataAmplitude.clear();
    for (double level : levels) {
        PssAmplitude.push_back(level * pssBoost);
        SssAmplitude.push_back(level);
        DmrsAmplitude.push_back(level);
        DataAmplitude.push_back(level);
    }

    BlockWidth = kSsbSubcarriers;
    BlockStart = FreqOffset - kSsbSubcarriers / 2;
    PointAOffset = static_cast<int>(pointA);

    CandidateSymbols =
        GetSSBCandidateSymbols(Mu, static_cast<int>(settings->SSB30KSymbolIndex->getValue()));
    if (static_cast<int>(CandidateSymbols.size()) < Lmax) {
        ErrorMessage = "SSBlock Position Calculation Error";
        return false;
    }
    CandidateSymbols.resize(static_cast<std::size_t>(Lmax));
    // Lmax is at most 64 here: the stores of both half frames' blocks.
    PbchSymbols.assign(static_cast<std::size_t>(2 * Lmax), std::vector<complex>(kPbchSymbols));
    DmrsSymbols.assign(static_cast<std::size_t>(2 * Lmax), std::vector<complex>(kPbchDmrsLength));
    return true;
}

void PBCH_Generator::buildActiveBlocks(int frame) {
    const int halfFrame = 70 << Mu;  // symbols of a half frame in the block's numerology
    int repeats = 1;                 // 2 for a 5 ms period: both half frames
    bool active = true;
    switch (Period) {
        case 0:
            repeats = 2;
            break;
        case 1:
            break;
        case 2:
        case 3:
        case 4:
        case 5:
            active = frame % (1 << (Period - 1)) == 0;  // every 2nd, 4th, 8th, 16th frame
            break;
        default:
            failWith("SSBPeriod is not one of its enumerators.", setting("SSPBCH.SSBPeriod", Period));
    }

    ActiveBase = 0;
    ActiveCount = active ? repeats * Lmax : 0;
    ActiveBlocks.clear();
    if (ActiveCount == 0) return;
    if (static_cast<int>(CandidateSymbols.size()) < Lmax || static_cast<int>(PbchSymbols.size()) < ActiveCount)
        failWith("SSBlock Position Calculation Error",
                 setting("SSPBCH.Lmax", Lmax) + " with " + setting("SSPBCH.Mu", Mu));
    // A burst in a half frame other than 0 or 1 would lie outside the radio frame.
    if (Period != 0 && (HalfFrame < 0 || HalfFrame > 1))
        failWith("HalfFrameIndex puts the SS/PBCH burst outside the radio frame.",
                 setting("SSPBCH.HalfFrameIndex", HalfFrame));
    const int offset = Period == 0 ? 0 : halfFrame * HalfFrame;
    for (int r = 0; r < repeats; ++r)
        for (int i = 0; i < Lmax; ++i)
            ActiveBlocks.push_back(CandidateSymbols[i] + offset + r * halfFrame);
}

double PBCH_Generator::levelOf(int block) const {
    if (DataAmplitude.empty()) failWith("PowerLevelStr holds no level.", "SSPBCH.PowerLevelStr \"\"");
    return DataAmplitude[static_cast<std::size_t>(block) % DataAmplitude.size()];
}

bool PBCH_Generator::Generate(int frame) {
    buildActiveBlocks(frame);
    if (ReserveOnly) return true;
    bool capture = true;
    for (int i = 0; i < ActiveCount; ++i) {
        if (levelOf(i) == 0.0) continue;
        generateBlock(i, frame, capture);
        capture = false;
    }
    return true;
}

void PBCH_Generator::generateBlock(int block, int frame, bool capture) {
    const int indexMask = Lmax == 4 ? 3 : 7;
    const int iSsb = block & indexMask;
    const int hrf = Period == 0 ? (block >= Lmax ? 1 : 0) : HalfFrame;
    const int nHf = Lmax == 4 ? hrf : 0;

    if (!ChannelCodingOn) {
        Source->GetOneFrame(RateMatchedBits, kCodedBits);
    } else {
        const int a = PayloadLength;
        // Only the ten low bits of the system frame number reach the block (MIB bits 1 to 6,
        // the timing bits and v = (SFN / 2) mod 4), so the sum is taken modulo 1024, where it
        // cannot overflow, with the same bits as the unreduced number.
        const int sfn = static_cast<int>((static_cast<long long>(SfnStart) + frame) & 1023);
        if (AutoMib) {
            GenerateMIB(PayloadBits, sfn);
        } else {
            // Every block and frame carries the same start of the pattern.
            Source->Reset();
            Source->GetOneFrame(PayloadBits, a);
        }
        Generate_PBCH_Payload(PayloadBits, a, sfn, hrf, block % Lmax, Lmax,
                              Mib ? Mib->SsbSubcarrierOffset->getValue() : 0);
        for (int k = 0; k < InterleavedLength; ++k)
            InterleavedBits[InterleaverMap[k]] = PayloadBits[k];

        if (ScrambleBefore) {
            // TS 38.212 clause 7.1.2: M bits per SFN pair, offset by v = (SFN/2) mod 4.
            const int m = InterleavedLength - ((Lmax == 4 || Lmax == 8) ? 3 : 6);
            const char* c = ScramblingSequence.data() + ((sfn >> 1) & 3) * m;
            for (int k = 0; k < InterleavedLength; ++k)
                if (ScrambleMask[k]) InterleavedBits[k] ^= *c++;
        }

        NR_CRC(CRC_24C, InterleavedLength, InterleavedBits, CrcBits);
        std::copy(InterleavedBits.begin(), InterleavedBits.end(), CrcAttachedBits.begin());
        std::copy(CrcBits.begin(), CrcBits.end(), CrcAttachedBits.begin() + InterleavedLength);
        Polar.Encode(CrcAttachedBits, PolarBits);
        RateMatch.Go(PolarBits, RateMatchedBits);
        if (capture) {
            CapturedInterleaved = InterleavedBits;
            CapturedCrcAttached = CrcAttachedBits;
            CapturedPolar = PolarBits;
            CapturedRateMatched = RateMatchedBits;
        }
    }

    if (ScrambleAfter) {
        // TS 38.211 clause 7.3.3.1: 864 bits per block index v, v the 2 or 3 LSBs of i.
        const char* c = ScramblingSequence.data() + iSsb * kCodedBits;
        for (int n = 0; n < kCodedBits; ++n) ScrambledBits[n] = RateMatchedBits[n] ^ c[n];
    } else {
        ScrambledBits = RateMatchedBits;
    }

    std::vector<complex>& symbols = PbchSymbols[block];
    for (int k = 0; k < kPbchSymbols; ++k)
        symbols[k] = complex(ScrambledBits[2 * k] == 0 ? kQpsk : -kQpsk,
                             ScrambledBits[2 * k + 1] == 0 ? kQpsk : -kQpsk);

    Generate_PBCH_DMRS_Signal(iSsb, CellId, nHf, DmrsSymbols[block], SwapDmrsIndex);
}

void PBCH_Generator::GenerateMIB(BitSequence& mib, int sfn) {
    if (mib.size() < 24)
        failWith("The MIB needs 24 bits of payload.", setting("SSPBCH.PayloadDataLength", PayloadLength));
    if (!Mib) failWith("The SS/PBCH item has no MIB.", "SSPBCH.MIB");
    auto bit = [](int value, int position) { return static_cast<char>((value >> position) & 1); };

    mib[0] = 0;  // choice of BCCH-BCH-Message: mib
    for (int j = 0; j < 6; ++j) mib[1 + j] = bit(sfn, 9 - j);
    // subCarrierSpacingCommon: scs15or60 is 0, scs30or120 is 1
    mib[7] = (static_cast<int>(Mib->SubcarrierSpacingCommon->getValue()) & ~2) == 0 ? 0 : 1;
    const int kSsb = Mib->SsbSubcarrierOffset->getValue();
    for (int j = 0; j < 4; ++j) mib[8 + j] = bit(kSsb, 3 - j);
    mib[12] = Mib->DmrstypeApos->getValue() == 2 ? 0 : 1;
    const int sib1 = Mib->PdcchConfigSIB1->getValue();
    for (int j = 0; j < 8; ++j) mib[13 + j] = bit(sib1, 7 - j);
    mib[21] = static_cast<char>(Mib->CellBarred->getValue());
    mib[22] = static_cast<char>(Mib->IntraFreqReselection->getValue());
    mib[23] = 0;  // spare
}

void PBCH_Generator::reserve(OccupancyGrid& occupancy, int firstSymbol, int lastSymbol,
                             long long firstColumn, long long endColumn) const {
    if (firstColumn >= endColumn || firstSymbol > lastSymbol) return;
    // Negative columns wrap to the top of the store: the span must lie within one width.
    for (const auto& row : occupancy)
        if (firstSymbol < 0 || firstColumn < -static_cast<long long>(GridWidth) || endColumn > GridWidth ||
            static_cast<long long>(lastSymbol + 1) * GridWidth > static_cast<long long>(row.size()))
            failWith("The SS/PBCH reservation lies outside the frame store.",
                     setting("SSPBCH.FrequencyOffset", FreqOffset) + ", columns " +
                         std::to_string(firstColumn) + " to " + std::to_string(endColumn - 1) +
                         ", symbols " + std::to_string(firstSymbol) + " to " +
                         std::to_string(lastSymbol) + ", store of " + std::to_string(GridWidth) +
                         " subcarriers");
    for (auto& row : occupancy) {
        for (int s = firstSymbol; s <= lastSymbol; ++s) {
            int* symbol = row.data() + static_cast<std::size_t>(s) * GridWidth;
            for (long long column = firstColumn; column < endColumn; ++column) {
                int& value = symbol[column < 0 ? column + GridWidth : column];
                if (value == 0) value = kOccupancySsbUnused;
            }
        }
    }
}

bool PBCH_Generator::Map(SlotGrid& grid, OccupancyGrid& occupancy, OccupancyGrid& symbolFlags,
                         bool firstChannel, int gridMu, bool extendedCp) {
    if (gridMu < 0 || gridMu > 6)
        failWith("The frame store's numerology is out of range (mu 0 to 6).", setting("gridMu", gridMu));
    const int gridScale = 1 << gridMu;
    const int blockScale = 1 << Mu;

    // Block symbols lie within the block's radio frame (buildActiveBlocks), at most 140 << 6.
    FirstSymbol.resize(static_cast<std::size_t>(ActiveCount));
    LastSymbol.resize(static_cast<std::size_t>(ActiveCount));
    for (int b = 0; b < ActiveCount; ++b) {
        const int p = ActiveBlocks[b];
        int first = gridScale * p / blockScale;
        int last = ((p + 4) * gridScale - 1) / blockScale;
        if (extendedCp) {
            first = 12 * first / 14;
            last = (12 * last + 13) / 14;
        }
        FirstSymbol[b] = first;
        LastSymbol[b] = last;
    }

    // The block's span in resource blocks of the store, counted from point A. FrequencyOffset
    // and point A are bounded in Init, so the scaled spans fit int; the products are long long.
    const double q = static_cast<double>(blockScale) / gridScale;
    RbStart = static_cast<int>(std::floor((BlockStart - PointAOffset) / 12.0 * q));
    RbEnd = static_cast<int>(std::floor(
                ((kSsbSubcarriers + static_cast<long long>(BlockStart) - PointAOffset) * blockScale - 1) /
                (12.0 * gridScale))) +
            1;
    const int base = static_cast<int>(std::floor(PointAOffset * q));

    if (ActiveCount > 0 &&
        (GridWidth < 1 || occupancy.size() < grid.size() || symbolFlags.size() < grid.size()))
        failWith("The SS/PBCH generator was given a frame store that does not match its width.",
                 "store of " + std::to_string(GridWidth) + " subcarriers and " +
                     std::to_string(grid.size()) + " antennas");

    bool firstMapped = true;
    for (int b = 0; b < ActiveCount; ++b) {
        if (levelOf(b) == 0.0) continue;
        const int p = ActiveBlocks[b];

        if (!ReserveOnly) {
            // Negative frequencies sit at the top of the store.
            if (BlockStart < -GridWidth || BlockStart + BlockWidth > GridWidth)
                failWith("FrequencyOffset puts the SS/PBCH block outside the frame store.",
                         setting("SSPBCH.FrequencyOffset", FreqOffset) + " in a store of " +
                             std::to_string(GridWidth) + " subcarriers");
            const std::size_t end = static_cast<std::size_t>(p + kSsbSymbols) * GridWidth;
            for (std::size_t a = 0; a < grid.size(); ++a)
                if (end > grid[a].size() || end > occupancy[a].size() ||
                    static_cast<std::size_t>(p + kSsbSymbols) > symbolFlags[a].size())
                    failWith("The SS/PBCH block lies outside the frame store.",
                             setting("SSPBCH.Mu", Mu) + " at symbol " + std::to_string(p) +
                                 " in a store of numerology mu " + std::to_string(gridMu));

            const std::size_t level = static_cast<std::size_t>(b);
            const auto at = [level](const std::vector<double>& list) {
                return list[level % list.size()];
            };
            Map_SSBlock_Signal(Pss, Sss, PbchSymbols[b], DmrsSymbols[b], BlockSamples, BlockWidth,
                               Boost * at(PssAmplitude), Boost * at(SssAmplitude),
                               Boost * at(DmrsAmplitude), Boost * at(DataAmplitude), CellId,
                               BlockOccupancy);
            const int flag = firstChannel && firstMapped ? 3 : 1;
            firstMapped = false;
            for (std::size_t a = 0; a < grid.size(); ++a) {
                for (int s = 0; s < kSsbSymbols; ++s) {
                    const std::size_t row = static_cast<std::size_t>(p + s) * GridWidth;
                    for (int k = 0; k < BlockWidth; ++k) {
                        int c = BlockStart + k;
                        if (c < 0) c += GridWidth;
                        grid[a][row + c] = BlockSamples[s * BlockWidth + k];
                        occupancy[a][row + c] = BlockOccupancy[s * BlockWidth + k];
                    }
                    symbolFlags[a][p + s] |= flag;
                }
            }
        }

        // Withhold whole resource blocks from the later channels.
        const int firstSymbol = SsbSymbolsOnly ? FirstSymbol[b] : 14 * (p / 14);
        const int lastSymbol = SsbSymbolsOnly ? LastSymbol[b] : 14 * (p / 14) + 13;
        reserve(occupancy, firstSymbol, lastSymbol, base + 12LL * RbStart, base + 12LL * RbEnd);
    }
    return true;
}

Models::Nr5g::Numerology PBCH_Generator::GetNumerology() {
    return static_cast<Models::Nr5g::Numerology>(NumerologyValue);
}

}  // namespace Orvalis_NR
