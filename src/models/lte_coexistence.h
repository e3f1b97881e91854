#pragma once
// Settings model LTECoexistence.

#include <memory>
#include <string>

#include "framework/enum_setting.h"
#include "framework/model_base.h"
#include "framework/model_registration.h"
#include "framework/sub_setting.h"
#include "framework/value_setting.h"
#include "models/enums.h"
#include "models/lte_crs.h"

namespace Models::Nr5g {

using Orvalis::Tessaline::BoolSetting;
using Orvalis::Tessaline::DoubleSetting;
using Orvalis::Tessaline::EnumSetting;
using Orvalis::Tessaline::Int32Setting;
using Orvalis::Tessaline::ModelBase;
using Orvalis::Tessaline::ModelCollection;
using Orvalis::Tessaline::StringSetting;
using Orvalis::Tessaline::SubSetting;

class LTECoexistence : public ModelBase {
    TESSALINE_MODEL_TYPE(LTECoexistence)
  public:
    LTECoexistence();

    /// Display name, by which other settings refer to this item.
    std::shared_ptr<StringSetting> Name = std::make_shared<StringSetting>("Name");
    /// The item takes part in the generation.
    std::shared_ptr<BoolSetting> Enabled = std::make_shared<BoolSetting>("Enabled");
    /// Number of LTE carriers.
    std::shared_ptr<Int32Setting> NumberOfLTECRS = std::make_shared<Int32Setting>("NumberOfLTECRS");
    /// The LTE CRS carriers.
    std::shared_ptr<SubSetting<ModelCollection<::Models::Nr5g::LTECRS>>> LTECRS =
        std::make_shared<SubSetting<ModelCollection<::Models::Nr5g::LTECRS>>>("LTECRS");
    /// Alternative additional DM-RS positions.
    std::shared_ptr<BoolSetting> AdditionalDMRS_DL_Alt =
        std::make_shared<BoolSetting>("AdditionalDMRS_DL_Alt");
    /// Host validation state: the item collides with another.
    std::shared_ptr<BoolSetting> Conflict = std::make_shared<BoolSetting>("Conflict");
    /// Host validation state.
    std::shared_ptr<BoolSetting> Valid = std::make_shared<BoolSetting>("Valid");
};

TESSALINE_REGISTERED_MODEL(LTECoexistence)

}  // namespace Models::Nr5g
