#pragma once
// Numbers in list settings (comma lists of slots, subframes, ports) and in names. A text that is
// no number throws std::invalid_argument("invalid stoi argument"), one beyond int
// std::out_of_range("stoi argument out of range"): the texts a host knows from these settings,
// the same on every standard library. Like std::stoi, leading blanks are skipped and anything
// after the number is ignored ("3a" is 3).

#include <string>
#include <vector>

namespace Orvalis_NR {

int intFromText(const std::string& text);
double doubleFromText(const std::string& text);  // "invalid stod argument", "stod argument out of range"

/// The comma-separated integers of `list`. An empty text is an empty list, and a comma at the
/// very end closes the list; an empty item anywhere else is no number.
std::vector<int> intsFromCommaList(const std::string& list);

}  // namespace Orvalis_NR
