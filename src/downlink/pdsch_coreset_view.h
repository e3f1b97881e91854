#pragma once
// What the PDSCH reads of the PDCCH generators of its bandwidth part.

#include <vector>

#include "models/nr_dl_bwp.h"

namespace Orvalis_NR {

class PDCCH_Generator;

/// Among the generators of bandwidth part `bwp`, the CORESET with the greatest last symbol:
/// its first and last symbol and its RB map over the bandwidth part. False when there is none.
bool latestCoreset(const std::vector<PDCCH_Generator*>& pdcch, const Models::Nr5g::NRDLBWP* bwp, int& first,
                   int& last, std::vector<int>& rbMap);

}  // namespace Orvalis_NR
