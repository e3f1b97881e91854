#pragma once
// Settings model NRPRACH.

#include <memory>
#include <string>

#include "framework/enum_setting.h"
#include "framework/model_base.h"
#include "framework/model_registration.h"
#include "framework/sub_setting.h"
#include "framework/value_setting.h"
#include "models/enums.h"
#include "models/nr_prach_burst.h"
#include "models/nr_ul_bwp.h"

namespace Models::Nr5g {

using Orvalis::Tessaline::BoolSetting;
using Orvalis::Tessaline::DoubleSetting;
using Orvalis::Tessaline::EnumSetting;
using Orvalis::Tessaline::Int32Setting;
using Orvalis::Tessaline::ModelBase;
using Orvalis::Tessaline::ModelCollection;
using Orvalis::Tessaline::StringSetting;
using Orvalis::Tessaline::SubSetting;

class NRPRACH : public ModelBase {
    TESSALINE_MODEL_TYPE(NRPRACH)
  public:
    NRPRACH();

    /// The item takes part in the generation.
    std::shared_ptr<BoolSetting> Enabled = std::make_shared<BoolSetting>("Enabled");
    /// Display name, by which other settings refer to this item.
    std::shared_ptr<StringSetting> Name = std::make_shared<StringSetting>("Name");
    /// Power boost in dB.
    std::shared_ptr<DoubleSetting> PowerBoosting = std::make_shared<DoubleSetting>("PowerBoosting");
    /// Preamble format.
    std::shared_ptr<EnumSetting<::Models::Nr5g::PRACHFormat>> PRACHFormat =
        std::make_shared<EnumSetting<::Models::Nr5g::PRACHFormat>>("PRACHFormat");
    /// PRACH subcarrier spacing.
    std::shared_ptr<EnumSetting<::Models::Nr5g::PRACHSubcarrierSpacing>> SCS =
        std::make_shared<EnumSetting<::Models::Nr5g::PRACHSubcarrierSpacing>>("SCS");
    /// Subcarrier spacing of the PUSCH.
    std::shared_ptr<EnumSetting<::Models::Nr5g::SubcarrierSpacing>> SCSPUSCH =
        std::make_shared<EnumSetting<::Models::Nr5g::SubcarrierSpacing>>("SCSPUSCH");
    /// The uplink bandwidth part of the PRACH.
    std::shared_ptr<SubSetting<::Models::Nr5g::NRULBWP>> BWP =
        std::make_shared<SubSetting<::Models::Nr5g::NRULBWP>>("BWP");
    /// Cyclic shift index.
    std::shared_ptr<Int32Setting> CyclicShiftIndex =
        std::make_shared<Int32Setting>("CyclicShiftIndex");
    /// Root index.
    std::shared_ptr<Int32Setting> RootIndex = std::make_shared<Int32Setting>("RootIndex");
    /// Logical root sequence index.
    std::shared_ptr<Int32Setting> PRACHRootSequenceIndex =
        std::make_shared<Int32Setting>("PRACHRootSequenceIndex");
    /// Restricted set.
    std::shared_ptr<EnumSetting<::Models::Nr5g::PRACHRestrictedSetConfig>> RestrictedSetConfig =
        std::make_shared<EnumSetting<::Models::Nr5g::PRACHRestrictedSetConfig>>(
            "RestrictedSetConfig");
    /// Zero correlation zone configuration.
    std::shared_ptr<Int32Setting> ZeroCorrelationZoneConfig =
        std::make_shared<Int32Setting>("ZeroCorrelationZoneConfig");
    /// Sequence length L_RA.
    std::shared_ptr<Int32Setting> LRA = std::make_shared<Int32Setting>("LRA");
    /// Cyclic shift N_CS.
    std::shared_ptr<Int32Setting> NCS = std::make_shared<Int32Setting>("NCS");
    /// msg1-FrequencyStart.
    std::shared_ptr<Int32Setting> Msg1FrequencyStart =
        std::make_shared<Int32Setting>("Msg1FrequencyStart");
    /// Index of the PRACH occasion.
    std::shared_ptr<Int32Setting> OccasionIndex = std::make_shared<Int32Setting>("OccasionIndex");
    /// Offset k1.
    std::shared_ptr<Int32Setting> k1 = std::make_shared<Int32Setting>("k1");
    /// Start time of the preamble in seconds.
    std::shared_ptr<DoubleSetting> t_start = std::make_shared<DoubleSetting>("t_start");
    /// Subframe of the occasion.
    std::shared_ptr<Int32Setting> SubframeIndex = std::make_shared<Int32Setting>("SubframeIndex");
    /// Configuration table.
    std::shared_ptr<EnumSetting<::Models::Nr5g::PRACHConfigurationTable>> ConfigurationTable =
        std::make_shared<EnumSetting<::Models::Nr5g::PRACHConfigurationTable>>(
            "ConfigurationTable");
    /// PRACH configuration index.
    std::shared_ptr<Int32Setting> ConfigurationIndex =
        std::make_shared<Int32Setting>("ConfigurationIndex");
    /// Period in frames.
    std::shared_ptr<Int32Setting> FramePeriod = std::make_shared<Int32Setting>("FramePeriod");
    /// Frame offsets, as text.
    std::shared_ptr<StringSetting> FrameOffsetStr =
        std::make_shared<StringSetting>("FrameOffsetStr");
    /// Slots as the user entered them: a number, or a range with a colon ("0:19").
    std::shared_ptr<StringSetting> SlotIndexStr = std::make_shared<StringSetting>("SlotIndexStr");
    /// First symbol.
    std::shared_ptr<Int32Setting> SymbolStart = std::make_shared<Int32Setting>("SymbolStart");
    /// Number of PRACH slots; -1 when unset.
    std::shared_ptr<Int32Setting> NPRACHSlots = std::make_shared<Int32Setting>("NPRACHSlots");
    /// Occasions per PRACH slot; -1 when unset.
    std::shared_ptr<Int32Setting> NPRACHOccasionsPerSlot =
        std::make_shared<Int32Setting>("NPRACHOccasionsPerSlot");
    /// Duration of an occasion.
    std::shared_ptr<Int32Setting> PRACHDuration = std::make_shared<Int32Setting>("PRACHDuration");
    /// msg1-FDM.
    std::shared_ptr<Int32Setting> Msg1FDM = std::make_shared<Int32Setting>("Msg1FDM");
    /// The preamble bursts.
    std::shared_ptr<SubSetting<ModelCollection<::Models::Nr5g::NRPRACHBurst>>> Bursts =
        std::make_shared<SubSetting<ModelCollection<::Models::Nr5g::NRPRACHBurst>>>("Bursts");
    /// Map of preamble indices, as text.
    std::shared_ptr<StringSetting> PreambleIndexMap =
        std::make_shared<StringSetting>("PreambleIndexMap");
    /// First antenna port of this item.
    std::shared_ptr<Int32Setting> AntennaPort = std::make_shared<Int32Setting>("AntennaPort");
    /// Antenna ports as a comma list of integers.
    std::shared_ptr<StringSetting> AntennaPortArray =
        std::make_shared<StringSetting>("AntennaPortArray");
    /// Host validation state: the item collides with another.
    std::shared_ptr<BoolSetting> Conflict = std::make_shared<BoolSetting>("Conflict");
    /// Host validation state.
    std::shared_ptr<BoolSetting> Valid = std::make_shared<BoolSetting>("Valid");
};

TESSALINE_REGISTERED_MODEL(NRPRACH)

}  // namespace Models::Nr5g
