#pragma once
// Modulation, code rate and transport block size of a PDSCH or PUSCH from its MCS, allocation
// and DM-RS, as TS 38.214 clauses 5.1.3 and 6.1.4 give them for one code word.

#include <string>

#include "models/all_models.h"

namespace nrsynth_host {

struct SharedChannelSize {
    bool valid = false;
    std::string reason;   // why the size cannot be worked out, when not valid
    Models::Nr5g::ModulationType modulation = Models::Nr5g::ModulationType::QPSK;
    double codeRate = 0.0;
    int transportBlockSize = 0;
};

/// The allocated resource blocks: RBNumber for allocation type 1; for type 0 the RBs of the
/// groups RBGBitmap selects, groups of `rbgSize` aligned to common RB 0 (TS 38.214 clause
/// 5.1.2.2.1), the first and last cut by the BWP's edges.
int allocatedResourceBlocks(bool type0, int rbNumber, int rbgSize, const std::string& bitmap, int bwpStart, int bwpSize);

/// PDSCH: with two code words the size is that of the first, which takes floor(v / 2) layers
/// (TS 38.211 Table 7.3.1.3-1). `bwp` may be null for allocation type 1.
SharedChannelSize downlinkSharedChannelSize(const Models::Nr5g::NRDLSCH& channel, const Models::Nr5g::NRDLBWP* bwp);

/// PUSCH: with transform precoding every DM-RS symbol is free of data; `pi2Bpsk` picks q = 1 in
/// the rows of Tables 6.1.4.1-1 / -2 printed with q. DM-RS positions are those without
/// intra-slot frequency hopping.
SharedChannelSize uplinkSharedChannelSize(const Models::Nr5g::NRULSCH& channel, const Models::Nr5g::NRULBWP* bwp,
                                          bool pi2Bpsk);

}  // namespace nrsynth_host
