// Which edition of the base-sequence tables a waveform selects: the first carrier's bandwidth part
// named with "15.1" selects the first edition, for the rest of the process.

#include <gtest/gtest.h>

#include <memory>
#include <string>

#include "coding/table_edition.h"
#include "engine/nr5g_engine.h"
#include "framework/json_serializer.h"
#include "models/nr5g_waveform_settings.h"
#include "output_files.h"
#include "waveform_test_support.h"

namespace {

using Models::Nr5g::NR5GWaveformSettings;

struct EditionCase {
    const char* name;
    nlohmann::json carriers;
    int edition;
};

nlohmann::json downlink(nlohmann::json bwps) {
    return {{"CarrierType", "DL"}, {"Downlink", {{"BWP", std::move(bwps)}}}};
}

class TableEditionSelection : public ::testing::TestWithParam<EditionCase> {
  protected:
    // The edition is process-wide: every case starts from the second and leaves it so.
    void SetUp() override { Orvalis_NR::specVersion = 152; }
    void TearDown() override { Orvalis_NR::specVersion = 152; }

    void initEngine(const nlohmann::json& carriers) {
        nlohmann::json document = {{"SampleRateAuto", 3.84e6}, {"NRCarriers", carriers}};
        Orvalis::Tessaline::JsonSerializer serializer;
        auto settings = std::dynamic_pointer_cast<NR5GWaveformSettings>(serializer.deserialize(document.dump()));
        ASSERT_TRUE(settings);
        Orvalis_NR::NR5GEngine engine;
        engine.Init(*settings, folder.file("wave.bin").c_str());
    }
    nrsynth_test::ScratchFolder folder;
};

TEST_P(TableEditionSelection, FollowsTheFirstCarriersBandwidthPartName) {
    initEngine(GetParam().carriers);
    EXPECT_EQ(Orvalis_NR::specVersion, GetParam().edition);
}

const nlohmann::json kInitial15 = {{"Name", "initial 15.1"}, {"InitialDLBWP", true}};

INSTANTIATE_TEST_SUITE_P(
    Cases, TableEditionSelection,
    ::testing::Values(
        EditionCase{"DownlinkFirstPart", nlohmann::json::array({downlink({{{"Name", "BWP 15.1"}}, {{"Name", "other"}}})}), 151},
        EditionCase{"DownlinkSecondPartOnly", nlohmann::json::array({downlink({{{"Name", "BWP"}}, {{"Name", "BWP 15.1"}}})}), 152},
        // An initial part is passed over for the second, when there is one.
        EditionCase{"InitialPartPassedOver", nlohmann::json::array({downlink({kInitial15, {{"Name", "active"}}})}), 152},
        EditionCase{"PartAfterTheInitialOne",
                    nlohmann::json::array({downlink({{{"Name", "initial"}, {"InitialDLBWP", true}}, {{"Name", "x15.1y"}}})}), 151},
        EditionCase{"InitialPartAlone", nlohmann::json::array({downlink(nlohmann::json::array({kInitial15}))}), 151},
        EditionCase{"OtherVersion", nlohmann::json::array({downlink(nlohmann::json::array({{{"Name", "BWP 15.2"}}}))}), 152},
        EditionCase{"NoPart", nlohmann::json::array({downlink(nlohmann::json::array())}), 152},
        EditionCase{"Uplink",
                    nlohmann::json::array({{{"CarrierType", "UL"},
                                            {"Uplink", {{"BWP", nlohmann::json::array({{{"Name", "UL 15.1"}}})}}}}}),
                    151},
        EditionCase{"ContinuousWaveFirst",
                    nlohmann::json::array({{{"CarrierType", "CW"}}, downlink(nlohmann::json::array({{{"Name", "15.1"}}}))}),
                    152},
        EditionCase{"NoCarrier", nlohmann::json::array(), 152}),
    [](const auto& info) { return std::string(info.param.name); });

TEST_F(TableEditionSelection, FirstEditionStaysForLaterWaveforms) {
    initEngine(nlohmann::json::array({downlink(nlohmann::json::array({{{"Name", "15.1"}}}))}));
    ASSERT_EQ(Orvalis_NR::specVersion, 151);
    initEngine(nlohmann::json::array({downlink(nlohmann::json::array({{{"Name", "Rel-16"}}}))}));
    EXPECT_EQ(Orvalis_NR::specVersion, 151);
}

}  // namespace
