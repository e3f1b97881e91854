#pragma once
// Settings model PayloadData.

#include <memory>
#include <string>

#include "framework/enum_setting.h"
#include "framework/model_base.h"
#include "framework/model_registration.h"
#include "framework/sub_setting.h"
#include "framework/value_setting.h"
#include "models/enums.h"

namespace Models::Nr5g {

using Orvalis::Tessaline::BoolSetting;
using Orvalis::Tessaline::DoubleSetting;
using Orvalis::Tessaline::EnumSetting;
using Orvalis::Tessaline::Int32Setting;
using Orvalis::Tessaline::ModelBase;
using Orvalis::Tessaline::ModelCollection;
using Orvalis::Tessaline::StringSetting;
using Orvalis::Tessaline::SubSetting;

class PayloadData : public ModelBase {
    TESSALINE_MODEL_TYPE(PayloadData)
  public:
    PayloadData();

    /// Data source. The key is spelt with a capital L.
    std::shared_ptr<EnumSetting<::Models::Nr5g::PayloadDataType>> PayLoadDataType =
        std::make_shared<EnumSetting<::Models::Nr5g::PayloadDataType>>("PayLoadDataType");
    /// Fixed four-bit value; no enumerator of `PayloadDataType` selects it.
    std::shared_ptr<Int32Setting> Fix4 = std::make_shared<Int32Setting>("Fix4");
    /// Custom pattern as a string of "0" and "1".
    std::shared_ptr<StringSetting> PatternBits = std::make_shared<StringSetting>("PatternBits");
    /// Path of the user data file.
    std::shared_ptr<StringSetting> UserFile = std::make_shared<StringSetting>("UserFile");
};

TESSALINE_REGISTERED_MODEL(PayloadData)

}  // namespace Models::Nr5g
