// Documents the fuzzers once crashed the library with, and kin of them: each now ends in a
// reported outcome through the host interface, with the message that says why.

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <sstream>
#include <string>

#include "nrsynth/nrsynth.h"
#include "test_support.h"

namespace {

struct RegressionCase {
    const char* name;    // tests/fuzz/documents/<name>.json
    int status;          // status after the last step that ran
    const char* logHas;  // a text the log must hold
};

void PrintTo(const RegressionCase& c, std::ostream* os) {
    *os << c.name;
}

std::string document(const std::string& name) {
    std::ifstream in(nrsynth_test::sourceDir() / "tests" / "fuzz" / "documents" / (name + ".json"),
                     std::ios::binary);
    std::ostringstream text;
    text << in.rdbuf();
    return text.str();
}

class FuzzRegressions : public ::testing::TestWithParam<RegressionCase> {};

TEST_P(FuzzRegressions, EndInAReportedOutcome) {
    const auto& c = GetParam();
    const std::string json = document(c.name);
    ASSERT_FALSE(json.empty()) << "missing document " << c.name;
    const auto folder =
        std::filesystem::temp_directory_path() / ("nrsynth_fuzz_regression_" + std::string(c.name));
    std::filesystem::create_directories(folder);
    const std::string output = (folder / "wave.bin").string();

    StartDeserialize(json.c_str());
    if (GetStatus() == 0) InitEngine(output.c_str());
    if (GetStatus() == 0) RunEngine();
    EXPECT_EQ(GetStatus(), c.status);
    EXPECT_NE(std::string(GetLog()).find(c.logHas), std::string::npos) << GetLog();
    InitEngine("");  // closes the files of a failed run
    std::filesystem::remove_all(folder);
}

INSTANTIATE_TEST_SUITE_P(Documents, FuzzRegressions,
                         ::testing::Values(RegressionCase{"deep_nesting", -1,
                                                          "document nests deeper than 64 levels"}),
                         [](const ::testing::TestParamInfo<RegressionCase>& info) {
                             return std::string(info.param.name);
                         });

}  // namespace
