#pragma once
// PRS generator: the downlink positioning reference signal of one NRPRS item (TS 38.211
// clause 7.4.1.7): a comb of QPSK values over a block of symbols, in the slots that the
// periodicity, offsets, repetition and time gap select and the two muting patterns leave.
// Elements that an earlier channel holds (SS/PBCH, CSI-RS, ...) are left to it.

#include <string>
#include <vector>

#include "coding/coding_types.h"
#include "dsp/slot_grid.h"
#include "models/nr_carrier.h"
#include "models/nr_prs.h"

namespace Orvalis_NR {

class PBCH_Generator;

class PRS_Generator {
  public:
    /// Reads the item. gridWidth: subcarriers per symbol of the store. Fails naming the setting
    /// for a comb size or symbol count outside TS 38.211 clause 7.4.1.7.3, symbols outside the
    /// slot, a period, repetition, gap or muting factor below 1, a muting pattern that is not a
    /// string of 0 and 1, or a resource outside the band.
    bool Init(Models::Nr5g::NRCarrier* carrier, Models::Nr5g::NRPRS* settings, int gridWidth,
              std::vector<PBCH_Generator*>& pbch);

    /// Sequence of every symbol of the resource in slot `slot` of subframe `subframe`
    /// (TS 38.211 clause 7.4.1.7.2).
    bool Generate(int frame, int subframe, int slot);

    /// Writes every PRS occasion of waveform frame `frame` that no muting pattern mutes.
    bool Map(SlotGrid& grid, OccupancyGrid& occupancy, int frame, OccupancyGrid& symbolFlags, bool firstChannel);

    /// True when slot `slot` of frame `frame` holds a PRS occasion that is not muted.
    bool IsOccasion(int frame, int slot) const;

    /// Numerology (position of the Numerology enumeration) of the spacing and prefix.
    int GetNumerology() const { return numerology_; }
    /// Subcarriers spanned, counted from point A, for the baseband filter.
    void GetScAllocation(int& first, int& last) const;

    Models::Nr5g::NRPRS* Settings = nullptr;  ///< not owned
    int GridWidth = 0;
    std::vector<PBCH_Generator*> PbchGenerators;  ///< not owned
    std::vector<int> Symbols;                     ///< symbols of the slot, in order
    int SymbolsPerSlot = 14;
    int SlotsPerFrame = 20;
    int SequenceBits = 0;
    std::vector<std::vector<complex>> Sequence;  ///< per symbol of Symbols, r(m) from point A
    double Amplitude = 1.0;
    int Comb = 2;
    int ReOffset = 0;
    int StartPrb = 0;
    int Bandwidth = 0;
    int PointOffset = 0;  ///< point A from the carrier centre, in subcarriers
    int Period = 10;
    int SetOffset = 0;
    int Repetition = 1;
    int Gap = 1;
    int MutingBitRepetition = 1;
    int ResourceSlotOffset = 0;
    std::string Muting1 = "11";
    std::string Muting2 = "11";

  private:
    std::vector<int> kPrime_;  // k' of each symbol of Symbols, TS 38.211 Table 7.4.1.7.3-1
    BitSequence bits_;
    int numerology_ = 1;
    int sequenceId_ = 0;
    std::string path_;
};

}  // namespace Orvalis_NR
