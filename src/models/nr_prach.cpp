#include "models/nr_prach.h"

namespace Models::Nr5g {

NRPRACH::NRPRACH() : ModelBase("NRPRACH") {
    init(Enabled)->setValue(false);
    init(Name)->setValue(std::string{});
    init(PowerBoosting)->setValue(0.0);
    init(PRACHFormat)->setValue(::Models::Nr5g::PRACHFormat::Format0);
    init(SCS)->setValue(::Models::Nr5g::PRACHSubcarrierSpacing::SCS1250);
    init(SCSPUSCH)->setValue(::Models::Nr5g::SubcarrierSpacing::SCS30k);
    init(BWP);
    init(CyclicShiftIndex)->setValue(1);
    init(RootIndex)->setValue(1);
    init(PRACHRootSequenceIndex)->setValue(0);
    init(RestrictedSetConfig)->setValue(::Models::Nr5g::PRACHRestrictedSetConfig::UnrestrictedSet);
    init(ZeroCorrelationZoneConfig)->setValue(0);
    init(LRA)->setValue(0);
    init(NCS)->setValue(0);
    init(Msg1FrequencyStart)->setValue(0);
    init(OccasionIndex)->setValue(0);
    init(k1)->setValue(0);
    init(t_start)->setValue(0.0);
    init(SubframeIndex)->setValue(0);
    init(ConfigurationTable)->setValue(::Models::Nr5g::PRACHConfigurationTable::FR1_PairedSpectrum);
    init(ConfigurationIndex)->setValue(16);
    init(FramePeriod)->setValue(1);
    init(FrameOffsetStr)->setValue(std::string{"0"});
    init(SlotIndexStr)->setValue(std::string{"0"});
    init(SymbolStart)->setValue(0);
    init(NPRACHSlots)->setValue(-1);
    init(NPRACHOccasionsPerSlot)->setValue(-1);
    init(PRACHDuration)->setValue(0);
    init(Msg1FDM)->setValue(1);
    init(Bursts);
    init(PreambleIndexMap)->setValue(std::string{});
    init(AntennaPort)->setValue(4000);
    init(AntennaPortArray)->setValue(std::string{"4000"});
    init(Conflict)->setValue(false);
    init(Valid)->setValue(false);
}

TESSALINE_MODEL_REGISTRATION(NRPRACH)

}  // namespace Models::Nr5g
