#pragma once
// Settings model LTECRS.

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

class LTECRS : public ModelBase {
    TESSALINE_MODEL_TYPE(LTECRS)
  public:
    LTECRS();
    std::string getMBSFNSubframeIndexArrayStr() const {
        return MBSFNSubframeIndexArrayStr->getValue();
    }

    /// LTE bandwidth.
    std::shared_ptr<EnumSetting<::Models::Nr5g::LTEBandwidth>> LTEBandwidth =
        std::make_shared<EnumSetting<::Models::Nr5g::LTEBandwidth>>("LTEBandwidth");
    /// Offset to point A.
    std::shared_ptr<Int32Setting> OffsetToPointA = std::make_shared<Int32Setting>("OffsetToPointA");
    /// Offset to the NR carrier.
    std::shared_ptr<Int32Setting> OffsetToNR = std::make_shared<Int32Setting>("OffsetToNR");
    /// MBSFN subframes as entered.
    std::shared_ptr<StringSetting> MBSFNSubframeIndexStr =
        std::make_shared<StringSetting>("MBSFNSubframeIndexStr");
    /// The same as a comma list.
    std::shared_ptr<StringSetting> MBSFNSubframeIndexArrayStr =
        std::make_shared<StringSetting>("MBSFNSubframeIndexArrayStr");
    /// Number of CRS antenna ports.
    std::shared_ptr<Int32Setting> NumberOfCRSAntennaPorts =
        std::make_shared<Int32Setting>("NumberOfCRSAntennaPorts");
    /// Frequency shift v_shift.
    std::shared_ptr<Int32Setting> VShift = std::make_shared<Int32Setting>("VShift");
};

TESSALINE_REGISTERED_MODEL(LTECRS)

}  // namespace Models::Nr5g
