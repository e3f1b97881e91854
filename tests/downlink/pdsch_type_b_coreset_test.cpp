// Mapping type B next to a CORESET (TS 38.211 clause 7.4.1.1.2): when the front-loaded DM-RS
// would fall in the symbols of a CORESET that shares RBs with the PDSCH, it moves to the first
// symbol after the CORESET; a CORESET in other symbols or other RBs leaves it at the PDSCH's
// first symbol.

#include <gtest/gtest.h>

#include <memory>
#include <ostream>
#include <string>
#include <vector>

#include "downlink/pdcch_generator.h"
#include "downlink/pdsch_test_setup.h"

namespace {

struct TypeBCase {
    const char* name;
    int coresetFirst, coresetSymbols;
    int pdschFirst, pdschLast;
    int rbOffset, rbCount;  // PDSCH allocation in the BWP
    std::vector<int> dmrs;   // expected DM-RS symbols of the slot
    friend void PrintTo(const TypeBCase& c, std::ostream* os) { *os << c.name; }
};

// The CORESET (bitmap 1111) holds BWP RBs 3..26: the BWP starts at CRB 3, its six-RB grid at CRB 6.
const TypeBCase kCases[] = {
    {"TwoSymbolCoresetOverTheStart", 4, 2, 4, 10, 0, 24, {6}},
    {"OneSymbolCoresetOverTheStart", 4, 1, 4, 10, 0, 24, {5}},
    {"TwoSymbolDurationBehindOneSymbol", 4, 1, 4, 5, 0, 24, {5}},
    {"CoresetInEarlierSymbols", 0, 2, 4, 10, 0, 24, {4}},
    {"CoresetInOtherRbs", 4, 2, 4, 10, 30, 10, {4}},
};

class PdschTypeBBehindCoreset : public ::testing::TestWithParam<TypeBCase> {};

TEST_P(PdschTypeBBehindCoreset, FrontLoadedDmrsFollowsTheCoreset) {
    const auto& c = GetParam();
    pdsch_setup::Patch patch;
    patch.bwp = {{"NumberOfCoreset", 2},
                 {"Coreset1", {{"ID", 1}, {"FrequencyDomainBitmap", "1111"}, {"SymbolNumber", c.coresetSymbols}}}};
    patch.downlink = {{"DCI",
                       {{{"Name", "DCI1"}, {"CoresetIndex", 1}, {"SlotIndexArrayStr", "0"}, {"CCEOffsetStr", "0"},
                         {"NumberOfCCE", 1}, {"FirstSymbol", c.coresetFirst}}}}};
    patch.dlsch = {{"PDSCHMappingType", "B"}, {"FirstSymbol", c.pdschFirst}, {"LastSymbol", c.pdschLast},
                   {"SymbolNumber", c.pdschLast - c.pdschFirst + 1}, {"RBOffset", c.rbOffset}, {"RBNumber", c.rbCount},
                   {"TransportBlockSize", 100}};
    pdsch_setup::PdschUnderTest setup(pdsch_setup::document(patch));
    auto dci = setup.carrier->Downlink->getValue()->DCI->getValue()->getItem(0);
    auto pdcch = std::make_unique<Orvalis_NR::PDCCH_Generator>();
    pdcch->Init(setup.root.get(), setup.carrier.get(), dci.get(), setup.bwp.get());
    int first = -1, last = -1;
    pdcch->GetCoresetSymbol(first, last);
    ASSERT_EQ(first, c.coresetFirst);
    ASSERT_EQ(last, c.coresetFirst + c.coresetSymbols - 1);
    setup.pdcch.push_back(pdcch.get());
    setup.init();
    EXPECT_EQ(setup.generator.DmrsSymbols, c.dmrs);
}

INSTANTIATE_TEST_SUITE_P(Cases, PdschTypeBBehindCoreset, ::testing::ValuesIn(kCases),
                         [](const auto& info) { return std::string(info.param.name); });

}  // namespace
