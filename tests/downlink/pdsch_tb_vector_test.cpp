// Published transport-block vectors (../shared/testvectors/tb): a transport block through CRC,
// segmentation, LDPC, rate matching with rv 0 and the full circular buffer, bit interleaving and
// scrambling with cInit = RNTI 2^15 + n_ID. The DL-SCH runs the same chain, so each vector
// whose G a PDSCH allocation can give exactly is replayed through the PDSCH generator: an
// allocation of N RBs over 13 data symbols (the DM-RS symbol holds two CDM groups and no data)
// gives G = 156 N Qm layers.

#include <gtest/gtest.h>

#include <algorithm>
#include <fstream>
#include <map>
#include <sstream>
#include <string>
#include <vector>

#include "downlink/pdsch_test_setup.h"
#include "test_support.h"

namespace {

struct TbVector {
    std::map<std::string, std::string> values;
    std::string tb, coded, scrambled;
    int number(const std::string& key) const { return std::stoi(values.at(key)); }
};

bool readVector(int index, TbVector& v) {
    std::ifstream in(nrsynth_test::sharedDir() / "testvectors" / "tb" / ("sionna_tb_testcase_" + std::to_string(index) + ".txt"));
    if (!in) return false;
    std::vector<std::string> lines;
    for (std::string line; std::getline(in, line);)
        if (!line.empty() && line[0] != '#') lines.push_back(line);
    if (lines.size() < 4) return false;
    std::istringstream fields(lines[0]);
    for (std::string field; fields >> field;) {
        const auto eq = field.find('=');
        if (eq != std::string::npos) v.values[field.substr(0, eq)] = field.substr(eq + 1);
    }
    v.tb = lines[1];
    v.coded = lines[2];
    v.scrambled = lines[3];
    return true;
}

struct VectorCase {
    int index;
    int rbs;  // N with 156 N Qm layers = G
};

class PdschTransportBlockVector : public ::testing::TestWithParam<VectorCase> {};

TEST_P(PdschTransportBlockVector, CodedAndScrambledBitsEqualTheVector) {
    NRSYNTH_REQUIRE_SHARED();
    TbVector v;
    ASSERT_TRUE(readVector(GetParam().index, v));
    const int a = v.number("TBS"), g = v.number("G"), qm = v.number("Qm"), layers = v.number("NL");
    const int rbs = GetParam().rbs;
    ASSERT_EQ(156 * rbs * qm * layers, g) << "no allocation gives this G";
    static const std::map<int, const char*> kModulation = {{2, "QPSK"}, {4, "QAM16"}, {6, "QAM64"}, {8, "QAM256"}};

    pdsch_setup::Patch patch;
    patch.bwp = {{"RBOffset", 0}, {"RBNumber", rbs}};
    patch.carrier = {{"FrequencyOffsetOfPointA", -6.0 * rbs * 30000.0}};
    patch.dlsch = {{"TransportBlockSize", a}, {"CodingRate", std::stod(v.values.at("coderate"))},
                   {"Modulation", kModulation.at(qm)}, {"NumberOfLayers", layers},
                   {"DMRSports", layers == 2 ? "0,1" : "0"}, {"AntennaPortArray", layers == 2 ? "1000,1001" : "1000"},
                   {"NumberOfDMRSCDMGroup", 2}, {"RNTI", v.number("n_RNTI")}, {"n_ID", v.number("n_ID")},
                   {"RBNumber", rbs}, {"PayloadData", {{"PayLoadDataType", "Pattern"}, {"PatternBits", v.tb}}}};
    pdsch_setup::PdschUnderTest setup(pdsch_setup::document(patch), 4096);
    setup.init();
    auto& gen = setup.generator;
    const auto& cw = gen.CodeWords[0];
    EXPECT_EQ(cw.Blocks, v.number("C"));
    EXPECT_EQ(cw.Z, v.number("Zc"));
    EXPECT_EQ(cw.BaseGraph, v.number("bg"));
    EXPECT_GE(cw.Nref, v.number("Ncb")) << "a limited buffer would cut the circular buffer";

    gen.Generate(0, 0, 0);
    ASSERT_EQ(cw.G, g);
    std::string e;
    for (int x : cw.PerBlockE) e += (e.empty() ? "" : ",") + std::to_string(x);
    EXPECT_EQ(e, v.values.at("E_list"));
    std::string tb, coded, scrambled;
    std::vector<char> tbBits;
    cw.appendTransportBlock(tbBits);
    for (int i = 0; i < a && i < static_cast<int>(tbBits.size()); ++i) tb += static_cast<char>('0' + tbBits[static_cast<std::size_t>(i)]);
    // Coded bits travel as symbols of Qm bits and the scrambling sequence as packed words.
    for (std::size_t k = 0; k < static_cast<std::size_t>(g); ++k) {
        const unsigned bit = (cw.CodedSymbols[k / static_cast<std::size_t>(qm)] >> (k % static_cast<std::size_t>(qm))) & 1u;
        coded += static_cast<char>('0' + bit);
        scrambled += static_cast<char>('0' + (bit ^ ((cw.PnWords[k / 64] >> (k % 64)) & 1u)));
    }
    EXPECT_EQ(tb, v.tb);
    EXPECT_TRUE(coded == v.coded) << "coded bits differ from bit " << std::mismatch(coded.begin(), coded.end(), v.coded.begin(), v.coded.end()).first - coded.begin();
    EXPECT_TRUE(scrambled == v.scrambled) << "scrambled bits differ from bit "
                                          << std::mismatch(scrambled.begin(), scrambled.end(), v.scrambled.begin(), v.scrambled.end()).first - scrambled.begin();
}

// Vectors 0 and 7: G not of the form 156 N Qm layers; vector 6: four layers, 144 blocks (too
// slow for a unit test).
INSTANTIATE_TEST_SUITE_P(Vectors, PdschTransportBlockVector,
                         ::testing::Values(VectorCase{3, 1}, VectorCase{1, 200}, VectorCase{2, 200}, VectorCase{4, 200},
                                           VectorCase{5, 200}),
                         [](const auto& info) { return "Vector" + std::to_string(info.param.index); });

}  // namespace
