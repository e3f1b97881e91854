#include "downlink/pbch_generator.h"

#include <algorithm>
#include <cmath>
#include <sstream>
#include <stdexcept>

#include "coding/crc.h"
#include "coding/gold_sequence.h"
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

std::string text(const char* what, int value) {
    return std::string(what) + std::to_string(value);
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

void requireMu(const char* what, int mu) {
    if (mu < 0 || mu > 6) throw std::invalid_argument(text(what, mu));
}

}  // namespace

PBCH_Generator::PBCH_Generator()
    : InterleaverTable(tables::kPbchPayloadInterleaver.begin(),
                       tables::kPbchPayloadInterleaver.end()) {}

bool PBCH_Generator::Init(Models::Nr5g::NRSSPBCH* settings, Models::Nr5g::NRCarrier* carrier,
                          int gridWidth) {
    if (!settings) throw std::invalid_argument("PBCH_Generator::Init: no NRSSPBCH settings");
    if (!carrier) throw std::invalid_argument("PBCH_Generator::Init: no NRCarrier");

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
    if (Lmax < 0 || Lmax > 64) throw std::invalid_argument(text("PBCH_Generator::Init: Lmax ", Lmax));
    if (CellId < 0 || CellId > 1007) throw std::invalid_argument(text("PBCH_Generator::Init: CellID ", CellId));
    requireMu("PBCH_Generator::Init: Mu ", Mu);

    auto source = std::make_unique<DataSourceBlock>();
    source->Init(settings->PayloadData->getValue());
    Source = std::move(source);

    const int a = settings->PayloadDataLength->getValue();
    // K = A + 32 must fit the downlink polar code (at most 164 bits with the interleaver).
    if (a < 1 || a > 132)
        throw std::invalid_argument(text("PBCH_Generator::Init: SSPBCH.PayloadDataLength ", a));
    InterleavedLength = a + 8;
    if (ChannelCodingOn) {
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
        PayloadLength = kCodedBits;
    }
    RateMatchedBits.assign(kCodedBits, 0);
    ScrambledBits.assign(kCodedBits, 0);

    // Both scramblings draw from the Gold sequence of cInit = CellId: the first up to
    // (v+1)M + 3 bits with v <= 3, the second up to 8 x 864. Drawn once here.
    const int m = (Lmax == 4 || Lmax == 8) ? a + 5 : a + 2;
    const int sequenceLength = std::max(kMaxBlockIndexBits * kCodedBits, 4 * m + 3);
    ScramblingSequence.assign(static_cast<std::size_t>(sequenceLength), 0);
    PN_Generator(ScramblingSequence, sequenceLength, CellId);

    Pss.assign(kSyncSequenceLength, 0);
    Sss.assign(kSyncSequenceLength, 0);
    Generate_PSS_Signal(CellId % 3, Pss);
    Generate_SSS_Signal(CellId / 3, CellId % 3, Sss);

    PbchSymbols.assign(static_cast<std::size_t>(2 * Lmax), std::vector<complex>(kPbchSymbols));
    DmrsSymbols.assign(static_cast<std::size_t>(2 * Lmax), std::vector<complex>(kPbchDmrsLength));
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
    PointAOffset = static_cast<int>(carrier->FrequencyOffsetOfPointA->getValue() / 15000.0 /
                                    std::ldexp(1.0, Mu));

    CandidateSymbols =
        GetSSBCandidateSymbols(Mu, static_cast<int>(settings->SSB30KSymbolIndex->getValue()));
    if (static_cast<int>(CandidateSymbols.size()) < Lmax) {
        ErrorMessage = "SSBlock Position Calculation Error";
        return false;
    }
    CandidateSymbols.resize(static_cast<std::size_t>(Lmax));
    return true;
}

void PBCH_Generator::buildActiveBlocks(int frame) {
    const int halfFrame = 70 << Mu;  // symbols of a half frame in the block's numerology
    int repeats = 1;                 // 2 for a 5 ms period: both half frames
    int offset = halfFrame * HalfFrame;
    bool active = true;
    switch (Period) {
        case 0:
            repeats = 2;
            offset = 0;
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
            throw std::invalid_argument(text("PBCH_Generator: SSBPeriod ", Period));
    }

    ActiveBase = 0;
    ActiveCount = active ? repeats * Lmax : 0;
    ActiveBlocks.clear();
    if (ActiveCount == 0) return;
    if (static_cast<int>(CandidateSymbols.size()) < Lmax)
        throw std::out_of_range("PBCH_Generator: SSBlock Position Calculation Error: Mu " +
                                std::to_string(Mu) + " has " +
                                std::to_string(CandidateSymbols.size()) +
                                " candidate blocks, Lmax " + std::to_string(Lmax));
    for (int r = 0; r < repeats; ++r)
        for (int i = 0; i < Lmax; ++i)
            ActiveBlocks.push_back(CandidateSymbols[i] + offset + r * halfFrame);
}

