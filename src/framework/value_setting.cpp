#include "value_setting.h"

#include <cctype>
#include <cerrno>
#include <charconv>
#include <cstdio>
#include <cstdlib>

namespace Orvalis::Tessaline {

std::string Int32Setting::toString() const {
    return std::to_string(value_);
}

bool Int32Setting::parse(const std::string& text) {
    int v = 0;
    const char* end = text.data() + text.size();
    auto [ptr, ec] = std::from_chars(text.data(), end, v);
    if (ec != std::errc{} || ptr != end) return false;
    setValue(v);
    return true;
}

std::string DoubleSetting::toString() const {
    char buffer[32];
    std::snprintf(buffer, sizeof buffer, "%.17g", value_);
    return buffer;
}

bool DoubleSetting::parse(const std::string& text) {
    if (text.empty() || std::isspace(static_cast<unsigned char>(text.front()))) return false;
    char* end = nullptr;
    errno = 0;
    const double v = std::strtod(text.c_str(), &end);
    if (end != text.c_str() + text.size() || errno == ERANGE) return false;
    setValue(v);
    return true;
}

bool BoolSetting::parse(const std::string& text) {
    std::string lower;
    for (char c : text) lower += static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    if (lower == "true" || lower == "1") {
        setValue(true);
        return true;
    }
    if (lower == "false" || lower == "0") {
        setValue(false);
        return true;
    }
    return false;
}

}  // namespace Orvalis::Tessaline
