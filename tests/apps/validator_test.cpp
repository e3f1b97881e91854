// The validator of the command-line tool: each rule with a document that trips it and one that
// does not, and the examples free of errors.

#include <gtest/gtest.h>

#include <filesystem>
#include <functional>
#include <nlohmann/json.hpp>
#include <sstream>
#include <string>

#include "commands.h"
#include "test_support.h"
#include "validation/document_check.h"

namespace {

using nlohmann::json;
using nrsynth_cli::validation::checkDocument;
using nrsynth_cli::validation::DocumentCheck;
using nrsynth_cli::validation::Severity;

// A 30 kHz carrier of 51 RBs: one BWP with one CORESET of 12 RBs in symbols 0-1, a DCI in it in
// slot 0, and a one-layer PDSCH over the whole BWP in symbols 2-13 of slots 0 and 1. Clean.
json baseDocument() {
    return json::parse(R"({
      "NumberOfFrames": 1, "NumberOfAntennas": 2,
      "NRCarriers": [{
        "CarrierType": "DL", "Numerology": "SCS30k", "Mu": 1, "NumberOfRB": 51, "CellID": 1,
        "Downlink": {
          "BWP": [{"Numerology": "SCS30k", "Mu": 1, "RBOffset": 0, "RBNumber": 51, "NumberOfCoreset": 1,
                   "Coreset0": {"ID": 1, "SymbolNumber": 2, "RBOffset": 0, "FrequencyDomainBitmap": "11"}}],
          "DCI": [{"BWPIndex": 0, "CoresetIndex": 0, "FirstSymbol": 0, "SlotIndexArrayStr": "0",
                   "AggregationLevel": 2, "AntennaPortArray": "2000"}],
          "DLSCH": [{"BWPIndex": 0, "DMRSports": "0", "NumberOfLayers": 1, "NumberOfAntennaPorts": 1,
                     "AntennaPortArray": "1000", "FirstSymbol": 2, "SymbolNumber": 12, "RBOffset": 0,
                     "RBNumber": 51, "SlotIndexArrayStr": "0,1", "CoresetIdForRM": 1, "MCS": 5}]
        }
      }]
    })");
}

json& carrier(json& d) { return d["NRCarriers"][0]; }
json& bwp(json& d) { return carrier(d)["Downlink"]["BWP"][0]; }
json& pdsch(json& d) { return carrier(d)["Downlink"]["DLSCH"][0]; }
json& dci(json& d) { return carrier(d)["Downlink"]["DCI"][0]; }

json csiRs(bool puncturing) {
    return {{"BWPIndex", 0}, {"RowIndex", 2}, {"FirstSymbol", 12}, {"RBOffset", 0}, {"RBNumber", 48},
            {"FrequencyDomainBitmap", "000000000001"}, {"NumberOfAntennaPorts", 1}, {"CDMType", "noCDM"},
            {"Density", "One"}, {"SlotIndexArrayStr", "0"}, {"AntennaPortArray", "3000"}, {"REUsedForPDSCH", puncturing}};
}

// A Case C burst of four blocks in the first half frame, centred on the carrier: block 0 takes
// symbols 2 to 5 of slot 0 and RBs 15 to 35.
void ssbOn(json& d) {
    carrier(d)["FrequencyOffsetOfPointA"] = -9180000;
    carrier(d)["Downlink"]["SSPBCH"] = {{"Enabled", true}, {"Mu", 1}, {"Numerology", "SCS30k"}, {"SSBlockPattern", "CaseC"},
                                        {"SSB30KSymbolIndex", "Option1"}, {"Lmax", 4}, {"SSBPeriod", "OneFrame"}};
    bwp(d)["Coreset0"]["FrequencyDomainBitmap"] = "0011";
    pdsch(d)["SlotIndexArrayStr"] = "2";  // the four blocks lie in slots 0 and 1
}

