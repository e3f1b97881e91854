#pragma once
// PDSCH generator: one NRDLSCH item of a downlink carrier. Init derives everything fixed over
// slots (allocation, code words, DM-RS and PT-RS patterns); per slot Generate codes, scrambles,
// modulates and layer-maps the transport blocks (TS 38.212 clauses 5.1-5.4 and 7.2, TS 38.211
// clause 7.3.1) and Map places them with DM-RS and PT-RS (TS 38.211 clauses 7.3.1.5, 7.4.1.1,
// 7.4.1.2) into the frame store.

#include <array>
#include <cstdint>
#include <atomic>
#include <memory>
#include <string>
#include <vector>

#include "coding/coding_types.h"
#include "coding/ldpc_encoder.h"
#include "coding/ldpc_rate_match.h"
#include "coding/ldpc_symbol_rate_match.h"
#include "downlink/csi_rs_footprint.h"
#include "downlink/precoding_matrix.h"
#include "dsp/slot_grid.h"
#include "models/nr_carrier.h"
#include "models/nr_coreset.h"
#include "models/nr_dl_bwp.h"
#include "models/nr_dlsch.h"
#include "payload/data_source.h"

enum PDSCH_MappingTypeEnumList : int { PDSCH_MappingTypeA = 0, PDSCH_MappingTypeB = 1 };

namespace Orvalis_NR {

class PBCH_Generator;
class PDCCH_Generator;
class PRS_Generator;

/// One code word of the PDSCH: its coding geometry, its payload and its per-slot bits.
struct SchCodeWord {
    int CrcSelector = 0;  ///< CRC_24A (0) or CRC_16 (3)
    LDPC_Encoder Encoder;
    LDPC_RateMatch RateMatch;
    std::unique_ptr<DataSource> Source;
    std::vector<int> PerBlockE;  ///< E of each code block, set per slot
    BitSequence TbBits;
    BitSequence TbWithCrc;
    BitSequence CbCrc;
    BitSequence CbBits;
    std::vector<int> EncoderOut;
    LdpcSymbolRateMatch SymbolRateMatch;
    std::vector<int> CodedBits;                ///< G payload bits when channel coding is off
    std::vector<std::uint16_t> CodedSymbols;   ///< G / Qm symbols of coded bits, first bit in bit 0
    std::vector<std::uint64_t> PnWords;        ///< G scrambling bits, packed, first in bit 0
    long long PnBits = 0;                      ///< bits of PnWords that hold the sequence of PnCInit
    int PnCInit = -1;
    std::vector<std::vector<complex>> Layers;  ///< one vector of R symbols per layer
    std::vector<complex> Constellation;        ///< indexed by the bits, first bit most significant
    std::vector<complex> SymbolTable;          ///< the same points indexed first bit least significant
    int TbsBits = 0;         ///< A
    long long G = 0;         ///< coded bits of the slot
    int Blocks = 0;          ///< C
    int Z = 0;
    int TbWithCrcBits = 0;   ///< B
    int CeilBlockBits = 0;   ///< K'+ of the segmentation (bits with block CRC)
    int FloorBlockBits = 0;
    int K = 0;
    int N = 0;
    int CbCrcBits = 0;  ///< 24 when C > 1, else 0
    int Qm = 1;
    int Nref = 0;
    int Rv = 0;
    int TbCrcBits = 0;
    int BaseGraph = 1;  ///< 1 or 2
    int Modulation = 0;
    std::vector<int> EncoderIn;    ///< K encoder inputs, -2 for a filler
    // The packed chain (common/packed_bits.h); the vectors above serve payloads that hold
    // other values than 0 and 1.
    std::vector<std::uint64_t> TbWords;  ///< B bits: the transport block and its CRC
    std::vector<std::uint64_t> CbWords;  ///< K bits of the code block being encoded
    std::vector<std::uint64_t> DWords;   ///< N encoder outputs of the last encoded block
    int LastFillerBegin = 0;             ///< its fillers in DWords: [LastFillerBegin, K - 2Z)
    bool PackedSlot = false;             ///< the last slot went through the packed chain

