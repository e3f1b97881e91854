#pragma once
// The failure that the engine reports to the host boundary: a fixed text of the library and,
// where it helps the user, a detail such as the setting or the file concerned.

#include <stdexcept>
#include <string>

namespace Orvalis_NR {

class EngineFailure : public std::runtime_error {
public:
    EngineFailure(const char* text, std::string detail)
        : std::runtime_error(detail.empty() ? std::string(text) : std::string(text) + " " + detail),
          text(text),
          detail(std::move(detail)) {}

    const char* text;    ///< static text of the library
    std::string detail;  ///< setting, value or file name; may be empty
};

/// Throws an EngineFailure with the detail text.
[[noreturn]] inline void failWith(const char* text, std::string detail = {}) {
    throw EngineFailure{text, std::move(detail)};
}

}  // namespace Orvalis_NR
