#include "models/nr_resource_grid.h"

namespace Models::Nr5g {

NRResourceGrid::NRResourceGrid() : ModelBase("NRResourceGrid") {
    init(Enabled)->setValue(false);
    init(Mu)->setValue(0);
    init(N_grid_start)->setValue(0);
    init(N_grid_size)->setValue(0);
    init(k0)->setValue(0);
    init(RefA)->setValue(0.0);
    init(N_RB_low)->setValue(0.0);
}

TESSALINE_MODEL_REGISTRATION(NRResourceGrid)

}  // namespace Models::Nr5g
