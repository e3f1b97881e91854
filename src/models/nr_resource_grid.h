#pragma once
// Settings model NRResourceGrid.

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

class NRResourceGrid : public ModelBase {
    TESSALINE_MODEL_TYPE(NRResourceGrid)
  public:
    NRResourceGrid();

    /// The grid is in use.
    std::shared_ptr<BoolSetting> Enabled = std::make_shared<BoolSetting>("Enabled");
    /// Numerology of the grid.
    std::shared_ptr<Int32Setting> Mu = std::make_shared<Int32Setting>("Mu");
    /// Start of the grid in resource blocks.
    std::shared_ptr<Int32Setting> N_grid_start = std::make_shared<Int32Setting>("N_grid_start");
    /// Size of the grid in resource blocks.
    std::shared_ptr<Int32Setting> N_grid_size = std::make_shared<Int32Setting>("N_grid_size");
    /// Offset k0 of the grid.
    std::shared_ptr<Int32Setting> k0 = std::make_shared<Int32Setting>("k0");
    /// Frequency of reference point A in Hz.
    std::shared_ptr<DoubleSetting> RefA = std::make_shared<DoubleSetting>("RefA");
    /// Lowest resource block of the grid.
    std::shared_ptr<DoubleSetting> N_RB_low = std::make_shared<DoubleSetting>("N_RB_low");
};

TESSALINE_REGISTERED_MODEL(NRResourceGrid)

}  // namespace Models::Nr5g
