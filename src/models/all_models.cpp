#include "models/all_models.h"

#include "framework/model_container.h"
#include "framework/text_model.h"

namespace Models::Nr5g {

namespace {

template <class T>
void registerType() {
    using namespace Orvalis::Tessaline;
    Prototype::getInstance<ModelContainer>()->add(Prototype::getInstance<T>(),
                                                  Prototype::getInstance<RuntimeType<T>>());
}

}  // namespace

bool registerModelTypes() {
    static const bool done = [] {
        registerEnumerationDisplayNames();
        registerType<LTECoexistence>();
        registerType<LTECRS>();
        registerType<NR5GWaveformSettings>();
        registerType<NRCarrier>();
        registerType<NRCarrierRT>();
        registerType<NRCORESET>();
        registerType<NRCSIRS>();
        registerType<NRDCI>();
        registerType<NRDLBWP>();
        registerType<NRDLSCH>();
        registerType<NRDownlink>();
        registerType<NRMIB>();
        registerType<NRPRACH>();
        registerType<NRPRACHBurst>();
        registerType<NRPRS>();
        registerType<NRRateMatchPattern>();
        registerType<NRResourceGrid>();
        registerType<NRSRS>();
        registerType<NRSSPBCH>();
        registerType<NRUCI>();
        registerType<NRUCIonPUSCH>();
        registerType<NRULBWP>();
        registerType<NRULSCH>();
        registerType<NRULSCH_RT>();
        registerType<NRUplink>();
        registerType<NRUplinkRT>();
        registerType<PayloadData>();
        registerType<Orvalis::Tessaline::TextModel>();
        return true;
    }();
    return done;
}

}  // namespace Models::Nr5g
