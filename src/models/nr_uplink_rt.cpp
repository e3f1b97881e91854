#include "models/nr_uplink_rt.h"

namespace Models::Nr5g {

NRUplinkRT::NRUplinkRT() : ModelBase("NRUplinkRT") {
    init(ULSCHRT);
    init(UCI);
    init(ULSCH);
    init(BWP);
    init(SRSs);
    init(SRS);
}

TESSALINE_MODEL_REGISTRATION(NRUplinkRT)

}  // namespace Models::Nr5g
