// Frequency-domain containment: bandwidth parts inside their carrier, CORESETs inside their
// bandwidth part, channel allocations inside their bandwidth part.

#include <algorithm>
#include <string>

#include "models/nr_carrier.h"
#include "models/nr_coreset.h"
#include "models/nr_csirs.h"
#include "models/nr_dci.h"
#include "models/nr_dl_bwp.h"
#include "models/nr_dlsch.h"
#include "models/nr_downlink.h"
#include "models/nr_resource_grid.h"
#include "models/nr_ul_bwp.h"
#include "models/nr_ulsch.h"
#include "models/nr_uplink.h"
#include "rule_support.h"

namespace nrsynth_cli::validation {

namespace {

/// Common RBs of the carrier in numerology `mu`: its resource grid of that µ when one is given,
/// else its NumberOfRB counted from point A, scaled when the carrier has another numerology.
struct CarrierSpan {
    long long first = 0;
    long long end = 0;  ///< one past the last RB
    std::string source;
};

CarrierSpan carrierSpan(const nr::NRCarrier& carrier, int mu) {
    const auto grids = carrier.ResourceGrid->getValue();
    for (int g = 0; g < grids->getCount(); ++g) {
        const auto& grid = *grids->getItem(g);
        if (grid.Enabled->getValue() && grid.Mu->getValue() == mu && grid.N_grid_size->getValue() > 0)
            return {grid.N_grid_start->getValue(), static_cast<long long>(grid.N_grid_start->getValue()) + grid.N_grid_size->getValue(),
                    "ResourceGrid[" + std::to_string(g) + "] (N_grid_start " + std::to_string(grid.N_grid_start->getValue()) +
                        ", N_grid_size " + std::to_string(grid.N_grid_size->getValue()) + ")"};
    }
    const int carrierMu = muOf(carrier.Numerology->getValue());
    const long long rbs = std::max(carrier.NumberOfRB->getValue(), 0);
    const long long scaled = mu >= carrierMu ? (rbs >> (mu - carrierMu)) : (rbs << (carrierMu - mu));
    return {0, scaled, "NumberOfRB " + std::to_string(rbs) + " of the carrier (" + std::to_string(scaled) + " RBs at mu " +
                           std::to_string(mu) + ")"};
}

template <class Bwp>
void checkBwp(const nr::NRCarrier& carrier, const Bwp& bwp, const std::string& path, FindingList& findings) {
    const int offset = bwp.RBOffset->getValue();
    const int size = bwp.RBNumber->getValue();
    if (size < 1 || size > 275) {
        findings.error(path + ".RBNumber", std::to_string(size), "a bandwidth part has 1 to 275 RBs (TS 38.211 clause 4.4.5)");
        return;
    }
    if (offset < 0) {
        findings.error(path + ".RBOffset", std::to_string(offset), "a bandwidth part starts at common RB 0 or above");
        return;
    }
    const auto span = carrierSpan(carrier, muOf(bwp.Numerology->getValue()));
    if (offset < span.first || static_cast<long long>(offset) + size > span.end)
        findings.error(path + ".RBNumber", std::to_string(size),
                       "RBs " + std::to_string(offset) + " to " + std::to_string(offset + size - 1) +
                           " lie outside the carrier's common RBs " + std::to_string(span.first) + " to " +
                           std::to_string(span.end - 1) + " given by " + span.source + " (TS 38.211 clause 4.4.5)");
}

/// TS 38.214 Table 5.1.2.2.1-1: nominal RBG size P for configurations 1 and 2.
std::pair<int, int> nominalRbgSizes(int bwpSize) {
    if (bwpSize <= 36) return {2, 4};
    if (bwpSize <= 72) return {4, 8};
    if (bwpSize <= 144) return {8, 16};
    return {16, 16};
}

void checkRbgAllocation(const std::string& path, int rbgSize, const std::string& bitmap, const nr::NRDLBWP& bwp,
                        FindingList& findings) {
    const int bwpSize = bwp.RBNumber->getValue();
    if (bwpSize < 1 || bwpSize > 275 || bwp.RBOffset->getValue() < 0) return;  // the bandwidth part's own rule reports it
    const auto [p1, p2] = nominalRbgSizes(bwpSize);
    if (rbgSize != p1 && rbgSize != p2) {
        findings.error(path + ".RBGSize", std::to_string(rbgSize),
                       "TS 38.214 Table 5.1.2.2.1-1 gives P = " + std::to_string(p1) + " (configuration 1) or " +
                           std::to_string(p2) + " (configuration 2) for a bandwidth part of " + std::to_string(bwpSize) + " RBs");
        return;
    }
    const int groups = rbgCount(bwp.RBOffset->getValue(), bwpSize, rbgSize);
    if (bitmap.find_first_not_of("01") != std::string::npos || static_cast<int>(bitmap.size()) > groups) {
        findings.error(path + ".RBGBitmap", quoted(bitmap),
                       "expected one '0' or '1' per resource block group: " + std::to_string(groups) +
                           " groups of P = " + std::to_string(rbgSize) + " (TS 38.214 clause 5.1.2.2.1)");
    } else if (bitmap.find('1') == std::string::npos) {
        findings.error(path + ".RBGBitmap", quoted(bitmap), "allocation type 0 with no group set allocates no RB");
    } else if (static_cast<int>(bitmap.size()) < groups) {
        findings.warning(path + ".RBGBitmap", quoted(bitmap),
                         "the bitmap is shorter than the " + std::to_string(groups) +
                             " resource block groups of the bandwidth part: the groups past its end stay empty");
    }
}

void checkContiguous(const std::string& path, int offset, int count, int bwpSize, FindingList& findings) {
    if (offset < 0 || offset >= bwpSize)
        findings.error(path + ".RBOffset", std::to_string(offset),
                       "the first RB lies outside the bandwidth part's RBs 0 to " + std::to_string(bwpSize - 1));
    else if (count < 1 || static_cast<long long>(offset) + count > bwpSize)
        findings.error(path + ".RBNumber", std::to_string(count),
                       "from RBOffset " + std::to_string(offset) + " the bandwidth part of " + std::to_string(bwpSize) +
                           " RBs holds 1 to " + std::to_string(bwpSize - offset) + " RBs");
}

void checkCoreset(const std::string& path, const nr::NRCORESET& coreset, const nr::NRDLBWP& bwp, FindingList& findings) {
    const int symbols = coreset.SymbolNumber->getValue();
    if (symbols < 1 || symbols > 3)
        findings.error(path + ".SymbolNumber", std::to_string(symbols), "a CORESET spans 1 to 3 symbols (TS 38.211 clause 7.3.2.2)");
    const std::string bitmap = coreset.FrequencyDomainBitmap->getValue();
    const bool contiguous = coreset.ID->getValue() == 0 && bwp.InitialDLBWP->getValue();
    if (!contiguous && bitmap.find_first_not_of("01") != std::string::npos) {
        findings.error(path + ".FrequencyDomainBitmap", quoted(bitmap), "expected '0' and '1' only, one per group of 6 RBs");
        return;
    }
    const auto rbs = coresetRbs(coreset, bwp);
    const int bwpSize = bwp.RBNumber->getValue();
    if (rbs.empty()) {
        findings.error(path + (contiguous ? ".RBNumber" : ".FrequencyDomainBitmap"),
                       contiguous ? std::to_string(coreset.RBNumber->getValue()) : quoted(bitmap), "the CORESET has no RB");
    } else if (rbs.front() < 0 || rbs.back() >= bwpSize) {
        findings.error(path + (contiguous ? ".RBNumber" : ".FrequencyDomainBitmap"),
                       contiguous ? std::to_string(coreset.RBNumber->getValue()) : quoted(bitmap),
                       "the CORESET's RBs " + std::to_string(rbs.front()) + " to " + std::to_string(rbs.back()) +
                           " reach past the bandwidth part's RBs 0 to " + std::to_string(bwpSize - 1) +
                           " (TS 38.213 clause 10.1: each bit is 6 RBs from the first multiple of 6)");
    }
}

void checkDownlink(const CarrierRef& ref, FindingList& findings) {
    const auto& carrier = *ref.carrier;
    const auto downlink = carrier.Downlink->getValue();
    const std::string base = ref.path + ".Downlink";
    const auto bwps = downlink->BWP->getValue();
    for (int b = 0; b < bwps->getCount(); ++b) checkBwp(carrier, *bwps->getItem(b), itemPath(base, "BWP", b), findings);
    const auto noBwp = [&](const std::string& path, int index) {
        findings.error(path + ".BWPIndex", std::to_string(index),
                       "names no bandwidth part: Downlink.BWP holds " + std::to_string(bwps->getCount()) +
                           " (index from 0)");
    };

    const auto pdschs = downlink->DLSCH->getValue();
    for (int i = 0; i < pdschs->getCount(); ++i) {
        const auto& pdsch = *pdschs->getItem(i);
        if (!pdsch.Enabled->getValue()) continue;
        const std::string path = itemPath(base, "DLSCH", i);
        const auto* bwp = downlinkBwp(carrier, pdsch.BWPIndex->getValue());
        if (!bwp) {
            noBwp(path, pdsch.BWPIndex->getValue());
            continue;
        }
        switch (pdsch.RAType->getValue()) {
            case nr::RAType::RAType0:
                checkRbgAllocation(path, pdsch.RBGSize->getValue(), pdsch.RBGBitmap->getValue(), *bwp, findings);
                break;
            case nr::RAType::RAType1:
                checkContiguous(path, pdsch.RBOffset->getValue(), pdsch.RBNumber->getValue(), bwp->RBNumber->getValue(), findings);
                break;
            case nr::RAType::RAType2:
                findings.error(path + ".RAType", "RAType2",
                               "allocation type 2 (interlaces) is an uplink allocation; a PDSCH uses type 0 or 1 "
                               "(TS 38.214 clause 5.1.2.2)");
                break;
        }
        const int rmId = pdsch.CoresetIdForRM->getValue();
        if (rmId != -1) {
            bool found = false;
            for (int c = 0; c < 3; ++c)
                if (const auto* coreset = coresetAt(*bwp, c); coreset && coreset->ID->getValue() == rmId) found = true;
            if (!found)
                findings.warning(path + ".CoresetIdForRM", std::to_string(rmId),
                                 "no used CORESET of the bandwidth part has this ID: nothing is rate-matched around");
        }
    }

    const auto dcis = downlink->DCI->getValue();
    for (int i = 0; i < dcis->getCount(); ++i) {
        const auto& dci = *dcis->getItem(i);
        if (!dci.Enabled->getValue()) continue;
        const std::string path = itemPath(base, "DCI", i);
        const auto* bwp = downlinkBwp(carrier, dci.BWPIndex->getValue());
        if (!bwp) {
            noBwp(path, dci.BWPIndex->getValue());
            continue;
        }
        const int position = dci.CoresetIndex->getValue();
        const auto* coreset = coresetAt(*bwp, position);
        if (!coreset) {
            findings.error(path + ".CoresetIndex", std::to_string(position),
                           "names no CORESET: the bandwidth part uses " + std::to_string(bwp->NumberOfCoreset->getValue()) +
                               " (NumberOfCoreset), indices from 0");
            continue;
        }
        checkCoreset(itemPath(base, "BWP", dci.BWPIndex->getValue()) + ".Coreset" + std::to_string(position), *coreset, *bwp,
                     findings);
    }

    const auto csiRss = downlink->CSIRS->getValue();
    for (int i = 0; i < csiRss->getCount(); ++i) {
        const auto& csiRs = *csiRss->getItem(i);
        if (!csiRs.Enabled->getValue()) continue;
        const std::string path = itemPath(base, "CSIRS", i);
        const auto* bwp = downlinkBwp(carrier, csiRs.BWPIndex->getValue());
        if (!bwp) {
            noBwp(path, csiRs.BWPIndex->getValue());
            continue;
        }
        // A resource wider than the bandwidth part is cut at its edge (TS 38.211 clause 7.4.1.5.3).
        const int offset = csiRs.RBOffset->getValue();
        if (offset < 0 || offset >= bwp->RBNumber->getValue())
            findings.error(path + ".RBOffset", std::to_string(offset),
                           "the first RB lies outside the bandwidth part's RBs 0 to " + std::to_string(bwp->RBNumber->getValue() - 1));
    }
}

void checkUplink(const CarrierRef& ref, FindingList& findings) {
    const auto& carrier = *ref.carrier;
    const auto uplink = carrier.Uplink->getValue();
    const std::string base = ref.path + ".Uplink";
    const auto bwps = uplink->BWP->getValue();
    for (int b = 0; b < bwps->getCount(); ++b) checkBwp(carrier, *bwps->getItem(b), itemPath(base, "BWP", b), findings);
    const auto puschs = uplink->ULSCH->getValue();
    for (int i = 0; i < puschs->getCount(); ++i) {
        const auto& pusch = *puschs->getItem(i);
        if (!pusch.Enabled->getValue()) continue;
        const std::string path = itemPath(base, "ULSCH", i);
        const auto* bwp = uplinkBwp(carrier, pusch.BWPIndex->getValue());
        if (!bwp) {
            findings.error(path + ".BWPIndex", std::to_string(pusch.BWPIndex->getValue()),
                           "names no bandwidth part: Uplink.BWP holds " + std::to_string(bwps->getCount()) + " (index from 0)");
            continue;
        }
        if (pusch.RAType->getValue() == nr::RAType::RAType1)
            checkContiguous(path, pusch.RBOffset->getValue(), pusch.RBNumber->getValue(), bwp->RBNumber->getValue(), findings);
    }
}

}  // namespace

void checkGrid(const nr::NR5GWaveformSettings& waveform, FindingList& findings) {
    for (const auto& ref : activeCarriers(waveform)) {
        const auto type = ref.carrier->CarrierType->getValue();
        if (type == nr::CarrierType::DL) checkDownlink(ref, findings);
        if (type == nr::CarrierType::UL) checkUplink(ref, findings);
    }
}

}  // namespace nrsynth_cli::validation
