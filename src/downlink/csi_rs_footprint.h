#pragma once
// What the PDSCH rate matching needs to know of one CSI-RS resource: where it sits in time and
// frequency and which resource elements of a resource block it takes. A CSI-RS generator
// publishes one of these; the PDSCH reads it per slot and never changes it.

#include <array>
#include <vector>

namespace Orvalis_NR {

struct CsiRsFootprint {
    /// The CSI-RS punctures the data instead of being rate-matched around.
    bool ReUsedForPdsch = false;
    int Mu = 0;              ///< mu of the CSI-RS bandwidth part
    int FirstRb = 0;         ///< first RB, relative to the PDSCH's bandwidth part
    int RbCount = 0;         ///< RBs of the resource
    int PrbStep = 1;         ///< 2 for density 0.5, else 1
    int OddPrbs = 0;         ///< n mod PrbStep of the RBs that carry it
    std::vector<int> SlotList;    ///< the resource's slot list, absolute slot numbers
    std::vector<int> CsiSymbols;  ///< symbols within the slot
    std::array<int, 12> ReWeights{};  ///< 1 for each subcarrier of an RB it takes
};

}  // namespace Orvalis_NR