double PBCH_Generator::levelOf(int block) const {
    if (DataAmplitude.empty())
        throw std::invalid_argument("PBCH_Generator: PowerLevelStr holds no level");
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
        const int sfn = SfnStart + frame;
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
        throw std::out_of_range("PBCH_Generator::GenerateMIB: mib holds " +
                                std::to_string(mib.size()) + " bits, 24 needed");
    if (!Mib) throw std::invalid_argument("PBCH_Generator::GenerateMIB: no MIB settings");
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
                             int firstColumn, int endColumn) const {
    for (auto& row : occupancy) {
        for (int s = firstSymbol; s <= lastSymbol; ++s) {
            for (int column = firstColumn; column < endColumn; ++column) {
                const int c = column < 0 ? column + GridWidth : column;
                const long long index = static_cast<long long>(s) * GridWidth + c;
                if (s < 0 || c < 0 || c >= GridWidth || index >= static_cast<long long>(row.size()))
                    throw std::out_of_range("PBCH_Generator::Map: reservation at symbol " +
                                            std::to_string(s) + ", column " +
                                            std::to_string(column) + " lies outside the store");
                int& value = row[static_cast<std::size_t>(index)];
                if (value == 0) value = kOccupancySsbUnused;
            }
        }
    }
}

bool PBCH_Generator::Map(SlotGrid& grid, OccupancyGrid& occupancy, OccupancyGrid& symbolFlags,
                         bool firstChannel, int gridMu, bool extendedCp) {
    requireMu("PBCH_Generator::Map: gridMu ", gridMu);
    const int gridScale = 1 << gridMu;
    const int blockScale = 1 << Mu;

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

    // The block's span in resource blocks of the store, counted from point A.
    const double q = static_cast<double>(blockScale) / gridScale;
    RbStart = static_cast<int>(std::floor((BlockStart - PointAOffset) / 12.0 * q));
    RbEnd = static_cast<int>(
                std::floor(((kSsbSubcarriers + BlockStart - PointAOffset) * blockScale - 1) /
                           (12.0 * gridScale))) +
            1;
    const int base = static_cast<int>(std::floor(PointAOffset * q));

    if (ActiveCount > 0 &&
        (GridWidth < 1 || occupancy.size() < grid.size() || symbolFlags.size() < grid.size()))
        throw std::invalid_argument("PBCH_Generator::Map: store of width " +
                                    std::to_string(GridWidth) + " with " +
                                    std::to_string(grid.size()) + " antennas does not match");

    bool firstMapped = true;
    for (int b = 0; b < ActiveCount; ++b) {
        if (levelOf(b) == 0.0) continue;
        const int p = ActiveBlocks[b];

        if (!ReserveOnly) {
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
                    if (row + GridWidth > grid[a].size() || row + GridWidth > occupancy[a].size() ||
                        static_cast<std::size_t>(p + s) >= symbolFlags[a].size())
                        throw std::out_of_range(text("PBCH_Generator::Map: block symbol ", p + s) +
                                                " lies outside the store");
                    for (int k = 0; k < BlockWidth; ++k) {
                        int c = BlockStart + k;
                        if (c < 0) c += GridWidth;  // negative frequencies sit at the top
                        if (c < 0 || c >= GridWidth)
                            throw std::out_of_range(
                                text("PBCH_Generator::Map: block column ", BlockStart + k) +
                                text(" outside a store of width ", GridWidth));
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
        reserve(occupancy, firstSymbol, lastSymbol, base + 12 * RbStart, base + 12 * RbEnd);
    }
    return true;
}

Models::Nr5g::Numerology PBCH_Generator::GetNumerology() {
    return static_cast<Models::Nr5g::Numerology>(NumerologyValue);
}

}  // namespace Orvalis_NR
