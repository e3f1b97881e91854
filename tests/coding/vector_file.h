#pragma once
// Readers of the oracle data: the plain-text files in ../shared/testvectors ('#' lines are
// comments, a case is a header line followed by a fixed number of data lines) and the 3GPP
// tables committed in data/3gpp, read apart from the library's generated headers.

#include <complex>
#include <fstream>
#include <nlohmann/json.hpp>
#include <random>
#include <sstream>
#include <string>
#include <vector>

#include "test_support.h"

namespace nrsynth_test {

struct VectorCase {
    std::vector<std::string> header;  // the header line split at blanks
    std::vector<std::string> lines;   // the data lines that follow it
};

/// Every case of testvectors/<relative>; `dataLines(header)` says how many lines follow each
/// header. Returns nothing when the file is missing.
template <typename DataLines>
std::vector<VectorCase> readVectorCases(const std::string& relative, DataLines dataLines) {
    std::vector<VectorCase> cases;
    std::ifstream in(sharedDir() / "testvectors" / relative);
    auto next = [&](std::string& out) {
        while (std::getline(in, out))
            if (!out.empty() && out[0] != '#') return true;
        return false;
    };
    for (std::string line; next(line);) {
        VectorCase c;
        std::istringstream words(line);
        for (std::string w; words >> w;) c.header.push_back(w);
        const int n = dataLines(c.header);
        for (int i = 0; i < n && next(line); ++i) c.lines.push_back(line);
        cases.push_back(std::move(c));
    }
    return cases;
}

/// A line of '0'/'1' characters as bits; '-' (an LDPC filler) reads as -2.
template <typename T = char>
std::vector<T> bitsOf(const std::string& text) {
    std::vector<T> bits;
    for (char ch : text) bits.push_back(static_cast<T>(ch == '-' ? -2 : ch - '0'));
    return bits;
}

/// A table of data/3gpp as its JSON document.
inline nlohmann::json dataTable(const std::string& file) {
    std::ifstream in(sourceDir() / "data" / "3gpp" / file);
    return nlohmann::json::parse(in);
}

/// Column 1 of the rows [index, value] of a data/3gpp table.
inline std::vector<int> tableColumn(const std::string& file) {
    const auto doc = dataTable(file);
    std::vector<int> values;
    for (const auto& row : doc.at("rows")) values.push_back(row.at(1).get<int>());
    return values;
}

/// n random bits.
template <typename T = char>
std::vector<T> randomBits(std::size_t n, std::mt19937& rng) {
    std::vector<T> bits(n);
    for (auto& b : bits) b = static_cast<T>(rng() & 1u);
    return bits;
}

/// A line "re im" as a complex value.
inline std::complex<double> complexOf(const std::string& line) {
    std::istringstream words(line);
    double re = 0, im = 0;
    words >> re >> im;
    return {re, im};
}

}  // namespace nrsynth_test
