#include "coding/polar_mother_code.h"

#include <algorithm>
#include <cmath>
#include <sstream>
#include <stdexcept>

#include "tables/polar_tables.h"

namespace Orvalis_NR {

namespace {

/// Smallest m with 2^m >= value (value >= 1).
int ceilLog2(long long value) {
    int m = 0;
    while ((1LL << m) < value) ++m;
    return m;
}

std::vector<int> placeIndexed(const std::vector<std::pair<int, int>>& pairs, int size,
                              const char* tableName) {
    std::vector<int> values(static_cast<std::size_t>(size), -1);
    for (const auto& [index, value] : pairs) {
        if (index < 0 || index >= size)
            throw std::invalid_argument(std::string(tableName) + ": index " +
                                        std::to_string(index) + " outside 0.." +
                                        std::to_string(size - 1));
        values[static_cast<std::size_t>(index)] = value;
    }
    const auto missing = std::find(values.begin(), values.end(), -1);
    if (missing != values.end())
        throw std::invalid_argument(std::string(tableName) + ": no entry " +
                                    std::to_string(missing - values.begin()));
    return values;
}

}  // namespace

int polarCodeLength(int K, int E, int nMax) {
    if (K < 1) throw std::invalid_argument("K must be at least 1, got " + std::to_string(K));
    if (E < 1) throw std::invalid_argument("E must be at least 1, got " + std::to_string(E));
    const int logE = ceilLog2(E);
    int n1 = logE;
    if (E <= 1.125 * std::ldexp(1.0, logE - 1) && static_cast<double>(K) / E < 0.5625)
        n1 = logE - 1;
    const int n2 = ceilLog2(8LL * K);
    const int n = std::max(std::min({n1, n2, nMax}), 5);
    return 1 << n;
}

bool polarPuncturing(int K, int E) {
    return static_cast<double>(K) / E <= 0.4375;
}

std::vector<int> polarSubBlockInterleaver(const std::vector<int>& pattern, int N) {
    if (pattern.size() != 32)
        throw std::invalid_argument("sub-block pattern must have 32 entries, got " +
                                    std::to_string(pattern.size()));
    if (N < 32 || (N & (N - 1)) != 0)
        throw std::invalid_argument("N must be a power of two of at least 32, got " +
                                    std::to_string(N));
    const int blockSize = N / 32;
    std::vector<int> J(static_cast<std::size_t>(N));
    for (int n = 0; n < N; ++n) {
        const int block = pattern[static_cast<std::size_t>(n / blockSize)];
        J[static_cast<std::size_t>(n)] = block * blockSize + n % blockSize;
    }
    return J;
}

std::vector<std::pair<int, int>> parseIndexValuePairs(const std::string& text,
                                                      const char* tableName) {
    std::istringstream in(text);
    std::vector<std::pair<int, int>> pairs;
    std::string first, second;
    while (in >> first) {
        if (!(in >> second))
            throw std::invalid_argument(std::string(tableName) + ": index " + first +
                                        " has no value");
        try {
            std::size_t used1 = 0, used2 = 0;
            const int index = std::stoi(first, &used1);
            const int value = std::stoi(second, &used2);
            if (used1 != first.size() || used2 != second.size()) throw std::invalid_argument("");
            pairs.emplace_back(index, value);
        } catch (const std::logic_error&) {
            throw std::invalid_argument(std::string(tableName) + ": bad pair \"" + first + " " +
                                        second + "\"");
        }
    }
    return pairs;
}

std::vector<int> readPolarInterleavingPattern(const std::string& text) {
    if (!text.empty())
        return placeIndexed(parseIndexValuePairs(text, "Table5311Text"), 164, "Table5311Text");
    return {tables::kPolarInterleavingPattern.begin(), tables::kPolarInterleavingPattern.end()};
}

std::vector<int> readPolarSubBlockPattern(const std::string& text) {
    if (!text.empty())
        return placeIndexed(parseIndexValuePairs(text, "Table54111Text"), 32, "Table54111Text");
    return {tables::kPolarSubBlockPattern.begin(), tables::kPolarSubBlockPattern.end()};
}

}  // namespace Orvalis_NR
