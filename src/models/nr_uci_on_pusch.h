#pragma once
// Settings model NRUCIonPUSCH.

#include <memory>
#include <string>

#include "framework/enum_setting.h"
#include "framework/model_base.h"
#include "framework/model_registration.h"
#include "framework/sub_setting.h"
#include "framework/value_setting.h"
#include "models/enums.h"
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

class NRUCIonPUSCH : public ModelBase {
    TESSALINE_MODEL_TYPE(NRUCIonPUSCH)
  public:
    NRUCIonPUSCH();

    /// The item takes part in the generation.
    std::shared_ptr<BoolSetting> Enabled = std::make_shared<BoolSetting>("Enabled");
    /// Data source of this item.
    std::shared_ptr<SubSetting<::Models::Nr5g::PayloadData>> PayloadData =
        std::make_shared<SubSetting<::Models::Nr5g::PayloadData>>("PayloadData");
    /// Number of payload bits.
    std::shared_ptr<Int32Setting> PayloadSize = std::make_shared<Int32Setting>("PayloadSize");
    /// Index of the beta offset.
    std::shared_ptr<Int32Setting> BetaOffsetIndex =
        std::make_shared<Int32Setting>("BetaOffsetIndex");
};

TESSALINE_REGISTERED_MODEL(NRUCIonPUSCH)

}  // namespace Models::Nr5g
