// A PDSCH beside CSI-RS in one slot. Rate matched: the receiver of the PDSCH round trip takes
// the CSI-RS elements (worked from TS 38.211 clause 7.4.1.5.3 in the test) out of the data
// elements and still decodes the transport block exactly, while the CSI-RS keeps its values.
// Punctured: the CSI-RS overwrites exactly its own elements of the PDSCH and nothing else.

#include <gtest/gtest.h>

#include <algorithm>
#include <memory>
#include <nlohmann/json.hpp>
#include <set>
#include <string>
#include <vector>

#include "downlink/csi_rs_generator.h"
#include "downlink/csi_rs_reference.h"
#include "downlink/pdsch_generator.h"
#include "downlink/pdsch_receiver.h"
#include "framework/json_serializer.h"
#include "models/nr5g_waveform_settings.h"

namespace {

using namespace pdsch_rx;
using csirs_ref::Cdm;
using Models::Nr5g::NR5GWaveformSettings;

const std::string kPattern = "0110101110010001101111010010110000111010";
constexpr int kCellId = 321, kRnti = 0x2B1, kNId = 211, kFft = 1024, kTbs = 1544, kFirstRb = 10, kRbs = 30;
constexpr double kRate = 0.3;
constexpr int kPointAOffset = -300;

/// One CSI-RS item of the test and the elements the clause gives it.
struct Resource {
    nlohmann::json item;
    std::vector<csirs_ref::Entry> entries;
    Cdm cdm;
    int ports;
    double rho;
    bool odd;
};

std::vector<Resource> resources(bool puncture) {
    auto item = [&](const char* name, int row, const char* bitmap, int l0, const char* density, bool odd, int portCount) {
        return nlohmann::json{{"Name", name}, {"RowIndex", row}, {"FrequencyDomainBitmap", bitmap}, {"FirstSymbol", l0},
                              {"Density", density}, {"PRBAllocation", odd ? "OddPRBs" : "EvenPRBs"},
                              {"NumberOfAntennaPorts", portCount}, {"RBOffset", 0}, {"RBNumber", 52}, {"BWPIndex", 0},
                              {"AntennaPortArray", "3000"}, {"SlotIndexArrayStr", "0"}, {"n_ID", 40},
                              {"REUsedForPDSCH", puncture}};
    };
    return {
        // Row 4, k0 = 4: groups at k 4, 5 and 6, 7 of symbol 6; this antenna sends group 0.
        {item("Row4", 4, "010", 6, "One", false, 4), {{0, 4, 6}, {1, 6, 6}}, Cdm::FdCdm2, 4, 1.0, false},
        // A TRS symbol: k 0, 4, 8 of symbol 8.
        {item("Trs", 1, "0001", 8, "One", false, 1), {{0, 0, 8}, {0, 4, 8}, {0, 8, 8}}, Cdm::NoCdm, 1, 3.0, false},
        // Row 2, k0 = 3, in the DM-RS symbol 2 on odd RBs only.
        {item("Row2InDmrsSymbol", 2, "000000001000", 2, "Dot5", true, 1), {{0, 3, 2}}, Cdm::NoCdm, 1, 0.5, true},
    };
}

nlohmann::json document(const std::vector<Resource>& csirs) {
    nlohmann::json dlsch = {
        {"Name", "PDSCH"}, {"DMRSports", "0"}, {"AntennaPortArray", "1000"}, {"NumberOfLayers", 1},
        {"NumberOfCodewords", 1}, {"NumberOfDMRSCDMGroup", 1}, {"RNTI", kRnti}, {"n_ID", kNId},
        {"SlotIndexArrayStr", "0"}, {"FirstSymbol", 0}, {"LastSymbol", 13}, {"SymbolNumber", 14}, {"BWPIndex", 0},
        {"RBOffset", kFirstRb}, {"RBNumber", kRbs}, {"RAType", "RAType1"}, {"Modulation", "QPSK"},
        {"TransportBlockSize", kTbs}, {"CodingRate", kRate}, {"DMRSConfigurationType", "Type1"},
        {"DMRSDuration", "SingleSymbol"}, {"DMRSaddpos", 1}, {"PDSCHMappingType", "A"}, {"DMRStypeApos", 2},
        {"PTRSEnabled", false}, {"PRBBundleSize", "Wideband"},
        {"PayloadData", {{"PayLoadDataType", "Pattern"}, {"PatternBits", kPattern}}}};
    nlohmann::json items = nlohmann::json::array();
    for (const auto& r : csirs) items.push_back(r.item);
    nlohmann::json bwp = {{"Name", "BWP1"}, {"Numerology", "SCS30k"}, {"Mu", 1}, {"RBOffset", 0}, {"RBNumber", 52}};
    return {{"SampleRateAuto", 30.72e6},
            {"NumberOfAntennas", 1},
            {"NRCarriers",
             {{{"CarrierType", "DL"}, {"CellID", kCellId}, {"FrequencyOffsetOfPointA", -9.0e6},
               {"Downlink", {{"BWP", {bwp}}, {"DLSCH", {dlsch}}, {"CSIRS", items}}}}}}};
}

/// The PDSCH and CSI-RS generators of a document, with its tree kept alive.
struct Slot {
    std::shared_ptr<NR5GWaveformSettings> root;
    std::vector<std::unique_ptr<Orvalis_NR::CSI_RS_Generator>> csirs;
    Orvalis_NR::PDSCH_Generator pdsch;
    Orvalis_NR::SlotGrid grid{1, std::vector<Sample>(280 * kFft)};
    Orvalis_NR::OccupancyGrid occupancy{1, std::vector<int>(280 * kFft, 0)};
    Orvalis_NR::OccupancyGrid flags{1, std::vector<int>(280, 0)};

