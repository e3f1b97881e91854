#include "models/nr_coreset.h"

namespace Models::Nr5g {

NRCORESET::NRCORESET() : ModelBase("NRCORESET") {
    init(ID)->setValue(0);
    init(SymbolNumber)->setValue(1);
    init(RBOffset)->setValue(-1);
    init(RBNumber)->setValue(270);
    init(FrequencyDomainBitmap)->setValue(std::string(45, '1'));
    init(CceMappingType)->setValue(::Models::Nr5g::CoresetCceMappingType::NonInterleaved);
    init(CceInterleaved)->setValue(false);
    init(RegBundleSize)->setValue(6);
    init(InterleaverSize)->setValue(2);
    init(ShiftIndex)->setValue(0);
    init(PrecoderGranularity)->setValue(::Models::Nr5g::PrecoderGranularity::REGBundleSize);
    init(PDCCHDMRSScramblingID)->setValue(0);
}

TESSALINE_MODEL_REGISTRATION(NRCORESET)

}  // namespace Models::Nr5g
