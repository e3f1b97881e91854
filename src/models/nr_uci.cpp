#include "models/nr_uci.h"

namespace Models::Nr5g {

NRUCI::NRUCI() : ModelBase("NRUCI") {
    init(Name)->setValue(std::string{"UCI1"});
    init(Enabled)->setValue(true);
    init(PUCCHFormat)->setValue(::Models::Nr5g::PUCCHFormat::Format0);
    init(n_ID)->setValue(0);
    init(HoppingID)->setValue(0);
    init(n_RNTI)->setValue(0);
    init(N_ID_0)->setValue(-1);
    init(SlotIndexStr)->setValue(std::string{"0"});
    init(FirstSymbol)->setValue(13);
    init(SymbolNumber)->setValue(1);
    init(LastSymbol)->setValue(13);
    init(BWPName)->setValue(std::string{"BWP1"});
    init(BWPIndex)->setValue(0);
    init(InterlacedTransmission)->setValue(false);
    init(RBOffset)->setValue(0);
    init(RBNumber)->setValue(1);
    init(RBSetIndex)->setValue(0);
    init(Interlace0)->setValue(0);
    init(Interlace1)->setValue(-1);
    init(Scrambling)->setValue(true);
    init(SRConfiguration)->setValue(::Models::Nr5g::SRConfiguration::Negative);
    init(BlockOfBits)->setValue(std::string{"0"});
    init(ChannelCoding)->setValue(true);
    init(MaxCodeRate)->setValue(::Models::Nr5g::PUCCHMaxCodeRate::CodeRate008);
    init(PayloadData);
    init(PayloadSize)->setValue(1);
    init(UCIBitsPerSlot)->setValue(std::string{});
    init(GroupHopping)->setValue(false);
    init(SequenceHopping)->setValue(false);
    init(PUCCHGroupHopping)->setValue(::Models::Nr5g::PUCCHGroupHopping::Neither);
    init(m0)->setValue(0);
    init(InterslotFrequencyHopping)->setValue(false);
    init(IntraslotFrequencyHopping)->setValue(false);
    init(NumberOfSlotsForRepetition)->setValue(1);
    init(RBOffset2)->setValue(0);
    init(OCCIndex)->setValue(0);
    init(OCCLength)->setValue(2);
    init(Pi2BPSKEnabled)->setValue(false);
    init(AdditionalDMRS)->setValue(false);
    init(DMRSPowerBoosting)->setValue(0.0);
    init(DMRSuplinkTransformPrecodingPUCCH_r16)->setValue(false);
    init(SlotIndexArrayStr)->setValue(std::string{});
    init(PowerBoosting)->setValue(0.0);
    init(AntennaPort)->setValue(2000);
    init(AntennaPortArray)->setValue(std::string{"2000"});
    init(Conflict)->setValue(false);
    init(Valid)->setValue(false);
}

TESSALINE_MODEL_REGISTRATION(NRUCI)

}  // namespace Models::Nr5g
