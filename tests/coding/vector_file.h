#pragma once
// Reader of the plain-text oracle files in ../shared/testvectors: '#' lines are comments, a
// case is a header line followed by a fixed number of data lines.

#include <fstream>
#include <sstream>
#include <string>
#include <vector>

#include "coding/coding_types.h"

namespace nrsynth_test {

struct VectorCase {
    std::vector<std::string> header;  // the header line split at blanks
    std::vector<std::string> lines;   // the data lines that follow it
};

/// Reads every case of `path`; `dataLines(header)` says how many lines follow each header.
/// Returns nothing when the file is missing.
template <typename DataLines>
std::vector<VectorCase> readVectorCases(const std::string& path, DataLines dataLines) {
    std::vector<VectorCase> cases;
    std::ifstream in(path);
    std::string line;
    auto next = [&](std::string& out) {
        while (std::getline(in, out))
            if (!out.empty() && out[0] != '#') return true;
        return false;
    };
    while (next(line)) {
        VectorCase c;
        std::istringstream words(line);
        for (std::string w; words >> w;) c.header.push_back(w);
        const int n = dataLines(c.header);
        for (int i = 0; i < n && next(line); ++i) c.lines.push_back(line);
        cases.push_back(std::move(c));
    }
    return cases;
}

/// A line of '0'/'1' characters as bits.
inline BitSequence bitsOf(const std::string& text) {
    BitSequence bits;
    for (char ch : text) bits.push_back(static_cast<char>(ch - '0'));
    return bits;
}

}  // namespace nrsynth_test
