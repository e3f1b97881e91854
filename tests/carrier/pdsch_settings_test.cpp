// Bad PDSCH settings fail at InitEngine with a text that names the setting and its value.

#include <gtest/gtest.h>

#include <fstream>
#include <functional>
#include <string>

#include "../engine/output_files.h"
#include "../engine/waveform_test_support.h"
#include "test_support.h"

namespace {

struct BadSetting {
    const char* name;
    std::function<void(nlohmann::json&)> change;
    const char* expected;  // part of the log text
};

const BadSetting kBad[] = {
    {"BwpIndexWithoutBwp", [](auto& d) { d["BWPIndex"] = 3; }, "DLSCH[0].BWPIndex 3"},
    {"AllocationPastTheBwp", [](auto& d) { d["RBNumber"] = 107; }, "RBNumber 107"},
    {"OffsetPastTheBwp", [](auto& d) { d["RBOffset"] = -1; }, "RBOffset -1"},
    {"ZeroTransportBlock", [](auto& d) { d["TransportBlockSize"] = 0; }, "TransportBlockSize 0"},
    {"NegativeTransportBlock", [](auto& d) { d["TransportBlockSize"] = -8; }, "TransportBlockSize -8"},
    {"TransportBlockTooLarge", [](auto& d) { d["TransportBlockSize"] = 2147483647; }, "TransportBlockSize 2147483647"},
    {"PortsAndLayersDisagree", [](auto& d) { d["DMRSports"] = "0,1,2"; }, "DMRSports \"0,1,2\""},
    {"PortOutOfRange", [](auto& d) { d["DMRSports"] = "0,1,2,3,4,5,6,9"; }, "DMRSports"},
    {"MalformedPortList", [](auto& d) { d["DMRSports"] = "0,x"; }, "invalid stoi argument"},
    {"MalformedSlotList", [](auto& d) { d["SlotIndexArrayStr"] = "1,,2"; }, "invalid stoi argument"},
    {"LayersOutOfRange", [](auto& d) { d["NumberOfLayers"] = 9; }, "NumberOfLayers 9"},
    {"LastSymbolPastTheSlot", [](auto& d) { d["LastSymbol"] = 14; }, "LastSymbol 14"},
    {"PtrsDensity", [](auto& d) { d["K_PTRS"] = 0; }, "K_PTRS 0"},
    {"RbgBitmapTooLong", [](auto& d) { d["RAType"] = "RAType0"; d["RBGBitmap"] = std::string(40, '1'); }, "RBGBitmap"},
    {"RntiOutOfRange", [](auto& d) { d["RNTI"] = 70000; }, "RNTI 70000"},
    {"RbgBitmapNotBinary", [](auto& d) { d["RAType"] = "RAType0"; d["RBGBitmap"] = "1x01"; }, "RBGBitmap \"1x01\""},
    {"MalformedAntennaPortArray", [](auto& d) { d["AntennaPortArray"] = "1000,,1001"; }, "invalid stoi argument"},
    {"PortNumberBeyondInt", [](auto& d) { d["DMRSports"] = "0,99999999999"; }, "stoi argument out of range"},
    {"MalformedPtrsPorts", [](auto& d) { d["PTRSEnabled"] = true; d["PTRSports"] = "0,a"; }, "invalid stoi argument"},
};

class PdschBadSettings : public ::testing::TestWithParam<BadSetting> {};

TEST_P(PdschBadSettings, FailNamingTheSetting) {
    std::ifstream in(nrsynth_test::sourceDir() / "examples" / "pdsch_type_b_ptrs_20mhz.json");
    auto document = nlohmann::json::parse(in);
    GetParam().change(document["NRCarriers"][0]["Downlink"]["DLSCH"][0]);
    nrsynth_test::ScratchFolder folder;
    StartDeserialize(document.dump().c_str());
    ASSERT_EQ(GetStatus(), 0) << GetLog();
    InitEngine(folder.file("bad.bin").c_str());
    if (GetStatus() == 0) RunEngine();  // the carriers are set up by the run
    EXPECT_EQ(GetStatus(), -1);
    EXPECT_NE(std::string(GetLog()).find(GetParam().expected), std::string::npos) << GetLog();
}

INSTANTIATE_TEST_SUITE_P(Cases, PdschBadSettings, ::testing::ValuesIn(kBad),
                         [](const auto& info) { return std::string(info.param.name); });

}  // namespace
