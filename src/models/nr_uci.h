#pragma once
// Settings model NRUCI.

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

class NRUCI : public ModelBase {
    TESSALINE_MODEL_TYPE(NRUCI)
  public:
    NRUCI();

    /// Display name, by which other settings refer to this item.
    std::shared_ptr<StringSetting> Name = std::make_shared<StringSetting>("Name");
    /// The item takes part in the generation.
    std::shared_ptr<BoolSetting> Enabled = std::make_shared<BoolSetting>("Enabled");
    /// PUCCH format.
    std::shared_ptr<EnumSetting<::Models::Nr5g::PUCCHFormat>> PUCCHFormat =
        std::make_shared<EnumSetting<::Models::Nr5g::PUCCHFormat>>("PUCCHFormat");
    /// Data scrambling identity; -1 means the cell identity.
    std::shared_ptr<Int32Setting> n_ID = std::make_shared<Int32Setting>("n_ID");
    /// Hopping identity.
    std::shared_ptr<Int32Setting> HoppingID = std::make_shared<Int32Setting>("HoppingID");
    /// RNTI of the scrambling.
    std::shared_ptr<Int32Setting> n_RNTI = std::make_shared<Int32Setting>("n_RNTI");
    /// DM-RS scrambling identity 0; -1 means the cell identity.
    std::shared_ptr<Int32Setting> N_ID_0 = std::make_shared<Int32Setting>("N_ID_0");
    /// Slots as the user entered them: a number, or a range with a colon ("0:19").
    std::shared_ptr<StringSetting> SlotIndexStr = std::make_shared<StringSetting>("SlotIndexStr");
    /// First OFDM symbol.
    std::shared_ptr<Int32Setting> FirstSymbol = std::make_shared<Int32Setting>("FirstSymbol");
    /// Number of OFDM symbols.
    std::shared_ptr<Int32Setting> SymbolNumber = std::make_shared<Int32Setting>("SymbolNumber");
    /// Last OFDM symbol.
    std::shared_ptr<Int32Setting> LastSymbol = std::make_shared<Int32Setting>("LastSymbol");
    /// Name of the bandwidth part this item uses.
    std::shared_ptr<StringSetting> BWPName = std::make_shared<StringSetting>("BWPName");
    /// Index of that bandwidth part in the collection.
    std::shared_ptr<Int32Setting> BWPIndex = std::make_shared<Int32Setting>("BWPIndex");
    /// Interlaced transmission.
    std::shared_ptr<BoolSetting> InterlacedTransmission =
        std::make_shared<BoolSetting>("InterlacedTransmission");
    /// First resource block, relative to the bandwidth part.
    std::shared_ptr<Int32Setting> RBOffset = std::make_shared<Int32Setting>("RBOffset");
    /// Number of resource blocks.
    std::shared_ptr<Int32Setting> RBNumber = std::make_shared<Int32Setting>("RBNumber");
    /// RB set of an interlaced allocation.
    std::shared_ptr<Int32Setting> RBSetIndex = std::make_shared<Int32Setting>("RBSetIndex");
    /// First interlace.
    std::shared_ptr<Int32Setting> Interlace0 = std::make_shared<Int32Setting>("Interlace0");
    /// Second interlace; -1 means none.
    std::shared_ptr<Int32Setting> Interlace1 = std::make_shared<Int32Setting>("Interlace1");
    /// Switch of the scrambling.
    std::shared_ptr<BoolSetting> Scrambling = std::make_shared<BoolSetting>("Scrambling");
    /// Scheduling request state.
    std::shared_ptr<EnumSetting<::Models::Nr5g::SRConfiguration>> SRConfiguration =
        std::make_shared<EnumSetting<::Models::Nr5g::SRConfiguration>>("SRConfiguration");
    /// UCI bits, as a string of "0" and "1".
    std::shared_ptr<StringSetting> BlockOfBits = std::make_shared<StringSetting>("BlockOfBits");
    /// When false, the coding chain is bypassed.
    std::shared_ptr<BoolSetting> ChannelCoding = std::make_shared<BoolSetting>("ChannelCoding");
    /// Maximum code rate.
    std::shared_ptr<EnumSetting<::Models::Nr5g::PUCCHMaxCodeRate>> MaxCodeRate =
        std::make_shared<EnumSetting<::Models::Nr5g::PUCCHMaxCodeRate>>("MaxCodeRate");
    /// Data source of this item.
    std::shared_ptr<SubSetting<::Models::Nr5g::PayloadData>> PayloadData =
        std::make_shared<SubSetting<::Models::Nr5g::PayloadData>>("PayloadData");
    /// Number of payload bits.
    std::shared_ptr<Int32Setting> PayloadSize = std::make_shared<Int32Setting>("PayloadSize");
    /// UCI bits per slot, as text.
    std::shared_ptr<StringSetting> UCIBitsPerSlot =
        std::make_shared<StringSetting>("UCIBitsPerSlot");
    /// Group hopping is on.
    std::shared_ptr<BoolSetting> GroupHopping = std::make_shared<BoolSetting>("GroupHopping");
    /// Sequence hopping is on.
    std::shared_ptr<BoolSetting> SequenceHopping = std::make_shared<BoolSetting>("SequenceHopping");
    /// Group hopping.
    std::shared_ptr<EnumSetting<::Models::Nr5g::PUCCHGroupHopping>> PUCCHGroupHopping =
        std::make_shared<EnumSetting<::Models::Nr5g::PUCCHGroupHopping>>("PUCCHGroupHopping");
    /// Initial cyclic shift m0.
    std::shared_ptr<Int32Setting> m0 = std::make_shared<Int32Setting>("m0");
    /// Inter-slot frequency hopping.
    std::shared_ptr<BoolSetting> InterslotFrequencyHopping =
        std::make_shared<BoolSetting>("InterslotFrequencyHopping");
    /// Intra-slot frequency hopping.
    std::shared_ptr<BoolSetting> IntraslotFrequencyHopping =
        std::make_shared<BoolSetting>("IntraslotFrequencyHopping");
    /// Number of slots of a repeated PUCCH.
    std::shared_ptr<Int32Setting> NumberOfSlotsForRepetition =
        std::make_shared<Int32Setting>("NumberOfSlotsForRepetition");
    /// First resource block of the second hop.
    std::shared_ptr<Int32Setting> RBOffset2 = std::make_shared<Int32Setting>("RBOffset2");
    /// Orthogonal cover code index.
    std::shared_ptr<Int32Setting> OCCIndex = std::make_shared<Int32Setting>("OCCIndex");
    /// Orthogonal cover code length.
    std::shared_ptr<Int32Setting> OCCLength = std::make_shared<Int32Setting>("OCCLength");
    /// Pi/2 BPSK in place of QPSK.
    std::shared_ptr<BoolSetting> Pi2BPSKEnabled = std::make_shared<BoolSetting>("Pi2BPSKEnabled");
    /// Additional DM-RS.
    std::shared_ptr<BoolSetting> AdditionalDMRS = std::make_shared<BoolSetting>("AdditionalDMRS");
    /// DM-RS power boost in dB.
    std::shared_ptr<DoubleSetting> DMRSPowerBoosting =
        std::make_shared<DoubleSetting>("DMRSPowerBoosting");
    /// Release 16 DM-RS of PUCCH with pi/2 BPSK.
    std::shared_ptr<BoolSetting> DMRSuplinkTransformPrecodingPUCCH_r16 =
        std::make_shared<BoolSetting>("DMRSuplinkTransformPrecodingPUCCH_r16");
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

TESSALINE_REGISTERED_MODEL(NRUCI)

}  // namespace Models::Nr5g
