#include "downlink/pdsch_coreset_view.h"

#include "downlink/pdcch_generator.h"

namespace Orvalis_NR {

bool latestCoreset(const std::vector<PDCCH_Generator*>& pdcch, const Models::Nr5g::NRDLBWP* bwp, int& first,
                   int& last, std::vector<int>& rbMap) {
    bool found = false;
    for (auto* generator : pdcch) {
        if (!generator || generator->Bwp != bwp) continue;
        int f = 0, l = 0;
        generator->GetCoresetSymbol(f, l);
        if (found && l <= last) continue;
        first = f;
        last = l;
        generator->GetCoresetMap(rbMap);
        found = true;
    }
    return found;
}

}  // namespace Orvalis_NR
