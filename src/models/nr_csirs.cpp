#include "models/nr_csirs.h"

namespace Models::Nr5g {

NRCSIRS::NRCSIRS() : ModelBase("NRCSIRS") {
    init(Name)->setValue(std::string{"CSI-RS1"});
    init(Enabled)->setValue(true);
    init(AntennaPortsGenerated)->setValue(std::string{"p0"});
    init(n_ID)->setValue(0);
    init(ZeroPower)->setValue(false);
    init(SlotIndexStr)->setValue(std::string{"2"});
    init(BWPName)->setValue(std::string{"BWP1"});
    init(BWPIndex)->setValue(1);
    init(RBOffset)->setValue(0);
    init(RBNumber)->setValue(272);
    init(FirstSymbol)->setValue(12);
    init(FirstSymbol2)->setValue(12);
    init(FrequencyDomainBitmap)->setValue(std::string{"000000000001"});
    init(RowIndex)->setValue(4);
    init(NumberOfAntennaPorts)->setValue(4);
    init(Density)->setValue(::Models::Nr5g::CSIRSDensity::One);
    init(PRBAllocation)->setValue(::Models::Nr5g::PRBAllocation::EvenPRBs);
    init(CDMType)->setValue(std::string{"FD-CDM2"});
    init(REUsedForPDSCH)->setValue(true);
    init(SlotIndexArrayStr)->setValue(std::string{});
    init(PowerBoosting)->setValue(0.0);
    init(AntennaPort)->setValue(3000);
    init(AntennaPortArray)->setValue(std::string{"3000"});
    init(Conflict)->setValue(false);
    init(Valid)->setValue(false);
}

TESSALINE_MODEL_REGISTRATION(NRCSIRS)

}  // namespace Models::Nr5g
