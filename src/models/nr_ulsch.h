#pragma once
// Settings model NRULSCH.

#include <memory>
#include <string>

#include "framework/enum_setting.h"
#include "framework/model_base.h"
#include "framework/model_registration.h"
#include "framework/sub_setting.h"
#include "framework/value_setting.h"
#include "models/enums.h"
#include "models/nr_uci_on_pusch.h"
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

class NRULSCH : public ModelBase {
    TESSALINE_MODEL_TYPE(NRULSCH)
  public:
    NRULSCH();
    NRULSCH(const NRULSCH&) = default;
    /// Shares every setting object of `other`: a change through one model shows through both.
    NRULSCH& operator=(const NRULSCH& other);

    /// Display name, by which other settings refer to this item.
    std::shared_ptr<StringSetting> Name = std::make_shared<StringSetting>("Name");
    /// DM-RS port numbers as a comma list of integers.
    std::shared_ptr<StringSetting> DMRSports = std::make_shared<StringSetting>("DMRSports");
    /// Antenna port set as text.
    std::shared_ptr<StringSetting> AntennaPortSet =
        std::make_shared<StringSetting>("AntennaPortSet");
    /// Number of antenna ports.
    std::shared_ptr<Int32Setting> NumberOfAntennaPorts =
        std::make_shared<Int32Setting>("NumberOfAntennaPorts");
    /// Number of layers.
    std::shared_ptr<Int32Setting> NumberOfLayers = std::make_shared<Int32Setting>("NumberOfLayers");
    /// Ports generated, in the form "p0".
    std::shared_ptr<StringSetting> AntennaPortsGenerated =
        std::make_shared<StringSetting>("AntennaPortsGenerated");
    /// Number of DM-RS CDM groups without data.
    std::shared_ptr<Int32Setting> NumberOfDMRSCDMGroup =
        std::make_shared<Int32Setting>("NumberOfDMRSCDMGroup");
    /// Codebook-based transmission.
    std::shared_ptr<BoolSetting> CodebookBasedTransmission =
        std::make_shared<BoolSetting>("CodebookBasedTransmission");
    /// TPMI index.
    std::shared_ptr<Int32Setting> TPMIIndex = std::make_shared<Int32Setting>("TPMIIndex");
    /// Switch of the scrambling.
    std::shared_ptr<BoolSetting> Scrambling = std::make_shared<BoolSetting>("Scrambling");
    /// Transform precoding is on.
    std::shared_ptr<BoolSetting> TransformPrecoding =
        std::make_shared<BoolSetting>("TransformPrecoding");
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
    /// First resource block, relative to the bandwidth part.
    std::shared_ptr<Int32Setting> RBOffset = std::make_shared<Int32Setting>("RBOffset");
    /// Restrict the number of resource blocks to the transform-precoding sizes.
    std::shared_ptr<BoolSetting> RBNumberRestriction =
        std::make_shared<BoolSetting>("RBNumberRestriction");
    /// Number of resource blocks.
    std::shared_ptr<Int32Setting> RBNumber = std::make_shared<Int32Setting>("RBNumber");
    /// Resource allocation type.
    std::shared_ptr<EnumSetting<::Models::Nr5g::RAType>> RAType =
        std::make_shared<EnumSetting<::Models::Nr5g::RAType>>("RAType");
    /// Size of a resource block group.
    std::shared_ptr<Int32Setting> RBGSize = std::make_shared<Int32Setting>("RBGSize");
    /// Allocation bitmap for `RAType0`, as a string of "0" and "1".
    std::shared_ptr<StringSetting> RBGBitmap = std::make_shared<StringSetting>("RBGBitmap");
    /// First RB set of an interlaced allocation.
    std::shared_ptr<Int32Setting> RBSetStart = std::make_shared<Int32Setting>("RBSetStart");
    /// Number of RB sets.
    std::shared_ptr<Int32Setting> RBSetNumber = std::make_shared<Int32Setting>("RBSetNumber");
    /// Interlace indices, as text.
    std::shared_ptr<StringSetting> InterlaceIndexStr =
        std::make_shared<StringSetting>("InterlaceIndexStr");
    /// Frequency hopping.
    std::shared_ptr<EnumSetting<::Models::Nr5g::FrequencyHoppingMode>> FrequencyHoppingMode =
        std::make_shared<EnumSetting<::Models::Nr5g::FrequencyHoppingMode>>("FrequencyHoppingMode");
    /// Offset of the second hop in resource blocks.
    std::shared_ptr<Int32Setting> RBOffsetFreqHop =
        std::make_shared<Int32Setting>("RBOffsetFreqHop");
    /// When false, the coding chain is bypassed.
    std::shared_ptr<BoolSetting> ChannelCoding = std::make_shared<BoolSetting>("ChannelCoding");
    /// This item is an initial transmission.
    std::shared_ptr<BoolSetting> IsInitTrans = std::make_shared<BoolSetting>("IsInitTrans");
    /// New data indicator.
    std::shared_ptr<Int32Setting> NewDataIndicator =
        std::make_shared<Int32Setting>("NewDataIndicator");
    /// Name of the item that holds the initial transmission of a retransmission.
    std::shared_ptr<StringSetting> InitTransName = std::make_shared<StringSetting>("InitTransName");
    /// Redundancy version.
    std::shared_ptr<Int32Setting> RVIndex = std::make_shared<Int32Setting>("RVIndex");
    /// HARQ process number.
    std::shared_ptr<Int32Setting> HARQProcessNumber =
        std::make_shared<Int32Setting>("HARQProcessNumber");
    /// Code block group transmission is on.
    std::shared_ptr<BoolSetting> CBGTransmission = std::make_shared<BoolSetting>("CBGTransmission");
    /// Maximum number of code block groups per transport block.
    std::shared_ptr<Int32Setting> MaxCBGsPerTB = std::make_shared<Int32Setting>("MaxCBGsPerTB");
    /// Code block group transmission information, as a string of "0" and "1".
    std::shared_ptr<StringSetting> CBGTI = std::make_shared<StringSetting>("CBGTI");
    /// Error flags as a string of "0" and "1": a set flag makes the CRC of that block fail on
    /// purpose.
    std::shared_ptr<StringSetting> CRCErrorFlag = std::make_shared<StringSetting>("CRCErrorFlag");
    /// MCS index.
    std::shared_ptr<Int32Setting> MCS = std::make_shared<Int32Setting>("MCS");
    /// MCS table.
    std::shared_ptr<EnumSetting<::Models::Nr5g::ULSCHMCSTable>> MCSTable =
        std::make_shared<EnumSetting<::Models::Nr5g::ULSCHMCSTable>>("MCSTable");
    /// xOverhead of the transport block size calculation.
    std::shared_ptr<Int32Setting> XOverhead = std::make_shared<Int32Setting>("XOverhead");
    /// Code rate.
    std::shared_ptr<DoubleSetting> CodingRate = std::make_shared<DoubleSetting>("CodingRate");
    /// Modulation.
    std::shared_ptr<EnumSetting<::Models::Nr5g::ModulationType>> Modulation =
        std::make_shared<EnumSetting<::Models::Nr5g::ModulationType>>("Modulation");
    /// Transport block size in bits.
    std::shared_ptr<Int32Setting> TransportBlockSize =
        std::make_shared<Int32Setting>("TransportBlockSize");
    /// LDPC base graph.
    std::shared_ptr<Int32Setting> BaseGraph = std::make_shared<Int32Setting>("BaseGraph");
    /// Limited buffer rate matching.
    std::shared_ptr<BoolSetting> LBRM = std::make_shared<BoolSetting>("LBRM");
    /// Data source of this item.
    std::shared_ptr<SubSetting<::Models::Nr5g::PayloadData>> PayloadData =
        std::make_shared<SubSetting<::Models::Nr5g::PayloadData>>("PayloadData");
    /// Release 16 DM-RS of the uplink.
    std::shared_ptr<BoolSetting> DMRSuplink_r16 = std::make_shared<BoolSetting>("DMRSuplink_r16");
    /// Release 16 DM-RS with transform precoding.
    std::shared_ptr<BoolSetting> DMRSuplinkTransformPrecoding_r16 =
        std::make_shared<BoolSetting>("DMRSuplinkTransformPrecoding_r16");
    /// DM-RS power boost in dB.
    std::shared_ptr<DoubleSetting> DMRSPowerBoosting =
        std::make_shared<DoubleSetting>("DMRSPowerBoosting");
    /// DM-RS configuration type.
    std::shared_ptr<EnumSetting<::Models::Nr5g::DMRSConfigurationType>> DMRSConfigurationType =
        std::make_shared<EnumSetting<::Models::Nr5g::DMRSConfigurationType>>(
            "DMRSConfigurationType");
    /// DM-RS duration.
    std::shared_ptr<EnumSetting<::Models::Nr5g::DMRSDuration>> DMRSDuration =
        std::make_shared<EnumSetting<::Models::Nr5g::DMRSDuration>>("DMRSDuration");
    /// Additional DM-RS positions.
    std::shared_ptr<Int32Setting> DMRSaddpos = std::make_shared<Int32Setting>("DMRSaddpos");
    /// PUSCH mapping type.
    std::shared_ptr<EnumSetting<::Models::Nr5g::PUSCHMappingType>> PUSCHMappingType =
        std::make_shared<EnumSetting<::Models::Nr5g::PUSCHMappingType>>("PUSCHMappingType");
    /// Position of the first DM-RS symbol in type A mapping.
    std::shared_ptr<Int32Setting> DMRStypeApos = std::make_shared<Int32Setting>("DMRStypeApos");
    /// n_SCID of the DM-RS sequence.
    std::shared_ptr<Int32Setting> n_SCID = std::make_shared<Int32Setting>("n_SCID");
    /// Selected DM-RS scrambling identity; -1 means the cell identity.
    std::shared_ptr<Int32Setting> N_ID_nSCID = std::make_shared<Int32Setting>("N_ID_nSCID");
    /// DM-RS scrambling identity 0; -1 means the cell identity.
    std::shared_ptr<Int32Setting> N_ID_0 = std::make_shared<Int32Setting>("N_ID_0");
    /// DM-RS scrambling identity 1; -1 means the cell identity.
    std::shared_ptr<Int32Setting> N_ID_1 = std::make_shared<Int32Setting>("N_ID_1");
    /// Data scrambling identity; -1 means the cell identity.
    std::shared_ptr<Int32Setting> n_ID = std::make_shared<Int32Setting>("n_ID");
    /// n_RAPID of a Msg3 scrambling; -1 means none.
    std::shared_ptr<Int32Setting> n_RAPID = std::make_shared<Int32Setting>("n_RAPID");
    /// Identity of the DM-RS with transform precoding; -1 means the cell identity.
    std::shared_ptr<Int32Setting> n_ID_RS = std::make_shared<Int32Setting>("n_ID_RS");
    /// RNTI.
    std::shared_ptr<Int32Setting> RNTI = std::make_shared<Int32Setting>("RNTI");
    /// PT-RS is on.
    std::shared_ptr<BoolSetting> PTRSEnabled = std::make_shared<BoolSetting>("PTRSEnabled");
    /// PT-RS power boost in dB.
    std::shared_ptr<DoubleSetting> PTRSPowerBoosting =
        std::make_shared<DoubleSetting>("PTRSPowerBoosting");
    /// PT-RS ports as a comma list of integers.
    std::shared_ptr<StringSetting> PTRSports = std::make_shared<StringSetting>("PTRSports");
    /// Frequency density of the PT-RS.
    std::shared_ptr<Int32Setting> K_PTRS = std::make_shared<Int32Setting>("K_PTRS");
    /// Time density of the PT-RS.
    std::shared_ptr<Int32Setting> L_PTRS = std::make_shared<Int32Setting>("L_PTRS");
    /// PT-RS resource element offset.
    std::shared_ptr<EnumSetting<::Models::Nr5g::PTRSREOffset>> PTRSREOffset =
        std::make_shared<EnumSetting<::Models::Nr5g::PTRSREOffset>>("PTRSREOffset");
    /// Samples per PT-RS group.
    std::shared_ptr<Int32Setting> N_samp_group = std::make_shared<Int32Setting>("N_samp_group");
    /// Number of PT-RS groups.
    std::shared_ptr<Int32Setting> N_group_PTRS = std::make_shared<Int32Setting>("N_group_PTRS");
    /// Sequence identity under transform precoding; -1 means the cell identity.
    std::shared_ptr<Int32Setting> N_ID = std::make_shared<Int32Setting>("N_ID");
    /// Group hopping is on.
    std::shared_ptr<BoolSetting> GroupHopping = std::make_shared<BoolSetting>("GroupHopping");
    /// Sequence hopping is on.
    std::shared_ptr<BoolSetting> SequenceHopping = std::make_shared<BoolSetting>("SequenceHopping");
    /// UL-SCH data is present; when false only UCI rides on the PUSCH.
    std::shared_ptr<BoolSetting> ULSCHEnabled = std::make_shared<BoolSetting>("ULSCHEnabled");
    /// Scaling factor alpha of UCI on PUSCH.
    std::shared_ptr<DoubleSetting> UciOnPuschScaling =
        std::make_shared<DoubleSetting>("UciOnPuschScaling");
    /// HARQ-ACK part of UCI on PUSCH.
    std::shared_ptr<SubSetting<::Models::Nr5g::NRUCIonPUSCH>> HARQACK =
        std::make_shared<SubSetting<::Models::Nr5g::NRUCIonPUSCH>>("HARQACK");
    /// CSI part 1.
    std::shared_ptr<SubSetting<::Models::Nr5g::NRUCIonPUSCH>> CSI1 =
        std::make_shared<SubSetting<::Models::Nr5g::NRUCIonPUSCH>>("CSI1");
    /// CSI part 2.
    std::shared_ptr<SubSetting<::Models::Nr5g::NRUCIonPUSCH>> CSI2 =
        std::make_shared<SubSetting<::Models::Nr5g::NRUCIonPUSCH>>("CSI2");
    /// CG-UCI part.
    std::shared_ptr<SubSetting<::Models::Nr5g::NRUCIonPUSCH>> CGUCI =
        std::make_shared<SubSetting<::Models::Nr5g::NRUCIonPUSCH>>("CGUCI");
    /// The same slots as the comma list of absolute slot numbers, expanded by the host. This is the
    /// form the generators parse.
    std::shared_ptr<StringSetting> SlotIndexArrayStr =
        std::make_shared<StringSetting>("SlotIndexArrayStr");
    /// The item takes part in the generation.
    std::shared_ptr<BoolSetting> Enabled = std::make_shared<BoolSetting>("Enabled");
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

TESSALINE_REGISTERED_MODEL(NRULSCH)

}  // namespace Models::Nr5g
