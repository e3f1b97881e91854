#pragma once
// Settings model NRDownlink.

#include <memory>
#include <string>

#include "framework/enum_setting.h"
#include "framework/model_base.h"
#include "framework/model_registration.h"
#include "framework/sub_setting.h"
#include "framework/value_setting.h"
#include "models/enums.h"
#include "models/lte_coexistence.h"
#include "models/nr_csirs.h"
#include "models/nr_dci.h"
#include "models/nr_dl_bwp.h"
#include "models/nr_dlsch.h"
#include "models/nr_prs.h"
#include "models/nr_sspbch.h"

namespace Models::Nr5g {

using Orvalis::Tessaline::BoolSetting;
using Orvalis::Tessaline::DoubleSetting;
using Orvalis::Tessaline::EnumSetting;
using Orvalis::Tessaline::Int32Setting;
using Orvalis::Tessaline::ModelBase;
using Orvalis::Tessaline::ModelCollection;
using Orvalis::Tessaline::StringSetting;
using Orvalis::Tessaline::SubSetting;

class NRDownlink : public ModelBase {
    TESSALINE_MODEL_TYPE(NRDownlink)
  public:
    NRDownlink();

    /// The SS/PBCH configuration.
    std::shared_ptr<SubSetting<::Models::Nr5g::NRSSPBCH>> SSPBCH =
        std::make_shared<SubSetting<::Models::Nr5g::NRSSPBCH>>("SSPBCH");
    /// The DCIs.
    std::shared_ptr<SubSetting<ModelCollection<::Models::Nr5g::NRDCI>>> DCI =
        std::make_shared<SubSetting<ModelCollection<::Models::Nr5g::NRDCI>>>("DCI");
    /// The PDSCHs.
    std::shared_ptr<SubSetting<ModelCollection<::Models::Nr5g::NRDLSCH>>> DLSCH =
        std::make_shared<SubSetting<ModelCollection<::Models::Nr5g::NRDLSCH>>>("DLSCH");
    /// The CSI-RSs.
    std::shared_ptr<SubSetting<ModelCollection<::Models::Nr5g::NRCSIRS>>> CSIRS =
        std::make_shared<SubSetting<ModelCollection<::Models::Nr5g::NRCSIRS>>>("CSIRS");
    /// The bandwidth parts.
    std::shared_ptr<SubSetting<ModelCollection<::Models::Nr5g::NRDLBWP>>> BWP =
        std::make_shared<SubSetting<ModelCollection<::Models::Nr5g::NRDLBWP>>>("BWP");
    /// LTE coexistence.
    std::shared_ptr<SubSetting<::Models::Nr5g::LTECoexistence>> LTECoexistence =
        std::make_shared<SubSetting<::Models::Nr5g::LTECoexistence>>("LTECoexistence");
    /// The PRSs.
    std::shared_ptr<SubSetting<ModelCollection<::Models::Nr5g::NRPRS>>> PRS =
        std::make_shared<SubSetting<ModelCollection<::Models::Nr5g::NRPRS>>>("PRS");
};

TESSALINE_REGISTERED_MODEL(NRDownlink)

}  // namespace Models::Nr5g