    /// The slot's bits for export, appended: the transport block (A), with its CRC (B), and the
    /// last encoded block's N encoder outputs with fillers as -2.
    void appendTransportBlock(std::vector<char>& out) const;
    void appendTransportBlockWithCrc(std::vector<char>& out) const;
    void appendEncoderOutput(std::vector<int>& out) const;
};

class PDSCH_Generator {
  public:
    PDSCH_Generator();

    /// Reads the item and derives all that is fixed over slots. gridWidth: subcarriers per
    /// symbol of the store. Bad settings fail naming the setting and its value.
    bool Init(Models::Nr5g::NRCarrier* carrier, Models::Nr5g::NRDLSCH* settings,
              Models::Nr5g::NRDLBWP* bwp, int gridWidth, std::vector<PBCH_Generator*>& pbch,
              std::vector<PDCCH_Generator*>& pdcch, std::vector<PRS_Generator*>& prs,
              std::vector<const CsiRsFootprint*> csiRs = {});

    Models::Nr5g::Numerology GetNumerology();
    /// True when the allocation's RB mask meets `map` (one int per BWP RB) in any RB.
    bool isCollided(std::vector<int>& map);

    /// Data REs per layer of the slot, G per code word and E per code block (TS 38.212 5.4.2.1).
    void CalculateRateMathingParameters(int frame, int subframe, int slot);
    bool Generate(int frame, int subframe, int slot);
    bool Map(SlotGrid& grid, OccupancyGrid& occupancy, int frame, OccupancyGrid& symbolFlags,
             bool firstChannel);
    bool MapWithPrecoding(SlotGrid& grid, OccupancyGrid& occupancy, int frame,
                          OccupancyGrid& symbolFlags, bool firstChannel);
    /// The precoder of PRB `rb` for the current PRB bundle into PrecodingMatrix.
    void CalculatePrecodingMatrix(int rb);
    /// Uplink codebooks of TS 38.211 clause 6.3.1.5 (Tables 6.3.1.5-1 to -7), W of `ports` rows
    /// and `layers` columns; transform precoding picks Table 6.3.1.5-2 over -3. A pair without
    /// a table, or a TPMI outside it, fails naming the values.
    void GetPrecodingMatrix(bool transformPrecoded, int layers, int ports, int tpmi,
                            brinecomm::matrix<complex>& w);

    /// Cancel request, polled per slot, port and symbol; Map clears it on the way out.
    std::atomic<char> CancelRequested{0};

