#include "models/nr_ul_bwp.h"

namespace Models::Nr5g {

NRULBWP::NRULBWP() : ModelBase("NRULBWP") {
    init(ID)->setValue(99);
    init(Name)->setValue(std::string{"BWP1"});
    init(Numerology)->setValue(::Models::Nr5g::Numerology::SCS30k);
    init(Mu)->setValue(0);
    init(CPType)->setValue(::Models::Nr5g::CyclicPrefixType::Normal);
    init(RBOffset)->setValue(0);
    init(RBNumber)->setValue(273);
    init(Valid)->setValue(false);
}

TESSALINE_MODEL_REGISTRATION(NRULBWP)

}  // namespace Models::Nr5g
