#include "downlink/pdsch_list.h"

#include <stdexcept>

namespace Orvalis_NR {

std::vector<int> parseIntList(const std::string& text) {
    std::vector<int> values;
    std::size_t start = 0;
    if (text.empty()) return values;
    while (true) {
        const std::size_t comma = text.find(',', start);
        const std::string token = text.substr(start, comma == std::string::npos ? std::string::npos : comma - start);
        try {
            values.push_back(std::stoi(token));
        } catch (const std::invalid_argument&) {
            throw std::invalid_argument("invalid stoi argument");
        } catch (const std::out_of_range&) {
            throw std::out_of_range("stoi argument out of range");
        }
        if (comma == std::string::npos) break;
        start = comma + 1;
    }
    return values;
}

}  // namespace Orvalis_NR
