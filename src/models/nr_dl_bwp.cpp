#include "models/nr_dl_bwp.h"

namespace Models::Nr5g {

NRDLBWP::NRDLBWP() : ModelBase("NRDLBWP") {
    init(InitialDLBWP)->setValue(false);
    init(AutoConfiguration)->setValue(false);
    init(MinimumChannelBandwidth)->setValue(::Models::Nr5g::MinimumChannelBandwidth::_5or10MHz);
    init(SharedSpectrumChannelAccess)->setValue(false);
    init(NumberOfCoreset)->setValue(1);
    init(Coreset0);
    init(Coreset1);
    init(Coreset2);
    init(ID)->setValue(99);
    init(Name)->setValue(std::string{"BWP1"});
    init(Numerology)->setValue(::Models::Nr5g::Numerology::SCS30k);
    init(Mu)->setValue(0);
    init(CPType)->setValue(::Models::Nr5g::CyclicPrefixType::Normal);
    init(RBOffset)->setValue(0);
    init(RBNumber)->setValue(273);
    init(Valid)->setValue(false);
}

TESSALINE_MODEL_REGISTRATION(NRDLBWP)

}  // namespace Models::Nr5g
