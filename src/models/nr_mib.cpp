#include "models/nr_mib.h"

namespace Models::Nr5g {

NRMIB::NRMIB() : ModelBase("NRMIB") {
    init(SubcarrierSpacingCommon)->setValue(::Models::Nr5g::SubcarrierSpacing::SCS30k);
    init(SsbSubcarrierOffset)->setValue(0);
    init(DmrstypeApos)->setValue(2);
    init(PdcchConfigSIB1)->setValue(0);
    init(CellBarred)->setValue(::Models::Nr5g::CellBarred::barred);
    init(IntraFreqReselection)->setValue(::Models::Nr5g::IntraFreqReselection::allowed);
}

TESSALINE_MODEL_REGISTRATION(NRMIB)

}  // namespace Models::Nr5g
