#include "models/nr_prach_burst.h"

namespace Models::Nr5g {

NRPRACHBurst::NRPRACHBurst() : ModelBase("NRPRACHBurst") {
    init(Enabled)->setValue(false);
    init(PowerBoosting)->setValue(0.0);
    init(TimingOffset)->setValue(0.0);
    init(PRACHFormat)->setValue(::Models::Nr5g::PRACHFormat::Format0);
    init(PreambleIndex)->setValue(0);
    init(RootSequenceIndex)->setValue(0);
    init(SequenceNumber)->setValue(0);
    init(CyclicShiftIndex)->setValue(0);
    init(CyclicShift)->setValue(0);
    init(FrameOffset)->setValue(0);
    init(SlotIndex)->setValue(0);
    init(n_RA_t)->setValue(0);
    init(n_RA_slot)->setValue(0);
    init(n_RA_f)->setValue(0);
    init(OccasionIndex)->setValue(0);
    init(RA_RNTI)->setValue(0);
    init(t_start)->setValue(0.0);
    init(k1)->setValue(0);
    init(t_range)->setValue(0.0);
}

TESSALINE_MODEL_REGISTRATION(NRPRACHBurst)

}  // namespace Models::Nr5g
