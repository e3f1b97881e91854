#pragma once
// Small services of the settings framework: text helpers, enumeration tables, type names.

#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

namespace Orvalis::Tessaline {

class Tools {
  public:
    /// Pieces of text between separators (an empty text gives one empty piece).
    static std::vector<std::string> split(const std::string& text, char separator);
    /// text without leading and trailing `c`.
    static std::string trim(const std::string& text, char c);
    /// text without a trailing `suffix`, when it ends with it.
    static std::string trimEnd(const std::string& text, const std::string& suffix);
    /// Every occurrence of `from` replaced by `to`.
    static std::string replace(const std::string& text, std::string from, std::string to);
    /// Position of `text` in a comma-separated enumerator table; -1 when absent.
    static int textToEnumIndex(const std::string& table, const std::string& text);
    /// Name at `index` in a comma-separated enumerator table; empty when out of range.
    static std::string enumIndexToText(const std::string& table, int index);
    /// File name of the module that holds `address`.
    static std::string getLibraryName(const void* address);

    /// Enumerator position to name, from the enumeration's table (built once).
    template <class T>
    static std::unordered_map<T, std::string> getEnumNames(const std::string& table);
    /// Enumerator name to value (built once); a copy.
    template <class T>
    static std::unordered_map<std::string, T> enumValues();
    /// The same map without the copy, for the parsing path.
    template <class T>
    static const std::unordered_map<std::string, T>& enumValueMap();
};

class Path {
  public:
    /// Joins two path parts with one separator.
    static std::string combine(const std::string& first, const std::string& second);
};

class Log {
  public:
    /// Framework log line; the library keeps no log of its own here, so the text is dropped.
    static void writeLogText(const std::string& source, int level, const std::string& text);
};

class Library {
  public:
    static std::string getLibraryName(const void* address) {
        return Tools::getLibraryName(address);
    }
};

/// Extracts class names from the compiler's function-signature text of getTypeName and
/// getFullTypeName ("... Models::Nr5g::NRDCI::getTypeName(void) const").
class RunTime {
  public:
    /// The bare class name: "NRDCI".
    static std::string doGetTypeName(const char* signature, int length);
    /// The class name with its namespaces joined by points: "Models.Nr5g.NRDCI".
    static std::string doGetFullTypeName(const char* signature, int length);
};

}  // namespace Orvalis::Tessaline
