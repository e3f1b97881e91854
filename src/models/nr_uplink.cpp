#include "models/nr_uplink.h"

namespace Models::Nr5g {

NRUplink::NRUplink() : ModelBase("NRUplink") {
    init(UCI);
    init(ULSCH);
    init(BWP);
    init(SRSs);
}

}  // namespace Models::Nr5g
