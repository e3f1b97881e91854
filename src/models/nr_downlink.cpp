#include "models/nr_downlink.h"

namespace Models::Nr5g {

NRDownlink::NRDownlink() : ModelBase("NRDownlink") {
    init(SSPBCH);
    init(DCI);
    init(DLSCH);
    init(CSIRS);
    init(BWP);
    init(LTECoexistence);
    init(PRS);
}

TESSALINE_MODEL_REGISTRATION(NRDownlink)

}  // namespace Models::Nr5g
