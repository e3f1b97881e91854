#include "models/nr5g_waveform_settings.h"

namespace Models::Nr5g {

NR5GWaveformSettings::NR5GWaveformSettings() : ModelBase("NR5GWaveformSettings") {
    init(SpecVersion)->setValue(std::string{});
    init(Capability)->setValue(::Models::Nr5g::CapabilityEnum::Arb);
    init(WaveformName)->setValue(std::string{});
    init(WaveformComment)->setValue(std::string{});
    init(UserDefinedSampleRateEnabled)->setValue(false);
    init(TimeScaleFactor)->setValue(1.0);
    init(SampleRateAuto)->setValue(0.0);
    init(SampleRateUser)->setValue(0.0);
    init(NumberOfFrames)->setValue(1);
    init(SubframeOffset)->setValue(0);
    init(NumberOfSubframes)->setValue(10);
    init(SlotOffsetInSubframe)->setValue(-1);
    init(NumberOfSlotsInSubframe)->setValue(-1);
    init(TotalSamplePoints)->setValue(1228800);
    init(WaveformLength)->setValue(0.0);
    init(MirrorSpectrum)->setValue(false);
    init(PhaseCompensation)->setValue(::Models::Nr5g::PhaseCompensationMode::Auto);
    init(RadioFrequency)->setValue(1000000000.0);
    init(NumberOfAntennas)->setValue(1);
    init(Marker1)->setValue(::Models::Nr5g::MarkerType::WaveformStart);
    init(Marker2)->setValue(::Models::Nr5g::MarkerType::FrameStart);
    init(Marker3)->setValue(::Models::Nr5g::MarkerType::RfBlanking);
    init(Marker4)->setValue(::Models::Nr5g::MarkerType::AlcControl);
    init(CrestFactorReductionEnabled)->setValue(false);
    init(TargetPapr)->setValue(8.0);
    init(MaxIteration)->setValue(10);
    init(CancellingPercent)->setValue(100.0);
    init(BlockSize)->setValue(1000);
    init(CfrFilterMask)->setValue(std::string{"-60,-100;-50,0;50,0;60,-100"});
    init(BusyState)->setValue(std::string{});
    init(Generated)->setValue(false);
    init(AwgnEnabled)->setValue(false);
    init(CarrierToNoiseRatio)->setValue(0.0);
    init(CarrierBandwidth)->setValue(98280000.0);
    init(NoiseBandwidth)->setValue(98280000.0);
    init(CarrierPowerOffset)->setValue(-3.52182518111362);
    init(NoisePowerOffset)->setValue(-0.969100130080564);
    init(NRCarriers);
    init(NRCarriersRT);
    init(ArbFileName)->setValue(std::string{});
    init(FreeMemory)->setValue(std::string{});
    init(CcdfSummary)->setValue(std::string{});
    init(DefaultNumerology)->setValue(std::string{});
    init(DefaultCarrier);
    init(ReGenerateRequired)->setValue(true);
    init(RTWaveform)->setValue(std::string{});
    init(RegisterAddr)->setValue(std::string{});
    init(RegisterValue)->setValue(std::string{});
}

TESSALINE_MODEL_REGISTRATION(NR5GWaveformSettings)

}  // namespace Models::Nr5g
