#include "models/nr_dci.h"

namespace Models::Nr5g {

NRDCI::NRDCI() : ModelBase("NRDCI") {
    init(Name)->setValue(std::string{"DCI1"});
    init(Enabled)->setValue(true);
    init(DMRSPowerBoosting)->setValue(0.0);
    init(Scrambling)->setValue(true);
    init(PDCCHDMRSScramblingID)->setValue(-1);
    init(RNTI)->setValue(0);
    init(CRNTI)->setValue(0);
    init(DMRSMappingReference)->setValue(::Models::Nr5g::DMRSMappingReference::CRB0);
    init(BWPName)->setValue(std::string{"BWP1"});
    init(BWPIndex)->setValue(1);
    init(CoresetIndex)->setValue(0);
    init(CoresetID)->setValue(0);
    init(CoresetSelection)->setValue(std::string{"BWP1_CORESET1"});
    init(SlotIndexStr)->setValue(std::string{"0"});
    init(FirstSymbol)->setValue(0);
    init(SearchSpace)->setValue(::Models::Nr5g::PDCCHSearchSpace::UESpecific);
    init(AggregationLevel)->setValue(4);
    init(NumberOfCandidates)->setValue(4);
    init(CandidateIndex)->setValue(0);
    init(CCEOffset)->setValue(0);
    init(CCEOffsetStr)->setValue(std::string{});
    init(NumberOfCCE)->setValue(4);
    init(ChannelCoding)->setValue(true);
    init(PayloadData);
    init(PayloadSize)->setValue(20);
    init(AutoDCI)->setValue(false);
    init(DCIFormat)->setValue(::Models::Nr5g::DCIFormat::Format1_0);
    init(RNTIType)->setValue(::Models::Nr5g::RNTIType::C_RNTI);
    init(DLSCHCoupling)->setValue(std::string{});
    init(DCIBits)->setValue(std::string{});
    init(DCIBitsLength)->setValue(20);
    init(SlotIndexArrayStr)->setValue(std::string{});
    init(PowerBoosting)->setValue(0.0);
    init(AntennaPort)->setValue(2000);
    init(AntennaPortArray)->setValue(std::string{"2000"});
    init(Conflict)->setValue(false);
    init(Valid)->setValue(false);
}

TESSALINE_MODEL_REGISTRATION(NRDCI)

}  // namespace Models::Nr5g
