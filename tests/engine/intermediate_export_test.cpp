// Intermediate data export through the C interface: a small downlink waveform with SS/PBCH, one
// DCI and one PDSCH is generated with the export on, and every exported stage is checked
// against the coding chain of TS 38.211 / 38.212 as the test references compute it from the
// stage before; the multiplexed frame store must equal the exported frame after the cyclic
// prefix demodulated by the test's own transform.

#include <gtest/gtest.h>

#include <cmath>
#include <complex>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <ostream>
#include <set>
#include <sstream>
#include <string>
#include <vector>

#include "carrier/ofdm_receiver.h"
#include "downlink/pdcch_reference.h"
#include "downlink/pdsch_receiver.h"
#include "downlink/ssb_reference.h"
#include "engine/output_files.h"
#include "engine/test_vector_generator.h"
#include "engine/waveform_test_support.h"

namespace {

using Sample = std::complex<double>;
namespace fs = std::filesystem;

constexpr int kCellId = 101, kRnti = 0x4321, kNId = 77, kDciId = 500, kSlot = 5;
constexpr int kTbs = 3240, kQm = 4, kCces = 4, kDciBits = 40;
constexpr double kRate = 0.3;
const std::string kPattern = "1011001110001011110100100001101101011100010010111101100";

/// 51 RBs at 30 kHz and 30.72 MHz: SS/PBCH Case C, a DCI in a one-symbol CORESET and a 16QAM
/// PDSCH on symbols 2..13 of slot 5. Without the window the symbols start exactly after their
/// prefixes.
nlohmann::json document(bool withChannels = true) {
    nlohmann::json coreset = {{"ID", 1},
                              {"SymbolNumber", 1},
                              {"RBOffset", 0},
                              {"RBNumber", 48},
                              {"FrequencyDomainBitmap", "11111111"},
                              {"CceMappingType", "NonInterleaved"},
                              {"CceInterleaved", false},
                              {"RegBundleSize", 6},
                              {"InterleaverSize", 2},
                              {"ShiftIndex", 0}};
    nlohmann::json bwp = {{"InitialDLBWP", false}, {"NumberOfCoreset", 2}, {"Name", "BWP1"}, {"Numerology", "SCS30k"},
                          {"Mu", 1},               {"RBOffset", 0},        {"RBNumber", 51},    {"Coreset1", coreset}};
    nlohmann::json dci = {{"Name", "DCI"},         {"BWPIndex", 0},          {"CoresetIndex", 1},
                          {"FirstSymbol", 0},       {"SearchSpace", "UESpecific"}, {"AggregationLevel", kCces},
                          {"NumberOfCCE", kCces},   {"CCEOffsetStr", "0"},    {"SlotIndexArrayStr", std::to_string(kSlot)},
                          {"RNTI", kRnti},          {"CRNTI", kRnti},         {"PDCCHDMRSScramblingID", kDciId},
                          {"AutoDCI", false},       {"DCIBitsLength", kDciBits}, {"PayloadSize", kDciBits}};
    nlohmann::json dlsch = {
        {"Name", "PDSCH"}, {"DMRSports", "0"}, {"AntennaPortArray", "1000"}, {"NumberOfLayers", 1},
        {"NumberOfCodewords", 1}, {"NumberOfDMRSCDMGroup", 1}, {"RNTI", kRnti}, {"n_ID", kNId},
        {"SlotIndexArrayStr", std::to_string(kSlot)}, {"FirstSymbol", 2}, {"LastSymbol", 13}, {"SymbolNumber", 12},
        {"BWPIndex", 0}, {"RBOffset", 0}, {"RBNumber", 51}, {"RAType", "RAType1"}, {"Modulation", "QAM16"},
        {"TransportBlockSize", kTbs}, {"CodingRate", kRate}, {"DMRSConfigurationType", "Type1"},
        {"DMRSDuration", "SingleSymbol"}, {"DMRSaddpos", 0}, {"PDSCHMappingType", "A"}, {"DMRStypeApos", 2},
        {"PTRSEnabled", false}, {"PRBBundleSize", "Wideband"},
        {"PayloadData", {{"PayLoadDataType", "Pattern"}, {"PatternBits", kPattern}}}};
    nlohmann::json ssb = {{"Enabled", true},     {"Numerology", "SCS30k"}, {"Mu", 1},      {"SSBlockPattern", "CaseC"},
                          {"Lmax", 8},           {"PowerLevelStr", "1"},   {"FrequencyOffset", -120}};
    nlohmann::json downlink = {{"BWP", nlohmann::json::array({bwp})}, {"SSPBCH", ssb}};
    if (withChannels) {
        downlink["DCI"] = nlohmann::json::array({dci});
        downlink["DLSCH"] = nlohmann::json::array({dlsch});
    }
    nlohmann::json carrier = {{"CarrierType", "DL"}, {"Numerology", "SCS30k"}, {"Mu", 1},
                              {"NumberOfRB", 51},    {"CellID", kCellId},     {"FrequencyOffsetOfPointA", -51 * 6 * 30000.0},
                              {"BasebandFilter", false}, {"WindowBeta", 0.0}, {"Downlink", downlink}};
    auto waveform = nrsynth_test::waveform(30.72e6, 1, carrier);
    waveform["PhaseCompensation"] = "Off";  // the frame store and the samples differ by no rotation
    return waveform;
}

/// StartDeserialize and InitEngine, then the export as `exportCall` sets it, then RunEngine.
template <class ExportCall>
int generate(const nlohmann::json& doc, const std::string& output, ExportCall&& exportCall) {
    StartDeserialize(doc.dump().c_str());
    if (GetStatus() != 0) return GetStatus();
    InitEngine(output.c_str());
    if (GetStatus() != 0) return GetStatus();
    exportCall();
    RunEngine();
    return GetStatus();
}

void exportTo(bool enable, std::string folder) {
    std::vector<char> text(folder.begin(), folder.end());
    text.push_back('\0');
    InitTestVectorGenerator(enable, text.data());
}

std::set<std::string> filesIn(const fs::path& folder) {
    std::set<std::string> names;
    std::error_code error;
    for (const auto& entry : fs::directory_iterator(folder, error)) names.insert(entry.path().filename().string());
    return names;
}

std::vector<int> readIntegers(const fs::path& file) {
    std::ifstream in(file);
    std::vector<int> values;
    for (int v; in >> v;) values.push_back(v);
    return values;
}

std::vector<char> readBits(const fs::path& file) {
    const auto values = readIntegers(file);
    return std::vector<char>(values.begin(), values.end());
}

std::vector<Sample> readComplex(const fs::path& file) {
    std::ifstream in(file);
    std::vector<Sample> values;
    for (double re, im; in >> re >> im;) values.emplace_back(re, im);
    return values;
}

/// QPSK of TS 38.211 clause 5.1.3 for each pair of bits.
std::vector<Sample> qpsk(const std::vector<char>& bits) {
    std::vector<Sample> symbols;
    for (std::size_t i = 0; i + 1 < bits.size(); i += 2)
        symbols.emplace_back((1 - 2 * bits[i]) / std::sqrt(2.0), (1 - 2 * bits[i + 1]) / std::sqrt(2.0));
    return symbols;
}

/// Largest distance between two sequences of the same length (the files keep six digits).
double worstError(const std::vector<Sample>& a, const std::vector<Sample>& b) {
    EXPECT_EQ(a.size(), b.size());
    double worst = 0;
    for (std::size_t i = 0; i < std::min(a.size(), b.size()); ++i) worst = std::max(worst, std::abs(a[i] - b[i]));
    return worst;
}

std::vector<char> concat(std::vector<char> a, const std::vector<char>& b) {
    a.insert(a.end(), b.begin(), b.end());
    return a;
}

class IntermediateExport : public ::testing::Test {
  protected:
    static void SetUpTestSuite() {
        folder_ = new nrsynth_test::ScratchFolder();
        fs::create_directories(folder_->path() / "Intermediate Data");
        status_ = generate(document(), folder_->file("wave.bin"), [] { exportTo(true, folder_->path().string()); });
    }
    static void TearDownTestSuite() {
        delete folder_;
        folder_ = nullptr;
    }
    void SetUp() override { ASSERT_EQ(status_, 0) << GetLog(); }
    static fs::path file(const std::string& name) { return folder_->path() / "Intermediate Data" / name; }

