#include "downlink/integer_list.h"

#include <algorithm>
#include <cctype>
#include <stdexcept>

#include "common/failure.h"

namespace Orvalis_NR {

std::vector<int> parseIntegerList(const std::string& text, const std::string& setting) {
    const std::string detail = " (" + setting + " \"" + text + "\")";
    if (text.find_first_not_of(" \t") == std::string::npos) failWith("The list is empty.", setting + " \"\"");
    std::vector<int> values;
    std::size_t start = 0;
    while (start <= text.size()) {
        const std::size_t comma = std::min(text.find(',', start), text.size());
        const std::string token = text.substr(start, comma - start);
        std::size_t used = 0;
        int value = 0;
        try {
            value = std::stoi(token, &used);
        } catch (const std::invalid_argument&) {
            throw std::invalid_argument("invalid stoi argument" + detail);
        } catch (const std::out_of_range&) {
            throw std::out_of_range("stoi argument out of range" + detail);
        }
        // A token with anything but blanks after its number is malformed as well.
        for (std::size_t i = used; i < token.size(); ++i)
            if (!std::isspace(static_cast<unsigned char>(token[i]))) throw std::invalid_argument("invalid stoi argument" + detail);
        values.push_back(value);
        start = comma + 1;
    }
    return values;
}

}  // namespace Orvalis_NR
