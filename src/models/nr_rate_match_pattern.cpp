#include "models/nr_rate_match_pattern.h"

namespace Models::Nr5g {

NRRateMatchPattern::NRRateMatchPattern() : ModelBase("NRRateMatchPattern") {
    init(Enabled)->setValue(true);
    init(Level)->setValue(::Models::Nr5g::RateMatchPatternLevel::BWP);
    init(SubcarrierSpacing)->setValue(::Models::Nr5g::SubcarrierSpacing::SCS30k);
    init(RBBitmap)->setValue(std::string(273, '1'));
    init(SymbolBitmapSpan)->setValue(::Models::Nr5g::SymbolBitmapSpan::OneSlot);
    init(SymbolBitmap)->setValue(std::string{"00000000000000"});
    init(Periodicity)->setValue(1);
    init(PeriodicityPatternBitmap)->setValue(std::string{"1"});
}

TESSALINE_MODEL_REGISTRATION(NRRateMatchPattern)

}  // namespace Models::Nr5g
