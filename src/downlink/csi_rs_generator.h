#pragma once
// CSI-RS generator: one NRCSIRS item, zero power or not, TRS included (a row 1 resource of
// density 3). Init reads the item and works out its pattern from TS 38.211 Table 7.4.1.5.3-1;
// GenerateAndMap then, per frame, makes the sequence of clause 7.4.1.5.2 for every occasion of
// the slot list and places it by clause 7.4.1.5.3. The resource publishes a CsiRsFootprint so
// that a PDSCH can rate-match around it.

#include <array>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include "coding/coding_types.h"
#include "downlink/csi_rs_footprint.h"
#include "dsp/slot_grid.h"
#include "models/nr5g_waveform_settings.h"
#include "models/nr_carrier.h"
#include "models/nr_csirs.h"
#include "models/nr_dl_bwp.h"

namespace Orvalis_NR {

/// CDM types of TS 38.211 Tables 7.4.1.5.3-2 to -5, by their number in the location table.
enum CsiRsCdmType : int { CsiRsNoCdm = 0, CsiRsFdCdm2 = 1, CsiRsCdm4 = 2, CsiRsCdm8 = 3 };

class CSI_RS_Generator {
  public:
    /// Reads the item and derives the pattern. Fails naming the setting for a row outside the
    /// table, a bitmap that does not fit its row, ports the row does not have, symbols outside
    /// the slot, a malformed list, or a resource outside the band of the sample rate.
    bool Init(Models::Nr5g::NR5GWaveformSettings* waveform, Models::Nr5g::NRCarrier* carrier,
              Models::Nr5g::NRDLBWP* bwp, Models::Nr5g::NRCSIRS* settings);

    /// Generates and writes every occasion of SlotList in waveform frame `frame`. Each antenna
    /// row carries the port of its entry of PortList: that port's CDM group gets the values
    /// with occupancy 1400, the resource's other elements are reserved (1401) where still free.
    bool GenerateAndMap(SlotGrid& grid, OccupancyGrid& occupancy, int frame, OccupancyGrid& symbolFlags,
                        bool firstChannel);

    /// TS 38.211 Table 7.4.1.5.3-1 for `row` (1..18), the slot's first symbols l0 and l1 and the
    /// frequency-domain bitmap (b_(N-1) first). Yields the row's port count, its CDM group size,
    /// one (k-bar, l-bar) pair per table entry with its CDM group j, and the CDM type (one
    /// element, a CsiRsCdmType). Fails naming the setting when the row or bitmap is bad.
    void CalculateCsiLocations(int row, int l0, int l1, std::string bitmap, int& portCount, int& cdmSize,
                               std::vector<std::pair<int, int>>& locations, std::vector<int>& groups,
                               std::vector<int>& cdmType);

    /// w_f(k') and w_t(l') of TS 38.211 Tables 7.4.1.5.3-2 to -5, one vector per index s.
    void InitWfWt(int cdmType, int cdmSize, std::vector<std::vector<int>>& wf, std::vector<std::vector<int>>& wt);

    Models::Nr5g::Numerology GetNumerology() const { return numerology_; }
    /// Subcarriers spanned, counted from point A, for the baseband filter.
    void GetScAllocation(int& first, int& last) const;

    Models::Nr5g::NRDLBWP* Bwp = nullptr;         ///< not owned
    Models::Nr5g::NRCSIRS* Settings = nullptr;    ///< not owned
    std::vector<int> PortList;   ///< antenna port of each store row, -1 for none
    std::vector<int> SlotList;   ///< absolute slot numbers from the waveform's start
    int Row = 4;
    int SymbolsPerSlot = 14;
    int NId = 0;
    double Density = 1.0;
    bool OddPrbs = false;
    std::vector<std::pair<int, int>> CsiLocations;  ///< (k-bar, l-bar) per table entry
    std::vector<int> CsiGroups;                     ///< CDM group j per table entry
    int CdmType = CsiRsFdCdm2;
    int CdmSize = 2;
    int PortCount = 4;
    std::vector<std::vector<int>> Wf;
    std::vector<std::vector<int>> Wt;
    int Mu = 0;
    int SlotsPerSubframe = 1;
    int RbNumber = 0;   ///< RBs of the resource after clipping to the BWP
    int RbOffset = 0;   ///< first RB of the resource, relative to the BWP
    double Amplitude = 1.0;
    std::array<int, 12> ReWeights{};  ///< 1 for each subcarrier of an RB the resource takes
    std::set<int> CsiSymbols;         ///< symbols of the slot the resource takes
    BitSequence Pn;
    std::vector<std::vector<complex>> Values;  ///< per entry of CsiSymbols, r(m) of the slot
    int BwpOffset = 0;    ///< first subcarrier of the BWP from the carrier centre
    int PointOffset = 0;  ///< point A from the carrier centre, in subcarriers
    int FirstSymbol = 0;
    int FirstSymbol2 = 0;
    int GridWidth = 0;  ///< subcarriers per symbol of the frame store
    /// What a PDSCH needs of this resource to rate-match around it.
    CsiRsFootprint Footprint;

  private:
    void readSlotsAndPorts();
    void checkBand(double sampleRate, long long firstCrb, long long lastCrb);
    void buildFootprint();
    int sequenceIndex(int crb, int kBar, int kPrime) const;

    Models::Nr5g::Numerology numerology_ = Models::Nr5g::Numerology::SCS30k;
    int firstCrb_ = 0;     // first common RB of the resource
    int lastCrb_ = -1;     // last common RB
    int alphaTwice_ = 2;   // 2 alpha of clause 7.4.1.5.3
    int rhoTwice_ = 2;     // 2 rho
    int sequenceLength_ = 0;
    std::vector<int> symbolList_;  // CsiSymbols in order, for the per-symbol sequences
    std::string path_;             // "CSI-RS <Name>" for failure texts
};

}  // namespace Orvalis_NR
