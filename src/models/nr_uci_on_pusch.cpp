#include "models/nr_uci_on_pusch.h"

namespace Models::Nr5g {

NRUCIonPUSCH::NRUCIonPUSCH() : ModelBase("NRUCIonPUSCH") {
    init(Enabled)->setValue(false);
    init(PayloadData);
    init(PayloadSize)->setValue(10);
    init(BetaOffsetIndex)->setValue(0);
}

TESSALINE_MODEL_REGISTRATION(NRUCIonPUSCH)

}  // namespace Models::Nr5g
