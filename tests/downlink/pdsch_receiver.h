#pragma once
// A hard-decision PDSCH receiver written from the 3GPP text alone, for the round-trip tests:
// Gold sequence (TS 38.211 5.2.1), constellations (5.1), DM-RS (7.4.1.1), CRC (TS 38.212 5.1),
// bit de-interleaving and bit selection (5.4.2), and the parity checks of the LDPC base graphs
// read from data/3gpp. Nothing here calls the library.

#include <nlohmann/json.hpp>

#include <algorithm>
#include <bit>
#include <cmath>
#include <complex>
#include <cstdint>
#include <fstream>
#include <numbers>
#include <string>
#include <vector>

#include "test_support.h"

namespace pdsch_rx {

using Sample = std::complex<double>;
using Bits = std::vector<int>;

/// c(0..n-1) of TS 38.211 clause 5.2.1 for cInit, Nc = 1600.
inline Bits gold(std::uint32_t cInit, int n) {
    std::vector<std::uint8_t> x1(static_cast<std::size_t>(n) + 1600 + 31, 0), x2(x1.size(), 0);
    x1[0] = 1;
    for (int i = 0; i < 31; ++i) x2[static_cast<std::size_t>(i)] = (cInit >> i) & 1u;
    for (std::size_t i = 0; i + 31 < x1.size(); ++i) {
        x1[i + 31] = (x1[i + 3] + x1[i]) & 1;
        x2[i + 31] = (x2[i + 3] + x2[i + 2] + x2[i + 1] + x2[i]) & 1;
    }
    Bits c(static_cast<std::size_t>(n));
    for (int i = 0; i < n; ++i) c[static_cast<std::size_t>(i)] = (x1[static_cast<std::size_t>(i) + 1600] + x2[static_cast<std::size_t>(i) + 1600]) & 1;
    return c;
}

/// The points of TS 38.211 clause 5.1 for Qm bits, indexed by the bits (first bit most
/// significant): BPSK here on the real axis, 8PSK at index i pi / 4.
inline std::vector<Sample> constellation(int qm) {
    std::vector<Sample> points(std::size_t{1} << qm);
    if (qm == 1) return {Sample(std::sqrt(0.5), 0), Sample(-std::sqrt(0.5), 0)};
    if (qm == 3) {
        const int order[8] = {0, 1, 2, 3, 4, 5, 6, 7};
        for (int i = 0; i < 8; ++i) points[static_cast<std::size_t>(i)] = std::polar(1.0, order[i] * std::numbers::pi / 4);
        return points;
    }
    // d = (1 - 2b0)(2^(m-1) - (1 - 2b2)(2^(m-2) - ...)) + j(same with the odd bits), scaled.
    const int m = qm / 2;
    double power = 0;
    for (std::size_t index = 0; index < points.size(); ++index) {
        auto bit = [&](int k) { return static_cast<int>((index >> (qm - 1 - k)) & 1u); };
        double axis[2];
        for (int part = 0; part < 2; ++part) {
            double level = 1 - 2 * bit(part + 2 * (m - 1));
            for (int t = m - 2; t >= 0; --t) level = (1 - 2 * bit(part + 2 * t)) * ((1 << (m - 1 - t)) - level);
            axis[part] = level;
        }
        points[index] = Sample(axis[0], axis[1]);
        power += std::norm(points[index]);
    }
    for (auto& p : points) p /= std::sqrt(power / points.size());
    return points;
}

/// Nearest-point decisions: Qm bits per symbol, first bit first.
inline Bits demap(const std::vector<Sample>& symbols, int qm) {
    const auto points = constellation(qm);
    Bits bits;
    bits.reserve(symbols.size() * static_cast<std::size_t>(qm));
    for (const auto& y : symbols) {
        std::size_t best = 0;
        for (std::size_t i = 1; i < points.size(); ++i)
            if (std::norm(y - points[i]) < std::norm(y - points[best])) best = i;
        for (int b = qm - 1; b >= 0; --b) bits.push_back(static_cast<int>((best >> b) & 1u));
    }
    return bits;
}

/// CRC of TS 38.212 clause 5.1: `length` bits for the generator polynomial `poly` (without its
/// leading term), over `bits`.
inline Bits crc(const Bits& bits, int length, std::uint32_t poly) {
    std::uint32_t reg = 0;
    const std::uint32_t top = 1u << (length - 1), mask = (length == 32) ? ~0u : (1u << length) - 1;
    for (int b : bits) {
        const bool feedback = ((reg & top) != 0) != (b != 0);
        reg = (reg << 1) & mask;
        if (feedback) reg ^= poly;
    }
    Bits out(static_cast<std::size_t>(length));
    for (int i = 0; i < length; ++i) out[static_cast<std::size_t>(i)] = (reg >> (length - 1 - i)) & 1u;
    return out;
}
constexpr std::uint32_t kCrc24A = 0x864CFB, kCrc24B = 0x800063, kCrc16 = 0x1021;

/// The base graph (1 or 2) as rows [row, column, shift per set] from data/3gpp.
inline const nlohmann::json& baseGraph(int graph) {
    auto load = [](const char* name) {
        std::ifstream in(nrsynth_test::sourceDir() / "data" / "3gpp" / name);
        return nlohmann::json::parse(in).at("rows");
    };
    static const auto bg1 = load("ts38212_table_5_3_2_2_ldpc_bg1.json");
    static const auto bg2 = load("ts38212_table_5_3_2_3_ldpc_bg2.json");
    return graph == 1 ? bg1 : bg2;
}

/// Unsatisfied lifted parity checks of the code word `word` (N + 2Z bits) of graph `graph`.
inline int failedChecks(int graph, int z, const Bits& word) {
    const int set = ((z >> std::countr_zero(static_cast<unsigned>(z))) - 1) / 2;
    std::vector<int> sums(static_cast<std::size_t>((graph == 1 ? 46 : 42) * z), 0);
    for (const auto& e : baseGraph(graph)) {
        const int row = e.at(0), column = e.at(1), shift = e.at(2 + set).get<int>() % z;
        for (int r = 0; r < z; ++r)
            sums[static_cast<std::size_t>(row * z + r)] ^= word[static_cast<std::size_t>(column * z + (shift + r) % z)] & 1;
    }
    return static_cast<int>(std::count(sums.begin(), sums.end(), 1));
}

/// TS 38.212 clause 5.4.2.2 undone: e(i E/Qm + j) = f(i + j Qm).
inline Bits deinterleave(const Bits& f, int qm) {
    const std::size_t rows = f.size() / static_cast<std::size_t>(qm);
    Bits e(f.size());
    for (std::size_t j = 0; j < rows; ++j)
        for (int i = 0; i < qm; ++i) e[static_cast<std::size_t>(i) * rows + j] = f[static_cast<std::size_t>(i) + j * qm];
    return e;
}

/// Result of the check of one rate-matched code block.
struct BlockCheck {
    int systematicErrors = 0;  ///< received systematic bits that differ from the expected
    int seenParity = 0;        ///< d positions received at least once
    int parityFailures = 0;    ///< unsatisfied checks with the whole buffer received, else -1
};

/// Checks the E bits `e` (after de-interleaving) of one block, selected with rv 0 from a
/// circular buffer of Ncb bits (TS 38.212 clause 5.4.2.1), against the K' information bits
/// `info` (with its block CRC) of a code of graph `graph` and lifting `z`.
inline BlockCheck checkBlock(const Bits& e, const Bits& info, int graph, int z, int ncb) {
    const int k = (graph == 1 ? 22 : 10) * z, n = (graph == 1 ? 66 : 50) * z;
    const int kPrime = static_cast<int>(info.size());
    std::vector<int> d(static_cast<std::size_t>(n), -1);  // -1 unknown
    for (int i = kPrime - 2 * z; i < k - 2 * z; ++i) d[static_cast<std::size_t>(i)] = -2;  // fillers
    BlockCheck result;
    int j = 0;
    for (std::size_t i = 0; i < e.size(); ++j) {
        const int at = j % ncb;
        if (d[static_cast<std::size_t>(at)] == -2) continue;
        if (d[static_cast<std::size_t>(at)] >= 0 && d[static_cast<std::size_t>(at)] != e[i]) ++result.systematicErrors;
        d[static_cast<std::size_t>(at)] = e[i++];
    }
    for (int i = 0; i < kPrime - 2 * z; ++i)
        if (d[static_cast<std::size_t>(i)] >= 0 && d[static_cast<std::size_t>(i)] != info[static_cast<std::size_t>(i + 2 * z)])
            ++result.systematicErrors;
    Bits word(static_cast<std::size_t>(n + 2 * z), 0);
    bool whole = true;
    for (int i = 0; i < n + 2 * z; ++i) {
        if (i < kPrime) word[static_cast<std::size_t>(i)] = info[static_cast<std::size_t>(i)];
        else if (i < k) word[static_cast<std::size_t>(i)] = 0;
        else {
            const int v = d[static_cast<std::size_t>(i - 2 * z)];
            if (v < 0) whole = false;
            else ++result.seenParity;
            word[static_cast<std::size_t>(i)] = v < 0 ? 0 : v;
        }
    }
    result.parityFailures = whole && ncb == n ? failedChecks(graph, z, word) : -1;
    return result;
}

/// DM-RS value r(m) of TS 38.211 clause 7.4.1.1.1 from the bits c of its Gold sequence.
inline Sample dmrsValue(const Bits& c, int m) {
    const double a = std::sqrt(0.5);
    return Sample(a * (1 - 2 * c[static_cast<std::size_t>(2 * m)]), a * (1 - 2 * c[static_cast<std::size_t>(2 * m + 1)]));
}

/// cInit of the PDSCH DM-RS (TS 38.211 clause 7.4.1.1.1, lambda-bar 0).
inline std::uint32_t dmrsCInit(int symbolsPerSlot, int slot, int symbol, int nId, int nScid) {
    const std::uint64_t v = (static_cast<std::uint64_t>(symbolsPerSlot * slot + symbol + 1) * (2 * nId + 1) << 17) +
                            2 * static_cast<std::uint64_t>(nId) + nScid;
    return static_cast<std::uint32_t>(v & 0x7FFFFFFFu);
}

/// Segmentation of TS 38.212 clause 5.2.2 with the graph choice of clause 7.2.2.
struct Segmentation {
    int graph, blocks, kPrime, z, crcPerBlock;
    Segmentation(int a, double rate) {
        const int b = a + (a > 3824 ? 24 : 16);
        graph = (a <= 292 || (a <= 3824 && rate <= 0.67) || rate <= 0.25) ? 2 : 1;
        const int kcb = graph == 1 ? 8448 : 3840;
        blocks = b <= kcb ? 1 : (b + kcb - 24 - 1) / (kcb - 24);
        crcPerBlock = blocks > 1 ? 24 : 0;
        kPrime = (b + blocks * crcPerBlock) / blocks;
        const int kb = graph == 1 ? 22 : b > 640 ? 10 : b > 560 ? 9 : b > 192 ? 8 : 6;
        z = 1 << 30;
        for (int a0 : {2, 3, 5, 7, 9, 11, 13, 15})
            for (int v = a0; v <= 384; v *= 2)
                if (v * kb >= kPrime) z = std::min(z, v);
    }
};

}  // namespace pdsch_rx