// The same carrier as an uplink carrier with one PUSCH over its BWP.
void uplinkOnly(json& d) {
    carrier(d)["CarrierType"] = "UL";
    carrier(d)["Uplink"] = json::parse(R"({
      "BWP": [{"Numerology": "SCS30k", "Mu": 1, "RBOffset": 0, "RBNumber": 51}],
      "ULSCH": [{"BWPIndex": 0, "DMRSports": "0", "NumberOfLayers": 1, "NumberOfAntennaPorts": 1, "AntennaPortArray": "1000",
                 "RBOffset": 0, "RBNumber": 51, "SlotIndexArrayStr": "0", "MCS": 3}]})");
}
json& pusch(json& d) { return carrier(d)["Uplink"]["ULSCH"][0]; }

struct RuleCase {
    const char* name;
    std::function<void(json&)> change;
    const char* path;  ///< the finding expected; empty for a document without findings
    Severity severity;
};

void PrintTo(const RuleCase& c, std::ostream* out) { *out << c.name; }

const RuleCase kCases[] = {
    {"base document is clean", [](json&) {}, "", Severity::Error},
    // Ranges
    {"cell identity 1008", [](json& d) { carrier(d)["CellID"] = 1008; }, "NRCarriers[0].CellID", Severity::Error},
    {"cell identity 1007", [](json& d) { carrier(d)["CellID"] = 1007; }, "", Severity::Error},
    {"MCS 32", [](json& d) { pdsch(d)["MCS"] = 32; }, "NRCarriers[0].Downlink.DLSCH[0].MCS", Severity::Error},
    {"MCS 29 reserved in table 1", [](json& d) { pdsch(d)["MCS"] = 29; }, "NRCarriers[0].Downlink.DLSCH[0].MCS", Severity::Warning},
    {"MCS 28 in table 1", [](json& d) { pdsch(d)["MCS"] = 28; }, "", Severity::Error},
    {"MCS 28 reserved in table 2",
     [](json& d) { pdsch(d)["MCS"] = 28; pdsch(d)["MCSTable"] = "Table51312"; }, "NRCarriers[0].Downlink.DLSCH[0].MCS", Severity::Warning},
    {"RNTI 65536", [](json& d) { pdsch(d)["RNTI"] = 65536; }, "NRCarriers[0].Downlink.DLSCH[0].RNTI", Severity::Error},
    {"RNTI 65535", [](json& d) { pdsch(d)["RNTI"] = 65535; }, "", Severity::Error},
    {"slot 20 of a 20-slot waveform", [](json& d) { pdsch(d)["SlotIndexArrayStr"] = "0,20"; },
     "NRCarriers[0].Downlink.DLSCH[0].SlotIndexArrayStr", Severity::Error},
    {"slot 19 of a 20-slot waveform", [](json& d) { pdsch(d)["SlotIndexArrayStr"] = "1,19"; }, "", Severity::Error},
    {"aggregation level 3", [](json& d) { dci(d)["AggregationLevel"] = 3; }, "NRCarriers[0].Downlink.DCI[0].AggregationLevel", Severity::Error},
    {"n_ID 1024", [](json& d) { pdsch(d)["n_ID"] = 1024; }, "NRCarriers[0].Downlink.DLSCH[0].n_ID", Severity::Error},
    // Grid
    {"BWP past the carrier", [](json& d) { bwp(d)["RBOffset"] = 1; }, "NRCarriers[0].Downlink.BWP[0].RBNumber", Severity::Error},
    {"BWP of 276 RBs", [](json& d) { bwp(d)["RBNumber"] = 276; carrier(d)["NumberOfRB"] = 276; },
     "NRCarriers[0].Downlink.BWP[0].RBNumber", Severity::Error},
    {"CORESET past the BWP", [](json& d) { bwp(d)["Coreset0"]["FrequencyDomainBitmap"] = "000000011"; },
     "NRCarriers[0].Downlink.BWP[0].Coreset0.FrequencyDomainBitmap", Severity::Error},
    {"CORESET index beyond NumberOfCoreset", [](json& d) { dci(d)["CoresetIndex"] = 1; },
     "NRCarriers[0].Downlink.DCI[0].CoresetIndex", Severity::Error},
    {"PDSCH past the BWP", [](json& d) { pdsch(d)["RBOffset"] = 1; }, "NRCarriers[0].Downlink.DLSCH[0].RBNumber", Severity::Error},
    {"PDSCH names no BWP", [](json& d) { pdsch(d)["BWPIndex"] = 1; }, "NRCarriers[0].Downlink.DLSCH[0].BWPIndex", Severity::Error},
    {"RBG size 3", [](json& d) { pdsch(d)["RAType"] = "RAType0"; pdsch(d)["RBGSize"] = 3; pdsch(d)["RBGBitmap"] = "1"; },
     "NRCarriers[0].Downlink.DLSCH[0].RBGSize", Severity::Error},
    {"RBG bitmap longer than the 13 groups",
     [](json& d) { pdsch(d)["RAType"] = "RAType0"; pdsch(d)["RBGSize"] = 4; pdsch(d)["RBGBitmap"] = "11111111111111"; },
     "NRCarriers[0].Downlink.DLSCH[0].RBGBitmap", Severity::Error},
    {"RBG bitmap of the 13 groups",
     [](json& d) { pdsch(d)["RAType"] = "RAType0"; pdsch(d)["RBGSize"] = 8; pdsch(d)["RBGBitmap"] = "1010101"; }, "", Severity::Error},
    {"CSI-RS starting past its BWP",
     [](json& d) { json c = csiRs(false); c["RBOffset"] = 51; carrier(d)["Downlink"]["CSIRS"] = json::array({c}); },
     "NRCarriers[0].Downlink.CSIRS[0].RBOffset", Severity::Error},
    {"CSI-RS wider than its BWP is cut at its edge",
     [](json& d) { json c = csiRs(false); c["RBNumber"] = 272; carrier(d)["Downlink"]["CSIRS"] = json::array({c}); }, "", Severity::Error},
    {"downlink allocation type 2", [](json& d) { pdsch(d)["RAType"] = "RAType2"; }, "NRCarriers[0].Downlink.DLSCH[0].RAType", Severity::Error},
    // DM-RS, time allocation, ports and layers
    {"type A starting at symbol 4", [](json& d) { pdsch(d)["FirstSymbol"] = 4; pdsch(d)["SymbolNumber"] = 10; },
     "NRCarriers[0].Downlink.DLSCH[0].FirstSymbol", Severity::Error},
    {"type A starting after DMRStypeApos 2", [](json& d) { pdsch(d)["FirstSymbol"] = 3; pdsch(d)["SymbolNumber"] = 11; },
     "NRCarriers[0].Downlink.DLSCH[0].FirstSymbol", Severity::Error},
    {"type A from symbol 3 with DMRStypeApos 3",
     [](json& d) { pdsch(d)["FirstSymbol"] = 3; pdsch(d)["SymbolNumber"] = 11; pdsch(d)["DMRStypeApos"] = 3; }, "", Severity::Error},
    {"type B of 14 symbols", [](json& d) { pdsch(d)["PDSCHMappingType"] = "B"; pdsch(d)["FirstSymbol"] = 0; pdsch(d)["SymbolNumber"] = 14; },
     "NRCarriers[0].Downlink.DLSCH[0].SymbolNumber", Severity::Error},
    {"type B of 7 symbols, one additional position",
     [](json& d) { pdsch(d)["PDSCHMappingType"] = "B"; pdsch(d)["FirstSymbol"] = 5; pdsch(d)["SymbolNumber"] = 7; pdsch(d)["DMRSaddpos"] = 1; },
     "", Severity::Error},
    {"type B of 2 symbols with double-symbol DM-RS",
     [](json& d) { pdsch(d)["PDSCHMappingType"] = "B"; pdsch(d)["FirstSymbol"] = 5; pdsch(d)["SymbolNumber"] = 2; pdsch(d)["DMRSDuration"] = "DoubleSymbol"; },
     "NRCarriers[0].Downlink.DLSCH[0].DMRSaddpos", Severity::Error},
    {"double-symbol DM-RS with two additional positions",
     [](json& d) { pdsch(d)["DMRSDuration"] = "DoubleSymbol"; pdsch(d)["DMRSaddpos"] = 2; },
     "NRCarriers[0].Downlink.DLSCH[0].DMRSaddpos", Severity::Error},
    {"DMRStypeApos 3 with three additional positions", [](json& d) { pdsch(d)["DMRStypeApos"] = 3; pdsch(d)["DMRSaddpos"] = 3; },
     "NRCarriers[0].Downlink.DLSCH[0].DMRSaddpos", Severity::Error},
    {"two DM-RS ports for one layer", [](json& d) { pdsch(d)["DMRSports"] = "0,1"; }, "NRCarriers[0].Downlink.DLSCH[0].DMRSports", Severity::Error},
    {"port 4 of single-symbol type 1", [](json& d) { pdsch(d)["DMRSports"] = "4"; }, "NRCarriers[0].Downlink.DLSCH[0].DMRSports", Severity::Error},
    {"port 2 with one CDM group", [](json& d) { pdsch(d)["DMRSports"] = "2"; },
     "NRCarriers[0].Downlink.DLSCH[0].NumberOfDMRSCDMGroup", Severity::Error},
    {"port 2 with two CDM groups", [](json& d) { pdsch(d)["DMRSports"] = "2"; pdsch(d)["NumberOfDMRSCDMGroup"] = 2; }, "", Severity::Error},
    {"fewer antenna ports than layers",
     [](json& d) { pdsch(d)["NumberOfLayers"] = 2; pdsch(d)["DMRSports"] = "0,1"; pdsch(d)["AntennaPortArray"] = "1000"; },
     "NRCarriers[0].Downlink.DLSCH[0].NumberOfAntennaPorts", Severity::Warning},
    {"AntennaPortArray count differs", [](json& d) { pdsch(d)["AntennaPortArray"] = "1000,1001"; },
     "NRCarriers[0].Downlink.DLSCH[0].AntennaPortArray", Severity::Warning},
    {"two layers on two antennas",
     [](json& d) {
         pdsch(d)["NumberOfLayers"] = 2; pdsch(d)["DMRSports"] = "0,1"; pdsch(d)["NumberOfAntennaPorts"] = 2; pdsch(d)["AntennaPortArray"] = "1000,1001";
     },
     "", Severity::Error},
    {"five layers in one code word",
     [](json& d) {
         d["NumberOfAntennas"] = 8;
         pdsch(d)["NumberOfLayers"] = 5; pdsch(d)["DMRSports"] = "0,1,2,3,4"; pdsch(d)["DMRSDuration"] = "DoubleSymbol";
         pdsch(d)["NumberOfDMRSCDMGroup"] = 2; pdsch(d)["NumberOfAntennaPorts"] = 5; pdsch(d)["AntennaPortArray"] = "1000,1001,1002,1003,1004";
     },
     "NRCarriers[0].Downlink.DLSCH[0].NumberOfCodewords", Severity::Error},
    {"PT-RS density K 3", [](json& d) { pdsch(d)["PTRSEnabled"] = true; pdsch(d)["K_PTRS"] = 3; },
     "NRCarriers[0].Downlink.DLSCH[0].K_PTRS", Severity::Error},
    {"PT-RS on a port without DM-RS", [](json& d) { pdsch(d)["PTRSEnabled"] = true; pdsch(d)["PTRSports"] = "1"; },
     "NRCarriers[0].Downlink.DLSCH[0].PTRSports", Severity::Error},
    {"PT-RS K 4 L 2 on the DM-RS port",
     [](json& d) { pdsch(d)["PTRSEnabled"] = true; pdsch(d)["K_PTRS"] = 4; pdsch(d)["L_PTRS"] = 2; }, "", Severity::Error},
    // Collisions
    {"two PDSCHs on one resource", [](json& d) { carrier(d)["Downlink"]["DLSCH"].push_back(pdsch(d)); },
     "NRCarriers[0].Downlink.DLSCH[1]", Severity::Error},
    {"two PDSCHs in different slots",
     [](json& d) {
         json second = pdsch(d);
         second["SlotIndexArrayStr"] = "2,3";
         carrier(d)["Downlink"]["DLSCH"].push_back(second);
     },
     "", Severity::Error},
    {"two PDSCHs on different antennas",
     [](json& d) {
         json second = pdsch(d);
         second["AntennaPortArray"] = "-1,1000";
         carrier(d)["Downlink"]["DLSCH"].push_back(second);
     },
     "", Severity::Error},
    {"PDSCH over a CORESET without rate matching", [](json& d) { pdsch(d)["FirstSymbol"] = 0; pdsch(d)["SymbolNumber"] = 14; pdsch(d)["CoresetIdForRM"] = -1; },
     "NRCarriers[0].Downlink.DLSCH[0].CoresetIdForRM", Severity::Error},
    {"PDSCH over a CORESET it rate-matches around", [](json& d) { pdsch(d)["FirstSymbol"] = 0; pdsch(d)["SymbolNumber"] = 14; }, "", Severity::Error},
    {"CSI-RS puncturing the PDSCH", [](json& d) { carrier(d)["Downlink"]["CSIRS"] = json::array({csiRs(true)}); },
     "NRCarriers[0].Downlink.CSIRS[0].REUsedForPDSCH", Severity::Warning},
    {"CSI-RS the PDSCH rate-matches around", [](json& d) { carrier(d)["Downlink"]["CSIRS"] = json::array({csiRs(false)}); }, "", Severity::Error},
    {"CORESET over an SS/PBCH block", [](json& d) { ssbOn(d); dci(d)["FirstSymbol"] = 2; },
     "NRCarriers[0].Downlink.DCI[0].SlotIndexArrayStr", Severity::Error},
    {"CORESET beside an SS/PBCH block in time", [](json& d) { ssbOn(d); }, "", Severity::Error},
    {"CORESET beside an SS/PBCH block in frequency",
     [](json& d) { ssbOn(d); dci(d)["FirstSymbol"] = 2; bwp(d)["Coreset0"]["FrequencyDomainBitmap"] = "11"; }, "", Severity::Error},
    {"PDSCH rate-matched around an SS/PBCH block", [](json& d) { ssbOn(d); pdsch(d)["SlotIndexArrayStr"] = "1"; },
     "NRCarriers[0].Downlink.DLSCH[0].SlotIndexArrayStr", Severity::Warning},
    // Uplink
    {"PUSCH is clean", [](json& d) { uplinkOnly(d); }, "", Severity::Error},
    {"PUSCH past its BWP", [](json& d) { uplinkOnly(d); pusch(d)["RBNumber"] = 52; }, "NRCarriers[0].Uplink.ULSCH[0].RBNumber", Severity::Error},
    {"PUSCH MCS 28 reserved in table 6.1.4.1-1",
     [](json& d) { uplinkOnly(d); pusch(d)["MCSTable"] = "Table61411"; pusch(d)["MCS"] = 28; },
     "NRCarriers[0].Uplink.ULSCH[0].MCS", Severity::Warning},
    {"two layers with transform precoding",
     [](json& d) {
         uplinkOnly(d); pusch(d)["TransformPrecoding"] = true; pusch(d)["NumberOfLayers"] = 2; pusch(d)["DMRSports"] = "0,1";
         pusch(d)["NumberOfAntennaPorts"] = 2;
     },
     "NRCarriers[0].Uplink.ULSCH[0].NumberOfLayers", Severity::Error},
    // Host values written in that contradict what they follow from. The base PDSCH worked by
    // hand with TS 38.214 clause 5.1.3.2: 51 RBs x (12 x 12 - 6 DM-RS) = 7038 REs, MCS 5 of
    // Table 5.1.3.1-1 (Qm 2, R 379/1024) gives N_info 5209.8, N'_info 5248 and TBS 5248.
    {"TransportBlockSize the MCS gives", [](json& d) { pdsch(d)["TransportBlockSize"] = 5248; }, "", Severity::Error},
    {"TransportBlockSize off by one", [](json& d) { pdsch(d)["TransportBlockSize"] = 5249; },
     "NRCarriers[0].Downlink.DLSCH[0].TransportBlockSize", Severity::Error},
    {"Modulation other than the MCS's", [](json& d) { pdsch(d)["Modulation"] = "QAM16"; },
     "NRCarriers[0].Downlink.DLSCH[0].Modulation", Severity::Error},
    {"CodingRate within half a 1024th", [](json& d) { pdsch(d)["CodingRate"] = 0.37; }, "", Severity::Error},
    {"CodingRate other than the MCS's", [](json& d) { pdsch(d)["CodingRate"] = 0.5; },
     "NRCarriers[0].Downlink.DLSCH[0].CodingRate", Severity::Warning},
    {"Mu not matching Numerology", [](json& d) { bwp(d)["Mu"] = 0; }, "NRCarriers[0].Downlink.BWP[0].Mu", Severity::Error},
    {"LastSymbol not first + number - 1", [](json& d) { pdsch(d)["LastSymbol"] = 12; },
     "NRCarriers[0].Downlink.DLSCH[0].LastSymbol", Severity::Error},
    {"SlotIndexArrayStr the expansion of SlotIndexStr", [](json& d) { pdsch(d)["SlotIndexStr"] = "0:1"; }, "", Severity::Error},
    {"SlotIndexArrayStr not the expansion of SlotIndexStr", [](json& d) { pdsch(d)["SlotIndexStr"] = "0:2"; },
     "NRCarriers[0].Downlink.DLSCH[0].SlotIndexArrayStr", Severity::Error},
    // Disabled items are not generated, so they are not checked.
    {"disabled PDSCH with a bad MCS", [](json& d) { pdsch(d)["MCS"] = 40; pdsch(d)["Enabled"] = false; }, "", Severity::Error},
};

