#pragma once
// Settings model NR5GWaveformSettings.

#include <memory>
#include <string>

#include "framework/enum_setting.h"
#include "framework/model_base.h"
#include "framework/model_registration.h"
#include "framework/sub_setting.h"
#include "framework/value_setting.h"
#include "models/enums.h"
#include "models/nr_carrier.h"
#include "models/nr_carrier_rt.h"

namespace Models::Nr5g {

using Orvalis::Tessaline::BoolSetting;
using Orvalis::Tessaline::DoubleSetting;
using Orvalis::Tessaline::EnumSetting;
using Orvalis::Tessaline::Int32Setting;
using Orvalis::Tessaline::ModelBase;
using Orvalis::Tessaline::ModelCollection;
using Orvalis::Tessaline::StringSetting;
using Orvalis::Tessaline::SubSetting;

class NR5GWaveformSettings : public ModelBase {
    TESSALINE_MODEL_TYPE(NR5GWaveformSettings)
  public:
    NR5GWaveformSettings();

    /// Version of the settings schema, as text.
    std::shared_ptr<StringSetting> SpecVersion = std::make_shared<StringSetting>("SpecVersion");
    /// Mode of the waveform: `Arb` generates a playback waveform from `NRCarriers`, `Realtime`
    /// selects the real-time uplink set `NRCarriersRT`.
    std::shared_ptr<EnumSetting<::Models::Nr5g::CapabilityEnum>> Capability =
        std::make_shared<EnumSetting<::Models::Nr5g::CapabilityEnum>>("Capability");
    /// Name of the waveform.
    std::shared_ptr<StringSetting> WaveformName = std::make_shared<StringSetting>("WaveformName");
    /// Free comment.
    std::shared_ptr<StringSetting> WaveformComment =
        std::make_shared<StringSetting>("WaveformComment");
    /// Use `SampleRateUser` instead of `SampleRateAuto`.
    std::shared_ptr<BoolSetting> UserDefinedSampleRateEnabled =
        std::make_shared<BoolSetting>("UserDefinedSampleRateEnabled");
    /// Factor on the time axis of the played waveform.
    std::shared_ptr<DoubleSetting> TimeScaleFactor =
        std::make_shared<DoubleSetting>("TimeScaleFactor");
    /// Sample rate worked out by the host, in Hz.
    std::shared_ptr<DoubleSetting> SampleRateAuto =
        std::make_shared<DoubleSetting>("SampleRateAuto");
    /// Sample rate entered by the user, in Hz.
    std::shared_ptr<DoubleSetting> SampleRateUser =
        std::make_shared<DoubleSetting>("SampleRateUser");
    /// Number of 10 ms frames to generate.
    std::shared_ptr<Int32Setting> NumberOfFrames = std::make_shared<Int32Setting>("NumberOfFrames");
    /// First subframe of the generated part.
    std::shared_ptr<Int32Setting> SubframeOffset = std::make_shared<Int32Setting>("SubframeOffset");
    /// Number of subframes of the generated part.
    std::shared_ptr<Int32Setting> NumberOfSubframes =
        std::make_shared<Int32Setting>("NumberOfSubframes");
    /// First slot within the first subframe; -1 means not restricted.
    std::shared_ptr<Int32Setting> SlotOffsetInSubframe =
        std::make_shared<Int32Setting>("SlotOffsetInSubframe");
    /// Number of slots per subframe to generate; -1 means not restricted.
    std::shared_ptr<Int32Setting> NumberOfSlotsInSubframe =
        std::make_shared<Int32Setting>("NumberOfSlotsInSubframe");
    /// Length of the waveform in samples.
    std::shared_ptr<Int32Setting> TotalSamplePoints =
        std::make_shared<Int32Setting>("TotalSamplePoints");
    /// Length of the waveform in seconds.
    std::shared_ptr<DoubleSetting> WaveformLength =
        std::make_shared<DoubleSetting>("WaveformLength");
    /// Mirror the spectrum (conjugate the samples).
    std::shared_ptr<BoolSetting> MirrorSpectrum = std::make_shared<BoolSetting>("MirrorSpectrum");
    /// Phase compensation mode of the waveform.
    std::shared_ptr<EnumSetting<::Models::Nr5g::PhaseCompensationMode>> PhaseCompensation =
        std::make_shared<EnumSetting<::Models::Nr5g::PhaseCompensationMode>>("PhaseCompensation");
    /// Radio frequency in Hz.
    std::shared_ptr<DoubleSetting> RadioFrequency =
        std::make_shared<DoubleSetting>("RadioFrequency");
    /// Number of antennas, which is the number of output streams.
    std::shared_ptr<Int32Setting> NumberOfAntennas =
        std::make_shared<Int32Setting>("NumberOfAntennas");
    /// Content of marker 1.
    std::shared_ptr<EnumSetting<::Models::Nr5g::MarkerType>> Marker1 =
        std::make_shared<EnumSetting<::Models::Nr5g::MarkerType>>("Marker1");
    /// Content of marker 2.
    std::shared_ptr<EnumSetting<::Models::Nr5g::MarkerType>> Marker2 =
        std::make_shared<EnumSetting<::Models::Nr5g::MarkerType>>("Marker2");
    /// Content of marker 3.
    std::shared_ptr<EnumSetting<::Models::Nr5g::MarkerType>> Marker3 =
        std::make_shared<EnumSetting<::Models::Nr5g::MarkerType>>("Marker3");
    /// Content of marker 4.
    std::shared_ptr<EnumSetting<::Models::Nr5g::MarkerType>> Marker4 =
        std::make_shared<EnumSetting<::Models::Nr5g::MarkerType>>("Marker4");
    /// Switch of the crest factor reduction; carried for the host, no generator reads it.
    std::shared_ptr<BoolSetting> CrestFactorReductionEnabled =
        std::make_shared<BoolSetting>("CrestFactorReductionEnabled");
    /// Target peak-to-average power ratio in dB; carried for the host.
    std::shared_ptr<DoubleSetting> TargetPapr = std::make_shared<DoubleSetting>("TargetPapr");
    /// Maximum number of iterations of the crest factor reduction; carried for the host.
    std::shared_ptr<Int32Setting> MaxIteration = std::make_shared<Int32Setting>("MaxIteration");
    /// Share of the peak that is cancelled, in percent; carried for the host.
    std::shared_ptr<DoubleSetting> CancellingPercent =
        std::make_shared<DoubleSetting>("CancellingPercent");
    /// Block size of the crest factor reduction, in samples; carried for the host.
    std::shared_ptr<Int32Setting> BlockSize = std::make_shared<Int32Setting>("BlockSize");
    /// Filter mask of the crest factor reduction: pairs of frequency and level, the pair parts
    /// joined by a comma, the pairs by a semicolon; carried for the host.
    std::shared_ptr<StringSetting> CfrFilterMask = std::make_shared<StringSetting>("CfrFilterMask");
    /// Host state, carried as text.
    std::shared_ptr<StringSetting> BusyState = std::make_shared<StringSetting>("BusyState");
    /// Host state: a waveform exists.
    std::shared_ptr<BoolSetting> Generated = std::make_shared<BoolSetting>("Generated");
    /// Add the noise carrier.
    std::shared_ptr<BoolSetting> AwgnEnabled = std::make_shared<BoolSetting>("AwgnEnabled");
    /// Carrier-to-noise ratio in dB.
    std::shared_ptr<DoubleSetting> CarrierToNoiseRatio =
        std::make_shared<DoubleSetting>("CarrierToNoiseRatio");
    /// Carrier bandwidth of the noise calculation, in Hz.
    std::shared_ptr<DoubleSetting> CarrierBandwidth =
        std::make_shared<DoubleSetting>("CarrierBandwidth");
    /// Noise bandwidth in Hz.
    std::shared_ptr<DoubleSetting> NoiseBandwidth =
        std::make_shared<DoubleSetting>("NoiseBandwidth");
    /// Carrier power offset in dB.
    std::shared_ptr<DoubleSetting> CarrierPowerOffset =
        std::make_shared<DoubleSetting>("CarrierPowerOffset");
    /// Noise power offset in dB.
    std::shared_ptr<DoubleSetting> NoisePowerOffset =
        std::make_shared<DoubleSetting>("NoisePowerOffset");
    /// The carriers of a playback waveform.
    std::shared_ptr<SubSetting<ModelCollection<::Models::Nr5g::NRCarrier>>> NRCarriers =
        std::make_shared<SubSetting<ModelCollection<::Models::Nr5g::NRCarrier>>>("NRCarriers");
    /// The carriers of a real-time waveform.
    std::shared_ptr<SubSetting<ModelCollection<::Models::Nr5g::NRCarrierRT>>> NRCarriersRT =
        std::make_shared<SubSetting<ModelCollection<::Models::Nr5g::NRCarrierRT>>>("NRCarriersRT");
    /// Name of the waveform file.
    std::shared_ptr<StringSetting> ArbFileName = std::make_shared<StringSetting>("ArbFileName");
    /// Result setting for the host; nothing computes it here.
    std::shared_ptr<StringSetting> FreeMemory = std::make_shared<StringSetting>("FreeMemory");
    /// Result setting for the host; nothing computes it here.
    std::shared_ptr<StringSetting> CcdfSummary = std::make_shared<StringSetting>("CcdfSummary");
    /// Host state, carried as text.
    std::shared_ptr<StringSetting> DefaultNumerology =
        std::make_shared<StringSetting>("DefaultNumerology");
    /// Template carrier of the host.
    std::shared_ptr<SubSetting<::Models::Nr5g::NRCarrier>> DefaultCarrier =
        std::make_shared<SubSetting<::Models::Nr5g::NRCarrier>>("DefaultCarrier");
    /// Host state: settings have changed since the last generation.
    std::shared_ptr<BoolSetting> ReGenerateRequired =
        std::make_shared<BoolSetting>("ReGenerateRequired");
    /// Text of the real-time waveform.
    std::shared_ptr<StringSetting> RTWaveform = std::make_shared<StringSetting>("RTWaveform");
    /// Register addresses of the real-time mode, as text.
    std::shared_ptr<StringSetting> RegisterAddr = std::make_shared<StringSetting>("RegisterAddr");
    /// Register values of the real-time mode, as text.
    std::shared_ptr<StringSetting> RegisterValue = std::make_shared<StringSetting>("RegisterValue");
};

TESSALINE_REGISTERED_MODEL(NR5GWaveformSettings)

}  // namespace Models::Nr5g