    Models::Nr5g::NRDLBWP* Bwp = nullptr;
    Models::Nr5g::NRDLSCH* Settings = nullptr;
    Models::Nr5g::NRCarrier* Carrier = nullptr;
    std::vector<PDCCH_Generator*> PdcchGenerators;
    std::vector<PBCH_Generator*> PbchGenerators;
    std::vector<PRS_Generator*> PrsGenerators;
    std::vector<const CsiRsFootprint*> CsiRsGenerators;
    int PointAOffset = 0;
    int GridWidth = 0;
    std::vector<SchCodeWord> CodeWords;
    int SymbolsPerSlot = 14;
    int SymbolsPerSubframe = 14;
    int SlotsPerSubframe = 1;
    int Mu = 0;
    int NumerologyValue = 1;
    int NId = 0;
    int Rnti = 0;
    int NId0 = 0;
    int NId1 = 0;
    int NIdNScid = 0;
    int NScid = 0;
    bool DmrsR16 = false;
    std::vector<int> Ports;      ///< DM-RS ports less 1000
    std::vector<int> PortArray;  ///< antenna port of each store row
    int NumberOfLayers = 1;
    int NumberOfCodewords = 1;
    int CdmGroups = 1;
    int BwpStart = 0;
    int BwpSize = 0;
    bool CodingOn = true;
    bool PtrsOn = false;
    bool PtrsMapAll = false;
    int KPtrs = 2;
    int LPtrs = 1;
    int PtrsReOffset = 0;
    std::vector<int> RbMask;
    int AllocRbStart = 0;
    int AllocRbCount = 0;
    bool VrbMapped = false;
    std::vector<int> VrbToPrb;
    std::vector<int> PrbIndex;
    std::vector<int> SlotList;
    std::vector<int> DmrsSymbols;
    std::vector<int> DmrsSymbolOffsets;
    std::vector<int> DataSymbols;
    std::vector<int> PtrsSymbols;
    std::vector<int> SymbolClass;
    int DmrsConfigType = 1;
    bool DoubleSymbolDmrs = false;
    std::array<int, 12> DmrsReMask{};
    int DmrsRePerRb = 0;
    std::vector<int> PtrsPortList;
    std::vector<int> PtrsReInRb;
    int PtrsRbOffset = 0;
    int PtrsPerRb = 6;
    std::vector<int> PtrsCombIndex;
    std::vector<int> PtrsPhaseIndex;
    bool CbgOn = false;
    int MaxCbg = 0;
    std::vector<int> CbgFlags;
    std::vector<int> CrcErrorFlags;
    int CodedBlocks = 0;
    std::shared_ptr<Models::Nr5g::NRCORESET> RmCoreset;
    std::vector<int> RmCoresetSlots;
    std::vector<int> RmCoresetSymbols;
    std::vector<std::vector<int>> RmPatternRbs;
    std::vector<std::vector<int>> RmPatternSymbols;
    double DataAmplitude = 1.0;
    double DmrsAmplitude = 1.0;
    double PtrsAmplitude = 1.0;
    bool BundledPrecoding = false;
    int BundleSize = 2;
    brinecomm::matrix<complex> PrecodingMatrix;

    // Per slot.
    int DataRePerLayer = 0;  ///< R of the last rate-matching count
    int LowestPrb = 0;
    int HighestPrb = 0;
    std::vector<std::vector<std::vector<complex>>> DmrsValues;  ///< [DMRS symbol][port][value]
    std::vector<std::vector<int>> DmrsCInit;                    ///< [DMRS symbol][port]
    std::vector<complex> PtrsBase;

  private:
    struct SlotPlace {
        int frame = 0, subframe = 0, slot = 0;
    };

    void readIdentities(Models::Nr5g::NRCarrier* carrier);
    void readPorts();
    void buildAllocation();
    void buildVrbToPrb();
    void buildCodeWords(Models::Nr5g::NRCarrier* carrier);
    void buildCbg();
    void buildCoresetRateMatching(Models::Nr5g::NRCarrier* carrier);
    void buildDmrsSymbols(Models::Nr5g::NRCarrier* carrier);
    void buildPtrs();
    void buildSymbolClass();
    void buildRateMatchPatterns();
    bool patternHit(int symbolInFrame, int frame, int prb) const;
    bool coresetHit(int prb) const;
    bool ssbHit(int prb, int symbolInFrame, int firstOfSlot, int lastOfSlot) const;
    void generateDmrs(int subframe, int slot);
    void encodeCodeWordPacked(SchCodeWord& cw);
    void encodeCodeWordBits(SchCodeWord& cw);
    void initRateMatch(SchCodeWord& cw, int e);
    void modulateAndMapLayers(SchCodeWord& cw, bool scrambled);
    int portGroupOffset(int port) const;
    bool readSlot(int entry, int frame, SlotPlace& place) const;
    const std::vector<complex>* portLayer(int position) const;

    /// An LTE carrier whose CRS the data avoids: fixed part from Init, the rest set per slot
    /// and symbol by the rate-matching count.
    struct LteCrsItem {
        int centre = 0, low = 0, high = 0, ports = 1, vShift = 0;
        std::vector<int> mbsfnSubframes;
        bool mbsfn = false, hasCrs = false;
        int step = 6, shift = 0, adjust = 0;
    };
    void buildLteCrs(Models::Nr5g::NRCarrier* carrier);
    void reserveSlotStorage();

