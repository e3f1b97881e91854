// Values that the 3GPP specifications bound: identities, MCS indices per table, symbols inside
// the slot and slots inside the waveform.

#include <string>

#include "models/nr_carrier.h"
#include "models/nr_csirs.h"
#include "models/nr_dci.h"
#include "models/nr_dl_bwp.h"
#include "models/nr_dlsch.h"
#include "models/nr_downlink.h"
#include "models/nr_sspbch.h"
#include "models/nr_ul_bwp.h"
#include "models/nr_ulsch.h"
#include "models/nr_uplink.h"
#include "rule_support.h"

namespace nrsynth_cli::validation {

namespace {

struct McsTableInfo {
    const char* name;  ///< the 3GPP table
    int lastDataRow;   ///< rows above it are reserved (retransmissions only)
};

McsTableInfo downlinkMcsTable(nr::DLSCHMCSTable table) {
    switch (table) {
        case nr::DLSCHMCSTable::Table51312: return {"TS 38.214 Table 5.1.3.1-2", 27};
        case nr::DLSCHMCSTable::Table51313: return {"TS 38.214 Table 5.1.3.1-3", 28};
        case nr::DLSCHMCSTable::Table51311: break;
    }
    return {"TS 38.214 Table 5.1.3.1-1", 28};
}

McsTableInfo uplinkMcsTable(nr::ULSCHMCSTable table) {
    switch (table) {
        case nr::ULSCHMCSTable::Table51312: return {"TS 38.214 Table 5.1.3.1-2", 27};
        case nr::ULSCHMCSTable::Table51313: return {"TS 38.214 Table 5.1.3.1-3", 28};
        case nr::ULSCHMCSTable::Table61411: return {"TS 38.214 Table 6.1.4.1-1", 27};
        case nr::ULSCHMCSTable::Table61412: return {"TS 38.214 Table 6.1.4.1-2", 27};
        case nr::ULSCHMCSTable::Table51311: break;
    }
    return {"TS 38.214 Table 5.1.3.1-1", 28};
}

void checkMcs(const std::string& path, int mcs, const McsTableInfo& table, FindingList& findings) {
    if (mcs < 0 || mcs > 31) {
        findings.error(path + ".MCS", std::to_string(mcs), std::string("an MCS index is 0 to 31 (") + table.name + ")");
    } else if (mcs > table.lastDataRow) {
        findings.warning(path + ".MCS", std::to_string(mcs),
                         std::string("rows ") + std::to_string(table.lastDataRow + 1) + " to 31 of " + table.name +
                             " are reserved: they give only the modulation of a retransmission, the transport block "
                             "size must come from its initial transmission");
    }
}

void checkRnti(const std::string& path, int rnti, FindingList& findings) {
    if (rnti < 0 || rnti > 65535)
        findings.error(path + ".RNTI", std::to_string(rnti), "an RNTI is 0 to 65535 (16 bits, TS 38.321 clause 7.1)");
}

/// An identity where -1 stands for the cell identity.
void checkIdentity(const std::string& path, const char* key, int value, int maximum, FindingList& findings) {
    if (value == -1 || (value >= 0 && value <= maximum)) return;
    findings.error(path + "." + key, std::to_string(value),
                   "expected -1 (the cell identity) or 0 to " + std::to_string(maximum) + " (TS 38.211)");
}

void checkSymbols(const std::string& path, int first, int count, int perSlot, FindingList& findings) {
    if (first < 0 || first >= perSlot) {
        findings.error(path + ".FirstSymbol", std::to_string(first),
                       "a slot has symbols 0 to " + std::to_string(perSlot - 1));
    } else if (count < 1 || count > perSlot - first) {
        findings.error(path + ".SymbolNumber", std::to_string(count),
                       "from FirstSymbol " + std::to_string(first) + " the slot holds 1 to " +
                           std::to_string(perSlot - first) + " symbols");
    }
}

void checkSlots(const std::string& path, const std::string& slotText, int slotCount, FindingList& findings) {
    const auto slots = intList(slotText);
    if (!slots) {
        findings.error(path + ".SlotIndexArrayStr", quoted(slotText), "expected a comma list of slot numbers");
        return;
    }
    for (int slot : *slots) {
        if (slot >= 0 && slot < slotCount) continue;
        findings.error(path + ".SlotIndexArrayStr", quoted(slotText),
                       "slot " + std::to_string(slot) + " lies outside the waveform, which has slots 0 to " +
                           std::to_string(slotCount - 1) + " (NumberOfFrames x 10 x 2^mu)");
        return;
    }
}

void checkDownlink(const nr::NR5GWaveformSettings& waveform, const CarrierRef& ref, FindingList& findings) {
    const auto& carrier = *ref.carrier;
    const auto downlink = carrier.Downlink->getValue();
    const std::string base = ref.path + ".Downlink";

    const auto pdschs = downlink->DLSCH->getValue();
    for (int i = 0; i < pdschs->getCount(); ++i) {
        const auto& pdsch = *pdschs->getItem(i);
        if (!pdsch.Enabled->getValue()) continue;
        const std::string path = itemPath(base, "DLSCH", i);
        checkRnti(path, pdsch.RNTI->getValue(), findings);
        checkMcs(path, pdsch.MCS->getValue(), downlinkMcsTable(pdsch.MCSTable->getValue()), findings);
        checkIdentity(path, "n_ID", pdsch.n_ID->getValue(), 1023, findings);
        checkIdentity(path, "N_ID_0", pdsch.N_ID_0->getValue(), 65535, findings);
        checkIdentity(path, "N_ID_1", pdsch.N_ID_1->getValue(), 65535, findings);
        checkIdentity(path, "N_ID_nSCID", pdsch.N_ID_nSCID->getValue(), 65535, findings);
        if (pdsch.n_SCID->getValue() != 0 && pdsch.n_SCID->getValue() != 1)
            findings.error(path + ".n_SCID", std::to_string(pdsch.n_SCID->getValue()), "n_SCID is 0 or 1 (TS 38.211 clause 7.4.1.1.1)");
        const auto* bwp = downlinkBwp(carrier, pdsch.BWPIndex->getValue());
        if (!bwp) continue;
        // Its symbols are checked against TS 38.214 Table 5.1.2.1-1 with the DM-RS.
        checkSlots(path, pdsch.SlotIndexArrayStr->getValue(), slotsInWaveform(waveform, muOf(bwp->Numerology->getValue())),
                   findings);
    }

    const auto dcis = downlink->DCI->getValue();
    for (int i = 0; i < dcis->getCount(); ++i) {
        const auto& dci = *dcis->getItem(i);
        if (!dci.Enabled->getValue()) continue;
        const std::string path = itemPath(base, "DCI", i);
        checkRnti(path, dci.RNTI->getValue(), findings);
        const int level = dci.AggregationLevel->getValue();
        if (level != 1 && level != 2 && level != 4 && level != 8 && level != 16)
            findings.error(path + ".AggregationLevel", std::to_string(level),
                           "an aggregation level is 1, 2, 4, 8 or 16 CCEs (TS 38.211 Table 7.3.2.1-1)");
        const auto* bwp = downlinkBwp(carrier, dci.BWPIndex->getValue());
        if (!bwp) continue;
        const auto* coreset = coresetAt(*bwp, dci.CoresetIndex->getValue());
        const int perSlot = symbolsPerSlot(bwp->CPType->getValue());
        if (coreset) checkSymbols(path, dci.FirstSymbol->getValue(), coreset->SymbolNumber->getValue(), perSlot, findings);
        checkSlots(path, dci.SlotIndexArrayStr->getValue(), slotsInWaveform(waveform, muOf(bwp->Numerology->getValue())),
                   findings);
    }

    const auto csiRss = downlink->CSIRS->getValue();
    for (int i = 0; i < csiRss->getCount(); ++i) {
        const auto& csiRs = *csiRss->getItem(i);
        if (!csiRs.Enabled->getValue()) continue;
        const std::string path = itemPath(base, "CSIRS", i);
        const int row = csiRs.RowIndex->getValue();
        if (row < 1 || row > 18)
            findings.error(path + ".RowIndex", std::to_string(row), "TS 38.211 Table 7.4.1.5.3-1 has rows 1 to 18");
        checkIdentity(path, "n_ID", csiRs.n_ID->getValue(), 1023, findings);
        const auto* bwp = downlinkBwp(carrier, csiRs.BWPIndex->getValue());
        if (!bwp) continue;
        checkSlots(path, csiRs.SlotIndexArrayStr->getValue(),
                   slotsInWaveform(waveform, muOf(bwp->Numerology->getValue())), findings);
    }

    const auto& ssb = *downlink->SSPBCH->getValue();
    if (ssb.Enabled->getValue()) {
        const int lmax = ssb.Lmax->getValue();
        if (lmax != 4 && lmax != 8 && lmax != 64)
            findings.error(base + ".SSPBCH.Lmax", std::to_string(lmax),
                           "a burst holds at most 4, 8 or 64 SS/PBCH blocks (TS 38.213 clause 4.1)");
    }
}

void checkUplink(const nr::NR5GWaveformSettings& waveform, const CarrierRef& ref, FindingList& findings) {
    const auto& carrier = *ref.carrier;
    const auto puschs = carrier.Uplink->getValue()->ULSCH->getValue();
    const std::string base = ref.path + ".Uplink";
    for (int i = 0; i < puschs->getCount(); ++i) {
        const auto& pusch = *puschs->getItem(i);
        if (!pusch.Enabled->getValue()) continue;
        const std::string path = itemPath(base, "ULSCH", i);
        checkRnti(path, pusch.RNTI->getValue(), findings);
        checkMcs(path, pusch.MCS->getValue(), uplinkMcsTable(pusch.MCSTable->getValue()), findings);
        checkIdentity(path, "n_ID", pusch.n_ID->getValue(), 1023, findings);
        const auto* bwp = uplinkBwp(carrier, pusch.BWPIndex->getValue());
        if (!bwp) continue;
        checkSymbols(path, pusch.FirstSymbol->getValue(), pusch.SymbolNumber->getValue(),
                     symbolsPerSlot(bwp->CPType->getValue()), findings);
        checkSlots(path, pusch.SlotIndexArrayStr->getValue(), slotsInWaveform(waveform, muOf(bwp->Numerology->getValue())),
                   findings);
    }
}

}  // namespace

void checkRanges(const nr::NR5GWaveformSettings& waveform, FindingList& findings) {
    if (waveform.NumberOfFrames->getValue() < 1)
        findings.error("NumberOfFrames", std::to_string(waveform.NumberOfFrames->getValue()),
                       "a waveform holds at least one 10 ms frame");
    for (const auto& ref : activeCarriers(waveform)) {
        const int cellId = ref.carrier->CellID->getValue();
        if (cellId < 0 || cellId > 1007)
            findings.error(ref.path + ".CellID", std::to_string(cellId),
                           "a physical cell identity is 0 to 1007 (TS 38.211 clause 7.4.2.1)");
        const auto type = ref.carrier->CarrierType->getValue();
        if (type == nr::CarrierType::DL) checkDownlink(waveform, ref, findings);
        if (type == nr::CarrierType::UL) checkUplink(waveform, ref, findings);
    }
}

}  // namespace nrsynth_cli::validation
