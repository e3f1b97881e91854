#include "models/all_models.h"

#include "framework/model_registration.h"
#include "framework/text_model.h"

namespace Models::Nr5g {

bool registerModelTypes() {
    static const bool done = [] {
        registerEnumerations();
        registerModelType_LTECoexistence();
        registerModelType_LTECRS();
        registerModelType_NR5GWaveformSettings();
        registerModelType_NRCarrier();
        registerModelType_NRCarrierRT();
        registerModelType_NRCORESET();
        registerModelType_NRCSIRS();
        registerModelType_NRDCI();
        registerModelType_NRDLBWP();
        registerModelType_NRDLSCH();
        registerModelType_NRDownlink();
        registerModelType_NRMIB();
        registerModelType_NRPRACH();
        registerModelType_NRPRACHBurst();
        registerModelType_NRPRS();
        registerModelType_NRRateMatchPattern();
        registerModelType_NRResourceGrid();
        registerModelType_NRSRS();
        registerModelType_NRSSPBCH();
        registerModelType_NRUCI();
        registerModelType_NRUCIonPUSCH();
        registerModelType_NRULBWP();
        registerModelType_NRULSCH();
        registerModelType_NRULSCH_RT();
        registerModelType_NRUplink();
        registerModelType_NRUplinkRT();
        registerModelType_PayloadData();
        Orvalis::Tessaline::registerModelType<Orvalis::Tessaline::TextModel>();
        return true;
    }();
    return done;
}

}  // namespace Models::Nr5g
