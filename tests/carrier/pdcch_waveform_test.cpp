// PDCCH end to end: waveforms with DCIs in CORESETs of every kind generated through the C
// interface, demodulated at the symbol positions and decoded by a receiver written from the
// 3GPP text (tests/downlink/pdcch_reference.h): CCEs collected by the REG mapping of TS 38.211
// clause 7.3.2.2, DM-RS of clause 7.4.1.3 checked, data descrambled, polar-decoded, CRC and
// RNTI mask checked.

#include <gtest/gtest.h>

#include <cmath>
#include <complex>
#include <fstream>
#include <map>
#include <random>
#include <set>
#include <string>
#include <vector>

#include "../downlink/pdcch_reference.h"
#include "../engine/output_files.h"
#include "../engine/waveform_test_support.h"
#include "ofdm_receiver.h"
#include "test_support.h"

namespace {

using nrsynth_test::Receiver;
using nrsynth_test::Sample;
using pdcch_ref::Bits;

constexpr int kCarrierRbs = 51;  // 20 MHz at 30 kHz
constexpr double kPointA = -kCarrierRbs * 6 * 30000.0;
constexpr int kFirstSubcarrier = -kCarrierRbs * 6;  // common RB 0 from the carrier centre

/// What a UE is told about one DCI: its BWP, CORESET, search space and identities.
struct DciCase {
    std::string name;
    int cellId;
    int bwpOffset, bwpRbs;
    bool initialBwp;
    int coresetIndex, coresetId, symbols, coresetOffset, coresetRbs;
    std::string bitmap;
    bool interleaved;
    int L, R, shift;
    int firstSymbol, cces;
    std::string cceOffsets;
    std::string slots;
    int rnti, crnti, scramblingId;
    bool common;
    int payloadBits;
    bool autoDci;  // false: a PN9 payload stream
    double power, dmrsPower;
    std::string dciBits = {};  // the AutoDCI payload; empty: random bits seeded by the RNTI
};

/// The payload a UE expects of an AutoDCI case.
Bits expectedPayload(const DciCase& c) {
    std::string text = c.dciBits;
    if (text.empty()) {
        std::mt19937 random(static_cast<unsigned>(c.rnti));
        for (int i = 0; i < c.payloadBits; ++i) text += static_cast<char>('0' + random() % 2);
    }
    Bits bits;
    for (int i = 0; i < c.payloadBits; ++i) bits.push_back(text[static_cast<std::size_t>(i) % text.size()] == '1');
    return bits;
}

std::string bitText(const Bits& bits) {
    std::string text;
    for (char b : bits) text += static_cast<char>('0' + b);
    return text;
}

std::ostream& operator<<(std::ostream& out, const DciCase& c) { return out << c.name; }

std::vector<int> integers(const std::string& list) {
    std::vector<int> out;
    std::size_t start = 0;
    while (start < list.size()) {
        const auto comma = std::min(list.find(',', start), list.size());
        out.push_back(std::stoi(list.substr(start, comma - start)));
        start = comma + 1;
    }
    return out;
}

nlohmann::json document(const DciCase& c) {
    nlohmann::json coreset = {{"ID", c.coresetId},           {"SymbolNumber", c.symbols},
                              {"RBOffset", c.coresetOffset}, {"RBNumber", c.coresetRbs},
                              {"FrequencyDomainBitmap", c.bitmap},
                              {"CceMappingType", c.interleaved ? "Interleaved" : "NonInterleaved"},
                              {"CceInterleaved", c.interleaved}, {"RegBundleSize", c.L},
                              {"InterleaverSize", c.R},       {"ShiftIndex", c.shift}};
    nlohmann::json bwp = {{"InitialDLBWP", c.initialBwp}, {"NumberOfCoreset", c.coresetIndex + 1},
                          {"Name", "BWP1"},               {"Numerology", "SCS30k"},
                          {"Mu", 1},                      {"RBOffset", c.bwpOffset},
                          {"RBNumber", c.bwpRbs}};
    bwp["Coreset" + std::to_string(c.coresetIndex)] = coreset;
    nlohmann::json dci = {{"Name", c.name},
                          {"BWPIndex", 0},
                          {"CoresetIndex", c.coresetIndex},
                          {"FirstSymbol", c.firstSymbol},
                          {"SearchSpace", c.common ? "Common" : "UESpecific"},
                          {"AggregationLevel", c.cces},
                          {"NumberOfCCE", c.cces},
                          {"CCEOffsetStr", c.cceOffsets},
                          {"SlotIndexArrayStr", c.slots},
                          {"RNTI", c.rnti},
                          {"CRNTI", c.crnti},
                          {"PDCCHDMRSScramblingID", c.scramblingId},
                          {"AutoDCI", c.autoDci},
                          {"DCIBits", bitText(expectedPayload(c))},
                          {"DCIBitsLength", c.payloadBits},
                          {"PayloadSize", c.payloadBits},
                          {"PowerBoosting", c.power},
                          {"DMRSPowerBoosting", c.dmrsPower}};
    nlohmann::json carrier = {{"CarrierType", "DL"},
                              {"Numerology", "SCS30k"},
                              {"Mu", 1},
                              {"NumberOfRB", kCarrierRbs},
                              {"CellID", c.cellId},
                              {"FrequencyOffsetOfPointA", kPointA},
                              {"Downlink", {{"BWP", {bwp}}, {"DCI", {dci}}}}};
    return nrsynth_test::waveform(30.72e6, 1, {carrier});
}

/// The CORESET's RBs within the BWP in frequency order, with the common RB that numbers
/// their DM-RS (CORESET 0 of an initial BWP counts from its own first RB).
struct CoresetRb {
    int bwpRb, dmrsRb;
};

std::vector<CoresetRb> coresetRbs(const DciCase& c) {
    std::vector<CoresetRb> rbs;
    if (c.coresetId == 0 && c.initialBwp) {
        for (int i = 0; i < c.coresetRbs; ++i) rbs.push_back({c.coresetOffset + i, i});
        return rbs;
    }
    // frequencyDomainResources: groups of 6 RBs from the first common RB of the BWP that is
    // a multiple of 6, or from the rb-Offset given (TS 38.331 ControlResourceSet).
    const int start = c.coresetOffset >= 0 ? c.coresetOffset : (6 - c.bwpOffset % 6) % 6;
    const std::string& bitmap = c.bitmap;
    for (std::size_t g = 0; g < bitmap.size(); ++g)
        if (bitmap[g] == '1')
            for (int i = 0; i < 6; ++i) {
                const int r = start + 6 * static_cast<int>(g) + i;
                rbs.push_back({r, c.bwpOffset + r});
            }
    return rbs;
}

/// One PDCCH occasion as a UE receives it.
struct Occasion {
    Bits hard;                     // E hard bits in mapping order
    double worstDmrsEvmDb = -999;  // over the CORESET symbols
    double dataToDmrsDb = 0;       // level of the data against the DM-RS
    double strayLevel = 0;         // largest level on CORESET RBs the DCI does not use
};

Occasion receive(const Receiver& rx, const DciCase& c, int slot, int cceOffset) {
    const auto rbs = coresetRbs(c);
    const int regs = static_cast<int>(rbs.size()) * c.symbols;
    const auto used = pdcch_ref::cceRegs(cceOffset, c.cces, regs, c.interleaved, c.L, c.R, c.shift);
    std::vector<std::set<int>> rbsInSymbol(static_cast<std::size_t>(c.symbols));
    for (int g : used) rbsInSymbol[g % c.symbols].insert(g / c.symbols);  // REGs time first

    const int dmrsId = c.scramblingId == -1 ? c.cellId : c.scramblingId;
    Occasion occasion;
    double dataLevel = 0;
    int dataCount = 0;
    for (int l = 0; l < c.symbols; ++l) {
        const int symbol = 14 * slot + c.firstSymbol + l;
        const auto bins = rx.symbol(symbol);
        const auto bin = [&](int bwpRb, int k) {
            const int sc = kFirstSubcarrier + 12 * (c.bwpOffset + bwpRb) + k;
            return bins[static_cast<std::size_t>((sc + rx.fftSize) % rx.fftSize)];
        };
        const auto reference = pdcch_ref::dmrs(slot, c.firstSymbol + l, dmrsId, 3 * 300);
        std::vector<Sample> dmrsRx, dmrsRef, data;
        for (std::size_t i = 0; i < rbs.size(); ++i) {
            const bool inDci = rbsInSymbol[l].count(static_cast<int>(i)) > 0;
            for (int k = 0; k < 12; ++k) {
                const Sample value = bin(rbs[i].bwpRb, k);
                if (!inDci) {
                    occasion.strayLevel = std::max(occasion.strayLevel, std::abs(value));
                } else if (k % 4 == 1) {
                    dmrsRx.push_back(value);
                    dmrsRef.push_back(reference[static_cast<std::size_t>(3 * rbs[i].dmrsRb + k / 4)]);
                } else {
                    data.push_back(value);
                }
            }
        }
        Sample gain;
        occasion.worstDmrsEvmDb = std::max(occasion.worstDmrsEvmDb, nrsynth_test::evmDb(dmrsRx, dmrsRef, gain));
        for (const Sample& value : data) {
            const Sample equalised = value / gain;
            occasion.hard.push_back(equalised.real() < 0);
            occasion.hard.push_back(equalised.imag() < 0);
            dataLevel += std::abs(equalised);
            ++dataCount;
        }
    }
    occasion.dataToDmrsDb = 20 * std::log10(dataLevel / dataCount);
    return occasion;
}

/// Receives and decodes every occasion of `c` in the frames of `frames` (one receiver per
/// frame); unused CORESET RBs are checked to be empty when `alone`.
void checkEveryOccasion(const std::vector<Receiver>& frames, const DciCase& c, bool alone) {
    // TS 38.211 clause 7.3.2.3: n_RNTI is the C-RNTI in a UE-specific search space with a
    // scrambling identity configured, else 0; the common search space takes the cell identity.
    const bool configured = c.scramblingId != -1;
    const int nId = configured && !c.common ? c.scramblingId : c.cellId;
    const int nRnti = configured && !c.common ? c.crnti : 0;
    const auto slots = integers(c.slots);
    const auto offsets = integers(c.cceOffsets);
    std::set<Bits> payloads;
    for (std::size_t i = 0; i < slots.size(); ++i) {
        SCOPED_TRACE(c.name + ", slot " + std::to_string(slots[i]));
        ASSERT_LT(static_cast<std::size_t>(slots[i] / 20), frames.size());
        const Occasion occasion = receive(frames[slots[i] / 20], c, slots[i] % 20, offsets[i % offsets.size()]);
        EXPECT_LT(occasion.worstDmrsEvmDb, -30.0);
        if (alone) {
            EXPECT_LT(occasion.strayLevel, 0.02);
        }
        EXPECT_NEAR(occasion.dataToDmrsDb, -c.dmrsPower, 0.1);
        ASSERT_EQ(occasion.hard.size(), static_cast<std::size_t>(108 * c.cces));
        const auto dci = pdcch_ref::decodeDci(occasion.hard, c.payloadBits, nRnti, nId, c.rnti);
        EXPECT_TRUE(dci.crcOk);
        if (c.autoDci) {
            EXPECT_EQ(bitText(dci.payload), bitText(expectedPayload(c)));
        }
        payloads.insert(dci.payload);
        // A wrong RNTI or scrambling identity must not pass.
        EXPECT_FALSE(pdcch_ref::decodeDci(occasion.hard, c.payloadBits, nRnti, nId, c.rnti ^ 1).crcOk);
        EXPECT_FALSE(pdcch_ref::decodeDci(occasion.hard, c.payloadBits, nRnti + 1, nId, c.rnti).crcOk);
    }
    // A PN9 stream moves on between occasions; the DCIBits string repeats.
    EXPECT_EQ(payloads.size(), c.autoDci ? 1u : slots.size()) << c.name;
}

/// The frames of a generated file, one receiver each (30 kHz at 30.72 MHz).
std::vector<Receiver> receivers(const std::string& path, int frames) {
    const auto samples = nrsynth_test::readSamples(path);
    std::vector<Receiver> out;
    EXPECT_EQ(samples.size(), 307200u * static_cast<std::size_t>(frames));
    for (std::size_t f = 0; f + 1 <= samples.size() / 307200; ++f)
        out.emplace_back(std::vector<Sample>(samples.begin() + static_cast<long>(f * 307200),
                                             samples.begin() + static_cast<long>((f + 1) * 307200)),
                         1024, 1);
    return out;
}

class PdcchWaveform : public testing::TestWithParam<DciCase> {};

TEST_P(PdcchWaveform, EveryOccasionDecodesWithItsRntiAndIdentities) {
    const DciCase& c = GetParam();
    nrsynth_test::ScratchFolder folder;
    const auto path = folder.file("pdcch.bin");
    ASSERT_EQ(nrsynth_test::generate(document(c), path), 0) << GetLog();
    const auto frames = receivers(path, 1);
    ASSERT_EQ(frames.size(), 1u);
    checkEveryOccasion(frames, c, true);

    // Without an SS/PBCH block or PDSCH the PDCCH drives RF ALC: exactly its symbols.
    const auto markers = nrsynth_test::readMarkers(path + ".mkr");
    ASSERT_EQ(markers.size(), 307200u);
    constexpr unsigned char kAlc = 0x08;
    std::set<int> pdcchSymbols;
    for (int slot : integers(c.slots))
        for (int l = 0; l < c.symbols; ++l) pdcchSymbols.insert(14 * slot + c.firstSymbol + l);
    for (int symbol = 0; symbol < 280; ++symbol) {
        const long middle = frames[0].start[symbol] + frames[0].prefix[symbol] + 512;
        EXPECT_EQ((markers[static_cast<std::size_t>(middle)] & kAlc) != 0, pdcchSymbols.count(symbol) > 0) << symbol;
    }
}

// name, cell, BWP offset/RBs/initial, CORESET index/ID/symbols/RB offset/RBs/bitmap,
// interleaved L R shift, first symbol, CCEs, CCE offsets, slots, RNTI, C-RNTI, scrambling ID,
// common, A, AutoDCI, power, DM-RS power.
const DciCase kCases[] = {
    {"Coreset0InitialBwpCommonSiRnti", 101, 0, 51, true, 0, 0, 2, 4, 24, "", true, 6, 2, 101, 0, 4, "0,4",
     "0,1,10", 0xFFFF, 0x1234, -1, true, 39, true, 0, 0},
    {"NonInterleavedAggregation1", 17, 0, 51, false, 1, 1, 1, -1, 0, "11110000", false, 6, 1, 0, 0, 1, "0,3,2",
     "2,3,4", 0x4601, 0x4601, 500, false, 20, true, 0, 0},
    {"InterleavedWithHolesAggregation8", 17, 0, 51, false, 2, 2, 2, -1, 0, "101101", true, 6, 2, 7, 1, 8, "0",
     "5,6", 0x7A3C, 0x7A3C, -1, false, 44, true, 0, 0},
    {"InterleavedBundlesOf2Shifted", 250, 0, 51, false, 1, 3, 1, -1, 0, "111111", true, 2, 3, 5, 2, 2, "1,4",
     "7,8,9", 0x1001, 0x2002, 1000, false, 31, true, 0, 0},
    {"ThreeSymbolsAggregation16", 3, 0, 51, false, 1, 5, 3, -1, 0, "111111", true, 3, 6, 0, 0, 16, "2", "11",
     0xBEEF, 0x0042, 65535, false, 60, true, 0, 0},
    {"BwpStartOffTheSixGridCommonSearchSpace", 999, 3, 45, false, 2, 4, 2, -1, 0, "0111", false, 6, 1, 0, 4, 2,
     "4", "12,13", 0x0101, 0x0202, 3, true, 12, true, 0, 0},
    {"ExplicitRbOffsetPn9PayloadBoosted", 1007, 2, 40, false, 1, 1, 1, 5, 0, "11", false, 6, 1, 0, 0, 2,
     "0,0,0", "14,15,16", 0x5555, 0x6666, 12345, false, 27, false, 3.0, -3.0},
};

INSTANTIATE_TEST_SUITE_P(Cases, PdcchWaveform, testing::ValuesIn(kCases),
                         [](const testing::TestParamInfo<DciCase>& info) { return info.param.name; });

TEST(PdcchExample, EveryDciOfTheExampleDecodesBesideTheSsBurst) {
    std::ifstream in(nrsynth_test::sourceDir() / "examples" / "pdcch_coresets_30khz.json");
    const auto example = nlohmann::json::parse(in);
    nrsynth_test::ScratchFolder folder;
    const auto path = folder.file("example.bin");
    ASSERT_EQ(nrsynth_test::generate(example, path), 0) << GetLog();
    const int frameCount = example["NumberOfFrames"];
    const auto frames = receivers(path, frameCount);
    ASSERT_EQ(frames.size(), static_cast<std::size_t>(frameCount));

    const auto& carrier = example["NRCarriers"][0];
    const auto& bwp = carrier["Downlink"]["BWP"][0];
    ASSERT_EQ(carrier["FrequencyOffsetOfPointA"], kPointA);
    int decoded = 0;
    for (const auto& dci : carrier["Downlink"]["DCI"]) {
        const int index = dci["CoresetIndex"];
        const auto& coreset = bwp["Coreset" + std::to_string(index)];
        const DciCase c{dci["Name"],
                        carrier["CellID"],
                        bwp["RBOffset"],
                        bwp["RBNumber"],
                        bwp["InitialDLBWP"],
                        index,
                        coreset["ID"],
                        coreset["SymbolNumber"],
                        coreset["RBOffset"],
                        coreset["RBNumber"],
                        coreset["FrequencyDomainBitmap"],
                        coreset["CceInterleaved"],
                        coreset["RegBundleSize"],
                        coreset["InterleaverSize"],
                        coreset["ShiftIndex"],
                        dci["FirstSymbol"],
                        dci["NumberOfCCE"],
                        dci["CCEOffsetStr"],
                        dci["SlotIndexArrayStr"],
                        dci["RNTI"],
                        dci["CRNTI"],
                        dci["PDCCHDMRSScramblingID"],
                        dci["SearchSpace"] == "Common",
                        dci.value("AutoDCI", false) ? dci.value("DCIBitsLength", 20) : dci.value("PayloadSize", 20),
                        dci.value("AutoDCI", false),
                        dci.value("PowerBoosting", 0.0),
                        dci.value("DMRSPowerBoosting", 0.0),
                        dci.value("DCIBits", std::string())};
        EXPECT_EQ(dci["AggregationLevel"], c.cces);
        checkEveryOccasion(frames, c, false);
        decoded += static_cast<int>(integers(c.slots).size());
    }
    EXPECT_EQ(decoded, 24);
}

}  // namespace
