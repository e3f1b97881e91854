#pragma once
// Settings model NRMIB.

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

class NRMIB : public ModelBase {
    TESSALINE_MODEL_TYPE(NRMIB)
  public:
    NRMIB();

    /// MIB field subCarrierSpacingCommon.
    std::shared_ptr<EnumSetting<::Models::Nr5g::SubcarrierSpacing>> SubcarrierSpacingCommon =
        std::make_shared<EnumSetting<::Models::Nr5g::SubcarrierSpacing>>("SubcarrierSpacingCommon");
    /// MIB field ssb-SubcarrierOffset.
    std::shared_ptr<Int32Setting> SsbSubcarrierOffset =
        std::make_shared<Int32Setting>("SsbSubcarrierOffset");
    /// MIB field dmrs-TypeA-Position.
    std::shared_ptr<Int32Setting> DmrstypeApos = std::make_shared<Int32Setting>("DmrstypeApos");
    /// MIB field pdcch-ConfigSIB1.
    std::shared_ptr<Int32Setting> PdcchConfigSIB1 =
        std::make_shared<Int32Setting>("PdcchConfigSIB1");
    /// MIB field cellBarred.
    std::shared_ptr<EnumSetting<::Models::Nr5g::CellBarred>> CellBarred =
        std::make_shared<EnumSetting<::Models::Nr5g::CellBarred>>("CellBarred");
    /// MIB field intraFreqReselection.
    std::shared_ptr<EnumSetting<::Models::Nr5g::IntraFreqReselection>> IntraFreqReselection =
        std::make_shared<EnumSetting<::Models::Nr5g::IntraFreqReselection>>("IntraFreqReselection");
};

TESSALINE_REGISTERED_MODEL(NRMIB)

}  // namespace Models::Nr5g
