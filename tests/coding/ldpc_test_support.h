#pragma once
// Oracles and readers shared by the LDPC test suites.

#include <gtest/gtest.h>

#include <fstream>
#include <nlohmann/json.hpp>
#include <random>
#include <string>
#include <vector>

#include "test_support.h"
#include "vector_file.h"

namespace nrsynth_test {

/// One non-zero entry of an LDPC base graph as the 3GPP JSON file states it.
struct BaseGraphEntry {
    int row;
    int column;
    int shift[8];
};

/// Base graph 1 (bg 0) or 2 (bg 1) read straight from the committed JSON in data/3gpp, so
/// that the parity checks below do not depend on the generated tables.
inline const std::vector<BaseGraphEntry>& jsonBaseGraph(int bg) {
    static const auto load = [](const char* name) {
        std::ifstream file(sourceDir() / "data" / "3gpp" / name);
        const auto doc = nlohmann::json::parse(file);
        std::vector<BaseGraphEntry> entries;
        for (const auto& row : doc.at("rows")) {
            BaseGraphEntry e{row.at(0).get<int>(), row.at(1).get<int>(), {}};
            for (int s = 0; s < 8; ++s) e.shift[s] = row.at(2 + s).get<int>();
            entries.push_back(e);
        }
        return entries;
    };
    static const std::vector<BaseGraphEntry> bg1 = load("ts38212_table_5_3_2_2_ldpc_bg1.json");
    static const std::vector<BaseGraphEntry> bg2 = load("ts38212_table_5_3_2_3_ldpc_bg2.json");
    return bg == 0 ? bg1 : bg2;
}

/// Index of the lifting set (iLS) holding z, from TS 38.212 Table 5.3.2-1 (a * 2^j).
inline int liftingSetOf(int z) {
    static const int a[8] = {2, 3, 5, 7, 9, 11, 13, 15};
    for (int s = 0; s < 8; ++s) {
        for (int v = a[s]; v <= 384; v *= 2) {
            if (v == z) return s;
        }
    }
    return -1;
}

/// Number of unsatisfied lifted parity checks of a full code word (68 Z or 52 Z bits).
inline int failedChecks(int bg, int z, const std::vector<int>& word) {
    const int rows = bg == 0 ? 46 : 42;
    const int set = liftingSetOf(z);
    std::vector<int> sums(static_cast<std::size_t>(rows * z), 0);
    for (const auto& e : jsonBaseGraph(bg)) {
        const int shift = e.shift[set] % z;
        for (int r = 0; r < z; ++r) {
            sums[e.row * z + r] ^= word[e.column * z + (shift + r) % z] & 1;
        }
    }
    int failed = 0;
    for (int s : sums) failed += s;
    return failed;
}

/// The full code word from an encoder input (fillers read as 0) and its d sequence output.
inline std::vector<int> fullCodeWord(const std::vector<int>& in, const std::vector<int>& d, int z) {
    std::vector<int> word(d.size() + 2 * static_cast<std::size_t>(z), 0);
    for (std::size_t i = 0; i < in.size(); ++i) word[i] = in[i] == -2 ? 0 : in[i];
    for (std::size_t i = in.size() - 2 * z; i < d.size(); ++i) word[i + 2 * z] = d[i];
    return word;
}

inline std::vector<int> randomBits(std::size_t n, std::mt19937& rng) {
    std::vector<int> bits(n);
    for (auto& b : bits) b = static_cast<int>(rng() & 1);
    return bits;
}

/// A line of '0', '1' and '-' (a filler, -2) as ints.
inline std::vector<int> parseBits(const std::string& line) {
    std::vector<int> bits;
    bits.reserve(line.size());
    for (char c : line) bits.push_back(c == '-' ? -2 : c - '0');
    return bits;
}

/// Path of a file in ../shared/testvectors.
inline std::string vectorPath(const std::string& relative) {
    return (sharedDir() / "testvectors" / relative).string();
}

}  // namespace nrsynth_test
