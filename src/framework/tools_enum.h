#pragma once
// Template helpers of Tools over enumeration tables.

#include "tools.h"

namespace Orvalis::Tessaline {

template <class T>
std::unordered_map<T, std::string> Tools::getEnumNames(const std::string& table) {
    static const std::unordered_map<T, std::string> names = [&table] {
        std::unordered_map<T, std::string> map;
        const auto pieces = split(table, ',');
        for (std::size_t i = 0; i < pieces.size(); ++i)
            map.emplace(static_cast<T>(i), trim(pieces[i], ' '));
        return map;
    }();
    return names;
}

// enumValueMap<T> is defined beside EnumSetting<T>, whose table it reads.
template <class T>
std::unordered_map<std::string, T> Tools::enumValues() {
    return enumValueMap<T>();
}

}  // namespace Orvalis::Tessaline
