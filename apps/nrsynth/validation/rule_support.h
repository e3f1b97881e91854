#pragma once
// Shared reading helpers of the validator's rules: paths, list texts, numerologies and the
// resource blocks a channel occupies.

#include <optional>
#include <string>
#include <vector>

#include "findings.h"
#include "models/nr5g_waveform_settings.h"

namespace nrsynth_cli::validation {

namespace nr = Models::Nr5g;

/// An enabled carrier of the playback list, with its path in the document.
struct CarrierRef {
    const nr::NRCarrier* carrier = nullptr;
    std::string path;  ///< "NRCarriers[2]"
};

/// Carriers whose channels take part in the generation: the enabled items of `NRCarriers`
/// (a real-time waveform is not checked).
std::vector<CarrierRef> activeCarriers(const nr::NR5GWaveformSettings& waveform);

/// µ of a numerology enumerator: 60 kHz with normal and with extended prefix are both 2.
int muOf(nr::Numerology numerology);
int symbolsPerSlot(nr::CyclicPrefixType cp);
/// Slots of the whole waveform in numerology µ: NumberOfFrames x 10 x 2^µ.
int slotsInWaveform(const nr::NR5GWaveformSettings& waveform, int mu);

/// The integers of a comma list; nullopt when an item is no number.
std::optional<std::vector<int>> intList(const std::string& text);

std::string quoted(const std::string& text);
std::string itemPath(const std::string& parent, const char* collection, int index);

/// The downlink bandwidth part a channel names by `BWPIndex`, null when there is none.
const nr::NRDLBWP* downlinkBwp(const nr::NRCarrier& carrier, int index);
const nr::NRULBWP* uplinkBwp(const nr::NRCarrier& carrier, int index);

/// The CORESET model at position 0..2 of a bandwidth part, null outside the used ones.
const nr::NRCORESET* coresetAt(const nr::NRDLBWP& bwp, int position);
/// First RB of a CORESET inside its bandwidth part; an RBOffset of -1 starts on the six-RB grid
/// of common RBs.
int coresetFirstRb(const nr::NRCORESET& coreset, const nr::NRDLBWP& bwp);
/// RBs of a CORESET relative to its bandwidth part (CORESET 0 of an initial BWP is contiguous).
std::vector<int> coresetRbs(const nr::NRCORESET& coreset, const nr::NRDLBWP& bwp);

/// Resource block groups of a BWP of `size` RBs starting at common RB `start`, with groups of
/// `p` RBs (TS 38.214 clause 5.1.2.2.1).
int rbgCount(int start, int size, int p);

/// RBs a PDSCH allocates, relative to its bandwidth part; empty when the allocation is unreadable.
std::vector<int> pdschRbs(const nr::NRDLSCH& pdsch, const nr::NRDLBWP& bwp);

/// Antenna rows a channel writes: the positions of `AntennaPortArray` that hold a port.
std::vector<int> antennaRows(const std::string& antennaPortArray);

bool overlaps(const std::vector<int>& a, const std::vector<int>& b);
std::vector<int> rangeOf(int first, int count);

/// The channel's slots (SlotIndexArrayStr), empty when unreadable.
std::vector<int> slotsOf(const std::string& slotIndexArrayStr);

// Rule groups, each adding its findings.
void checkRanges(const nr::NR5GWaveformSettings& waveform, FindingList& findings);
void checkGrid(const nr::NR5GWaveformSettings& waveform, FindingList& findings);
void checkDmrs(const nr::NR5GWaveformSettings& waveform, FindingList& findings);
void checkCollisions(const nr::NR5GWaveformSettings& waveform, FindingList& findings);

}  // namespace nrsynth_cli::validation
