#pragma once
// Settings model NRPRACHBurst.

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

class NRPRACHBurst : public ModelBase {
    TESSALINE_MODEL_TYPE(NRPRACHBurst)
  public:
    NRPRACHBurst();

    /// The item takes part in the generation.
    std::shared_ptr<BoolSetting> Enabled = std::make_shared<BoolSetting>("Enabled");
    /// Power boost in dB.
    std::shared_ptr<DoubleSetting> PowerBoosting = std::make_shared<DoubleSetting>("PowerBoosting");
    /// Timing offset in seconds.
    std::shared_ptr<DoubleSetting> TimingOffset = std::make_shared<DoubleSetting>("TimingOffset");
    /// Preamble format of the burst.
    std::shared_ptr<EnumSetting<::Models::Nr5g::PRACHFormat>> PRACHFormat =
        std::make_shared<EnumSetting<::Models::Nr5g::PRACHFormat>>("PRACHFormat");
    /// Preamble index.
    std::shared_ptr<Int32Setting> PreambleIndex = std::make_shared<Int32Setting>("PreambleIndex");
    /// Root sequence index.
    std::shared_ptr<Int32Setting> RootSequenceIndex =
        std::make_shared<Int32Setting>("RootSequenceIndex");
    /// Sequence number.
    std::shared_ptr<Int32Setting> SequenceNumber = std::make_shared<Int32Setting>("SequenceNumber");
    /// Cyclic shift index.
    std::shared_ptr<Int32Setting> CyclicShiftIndex =
        std::make_shared<Int32Setting>("CyclicShiftIndex");
    /// Cyclic shift.
    std::shared_ptr<Int32Setting> CyclicShift = std::make_shared<Int32Setting>("CyclicShift");
    /// Frame offset of the burst.
    std::shared_ptr<Int32Setting> FrameOffset = std::make_shared<Int32Setting>("FrameOffset");
    /// Slot of the burst.
    std::shared_ptr<Int32Setting> SlotIndex = std::make_shared<Int32Setting>("SlotIndex");
    /// Time index of the occasion.
    std::shared_ptr<Int32Setting> n_RA_t = std::make_shared<Int32Setting>("n_RA_t");
    /// Slot index of the occasion.
    std::shared_ptr<Int32Setting> n_RA_slot = std::make_shared<Int32Setting>("n_RA_slot");
    /// Frequency index of the occasion.
    std::shared_ptr<Int32Setting> n_RA_f = std::make_shared<Int32Setting>("n_RA_f");
    /// Index of the PRACH occasion.
    std::shared_ptr<Int32Setting> OccasionIndex = std::make_shared<Int32Setting>("OccasionIndex");
    /// RA-RNTI.
    std::shared_ptr<Int32Setting> RA_RNTI = std::make_shared<Int32Setting>("RA_RNTI");
    /// Start time of the preamble in seconds.
    std::shared_ptr<DoubleSetting> t_start = std::make_shared<DoubleSetting>("t_start");
    /// Offset k1.
    std::shared_ptr<Int32Setting> k1 = std::make_shared<Int32Setting>("k1");
    /// Time range in seconds.
    std::shared_ptr<DoubleSetting> t_range = std::make_shared<DoubleSetting>("t_range");
};

TESSALINE_REGISTERED_MODEL(NRPRACHBurst)

}  // namespace Models::Nr5g
