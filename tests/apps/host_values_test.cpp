// The host values the command-line tool works out for documents that leave them out, against
// figures worked by hand from TS 38.214 clause 5.1.3.2 and from the examples' own values.

#include <gtest/gtest.h>

#include <fstream>
#include <functional>
#include <stdexcept>

#include "host/derived_values.h"
#include "host/shared_channel_size.h"
#include "host/slot_text.h"

namespace {

using nlohmann::ordered_json;
using nrsynth_host::completeDocument;

ordered_json withCarrier(ordered_json carrier) {
    return ordered_json{{"NRCarriers", ordered_json::array({std::move(carrier)})}};
}

ordered_json downlinkOf(ordered_json channel, int bwpRbs = 273) {
    ordered_json bwp{{"Name", "BWP1"}, {"Numerology", "SCS30k"}, {"RBOffset", 0}, {"RBNumber", bwpRbs}};
    return withCarrier({{"Numerology", "SCS30k"},
                        {"Downlink", {{"BWP", ordered_json::array({bwp})}, {"DLSCH", ordered_json::array({channel})}}}});
}

const ordered_json& dlsch(const ordered_json& document) { return document["NRCarriers"][0]["Downlink"]["DLSCH"][0]; }

struct SizeCase {
    const char* name;
    ordered_json channel;   // the keys that differ from a 1-layer, 14-symbol, type A PDSCH
    int transportBlockSize;
    double rateX1024;
    const char* modulation;
};

class SharedChannelSize : public testing::TestWithParam<SizeCase> {};

// Every case: BWP "BWP1" at 30 kHz; symbols 0..13 unless set, type A, single-symbol DM-RS type 1
// with two CDM groups without data (12 REs per DM-RS symbol).
TEST_P(SharedChannelSize, FollowsTs38214FromTheMcsAndTheAllocation) {
    ordered_json channel{{"FirstSymbol", 0},          {"SymbolNumber", 14}, {"NumberOfLayers", 1},
                         {"NumberOfCodewords", 1},    {"NumberOfDMRSCDMGroup", 2}, {"DMRSaddpos", 0}};
    channel.update(GetParam().channel);
    const auto completion = completeDocument(downlinkOf(channel));
    ASSERT_TRUE(completion.problems.empty()) << completion.problems.front();
    const auto& done = dlsch(completion.document);
    EXPECT_EQ(done["TransportBlockSize"], GetParam().transportBlockSize);
    EXPECT_DOUBLE_EQ(done["CodingRate"].get<double>(), GetParam().rateX1024 / 1024);
    EXPECT_EQ(done["Modulation"], GetParam().modulation);
}

INSTANTIATE_TEST_SUITE_P(
    HostValues, SharedChannelSize,
    testing::Values(
        // N'_RE 168 - 12 = 156, N_RE 1560, N_info 1560 x 120/1024 x 2 = 365.6: quantised with
        // step 8 to 360, the next size of Table 5.1.3.2-1 is 368.
        SizeCase{"SmallTableBranch", {{"MCS", 0}, {"RBNumber", 10}}, 368, 120, "QPSK"},
        // 2 DM-RS symbols (l_d 14, pos1), N'_RE 144, N_RE 39312, N_info 582309: step 2^14,
        // N' 589824, C = 71 blocks of 8424 at most, TBS 568 x 1039 - 24.
        SizeCase{"LargeManyBlocks",
                 {{"MCS", 27}, {"MCSTable", "Table51312"}, {"RBNumber", 273}, {"NumberOfLayers", 2}, {"DMRSaddpos", 1}},
                 590128, 948, "QAM256"},
        // N_info 7312.5 with R <= 1/4: N' 7296, C = ceil(7320 / 3816) = 2, TBS 16 x 458 - 24.
        SizeCase{"LowRateTwoBlocks", {{"MCS", 0}, {"RBNumber", 100}, {"NumberOfLayers", 2}}, 7304, 120, "QPSK"},
        // N_info 8019.4: N' 7936 <= 8424, one block, TBS 8 x ceil(7960 / 8) - 24.
        SizeCase{"OneLargeBlock", {{"MCS", 16}, {"RBNumber", 20}}, 7936, 658, "QAM16"},
        // xOverhead 6: N'_RE 150, N_RE 7650; S 0.5: N_info 16114.3, N' 16128, C 2, TBS 16136.
        SizeCase{"OverheadAndScaling",
                 {{"MCS", 23}, {"RBNumber", 51}, {"XOverhead", 6}, {"TBScalingFactor", 0.5}},
                 16136, 719, "QAM64"},
        // Two code words of 5 layers: the first takes 2 (TS 38.211 Table 7.3.1.3-1), N_info
        // 1560 x 2 x 120/1024 x 2 = 731.25, step 8: 728, table size 736.
        SizeCase{"FirstOfTwoCodeWords",
                 {{"MCS", 0}, {"RBNumber", 10}, {"NumberOfLayers", 5}, {"NumberOfCodewords", 2}},
                 736, 120, "QPSK"},
        // Allocation type 0 in a BWP from RB 0 of 273 with groups of 16: "101" is 32 RBs.
        SizeCase{"AllocationType0",
                 {{"MCS", 0}, {"RAType", "RAType0"}, {"RBGSize", 16}, {"RBGBitmap", "101"}},
                 1192, 120, "QPSK"}),
    [](const auto& info) { return std::string(info.param.name); });

TEST(HostValues, UplinkWithTransformPrecodingLeavesDmrsSymbolsFreeOfData) {
    ordered_json pusch{{"TransformPrecoding", true}, {"MCSTable", "Table61411"}, {"MCS", 0}, {"RBNumber", 25},
                       {"FirstSymbol", 0},           {"SymbolNumber", 14},      {"DMRSaddpos", 0}};
    ordered_json bwp{{"Name", "BWP1"}, {"Numerology", "SCS15k"}, {"RBOffset", 0}, {"RBNumber", 25}};
    auto document = withCarrier({{"Numerology", "SCS15k"},
                                 {"Uplink", {{"BWP", ordered_json::array({bwp})}, {"ULSCH", ordered_json::array({pusch})}}}});
    // q = 2 unless the document asks for pi/2-BPSK: R 120, then q = 1: R 240. N'_RE 168 - 12:
    // N_info 3900 x 120/1024 x 2 = 914.1 -> 912 -> 928; with q = 1 the same N_info.
    auto done = completeDocument(document).document["NRCarriers"][0]["Uplink"]["ULSCH"][0];
    EXPECT_EQ(done["TransportBlockSize"], 928);
    EXPECT_EQ(done["Modulation"], "QPSK");
    EXPECT_DOUBLE_EQ(done["CodingRate"].get<double>(), 120.0 / 1024);
    document["NRCarriers"][0]["Uplink"]["ULSCH"][0]["Modulation"] = "BPSK";
    done = completeDocument(document).document["NRCarriers"][0]["Uplink"]["ULSCH"][0];
    EXPECT_EQ(done["TransportBlockSize"], 928);
    EXPECT_EQ(done["Modulation"], "BPSK");
    EXPECT_DOUBLE_EQ(done["CodingRate"].get<double>(), 240.0 / 1024);
}

TEST(HostValues, AllocationType0CountsTheGroupsCutByTheBwpEdges) {
    // BWP from common RB 3, 20 RBs, groups of 4 aligned to RB 0: sizes 1, 4, 4, 4, 4, 3.
    EXPECT_EQ(nrsynth_host::allocatedResourceBlocks(true, 0, 4, "110001", 3, 20), 1 + 4 + 3);
    EXPECT_EQ(nrsynth_host::allocatedResourceBlocks(true, 0, 4, "111111", 3, 20), 20);
    EXPECT_EQ(nrsynth_host::allocatedResourceBlocks(true, 0, 4, "01", 0, 20), 4);
    EXPECT_EQ(nrsynth_host::allocatedResourceBlocks(false, 17, 4, "", 3, 20), 17);
}

TEST(HostValues, PresentKeysAreNeverChangedAndProblemsAreNamed) {
    auto document = downlinkOf({{"MCS", 0}, {"RBNumber", 10}, {"TransportBlockSize", 1234}, {"SlotIndexStr", "0:3"}});
    const auto completion = completeDocument(document);
    EXPECT_EQ(dlsch(completion.document)["TransportBlockSize"], 1234);
    EXPECT_EQ(dlsch(completion.document)["SlotIndexArrayStr"], "0,1,2,3");
    EXPECT_EQ(dlsch(completion.document)["BWPIndex"], 0);
    EXPECT_EQ(dlsch(completion.document)["LastSymbol"], 13);

    auto reserved = downlinkOf({{"MCS", 29}, {"BWPName", "Nowhere"}, {"SlotIndexStr", "3:1"}});
    const auto failed = completeDocument(reserved);
    ASSERT_EQ(failed.problems.size(), 3u);
    EXPECT_NE(failed.problems[0].find("DLSCH[0].BWPIndex: no bandwidth part is named \"Nowhere\""), std::string::npos);
    EXPECT_NE(failed.problems[1].find("DLSCH[0].SlotIndexStr: \"3:1\""), std::string::npos);
    EXPECT_NE(failed.problems[2].find("MCS 29 is reserved"), std::string::npos);
}

TEST(HostValues, SlotTextRepeatsOverTheFramesAndRefusesWhatNoFrameHolds) {
    using nrsynth_host::expandSlotText;
    EXPECT_EQ(expandSlotText("0:1, 5", 20, 2), "0,1,5,20,21,25");
    EXPECT_EQ(expandSlotText("2:8:2", 10, 1), "2,4,6,8");
    EXPECT_EQ(expandSlotText("", 10, 3), "");
    for (const char* bad : {"3:1", "x", "1:2:0", "1:2:3:4", "0:700", "-1", "1,,2"})
        EXPECT_THROW(nrsynth_host::parseSlotText(bad), std::invalid_argument) << bad;
    EXPECT_THROW(expandSlotText("0:20", 20, 1), std::invalid_argument);
}

TEST(HostValues, SampleRateIsTheSmallestOfTheFamilyThatHoldsEveryCarrier) {
    using nrsynth_host::autoSampleRate;
    EXPECT_EQ(autoSampleRate({0}, {25 * 12 * 15e3}), 7.68e6);         // 5 MHz
    EXPECT_EQ(autoSampleRate({0}, {106 * 12 * 15e3}), 30.72e6);       // 20 MHz
    EXPECT_EQ(autoSampleRate({0}, {273 * 12 * 30e3}), 122.88e6);      // 100 MHz
    EXPECT_EQ(autoSampleRate({-30e6, 30e6}, {106 * 12 * 15e3, 51 * 12 * 30e3}), 122.88e6);
    EXPECT_EQ(autoSampleRate({0}, {264 * 12 * 120e3}), 491.52e6);     // FR2 400 MHz
    EXPECT_EQ(autoSampleRate({200e6}, {264 * 12 * 120e3}), 0.0);      // past the family
}

// Every host value of an example left out: the completed document holds the example's values.
TEST(HostValues, ExamplesWithTheirHostValuesLeftOutAreCompletedToThemselves) {
    for (const char* name : {"csirs_trs_prs_30khz.json", "pdsch_full_load_100mhz.json",
                             "pdsch_type_b_ptrs_20mhz.json", "pdcch_coresets_30khz.json", "ssb_case_c_30khz.json"}) {
        std::ifstream in(std::string(NRSYNTH_SOURCE_DIR) + "/examples/" + name);
        const auto example = ordered_json::parse(in);
        auto stripped = example;
        const std::vector<std::string> hostKeys{"Mu",        "SampleRateAuto", "SlotIndexArrayStr", "LastSymbol",
                                                "BWPIndex",  "Modulation",     "CodingRate",        "TransportBlockSize"};
        std::function<void(ordered_json&)> strip = [&](ordered_json& node) {
            if (!node.is_structured()) return;
            // A PRS keeps its slot list: it has no typed form to work it out from.
            if (node.is_object() && !(node.contains("SlotIndexArrayStr") && !node.contains("SlotIndexStr")))
                for (const auto& key : hostKeys) node.erase(key);
            for (auto& child : node) strip(child);
        };
        strip(stripped);
        const auto completion = completeDocument(stripped);
        EXPECT_TRUE(completion.problems.empty()) << name;
        const auto difference = ordered_json::diff(example, completion.document);
        for (const auto& change : difference) {
            // Only a whole number written as a double may differ in form (30720000 / 30720000.0).
            const auto path = ordered_json::json_pointer(change["path"].get<std::string>());
            ASSERT_TRUE(change["op"] == "replace" && example.at(path).is_number()) << name << ": " << change.dump();
            EXPECT_EQ(example.at(path).get<double>(), completion.document.at(path).get<double>()) << name << change.dump();
        }
    }
}

}  // namespace
