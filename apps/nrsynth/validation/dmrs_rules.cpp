// DM-RS and PT-RS combinations of the PDSCH that TS 38.211 defines, and ports, layers and code
// words that agree with each other.

#include <algorithm>
#include <string>

#include "models/nr_carrier.h"
#include "models/nr_dl_bwp.h"
#include "models/nr_dlsch.h"
#include "models/nr_downlink.h"
#include "models/nr_ulsch.h"
#include "models/nr_uplink.h"
#include "rule_support.h"
#include "tables/pdsch_tables.h"

namespace nrsynth_cli::validation {

namespace {

namespace tables = Orvalis_NR::tables;

/// TS 38.214 Table 5.1.2.1-1: start S and length L of a PDSCH per mapping type and prefix.
/// False when S or L is outside it: the DM-RS rules then have nothing sound to check.
bool checkTimeAllocation(const std::string& path, const nr::NRDLSCH& pdsch, bool extendedCp, FindingList& findings) {
    const bool typeB = pdsch.PDSCHMappingType->getValue() == nr::PDSCHMappingType::B;
    const int s = pdsch.FirstSymbol->getValue();
    const int l = pdsch.SymbolNumber->getValue();
    const int slotEnd = extendedCp ? 12 : 14;
    const int maxStart = typeB ? slotEnd - 2 : 3;
    const int minLength = typeB ? 2 : 3;
    const int maxLength = typeB ? (extendedCp ? 6 : 13) : slotEnd;
    const std::string where = std::string(" for mapping type ") + (typeB ? "B" : "A") + (extendedCp ? ", extended prefix" : "") +
                              " (TS 38.214 Table 5.1.2.1-1)";
    if (s < 0 || s > maxStart) {
        findings.error(path + ".FirstSymbol", std::to_string(s), "the start S is 0 to " + std::to_string(maxStart) + where);
        return false;
    }
    if (l < minLength || l > maxLength || s + l > slotEnd) {
        findings.error(path + ".SymbolNumber", std::to_string(l),
                       "the length L is " + std::to_string(minLength) + " to " + std::to_string(std::min(maxLength, slotEnd - s)) +
                           " from S = " + std::to_string(s) + where);
        return false;
    }
    if (!typeB) {
        const int apos = pdsch.DMRStypeApos->getValue();
        if (apos != 2 && apos != 3)
            findings.error(path + ".DMRStypeApos", std::to_string(apos), "dmrs-TypeA-Position is 2 or 3 (TS 38.211 clause 7.4.1.1.2)");
        else if (s > apos)
            findings.error(path + ".FirstSymbol", std::to_string(s),
                           "with mapping type A the first DM-RS symbol " + std::to_string(apos) +
                               " (DMRStypeApos) must lie inside the allocation, which starts later");
        else if (apos == 3 && pdsch.DMRSaddpos->getValue() == 3)
            findings.error(path + ".DMRSaddpos", "3",
                           "dmrs-AdditionalPosition 3 is only defined with dmrs-TypeA-Position 2 (TS 38.211 clause 7.4.1.1.2)");
        else
            return true;
        return false;
    }
    return true;
}

void checkDmrsPositions(const std::string& path, const nr::NRDLSCH& pdsch, FindingList& findings) {
    const int addPos = pdsch.DMRSaddpos->getValue();
    if (addPos < 0 || addPos > 3) {
        findings.error(path + ".DMRSaddpos", std::to_string(addPos), "dmrs-AdditionalPosition is 0 to 3");
        return;
    }
    const bool typeB = pdsch.PDSCHMappingType->getValue() == nr::PDSCHMappingType::B;
    const bool doubleSymbol = pdsch.DMRSDuration->getValue() == nr::DMRSDuration::DoubleSymbol;
    const int first = pdsch.FirstSymbol->getValue();
    const int length = pdsch.SymbolNumber->getValue();
    // l_d: the slot start to the last symbol for type A, the scheduled length for type B.
    const int ld = typeB ? length : first + length;
    if (ld < 0 || ld > 14) return;  // the time allocation rule reports it
    const auto& table = doubleSymbol ? tables::kPdschDmrsPositionsDouble : tables::kPdschDmrsPositionsSingle;
    const auto& cell = table[static_cast<std::size_t>(ld)][static_cast<std::size_t>((typeB ? 4 : 0) + addPos)];
    if (cell[0]) return;
    findings.error(path + ".DMRSaddpos", std::to_string(addPos),
                   std::string("TS 38.211 Table 7.4.1.1.2-") + (doubleSymbol ? "4 (double-symbol" : "3 (single-symbol") +
                       " DM-RS) defines no DM-RS position for mapping type " + (typeB ? "B" : "A") + ", l_d = " +
                       std::to_string(ld) + " and dmrs-AdditionalPosition " + std::to_string(addPos));
}

/// Ports, CDM groups, layers, antenna ports and code words.
void checkPorts(const std::string& path, const nr::NRDLSCH& pdsch, int antennas, FindingList& findings) {
    const bool type1 = pdsch.DMRSConfigurationType->getValue() == nr::DMRSConfigurationType::Type1;
    const bool doubleSymbol = pdsch.DMRSDuration->getValue() == nr::DMRSDuration::DoubleSymbol;
    const int layers = pdsch.NumberOfLayers->getValue();
    const std::string portText = pdsch.DMRSports->getValue();
    if (layers < 1 || layers > 8) {
        findings.error(path + ".NumberOfLayers", std::to_string(layers), "a PDSCH has 1 to 8 layers (TS 38.211 clause 7.3.1.3)");
        return;
    }
    const int codewords = pdsch.NumberOfCodewords->getValue();
    const int expectedCodewords = layers > 4 ? 2 : 1;
    if (codewords != expectedCodewords)
        findings.error(path + ".NumberOfCodewords", std::to_string(codewords),
                       std::to_string(layers) + " layers carry " + std::to_string(expectedCodewords) +
                           " code word(s) (TS 38.211 Table 7.3.1.3-1)");

    const auto ports = intList(portText);
    if (!ports) {
        findings.error(path + ".DMRSports", quoted(portText), "expected a comma list of DM-RS port numbers (0 for port 1000)");
        return;
    }
    if (static_cast<int>(ports->size()) != layers)
        findings.error(path + ".DMRSports", quoted(portText),
                       "expected one DM-RS port per layer: NumberOfLayers is " + std::to_string(layers));
    const int cdmGroups = pdsch.NumberOfDMRSCDMGroup->getValue();
    const int maxGroups = type1 ? 2 : 3;
    if (cdmGroups < 1 || cdmGroups > maxGroups)
        findings.error(path + ".NumberOfDMRSCDMGroup", std::to_string(cdmGroups),
                       std::string("configuration type ") + (type1 ? "1 has 1 or 2" : "2 has 1 to 3") +
                           " CDM groups (TS 38.211 Tables 7.4.1.1.2-1/-2)");
    const int portCount = (type1 ? 4 : 6) * (doubleSymbol ? 2 : 1);
    for (std::size_t i = 0; i < ports->size(); ++i) {
        const int p = (*ports)[i];
        if (p < 0 || p >= portCount) {
            findings.error(path + ".DMRSports", quoted(portText),
                           "port " + std::to_string(p) + " does not exist: configuration type " + (type1 ? "1" : "2") +
                               (doubleSymbol ? " with double-symbol" : " with single-symbol") + " DM-RS has ports 0 to " +
                               std::to_string(portCount - 1) + " (TS 38.211 Tables 7.4.1.1.2-1/-2)");
            return;
        }
        if (std::find(ports->begin(), ports->begin() + static_cast<std::ptrdiff_t>(i), p) != ports->begin() + static_cast<std::ptrdiff_t>(i)) {
            findings.error(path + ".DMRSports", quoted(portText), "port " + std::to_string(p) + " is named twice; each layer has its own port");
            return;
        }
        const int group = type1 ? tables::kPdschDmrsPortsType1[static_cast<std::size_t>(p)][0]
                                : tables::kPdschDmrsPortsType2[static_cast<std::size_t>(p)][0];
        if (cdmGroups >= 1 && cdmGroups <= maxGroups && group >= cdmGroups)
            findings.error(path + ".NumberOfDMRSCDMGroup", std::to_string(cdmGroups),
                           "port " + std::to_string(p) + " lies in CDM group " + std::to_string(group) +
                               ", so at least " + std::to_string(group + 1) +
                               " CDM groups are without data (TS 38.212 Tables 7.3.1.2.2-1 to -4)");
    }

    // The mapping follows AntennaPortArray alone; NumberOfAntennaPorts only describes it, so a
    // disagreement is worth a warning, not a refusal.
    const auto rows = antennaRows(pdsch.AntennaPortArray->getValue());
    const int antennaPorts = pdsch.NumberOfAntennaPorts->getValue();
    if (antennaPorts < layers)
        findings.warning(path + ".NumberOfAntennaPorts", std::to_string(antennaPorts),
                         "at least one antenna port per layer: NumberOfLayers is " + std::to_string(layers));
    else if (static_cast<int>(rows.size()) != antennaPorts)
        findings.warning(path + ".AntennaPortArray", quoted(pdsch.AntennaPortArray->getValue()),
                         "expected " + std::to_string(antennaPorts) + " ports (NumberOfAntennaPorts), one per antenna, -1 for none");
    if (!rows.empty() && rows.back() >= antennas)
        findings.warning(path + ".AntennaPortArray", quoted(pdsch.AntennaPortArray->getValue()),
                         "the waveform has " + std::to_string(antennas) +
                             " antenna(s) (NumberOfAntennas): ports past them are not generated");
}

/// TS 38.214 clause 5.1.6.3: time and frequency density and the ports of the PT-RS.
void checkPtrs(const std::string& path, const nr::NRDLSCH& pdsch, FindingList& findings) {
    if (!pdsch.PTRSEnabled->getValue()) return;
    const int k = pdsch.K_PTRS->getValue();
    const int l = pdsch.L_PTRS->getValue();
    if (k != 2 && k != 4)
        findings.error(path + ".K_PTRS", std::to_string(k), "the PT-RS frequency density K is 2 or 4 (TS 38.214 Table 5.1.6.3-2)");
    if (l != 1 && l != 2 && l != 4)
        findings.error(path + ".L_PTRS", std::to_string(l), "the PT-RS time density L is 1, 2 or 4 (TS 38.214 Table 5.1.6.3-1)");
    const auto ptrsPorts = intList(pdsch.getPTRSports());
    const auto dmrsPorts = intList(pdsch.DMRSports->getValue());
    if (!ptrsPorts || ptrsPorts->empty()) {
        findings.error(path + ".PTRSports", quoted(pdsch.getPTRSports()), "expected a comma list of PT-RS ports");
        return;
    }
    if (ptrsPorts->size() > 2)
        findings.error(path + ".PTRSports", quoted(pdsch.getPTRSports()), "a PDSCH has at most 2 PT-RS ports (TS 38.214 clause 5.1.6.3)");
    if (!dmrsPorts) return;
    for (int p : *ptrsPorts)
        if (std::find(dmrsPorts->begin(), dmrsPorts->end(), p) == dmrsPorts->end()) {
            findings.error(path + ".PTRSports", quoted(pdsch.getPTRSports()),
                           "PT-RS port " + std::to_string(p) + " is none of the DM-RS ports " + quoted(pdsch.DMRSports->getValue()) +
                               ": a PT-RS port is associated with a DM-RS port (TS 38.211 clause 7.4.1.2)");
            return;
        }
}

/// PUSCH layers and ports: at most 4 layers, one with transform precoding (TS 38.211 clauses
/// 6.3.1.3 and 6.3.1.4), one DM-RS port per layer.
void checkUplinkPorts(const std::string& path, const nr::NRULSCH& pusch, FindingList& findings) {
    const int layers = pusch.NumberOfLayers->getValue();
    const bool precoded = pusch.TransformPrecoding->getValue();
    if (layers < 1 || layers > 4 || (precoded && layers != 1)) {
        findings.error(path + ".NumberOfLayers", std::to_string(layers),
                       precoded ? "transform precoding carries a single layer (TS 38.211 clause 6.3.1.4)"
                                : "a PUSCH has 1 to 4 layers (TS 38.211 clause 6.3.1.3)");
        return;
    }
    const auto ports = intList(pusch.DMRSports->getValue());
    if (!ports || static_cast<int>(ports->size()) != layers)
        findings.error(path + ".DMRSports", quoted(pusch.DMRSports->getValue()),
                       "expected one DM-RS port per layer: NumberOfLayers is " + std::to_string(layers));
    if (pusch.NumberOfAntennaPorts->getValue() < layers)
        findings.warning(path + ".NumberOfAntennaPorts", std::to_string(pusch.NumberOfAntennaPorts->getValue()),
                       "at least one antenna port per layer: NumberOfLayers is " + std::to_string(layers));
}

}  // namespace

void checkDmrs(const nr::NR5GWaveformSettings& waveform, FindingList& findings) {
    const int antennas = waveform.NumberOfAntennas->getValue();
    for (const auto& ref : activeCarriers(waveform)) {
        if (ref.carrier->CarrierType->getValue() == nr::CarrierType::UL) {
            const auto puschs = ref.carrier->Uplink->getValue()->ULSCH->getValue();
            for (int i = 0; i < puschs->getCount(); ++i)
                if (puschs->getItem(i)->Enabled->getValue())
                    checkUplinkPorts(itemPath(ref.path + ".Uplink", "ULSCH", i), *puschs->getItem(i), findings);
        }
        if (ref.carrier->CarrierType->getValue() != nr::CarrierType::DL) continue;
        const auto pdschs = ref.carrier->Downlink->getValue()->DLSCH->getValue();
        for (int i = 0; i < pdschs->getCount(); ++i) {
            const auto& pdsch = *pdschs->getItem(i);
            if (!pdsch.Enabled->getValue()) continue;
            const std::string path = itemPath(ref.path + ".Downlink", "DLSCH", i);
            const auto* bwp = downlinkBwp(*ref.carrier, pdsch.BWPIndex->getValue());
            if (checkTimeAllocation(path, pdsch, bwp && bwp->CPType->getValue() == nr::CyclicPrefixType::Extended, findings))
                checkDmrsPositions(path, pdsch, findings);
            checkPorts(path, pdsch, antennas, findings);
            checkPtrs(path, pdsch, findings);
        }
    }
}

}  // namespace nrsynth_cli::validation
