#pragma once
// Helpers shared by the test suites.

#include <gtest/gtest.h>

#include <filesystem>
#include <string>

namespace nrsynth_test {

/// Folder of the public oracle data beside the checkout; empty when it is absent.
inline std::filesystem::path sharedDir() {
    std::filesystem::path p{NRSYNTH_SHARED_DIR};
    return std::filesystem::is_directory(p) ? p : std::filesystem::path{};
}

/// Folder of the project sources (examples/, data/).
inline std::filesystem::path sourceDir() { return std::filesystem::path{NRSYNTH_SOURCE_DIR}; }

/// The text of the library failure (a thrown `const char*`) that `run` raises; empty when it
/// raises none. Other exceptions pass through.
template <class Run>
std::string failureText(Run&& run) {
    try {
        run();
    } catch (const char* text) {
        return text ? std::string(text) : std::string("(null)");
    }
    return {};
}

}  // namespace nrsynth_test

/// Skips the current test when the oracle folder is not beside the checkout.
#define NRSYNTH_REQUIRE_SHARED()                                                  \
    do {                                                                          \
        if (nrsynth_test::sharedDir().empty()) GTEST_SKIP() << "no ../shared folder"; \
    } while (0)
