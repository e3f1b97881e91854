// Where the PDSCH goes and how much it carries: interleaved VRB-to-PRB mapping (TS 38.211
// clause 7.3.1.6), resource allocation type 0 (TS 38.214 clause 5.1.2.2.1), rate-match patterns
// at BWP and cell level, and code block groups (TS 38.212 clause 5.4.2.1 over the flagged
// blocks). Expected values are worked here from the clauses, not taken from the generator.

#include <gtest/gtest.h>

#include <algorithm>
#include <numeric>
#include <set>
#include <string>
#include <vector>

#include "downlink/pdsch_receiver.h"
#include "downlink/pdsch_test_setup.h"

namespace {

using pdsch_setup::Patch;
using pdsch_setup::PdschUnderTest;
using pdsch_setup::Store;

constexpr int kPointA = -300;  // FrequencyOffsetOfPointA -9 MHz at 30 kHz

/// RBs of the BWP (from 0) that hold PDSCH data in frame symbol `symbol`.
std::set<int> dataRbs(const Store& store, int symbol, int bwpOffset, int bwpSize) {
    std::set<int> rbs;
    for (int p = 0; p < bwpSize; ++p)
        for (int j = 0; j < 12; ++j)
            if (store.occupancy[0][store.at(symbol, 12 * (bwpOffset + p) + j, kPointA)] == 7) rbs.insert(p);
    return rbs;
}

// ---------------------------------------------------------------------------------------------
// VRB-to-PRB interleaving, TS 38.211 clause 7.3.1.6: bundles of L RBs aligned to common RB 0,
// VRB bundle j = cR + r (R = 2) to PRB bundle f(j) = rC + c, C = floor(N_bundle / R), the last
// bundle to itself.

struct InterleaveCase {
    const char* name;
    int bundle, bwpOffset, bwpSize;
    std::vector<int> expected;  // PRB of each VRB, worked by hand
};

const InterleaveCase kInterleave[] = {
    // Start 3, L 2: bundles {0} {1,2} {3,4} {5,6} {7,8} {9}; C 3: 1->3, 2->1, 3->4, 4->2.
    {"Bundle2OddStart", 2, 3, 10, {0, 5, 6, 1, 2, 7, 8, 3, 4, 9}},
    // Start 3, L 4: bundles {0} {1..4} {5..8} {9}; C 2: 1->2, 2->1.
    {"Bundle4StartThree", 4, 3, 10, {0, 5, 6, 7, 8, 1, 2, 3, 4, 9}},
    // Start 4, L 2: five whole bundles; C 2: 1->2, 2->1, 3->3.
    {"Bundle2Aligned", 2, 4, 10, {0, 1, 4, 5, 2, 3, 6, 7, 8, 9}},
};

class PdschVrbInterleaving : public ::testing::TestWithParam<InterleaveCase> {};

TEST_P(PdschVrbInterleaving, MapsBundlesAsTheClauseWorksThem) {
    const auto& c = GetParam();
    Patch patch;
    patch.bwp = {{"RBOffset", c.bwpOffset}, {"RBNumber", c.bwpSize}};
    patch.dlsch = {{"VRBtoPRBMapping", "Interleaved"}, {"VRBtoPRBInterleaver", c.bundle}, {"RBOffset", 1},
                   {"RBNumber", 4}, {"TransportBlockSize", 200}};
    PdschUnderTest setup(pdsch_setup::document(patch));
    setup.init();
    EXPECT_EQ(setup.generator.VrbToPrb, c.expected);

    // VRBs 1..4 carry the data; it lands on their PRBs.
    Store store(1, setup.fft);
    setup.generator.Map(store.grid, store.occupancy, 0, store.flags, true);
    std::set<int> expected;
    for (int n = 1; n <= 4; ++n) expected.insert(c.expected[static_cast<std::size_t>(n)]);
    EXPECT_EQ(dataRbs(store, 0, c.bwpOffset, c.bwpSize), expected);
}

INSTANTIATE_TEST_SUITE_P(Cases, PdschVrbInterleaving, ::testing::ValuesIn(kInterleave),
                         [](const auto& info) { return std::string(info.param.name); });

TEST(PdschVrbInterleaving, WideBandwidthPartIsAPermutationOfWholeBundles) {
    for (int bundle : {2, 4}) {
        SCOPED_TRACE("L " + std::to_string(bundle));
        const int start = 5, size = 51;
        Patch patch;
        patch.bwp = {{"RBOffset", start}, {"RBNumber", size}};
        patch.dlsch = {{"VRBtoPRBMapping", "Interleaved"}, {"VRBtoPRBInterleaver", bundle}, {"RBNumber", size}};
        PdschUnderTest setup(pdsch_setup::document(patch));
        setup.init();
        // Bundle boundaries from common RB 0, then f(j) bundle by bundle.
        std::vector<int> first{0};
        for (int n = 1; n < size; ++n)
            if ((start + n) % bundle == 0) first.push_back(n);
        const int bundles = static_cast<int>(first.size());
        first.push_back(size);
        std::vector<int> expected(static_cast<std::size_t>(size));
        for (int j = 0; j < bundles; ++j) {
            const int r = j % 2, c = j / 2;
            const int target = j == bundles - 1 ? j : r * (bundles / 2) + c;
            for (int i = 0; i < first[static_cast<std::size_t>(j) + 1] - first[static_cast<std::size_t>(j)]; ++i)
                expected[static_cast<std::size_t>(first[static_cast<std::size_t>(j)] + i)] = first[static_cast<std::size_t>(target)] + i;
        }
        EXPECT_EQ(setup.generator.VrbToPrb, expected);
        std::vector<int> sorted = setup.generator.VrbToPrb;
        std::sort(sorted.begin(), sorted.end());
        std::vector<int> identity(static_cast<std::size_t>(size));
        std::iota(identity.begin(), identity.end(), 0);
        EXPECT_EQ(sorted, identity);
    }
}

// ---------------------------------------------------------------------------------------------
// Resource allocation type 0: RBG size P of TS 38.214 Table 5.1.2.2.1-1 (configuration 1), the
// first RBG P - (start mod P) RBs, the last (start + size) mod P (or P), one bitmap bit each.

int rbgSizeConfiguration1(int bwpSize) { return bwpSize <= 36 ? 2 : bwpSize <= 72 ? 4 : bwpSize <= 144 ? 8 : 16; }

struct RbgCase {
    const char* name;
    int bwpOffset, bwpSize;
    const char* bitmap;
    std::set<int> rbs;  // worked by hand
};

const RbgCase kRbg[] = {
    // P 4, start 6: groups {0,1} {2..5} ... {34..37} {38,39}.
    {"P4ShortFirstAndLast", 6, 40, "10100000011", {0, 1, 6, 7, 8, 9, 34, 35, 36, 37, 38, 39}},
    // P 2, start 1: 16 groups, the first and last of one RB.
    {"P2SingleRbEnds", 1, 30, "1000000000000001", {0, 29}},
    // P 8, start 10: groups {0..5} {6..13} ... {70..77} {78..79}.
    {"P8", 10, 80, "01000000001", {6, 7, 8, 9, 10, 11, 12, 13, 78, 79}},
};

class PdschResourceAllocationType0 : public ::testing::TestWithParam<RbgCase> {};

TEST_P(PdschResourceAllocationType0, BitmapSelectsTheGroups) {
    const auto& c = GetParam();
    Patch patch;
    patch.bwp = {{"RBOffset", c.bwpOffset}, {"RBNumber", c.bwpSize}};
    patch.dlsch = {{"RAType", "RAType0"}, {"RBGSize", rbgSizeConfiguration1(c.bwpSize)}, {"RBGBitmap", c.bitmap},
                   {"TransportBlockSize", 200}};
    PdschUnderTest setup(pdsch_setup::document(patch));
    setup.init();
    std::set<int> mask;
    for (int n = 0; n < c.bwpSize; ++n)
        if (setup.generator.RbMask[static_cast<std::size_t>(n)]) mask.insert(n);
    EXPECT_EQ(mask, c.rbs);

    Store store(1, setup.fft);
    setup.generator.Map(store.grid, store.occupancy, 0, store.flags, true);
    EXPECT_EQ(dataRbs(store, 0, c.bwpOffset, c.bwpSize), c.rbs);
    // 13 symbols of 12 REs and the DM-RS symbol's 6 per RB.
    EXPECT_EQ(setup.generator.DataRePerLayer, static_cast<int>(c.rbs.size()) * (13 * 12 + 6));
}

INSTANTIATE_TEST_SUITE_P(Cases, PdschResourceAllocationType0, ::testing::ValuesIn(kRbg),
                         [](const auto& info) { return std::string(info.param.name); });

// ---------------------------------------------------------------------------------------------
// Rate-match patterns: an RB bitmap (from BWP RB 0 at BWP level, from common RB 0 at cell
// level), a symbol bitmap and a slot periodicity; the PDSCH leaves the REs they cover.

struct PatternCase {
    const char* name;
    const char* level;
    const char* spacing;
    std::string rbBitmap;
    int periodicity;
    const char* periodBitmap;
    int hitSlot0, hitSlot1;  // RB-symbols taken in slots 0 and 1
};

// BWP at CRB 3: BWP RBs 2 and 3 are CRBs 5 and 6. Symbols 5 and 6 (no DM-RS there).
const PatternCase kPatterns[] = {
    {"BwpLevel", "BWP", "SCS30k", "0011", 1, "1", 4, 4},
    {"CellLevel", "Cell", "SCS30k", "0000011", 1, "1", 4, 4},
    {"CellLevelOtherSpacingIgnored", "Cell", "SCS15k", "0000011", 1, "1", 0, 0},
    {"DisabledIgnored", "BWP", "SCS30k", "0011", 1, "1", 0, 0},
    {"EverySecondSlot", "BWP", "SCS30k", "0011", 2, "01", 0, 4},
};

class PdschRateMatchPattern : public ::testing::TestWithParam<PatternCase> {};

TEST_P(PdschRateMatchPattern, TakesTheCoveredResourceElements) {
    const auto& c = GetParam();
    const bool enabled = std::string(c.name) != "DisabledIgnored";
    const nlohmann::json pattern = {{"Enabled", enabled},           {"Level", c.level},
                                    {"SubcarrierSpacing", c.spacing}, {"RBBitmap", c.rbBitmap},
                                    {"SymbolBitmapSpan", "OneSlot"}, {"SymbolBitmap", "00000110000000"},
                                    {"Periodicity", c.periodicity},  {"PeriodicityPatternBitmap", c.periodBitmap}};
    Patch patch;
    patch.dlsch = {{"RateMatchPatterns", {pattern}}, {"SlotIndexArrayStr", "0,1"}};
    PdschUnderTest setup(pdsch_setup::document(patch));
    setup.init();
    const int full = 52 * (13 * 12 + 6);
    auto& g = setup.generator;
    g.CalculateRateMathingParameters(0, 0, 0);
    EXPECT_EQ(g.DataRePerLayer, full - 12 * c.hitSlot0);
    g.CalculateRateMathingParameters(0, 0, 1);
    EXPECT_EQ(g.DataRePerLayer, full - 12 * c.hitSlot1);

    // The mapping leaves the same REs: RBs 2 and 3 in symbols 5 and 6 of a hit slot.
    Store store(1, setup.fft);
    g.Map(store.grid, store.occupancy, 0, store.flags, true);
    for (int slot = 0; slot < 2; ++slot) {
        const bool hit = (slot == 0 ? c.hitSlot0 : c.hitSlot1) > 0;
        for (int s : {4, 5, 6, 7}) {
            std::set<int> expected;
            for (int p = 0; p < 52; ++p)
                if (!(hit && (s == 5 || s == 6) && (p == 2 || p == 3))) expected.insert(p);
            EXPECT_EQ(dataRbs(store, 14 * slot + s, 3, 52), expected) << "slot " << slot << " symbol " << s;
        }
    }
}

INSTANTIATE_TEST_SUITE_P(Cases, PdschRateMatchPattern, ::testing::ValuesIn(kPatterns),
                         [](const auto& info) { return std::string(info.param.name); });

// ---------------------------------------------------------------------------------------------
// Code block groups: six blocks in four groups of 2, 2, 1, 1 blocks (TS 38.214 clause 5.1.7);
// CBGTI 0110 sends groups 1 and 2, blocks 2, 3 and 4. E is worked over those three only, and
// the coded bits hold exactly those blocks in order.

TEST(PdschCodeBlockGroups, RateMatchOnlyTheFlaggedBlocks) {
    constexpr int kTbs = 45000, kQm = 8;
    const std::string pattern = "1011001110001011110100100001101101011100010010111101100";
    Patch patch;
    patch.dlsch = {{"Modulation", "QAM256"}, {"TransportBlockSize", kTbs}, {"CodingRate", 0.8},
                   {"CBGTransmission", true}, {"MaxCBGsPerTB", 4}, {"CBGTI", "0110"}, {"CRCErrorFlag", "0"},
                   {"PayloadData", {{"PayLoadDataType", "Pattern"}, {"PatternBits", pattern}}}};
    PdschUnderTest setup(pdsch_setup::document(patch));
    setup.init();
    auto& g = setup.generator;
    const pdsch_rx::Segmentation seg(kTbs, 0.8);
    ASSERT_EQ(seg.blocks, 6);
    EXPECT_EQ(g.CbgFlags, (std::vector<int>{0, 0, 1, 1, 1, 0}));
    EXPECT_EQ(g.CodedBlocks, 3);

    g.Generate(0, 0, 0);
    const auto& cw = g.CodeWords[0];
    const int bits = static_cast<int>(cw.G);
    // Coded bits travel as symbols of Qm bits, the first in bit 0.
    std::vector<int> coded(static_cast<std::size_t>(bits));
    for (std::size_t k = 0; k < coded.size(); ++k) coded[k] = (cw.CodedSymbols[k / kQm] >> (k % kQm)) & 1;
    EXPECT_EQ(bits, kQm * 52 * (13 * 12 + 6));
    // TS 38.212 clause 5.4.2.1 with C' = 3: E_r = Qm floor(G / (Qm C')) for the first
    // C' - (G / Qm mod C') blocks, Qm ceil(...) for the rest.
    const int p = bits / kQm, cPrime = 3;
    std::vector<int> expectedE;
    for (int r = 0; r < cPrime; ++r)
        expectedE.push_back(kQm * (r <= cPrime - p % cPrime - 1 ? p / cPrime : (p + cPrime - 1) / cPrime));
    expectedE.resize(6, 0);
    EXPECT_EQ(cw.PerBlockE, expectedE);

    // TB with its CRC, cut into blocks with their CRC; blocks 2, 3, 4 follow one another.
    pdsch_rx::Bits tb(kTbs);
    for (int i = 0; i < kTbs; ++i) tb[static_cast<std::size_t>(i)] = pattern[static_cast<std::size_t>(i) % pattern.size()] - '0';
    const auto tbCrc = pdsch_rx::crc(tb, 24, pdsch_rx::kCrc24A);
    tb.insert(tb.end(), tbCrc.begin(), tbCrc.end());
    std::size_t offset = 0;
    const int payload = seg.kPrime - 24;
    for (int r = 2; r <= 4; ++r) {
        SCOPED_TRACE("block " + std::to_string(r));
        pdsch_rx::Bits info(tb.begin() + r * payload, tb.begin() + (r + 1) * payload);
        const auto blockCrc = pdsch_rx::crc(info, 24, pdsch_rx::kCrc24B);
        info.insert(info.end(), blockCrc.begin(), blockCrc.end());
        const int e = expectedE[static_cast<std::size_t>(r - 2)];
        const pdsch_rx::Bits f(coded.begin() + static_cast<std::ptrdiff_t>(offset),
                               coded.begin() + static_cast<std::ptrdiff_t>(offset) + e);
        offset += static_cast<std::size_t>(e);
        const auto check = pdsch_rx::checkBlock(pdsch_rx::deinterleave(f, kQm), info, seg.graph, seg.z, 66 * seg.z);
        EXPECT_EQ(check.systematicErrors, 0);
        EXPECT_GT(check.seenParity, 0);
    }
    EXPECT_EQ(offset, static_cast<std::size_t>(bits));
}

}  // namespace
