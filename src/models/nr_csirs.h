#pragma once
// Settings model NRCSIRS.

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

class NRCSIRS : public ModelBase {
    TESSALINE_MODEL_TYPE(NRCSIRS)
  public:
    NRCSIRS();

    /// Display name, by which other settings refer to this item.
    std::shared_ptr<StringSetting> Name = std::make_shared<StringSetting>("Name");
    /// The item takes part in the generation.
    std::shared_ptr<BoolSetting> Enabled = std::make_shared<BoolSetting>("Enabled");
    /// Ports generated, in the form "p0".
    std::shared_ptr<StringSetting> AntennaPortsGenerated =
        std::make_shared<StringSetting>("AntennaPortsGenerated");
    /// Data scrambling identity; -1 means the cell identity.
    std::shared_ptr<Int32Setting> n_ID = std::make_shared<Int32Setting>("n_ID");
    /// Zero-power CSI-RS.
    std::shared_ptr<BoolSetting> ZeroPower = std::make_shared<BoolSetting>("ZeroPower");
    /// Slots as the user entered them: a number, or a range with a colon ("0:19").
    std::shared_ptr<StringSetting> SlotIndexStr = std::make_shared<StringSetting>("SlotIndexStr");
    /// Name of the bandwidth part this item uses.
    std::shared_ptr<StringSetting> BWPName = std::make_shared<StringSetting>("BWPName");
    /// Index of that bandwidth part in the collection.
    std::shared_ptr<Int32Setting> BWPIndex = std::make_shared<Int32Setting>("BWPIndex");
    /// First resource block, relative to the bandwidth part.
    std::shared_ptr<Int32Setting> RBOffset = std::make_shared<Int32Setting>("RBOffset");
    /// Number of resource blocks.
    std::shared_ptr<Int32Setting> RBNumber = std::make_shared<Int32Setting>("RBNumber");
    /// First symbol l0.
    std::shared_ptr<Int32Setting> FirstSymbol = std::make_shared<Int32Setting>("FirstSymbol");
    /// Second first-symbol l1.
    std::shared_ptr<Int32Setting> FirstSymbol2 = std::make_shared<Int32Setting>("FirstSymbol2");
    /// Frequency-domain resources, as a string of "0" and "1".
    std::shared_ptr<StringSetting> FrequencyDomainBitmap =
        std::make_shared<StringSetting>("FrequencyDomainBitmap");
    /// Row of the CSI-RS location table.
    std::shared_ptr<Int32Setting> RowIndex = std::make_shared<Int32Setting>("RowIndex");
    /// Number of antenna ports.
    std::shared_ptr<Int32Setting> NumberOfAntennaPorts =
        std::make_shared<Int32Setting>("NumberOfAntennaPorts");
    /// Frequency density.
    std::shared_ptr<EnumSetting<::Models::Nr5g::CSIRSDensity>> Density =
        std::make_shared<EnumSetting<::Models::Nr5g::CSIRSDensity>>("Density");
    /// Even or odd PRBs.
    std::shared_ptr<EnumSetting<::Models::Nr5g::PRBAllocation>> PRBAllocation =
        std::make_shared<EnumSetting<::Models::Nr5g::PRBAllocation>>("PRBAllocation");
    /// CDM type as text, for example "FD-CDM2".
    std::shared_ptr<StringSetting> CDMType = std::make_shared<StringSetting>("CDMType");
    /// When true the CSI-RS punctures the data; when false, data rate-matches around it.
    std::shared_ptr<BoolSetting> REUsedForPDSCH = std::make_shared<BoolSetting>("REUsedForPDSCH");
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

TESSALINE_REGISTERED_MODEL(NRCSIRS)

}  // namespace Models::Nr5g
