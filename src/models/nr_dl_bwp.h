#pragma once
// Settings model NRDLBWP.

#include <memory>
#include <string>

#include "framework/enum_setting.h"
#include "framework/model_base.h"
#include "framework/model_registration.h"
#include "framework/sub_setting.h"
#include "framework/value_setting.h"
#include "models/enums.h"
#include "models/nr_coreset.h"

namespace Models::Nr5g {

using Orvalis::Tessaline::BoolSetting;
using Orvalis::Tessaline::DoubleSetting;
using Orvalis::Tessaline::EnumSetting;
using Orvalis::Tessaline::Int32Setting;
using Orvalis::Tessaline::ModelBase;
using Orvalis::Tessaline::ModelCollection;
using Orvalis::Tessaline::StringSetting;
using Orvalis::Tessaline::SubSetting;

class NRDLBWP : public ModelBase {
    TESSALINE_MODEL_TYPE(NRDLBWP)
  public:
    NRDLBWP();

    /// This is the initial downlink bandwidth part.
    std::shared_ptr<BoolSetting> InitialDLBWP = std::make_shared<BoolSetting>("InitialDLBWP");
    /// The CORESET 0 of the initial bandwidth part is derived.
    std::shared_ptr<BoolSetting> AutoConfiguration =
        std::make_shared<BoolSetting>("AutoConfiguration");
    /// Minimum channel bandwidth.
    std::shared_ptr<EnumSetting<::Models::Nr5g::MinimumChannelBandwidth>> MinimumChannelBandwidth =
        std::make_shared<EnumSetting<::Models::Nr5g::MinimumChannelBandwidth>>(
            "MinimumChannelBandwidth");
    /// Shared spectrum channel access.
    std::shared_ptr<BoolSetting> SharedSpectrumChannelAccess =
        std::make_shared<BoolSetting>("SharedSpectrumChannelAccess");
    /// How many of the three CORESETs are used.
    std::shared_ptr<Int32Setting> NumberOfCoreset =
        std::make_shared<Int32Setting>("NumberOfCoreset");
    /// First CORESET.
    std::shared_ptr<SubSetting<::Models::Nr5g::NRCORESET>> Coreset0 =
        std::make_shared<SubSetting<::Models::Nr5g::NRCORESET>>("Coreset0");
    /// Second CORESET.
    std::shared_ptr<SubSetting<::Models::Nr5g::NRCORESET>> Coreset1 =
        std::make_shared<SubSetting<::Models::Nr5g::NRCORESET>>("Coreset1");
    /// Third CORESET.
    std::shared_ptr<SubSetting<::Models::Nr5g::NRCORESET>> Coreset2 =
        std::make_shared<SubSetting<::Models::Nr5g::NRCORESET>>("Coreset2");
    /// Identifier.
    std::shared_ptr<Int32Setting> ID = std::make_shared<Int32Setting>("ID");
    /// Display name, by which other settings refer to this item.
    std::shared_ptr<StringSetting> Name = std::make_shared<StringSetting>("Name");
    /// Numerology.
    std::shared_ptr<EnumSetting<::Models::Nr5g::Numerology>> Numerology =
        std::make_shared<EnumSetting<::Models::Nr5g::Numerology>>("Numerology");
    /// Numerology as the number µ.
    std::shared_ptr<Int32Setting> Mu = std::make_shared<Int32Setting>("Mu");
    /// Cyclic prefix.
    std::shared_ptr<EnumSetting<::Models::Nr5g::CyclicPrefixType>> CPType =
        std::make_shared<EnumSetting<::Models::Nr5g::CyclicPrefixType>>("CPType");
    /// First resource block, relative to the bandwidth part.
    std::shared_ptr<Int32Setting> RBOffset = std::make_shared<Int32Setting>("RBOffset");
    /// Number of resource blocks.
    std::shared_ptr<Int32Setting> RBNumber = std::make_shared<Int32Setting>("RBNumber");
    /// Host validation state.
    std::shared_ptr<BoolSetting> Valid = std::make_shared<BoolSetting>("Valid");
};

TESSALINE_REGISTERED_MODEL(NRDLBWP)

}  // namespace Models::Nr5g
