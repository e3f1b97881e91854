#include "models/lte_coexistence.h"

namespace Models::Nr5g {

LTECoexistence::LTECoexistence() : ModelBase("LTECoexistence") {
    init(Name)->setValue(std::string{"LTE Coexistence"});
    init(Enabled)->setValue(false);
    init(NumberOfLTECRS)->setValue(1);
    init(LTECRS);
    init(AdditionalDMRS_DL_Alt)->setValue(false);
    init(Conflict)->setValue(false);
    init(Valid)->setValue(false);
}

TESSALINE_MODEL_REGISTRATION(LTECoexistence)

}  // namespace Models::Nr5g
