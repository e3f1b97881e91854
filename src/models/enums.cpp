#include "models/enums.h"

#include "framework/prototype.h"

namespace Models::Nr5g {

using Orvalis::Tessaline::EnumConverter;
using Orvalis::Tessaline::EnumInfo;
using Orvalis::Tessaline::Prototype;

std::string toString(Numerology numerology) {
    const auto names = Orvalis::Tessaline::Tools::getEnumNames<Numerology>(
        Orvalis::Tessaline::EnumSetting<Numerology>::staticGetTable());
    const auto it = names.find(numerology);
    return it == names.end() ? std::string{} : it->second;
}

namespace {

template <class T>
void registerDisplayNames() {
    const auto& names = EnumInfo<T>::displayNames;
    Prototype::getInstance<EnumConverter<T>>()->setDisplayNames(
        std::vector<std::string>(names.begin(), names.end()));
}

}  // namespace

void registerEnumerationDisplayNames() {
    registerDisplayNames<Bandwidth>();
    registerDisplayNames<CapabilityEnum>();
    registerDisplayNames<CarrierType>();
    registerDisplayNames<CellBarred>();
    registerDisplayNames<CoresetCceMappingType>();
    registerDisplayNames<CSIRSDensity>();
    registerDisplayNames<CyclicPrefixType>();
    registerDisplayNames<DCIFormat>();
    registerDisplayNames<DedicatedCommandType>();
    registerDisplayNames<DLSCHMCSTable>();
    registerDisplayNames<DMRSConfigurationType>();
    registerDisplayNames<DMRSDuration>();
    registerDisplayNames<DMRSMappingReference>();
    registerDisplayNames<DMRStypeAposEnum>();
    registerDisplayNames<FrequencyHoppingMode>();
    registerDisplayNames<HarqDataSource>();
    registerDisplayNames<HarqValue>();
    registerDisplayNames<IntraFreqReselection>();
    registerDisplayNames<LTEBandwidth>();
    registerDisplayNames<MarkerType>();
    registerDisplayNames<MinimumChannelBandwidth>();
    registerDisplayNames<ModulationType>();
    registerDisplayNames<Numerology>();
    registerDisplayNames<NumerologyMode>();
    registerDisplayNames<PayloadDataType>();
    registerDisplayNames<PDCCHSearchSpace>();
    registerDisplayNames<PDSCHMappingType>();
    registerDisplayNames<PhaseCompensationMode>();
    registerDisplayNames<PowerDefinitionType>();
    registerDisplayNames<PRACHConfigurationTable>();
    registerDisplayNames<PRACHFormat>();
    registerDisplayNames<PRACHRestrictedSetConfig>();
    registerDisplayNames<PRACHSubcarrierSpacing>();
    registerDisplayNames<PRBAllocation>();
    registerDisplayNames<PRBBundleSize>();
    registerDisplayNames<PrecoderGranularity>();
    registerDisplayNames<PTRSREOffset>();
    registerDisplayNames<PUCCHFormat>();
    registerDisplayNames<PUCCHGroupHopping>();
    registerDisplayNames<PUCCHMaxCodeRate>();
    registerDisplayNames<PUSCHMappingType>();
    registerDisplayNames<RateMatchPatternLevel>();
    registerDisplayNames<RAType>();
    registerDisplayNames<RNTIType>();
    registerDisplayNames<SRConfiguration>();
    registerDisplayNames<SSB30KSymbolIndex>();
    registerDisplayNames<SSBlockPattern>();
    registerDisplayNames<SSBPeriod>();
    registerDisplayNames<SubcarrierSpacing>();
    registerDisplayNames<SymbolBitmapSpan>();
    registerDisplayNames<ULSCHMCSTable>();
    registerDisplayNames<VRBtoPRBMapping>();
    registerDisplayNames<WindowingMethod>();
}

bool registerEnumerations() {
    static const bool done = (registerEnumerationDisplayNames(), true);
    return done;
}

}  // namespace Models::Nr5g