class ValidatorRule : public ::testing::TestWithParam<RuleCase> {};

TEST_P(ValidatorRule, FindsExactlyTheBrokenSetting) {
    const auto& c = GetParam();
    json document = baseDocument();
    c.change(document);
    const DocumentCheck check = checkDocument(document.dump());
    EXPECT_TRUE(check.readerProblems.empty()) << check.readerProblems.front();
    std::ostringstream printed;
    nrsynth_cli::validation::printDocumentCheck(printed, "case", check);
    if (std::string(c.path).empty()) {
        EXPECT_TRUE(check.findings.all().empty()) << printed.str();
        return;
    }
    ASSERT_EQ(check.findings.all().size(), 1u) << printed.str();
    const auto& finding = check.findings.all().front();
    EXPECT_EQ(finding.path, c.path) << printed.str();
    EXPECT_EQ(finding.severity, c.severity) << printed.str();
    EXPECT_FALSE(finding.value.empty());
    EXPECT_GT(finding.rule.size(), 20u);
}

INSTANTIATE_TEST_SUITE_P(Cases, ValidatorRule, ::testing::ValuesIn(kCases));

TEST(ValidatorExamples, EveryExampleIsFreeOfErrors) {
    int checked = 0;
    for (const auto& entry : std::filesystem::directory_iterator(nrsynth_test::sourceDir() / "examples")) {
        // all_models.json is a reference of the settings tree (one item of every model, defaults
        // kept), not a waveform to generate.
        if (entry.path().extension() != ".json" || entry.path().filename() == "all_models.json") continue;
        const auto check = checkDocument(nrsynth_cli::readTextFile(entry.path().string()));
        std::ostringstream printed;
        nrsynth_cli::validation::printDocumentCheck(printed, entry.path().filename().string(), check);
        EXPECT_EQ(check.errorCount(), 0) << printed.str();
        ++checked;
    }
    EXPECT_GT(checked, 3);
}

TEST(ValidatorPrinting, NamesPathValueAndRuleAndCountsBySeverity) {
    json document = baseDocument();
    pdsch(document)["MCS"] = 30;
    carrier(document)["CellID"] = 2000;
    const auto check = checkDocument(document.dump());
    std::ostringstream printed;
    nrsynth_cli::validation::printDocumentCheck(printed, "doc.json", check);
    const std::string text = printed.str();
    EXPECT_NE(text.find("error: NRCarriers[0].CellID = 2000: a physical cell identity is 0 to 1007"), std::string::npos) << text;
    EXPECT_NE(text.find("warning: NRCarriers[0].Downlink.DLSCH[0].MCS = 30: "), std::string::npos) << text;
    EXPECT_NE(text.find("TS 38.214 Table 5.1.3.1-1"), std::string::npos) << text;
    EXPECT_NE(text.find("doc.json: 1 error(s), 1 warning(s)"), std::string::npos) << text;
}

}  // namespace
