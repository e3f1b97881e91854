#pragma once
// Settings model NRSSPBCH.

#include <memory>
#include <string>

#include "framework/enum_setting.h"
#include "framework/model_base.h"
#include "framework/model_registration.h"
#include "framework/sub_setting.h"
#include "framework/value_setting.h"
#include "models/enums.h"
#include "models/nr_mib.h"
#include "models/payload_data.h"

namespace Models::Nr5g {

using Orvalis::Tessaline::BoolSetting;
using Orvalis::Tessaline::DoubleSetting;
using Orvalis::Tessaline::EnumSetting;
using Orvalis::Tessaline::Int32Setting;
using Orvalis::Tessaline::ModelBase;
using Orvalis::Tessaline::ModelCollection;
using Orvalis::Tessaline::StringSetting;
using Orvalis::Tessaline::SubSetting;

class NRSSPBCH : public ModelBase {
    TESSALINE_MODEL_TYPE(NRSSPBCH)
  public:
    NRSSPBCH();

    /// Display name, by which other settings refer to this item.
    std::shared_ptr<StringSetting> Name = std::make_shared<StringSetting>("Name");
    /// Power boost in dB.
    std::shared_ptr<DoubleSetting> PowerBoosting = std::make_shared<DoubleSetting>("PowerBoosting");
    /// The item takes part in the generation.
    std::shared_ptr<BoolSetting> Enabled = std::make_shared<BoolSetting>("Enabled");
    /// Numerology as the number µ.
    std::shared_ptr<Int32Setting> Mu = std::make_shared<Int32Setting>("Mu");
    /// Numerology.
    std::shared_ptr<EnumSetting<::Models::Nr5g::Numerology>> Numerology =
        std::make_shared<EnumSetting<::Models::Nr5g::Numerology>>("Numerology");
    /// Symbol alternative for 30 kHz.
    std::shared_ptr<EnumSetting<::Models::Nr5g::SSB30KSymbolIndex>> SSB30KSymbolIndex =
        std::make_shared<EnumSetting<::Models::Nr5g::SSB30KSymbolIndex>>("SSB30KSymbolIndex");
    /// Block pattern.
    std::shared_ptr<EnumSetting<::Models::Nr5g::SSBlockPattern>> SSBlockPattern =
        std::make_shared<EnumSetting<::Models::Nr5g::SSBlockPattern>>("SSBlockPattern");
    /// Burst period.
    std::shared_ptr<EnumSetting<::Models::Nr5g::SSBPeriod>> SSBPeriod =
        std::make_shared<EnumSetting<::Models::Nr5g::SSBPeriod>>("SSBPeriod");
    /// Half frame that holds the burst.
    std::shared_ptr<Int32Setting> HalfFrameIndex = std::make_shared<Int32Setting>("HalfFrameIndex");
    /// Maximum number of blocks per burst.
    std::shared_ptr<Int32Setting> Lmax = std::make_shared<Int32Setting>("Lmax");
    /// Active blocks in the same form as `SlotIndexStr`, for example "0:3".
    std::shared_ptr<StringSetting> SSBActiveIndex =
        std::make_shared<StringSetting>("SSBActiveIndex");
    /// Per-block power boosts, as text.
    std::shared_ptr<StringSetting> PowerBoostingStr =
        std::make_shared<StringSetting>("PowerBoostingStr");
    /// Linear level of each SS block, as a comma list of decimal numbers; the token at position i
    /// is block i.
    std::shared_ptr<StringSetting> PowerLevelStr = std::make_shared<StringSetting>("PowerLevelStr");
    /// PSS power boost in dB.
    std::shared_ptr<DoubleSetting> PSSPowerBoosting =
        std::make_shared<DoubleSetting>("PSSPowerBoosting");
    /// First resource block, relative to the bandwidth part.
    std::shared_ptr<Int32Setting> RBOffset = std::make_shared<Int32Setting>("RBOffset");
    /// Subcarrier offset of the block.
    std::shared_ptr<Int32Setting> k0 = std::make_shared<Int32Setting>("k0");
    /// Offset of the block in subcarriers.
    std::shared_ptr<Int32Setting> FrequencyOffset =
        std::make_shared<Int32Setting>("FrequencyOffset");
    /// Frequency shift in Hz.
    std::shared_ptr<DoubleSetting> DeltaFrequency =
        std::make_shared<DoubleSetting>("DeltaFrequency");
    /// When false, the coding chain is bypassed.
    std::shared_ptr<BoolSetting> ChannelCoding = std::make_shared<BoolSetting>("ChannelCoding");
    /// First PBCH scrambling is on.
    std::shared_ptr<BoolSetting> ScramblingBeforeChannelCoding =
        std::make_shared<BoolSetting>("ScramblingBeforeChannelCoding");
    /// Second PBCH scrambling is on.
    std::shared_ptr<BoolSetting> ScramblingAfterChannelCoding =
        std::make_shared<BoolSetting>("ScramblingAfterChannelCoding");
    /// The MIB comes from `MIB`; otherwise from `PayloadData`.
    std::shared_ptr<BoolSetting> AutoMIB = std::make_shared<BoolSetting>("AutoMIB");
    /// PBCH payload used when `AutoMIB` is false.
    std::shared_ptr<SubSetting<::Models::Nr5g::PayloadData>> PayloadData =
        std::make_shared<SubSetting<::Models::Nr5g::PayloadData>>("PayloadData");
    /// Length of the PBCH payload in bits.
    std::shared_ptr<Int32Setting> PayloadDataLength =
        std::make_shared<Int32Setting>("PayloadDataLength");
    /// System frame number of the first frame.
    std::shared_ptr<Int32Setting> SFNStart = std::make_shared<Int32Setting>("SFNStart");
    /// The MIB fields.
    std::shared_ptr<SubSetting<::Models::Nr5g::NRMIB>> MIB =
        std::make_shared<SubSetting<::Models::Nr5g::NRMIB>>("MIB");
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

TESSALINE_REGISTERED_MODEL(NRSSPBCH)

}  // namespace Models::Nr5g
