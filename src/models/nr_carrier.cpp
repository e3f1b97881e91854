#include "models/nr_carrier.h"

namespace Models::Nr5g {

NRCarrier::NRCarrier() : ModelBase("NRCarrier") {
    init(Index)->setValue(0);
    init(Enabled)->setValue(true);
    init(FrequencyOffset)->setValue(0.0);
    init(TimingOffset)->setValue(0.0);
    init(PowerBoosting)->setValue(0.0);
    init(InitialPhase)->setValue(0.0);
    init(CarrierType)->setValue(::Models::Nr5g::CarrierType::DL);
    init(CellID)->setValue(0);
    init(Bandwidth)->setValue(::Models::Nr5g::Bandwidth::FR1_100M);
    init(NumerologyMode)->setValue(::Models::Nr5g::NumerologyMode::SingleNumerology);
    init(Numerology)->setValue(::Models::Nr5g::Numerology::SCS30k);
    init(Mu)->setValue(0);
    init(MuInRAGraph)->setValue(0);
    init(CPType)->setValue(::Models::Nr5g::CyclicPrefixType::Normal);
    init(MinimumGuardband)->setValue(0.0);
    init(MaxMu)->setValue(0);
    init(NumberOfRB)->setValue(273);
    init(k0)->setValue(0.0);
    init(IntraCellGuardBandMu0)->setValue(std::string{});
    init(IntraCellGuardBandMu1)->setValue(std::string{});
    init(ResourceGrid);
    init(FrequencyOffsetOfPointA)->setValue(0.0);
    init(ConfiguredBandwidth)->setValue(98280000.0);
    init(BaseSampleRate)->setValue(122880000.0);
    init(DCPunctured)->setValue(false);
    init(WindowBeta)->setValue(0.01);
    init(WindowingMethod)->setValue(::Models::Nr5g::WindowingMethod::CenteredAtSymbolBoundary);
    init(BasebandFilter)->setValue(true);
    init(PowerDefinitionType)->setValue(::Models::Nr5g::PowerDefinitionType::TotalPower);
    init(SSRSRP)->setValue(-45.15);
    init(Downlink);
    init(Uplink);
    init(Prach);
    init(FilterBandwidth)->setValue(100000000.0);
    init(FilterCenter)->setValue(0.0);
    init(FR1)->setValue(false);
    init(WaveformSampleRate)->setValue(0.0);
    init(PhaseCompensation)->setValue(::Models::Nr5g::PhaseCompensationMode::Auto);
    init(NumberOfAntennas)->setValue(1);
    init(RadioFrequency)->setValue(0.0);
    init(PartialFrameConfig)->setValue(std::string{});
}

TESSALINE_MODEL_REGISTRATION(NRCarrier)

}  // namespace Models::Nr5g
