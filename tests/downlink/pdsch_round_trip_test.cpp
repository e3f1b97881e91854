// PDSCH round trips through the frame store: the generator maps a slot, and a receiver written
// from TS 38.211 / 38.212 alone finds the data REs, demodulates, descrambles, de-rate-matches and
// checks every code block's systematic bits, the base graph's parity checks and the CRCs, and
// the DM-RS and PT-RS values.

#include <gtest/gtest.h>

#include <memory>
#include <nlohmann/json.hpp>
#include <string>

#include "downlink/pdsch_generator.h"
#include "downlink/pdsch_receiver.h"
#include "framework/json_serializer.h"
#include "models/nr5g_waveform_settings.h"

namespace {

using namespace pdsch_rx;
using Models::Nr5g::NR5GWaveformSettings;

// Pseudo-random payload pattern, handed out cyclically by the data source.
const std::string kPattern = "1011001110001011110100100001101101011100010010111101100";

struct Case {
    const char* name;
    const char* modulation;
    int qm;
    int layers;
    int tbs;
    double rate;
    int rbOffset, rbCount;
    int firstSymbol, lastSymbol;
    bool typeB;
    int dmrsType;    // 1 or 2
    bool doubleSymbol;
    int addPos;
    int cdmGroups;
    bool ptrs;
    std::vector<int> dmrsSymbols;  // TS 38.211 Tables 7.4.1.1.2-3/-4, absolute in the slot
};

const Case kCases[] = {
    {"Qam256TypeA", "QAM256", 8, 1, 14856, 0.3, 4, 40, 0, 13, false, 1, false, 1, 1, false, {2, 11}},
    {"Qam64TwoLayersTypeBPtrs", "QAM64", 6, 2, 3240, 0.16, 0, 24, 2, 8, true, 2, false, 1, 1, true, {2, 6}},
    {"QpskDoubleSymbolTwoGroups", "QPSK", 2, 1, 256, 0.1, 10, 10, 0, 13, false, 1, true, 1, 2, false, {2, 3, 10, 11}},
    {"Qam1024", "QAM1024", 10, 1, 2280, 0.2, 0, 8, 0, 13, false, 1, false, 0, 1, false, {2}},
    {"Psk8", "PSK8", 3, 1, 640, 0.2, 20, 8, 0, 13, false, 1, false, 0, 1, false, {2}},
};

constexpr int kCellId = 101, kRnti = 0x4321, kNId = 77, kFft = 1024, kBwpOffset = 3;
constexpr double kPointA = -9.0e6;  // -300 subcarriers of 30 kHz

nlohmann::json document(const Case& c) {
    std::string ports = "0", antennas = "1000";
    if (c.layers == 2) ports = "0,1", antennas = "1000,1001";
    nlohmann::json dlsch = {
        {"Name", "PDSCH"}, {"DMRSports", ports}, {"AntennaPortArray", antennas}, {"NumberOfLayers", c.layers},
        {"NumberOfCodewords", 1}, {"NumberOfDMRSCDMGroup", c.cdmGroups}, {"RNTI", kRnti}, {"n_ID", kNId},
        {"SlotIndexArrayStr", "0,1"}, {"FirstSymbol", c.firstSymbol}, {"LastSymbol", c.lastSymbol},
        {"SymbolNumber", c.lastSymbol - c.firstSymbol + 1}, {"BWPIndex", 0}, {"RBOffset", c.rbOffset},
        {"RBNumber", c.rbCount}, {"RAType", "RAType1"}, {"Modulation", c.modulation}, {"TransportBlockSize", c.tbs},
        {"CodingRate", c.rate}, {"DMRSConfigurationType", c.dmrsType == 1 ? "Type1" : "Type2"},
        {"DMRSDuration", c.doubleSymbol ? "DoubleSymbol" : "SingleSymbol"}, {"DMRSaddpos", c.addPos},
        {"PDSCHMappingType", c.typeB ? "B" : "A"}, {"DMRStypeApos", 2}, {"PTRSEnabled", c.ptrs}, {"K_PTRS", 2},
        {"L_PTRS", 1}, {"PTRSports", "0"}, {"PRBBundleSize", "Wideband"},
        {"PayloadData", {{"PayLoadDataType", "Pattern"}, {"PatternBits", kPattern}}}};
    nlohmann::json bwp = {{"Name", "BWP1"}, {"Numerology", "SCS30k"}, {"Mu", 1}, {"RBOffset", kBwpOffset}, {"RBNumber", 52}};
    return {{"SampleRateAuto", 30.72e6},
            {"NumberOfAntennas", c.layers},
            {"NRCarriers",
             {{{"CarrierType", "DL"}, {"CellID", kCellId}, {"FrequencyOffsetOfPointA", kPointA},
               {"Downlink", {{"BWP", {bwp}}, {"DLSCH", {dlsch}}}}}}}};
}

/// Bits `from` .. `from + count - 1` of the cyclic payload pattern.
Bits payload(long long from, int count) {
    Bits bits(static_cast<std::size_t>(count));
    for (int i = 0; i < count; ++i) bits[static_cast<std::size_t>(i)] = kPattern[static_cast<std::size_t>((from + i) % kPattern.size())] - '0';
    return bits;
}

class PdschRoundTrip : public ::testing::TestWithParam<Case> {};

TEST_P(PdschRoundTrip, ReceiverRecoversEveryCodeBlockAndReferenceSignal) {
    const Case& c = GetParam();
    Orvalis::Tessaline::JsonSerializer reader;
    auto root = std::dynamic_pointer_cast<NR5GWaveformSettings>(reader.deserialize(document(c).dump()));
    ASSERT_TRUE(root);
    auto carrier = root->NRCarriers->getValue()->getItem(0);
    auto dlsch = carrier->Downlink->getValue()->DLSCH->getValue()->getItem(0);
    auto bwp = carrier->Downlink->getValue()->BWP->getValue()->getItem(0);

    Orvalis_NR::PDSCH_Generator generator;
    std::vector<Orvalis_NR::PBCH_Generator*> pbch;
    std::vector<Orvalis_NR::PDCCH_Generator*> pdcch;
    std::vector<Orvalis_NR::PRS_Generator*> prs;
    ASSERT_TRUE(generator.Init(carrier.get(), dlsch.get(), bwp.get(), kFft, pbch, pdcch, prs));
    EXPECT_EQ(generator.DmrsSymbols, c.dmrsSymbols);

    const int symbols = 280;  // one frame at 30 kHz
    Orvalis_NR::SlotGrid grid(static_cast<std::size_t>(c.layers), std::vector<Sample>(static_cast<std::size_t>(symbols) * kFft));
    Orvalis_NR::OccupancyGrid occupancy(static_cast<std::size_t>(c.layers), std::vector<int>(grid[0].size(), 0));
    Orvalis_NR::OccupancyGrid flags(static_cast<std::size_t>(c.layers), std::vector<int>(symbols, 0));
    generator.Map(grid, occupancy, 0, flags, true);

    const Segmentation seg(c.tbs, c.rate);
    const int pointA = static_cast<int>(kPointA / 30000);
    auto isDmrs = [&](int l) { return std::find(c.dmrsSymbols.begin(), c.dmrsSymbols.end(), l) != c.dmrsSymbols.end(); };
    // PT-RS with L = 1 sits in every data symbol without DM-RS, K = 2, k_ref^RE 0 for port 1000
    // (TS 38.211 Table 7.4.1.2.2-1, offset00), k_ref^RB from the RNTI.
    const int krefRb = c.rbCount % 2 == 0 ? kRnti % 2 : kRnti % (c.rbCount % 2);

    for (int slot = 0; slot < 2; ++slot) {
        SCOPED_TRACE("slot " + std::to_string(slot));
        std::vector<std::vector<Sample>> layers(static_cast<std::size_t>(c.layers));
        int dmrsChecked = 0, ptrsChecked = 0;
        for (int l = c.firstSymbol; l <= c.lastSymbol; ++l) {
            const int line = (14 * slot + l) * kFft;
            const Bits dmrsBits = gold(dmrsCInit(14, slot, l, kCellId, 0), 2 * 12 * (kBwpOffset + 52));
            const Bits ptrsBits = gold(dmrsCInit(14, slot, c.dmrsSymbols[0], kCellId, 0), 2 * 12 * (kBwpOffset + 52));
            for (int i = 0; i < c.rbCount; ++i) {
                const int p = c.rbOffset + i;
                for (int j = 0; j < 12; ++j) {
                    const int kCrb = 12 * (kBwpOffset + p) + j;
                    int column = pointA + kCrb;
                    if (column < 0) column += kFft;
                    const std::size_t at = static_cast<std::size_t>(line + column);
                    if (isDmrs(l)) {
                        // CDM group g covers k with k - Delta(g) in {0, 2} mod 4 (type 1) or {0, 1} mod 6.
                        const int group = c.dmrsType == 1 ? j % 2 : (j % 6) / 2;
                        if (group < c.cdmGroups) {
                            if (group == 0) {
                                const int m = c.dmrsType == 1 ? kCrb / 2 : 2 * (kCrb / 6) + kCrb % 6;
                                EXPECT_LT(std::abs(grid[0][at] - dmrsValue(dmrsBits, m)), 1e-12) << "DM-RS l " << l << " k " << kCrb;
                                ++dmrsChecked;
                            }
                            continue;
                        }
                    } else if (c.ptrs && j == 0 && (i - krefRb) % 2 == 0) {
                        const int m = c.dmrsType == 1 ? kCrb / 2 : 2 * (kCrb / 6);
                        EXPECT_LT(std::abs(grid[0][at] - dmrsValue(ptrsBits, m)), 1e-12) << "PT-RS l " << l << " k " << kCrb;
                        ++ptrsChecked;
                        continue;
                    }
                    for (int layer = 0; layer < c.layers; ++layer) layers[static_cast<std::size_t>(layer)].push_back(grid[static_cast<std::size_t>(layer)][at]);
                }
            }
        }
        EXPECT_GT(dmrsChecked, 0);
        if (c.ptrs) {
            EXPECT_GT(ptrsChecked, 0);
        }
        const std::size_t perLayer = layers[0].size();
        ASSERT_EQ(static_cast<std::size_t>(generator.DataRePerLayer), perLayer);

        // Layer demapping (TS 38.211 clause 7.3.1.3), demodulation, descrambling (7.3.1.1, q = 0).
        std::vector<Sample> stream;
        for (std::size_t i = 0; i < perLayer; ++i)
            for (const auto& layer : layers) stream.push_back(layer[i]);
        Bits bits = demap(stream, c.qm);
        const Bits scrambling = gold(static_cast<std::uint32_t>(kRnti) * 32768u + kNId, static_cast<int>(bits.size()));
        for (std::size_t i = 0; i < bits.size(); ++i) bits[i] ^= scrambling[i];

        // The transport block of this slot and its CRC, then block by block.
        Bits tb = payload(static_cast<long long>(slot) * c.tbs, c.tbs);
        const Bits tbCrc = crc(tb, c.tbs > 3824 ? 24 : 16, c.tbs > 3824 ? kCrc24A : kCrc16);
        tb.insert(tb.end(), tbCrc.begin(), tbCrc.end());
        const int g = static_cast<int>(bits.size());
        const int perBlock = g / (c.layers * c.qm);
        std::size_t offset = 0, taken = 0;
        for (int r = 0; r < seg.blocks; ++r) {
            SCOPED_TRACE("code block " + std::to_string(r));
            const int e = c.layers * c.qm * (r <= seg.blocks - perBlock % seg.blocks - 1 ? perBlock / seg.blocks : (perBlock + seg.blocks - 1) / seg.blocks);
            Bits info(tb.begin() + static_cast<std::ptrdiff_t>(taken), tb.begin() + static_cast<std::ptrdiff_t>(taken + seg.kPrime - seg.crcPerBlock));
            taken += static_cast<std::size_t>(seg.kPrime - seg.crcPerBlock);
            if (seg.crcPerBlock) {
                const Bits blockCrc = crc(info, 24, kCrc24B);
                info.insert(info.end(), blockCrc.begin(), blockCrc.end());
            }
            const Bits f(bits.begin() + static_cast<std::ptrdiff_t>(offset), bits.begin() + static_cast<std::ptrdiff_t>(offset + e));
            offset += static_cast<std::size_t>(e);
            const int n = (seg.graph == 1 ? 66 : 50) * seg.z;
            const BlockCheck check = checkBlock(deinterleave(f, c.qm), info, seg.graph, seg.z, n);
            EXPECT_EQ(check.systematicErrors, 0);
            EXPECT_EQ(check.parityFailures, 0) << "whole circular buffer expected in this case";
        }
        EXPECT_EQ(offset, bits.size() - bits.size() % static_cast<std::size_t>(c.layers * c.qm));
    }
}

INSTANTIATE_TEST_SUITE_P(Cases, PdschRoundTrip, ::testing::ValuesIn(kCases),
                         [](const auto& info) { return std::string(info.param.name); });

}  // namespace
