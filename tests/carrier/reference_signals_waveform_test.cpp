// The CSI-RS/TRS/PRS example end to end: generated through the C interface, demodulated by the
// test's own transform, and checked against TS 38.211 worked in the test: the 32-port CDM8
// CSI-RS and the TRS element by element (clauses 7.4.1.5.2, 7.4.1.5.3), the PRS with its muted
// period (clause 7.4.1.7), and the PDSCH that rate-matches around the CSI-RS and TRS decoded
// block by block in the slots that hold them.

#include <gtest/gtest.h>

#include <cmath>
#include <complex>
#include <fstream>
#include <set>
#include <vector>

#include "../downlink/csi_rs_reference.h"
#include "../downlink/pdsch_receiver.h"
#include "../engine/output_files.h"
#include "../engine/waveform_test_support.h"
#include "ofdm_receiver.h"
#include "test_support.h"

namespace {

using namespace pdsch_rx;

const std::string kPattern = "1110010100011011010011100001011011110010001101";
constexpr int kPointA = -306;  // FrequencyOffsetOfPointA / 30 kHz
constexpr int kRbs = 51, kNId = 42;

/// PRS r(0..count-1) of clause 7.4.1.7.2 for symbol l of slot n_s.
std::vector<Sample> prsSequence(int slot, int l, int nId, int count) {
    const std::uint64_t cInit = ((std::uint64_t{1} << 10) * static_cast<std::uint64_t>(14 * slot + l + 1) *
                                     static_cast<std::uint64_t>(2 * (nId % 1024) + 1) +
                                 static_cast<std::uint64_t>(nId % 1024)) %
                                (std::uint64_t{1} << 31);
    const auto c = gold(static_cast<std::uint32_t>(cInit), 2 * count);
    std::vector<Sample> r;
    for (int m = 0; m < count; ++m)
        r.push_back(pdsch_rx::dmrsValue(c, m));  // QPSK of TS 38.211 clause 5.1.3
    return r;
}

class ReferenceSignalsWaveform : public ::testing::Test {
  protected:
    static void SetUpTestSuite() {
        std::ifstream in(nrsynth_test::sourceDir() / "examples" / "csirs_trs_prs_30khz.json");
        document_ = new nlohmann::json(nlohmann::json::parse(in));
        auto& carrier = (*document_)["NRCarriers"][0];
        carrier["Downlink"]["DLSCH"][0]["PayloadData"] = {{"PayLoadDataType", "Pattern"}, {"PatternBits", kPattern}};
        carrier["BasebandFilter"] = false;   // the filter has its own tests
        (*document_)["PhaseCompensation"] = "Off";
        nrsynth_test::ScratchFolder folder;
        status_ = nrsynth_test::generate(*document_, folder.file("rs.bin"));
        // Every symbol of every antenna, demodulated once.
        bins_ = new std::vector<std::vector<std::vector<Sample>>>(4);
        for (int a = 0; a < 4 && status_ == 0; ++a) {
            const nrsynth_test::Receiver receiver(nrsynth_test::readSamples(folder.file("rs" + std::to_string(a) + ".bin")), 1024, 1);
            if (receiver.samples.size() != 307200u) break;
            for (int s = 0; s < 280; ++s) (*bins_)[static_cast<std::size_t>(a)].push_back(receiver.symbol(s));
        }
    }
    static void TearDownTestSuite() {
        delete bins_;
        delete document_;
    }
    void SetUp() override {
        ASSERT_EQ(status_, 0);
        ASSERT_EQ((*bins_)[3].size(), 280u);
    }
    /// Subcarrier k from point A of symbol l of slot `slot` on an antenna.
    static Sample at(int antenna, int slot, int l, int k) {
        return (*bins_)[static_cast<std::size_t>(antenna)][static_cast<std::size_t>(14 * slot + l)]
                       [static_cast<std::size_t>((kPointA + k + 1024) % 1024)];
    }

