// The PDSCH data count around the cell reference signals of an LTE carrier sharing the band
// (TS 38.214 clause 5.1.4.2): the REs taken off are built here port by port from TS 36.211
// clause 6.10.1.2, on the LTE subcarrier grid that leaves out its DC subcarrier.

#include <gtest/gtest.h>

#include <ostream>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include "downlink/pdsch_test_setup.h"

namespace {

struct LteCase {
    const char* name;
    int ports;
    const char* bandwidth;
    int resourceBlocks;
    int centre;  // LTE DC subcarrier from point A
    int vShift;
    const char* mbsfn;
    int subframe;
    int rbOffset = 0, rbCount = 52;  // PDSCH allocation; the BWP spans CRB 0 to 51
    friend void PrintTo(const LteCase& c, std::ostream* os) { *os << c.name; }
};

const LteCase kCases[] = {
    {"OnePort", 1, "BW5M_25RB", 25, 300, 0, "", 0},
    {"TwoPortsShifted", 2, "BW10M_50RB", 50, 311, 2, "", 3},
    {"FourPortsOddDc", 4, "BW5M_25RB", 25, 199, 1, "", 1},
    {"PartlyBelowPointA", 2, "BW5M_25RB", 25, 100, 0, "", 0},
    {"MbsfnSubframeTakesNothing", 2, "BW5M_25RB", 25, 300, 0, "2,3", 3},
    {"MbsfnListOfOtherSubframes", 2, "BW5M_25RB", 25, 300, 0, "2,3", 4},
    // RB 25 starts at the LTE DC: the REs above it sit one subcarrier up (301, 307 in symbol 0).
    {"SingleRbAtTheDc", 1, "BW5M_25RB", 25, 300, 0, "", 0, 25, 1},
    {"SingleRbBelowTheDc", 1, "BW5M_25RB", 25, 300, 0, "", 0, 24, 1},
};

constexpr int kRbs = 52;  // the BWP from CRB 0: subcarriers 0 .. 623 from point A

/// (symbol of the subframe, subcarrier from point A) of every CRS RE of the LTE carrier inside
/// the PDSCH allocation. Ports 0 and 1 in symbols 0 and 4 of each slot, ports 2 and 3 in symbol 1;
/// k = 6m + (v + v_shift) mod 6 on the LTE grid, which skips its DC subcarrier at `centre`.
std::set<std::pair<int, int>> crsElements(const LteCase& c) {
    std::set<std::pair<int, int>> elements;
    const int half = 6 * c.resourceBlocks;
    for (int slot = 0; slot < 2; ++slot)
        for (int port = 0; port < c.ports; ++port)
            for (int l : port < 2 ? std::vector<int>{0, 4} : std::vector<int>{1}) {
                const int ns = 2 * c.subframe + slot;
                const int v = port == 0 ? (l == 0 ? 0 : 3) : port == 1 ? (l == 0 ? 3 : 0) : port == 2 ? 3 * (ns % 2) : 3 + 3 * (ns % 2);
                for (int m = 0; m < 2 * c.resourceBlocks; ++m) {
                    const int k = 6 * m + (v + c.vShift) % 6;
                    const int fromPointA = c.centre - half + k + (k >= half ? 1 : 0);
                    if (fromPointA >= 12 * c.rbOffset && fromPointA < 12 * (c.rbOffset + c.rbCount)) elements.insert({7 * slot + l, fromPointA});
                }
            }
    return elements;
}

class PdschLteCrsCount : public ::testing::TestWithParam<LteCase> {};

TEST_P(PdschLteCrsCount, TakesOffTheReferenceElementsOfEveryPort) {
    const auto& c = GetParam();
    pdsch_setup::Patch patch;
    patch.bwp = {{"Numerology", "SCS15k"}, {"Mu", 0}, {"RBOffset", 0}, {"RBNumber", kRbs}};
    patch.carrier = {{"FrequencyOffsetOfPointA", -312 * 15000.0}};
    patch.dlsch = {{"RBOffset", c.rbOffset}, {"RBNumber", c.rbCount}, {"TransportBlockSize", 100},
                   {"SlotIndexArrayStr", std::to_string(c.subframe)}};
    patch.downlink = {{"LTECoexistence",
                       {{"Enabled", true},
                        {"LTECRS",
                         {{{"LTEBandwidth", c.bandwidth}, {"OffsetToPointA", c.centre}, {"NumberOfCRSAntennaPorts", c.ports},
                           {"VShift", c.vShift}, {"MBSFNSubframeIndexArrayStr", c.mbsfn}}}}}}};
    pdsch_setup::PdschUnderTest setup(pdsch_setup::document(patch));
    setup.init();
    auto& g = setup.generator;
    ASSERT_EQ(g.DmrsSymbols, std::vector<int>{2});  // no CRS symbol: nothing to exempt

    const std::string list = std::string(",") + c.mbsfn + ",";
    const bool mbsfn = list.find("," + std::to_string(c.subframe) + ",") != std::string::npos;
    const int taken = mbsfn ? 0 : static_cast<int>(crsElements(c).size());
    g.CalculateRateMathingParameters(0, c.subframe, 0);
    EXPECT_EQ(g.DataRePerLayer, c.rbCount * (13 * 12 + 6) - taken);
    if (!mbsfn) {
        EXPECT_GT(taken, 0);
    }
}

INSTANTIATE_TEST_SUITE_P(Cases, PdschLteCrsCount, ::testing::ValuesIn(kCases),
                         [](const auto& info) { return std::string(info.param.name); });

}  // namespace
