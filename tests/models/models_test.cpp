#include <gtest/gtest.h>

#include <set>
#include <tuple>

#include "framework/json_serializer.h"
#include "framework/model_container.h"
#include "framework/text_model.h"
#include "models/all_models.h"

namespace {

using namespace Models::Nr5g;
using Orvalis::Tessaline::EnumConverter;
using Orvalis::Tessaline::EnumSetting;
using Orvalis::Tessaline::ModelContainer;
using Orvalis::Tessaline::Prototype;
using Orvalis::Tessaline::Tools;

using AllEnumerations =
    std::tuple<Bandwidth, CapabilityEnum, CarrierType, CellBarred, CoresetCceMappingType,
               CSIRSDensity, CyclicPrefixType, DCIFormat, DedicatedCommandType, DLSCHMCSTable,
               DMRSConfigurationType, DMRSDuration, DMRSMappingReference, DMRStypeAposEnum,
               FrequencyHoppingMode, HarqDataSource, HarqValue, IntraFreqReselection, LTEBandwidth,
               MarkerType, MinimumChannelBandwidth, ModulationType, Numerology, NumerologyMode,
               PayloadDataType, PDCCHSearchSpace, PDSCHMappingType, PhaseCompensationMode,
               PowerDefinitionType, PRACHConfigurationTable, PRACHFormat, PRACHRestrictedSetConfig,
               PRACHSubcarrierSpacing, PRBAllocation, PRBBundleSize, PrecoderGranularity,
               PTRSREOffset, PUCCHFormat, PUCCHGroupHopping, PUCCHMaxCodeRate, PUSCHMappingType,
               RateMatchPatternLevel, RAType, RNTIType, SRConfiguration, SSB30KSymbolIndex,
               SSBlockPattern, SSBPeriod, SubcarrierSpacing, SymbolBitmapSpan, ULSCHMCSTable,
               VRBtoPRBMapping, WindowingMethod>;

template <class T>
void expectTableMatchesDisplayNames() {
    const auto table = Tools::split(EnumSetting<T>::staticGetTable(), ',');
    const auto& names = Prototype::getInstance<EnumConverter<T>>()->getDisplayNames();
    EXPECT_EQ(table.size(), names.size()) << EnumSetting<T>::staticGetTable();
    // Every enumerator reads back from its own name and its display name to its position.
    for (std::size_t i = 0; i < table.size(); ++i) {
        EnumSetting<T> setting("Probe");
        ASSERT_TRUE(setting.parse(Tools::trim(table[i], ' ')));
        EXPECT_EQ(setting.getInt32(), static_cast<int>(i));
        EXPECT_EQ(Prototype::getInstance<EnumConverter<T>>()->convertTo(&setting), names[i]);
    }
}

TEST(Registration, EveryEnumerationHasItsDisplayNamesAtLoad) {
    EXPECT_EQ(std::tuple_size_v<AllEnumerations>, 53u);
    std::apply([](auto... e) { (expectTableMatchesDisplayNames<decltype(e)>(), ...); },
               AllEnumerations{});
}

TEST(Registration, TheContainerKnowsAll28Types) {
    auto container = Prototype::getInstance<ModelContainer>();
    EXPECT_EQ(container->size(), 28u);
    for (const char* name :
         {"LTECRS", "NR5GWaveformSettings", "NRULSCH_RT", "PayloadData", "TextModel"})
        EXPECT_NE(container->findByName(name), nullptr) << name;
    const auto* carrier = container->find("Models.Nr5g.NRCarrier");
    ASSERT_NE(carrier, nullptr);
    EXPECT_EQ(carrier->prototype, Prototype::getInstance<NRCarrier>());
    EXPECT_TRUE(carrier->runtimeType->isAssignableFrom(std::make_shared<NRCarrier>()));
    EXPECT_FALSE(carrier->runtimeType->isAssignableFrom(std::make_shared<NRCarrierRT>()));
    EXPECT_NE(container->findCollection("Models.ModelCollection`1[[Models.Nr5g.NRCarrier]]"),
              nullptr);
    EXPECT_EQ(container->find("Orvalis.Tessaline.TextModel")->prototype->getTypeName(),
              "TextModel");
    EXPECT_FALSE(carrier->runtimeType->getLibraryName().empty());
    EXPECT_FALSE(carrier->runtimeType->getCollectionRuntimeType()->isAssignableFrom(
        std::make_shared<Orvalis::Tessaline::ModelCollection<NRCarrier>>()));
}

TEST(Registration, RegisteringAgainKeepsOneEntryPerType) {
    EXPECT_TRUE(registerModelTypes());
    auto container = Prototype::getInstance<ModelContainer>();
    container->add(Prototype::getInstance<NRDCI>(),
                   Prototype::getInstance<Orvalis::Tessaline::RuntimeType<NRDCI>>());
    EXPECT_EQ(container->size(), 28u);
}

TEST(Enumerations, PositionsAndNames) {
    EXPECT_EQ(Tools::enumValues<ModulationType>().at("QAM16"), ModulationType::QAM16);
    EXPECT_EQ(static_cast<int>(ModulationType::QAM16), 3);
    EnumSetting<PTRSREOffset> offset("PTRSREOffset");
    EXPECT_TRUE(offset.parse("Offset01"));
    EXPECT_EQ(offset.getInt32(), 1);
    EXPECT_FALSE(offset.parse(""));
    EXPECT_EQ(static_cast<int>(DMRStypeAposEnum::Pos2), 0);
    EXPECT_EQ(Prototype::getInstance<EnumConverter<DMRStypeAposEnum>>()->getDisplayNames()[0], "2");
    EXPECT_EQ(toString(Numerology::SCS60kECP), "SCS60kECP");
    EXPECT_EQ(static_cast<int>(ULSCHMCSTable::Table51313), 3);
    EXPECT_EQ(static_cast<int>(DLSCHMCSTable::Table51313), 2);
    EXPECT_EQ(static_cast<int>(PRACHSubcarrierSpacing::SCS1250), 4);
    EXPECT_EQ(EnumSetting<PUCCHMaxCodeRate>::staticGetTable().substr(
                  EnumSetting<PUCCHMaxCodeRate>::staticGetTable().rfind(' ') + 1),
              "codeRate080");
}

struct CountCase {
    const char* type;
    std::size_t settings;
};

class SettingCounts : public ::testing::TestWithParam<CountCase> {};

TEST_P(SettingCounts, DeclaredSettings) {
    const auto* entry = Prototype::getInstance<ModelContainer>()->findByName(GetParam().type);
    ASSERT_NE(entry, nullptr);
    auto model =
        std::dynamic_pointer_cast<Orvalis::Tessaline::ModelBase>(entry->prototype->create());
    EXPECT_EQ(model->settings.size(), GetParam().settings);
    // Every setting is named and no name repeats.
    std::set<std::string> names;
    for (const auto& s : model->settings) names.insert(s->getName());
    EXPECT_EQ(names.size(), model->settings.size());
}

INSTANTIATE_TEST_SUITE_P(Models, SettingCounts,
                         ::testing::Values(CountCase{"NR5GWaveformSettings", 48},
                                           CountCase{"NRCarrier", 41}, CountCase{"NRDLSCH", 80},
                                           CountCase{"NRULSCH", 87}, CountCase{"NRULSCH_RT", 95},
                                           CountCase{"NRCarrierRT", 42}, CountCase{"NRDownlink", 7},
                                           CountCase{"NRUplinkRT", 6}, CountCase{"PayloadData", 4},
                                           CountCase{"TextModel", 1}));

TEST(Defaults, ValuesThatAreEasyToGetWrong) {
    NR5GWaveformSettings root;
    EXPECT_EQ(root.CarrierPowerOffset->getValue(), -3.52182518111362);
    EXPECT_EQ(root.NoisePowerOffset->getValue(), -0.969100130080564);
    EXPECT_EQ(root.Marker3->getValue(), MarkerType::RfBlanking);
    EXPECT_EQ(root.Marker4->getValue(), MarkerType::AlcControl);
    EXPECT_EQ(root.CfrFilterMask->getValue(), "-60,-100;-50,0;50,0;60,-100");
    EXPECT_EQ(root.RadioFrequency->getValue(), 1e9);
    NRCarrier carrier;
    EXPECT_EQ(carrier.RadioFrequency->getValue(), 0.0);
    EXPECT_EQ(carrier.Mu->getValue(), 0);
    EXPECT_EQ(carrier.Numerology->getValue(), Numerology::SCS30k);
    EXPECT_EQ(carrier.WindowBeta->getValue(), 0.01);
    NRCarrierRT carrierRt;
    EXPECT_EQ(carrierRt.WindowBeta->getValue(), 0.0);
    EXPECT_EQ(carrierRt.CarrierType->getValue(), CarrierType::UL);
    NRCORESET coreset;
    EXPECT_EQ(coreset.FrequencyDomainBitmap->getValue(), std::string(45, '1'));
    EXPECT_EQ(coreset.RBOffset->getValue(), -1);
    NRRateMatchPattern pattern;
    EXPECT_EQ(pattern.getRBBitmap(), std::string(273, '1'));
    EXPECT_EQ(pattern.getSymbolBitmap(), "00000000000000");
    EXPECT_EQ(pattern.getPeriodicityPatternBitmap(), "1");
    NRSSPBCH ssb;
    EXPECT_EQ(ssb.RBOffset->getValue(), 253);
    EXPECT_EQ(ssb.AntennaPortArray->getValue(), "4000");
    NRSRS srs;
    EXPECT_EQ(srs.Numerology->getValue(), Numerology::SCS15k);
    NRPRACH prach;
    EXPECT_EQ(prach.SCS->getValue(), PRACHSubcarrierSpacing::SCS1250);
    EXPECT_EQ(prach.NPRACHSlots->getValue(), -1);
    NRDLSCH dlsch;
    EXPECT_EQ(dlsch.N_ID_0->getValue(), -1);
    EXPECT_EQ(dlsch.RNTI->getValue(), 1);
    EXPECT_EQ(dlsch.CBGTI->getValue(), "11111111");
    EXPECT_EQ(dlsch.BWPIndex->getValue(), 1);
    NRULSCH ulsch;
    EXPECT_EQ(ulsch.BWPIndex->getValue(), 0);
    EXPECT_EQ(ulsch.CodingRate->getValue(), 0.1171875);
    NRULSCH_RT ulschRt;
    EXPECT_EQ(ulschRt.RVIndexArray->getValue(), "0,2,1,3");
    EXPECT_EQ(ulschRt.HarqData->getValue(), "A");
    EXPECT_EQ(ulschRt.K2->getValue(), 2);
    LTECoexistence lte;
    EXPECT_EQ(lte.NumberOfLTECRS->getValue(), 1);
    EXPECT_EQ(lte.LTECRS->getValue()->getCount(), 0);
    NRPRS prs;
    EXPECT_EQ(prs.FrequencyOffsetOfPointA->getValue(), -49140000.0);
    NRDLBWP bwp;
    EXPECT_EQ(bwp.Coreset2->getValue()->RBNumber->getValue(), 270);
}

TEST(Accessors, ReturnTheStringsAsTheyStand) {
    NRDLSCH dlsch;
    dlsch.PTRSports->setValue("1000,1001");
    EXPECT_EQ(dlsch.getPTRSports(), "1000,1001");
    LTECRS crs;
    crs.MBSFNSubframeIndexArrayStr->setValue("1,2,3");
    EXPECT_EQ(crs.getMBSFNSubframeIndexArrayStr(), "1,2,3");
    NRRateMatchPattern pattern;
    pattern.RBBitmap->setValue("");
    EXPECT_EQ(pattern.getRBBitmap(), "");
}

TEST(NRULSCHAssignment, SharesEverySettingObject) {
    NRULSCH source;
    NRULSCH target;
    source.MCS->setValue(17);
    target = source;
    EXPECT_EQ(target.MCS->getValue(), 17);
    EXPECT_EQ(target.HARQACK, source.HARQACK);
    ASSERT_EQ(target.settings.size(), source.settings.size());
    source.RNTI->setValue(4321);
    EXPECT_EQ(target.RNTI->getValue(), 4321);  // a change through one model shows through the other
    target.PayloadData->getValue()->PatternBits->setValue("11");
    EXPECT_EQ(source.PayloadData->getValue()->PatternBits->getValue(), "11");
    for (std::size_t i = 0; i < target.settings.size(); ++i)
        EXPECT_EQ(target.settings[i], source.settings[i]);
}

TEST(ModelTypeNames, BareAndDotted) {
    EXPECT_EQ(NRULSCH_RT().getTypeName(), "NRULSCH_RT");
    EXPECT_EQ(NR5GWaveformSettings().getFullTypeName(), "Models.Nr5g.NR5GWaveformSettings");
    EXPECT_EQ(Orvalis::Tessaline::TextModel().getFullTypeName(), "Orvalis.Tessaline.TextModel");
    EXPECT_EQ(Orvalis::Tessaline::ModelCollection<NRDCI>().getFullTypeName(),
              "Models.ModelCollection`1[[Models.Nr5g.NRDCI]]");
}

}  // namespace
