#pragma once
// PDCCH generator: one DCI from its payload bits to QPSK symbols and DM-RS in a CORESET of the
// frame store (TS 38.212 clause 7.3, TS 38.211 clauses 7.3.2 and 7.4.1.3).

#include <memory>
#include <string>
#include <vector>

#include "coding/coding_types.h"
#include "coding/polar_coding.h"
#include "coding/polar_rate_matching.h"
#include "dsp/slot_grid.h"
#include "models/nr5g_waveform_settings.h"
#include "models/nr_carrier.h"
#include "models/nr_coreset.h"
#include "models/nr_dci.h"
#include "models/nr_dl_bwp.h"
#include "payload/data_source.h"

namespace Orvalis_NR {

/// One NRDCI item of a carrier. Init once; Map then, per frame, generates and writes every
/// occasion of the DCI's slot list that falls into that frame.
class PDCCH_Generator {
  public:
    Models::Nr5g::NRDLBWP* Bwp = nullptr;        ///< not owned
    Models::Nr5g::NRCORESET* Coreset = nullptr;  ///< Coreset0..2 of the BWP, not owned
    int NumberOfCCE = 0;
    int CoresetSymbols = 0;  ///< SymbolNumber
    int CoresetRbs = 0;      ///< resource blocks of the CORESET
    std::string FrequencyBitmap;
    int RegBundle = 6;  ///< RegBundleSize
    bool Interleaved = false;
    int SymbolsPerSlot = 14;
    int RegsPerSymbol = 0;  ///< NumberOfCCE x 6 / CoresetSymbols
    int FirstSymbol = 0;
    int LastSymbol = 0;
    int Rnti = 0;         ///< masks the CRC
    int ScrambleRnti = 0;  ///< n_RNTI of the data scrambling
    std::vector<int> SlotList;    ///< absolute slot numbers counted from the waveform's start
    std::vector<int> CceOffsets;  ///< first CCE, entry i for slot entry i modulo the length
    int PayloadLength = 0;        ///< A
    bool CodingOn = true;
    bool ScramblingOn = true;
    int DataScramblingId = 0;  ///< n_ID of TS 38.211 clause 7.3.2.3
    int DmrsScramblingId = 0;  ///< N_ID of TS 38.211 clause 7.4.1.3.1
    std::unique_ptr<DataSource> Source;
    int CodedBits = 0;    ///< E
    int SymbolCount = 0;  ///< E / 2
    PolarCoding Polar;
    RateMatchingPolar RateMatch;

    BitSequence PayloadBits;      ///< A
    BitSequence CrcBits;          ///< 24, RNTI-masked
    BitSequence CrcAttachedBits;  ///< K = A + 24
    BitSequence PolarBits;        ///< N
    BitSequence RateMatchedBits;  ///< E
    BitSequence ScrambledBits;    ///< E
    BitSequence ScramblingBits;   ///< E

    std::vector<std::vector<complex>> Dmrs;  ///< per CORESET symbol, from common RB 0 upward
    std::vector<complex> DataSymbols;        ///< E / 2
    double DataAmplitude = 1.0;
    double DmrsAmplitude = 1.0;
    int Mu2 = 1;               ///< 2^Mu of the BWP
    int BwpCarrierOffset = 0;  ///< first subcarrier of the BWP from the carrier centre
    int GridWidth = 0;         ///< subcarriers per symbol of the frame store
    bool InitialBwp = false;
    bool DmrsOn = true;
    std::vector<int> RegInterleaver;  ///< f(j) of TS 38.211 clause 7.3.2.2
    /// Per CORESET symbol, per CORESET resource block: 1 when this occasion's CCEs use it.
    std::vector<std::vector<int>> RbMask;
    /// RbMask of every entry of SlotList, CoresetSymbols rows per entry.
    std::vector<std::vector<int>> OccasionMasks;
    int CrcPreset = 3334721;

    /// Reads the DCI and its CORESET and derives all that is fixed over slots. Fails with a
    /// text naming the setting for a CORESET, slot list or CCE list that cannot be mapped.
    void Init(Models::Nr5g::NR5GWaveformSettings* waveform, Models::Nr5g::NRCarrier* carrier,
              Models::Nr5g::NRDCI* dci, Models::Nr5g::NRDLBWP* bwp);

    /// DataSymbols and Dmrs of slot `slotInFrame`.
    void Generate(int slotInFrame);

    /// Generates and writes every occasion of SlotList that lies in waveform frame `frame`.
    /// symbolFlags gets bit 0 on the CORESET symbols, and bit 1 too when firstChannel is set.
    void Map(SlotGrid& grid, OccupancyGrid& occupancy, int frame, OccupancyGrid& symbolFlags,
             bool firstChannel);

    /// rbMap sized to the BWP's RBNumber, 1 for each RB of the CORESET (all 0 for CORESET 0).
    void GetCoresetMap(std::vector<int>& rbMap);

    /// First and last OFDM symbol of the CORESET in the slot.
    void GetCoresetSymbol(int& first, int& last);

    /// Subcarriers spanned by the CORESET, counted from point A, for the baseband filter.
    void GetScAllocation(int& first, int& last);

    /// Numerology of the BWP.
    Models::Nr5g::Numerology GetNumerology();

  private:
    /// One resource block of the CORESET in frequency order.
    struct CoresetRb {
        int bwpRb;      ///< RB within the BWP
        int dmrsIndex;  ///< first DM-RS value of the RB in Dmrs[l]
    };

    void readCoreset(Models::Nr5g::NRDCI* dci);
    void buildInterleaver();
    void buildOccasionMasks();
    void fillMask(int cceOffset, std::vector<std::vector<int>>::iterator rows) const;
    int coresetStart() const;

    std::vector<CoresetRb> walk_;  // the CORESET's RBs in frequency order
    int dmrsLength_ = 0;           // DM-RS values per CORESET symbol
    BitSequence dmrsBits_;         // 2 dmrsLength_ Gold sequence bits
    int bundleSize_ = 6;           // L of the interleaver in use
    int interleaverSize_ = 1;      // R
    int shiftIndex_ = 0;           // n_shift
    Models::Nr5g::Numerology numerology_ = Models::Nr5g::Numerology::SCS30k;
    std::string path_;  // "DCI <Name>" for failure texts
};

}  // namespace Orvalis_NR