    std::vector<LteCrsItem> lteCrs_;
    std::vector<int> dmrsPortNumbers_;                 ///< Ports plus 1000
    std::vector<int> ptrsPortNumber_{1000};
    std::vector<int> ptrsCInit_ = std::vector<int>(1);
    std::vector<std::vector<complex>> ptrsValues_;     ///< the PT-RS base sequence being made
    BitSequence dmrsGold_;                             ///< Gold bits of one DM-RS sequence
    std::vector<int> symbolHits_;
    int rmCoresetStart_ = 0;          ///< first RB of the rate-matched CORESET in the BWP
    std::string rmCoresetBitmap_;     ///< its FrequencyDomainBitmap
    /// A store row that carries one of this channel's ports, and where its layer is read.
    struct MappedRow {
        std::size_t store = 0;
        int position = 0;  ///< place of the port in Ports
        int port = 0;      ///< port number less 1000
        int groupOffset = 0;
        std::size_t read = 0;
        complex* values = nullptr;  ///< the store row's values and occupancy in this frame
        int* occupancy = nullptr;
        /// Per subcarrier of an RB on the current DM-RS symbol: the DM-RS value's place in the
        /// RB (0 up) or one of the kPattern actions.
        std::array<signed char, 12> pattern{};
    };
    static constexpr signed char kPatternNothing = -1;
    static constexpr signed char kPatternData = -2;
    static constexpr signed char kPatternReserved = -3;
    void setRowPatterns(bool withData);
    /// One resource element of the walk.
    struct ElementPlace {
        std::size_t at = 0;  ///< index in a store row
        int re = 0;          ///< subcarrier in the RB
        int prb = 0;
        int dmrsIndex = -1;  ///< entry of DmrsValues in a DM-RS symbol
        bool isDmrs = false, isData = false, ptrsRb = false;
    };
    /// The one walk of Map and MapWithPrecoding over slots, symbols, RBs and REs; the two differ
    /// only in how layer and DM-RS values become the value of an antenna row.
    void walkAllocation(SlotGrid& grid, OccupancyGrid& occupancy, int frame, OccupancyGrid& symbolFlags,
                        bool firstChannel, bool precoded);
    void mapElement(const ElementPlace& e, bool precoded);
    bool mapElementRow(const ElementPlace& e, std::size_t r, bool precoded);
    bool dmrsPortValue(const ElementPlace& e, std::size_t r, bool precoded, complex& value) const;
    bool dataPortValue(std::size_t r, bool precoded, complex& value);

    std::vector<MappedRow> rows_;
    std::size_t commonRead_ = 0;  ///< read position of all layers under precoding
    std::vector<const std::vector<complex>*> layers_;  ///< layer of each port position
};

/// DM-RS values of one DM-RS symbol for each port of `ports` (1000 up), TS 38.211 clause
/// 7.4.1.1.1-2: QPSK from the Gold sequence of cInit[i] for port i, rbCount RBs from common RB
/// firstRb (6 values per RB for type 1, 4 for type 2), with w_f(k') applied per value and
/// w_t(l') per symbol. dmrsSymbol: 0 single-symbol DM-RS, 1 or 2 the first or second symbol of
/// a double-symbol DM-RS. False for a bad range, configuration type or port.
bool Generate_PDSCH_DMRS_Signal(std::vector<std::vector<complex>>& dmrs, CP_TypeEnumList cp,
                                std::vector<int> ports, int firstRb, int rbCount, int configType,
                                int dmrsSymbol, int nScid, int slot, std::vector<int> cInit);

/// l-bar of TS 38.211 Tables 7.4.1.1.2-3 (single) and -4 (double): l0 followed by the
/// additional positions. duration: l_d (type A: from the slot start to the last data symbol
/// plus one; type B: the scheduled length); length is the same for type B callers.
bool GetLBar_PDSCH_DMRS(std::vector<int>& lBar, PDSCH_MappingTypeEnumList type, int l0,
                        int addPos, int duration, int length, int doubleSymbol);

/// The PDSCH constellation of `modulation` (0 BPSK .. 6 1024QAM) with its Qm; an unknown value
/// leaves Qm 1 and the table empty.
void GetPdschConstellation(int modulation, int& qm, std::vector<complex>& table);

}  // namespace Orvalis_NR
