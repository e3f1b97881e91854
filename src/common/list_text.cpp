#include "common/list_text.h"

#include <algorithm>
#include <stdexcept>

namespace Orvalis_NR {

int intFromText(const std::string& text) {
    try {
        return std::stoi(text);
    } catch (const std::invalid_argument&) {
        throw std::invalid_argument("invalid stoi argument");
    } catch (const std::out_of_range&) {
        throw std::out_of_range("stoi argument out of range");
    }
}

double doubleFromText(const std::string& text) {
    try {
        return std::stod(text);
    } catch (const std::invalid_argument&) {
        throw std::invalid_argument("invalid stod argument");
    } catch (const std::out_of_range&) {
        throw std::out_of_range("stod argument out of range");
    }
}

std::vector<int> intsFromCommaList(const std::string& list) {
    std::vector<int> values;
    for (std::size_t start = 0; start < list.size();) {
        const auto comma = std::min(list.find(',', start), list.size());
        values.push_back(intFromText(list.substr(start, comma - start)));
        start = comma + 1;
    }
    return values;
}

}  // namespace Orvalis_NR
