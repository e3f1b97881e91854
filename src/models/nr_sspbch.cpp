#include "models/nr_sspbch.h"

namespace Models::Nr5g {

NRSSPBCH::NRSSPBCH() : ModelBase("NRSSPBCH") {
    init(Name)->setValue(std::string{"SS/PBCH"});
    init(PowerBoosting)->setValue(0.0);
    init(Enabled)->setValue(false);
    init(Mu)->setValue(0);
    init(Numerology)->setValue(::Models::Nr5g::Numerology::SCS30k);
    init(SSB30KSymbolIndex)->setValue(::Models::Nr5g::SSB30KSymbolIndex::Option0);
    init(SSBlockPattern)->setValue(::Models::Nr5g::SSBlockPattern::CaseB);
    init(SSBPeriod)->setValue(::Models::Nr5g::SSBPeriod::OneFrame);
    init(HalfFrameIndex)->setValue(0);
    init(Lmax)->setValue(4);
    init(SSBActiveIndex)->setValue(std::string{"0:3"});
    init(PowerBoostingStr)->setValue(std::string{});
    init(PowerLevelStr)->setValue(std::string{});
    init(PSSPowerBoosting)->setValue(0.0);
    init(RBOffset)->setValue(253);
    init(k0)->setValue(0);
    init(FrequencyOffset)->setValue(0);
    init(DeltaFrequency)->setValue(0.0);
    init(ChannelCoding)->setValue(true);
    init(ScramblingBeforeChannelCoding)->setValue(true);
    init(ScramblingAfterChannelCoding)->setValue(true);
    init(AutoMIB)->setValue(true);
    init(PayloadData);
    init(PayloadDataLength)->setValue(24);
    init(SFNStart)->setValue(0);
    init(MIB);
    init(AntennaPort)->setValue(4000);
    init(AntennaPortArray)->setValue(std::string{"4000"});
    init(Conflict)->setValue(false);
    init(Valid)->setValue(false);
}

TESSALINE_MODEL_REGISTRATION(NRSSPBCH)

}  // namespace Models::Nr5g
