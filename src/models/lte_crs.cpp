#include "models/lte_crs.h"

namespace Models::Nr5g {

LTECRS::LTECRS() : ModelBase("LTECRS") {
    init(LTEBandwidth)->setValue(::Models::Nr5g::LTEBandwidth::BW5M_25RB);
    init(OffsetToPointA)->setValue(0);
    init(OffsetToNR)->setValue(0);
    init(MBSFNSubframeIndexStr)->setValue(std::string{});
    init(MBSFNSubframeIndexArrayStr)->setValue(std::string{});
    init(NumberOfCRSAntennaPorts)->setValue(1);
    init(VShift)->setValue(0);
}

TESSALINE_MODEL_REGISTRATION(LTECRS)

}  // namespace Models::Nr5g
