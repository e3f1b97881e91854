#pragma once
// Settings model NRCarrier.

#include <memory>
#include <string>

#include "framework/enum_setting.h"
#include "framework/model_base.h"
#include "framework/model_registration.h"
#include "framework/sub_setting.h"
#include "framework/value_setting.h"
#include "models/enums.h"
#include "models/nr_downlink.h"
#include "models/nr_prach.h"
#include "models/nr_resource_grid.h"
#include "models/nr_uplink.h"

namespace Models::Nr5g {

using Orvalis::Tessaline::BoolSetting;
using Orvalis::Tessaline::DoubleSetting;
using Orvalis::Tessaline::EnumSetting;
using Orvalis::Tessaline::Int32Setting;
using Orvalis::Tessaline::ModelBase;
using Orvalis::Tessaline::ModelCollection;
using Orvalis::Tessaline::StringSetting;
using Orvalis::Tessaline::SubSetting;

class NRCarrier : public ModelBase {
    TESSALINE_MODEL_TYPE(NRCarrier)
  public:
    NRCarrier();

    /// Index of the carrier.
    std::shared_ptr<Int32Setting> Index = std::make_shared<Int32Setting>("Index");
    /// The item takes part in the generation.
    std::shared_ptr<BoolSetting> Enabled = std::make_shared<BoolSetting>("Enabled");
    /// Frequency offset of the carrier in Hz.
    std::shared_ptr<DoubleSetting> FrequencyOffset =
        std::make_shared<DoubleSetting>("FrequencyOffset");
    /// Timing offset in seconds.
    std::shared_ptr<DoubleSetting> TimingOffset = std::make_shared<DoubleSetting>("TimingOffset");
    /// Power boost in dB.
    std::shared_ptr<DoubleSetting> PowerBoosting = std::make_shared<DoubleSetting>("PowerBoosting");
    /// Initial phase of the carrier.
    std::shared_ptr<DoubleSetting> InitialPhase = std::make_shared<DoubleSetting>("InitialPhase");
    /// Kind of carrier.
    std::shared_ptr<EnumSetting<::Models::Nr5g::CarrierType>> CarrierType =
        std::make_shared<EnumSetting<::Models::Nr5g::CarrierType>>("CarrierType");
    /// Physical cell identity.
    std::shared_ptr<Int32Setting> CellID = std::make_shared<Int32Setting>("CellID");
    /// Channel bandwidth.
    std::shared_ptr<EnumSetting<::Models::Nr5g::Bandwidth>> Bandwidth =
        std::make_shared<EnumSetting<::Models::Nr5g::Bandwidth>>("Bandwidth");
    /// One numerology or several.
    std::shared_ptr<EnumSetting<::Models::Nr5g::NumerologyMode>> NumerologyMode =
        std::make_shared<EnumSetting<::Models::Nr5g::NumerologyMode>>("NumerologyMode");
    /// Numerology.
    std::shared_ptr<EnumSetting<::Models::Nr5g::Numerology>> Numerology =
        std::make_shared<EnumSetting<::Models::Nr5g::Numerology>>("Numerology");
    /// Numerology as the number µ.
    std::shared_ptr<Int32Setting> Mu = std::make_shared<Int32Setting>("Mu");
    /// Numerology shown in the host's resource allocation graph.
    std::shared_ptr<Int32Setting> MuInRAGraph = std::make_shared<Int32Setting>("MuInRAGraph");
    /// Cyclic prefix.
    std::shared_ptr<EnumSetting<::Models::Nr5g::CyclicPrefixType>> CPType =
        std::make_shared<EnumSetting<::Models::Nr5g::CyclicPrefixType>>("CPType");
    /// Minimum guard band in Hz.
    std::shared_ptr<DoubleSetting> MinimumGuardband =
        std::make_shared<DoubleSetting>("MinimumGuardband");
    /// Highest numerology of the carrier.
    std::shared_ptr<Int32Setting> MaxMu = std::make_shared<Int32Setting>("MaxMu");
    /// Number of resource blocks of the carrier.
    std::shared_ptr<Int32Setting> NumberOfRB = std::make_shared<Int32Setting>("NumberOfRB");
    /// Subcarrier offset k0.
    std::shared_ptr<DoubleSetting> k0 = std::make_shared<DoubleSetting>("k0");
    /// Intra-cell guard bands for numerology 0, as text; the interlaced allocation
    /// reads it.
    std::shared_ptr<StringSetting> IntraCellGuardBandMu0 =
        std::make_shared<StringSetting>("IntraCellGuardBandMu0");
    /// Intra-cell guard bands for numerology 1, as text; the interlaced allocation
    /// reads it.
    std::shared_ptr<StringSetting> IntraCellGuardBandMu1 =
        std::make_shared<StringSetting>("IntraCellGuardBandMu1");
    /// Resource grids, one per numerology.
    std::shared_ptr<SubSetting<ModelCollection<::Models::Nr5g::NRResourceGrid>>> ResourceGrid =
        std::make_shared<SubSetting<ModelCollection<::Models::Nr5g::NRResourceGrid>>>(
            "ResourceGrid");
    /// Frequency offset of point A in Hz.
    std::shared_ptr<DoubleSetting> FrequencyOffsetOfPointA =
        std::make_shared<DoubleSetting>("FrequencyOffsetOfPointA");
    /// Configured bandwidth in Hz.
    std::shared_ptr<DoubleSetting> ConfiguredBandwidth =
        std::make_shared<DoubleSetting>("ConfiguredBandwidth");
    /// Base sample rate in Hz.
    std::shared_ptr<DoubleSetting> BaseSampleRate =
        std::make_shared<DoubleSetting>("BaseSampleRate");
    /// The DC subcarrier is punctured.
    std::shared_ptr<BoolSetting> DCPunctured = std::make_shared<BoolSetting>("DCPunctured");
    /// Roll-off factor of the OFDM symbol window.
    std::shared_ptr<DoubleSetting> WindowBeta = std::make_shared<DoubleSetting>("WindowBeta");
    /// Position of the window.
    std::shared_ptr<EnumSetting<::Models::Nr5g::WindowingMethod>> WindowingMethod =
        std::make_shared<EnumSetting<::Models::Nr5g::WindowingMethod>>("WindowingMethod");
    /// Switch of the baseband filter.
    std::shared_ptr<BoolSetting> BasebandFilter = std::make_shared<BoolSetting>("BasebandFilter");
    /// Power reference.
    std::shared_ptr<EnumSetting<::Models::Nr5g::PowerDefinitionType>> PowerDefinitionType =
        std::make_shared<EnumSetting<::Models::Nr5g::PowerDefinitionType>>("PowerDefinitionType");
    /// SS-RSRP in dBm.
    std::shared_ptr<DoubleSetting> SSRSRP = std::make_shared<DoubleSetting>("SSRSRP");
    /// The downlink channels.
    std::shared_ptr<SubSetting<::Models::Nr5g::NRDownlink>> Downlink =
        std::make_shared<SubSetting<::Models::Nr5g::NRDownlink>>("Downlink");
    /// The uplink channels.
    std::shared_ptr<SubSetting<::Models::Nr5g::NRUplink>> Uplink =
        std::make_shared<SubSetting<::Models::Nr5g::NRUplink>>("Uplink");
    /// The PRACH.
    std::shared_ptr<SubSetting<::Models::Nr5g::NRPRACH>> Prach =
        std::make_shared<SubSetting<::Models::Nr5g::NRPRACH>>("Prach");
    /// Pass band of the baseband filter in Hz.
    std::shared_ptr<DoubleSetting> FilterBandwidth =
        std::make_shared<DoubleSetting>("FilterBandwidth");
    /// Centre of the baseband filter in Hz.
    std::shared_ptr<DoubleSetting> FilterCenter = std::make_shared<DoubleSetting>("FilterCenter");
    /// True for frequency range 1.
    std::shared_ptr<BoolSetting> FR1 = std::make_shared<BoolSetting>("FR1");
    /// Sample rate of this carrier in Hz.
    std::shared_ptr<DoubleSetting> WaveformSampleRate =
        std::make_shared<DoubleSetting>("WaveformSampleRate");
    /// Phase compensation of this carrier.
    std::shared_ptr<EnumSetting<::Models::Nr5g::PhaseCompensationMode>> PhaseCompensation =
        std::make_shared<EnumSetting<::Models::Nr5g::PhaseCompensationMode>>("PhaseCompensation");
    /// Number of antennas of this carrier.
    std::shared_ptr<Int32Setting> NumberOfAntennas =
        std::make_shared<Int32Setting>("NumberOfAntennas");
    /// Radio frequency of this carrier in Hz.
    std::shared_ptr<DoubleSetting> RadioFrequency =
        std::make_shared<DoubleSetting>("RadioFrequency");
    /// Text of the partial-frame configuration.
    std::shared_ptr<StringSetting> PartialFrameConfig =
        std::make_shared<StringSetting>("PartialFrameConfig");
};

TESSALINE_REGISTERED_MODEL(NRCarrier)

}  // namespace Models::Nr5g
