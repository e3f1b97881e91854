#include "models/nr_uplink.h"

namespace Models::Nr5g {

NRUplink::NRUplink() : ModelBase("NRUplink") {
    init(UCI);
    init(ULSCH);
    init(BWP);
    init(SRSs);
}

TESSALINE_MODEL_REGISTRATION(NRUplink)

}  // namespace Models::Nr5g
