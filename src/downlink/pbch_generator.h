#pragma once
// SS/PBCH block generator: PSS, SSS, PBCH and its DM-RS for every SS/PBCH block of a radio
// frame, written into the frame store of a numerology (TS 38.211 clause 7.4.3, TS 38.212
// clause 7.1, TS 38.213 clause 4.1).

#include <memory>
#include <string>
#include <vector>

#include "coding/coding_types.h"
#include "coding/polar_coding.h"
#include "coding/polar_rate_matching.h"
#include "dsp/slot_grid.h"
#include "models/nr_carrier.h"
#include "models/nr_mib.h"
#include "models/nr_sspbch.h"
#include "payload/data_source.h"

namespace Orvalis_NR {

/// One NRSSPBCH item of a carrier, kept by one numerology generator. Init once, then per frame
/// Generate (all blocks of the frame) and Map (into the store).
class PBCH_Generator {
  public:
    PBCH_Generator();

    std::string ErrorMessage;
    /// Set by the caller after Init when the block's numerology is not the store's: nothing is
    /// sent, Map only withholds the block's resource blocks (occupancy 370).
    bool ReserveOnly = false;
    /// False when Name contains "ALLSLOT": the reservation then spans the block's whole slot.
    bool SsbSymbolsOnly = true;
    int PayloadLength = 0;      ///< A with channel coding, else 864
    int InterleavedLength = 0;  ///< A + 8
    int CrcLength = 24;
    bool ScrambleBefore = true;  ///< first scrambling, TS 38.212 clause 7.1.2
    bool ScrambleAfter = true;   ///< second scrambling, TS 38.211 clause 7.3.3.1
    int Period = 0;              ///< SSBPeriod as its position: 0 = 5 ms .. 5 = 160 ms
    /// First symbol of each of the Lmax candidate blocks in a half frame.
    std::vector<int> CandidateSymbols;
    int HalfFrame = 0;
    int CellId = 0;
    int Lmax = 0;
    int NumerologyValue = 0;  ///< Numerology as its position
    int Mu = 0;
    bool ChannelCodingOn = true;
    bool AutoMib = true;
    std::shared_ptr<Models::Nr5g::NRMIB> Mib;
    PolarCoding Polar;
    RateMatchingPolar RateMatch;
    int GridWidth = 0;  ///< subcarriers of one symbol in the store
    int K0 = 0;
    std::unique_ptr<DataSource> Source;  ///< payload bits, a DataSourceBlock over PayloadData

    // The four coding stages of the first block of the last frame, for the data export.
    BitSequence CapturedInterleaved;
    BitSequence CapturedCrcAttached;
    BitSequence CapturedPolar;
    BitSequence CapturedRateMatched;

    /// The payload then its eight timing bits: A + 8 elements (a-bar of TS 38.212 clause 7.1.1).
    BitSequence PayloadBits;
    BitSequence InterleavedBits;  ///< A + 8
    BitSequence CrcAttachedBits;  ///< A + 32
    BitSequence PolarBits;        ///< N
    BitSequence RateMatchedBits;  ///< 864
    BitSequence ScrambledBits;    ///< 864
    /// Gold sequence of cInit = CellId, long enough for both scramblings of every block.
    BitSequence ScramblingSequence;

    std::vector<std::vector<complex>> PbchSymbols;  ///< 2 Lmax blocks of 432 values
    std::vector<std::vector<complex>> DmrsSymbols;  ///< 2 Lmax blocks of 144 values

    // Linear levels per block, one per token of PowerLevelStr, taken at i mod size.
    std::vector<double> PssAmplitude;
    std::vector<double> SssAmplitude;
    std::vector<double> DmrsAmplitude;
    std::vector<double> DataAmplitude;
    double Boost = 1.0;  ///< 10^(PowerBoosting/20)

    BitSequence Sss;                    ///< 127 values +1/-1
    BitSequence Pss;                    ///< 127 values +1/-1
    std::vector<complex> BlockSamples;  ///< one block, 4 rows of 240
    std::vector<int> BlockOccupancy;

    std::vector<int> ActiveBlocks;  ///< first symbol in the frame of each block of this frame
    std::vector<int> LastSymbol;    ///< per block: last symbol in the store's numerology
    std::vector<int> FirstSymbol;   ///< per block: first symbol in the store's numerology
    int ActiveCount = 0;
    int ActiveBase = 0;
    int FreqOffset = 0;  ///< block centre from the grid centre, in the block's subcarriers
    int BlockWidth = 240;
    int BlockStart = 0;  ///< FreqOffset - 120
    std::string Name;
    int SfnStart = 0;
    int PointAOffset = 0;  ///< FrequencyOffsetOfPointA in subcarriers of the block
    int RbStart = 0;       ///< resource blocks of the store withheld for the block, set by Map
    int RbEnd = 0;
    std::vector<int> InterleaverTable;  ///< TS 38.212 Table 7.1.1-1

    /// Where each payload bit goes in the interleaver, and which positions are scrambled.
    std::vector<int> InterleaverMap;
    BitSequence ScrambleMask;
    BitSequence CrcBits;         ///< 24 check bits of the block being coded
    bool SwapDmrsIndex = false;  ///< Name contains "F00" or "f00"

    /// Reads the settings and derives all that is fixed over frames. gridWidth: subcarriers per
    /// symbol of the store (the transform size). Returns false with ErrorMessage "SSBlock
    /// Position Calculation Error" when Mu has fewer candidate blocks than Lmax.
    bool Init(Models::Nr5g::NRSSPBCH* settings, Models::Nr5g::NRCarrier* carrier, int gridWidth);

    /// The blocks of waveform frame `frame` and, unless ReserveOnly, their symbols.
    bool Generate(int frame);

    /// The 24 MIB bits of TS 38.331 (BCCH-BCH-Message with its choice bit first) for
    /// system frame `sfn` into the first 24 elements of `mib`.
    void GenerateMIB(BitSequence& mib, int sfn);

    /// Writes the blocks of the last Generate into the store of numerology `gridMu` and withholds
    /// their resource blocks from later channels. `firstChannel` marks the first block's symbols
    /// for the RF ALC marker.
    bool Map(SlotGrid& grid, OccupancyGrid& occupancy, OccupancyGrid& symbolFlags,
             bool firstChannel, int gridMu, bool extendedCp);

    Models::Nr5g::Numerology GetNumerology();

  private:
    void buildActiveBlocks(int frame);
    void generateBlock(int block, int frame, bool capture);
    double levelOf(int block) const;
    void reserve(OccupancyGrid& occupancy, int firstSymbol, int lastSymbol, long long firstColumn,
                 long long endColumn) const;
};

}  // namespace Orvalis_NR
