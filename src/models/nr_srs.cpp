#include "models/nr_srs.h"

namespace Models::Nr5g {

NRSRS::NRSRS() : ModelBase("NRSRS") {
    init(Name)->setValue(std::string{});
    init(Enabled)->setValue(true);
    init(AntennaPortsGenerated)->setValue(std::string{"p0"});
    init(NumberOfAntennaPorts)->setValue(1);
    init(Numerology)->setValue(::Models::Nr5g::Numerology::SCS15k);
    init(SRSForPositioning)->setValue(false);
    init(SlotIndexStr)->setValue(std::string{"0"});
    init(SymbolStart)->setValue(8);
    init(StartPosition)->setValue(5);
    init(N_symb_SRS)->setValue(1);
    init(R)->setValue(1);
    init(Periodicity)->setValue(0);
    init(SlotOffset)->setValue(0);
    init(BWPName)->setValue(std::string{"BWP1"});
    init(BWPIndex)->setValue(0);
    init(K_TC)->setValue(2);
    init(k_TC)->setValue(0);
    init(B_SRS)->setValue(0);
    init(C_SRS)->setValue(0);
    init(b_hop)->setValue(0);
    init(n_shift)->setValue(0);
    init(n_RRC)->setValue(0);
    init(GroupSequenceHopping)->setValue(0);
    init(n_SRS_cs)->setValue(0);
    init(n_ID_SRS)->setValue(0);
    init(delta_ss)->setValue(0);
    init(SlotIndexArrayStr)->setValue(std::string{});
    init(PowerBoosting)->setValue(0.0);
    init(AntennaPort)->setValue(1000);
    init(AntennaPortArray)->setValue(std::string{"1000"});
    init(Conflict)->setValue(false);
    init(Valid)->setValue(false);
}

TESSALINE_MODEL_REGISTRATION(NRSRS)

}  // namespace Models::Nr5g
