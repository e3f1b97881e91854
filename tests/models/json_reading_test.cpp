#include <gtest/gtest.h>

#include <fstream>
#include <random>
#include <sstream>

#include "framework/json_serializer.h"
#include "models/all_models.h"
#include "test_support.h"

namespace {

using namespace Models::Nr5g;
using Orvalis::Tessaline::DeserializeError;
using Orvalis::Tessaline::JsonSerializer;

std::shared_ptr<NR5GWaveformSettings> read(const std::string& json) {
    JsonSerializer reader;
    return std::dynamic_pointer_cast<NR5GWaveformSettings>(reader.deserialize(json));
}

std::string errorOf(const std::string& json) {
    try {
        read(json);
    } catch (const DeserializeError& e) {
        return e.what();
    }
    return "(no error)";
}

std::string example(const std::string& name) {
    std::ifstream in(nrsynth_test::sourceDir() / "examples" / name);
    std::ostringstream text;
    text << in.rdbuf();
    return text.str();
}

TEST(JsonReading, EmptyDocumentIsTheDefaultTree) {
    auto root = read("{}");
    ASSERT_NE(root, nullptr);
    EXPECT_TRUE(root->equals(std::make_shared<NR5GWaveformSettings>()));
    EXPECT_EQ(root->NRCarriers->getValue()->getCount(), 0);
    EXPECT_EQ(root->TotalSamplePoints->getValue(), 1228800);
}

TEST(JsonReading, OmittedKeysKeepTheirDefaults) {
    auto root = read(R"({"NRCarriers": [{"CellID": 5, "Downlink": {"DLSCH": [{"MCS": 9}]}}]})");
    auto carrier = root->NRCarriers->getValue()->getItem(0);
    ASSERT_NE(carrier, nullptr);
    EXPECT_EQ(carrier->CellID->getValue(), 5);
    EXPECT_EQ(carrier->NumberOfRB->getValue(), 273);
    EXPECT_EQ(carrier->SSRSRP->getValue(), -45.15);
    auto dlsch = carrier->Downlink->getValue()->DLSCH->getValue()->getItem(0);
    EXPECT_EQ(dlsch->MCS->getValue(), 9);
    EXPECT_EQ(dlsch->TransportBlockSize->getValue(), 3200);
    EXPECT_EQ(dlsch->Name->getValue(), "DL-SCH1");
}

struct EnumCase {
    const char* json;
    int expected;
};

class EnumForms : public ::testing::TestWithParam<EnumCase> {};

void PrintTo(const EnumCase& c, std::ostream* os) {
    *os << c.json;
}

TEST_P(EnumForms, NameDisplayNameOrPosition) {
    const std::string doc =
        std::string(R"({"NRCarriers": [{"Downlink": {"DLSCH": [{"Modulation": )") +
        GetParam().json + "}]}}]}";
    auto dlsch = read(doc)
                     ->NRCarriers->getValue()
                     ->getItem(0)
                     ->Downlink->getValue()
                     ->DLSCH->getValue()
                     ->getItem(0);
    EXPECT_EQ(dlsch->Modulation->getInt32(), GetParam().expected);
}

INSTANTIATE_TEST_SUITE_P(JsonReading, EnumForms,
                         ::testing::Values(EnumCase{R"("QAM16")", 3}, EnumCase{R"("16QAM")", 3},
                                           EnumCase{R"("pi/2 BPSK")", 0}, EnumCase{"6", 6},
                                           EnumCase{R"("QAM1024")", 6}));

TEST(JsonReading, MicroSignDisplayNames) {
    auto root = read(R"({"DefaultCarrier": {"Numerology": "µ = 2: 60 kHz Extended CP"}})");
    EXPECT_EQ(root->DefaultCarrier->getValue()->Numerology->getValue(), Numerology::SCS60kECP);
}

struct ErrorCase {
    const char* json;
    const char* message;
};

class ReadErrors : public ::testing::TestWithParam<ErrorCase> {};

void PrintTo(const ErrorCase& c, std::ostream* os) {
    *os << c.json;
}

TEST_P(ReadErrors, NameThePathOfTheBadValue) {
    EXPECT_EQ(errorOf(GetParam().json), GetParam().message);
}

INSTANTIATE_TEST_SUITE_P(
    JsonReading, ReadErrors,
    ::testing::Values(
        ErrorCase{R"({"NRCarriers": [{}, {"Downlink": {"DLSCH": [{}, {"MCS": "x"}]}}]})",
                  R"(NRCarriers[1].Downlink.DLSCH[1].MCS: expected an integer, got "x")"},
        ErrorCase{R"({"NumberOfFrames": 1.5})", "NumberOfFrames: expected an integer, got 1.5"},
        ErrorCase{R"({"NumberOfFrames": 3000000000})",
                  "NumberOfFrames: integer 3000000000 is out of the 32-bit range"},
        ErrorCase{R"({"RadioFrequency": "1e9"})",
                  R"(RadioFrequency: expected a number, got "1e9")"},
        ErrorCase{R"({"AwgnEnabled": 1})", "AwgnEnabled: expected true or false, got 1"},
        ErrorCase{R"({"WaveformName": null})", "WaveformName: expected a string, got null"},
        ErrorCase{R"({"Marker1": "qpsk"})", R"(Marker1: unknown enumerator "qpsk")"},
        ErrorCase{R"({"Marker1": 4})", "Marker1: enumerator position 4 is out of the range 0..3"},
        ErrorCase{R"({"Marker1": -1})", "Marker1: enumerator position -1 is out of the range 0..3"},
        ErrorCase{R"({"Marker1": true})",
                  "Marker1: expected an enumerator name, display name or position, got true"},
        ErrorCase{R"({"NRCarriers": {"$values": 3}})",
                  "NRCarriers: expected an array of Models.Nr5g.NRCarrier, got 3"},
        ErrorCase{R"({"NRCarriers": {"items": []}})",
                  R"(NRCarriers: expected an array or an object with "$values", got an object with 1 key)"},
        ErrorCase{
            R"({"NRCarriers": [{"$type": "Models.Nr5g.NRDCI"}]})",
            R"(NRCarriers[0]: $type "Models.Nr5g.NRDCI" is not the expected type Models.Nr5g.NRCarrier)"},
        ErrorCase{R"({"NRCarriers": [7]})",
                  "NRCarriers[0]: expected an object of type Models.Nr5g.NRCarrier, got 7"},
        ErrorCase{
            R"({"$type": "Models.Nr5g.NRCarrier"})",
            R"((root): $type "Models.Nr5g.NRCarrier" is not the expected type Models.Nr5g.NR5GWaveformSettings)"},
        ErrorCase{"[]",
                  "(root): expected an object of type Models.Nr5g.NR5GWaveformSettings, got an empty array"}));

TEST(JsonReading, MalformedTextIsAnError) {
    EXPECT_NE(errorOf(R"({"NumberOfFrames": )").find("malformed JSON"), std::string::npos);
    EXPECT_NE(errorOf("").find("malformed JSON"), std::string::npos);
    EXPECT_NE(errorOf(R"({"a": 1e999})").find("malformed JSON"), std::string::npos);
}

TEST(JsonReading, UnknownKeysAreIgnoredAndListed) {
    JsonSerializer reader;
    auto root = std::dynamic_pointer_cast<NR5GWaveformSettings>(reader.deserialize(
        R"({"Future": 1, "NRCarriers": [{"Downlink": {"SSPBCH": {"Colour": "red", "Lmax": 8}}}]})"));
    EXPECT_EQ(reader.getUnknownKeys(),
              (std::vector<std::string>{"Future", "NRCarriers[0].Downlink.SSPBCH.Colour"}));
    EXPECT_EQ(root->NRCarriers->getValue()
                  ->getItem(0)
                  ->Downlink->getValue()
                  ->SSPBCH->getValue()
                  ->Lmax->getValue(),
              8);
}

TEST(JsonReading, CollectingModeListsEveryBadValue) {
    JsonSerializer reader;
    reader.setCollectIssues(true);
    auto root =
        reader.deserialize(R"({"NumberOfFrames": "2", "Marker1": "x", "NumberOfAntennas": 2})");
    ASSERT_EQ(reader.getIssues().size(), 2u);
    EXPECT_EQ(std::dynamic_pointer_cast<NR5GWaveformSettings>(root)->NumberOfAntennas->getValue(),
              2);
}

TEST(JsonReading, EveryModelTypeOfTheReferenceDocument) {
    const auto text = example("all_models.json");
    ASSERT_FALSE(text.empty());
    JsonSerializer reader;
    auto root = std::dynamic_pointer_cast<NR5GWaveformSettings>(reader.deserialize(text));
    ASSERT_NE(root, nullptr);
    EXPECT_TRUE(reader.getUnknownKeys().empty());
    EXPECT_EQ(root->Marker3->getValue(), MarkerType::AlcControl);
    EXPECT_EQ(root->Marker4->getValue(), MarkerType::RfBlanking);
    auto carrier = root->NRCarriers->getValue()->getItem(0);
    ASSERT_NE(carrier, nullptr);
    EXPECT_EQ(carrier->FrequencyOffset->getValue(), -12500000.5);
    EXPECT_EQ(carrier->ResourceGrid->getValue()->getItem(0)->N_grid_size->getValue(), 273);
    auto dl = carrier->Downlink->getValue();
    EXPECT_EQ(dl->SSPBCH->getValue()->SSBlockPattern->getValue(), SSBlockPattern::CaseC);
    EXPECT_EQ(dl->SSPBCH->getValue()->MIB->getValue()->CellBarred->getValue(),
              CellBarred::notBarred);
    EXPECT_EQ(dl->SSPBCH->getValue()->PayloadData->getValue()->PayLoadDataType->getValue(),
              PayloadDataType::PN23);
    EXPECT_EQ(dl->DCI->getValue()->getItem(0)->PayloadData->getValue()->PatternBits->getValue(),
              "1010");
    auto dlsch = dl->DLSCH->getValue()->getItem(0);
    EXPECT_EQ(dlsch->Modulation->getValue(), ModulationType::QAM256);
    EXPECT_EQ(dlsch->RateMatchPatterns->getValue()->getItem(0)->getRBBitmap(), "1100");
    EXPECT_EQ(dl->CSIRS->getValue()->getItem(0)->Density->getValue(), CSIRSDensity::Three);
    EXPECT_EQ(dl->BWP->getValue()->getItem(0)->Coreset0->getValue()->SymbolNumber->getValue(), 2);
    EXPECT_EQ(
        dl->LTECoexistence->getValue()->LTECRS->getValue()->getItem(0)->LTEBandwidth->getValue(),
        LTEBandwidth::BW20M_100RB);
    EXPECT_EQ(dl->PRS->getValue()->getCount(), 1);
    auto ul = carrier->Uplink->getValue();
    EXPECT_EQ(ul->UCI->getValue()->getItem(0)->PUCCHFormat->getValue(), PUCCHFormat::Format2);
    auto ulsch = ul->ULSCH->getValue()->getItem(0);
    EXPECT_EQ(ulsch->HARQACK->getValue()->PayloadData->getValue()->PayLoadDataType->getValue(),
              PayloadDataType::PN15);
    EXPECT_EQ(ul->BWP->getValue()->getItem(0)->RBNumber->getValue(), 106);
    EXPECT_EQ(ul->SRSs->getValue()->getCount(), 1);
    EXPECT_EQ(carrier->Prach->getValue()->Bursts->getValue()->getItem(0)->PRACHFormat->getValue(),
              PRACHFormat::FormatA1B1);
    EXPECT_EQ(carrier->Prach->getValue()->BWP->getValue()->RBNumber->getValue(), 52);
    auto rt = root->NRCarriersRT->getValue()->getItem(0);
    ASSERT_NE(rt, nullptr);
    auto uplinkRt = rt->UplinkRT->getValue();
    EXPECT_EQ(uplinkRt->ULSCHRT->getValue()->getItem(0)->HarqDefaultValue->getValue(),
              HarqValue::NACK);
    EXPECT_EQ(uplinkRt->ULSCHRT->getValue()->getItem(0)->NumberOfHARQProcesses->getValue(), 8);
    EXPECT_EQ(root->DefaultCarrier->getValue()->Bandwidth->getValue(), Bandwidth::FR2_100M);
}

TEST(JsonWriting, OutputReadsBackToTheSameTree) {
    auto first = read(example("all_models.json"));
    const auto text = JsonSerializer::serialize(*first);
    auto second = read(text);
    EXPECT_TRUE(first->equals(second));
    EXPECT_EQ(JsonSerializer::serialize(*second), text);
    // Keys in declaration order.
    EXPECT_LT(text.find("\"SpecVersion\""), text.find("\"Capability\""));
    EXPECT_LT(text.find("\"NRCarriers\""), text.find("\"NRCarriersRT\""));
}

TEST(JsonWriting, DoublesReadBackExactly) {
    std::mt19937_64 rng(7);
    std::uniform_real_distribution<double> uniform(-1e12, 1e12);
    auto root = std::make_shared<NR5GWaveformSettings>();
    for (int i = 0; i < 200; ++i) {
        const double value = uniform(rng) / std::ldexp(1.0, static_cast<int>(rng() % 60));
        root->RadioFrequency->setValue(value);
        EXPECT_EQ(read(JsonSerializer::serialize(*root))->RadioFrequency->getValue(), value);
    }
}

// Mutated copies of the examples must be read or refused with a DeserializeError, never
// anything else (under the sanitizer build this also checks memory safety).
TEST(JsonReading, RandomlyMutatedDocumentsNeverCrash) {
    const std::vector<std::string> seeds{example("all_models.json"), example("minimal.json")};
    const std::vector<std::string> fragments{"",
                                             "{",
                                             "}",
                                             "[",
                                             "]",
                                             "\"",
                                             ",",
                                             ":",
                                             "0",
                                             "-1",
                                             "1e400",
                                             "null",
                                             "true",
                                             "\"QAM16\"",
                                             "[{}]",
                                             "{\"$type\":1}",
                                             "\"$values\"",
                                             "\\u0000",
                                             "\xc3",
                                             "99999999999999999999"};
    std::mt19937 rng(12345);
    int accepted = 0;
    for (int round = 0; round < 3000; ++round) {
        std::string doc = seeds[rng() % seeds.size()];
        const int edits = 1 + static_cast<int>(rng() % 4);
        for (int e = 0; e < edits && !doc.empty(); ++e) {
            const std::size_t at = rng() % doc.size();
            switch (rng() % 4) {
                case 0:
                    doc[at] = static_cast<char>(rng() % 256);
                    break;
                case 1:
                    doc.erase(at, 1 + rng() % 16);
                    break;
                case 2:
                    doc.insert(at, fragments[rng() % fragments.size()]);
                    break;
                default:
                    doc.resize(at);
                    break;
            }
        }
        JsonSerializer reader;
        try {
            reader.deserialize(doc);
            ++accepted;
        } catch (const DeserializeError&) {
        }
    }
    EXPECT_GT(accepted, 0);
}

}  // namespace
