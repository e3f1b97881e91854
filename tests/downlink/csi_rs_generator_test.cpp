// CSI-RS resources through the frame store, checked against TS 38.211 clauses 7.4.1.5.2 and
// 7.4.1.5.3 worked in the test: for several rows of Table 7.4.1.5.3-1 the (k-bar, l-bar)
// entries are typed here from the clause, expanded by k', l', and every element of the frame is
// compared: the port's own CDM group carries w_f w_t beta r(m'), the other groups are reserved,
// and nothing else is touched.

#include <gtest/gtest.h>

#include <cmath>
#include <memory>
#include <nlohmann/json.hpp>
#include <string>
#include <vector>

#include "downlink/csi_rs_generator.h"
#include "downlink/csi_rs_reference.h"
#include "downlink/frame_store.h"
#include "framework/json_serializer.h"
#include "models/nr5g_waveform_settings.h"
#include "test_support.h"

namespace {

using csirs_ref::Cdm;
using csirs_ref::Entry;
using Models::Nr5g::NR5GWaveformSettings;
using Sample = std::complex<double>;

constexpr int kCellId = 77;
using frame_store::at;
using frame_store::kFft;
using frame_store::kPointA;
using frame_store::kSymbols;
using frame_store::Store;

struct Case {
    const char* name;
    int row;
    const char* bitmap;
    int l0, l1;
    const char* density;  // the setting
    bool odd;
    int rbOffset, rbNumber, bwpOffset, bwpSize;
    std::vector<int> ports;  // AntennaPortArray, one per antenna
    int portCount;           // X of the row
    double rho;              // the density the clause applies
    Cdm cdm;
    std::vector<Entry> entries;  // (j, k-bar, l-bar) from Table 7.4.1.5.3-1 and the bitmap
    int nId;
    double boostDb;
};

// k_i from the bitmap by clause 7.4.1.5.3: row 1 f(i), row 2 f(i), row 4 4f(i), else 2f(i), with
// f(i) the number of the i-th set bit from b0 (the last character).
const Case kCases[] = {
    // "0010": b1, k0 = 1; TRS row: three REs per RB at k0, k0 + 4, k0 + 8; density 3 over "One".
    {"TrsRow1", 1, "0010", 4, 4, "One", false, 2, 10, 0, 52, {3000}, 1, 3.0, Cdm::NoCdm,
     {{0, 1, 4}, {0, 5, 4}, {0, 9, 4}}, 517, 0.0},
    // "000000010000": b4, k0 = 4; density 0.5 on odd common RBs; the BWP starts at CRB 3, so the
    // RB offset 0 is clipped up to 3.
    {"Row2HalfDensityOdd", 2, "000000010000", 9, 9, "Dot5", true, 0, 20, 3, 40, {3000}, 1, 0.5, Cdm::NoCdm,
     {{0, 4, 9}}, 1023, 0.0},
    // "100": b2, k0 = 8; groups at k0 and k0 + 2; RBNumber past the BWP end is clipped.
    {"Row4FdCdm2Clipped", 4, "100", 12, 12, "One", false, 4, 300, 0, 24, {3000, 3001, 3002, 3003}, 4, 1.0,
     Cdm::FdCdm2, {{0, 8, 12}, {1, 10, 12}}, 0, 0.0},
    // "100100": b2, b5, k0 = 4, k1 = 10; CDM4 over l0, l0 + 1; ports s 0 and 3 of both groups.
    {"Row8Cdm4Boosted", 8, "100100", 5, 5, "One", false, 0, 30, 0, 30, {3000, 3003, 3004, 3007}, 8, 1.0, Cdm::Cdm4,
     {{0, 4, 5}, {1, 10, 5}}, 311, 3.0},
    // "110001": b0, b4, b5, k = 0, 8, 10; twelve FD-CDM2 groups over l0, l0 + 1, l1, l1 + 1;
    // density 0.5 on even RBs.
    {"Row13TwoSymbolPairsHalfDensity", 13, "110001", 2, 9, "Dot5", false, 6, 17, 0, 52, {3000, 3007, 3013, 3023}, 24,
     0.5, Cdm::FdCdm2,
     {{0, 0, 2}, {1, 8, 2}, {2, 10, 2}, {3, 0, 3}, {4, 8, 3}, {5, 10, 3},
      {6, 0, 9}, {7, 8, 9}, {8, 10, 9}, {9, 0, 10}, {10, 8, 10}, {11, 10, 10}},
     45, 0.0},
    // "001111": k = 0, 2, 4, 6; CDM8 over l0 .. l0 + 3; ports from all four groups.
    {"Row18Cdm8", 18, "001111", 6, 6, "One", false, 0, 52, 0, 52, {3000, 3009, 3018, 3031}, 32, 1.0, Cdm::Cdm8,
     {{0, 0, 6}, {1, 2, 6}, {2, 4, 6}, {3, 6, 6}}, 900, 0.0},
    // The 12-character form of a 6-bit bitmap: "100111" is b0, b1, b2, b5, k = 0, 2, 4, 10.
    {"Row11FullWidthBitmap", 11, "000000100111", 8, 8, "One", false, 10, 8, 0, 52, {3000, 3015}, 16, 1.0,
     Cdm::FdCdm2,
     {{0, 0, 8}, {1, 2, 8}, {2, 4, 8}, {3, 10, 8}, {4, 0, 9}, {5, 2, 9}, {6, 4, 9}, {7, 10, 9}}, 5, 0.0},
};

void PrintTo(const Case& c, std::ostream* os) { *os << c.name; }

nlohmann::json csiRsItem(const Case& c) {
    std::string ports;
    for (int p : c.ports) ports += (ports.empty() ? "" : ",") + std::to_string(p);
    return {{"Name", c.name}, {"RowIndex", c.row}, {"NumberOfAntennaPorts", c.portCount},
            {"FrequencyDomainBitmap", c.bitmap}, {"FirstSymbol", c.l0}, {"FirstSymbol2", c.l1},
            {"Density", c.density}, {"PRBAllocation", c.odd ? "OddPRBs" : "EvenPRBs"}, {"RBOffset", c.rbOffset},
            {"RBNumber", c.rbNumber}, {"BWPIndex", 0}, {"AntennaPortArray", ports}, {"SlotIndexArrayStr", "1,21"},
            {"n_ID", c.nId}, {"PowerBoosting", c.boostDb}, {"REUsedForPDSCH", false}};
}

nlohmann::json document(const nlohmann::json& csirs, int antennas, int bwpOffset, int bwpSize) {
    nlohmann::json bwp = {{"Name", "BWP1"}, {"Numerology", "SCS30k"}, {"Mu", 1}, {"RBOffset", bwpOffset}, {"RBNumber", bwpSize}};
    return {{"SampleRateAuto", 30.72e6},
            {"NumberOfAntennas", antennas},
            {"NRCarriers",
             {{{"CarrierType", "DL"}, {"CellID", kCellId}, {"FrequencyOffsetOfPointA", kPointA},
               {"Downlink", {{"BWP", {bwp}}, {"CSIRS", {csirs}}}}}}}};
}

/// The generator of the document's first CSI-RS item, and its settings tree kept alive.
struct Built {
    std::shared_ptr<NR5GWaveformSettings> root;
    Orvalis_NR::CSI_RS_Generator generator;
};

std::unique_ptr<Built> build(const nlohmann::json& doc) {
    auto built = std::make_unique<Built>();
    Orvalis::Tessaline::JsonSerializer reader;
    built->root = std::dynamic_pointer_cast<NR5GWaveformSettings>(reader.deserialize(doc.dump()));
    auto carrier = built->root->NRCarriers->getValue()->getItem(0);
    auto downlink = carrier->Downlink->getValue();
    auto item = downlink->CSIRS->getValue()->getItem(0);
    auto bwp = downlink->BWP->getValue()->getItem(0);
    built->generator.Init(built->root.get(), carrier.get(), bwp.get(), item.get());
    return built;
}


class CsiRsPattern : public ::testing::TestWithParam<Case> {};

TEST_P(CsiRsPattern, EveryElementOfTheFrameIsAsTheClauseSays) {
    const Case& c = GetParam();
    const int antennas = static_cast<int>(c.ports.size());
    auto built = build(document(csiRsItem(c), antennas, c.bwpOffset, c.bwpSize));
    Store store(antennas);
    built->generator.GenerateAndMap(store.grid, store.occupancy, 0, store.flags, false);

    // The resource's common RBs: from max(RBOffset, BWP start), clipped at the BWP end.
    const int first = std::max(c.rbOffset, c.bwpOffset);
    const int last = std::min(first + c.rbNumber, c.bwpOffset + c.bwpSize) - 1;
    const auto elements = csirs_ref::elements(c.entries, c.cdm, c.portCount, c.rho, c.odd, first, last);
    const double beta = std::pow(10.0, c.boostDb / 20.0);
    const int slot = 1, size = csirs_ref::groupSize(c.cdm);

    std::vector<std::vector<int>> expectedOccupancy(static_cast<std::size_t>(antennas), std::vector<int>(store.grid[0].size(), 0));
    std::vector<std::vector<Sample>> expectedGrid(static_cast<std::size_t>(antennas), std::vector<Sample>(store.grid[0].size()));
    for (int l = 0; l < 14; ++l) {
        const auto r = csirs_ref::sequence(slot, l, c.nId, 3 * (last + 1) + 2);
        for (const auto& e : elements) {
            if (e.l != l) continue;
            for (int a = 0; a < antennas; ++a) {
                const int p = c.ports[static_cast<std::size_t>(a)] - 3000, s = p % size;
                const std::size_t i = at(slot, l, e.k);
                if (p / size == e.group) {
                    expectedGrid[static_cast<std::size_t>(a)][i] =
                        beta * csirs_ref::wf(s, e.kPrime) * csirs_ref::wt(s, e.lPrime) * r[static_cast<std::size_t>(e.m)];
                    expectedOccupancy[static_cast<std::size_t>(a)][i] = 1400;
                } else {
                    expectedOccupancy[static_cast<std::size_t>(a)][i] = 1401;
                }
            }
        }
    }
    int ownElements = 0;
    for (int a = 0; a < antennas; ++a)
        for (std::size_t i = 0; i < store.grid[0].size(); ++i) {
            const auto row = static_cast<std::size_t>(a);
            ASSERT_EQ(store.occupancy[row][i], expectedOccupancy[row][i])
                << "antenna " << a << " symbol " << i / kFft << " bin " << i % kFft;
            ASSERT_LT(std::abs(store.grid[row][i] - expectedGrid[row][i]), 1e-12)
                << "antenna " << a << " symbol " << i / kFft << " bin " << i % kFft;
            ownElements += expectedOccupancy[row][i] == 1400;
        }
    EXPECT_GT(ownElements, 0);

    // The symbols of slot 1 are marked on every antenna, nothing else.
    for (int a = 0; a < antennas; ++a)
        for (int s = 0; s < kSymbols; ++s) {
            bool used = false;
            for (const auto& e : elements) used |= 14 * slot + e.l == s;
            EXPECT_EQ(store.flags[static_cast<std::size_t>(a)][static_cast<std::size_t>(s)], used ? 1 : 0) << "symbol " << s;
        }

    // Slot 21 is slot 1 of frame 1: the same sequence, since it counts the slot in the frame.
    Store next(antennas);
    built->generator.GenerateAndMap(next.grid, next.occupancy, 1, next.flags, true);
    EXPECT_EQ(next.grid, store.grid);
    EXPECT_EQ(next.occupancy, store.occupancy);
}

INSTANTIATE_TEST_SUITE_P(Rows, CsiRsPattern, ::testing::ValuesIn(kCases),
                         [](const auto& info) { return std::string(info.param.name); });

TEST(CsiRsGenerator, ZeroPowerReservesItsElementsWithZeroSamples) {
    Case c = kCases[2];
    auto item = csiRsItem(c);
    item["ZeroPower"] = true;
    item["PowerBoosting"] = 6.0;
    auto built = build(document(item, 4, c.bwpOffset, c.bwpSize));
    Store store(4);
    built->generator.GenerateAndMap(store.grid, store.occupancy, 0, store.flags, false);
    int own = 0;
    for (std::size_t a = 0; a < 4; ++a)
        for (std::size_t i = 0; i < store.grid[a].size(); ++i) {
            EXPECT_EQ(store.grid[a][i], Sample{});
            own += store.occupancy[a][i] == 1400;
        }
    EXPECT_EQ(own, 4 * 20 * 2);  // each port: common RBs 4..23, two elements each
}

TEST(CsiRsGenerator, PublishesWhatThePdschNeeds) {
    Case c = kCases[4];  // row 13, density 0.5 even, symbols 2, 3, 9, 10
    auto item = csiRsItem(c);
    auto built = build(document(item, 4, 5, 40));  // BWP at CRB 5: RBs 6..22 are 1..17 in it
    const auto& f = built->generator.Footprint;
    EXPECT_FALSE(f.ReUsedForPdsch);
    EXPECT_EQ(f.Mu, 1);
    EXPECT_EQ(f.FirstRb, 1);
    EXPECT_EQ(f.RbCount, 17);
    EXPECT_EQ(f.PrbStep, 2);
    EXPECT_EQ(f.OddPrbs, 1);  // even common RBs are the odd ones of a BWP at CRB 5
    EXPECT_EQ(f.SlotList, (std::vector<int>{1, 21}));
    EXPECT_EQ(f.CsiSymbols, (std::vector<int>{2, 3, 9, 10}));
    EXPECT_EQ(f.ReWeights, (std::array<int, 12>{1, 1, 0, 0, 0, 0, 0, 0, 1, 1, 1, 1}));
}

/// A bad setting and a text its failure must hold.
struct BadCase {
    const char* name;
    const char* key;
    nlohmann::json value;
    const char* message;
};

const BadCase kBadCases[] = {
    {"RowZero", "RowIndex", 0, "RowIndex 0"},
    {"RowNineteen", "RowIndex", 19, "RowIndex 19"},
    {"BitmapTooShort", "FrequencyDomainBitmap", "10", "FrequencyDomainBitmap \"10\", RowIndex 4 takes 3 bits"},
    {"BitmapBitAboveRow", "FrequencyDomainBitmap", "000000001001", "FrequencyDomainBitmap \"000000001001\""},
    {"BitmapTwoBitsForOne", "FrequencyDomainBitmap", "011", "takes 1 set bits"},
    {"BitmapNotBinary", "FrequencyDomainBitmap", "0x1", "other than 0 and 1"},
    {"PortNotInRow", "AntennaPortArray", "3000,3004", "port 3004, RowIndex 4 has ports 3000 to 3003"},
    {"PortBelowRange", "AntennaPortArray", "1000", "port 1000"},
    {"SymbolsPastSlot", "FirstSymbol", 14, "FirstSymbol 14"},
    {"MalformedSlots", "SlotIndexArrayStr", "1,x", "SlotIndexArrayStr \"1,x\""},
    {"NegativeSlot", "SlotIndexArrayStr", "-2", "A slot number is negative."},
    {"MalformedPorts", "AntennaPortArray", "3000;3001", "AntennaPortArray \"3000;3001\""},
};

void PrintTo(const BadCase& c, std::ostream* os) { *os << c.name; }

class CsiRsBadSetting : public ::testing::TestWithParam<BadCase> {};

TEST_P(CsiRsBadSetting, FailsNamingTheSetting) {
    const auto& bad = GetParam();
    nlohmann::json item = {{"Name", "Bad"}, {"RowIndex", 4}, {"FrequencyDomainBitmap", "001"}, {"FirstSymbol", 5},
                           {"BWPIndex", 0}, {"AntennaPortArray", "3000,3001"}, {"SlotIndexArrayStr", "1"}, {"RBNumber", 20}};
    item[bad.key] = bad.value;
    std::string text;
    try {
        text = nrsynth_test::failureText([&] { build(document(item, 2, 0, 52)); });
    } catch (const std::exception& e) {
        text = e.what();
    }
    EXPECT_NE(text.find(bad.message), std::string::npos) << text;
    EXPECT_NE(text.find("Bad"), std::string::npos) << "names the item: " << text;
}

INSTANTIATE_TEST_SUITE_P(Settings, CsiRsBadSetting, ::testing::ValuesIn(kBadCases),
                         [](const auto& info) { return std::string(info.param.name); });

TEST(CsiRsGenerator, ResourceOutsideTheSampleRateFails) {
    nlohmann::json item = {{"Name", "Wide"}, {"RowIndex", 2}, {"FrequencyDomainBitmap", "000000000001"},
                           {"BWPIndex", 0}, {"AntennaPortArray", "3000"}, {"SlotIndexArrayStr", "1"}, {"RBNumber", 200}};
    auto doc = document(item, 1, 0, 200);
    doc["SampleRateAuto"] = 7.68e6;  // 256 subcarriers of 30 kHz
    const auto text = nrsynth_test::failureText([&] { build(doc); });
    EXPECT_NE(text.find("outside the band"), std::string::npos) << text;
    EXPECT_NE(text.find("RBNumber 200"), std::string::npos) << text;
}

TEST(CsiRsGenerator, CalculateCsiLocationsGivesTheRowsShape) {
    Orvalis_NR::CSI_RS_Generator generator;
    int ports = 0, size = 0;
    std::vector<std::pair<int, int>> locations;
    std::vector<int> groups, cdm;
    // Row 17: 32 ports in eight CDM4 groups at (k0..k3, l0) and (k0..k3, l1).
    generator.CalculateCsiLocations(17, 3, 10, "011011", ports, size, locations, groups, cdm);
    EXPECT_EQ(ports, 32);
    EXPECT_EQ(size, 4);
    EXPECT_EQ(cdm, std::vector<int>{Orvalis_NR::CsiRsCdm4});
    EXPECT_EQ(groups, (std::vector<int>{0, 1, 2, 3, 4, 5, 6, 7}));
    const std::vector<std::pair<int, int>> expected = {{0, 3}, {2, 3}, {6, 3}, {8, 3}, {0, 10}, {2, 10}, {6, 10}, {8, 10}};
    EXPECT_EQ(locations, expected);

    std::vector<std::vector<int>> wf, wt;
    generator.InitWfWt(Orvalis_NR::CsiRsCdm8, 8, wf, wt);
    ASSERT_EQ(wf.size(), 8u);
    for (int s = 0; s < 8; ++s) {
        ASSERT_EQ(wf[static_cast<std::size_t>(s)].size(), 2u);
        ASSERT_EQ(wt[static_cast<std::size_t>(s)].size(), 4u);
        for (int k = 0; k < 2; ++k) EXPECT_EQ(wf[static_cast<std::size_t>(s)][static_cast<std::size_t>(k)], csirs_ref::wf(s, k));
        for (int l = 0; l < 4; ++l) EXPECT_EQ(wt[static_cast<std::size_t>(s)][static_cast<std::size_t>(l)], csirs_ref::wt(s, l));
    }
}

}  // namespace
