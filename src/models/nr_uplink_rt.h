#pragma once
// Settings model NRUplinkRT.

#include <memory>
#include <string>

#include "framework/enum_setting.h"
#include "framework/model_base.h"
#include "framework/model_registration.h"
#include "framework/sub_setting.h"
#include "framework/value_setting.h"
#include "models/enums.h"
#include "models/nr_srs.h"
#include "models/nr_uci.h"
#include "models/nr_ul_bwp.h"
#include "models/nr_ulsch.h"
#include "models/nr_ulsch_rt.h"

namespace Models::Nr5g {

using Orvalis::Tessaline::BoolSetting;
using Orvalis::Tessaline::DoubleSetting;
using Orvalis::Tessaline::EnumSetting;
using Orvalis::Tessaline::Int32Setting;
using Orvalis::Tessaline::ModelBase;
using Orvalis::Tessaline::ModelCollection;
using Orvalis::Tessaline::StringSetting;
using Orvalis::Tessaline::SubSetting;

class NRUplinkRT : public ModelBase {
    TESSALINE_MODEL_TYPE(NRUplinkRT)
  public:
    NRUplinkRT();

    /// The real-time PUSCHs.
    std::shared_ptr<SubSetting<ModelCollection<::Models::Nr5g::NRULSCH_RT>>> ULSCHRT =
        std::make_shared<SubSetting<ModelCollection<::Models::Nr5g::NRULSCH_RT>>>("ULSCHRT");
    /// The PUCCHs.
    std::shared_ptr<SubSetting<ModelCollection<::Models::Nr5g::NRUCI>>> UCI =
        std::make_shared<SubSetting<ModelCollection<::Models::Nr5g::NRUCI>>>("UCI");
    /// The PUSCHs.
    std::shared_ptr<SubSetting<ModelCollection<::Models::Nr5g::NRULSCH>>> ULSCH =
        std::make_shared<SubSetting<ModelCollection<::Models::Nr5g::NRULSCH>>>("ULSCH");
    /// The bandwidth parts.
    std::shared_ptr<SubSetting<ModelCollection<::Models::Nr5g::NRULBWP>>> BWP =
        std::make_shared<SubSetting<ModelCollection<::Models::Nr5g::NRULBWP>>>("BWP");
    /// The SRSs.
    std::shared_ptr<SubSetting<ModelCollection<::Models::Nr5g::NRSRS>>> SRSs =
        std::make_shared<SubSetting<ModelCollection<::Models::Nr5g::NRSRS>>>("SRSs");
    /// One SRS of the real-time uplink.
    std::shared_ptr<SubSetting<::Models::Nr5g::NRSRS>> SRS =
        std::make_shared<SubSetting<::Models::Nr5g::NRSRS>>("SRS");
};

TESSALINE_REGISTERED_MODEL(NRUplinkRT)

}  // namespace Models::Nr5g
