#pragma once
// Comma lists of integers in text settings ("0,1", "1000,1001", slot lists).

#include <string>
#include <vector>

namespace Orvalis_NR {

/// The integers of a comma list; an empty text gives an empty list. A token that is not a
/// number throws std::invalid_argument("invalid stoi argument"), one out of int range
/// std::out_of_range("stoi argument out of range").
std::vector<int> parseIntList(const std::string& text);

}  // namespace Orvalis_NR
