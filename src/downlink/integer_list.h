#pragma once
// Comma lists of integers held in string settings (SlotIndexArrayStr, CCEOffsetStr, ...).

#include <string>
#include <vector>

namespace Orvalis_NR {

/// The integers of the comma list `text`. `setting` names the setting and its owner for the
/// failure text. An empty list fails; a token that is not a whole integer throws
/// std::invalid_argument ("invalid stoi argument ...") and one outside int throws
/// std::out_of_range ("stoi argument out of range ..."), both naming the setting and value.
std::vector<int> parseIntegerList(const std::string& text, const std::string& setting);

}  // namespace Orvalis_NR
