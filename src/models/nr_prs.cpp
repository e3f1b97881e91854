#include "models/nr_prs.h"

namespace Models::Nr5g {

NRPRS::NRPRS() : ModelBase("NRPRS") {
    init(Name)->setValue(std::string{"PRS1"});
    init(Enabled)->setValue(false);
    init(SubcarrierSpacing)->setValue(::Models::Nr5g::SubcarrierSpacing::SCS30k);
    init(CyclicPrefix)->setValue(::Models::Nr5g::CyclicPrefixType::Normal);
    init(PointA)->setValue(0);
    init(FrequencyOffsetOfPointA)->setValue(-49140000.0);
    init(ResourceBandwidth)->setValue(272);
    init(StartPRB)->setValue(0);
    init(CombSizeN)->setValue(2);
    init(Periodicity)->setValue(10);
    init(ResourceSetSlotOffset)->setValue(0);
    init(ResourceRepetitionFactor)->setValue(1);
    init(ResourceTimeGap)->setValue(1);
    init(MutingPattern1)->setValue(std::string{});
    init(MutingBitRepetitionFactor)->setValue(1);
    init(MutingPattern2)->setValue(std::string{});
    init(SequenceId)->setValue(0);
    init(ReOffset)->setValue(0);
    init(ResourceSlotOffset)->setValue(0);
    init(ResourceSymbolOffset)->setValue(0);
    init(NumSymbols)->setValue(2);
    init(SlotIndexArrayStr)->setValue(std::string{});
    init(PowerBoosting)->setValue(0.0);
    init(Conflict)->setValue(false);
    init(Valid)->setValue(false);
}

TESSALINE_MODEL_REGISTRATION(NRPRS)

}  // namespace Models::Nr5g
