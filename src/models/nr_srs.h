#pragma once
// Settings model NRSRS.

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

class NRSRS : public ModelBase {
    TESSALINE_MODEL_TYPE(NRSRS)
  public:
    NRSRS();

    /// Display name, by which other settings refer to this item.
    std::shared_ptr<StringSetting> Name = std::make_shared<StringSetting>("Name");
    /// The item takes part in the generation.
    std::shared_ptr<BoolSetting> Enabled = std::make_shared<BoolSetting>("Enabled");
    /// Ports generated, in the form "p0".
    std::shared_ptr<StringSetting> AntennaPortsGenerated =
        std::make_shared<StringSetting>("AntennaPortsGenerated");
    /// Number of antenna ports.
    std::shared_ptr<Int32Setting> NumberOfAntennaPorts =
        std::make_shared<Int32Setting>("NumberOfAntennaPorts");
    /// Numerology.
    std::shared_ptr<EnumSetting<::Models::Nr5g::Numerology>> Numerology =
        std::make_shared<EnumSetting<::Models::Nr5g::Numerology>>("Numerology");
    /// SRS for positioning.
    std::shared_ptr<BoolSetting> SRSForPositioning =
        std::make_shared<BoolSetting>("SRSForPositioning");
    /// Slots as the user entered them: a number, or a range with a colon ("0:19").
    std::shared_ptr<StringSetting> SlotIndexStr = std::make_shared<StringSetting>("SlotIndexStr");
    /// First symbol.
    std::shared_ptr<Int32Setting> SymbolStart = std::make_shared<Int32Setting>("SymbolStart");
    /// Start position counted from the end of the slot.
    std::shared_ptr<Int32Setting> StartPosition = std::make_shared<Int32Setting>("StartPosition");
    /// Number of symbols.
    std::shared_ptr<Int32Setting> N_symb_SRS = std::make_shared<Int32Setting>("N_symb_SRS");
    /// Repetition factor.
    std::shared_ptr<Int32Setting> R = std::make_shared<Int32Setting>("R");
    /// Period in slots; 0 for no periodic repetition.
    std::shared_ptr<Int32Setting> Periodicity = std::make_shared<Int32Setting>("Periodicity");
    /// Slot offset within the period.
    std::shared_ptr<Int32Setting> SlotOffset = std::make_shared<Int32Setting>("SlotOffset");
    /// Name of the bandwidth part this item uses.
    std::shared_ptr<StringSetting> BWPName = std::make_shared<StringSetting>("BWPName");
    /// Index of that bandwidth part in the collection.
    std::shared_ptr<Int32Setting> BWPIndex = std::make_shared<Int32Setting>("BWPIndex");
    /// Transmission comb number.
    std::shared_ptr<Int32Setting> K_TC = std::make_shared<Int32Setting>("K_TC");
    /// Comb offset.
    std::shared_ptr<Int32Setting> k_TC = std::make_shared<Int32Setting>("k_TC");
    /// Bandwidth parameter B_SRS.
    std::shared_ptr<Int32Setting> B_SRS = std::make_shared<Int32Setting>("B_SRS");
    /// Bandwidth configuration C_SRS.
    std::shared_ptr<Int32Setting> C_SRS = std::make_shared<Int32Setting>("C_SRS");
    /// Hopping parameter b_hop.
    std::shared_ptr<Int32Setting> b_hop = std::make_shared<Int32Setting>("b_hop");
    /// Frequency-domain shift.
    std::shared_ptr<Int32Setting> n_shift = std::make_shared<Int32Setting>("n_shift");
    /// Frequency-domain position.
    std::shared_ptr<Int32Setting> n_RRC = std::make_shared<Int32Setting>("n_RRC");
    /// Group and sequence hopping, 0 for none.
    std::shared_ptr<Int32Setting> GroupSequenceHopping =
        std::make_shared<Int32Setting>("GroupSequenceHopping");
    /// Cyclic shift.
    std::shared_ptr<Int32Setting> n_SRS_cs = std::make_shared<Int32Setting>("n_SRS_cs");
    /// Sequence identity.
    std::shared_ptr<Int32Setting> n_ID_SRS = std::make_shared<Int32Setting>("n_ID_SRS");
    /// Delta_ss of the sequence group.
    std::shared_ptr<Int32Setting> delta_ss = std::make_shared<Int32Setting>("delta_ss");
    /// The same slots as the comma list of absolute slot numbers, expanded by the host. This is the
    /// form the generators parse.
    std::shared_ptr<StringSetting> SlotIndexArrayStr =
        std::make_shared<StringSetting>("SlotIndexArrayStr");
    /// Power boost in dB.
    std::shared_ptr<DoubleSetting> PowerBoosting = std::make_shared<DoubleSetting>("PowerBoosting");
    /// First antenna port of this item.
    std::shared_ptr<Int32Setting> AntennaPort = std::make_shared<Int32Setting>("AntennaPort");
    /// Antenna ports as a comma list of integers.
    std::shared_ptr<StringSetting> AntennaPortArray =
        std::make_shared<StringSetting>("AntennaPortArray");
    /// Host validation state: the item collides with another.
    std::shared_ptr<BoolSetting> Conflict = std::make_shared<BoolSetting>("Conflict");
    /// Host validation state.
    std::shared_ptr<BoolSetting> Valid = std::make_shared<BoolSetting>("Valid");
};

TESSALINE_REGISTERED_MODEL(NRSRS)

}  // namespace Models::Nr5g
