#pragma once
// Settings model NRPRS.

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

class NRPRS : public ModelBase {
    TESSALINE_MODEL_TYPE(NRPRS)
  public:
    NRPRS();

    /// Display name, by which other settings refer to this item.
    std::shared_ptr<StringSetting> Name = std::make_shared<StringSetting>("Name");
    /// The item takes part in the generation.
    std::shared_ptr<BoolSetting> Enabled = std::make_shared<BoolSetting>("Enabled");
    /// Subcarrier spacing.
    std::shared_ptr<EnumSetting<::Models::Nr5g::SubcarrierSpacing>> SubcarrierSpacing =
        std::make_shared<EnumSetting<::Models::Nr5g::SubcarrierSpacing>>("SubcarrierSpacing");
    /// Cyclic prefix.
    std::shared_ptr<EnumSetting<::Models::Nr5g::CyclicPrefixType>> CyclicPrefix =
        std::make_shared<EnumSetting<::Models::Nr5g::CyclicPrefixType>>("CyclicPrefix");
    /// Point A.
    std::shared_ptr<Int32Setting> PointA = std::make_shared<Int32Setting>("PointA");
    /// Frequency offset of point A in Hz.
    std::shared_ptr<DoubleSetting> FrequencyOffsetOfPointA =
        std::make_shared<DoubleSetting>("FrequencyOffsetOfPointA");
    /// Bandwidth of the resource in PRBs.
    std::shared_ptr<Int32Setting> ResourceBandwidth =
        std::make_shared<Int32Setting>("ResourceBandwidth");
    /// First PRB.
    std::shared_ptr<Int32Setting> StartPRB = std::make_shared<Int32Setting>("StartPRB");
    /// Comb size.
    std::shared_ptr<Int32Setting> CombSizeN = std::make_shared<Int32Setting>("CombSizeN");
    /// Period in slots.
    std::shared_ptr<Int32Setting> Periodicity = std::make_shared<Int32Setting>("Periodicity");
    /// Slot offset of the resource set.
    std::shared_ptr<Int32Setting> ResourceSetSlotOffset =
        std::make_shared<Int32Setting>("ResourceSetSlotOffset");
    /// Repetition factor.
    std::shared_ptr<Int32Setting> ResourceRepetitionFactor =
        std::make_shared<Int32Setting>("ResourceRepetitionFactor");
    /// Time gap of the repetitions.
    std::shared_ptr<Int32Setting> ResourceTimeGap =
        std::make_shared<Int32Setting>("ResourceTimeGap");
    /// First muting pattern, as a string of "0" and "1".
    std::shared_ptr<StringSetting> MutingPattern1 =
        std::make_shared<StringSetting>("MutingPattern1");
    /// Repetition factor of a muting bit.
    std::shared_ptr<Int32Setting> MutingBitRepetitionFactor =
        std::make_shared<Int32Setting>("MutingBitRepetitionFactor");
    /// Second muting pattern, as a string of "0" and "1".
    std::shared_ptr<StringSetting> MutingPattern2 =
        std::make_shared<StringSetting>("MutingPattern2");
    /// Sequence identity.
    std::shared_ptr<Int32Setting> SequenceId = std::make_shared<Int32Setting>("SequenceId");
    /// Resource element offset.
    std::shared_ptr<Int32Setting> ReOffset = std::make_shared<Int32Setting>("ReOffset");
    /// Slot offset of the resource.
    std::shared_ptr<Int32Setting> ResourceSlotOffset =
        std::make_shared<Int32Setting>("ResourceSlotOffset");
    /// Symbol offset of the resource.
    std::shared_ptr<Int32Setting> ResourceSymbolOffset =
        std::make_shared<Int32Setting>("ResourceSymbolOffset");
    /// Number of symbols.
    std::shared_ptr<Int32Setting> NumSymbols = std::make_shared<Int32Setting>("NumSymbols");
    /// The same slots as the comma list of absolute slot numbers, expanded by the host. This is the
    /// form the generators parse.
    std::shared_ptr<StringSetting> SlotIndexArrayStr =
        std::make_shared<StringSetting>("SlotIndexArrayStr");
    /// Power boost in dB.
    std::shared_ptr<DoubleSetting> PowerBoosting = std::make_shared<DoubleSetting>("PowerBoosting");
    /// Host validation state: the item collides with another.
    std::shared_ptr<BoolSetting> Conflict = std::make_shared<BoolSetting>("Conflict");
    /// Host validation state.
    std::shared_ptr<BoolSetting> Valid = std::make_shared<BoolSetting>("Valid");
};

TESSALINE_REGISTERED_MODEL(NRPRS)

}  // namespace Models::Nr5g