    static inline nrsynth_test::ScratchFolder* folder_ = nullptr;
    static inline int status_ = -1;
};

TEST_F(IntermediateExport, WritesOneFilePerStageOfEachChannelAndOfTheFrame) {
    std::set<std::string> expected = {"DL_Tx_PBCH0Pss.txt", "DL_Tx_PBCH0Sss.txt", "DL_Tx_Mux_Ant0_Mux_Out.txt",
                                      "DL_Tx_CPAdd_Ant0_CPAdd_Out.txt"};
    for (const char* channel : {"PBCH0", "PDCCH0", "PDSCH0"})
        for (const char* stage : {"_CRC_In", "_CRC_Out", "_Enc_Out", "_RM_Out", "_Mod_Out", "_DMRS"})
            expected.insert(std::string("DL_Tx_") + channel + stage + ".txt");
    EXPECT_EQ(filesIn(folder_->path() / "Intermediate Data"), expected);
    EXPECT_EQ(filesIn(folder_->path()), (std::set<std::string>{"Intermediate Data", "wave.bin", "wave.bin.mkr"}));
}

TEST_F(IntermediateExport, PbchStagesFollowTheCodingChainOfTheFirstBlock) {
    const auto pss = readIntegers(file("DL_Tx_PBCH0Pss.txt"));
    const auto sss = readIntegers(file("DL_Tx_PBCH0Sss.txt"));
    EXPECT_EQ(pss, ssb_ref::pss(kCellId % 3));
    EXPECT_EQ(sss, ssb_ref::sss(kCellId / 3, kCellId % 3));

    // CRC24C over the interleaved, scrambled payload a' (TS 38.212 clauses 7.1.1 to 7.1.3),
    // polar coding with the input interleaver (clause 5.3.1) and rate matching (5.4.1).
    const auto in = readBits(file("DL_Tx_PBCH0_CRC_In.txt"));
    ASSERT_EQ(in.size(), 32u);
    auto word = in;
    const unsigned parity = ssb_ref::crc24cRemainder(word);
    for (int b = 23; b >= 0; --b) word.push_back(static_cast<char>((parity >> b) & 1));
    EXPECT_EQ(readBits(file("DL_Tx_PBCH0_CRC_Out.txt")), word);
    const auto d = readBits(file("DL_Tx_PBCH0_Enc_Out.txt"));
    EXPECT_EQ(d, polar_ref::butterfly(polar_ref::encoderInput(word, 864, 9, 1, 0, 0)));
    const auto e = readBits(file("DL_Tx_PBCH0_RM_Out.txt"));
    EXPECT_EQ(e, polar_ref::rateMatch(d, 56, 864, 0));

    // Block 0: the second scrambling starts at v = 0 (TS 38.211 clause 7.3.3.1); DM-RS with
    // i-bar 0 (clause 7.4.1.4.1).
    auto scrambled = e;
    const auto c = ssb_ref::goldSequence(kCellId, 864);
    for (std::size_t n = 0; n < scrambled.size(); ++n) scrambled[n] ^= c[n];
    EXPECT_LT(worstError(readComplex(file("DL_Tx_PBCH0_Mod_Out.txt")), qpsk(scrambled)), 1e-5);
    EXPECT_LT(worstError(readComplex(file("DL_Tx_PBCH0_DMRS.txt")), ssb_ref::pbchDmrs(0, kCellId)), 1e-5);
}

TEST_F(IntermediateExport, PdcchStagesFollowTheCodingChainOfTheDci) {
    // TS 38.212 clause 7.3.2: CRC24C over 24 ones and the payload, last 16 bits RNTI-masked.
    const auto a = readBits(file("DL_Tx_PDCCH0_CRC_In.txt"));
    ASSERT_EQ(a.size(), static_cast<std::size_t>(kDciBits));
    auto parity = pdcch_ref::crc24c(a);
    const auto mask = pdcch_ref::rntiBits(kRnti);
    for (int i = 0; i < 16; ++i) parity[8 + i] ^= mask[i];
    const auto word = concat(a, parity);
    EXPECT_EQ(readBits(file("DL_Tx_PDCCH0_CRC_Out.txt")), word);

    const int e = 108 * kCces;  // 54 data REs per CCE, QPSK
    const auto d = readBits(file("DL_Tx_PDCCH0_Enc_Out.txt"));
    EXPECT_EQ(d, polar_ref::butterfly(polar_ref::encoderInput(word, e, 9, 1, 0, 0)));
    const auto rateMatched = readBits(file("DL_Tx_PDCCH0_RM_Out.txt"));
    EXPECT_EQ(rateMatched, polar_ref::rateMatch(d, kDciBits + 24, e, 0));

    // TS 38.211 clause 7.3.2.3: cInit = n_RNTI 2^16 + n_ID with the configured identity.
    auto scrambled = rateMatched;
    const auto c = pdcch_ref::gold(static_cast<std::uint32_t>((kRnti << 16) + kDciId), e);
    for (int n = 0; n < e; ++n) scrambled[static_cast<std::size_t>(n)] ^= c[static_cast<std::size_t>(n)];
    EXPECT_LT(worstError(readComplex(file("DL_Tx_PDCCH0_Mod_Out.txt")), qpsk(scrambled)), 1e-5);

    // The DM-RS of the CORESET symbol from common RB 0 up (clause 7.4.1.3.1).
    const auto dmrs = readComplex(file("DL_Tx_PDCCH0_DMRS.txt"));
    ASSERT_GE(dmrs.size(), 3u * 48);
    EXPECT_LT(worstError(dmrs, pdcch_ref::dmrs(kSlot, 0, kDciId, static_cast<int>(dmrs.size()))), 1e-5);
}

TEST_F(IntermediateExport, PdschStagesFollowTheCodingChainOfTheTransportBlock) {
    using pdsch_rx::Bits;
    // Slot 5 is the first the item sends: the transport block is the start of the pattern.
    const auto a = readIntegers(file("DL_Tx_PDSCH0_CRC_In.txt"));
    ASSERT_EQ(a.size(), static_cast<std::size_t>(kTbs));
    for (int i = 0; i < kTbs; ++i)
        ASSERT_EQ(a[static_cast<std::size_t>(i)], kPattern[static_cast<std::size_t>(i) % kPattern.size()] - '0') << i;
    auto tb = a;
    const auto crc = pdsch_rx::crc(a, 16, pdsch_rx::kCrc16);  // CRC16 up to 3824 bits
    tb.insert(tb.end(), crc.begin(), crc.end());
    EXPECT_EQ(readIntegers(file("DL_Tx_PDSCH0_CRC_Out.txt")), tb);

    // One code block of base graph 2 (TS 38.212 clauses 5.2.2, 7.2.2): d holds c from 2Z on,
    // the fillers as -2, and with them as zeros the lifted word meets every parity check.
    const pdsch_rx::Segmentation seg(kTbs, kRate);
    ASSERT_EQ(seg.blocks, 1);
    const int z = seg.z, k = (seg.graph == 1 ? 22 : 10) * z, n = (seg.graph == 1 ? 66 : 50) * z;
    const auto d = readIntegers(file("DL_Tx_PDSCH0_Enc_Out.txt"));
    ASSERT_EQ(d.size(), static_cast<std::size_t>(n));
    for (int i = 2 * z; i < k; ++i)
        ASSERT_EQ(d[static_cast<std::size_t>(i - 2 * z)], i < seg.kPrime ? tb[static_cast<std::size_t>(i)] : -2) << i;
    Bits word(tb.begin(), tb.begin() + 2 * z);
    for (int v : d) word.push_back(v == -2 ? 0 : v);
    EXPECT_EQ(pdsch_rx::failedChecks(seg.graph, z, word), 0);

    // Bit selection from k0 = 0 of redundancy version 0, fillers skipped (clause 5.4.2.1), then
    // the bit interleaver (clause 5.4.2.2).
    const auto f = readIntegers(file("DL_Tx_PDSCH0_RM_Out.txt"));
    ASSERT_GT(f.size(), 0u);
    ASSERT_EQ(f.size() % kQm, 0u);
    const auto e = pdsch_rx::deinterleave(f, kQm);
    for (std::size_t i = 0, j = 0; i < e.size(); ++j) {
        const int bit = d[j % static_cast<std::size_t>(n)];
        if (bit == -2) continue;
        ASSERT_EQ(e[i], bit) << "e " << i;
        ++i;
    }

    // Scrambling with cInit = n_RNTI 2^15 + n_ID and 16QAM (TS 38.211 clauses 7.3.1.1, 7.3.1.2).
    const auto c = pdsch_rx::gold(static_cast<std::uint32_t>((kRnti << 15) + kNId), static_cast<int>(f.size()));
    const auto points = pdsch_rx::constellation(kQm);
    std::vector<Sample> expected;
    for (std::size_t i = 0; i < f.size(); i += kQm) {
        unsigned index = 0;
        for (int b = 0; b < kQm; ++b) index = (index << 1) | static_cast<unsigned>(f[i + b] ^ c[i + b]);
        expected.push_back(points[index]);
    }
    EXPECT_LT(worstError(readComplex(file("DL_Tx_PDSCH0_Mod_Out.txt")), expected), 1e-5);

    // DM-RS of symbol 2, port 1000, from common RB 0 (clause 7.4.1.1.1).
    const auto dmrs = readComplex(file("DL_Tx_PDSCH0_DMRS.txt"));
    ASSERT_EQ(dmrs.size(), 6u * 51);
    const auto dmrsBits = pdsch_rx::gold(pdsch_rx::dmrsCInit(14, kSlot, 2, kCellId, 0), 2 * 6 * 51);
    std::vector<Sample> reference;
    for (int m = 0; m < 6 * 51; ++m) reference.push_back(pdsch_rx::dmrsValue(dmrsBits, m));
    EXPECT_LT(worstError(dmrs, reference), 1e-5);
}

TEST_F(IntermediateExport, MultiplexedFrameIsTheDemodulatedFrameBeforeFiltering) {
    const auto grid = readComplex(file("DL_Tx_Mux_Ant0_Mux_Out.txt"));
    const auto samples = readComplex(file("DL_Tx_CPAdd_Ant0_CPAdd_Out.txt"));
    ASSERT_EQ(grid.size(), 280u * 1024);
    ASSERT_EQ(samples.size(), 307200u);
    const nrsynth_test::Receiver rx(samples, 1024, 1);
    double worst = 0, strongest = 0;
    for (int l = 0; l < 280; ++l) {
        const auto bins = rx.symbol(l);
        for (int k = 0; k < 1024; ++k) {
            const Sample value = grid[static_cast<std::size_t>(l * 1024 + k)];
            worst = std::max(worst, std::abs(bins[static_cast<std::size_t>(k)] - value));
            strongest = std::max(strongest, std::abs(value));
        }
    }
    EXPECT_GT(strongest, 0.5);  // the frame carries the channels
    EXPECT_LT(worst, 1e-3);
}

// Without the call, with the call switched off, or with a folder that cannot be written, the
// waveform is the same and no text file appears; a trailing separator of either kind changes
// nothing.
struct FolderCase {
    const char* name;
    bool call, enable;
    const char* suffix;  // appended to the scratch folder
    bool filesExpected;
    friend void PrintTo(const FolderCase& c, std::ostream* os) { *os << c.name; }
};

class ExportFolder : public ::testing::TestWithParam<FolderCase> {};

TEST_P(ExportFolder, WritesTheExportOnlyWhereAsked) {
    const auto& c = GetParam();
    nrsynth_test::ScratchFolder folder;
    const auto exportFolder = folder.path() / "export";
    fs::create_directories(exportFolder / "Intermediate Data");
    const std::string given = exportFolder.string() + c.suffix;
    const auto status = generate(document(false), folder.file("wave.bin"), [&] {
        if (c.call) exportTo(c.enable, given);
    });
    ASSERT_EQ(status, 0) << GetLog();
    EXPECT_EQ(fs::file_size(folder.file("wave.bin")), 307200u * sizeof(Sample));
    const auto files = filesIn(exportFolder / "Intermediate Data");
    if (c.filesExpected) {
        EXPECT_EQ(files, (std::set<std::string>{"DL_Tx_PBCH0Pss.txt", "DL_Tx_PBCH0Sss.txt", "DL_Tx_PBCH0_CRC_In.txt",
                                                "DL_Tx_PBCH0_CRC_Out.txt", "DL_Tx_PBCH0_Enc_Out.txt",
                                                "DL_Tx_PBCH0_RM_Out.txt", "DL_Tx_PBCH0_Mod_Out.txt",
                                                "DL_Tx_PBCH0_DMRS.txt", "DL_Tx_Mux_Ant0_Mux_Out.txt",
                                                "DL_Tx_CPAdd_Ant0_CPAdd_Out.txt"}));
    } else {
        EXPECT_TRUE(files.empty());
    }
    EXPECT_EQ(filesIn(folder.path()), (std::set<std::string>{"export", "wave.bin", "wave.bin.mkr"}));
}

INSTANTIATE_TEST_SUITE_P(Cases, ExportFolder,
                         ::testing::Values(FolderCase{"NotCalled", false, false, "", false},
                                           FolderCase{"SwitchedOff", true, false, "", false},
                                           FolderCase{"Plain", true, true, "", true},
                                           FolderCase{"TrailingSlash", true, true, "/", true},
                                           FolderCase{"TrailingBackslashes", true, true, "\\\\", true},
                                           FolderCase{"MissingFolder", true, true, "/absent", false}),
                         [](const auto& info) { return std::string(info.param.name); });

// The text forms: integers one a line, complex "%0.6g %0.6g" with "0 0" for an exact zero, and
// nothing lost at the boundary of a write block.
TEST(ExportSaveBuffer, WritesTheTextFormsLineByLine) {
    nrsynth_test::ScratchFolder folder;
    Orvalis_NR::TestVectorGenerator generator;
    std::vector<char> bits = {0, 1, -1, 1};
    std::vector<int> coded = {-2, 0, 1, 123456};
    generator.SaveBuffer(bits, folder.file("bits.txt"));
    generator.SaveBuffer(coded, folder.file("coded.txt"));
    auto text = [&](const char* name) {
        std::ifstream in(folder.file(name));
        std::stringstream all;
        all << in.rdbuf();
        return all.str();
    };
    EXPECT_EQ(text("bits.txt"), "0\n1\n-1\n1\n");
    EXPECT_EQ(text("coded.txt"), "-2\n0\n1\n123456\n");

    std::vector<Sample> samples = {{0.0, 0.0}, {-0.0, 0.0}, {1.23456789, -0.5}, {1e-7, 0.0}, {0.0, 2.0}, {123456789.0, 3.0}};
    generator.SaveBuffer(samples, folder.file("samples.txt"));
    EXPECT_EQ(text("samples.txt"), "0 0\n0 0\n1.23457 -0.5\n1e-07 0\n0 2\n1.23457e+08 3\n");

    // Past one block of 100000 samples; a rewrite replaces the file.
    std::vector<Sample> many(100003);
    for (std::size_t i = 0; i < many.size(); ++i) many[i] = Sample(static_cast<double>(i), 0.0);
    generator.SaveBuffer(many, folder.file("samples.txt"));
    const auto back = readComplex(folder.file("samples.txt"));
    ASSERT_EQ(back.size(), many.size());
    EXPECT_EQ(back[99999], Sample(99999.0, 0.0));
    EXPECT_EQ(back[100002], Sample(100002.0, 0.0));
}

}  // namespace