    explicit Slot(const std::vector<Resource>& resources) {
        Orvalis::Tessaline::JsonSerializer reader;
        root = std::dynamic_pointer_cast<NR5GWaveformSettings>(reader.deserialize(document(resources).dump()));
        auto carrier = root->NRCarriers->getValue()->getItem(0);
        auto downlink = carrier->Downlink->getValue();
        auto bwp = downlink->BWP->getValue()->getItem(0);
        std::vector<const Orvalis_NR::CsiRsFootprint*> footprints;
        for (int i = 0; i < downlink->CSIRS->getValue()->getCount(); ++i) {
            csirs.push_back(std::make_unique<Orvalis_NR::CSI_RS_Generator>());
            csirs.back()->Init(root.get(), carrier.get(), bwp.get(), downlink->CSIRS->getValue()->getItem(i).get());
            footprints.push_back(&csirs.back()->Footprint);
        }
        std::vector<Orvalis_NR::PBCH_Generator*> pbch;
        std::vector<Orvalis_NR::PDCCH_Generator*> pdcch;
        std::vector<Orvalis_NR::PRS_Generator*> prs;
        pdsch.Init(carrier.get(), downlink->DLSCH->getValue()->getItem(0).get(), bwp.get(), kFft, pbch, pdcch, prs, footprints);
    }
    void mapCsiRs() {
        for (auto& g : csirs) g->GenerateAndMap(grid, occupancy, 0, flags, false);
    }
    void mapPdsch() { pdsch.Map(grid, occupancy, 0, flags, true); }
};

std::size_t at(int l, int k) { return static_cast<std::size_t>(l * kFft + ((kPointAOffset + k) % kFft + kFft) % kFft); }

/// The elements of the resources in slot 0 by their store index, with this antenna's value
/// (0 where another CDM group of the resource lies).
std::vector<std::pair<std::size_t, Sample>> csiRsElements(const std::vector<Resource>& list) {
    std::vector<std::pair<std::size_t, Sample>> out;
    for (const auto& r : list) {
        for (int l = 0; l < 14; ++l) {
            const auto seq = csirs_ref::sequence(0, l, 40, 200);
            for (const auto& e : csirs_ref::elements(r.entries, r.cdm, r.ports, r.rho, r.odd, 0, 51))
                if (e.l == l) out.emplace_back(at(l, e.k), e.group == 0 ? seq[static_cast<std::size_t>(e.m)] : Sample{});
        }
    }
    return out;
}

TEST(CsiRsBesidePdsch, RateMatchedDataStillDecodesExactly) {
    const auto list = resources(false);
    Slot slot(list);
    slot.mapCsiRs();
    slot.mapPdsch();

    std::set<std::size_t> csi;
    for (const auto& [i, value] : csiRsElements(list)) {
        csi.insert(i);
        EXPECT_LT(std::abs(slot.grid[0][i] - value), 1e-12) << "CSI-RS element " << i << " kept its value";
    }

    // Data elements in frequency-then-time order: DM-RS on even k of symbols 2 and 11
    // (type A, l0 = 2, one additional position, CDM group 0 alone).
    std::vector<Sample> data;
    for (int l = 0; l < 14; ++l)
        for (int k = 12 * kFirstRb; k < 12 * (kFirstRb + kRbs); ++k) {
            if ((l == 2 || l == 11) && k % 2 == 0) continue;
            if (csi.count(at(l, k))) continue;
            data.push_back(slot.grid[0][at(l, k)]);
        }
    ASSERT_EQ(static_cast<int>(data.size()), slot.pdsch.DataRePerLayer);
    ASSERT_LT(data.size(), static_cast<std::size_t>(kRbs * (12 * 12 + 2 * 6))) << "the CSI-RS took elements";

    Bits bits = demap(data, 2);
    const Bits scrambling = gold(static_cast<std::uint32_t>(kRnti) * 32768u + kNId, static_cast<int>(bits.size()));
    for (std::size_t i = 0; i < bits.size(); ++i) bits[i] ^= scrambling[i];

    // TS 38.212: CRC16 over 1544 bits, one block of base graph 2 (R 0.3), K' 1560, Z 160.
    Bits info(static_cast<std::size_t>(kTbs));
    for (int i = 0; i < kTbs; ++i) info[static_cast<std::size_t>(i)] = kPattern[static_cast<std::size_t>(i) % kPattern.size()] - '0';
    const Bits check = crc(info, 16, kCrc16);
    info.insert(info.end(), check.begin(), check.end());
    const int z = 160;
    const BlockCheck result = checkBlock(deinterleave(bits, 2), info, 2, z, 50 * z);
    EXPECT_EQ(result.systematicErrors, 0);
    EXPECT_EQ(result.parityFailures, 0);
}

TEST(CsiRsBesidePdsch, PuncturingOverwritesExactlyItsOwnElements) {
    const auto list = resources(true);
    Slot slot(list);
    Slot plain({});
    slot.mapPdsch();
    plain.mapPdsch();
    EXPECT_EQ(slot.pdsch.DataRePerLayer, plain.pdsch.DataRePerLayer) << "a punctured CSI-RS takes nothing off the count";
    const auto before = slot.grid;
    const auto occupancyBefore = slot.occupancy;
    slot.mapCsiRs();

    // Its own group's elements take the CSI-RS; another group's are only reserved where free.
    std::set<std::size_t> own, other;
    for (const auto& [i, value] : csiRsElements(list)) {
        if (value == Sample{}) {
            other.insert(i);
            continue;
        }
        own.insert(i);
        EXPECT_LT(std::abs(slot.grid[0][i] - value), 1e-12);
        EXPECT_EQ(slot.occupancy[0][i], 1400);
    }
    int changed = 0, puncturedData = 0;
    for (std::size_t i = 0; i < before[0].size(); ++i) {
        if (own.count(i)) {
            puncturedData += occupancyBefore[0][i] == 7;
            continue;
        }
        const int expected = other.count(i) && occupancyBefore[0][i] == 0 ? 1401 : occupancyBefore[0][i];
        changed += slot.grid[0][i] != before[0][i] || slot.occupancy[0][i] != expected;
    }
    EXPECT_EQ(changed, 0);
    EXPECT_GT(puncturedData, 100);
    EXPECT_GT(own.size(), 100u);
}

}  // namespace
