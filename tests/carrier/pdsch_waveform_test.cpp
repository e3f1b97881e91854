// The full-load PDSCH example end to end: generated through the C interface, demodulated as a
// receiver does (FFT halfway into each cyclic prefix), the PDSCH resource elements found from
// TS 38.211 / 38.214 around the SS/PBCH blocks and the CORESET, hard-decided, descrambled and
// checked block by block against the payload and its CRCs.

#include <gtest/gtest.h>

#include <cmath>
#include <complex>
#include <fstream>
#include <numbers>
#include <vector>

#include "../downlink/pdsch_receiver.h"
#include "../engine/output_files.h"
#include "../engine/waveform_test_support.h"
#include "test_support.h"

namespace {

using namespace pdsch_rx;

/// In-place radix-2 forward DFT, X(k) = sum x(n) e^(-j 2 pi k n / N).
void fft(std::vector<Sample>& x) {
    const std::size_t n = x.size();
    for (std::size_t i = 1, j = 0; i < n; ++i) {
        std::size_t bit = n >> 1;
        for (; j & bit; bit >>= 1) j ^= bit;
        j ^= bit;
        if (i < j) std::swap(x[i], x[j]);
    }
    for (std::size_t len = 2; len <= n; len <<= 1) {
        const Sample w = std::polar(1.0, -2.0 * std::numbers::pi / static_cast<double>(len));
        for (std::size_t i = 0; i < n; i += len) {
            Sample wk = 1.0;
            for (std::size_t k = 0; k < len / 2; ++k, wk *= w) {
                const Sample u = x[i + k], v = x[i + k + len / 2] * wk;
                x[i + k] = u + v;
                x[i + k + len / 2] = u - v;
            }
        }
    }
}

/// One demodulated OFDM symbol of 30 kHz at 122.88 MHz: bins in transform order.
std::vector<Sample> demodulate(const std::vector<Sample>& samples, int l) {
    constexpr int size = 4096;
    long start = 0;
    for (int s = 0; s < l; ++s) start += size + 288 + (s % 14 == 0 ? 64 : 0);
    const int prefix = 288 + (l % 14 == 0 ? 64 : 0), advance = prefix / 2;
    std::vector<Sample> x(samples.begin() + start + prefix - advance, samples.begin() + start + prefix - advance + size);
    fft(x);
    for (int k = 0; k < size; ++k) x[static_cast<std::size_t>(k)] *= std::polar(1.0, 2.0 * std::numbers::pi * k * advance / size);
    return x;
}

const std::string kPattern = "110100111010110001001101111000101011100110100001011";

TEST(PdschWaveform, FullLoadCarrierDecodesBlockByBlock) {
    std::ifstream in(nrsynth_test::sourceDir() / "examples" / "pdsch_full_load_100mhz.json");
    auto document = nlohmann::json::parse(in);
    auto& dlsch = document["NRCarriers"][0]["Downlink"]["DLSCH"][0];
    dlsch["PayloadData"] = {{"PayLoadDataType", "Pattern"}, {"PatternBits", kPattern}};
    document["NRCarriers"][0]["BasebandFilter"] = false;  // the filter has its own tests
    document["PhaseCompensation"] = "Off";                 // no rotation per symbol
    nrsynth_test::ScratchFolder folder;
    const auto path = folder.file("pdsch.bin");
    ASSERT_EQ(nrsynth_test::generate(document, path), 0) << GetLog();
    std::vector<std::vector<Sample>> antennas = {nrsynth_test::readSamples(folder.file("pdsch0.bin")),
                                                 nrsynth_test::readSamples(folder.file("pdsch1.bin"))};
    ASSERT_EQ(antennas[0].size(), 1228800u);

    const int cellId = document["NRCarriers"][0]["CellID"], rnti = dlsch["RNTI"], a = dlsch["TransportBlockSize"];
    const int pointA = -1638;  // FrequencyOffsetOfPointA / 30 kHz
    // SS/PBCH Case C, Lmax 8: blocks at symbols {2, 8} + 14 n of slots 0..3, RBs 76..96 of the
    // block at subcarriers -720..-481 (TS 38.214 clause 5.1.4: whole PRBs are withheld).
    auto ssb = [](int slot, int l, int rb) {
        if (slot > 3 || rb < 76 || rb > 96) return false;
        return (l >= 2 && l <= 5) || (l >= 8 && l <= 11);
    };
    long long payloadBit = 0;
    for (int slot = 0; slot < 6; ++slot) {
        if (slot != 0 && slot != 5) {  // the data source still advances over the other slots
            payloadBit += a;
            continue;
        }
        SCOPED_TRACE("slot " + std::to_string(slot));
        std::vector<std::vector<Sample>> layers(2);
        int dmrsChecked = 0;
        for (int l = 0; l < 14; ++l) {
            const auto rx0 = demodulate(antennas[0], 14 * slot + l);
            const auto rx1 = demodulate(antennas[1], 14 * slot + l);
            const bool dmrs = l == 2 || l == 11;  // type A, l0 = 2, dmrs-AdditionalPosition 1, l_d 14
            const Bits c = gold(dmrsCInit(14, slot, l, cellId, 0), 2 * 12 * 273);
            for (int rb = 0; rb < 273; ++rb) {
                if (ssb(slot, l, rb) || (l == 0 && rb < 48)) continue;  // SS/PBCH, CORESET
                for (int j = 0; j < 12; ++j) {
                    const int k = 12 * rb + j, bin = (pointA + k + 4096) % 4096;
                    if (dmrs && j % 2 == 0) {  // CDM group 0: ports 1000 and 1001, w_f = +1
                        EXPECT_LT(std::abs(rx0[static_cast<std::size_t>(bin)] - dmrsValue(c, k / 2)), 0.05) << "DM-RS l " << l << " k " << k;
                        ++dmrsChecked;
                        continue;
                    }
                    layers[0].push_back(rx0[static_cast<std::size_t>(bin)]);
                    layers[1].push_back(rx1[static_cast<std::size_t>(bin)]);
                }
            }
        }
        EXPECT_GT(dmrsChecked, 1000);
        std::vector<Sample> stream;
        for (std::size_t i = 0; i < layers[0].size(); ++i) stream.insert(stream.end(), {layers[0][i], layers[1][i]});
        Bits bits = demap(stream, 8);
        const Bits scrambling = gold(static_cast<std::uint32_t>(rnti) * 32768u + static_cast<std::uint32_t>(cellId), static_cast<int>(bits.size()));
        for (std::size_t i = 0; i < bits.size(); ++i) bits[i] ^= scrambling[i];

        // TS 38.212: CRC24A, 54 blocks of K' = 8376 with CRC24B, base graph 1, Z = 384.
        Bits tb(static_cast<std::size_t>(a));
        for (int i = 0; i < a; ++i) tb[static_cast<std::size_t>(i)] = kPattern[static_cast<std::size_t>((payloadBit + i) % kPattern.size())] - '0';
        payloadBit += a;
        const Bits tbCrc = crc(tb, 24, kCrc24A);
        tb.insert(tb.end(), tbCrc.begin(), tbCrc.end());
        const int blocks = 54, kPrime = 8376, z = 384;
        ASSERT_EQ(static_cast<int>(tb.size()) + 24 * blocks, blocks * kPrime);
        const int perBlock = static_cast<int>(bits.size()) / 16;
        std::size_t offset = 0;
        int systematicErrors = 0;
        for (int r = 0; r < blocks; ++r) {
            const int e = 16 * (r <= blocks - perBlock % blocks - 1 ? perBlock / blocks : (perBlock + blocks - 1) / blocks);
            Bits info(tb.begin() + static_cast<std::ptrdiff_t>(r * (kPrime - 24)), tb.begin() + static_cast<std::ptrdiff_t>((r + 1) * (kPrime - 24)));
            const Bits blockCrc = crc(info, 24, kCrc24B);
            info.insert(info.end(), blockCrc.begin(), blockCrc.end());
            const Bits f(bits.begin() + static_cast<std::ptrdiff_t>(offset), bits.begin() + static_cast<std::ptrdiff_t>(offset + e));
            offset += static_cast<std::size_t>(e);
            systematicErrors += checkBlock(deinterleave(f, 8), info, 1, z, 66 * z).systematicErrors;
        }
        EXPECT_EQ(systematicErrors, 0);
        EXPECT_EQ(offset, bits.size());
    }
}

}  // namespace
