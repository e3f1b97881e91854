#include "tools.h"

#include <dlfcn.h>

#include <algorithm>

namespace Orvalis::Tessaline {

std::vector<std::string> Tools::split(const std::string& text, char separator) {
    std::vector<std::string> pieces;
    std::string::size_type start = 0;
    for (;;) {
        const auto at = text.find(separator, start);
        if (at == std::string::npos) {
            pieces.push_back(text.substr(start));
            return pieces;
        }
        pieces.push_back(text.substr(start, at - start));
        start = at + 1;
    }
}

std::string Tools::trim(const std::string& text, char c) {
    const auto first = text.find_first_not_of(c);
    if (first == std::string::npos) return {};
    const auto last = text.find_last_not_of(c);
    return text.substr(first, last - first + 1);
}

std::string Tools::trimEnd(const std::string& text, const std::string& suffix) {
    if (!suffix.empty() && text.size() >= suffix.size() &&
        text.compare(text.size() - suffix.size(), suffix.size(), suffix) == 0)
        return text.substr(0, text.size() - suffix.size());
    return text;
}

std::string Tools::replace(const std::string& text, std::string from, std::string to) {
    if (from.empty()) return text;
    std::string out;
    std::string::size_type start = 0;
    for (;;) {
        const auto at = text.find(from, start);
        if (at == std::string::npos) break;
        out.append(text, start, at - start);
        out += to;
        start = at + from.size();
    }
    out.append(text, start, std::string::npos);
    return out;
}

int Tools::textToEnumIndex(const std::string& table, const std::string& text) {
    const auto names = split(table, ',');
    for (std::size_t i = 0; i < names.size(); ++i)
        if (trim(names[i], ' ') == text) return static_cast<int>(i);
    return -1;
}

std::string Tools::enumIndexToText(const std::string& table, int index) {
    const auto names = split(table, ',');
    if (index < 0 || static_cast<std::size_t>(index) >= names.size()) return {};
    return trim(names[static_cast<std::size_t>(index)], ' ');
}

std::string Tools::getLibraryName(const void* address) {
    Dl_info info{};
    if (address && dladdr(address, &info) != 0 && info.dli_fname) {
        std::string path = info.dli_fname;
        const auto slash = path.find_last_of('/');
        return slash == std::string::npos ? path : path.substr(slash + 1);
    }
    return {};
}

std::string Path::combine(const std::string& first, const std::string& second) {
    if (first.empty()) return second;
    if (second.empty()) return first;
    const bool endsWithSeparator = first.back() == '/' || first.back() == '\\';
    const bool startsWithSeparator = second.front() == '/' || second.front() == '\\';
    if (endsWithSeparator && startsWithSeparator) return first + second.substr(1);
    if (endsWithSeparator || startsWithSeparator) return first + second;
    return first + "/" + second;
}

void Log::writeLogText(const std::string&, int, const std::string&) {}

namespace {

// The qualified class name in front of "::getTypeName(" or "::getFullTypeName(": the last
// blank-separated token before the member name. Works for the MSVC form
// ("class std::basic_string<...> __cdecl Models::Nr5g::NRDCI::getTypeName(void) const")
// and the GCC form ("std::string Models::Nr5g::NRDCI::getTypeName() const").
std::string qualifiedClassName(const char* signature, int length) {
    if (!signature || length <= 0) return {};
    std::string text(signature, static_cast<std::size_t>(length));
    if (const auto nul = text.find('\0'); nul != std::string::npos) text.resize(nul);
    auto member = text.find("::getFullTypeName(");
    if (member == std::string::npos) member = text.find("::getTypeName(");
    if (member == std::string::npos) return {};
    const auto blank = text.rfind(' ', member);
    const auto start = blank == std::string::npos ? 0 : blank + 1;
    return text.substr(start, member - start);
}

}  // namespace

std::string RunTime::doGetTypeName(const char* signature, int length) {
    const auto name = qualifiedClassName(signature, length);
    const auto colon = name.rfind("::");
    return colon == std::string::npos ? name : name.substr(colon + 2);
}

std::string RunTime::doGetFullTypeName(const char* signature, int length) {
    return Tools::replace(qualifiedClassName(signature, length), "::", ".");
}

}  // namespace Orvalis::Tessaline