    static inline nlohmann::json* document_ = nullptr;
    static inline std::vector<std::vector<std::vector<Sample>>>* bins_ = nullptr;  // [antenna][symbol][bin]
    static inline int status_ = -1;
};

// Row 18, k = 0, 2, 4, 6 from "001111", l0 = 5: CDM group j on k_j, k_j + 1 and symbols 5..8.
const std::vector<csirs_ref::Entry> kCsiRs = {{0, 0, 5}, {1, 2, 5}, {2, 4, 5}, {3, 6, 5}};
// Row 1, k0 = 0 from "0001": k0, k0 + 4, k0 + 8 on symbols 4 and 8 (two items).
const std::vector<csirs_ref::Entry> kTrs = {{0, 0, 4}, {0, 4, 4}, {0, 8, 4}, {0, 0, 8}, {0, 4, 8}, {0, 8, 8}};

TEST_F(ReferenceSignalsWaveform, CsiRsOf32PortsCarriesEachAntennasPortAndCode) {
    const auto elements = csirs_ref::elements(kCsiRs, csirs_ref::Cdm8, 32, 1.0, false, 0, kRbs - 1);
    ASSERT_EQ(elements.size(), static_cast<std::size_t>(kRbs * 4 * 8));
    for (int slot : {5, 15}) {
        std::vector<std::vector<Sample>> r;
        for (int l = 0; l < 14; ++l) r.push_back(csirs_ref::sequence(slot, l, kNId, 2 * kRbs + 2));
        for (int a = 0; a < 4; ++a) {
            const int s = a;  // ports 3000, 3009, 3018, 3027: group j = a, index s = a
            double worst = 0.0;
            for (const auto& e : elements) {
                const Sample expected = e.group == a ? Sample(csirs_ref::wf(s, e.kPrime) * csirs_ref::wt(s, e.lPrime)) *
                                                           r[static_cast<std::size_t>(e.l)][static_cast<std::size_t>(e.m)]
                                                     : Sample{};
                worst = std::max(worst, std::abs(at(a, slot, e.l, e.k) - expected));
            }
            EXPECT_LT(worst, 1e-9) << "slot " << slot << " antenna " << a;
        }
    }
}

TEST_F(ReferenceSignalsWaveform, TrsBurstOnAntennaZeroInTwoSlots) {
    const auto elements = csirs_ref::elements(kTrs, csirs_ref::NoCdm, 1, 3.0, false, 0, kRbs - 1);
    for (int slot : {1, 2}) {
        std::vector<std::vector<Sample>> r;
        for (int l = 0; l < 14; ++l) r.push_back(csirs_ref::sequence(slot, l, kNId, 3 * kRbs + 3));
        double worst = 0.0, others = 0.0;
        for (const auto& e : elements) {
            worst = std::max(worst, std::abs(at(0, slot, e.l, e.k) - r[static_cast<std::size_t>(e.l)][static_cast<std::size_t>(e.m)]));
            for (int a = 1; a < 4; ++a) others = std::max(others, std::abs(at(a, slot, e.l, e.k)));
        }
        EXPECT_LT(worst, 1e-9) << "slot " << slot;
        EXPECT_LT(others, 1e-9) << "slot " << slot << ": the other antennas keep the TRS elements free";
    }
}

TEST_F(ReferenceSignalsWaveform, PrsInTheFirstPeriodAndMutedInTheSecond) {
    // Comb 4, k' 0, 2, 1, 3 on symbols 6..9, offset 1: k = 4m + (1 + k') mod 4 over PRBs 0..47.
    const int kPrime[4] = {0, 2, 1, 3};
    for (int slot : {8, 9, 18, 19}) {
        const bool sent = slot < 10;
        double worst = 0.0, peak = 0.0;
        for (int i = 0; i < 4; ++i) {
            const int l = 6 + i;
            const auto r = prsSequence(slot, l, kNId, 12 * 48 / 4);
            for (int m = 0; m < 12 * 48 / 4; ++m) {
                const int k = 4 * m + (1 + kPrime[i]) % 4;
                for (int a = 0; a < 4; ++a) {
                    const Sample rx = at(a, slot, l, k);
                    worst = std::max(worst, std::abs(rx - (sent ? r[static_cast<std::size_t>(m)] : Sample{})));
                    peak = std::max(peak, std::abs(rx));
                }
            }
        }
        EXPECT_LT(worst, 1e-9) << "slot " << slot;
        EXPECT_EQ(peak > 0.5, sent) << "slot " << slot;
    }
}

TEST_F(ReferenceSignalsWaveform, PdschRateMatchedAroundCsiRsAndTrsDecodes) {
    const auto& dlsch = (*document_)["NRCarriers"][0]["Downlink"]["DLSCH"][0];
    const int a = dlsch["TransportBlockSize"], rnti = dlsch["RNTI"], cellId = (*document_)["NRCarriers"][0]["CellID"];
    std::set<std::pair<int, int>> csi, trs;  // (l, k)
    for (const auto& e : csirs_ref::elements(kCsiRs, csirs_ref::Cdm8, 32, 1.0, false, 0, kRbs - 1)) csi.insert({e.l, e.k});
    for (const auto& e : csirs_ref::elements(kTrs, csirs_ref::NoCdm, 1, 3.0, false, 0, kRbs - 1)) trs.insert({e.l, e.k});

    // The PDSCH slots are 0..7 and 10..17; the payload moves on by one block per slot.
    for (const auto& [slot, index] : {std::pair{1, 1}, std::pair{5, 5}, std::pair{6, 6}}) {
        SCOPED_TRACE("slot " + std::to_string(slot));
        std::vector<Sample> stream;
        for (int l = 0; l < 14; ++l) {
            if (l == 2 || l == 11) continue;  // DM-RS of both CDM groups: no data
            for (int k = 0; k < 12 * kRbs; ++k) {
                if (slot == 5 && csi.count({l, k})) continue;
                if ((slot == 1 || slot == 2) && trs.count({l, k})) continue;
                for (int layer = 0; layer < 4; ++layer) stream.push_back(at(layer, slot, l, k));
            }
        }
        Bits bits = demap(stream, 6);
        const Bits scrambling = gold(static_cast<std::uint32_t>(rnti) * 32768u + static_cast<std::uint32_t>(cellId), static_cast<int>(bits.size()));
        for (std::size_t i = 0; i < bits.size(); ++i) bits[i] ^= scrambling[i];

        // TS 38.212: CRC24A, 9 blocks of K' = 8448 with CRC24B, base graph 1, Z = 384.
        Bits tb(static_cast<std::size_t>(a));
        for (int i = 0; i < a; ++i)
            tb[static_cast<std::size_t>(i)] = kPattern[static_cast<std::size_t>((static_cast<long long>(index) * a + i) % static_cast<long long>(kPattern.size()))] - '0';
        const Bits tbCrc = crc(tb, 24, kCrc24A);
        tb.insert(tb.end(), tbCrc.begin(), tbCrc.end());
        const int blocks = 9, kPrime = 8448, z = 384;
        ASSERT_EQ(static_cast<int>(tb.size()) + 24 * blocks, blocks * kPrime);
        const int perBlock = static_cast<int>(bits.size()) / 24;
        std::size_t offset = 0;
        int systematicErrors = 0;
        for (int r = 0; r < blocks; ++r) {
            const int e = 24 * (r <= blocks - perBlock % blocks - 1 ? perBlock / blocks : (perBlock + blocks - 1) / blocks);
            Bits info(tb.begin() + static_cast<std::ptrdiff_t>(r * (kPrime - 24)), tb.begin() + static_cast<std::ptrdiff_t>((r + 1) * (kPrime - 24)));
            const Bits blockCrc = crc(info, 24, kCrc24B);
            info.insert(info.end(), blockCrc.begin(), blockCrc.end());
            const Bits f(bits.begin() + static_cast<std::ptrdiff_t>(offset), bits.begin() + static_cast<std::ptrdiff_t>(offset + e));
            offset += static_cast<std::size_t>(e);
            systematicErrors += checkBlock(deinterleave(f, 6), info, 1, z, 66 * z).systematicErrors;
        }
        EXPECT_EQ(systematicErrors, 0);
        EXPECT_EQ(offset, bits.size());
    }
}

}  // namespace
