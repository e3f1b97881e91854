#pragma once
// Pieces of the polar code shared by the encoder and the rate matcher: the mother code length
// (TS 38.212 clause 5.3.1), the sub-block interleaver (clause 5.4.1.1) and the reading of the
// three polar tables, either from the compiled arrays or from index/value text.

#include <string>
#include <utility>
#include <vector>

namespace Orvalis_NR {

/// Mother code length N = 2^n of TS 38.212 clause 5.3.1 for K bits (CRC included) sent in E
/// coded bits, n limited to nMax (9 downlink, 10 uplink) and at least 5.
/// K, E: at least 1. Throws std::invalid_argument otherwise.
int polarCodeLength(int K, int E, int nMax);

/// True when the rate matcher punctures (E < N and K/E <= 7/16), TS 38.212 clause 5.4.1.1.
/// For E < N the alternative is shortening; for E >= N the output repeats.
bool polarPuncturing(int K, int E);

/// Sub-block interleaver of TS 38.212 clause 5.4.1.1: J(n) = P(floor(32n/N)) N/32 + n mod N/32
/// for n = 0..N-1. pattern: the 32 entries of Table 5.4.1.1-1; N: a power of two, at least 32.
std::vector<int> polarSubBlockInterleaver(const std::vector<int>& pattern, int N);

/// Whitespace-separated pairs "index value" of a table held as text. Throws
/// std::invalid_argument naming `tableName` when the text holds an odd count or a non-number.
std::vector<std::pair<int, int>> parseIndexValuePairs(const std::string& text,
                                                      const char* tableName);

/// Table 5.3.1.1-1 (164 entries) from `text` when it is not empty, else the compiled table.
std::vector<int> readPolarInterleavingPattern(const std::string& text);

/// Table 5.4.1.1-1 (32 entries) from `text` when it is not empty, else the compiled table.
std::vector<int> readPolarSubBlockPattern(const std::string& text);

}  // namespace Orvalis_NR
