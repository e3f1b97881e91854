// The host boundary: log rules and texts, status, and calls that fail or come out of order.

#include <gtest/gtest.h>

#include <cstring>
#include <filesystem>
#include <memory>
#include <string>

#include "../engine/output_files.h"
#include "../engine/waveform_test_support.h"
#include "interface/log_buffer.h"
#include "models/nr5g_waveform_settings.h"
#include "nrsynth/nrsynth.h"

extern std::shared_ptr<Models::Nr5g::NR5GWaveformSettings> gSettings;
extern int gLogLength;

namespace {

using nrsynth_test::cwCarrier;
using nrsynth_test::waveform;

std::string logText() {
    return GetLog();
}

bool startsWith(const std::string& text, const std::string& head) {
    return text.rfind(head, 0) == 0;
}

// The log rule on a buffer of its own, with guard bytes behind it: an entry that would reach
// length 4097 (text, CR LF separator and terminator) empties the log first; an entry longer than
// the whole buffer is cut instead of running over it.
TEST(LogRule, FullLogRestartsAndOverlongTextIsCut) {
    struct GuardedLog {
        char bytes[Orvalis_NR::kLogCapacity + 16];
        int length = 0;
        GuardedLog() { std::memset(bytes, 0x5A, sizeof bytes); }
        void add(const std::string& text, bool restart) {
            Orvalis_NR::appendLog(bytes, length, text.c_str(), restart);
        }
    };
    GuardedLog full, exact;
    full.add(std::string(4000, 'a'), true);
    full.add(std::string(94, 'b'), false);  // 4001 + 1 + 95 = 4097: does not fit
    EXPECT_EQ(full.length, 95);
    EXPECT_EQ(std::string(full.bytes), std::string(94, 'b'));
    exact.add(std::string(4000, 'a'), true);
    exact.add(std::string(93, 'b'), false);  // exactly 4096
    EXPECT_EQ(exact.length, 4096);
    EXPECT_EQ(std::strlen(exact.bytes), 4095u);

    for (bool restart : {true, false}) {
        GuardedLog log;
        log.add("first", true);
        log.add(std::string(5000, 'x'), restart);
        EXPECT_EQ(log.length, Orvalis_NR::kLogCapacity);
        EXPECT_EQ(log.bytes[Orvalis_NR::kLogCapacity - 1], '\0');
        for (std::size_t i = Orvalis_NR::kLogCapacity; i < sizeof log.bytes; ++i)
            ASSERT_EQ(log.bytes[i], 0x5A) << "guard byte " << i;
    }
}

class PlainFunctions : public ::testing::Test {
  protected:
    nrsynth_test::ScratchFolder folder;
    std::string path = folder.file("wave.bin");
    std::string goodDocument = waveform(3.84e6, 1, {cwCarrier()}).dump();
};

TEST_F(PlainFunctions, GoodRunLogsThreeEntriesAtOneStableAddress) {
    char* address = GetLog();
    ASSERT_EQ(nrsynth_test::generate(waveform(3.84e6, 1, {cwCarrier()}), path), 0) << GetLog();
    EXPECT_EQ(GetLog(), address);
    EXPECT_STREQ(GetLog(), "Deserialize OK! \r\nInit Engine OK! \r\nRun Engine OK! ");
    EXPECT_EQ(gLogLength, 52);

    char first[] = "one";
    char second[] = "two";
    LogStatus(first, true);
    LogStatus(second, false);
    EXPECT_EQ(GetLog(), address);
    EXPECT_STREQ(GetLog(), "one\r\ntwo");
    EXPECT_EQ(gLogLength, 9);
}

TEST_F(PlainFunctions, DeserializeFailureRestartsTheLogWithTheReadersText) {
    const std::string failure =
        "Deserialize Error! \r\nNRCarriers[0].CellID: expected an integer, got \"x\"";
    StartDeserialize(goodDocument.c_str());
    StartDeserialize(R"({"NRCarriers": [{"CellID": "x"}]})");
    EXPECT_EQ(GetStatus(), -1);
    EXPECT_EQ(logText(), failure);
    EXPECT_EQ(gLogLength, static_cast<int>(failure.size()) + 1);

    // The earlier tree stays, so an engine can still be built on it.
    InitEngine(path.c_str());
    EXPECT_EQ(GetStatus(), 0) << GetLog();
    EXPECT_EQ(logText(), failure + "\r\nInit Engine OK! ");

    for (const char* broken : {"{\"NumberOfFrames\": ", static_cast<const char*>(nullptr)}) {
        StartDeserialize(broken);
        EXPECT_EQ(GetStatus(), -1);
        EXPECT_TRUE(startsWith(logText(), "Deserialize Error! \r\n")) << logText();
    }
}

TEST_F(PlainFunctions, InitEngineFailuresNameTheCause) {
    struct Case {
        std::string outputPath;
        const char* expectedText;
    } cases[] = {
        {"a.b", "Output path shorter than four characters."},
        {folder.file("missing/wave.bin"), "FileBuffer::Open file failed."},
    };
    for (const auto& c : cases) {
        StartDeserialize(goodDocument.c_str());
        InitEngine(c.outputPath.c_str());
        EXPECT_EQ(GetStatus(), -1) << c.outputPath;
        EXPECT_TRUE(startsWith(logText(), std::string("Init Engine Error! \r\n") + c.expectedText))
            << logText();
        // The half-built engine cannot run.
        RunEngine();
        EXPECT_EQ(GetStatus(), -1);
        EXPECT_TRUE(startsWith(logText(), "Run Engine Error! \r\n")) << logText();
    }
}

// Documents the reader accepts but whose values would break the engine: each is a failure with
// a log entry, never a crash.
TEST_F(PlainFunctions, ValuesThatWouldBreakTheEngineAreReportedNotCrashed) {
    const std::string head = R"({"SampleRateAuto": 7.68e6, "NRCarriers": [{)";
    const std::string ssb = R"("CarrierType": "DL", "Numerology": "SCS15k", "Downlink": {"SSPBCH":)"
                            R"( {"Enabled": true, "Numerology": "SCS15k", "Mu": 0, "Lmax": 4,)"
                            R"( "PowerLevelStr": "1")";
    const std::string documents[] = {
        R"({"SampleRateAuto": 1e9, "NumberOfFrames": 1000})",  // beyond an int of samples
        R"({"SampleRateAuto": 3.84e6, "NumberOfAntennas": -2})",
        R"({"SampleRateAuto": 3e9, "AwgnEnabled": true})",
        head + R"("CellID": -1, )" + ssb + "}}}]}",  // a negative identity has no PSS shift
        head + ssb + R"(, "PayloadDataLength": 1000000000}}}]})",
        head + ssb + R"(, "Lmax": 100000000}}}]})",
        head + ssb + R"x(, "PayloadData": {"PayLoadDataType": "Pattern",)x" +
            R"x( "PatternBits": "PN23(0:2147483647)"}}}}]})x",
        head + R"("WindowBeta": 2, )" + ssb + "}}}]}",
        head + R"("FrequencyOffsetOfPointA": 1e300, )" + ssb + "}}}]}",
    };
    for (const auto& document : documents) {
        StartDeserialize(document.c_str());
        ASSERT_EQ(GetStatus(), 0) << document;
        InitEngine(path.c_str());
        if (GetStatus() == 0) RunEngine();
        EXPECT_EQ(GetStatus(), -1) << document;
        EXPECT_NE(logText().find("Error! \r\n"), std::string::npos) << logText();
    }
}

TEST_F(PlainFunctions, CallsOutOfOrderAreFailuresOrNoOps) {
    gSettings.reset();  // as at load
    InitEngine(path.c_str());
    EXPECT_EQ(GetStatus(), -1);
    EXPECT_NE(logText().find("StartDeserialize"), std::string::npos) << logText();
    Cancel();  // no running engine: nothing happens

    StartDeserialize(goodDocument.c_str());
    InitEngine(path.c_str());
    RunEngine();
    ASSERT_EQ(GetStatus(), 0) << GetLog();
    RunEngine();  // a second run needs a new engine
    EXPECT_EQ(GetStatus(), -1);
    EXPECT_TRUE(startsWith(logText(), "Run Engine Error! \r\n")) << logText();
}

TEST_F(PlainFunctions, ReplacingTheSettingsKeepsTheEnginesTreeAlive) {
    StartDeserialize(goodDocument.c_str());
    InitEngine(path.c_str());
    StartDeserialize(waveform(7.68e6, 2, {cwCarrier()}).dump().c_str());  // before the run
    RunEngine();
    ASSERT_EQ(GetStatus(), 0) << GetLog();
    EXPECT_EQ(nrsynth_test::readSamples(path).size(), 38400u);  // the engine ran on the first tree
}

// The empty document is a waveform of no carrier at sample rate 0: empty files, and success.
TEST_F(PlainFunctions, EmptyDocumentGivesEmptyFiles) {
    StartDeserialize("{}");
    InitEngine(path.c_str());
    RunEngine();
    EXPECT_EQ(GetStatus(), 0);
    EXPECT_STREQ(GetLog(), "Deserialize OK! \r\nInit Engine OK! \r\nRun Engine OK! ");
    ASSERT_TRUE(std::filesystem::exists(path));
    EXPECT_EQ(std::filesystem::file_size(path), 0u);
    EXPECT_EQ(std::filesystem::file_size(path + ".mkr"), 0u);
}

// List settings and the guard digit of a bandwidth part name fail with the texts of the
// string-to-int conversion, whatever the standard library's own texts are.
TEST_F(PlainFunctions, BadNumbersInListsAndNamesGiveTheConversionTexts) {
    const std::string ssb = R"("CarrierType": "DL", "Numerology": "SCS15k", "Downlink": {"SSPBCH":)"
                            R"( {"Enabled": true, "Numerology": "SCS15k", "Mu": 0, "Lmax": 4,)"
                            R"( "PowerLevelStr": "1"})";
    auto withCrs = [&](const char* list) {
        return R"({"SampleRateAuto": 7.68e6, "NRCarriers": [{)" + ssb +
               R"(, "LTECoexistence": {"Enabled": true, "LTECRS": [{"MBSFNSubframeIndexArrayStr": ")" + list +
               R"("}]}}}]})";
    };
    auto withBwpName = [&](const char* name) {
        return R"({"SampleRateAuto": 7.68e6, "NRCarriers": [{)" + ssb + R"(, "BWP": [{}, {"Name": ")" + name +
               R"("}]}}]})";
    };
    struct Case {
        std::string document;
        const char* text;
    } cases[] = {
        {withCrs("1,x"), "invalid stoi argument"},
        {withCrs("1,,2"), "invalid stoi argument"},
        {withCrs("99999999999"), "stoi argument out of range"},
        {withBwpName("BWP FBx"), "invalid stoi argument"},
        {withBwpName("FB"), "invalid stoi argument"},
        {withBwpName("FB-1"), "invalid stoi argument"},
    };
    for (const auto& c : cases) {
        StartDeserialize(c.document.c_str());
        ASSERT_EQ(GetStatus(), 0) << GetLog();
        InitEngine(path.c_str());
        ASSERT_EQ(GetStatus(), 0) << GetLog();
        RunEngine();
        EXPECT_EQ(GetStatus(), -1) << c.document;
        EXPECT_EQ(logText(), std::string("Run Engine Error! \r\n") + c.text) << c.document;
    }
    // A good digit and a good list run.
    for (const auto& document : {withBwpName("x FB2"), withCrs("1,6,")}) {
        EXPECT_EQ(nrsynth_test::generate(nlohmann::json::parse(document), path), 0) << GetLog();
    }
}

// A run holds its engine and tree: an InitEngine (and a new document) from another thread while
// it runs replaces the globals without freeing what the run uses, and the run completes.
TEST_F(PlainFunctions, InitEngineDuringARunLeavesTheRunItsEngine) {
    auto document = waveform(3.84e6, 40, {cwCarrier(1000.0)});
    document["AwgnEnabled"] = true;
    StartDeserialize(document.dump().c_str());
    InitEngine(path.c_str());
    ASSERT_EQ(GetStatus(), 0) << GetLog();
    nrsynth_test::BackgroundRun run(path);
    EXPECT_FALSE(run.finished()) << "the run ended before the new engine came";
    StartDeserialize(goodDocument.c_str());
    InitEngine(folder.file("other.bin").c_str());
    run.join();
    EXPECT_EQ(std::filesystem::file_size(path), 40u * 38400 * 16);
    // The new engine is the one that runs next.
    RunEngine();
    EXPECT_EQ(GetStatus(), 0) << GetLog();
    EXPECT_EQ(std::filesystem::file_size(folder.file("other.bin")), 38400u * 16);
}

}  // namespace
