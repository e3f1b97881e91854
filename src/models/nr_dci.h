#pragma once
// Settings model NRDCI.

#include <memory>
#include <string>

#include "framework/enum_setting.h"
#include "framework/model_base.h"
#include "framework/model_registration.h"
#include "framework/sub_setting.h"
#include "framework/value_setting.h"
#include "models/enums.h"
#include "models/payload_data.h"

namespace Models::Nr5g {

using Orvalis::Tessaline::BoolSetting;
using Orvalis::Tessaline::DoubleSetting;
using Orvalis::Tessaline::EnumSetting;
using Orvalis::Tessaline::Int32Setting;
using Orvalis::Tessaline::ModelBase;
using Orvalis::Tessaline::ModelCollection;
using Orvalis::Tessaline::StringSetting;
using Orvalis::Tessaline::SubSetting;

class NRDCI : public ModelBase {
    TESSALINE_MODEL_TYPE(NRDCI)
  public:
    NRDCI();

    /// Display name, by which other settings refer to this item.
    std::shared_ptr<StringSetting> Name = std::make_shared<StringSetting>("Name");
    /// The item takes part in the generation.
    std::shared_ptr<BoolSetting> Enabled = std::make_shared<BoolSetting>("Enabled");
    /// DM-RS power boost in dB.
    std::shared_ptr<DoubleSetting> DMRSPowerBoosting =
        std::make_shared<DoubleSetting>("DMRSPowerBoosting");
    /// Switch of the scrambling.
    std::shared_ptr<BoolSetting> Scrambling = std::make_shared<BoolSetting>("Scrambling");
    /// Scrambling identity of the PDCCH DM-RS; -1 means the cell identity.
    std::shared_ptr<Int32Setting> PDCCHDMRSScramblingID =
        std::make_shared<Int32Setting>("PDCCHDMRSScramblingID");
    /// RNTI.
    std::shared_ptr<Int32Setting> RNTI = std::make_shared<Int32Setting>("RNTI");
    /// C-RNTI.
    std::shared_ptr<Int32Setting> CRNTI = std::make_shared<Int32Setting>("CRNTI");
    /// Reference point of the DM-RS sequence.
    std::shared_ptr<EnumSetting<::Models::Nr5g::DMRSMappingReference>> DMRSMappingReference =
        std::make_shared<EnumSetting<::Models::Nr5g::DMRSMappingReference>>("DMRSMappingReference");
    /// Name of the bandwidth part this item uses.
    std::shared_ptr<StringSetting> BWPName = std::make_shared<StringSetting>("BWPName");
    /// Index of that bandwidth part in the collection.
    std::shared_ptr<Int32Setting> BWPIndex = std::make_shared<Int32Setting>("BWPIndex");
    /// Which of `Coreset0`, `Coreset1`, `Coreset2` of the bandwidth part: 0, 1 or 2.
    std::shared_ptr<Int32Setting> CoresetIndex = std::make_shared<Int32Setting>("CoresetIndex");
    /// CORESET by identifier.
    std::shared_ptr<Int32Setting> CoresetID = std::make_shared<Int32Setting>("CoresetID");
    /// CORESET by name, in the form "BWP1_CORESET1".
    std::shared_ptr<StringSetting> CoresetSelection =
        std::make_shared<StringSetting>("CoresetSelection");
    /// Slots as the user entered them: a number, or a range with a colon ("0:19").
    std::shared_ptr<StringSetting> SlotIndexStr = std::make_shared<StringSetting>("SlotIndexStr");
    /// First OFDM symbol.
    std::shared_ptr<Int32Setting> FirstSymbol = std::make_shared<Int32Setting>("FirstSymbol");
    /// Search space.
    std::shared_ptr<EnumSetting<::Models::Nr5g::PDCCHSearchSpace>> SearchSpace =
        std::make_shared<EnumSetting<::Models::Nr5g::PDCCHSearchSpace>>("SearchSpace");
    /// Aggregation level.
    std::shared_ptr<Int32Setting> AggregationLevel =
        std::make_shared<Int32Setting>("AggregationLevel");
    /// Number of PDCCH candidates.
    std::shared_ptr<Int32Setting> NumberOfCandidates =
        std::make_shared<Int32Setting>("NumberOfCandidates");
    /// PDCCH candidate used.
    std::shared_ptr<Int32Setting> CandidateIndex = std::make_shared<Int32Setting>("CandidateIndex");
    /// First CCE.
    std::shared_ptr<Int32Setting> CCEOffset = std::make_shared<Int32Setting>("CCEOffset");
    /// First CCE per slot, as a comma list of integers beside `SlotIndexArrayStr`.
    std::shared_ptr<StringSetting> CCEOffsetStr = std::make_shared<StringSetting>("CCEOffsetStr");
    /// Number of CCEs.
    std::shared_ptr<Int32Setting> NumberOfCCE = std::make_shared<Int32Setting>("NumberOfCCE");
    /// When false, the coding chain is bypassed.
    std::shared_ptr<BoolSetting> ChannelCoding = std::make_shared<BoolSetting>("ChannelCoding");
    /// Data source of this item.
    std::shared_ptr<SubSetting<::Models::Nr5g::PayloadData>> PayloadData =
        std::make_shared<SubSetting<::Models::Nr5g::PayloadData>>("PayloadData");
    /// Number of payload bits.
    std::shared_ptr<Int32Setting> PayloadSize = std::make_shared<Int32Setting>("PayloadSize");
    /// When true the payload is the string `DCIBits`, of `DCIBitsLength` bits; when false it comes
    /// from `PayloadData`.
    std::shared_ptr<BoolSetting> AutoDCI = std::make_shared<BoolSetting>("AutoDCI");
    /// Format.
    std::shared_ptr<EnumSetting<::Models::Nr5g::DCIFormat>> DCIFormat =
        std::make_shared<EnumSetting<::Models::Nr5g::DCIFormat>>("DCIFormat");
    /// RNTI type.
    std::shared_ptr<EnumSetting<::Models::Nr5g::RNTIType>> RNTIType =
        std::make_shared<EnumSetting<::Models::Nr5g::RNTIType>>("RNTIType");
    /// Name of the PDSCH this DCI schedules.
    std::shared_ptr<StringSetting> DLSCHCoupling = std::make_shared<StringSetting>("DLSCHCoupling");
    /// DCI bits, as a string of "0" and "1".
    std::shared_ptr<StringSetting> DCIBits = std::make_shared<StringSetting>("DCIBits");
    /// Number of DCI bits.
    std::shared_ptr<Int32Setting> DCIBitsLength = std::make_shared<Int32Setting>("DCIBitsLength");
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

TESSALINE_REGISTERED_MODEL(NRDCI)

}  // namespace Models::Nr5g
