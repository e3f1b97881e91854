// The host boundary: log rules and texts, status, and calls that fail or come out of order.

#include <gtest/gtest.h>

#include <cstring>
#include <memory>
#include <string>
#include <vector>

#include "../engine/output_files.h"
#include "../engine/waveform_test_support.h"
#include "interface/calculator.h"
#include "interface/log_buffer.h"
#include "interface/nr5g_engine_wrapper.h"
#include "models/nr5g_waveform_settings.h"
#include "nrsynth/nrsynth.h"

extern std::shared_ptr<Models::Nr5g::NR5GWaveformSettings> gSettings;
extern int gLogLength;

namespace {

using nrsynth_test::cwCarrier;
using nrsynth_test::waveform;

std::string logText() { return GetLog(); }

// ---- the log rule on a buffer of its own, with guard bytes behind it

struct GuardedLog {
    char bytes[Orvalis_NR::kLogCapacity + 16];
    int length = 0;
    GuardedLog() { std::memset(bytes, 0x5A, sizeof bytes); }
    void add(const std::string& text, bool restart) { Orvalis_NR::appendLog(bytes, length, text.c_str(), restart); }
    bool guardIntact() const {
        for (std::size_t i = Orvalis_NR::kLogCapacity; i < sizeof bytes; ++i)
            if (bytes[i] != 0x5A) return false;
        return true;
    }
};

TEST(LogRule, EntriesAreSeparatedByCarriageReturnLineFeed) {
    GuardedLog log;
    log.add("Deserialize OK! ", true);
    EXPECT_EQ(log.length, 17);
    log.add("Init Engine OK! ", false);
    log.add("Run Engine OK! ", false);
    EXPECT_EQ(log.length, 52);
    EXPECT_STREQ(log.bytes, "Deserialize OK! \r\nInit Engine OK! \r\nRun Engine OK! ");
}

TEST(LogRule, AnEntryReachingLength4097EmptiesTheLogFirst) {
    GuardedLog log;
    log.add(std::string(4000, 'a'), true);
    log.add(std::string(94, 'b'), false);  // 4001 + 1 + 95 = 4097: does not fit
    EXPECT_EQ(log.length, 95);
    EXPECT_EQ(std::string(log.bytes), std::string(94, 'b'));

    GuardedLog exact;
    exact.add(std::string(4000, 'a'), true);
    exact.add(std::string(93, 'b'), false);  // exactly 4096
    EXPECT_EQ(exact.length, 4096);
    EXPECT_EQ(std::strlen(exact.bytes), 4095u);
}

TEST(LogRule, AnOverlongTextIsCutInsteadOfRunningOverTheBuffer) {
    for (bool restart : {true, false}) {
        GuardedLog log;
        log.add("first", true);
        log.add(std::string(5000, 'x'), restart);
        EXPECT_TRUE(log.guardIntact());
        EXPECT_EQ(log.length, Orvalis_NR::kLogCapacity);
        EXPECT_EQ(log.bytes[Orvalis_NR::kLogCapacity - 1], '\0');
    }
}

// ---- the plain functions

class PlainFunctions : public ::testing::Test {
protected:
    nrsynth_test::ScratchFolder folder;
    std::string path = folder.file("wave.bin");
    std::string goodDocument = waveform(3.84e6, 1, {cwCarrier()}).dump();
};

TEST_F(PlainFunctions, DeserializeFailureRestartsTheLogWithTheReadersText) {
    StartDeserialize(goodDocument.c_str());
    StartDeserialize(R"({"NRCarriers": [{"CellID": "x"}]})");
    EXPECT_EQ(GetStatus(), -1);
    EXPECT_EQ(logText(), "Deserialize Error! \r\nNRCarriers[0].CellID: expected an integer, got \"x\"");
    EXPECT_EQ(gLogLength, static_cast<int>(logText().size()) + 1);

    // The earlier tree stays, so an engine can still be built on it.
    InitEngine(path.c_str());
    EXPECT_EQ(GetStatus(), 0) << GetLog();
    EXPECT_EQ(logText(), "Deserialize Error! \r\nNRCarriers[0].CellID: expected an integer, got \"x\"\r\nInit Engine OK! ");
}

TEST_F(PlainFunctions, MalformedAndMissingJsonAreReported) {
    StartDeserialize("{\"NumberOfFrames\": ");
    EXPECT_EQ(GetStatus(), -1);
    EXPECT_EQ(logText().rfind("Deserialize Error! \r\n", 0), 0u);
    StartDeserialize(nullptr);
    EXPECT_EQ(GetStatus(), -1);
    EXPECT_NE(logText().find("null"), std::string::npos);
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
        EXPECT_EQ(logText().rfind(std::string("Init Engine Error! \r\n") + c.expectedText, 0), 0u) << logText();
        // The half-built engine cannot run.
        RunEngine();
        EXPECT_EQ(GetStatus(), -1);
        EXPECT_EQ(logText().rfind("Run Engine Error! \r\n", 0), 0u) << logText();
    }
    InitEngine(nullptr);
    EXPECT_EQ(GetStatus(), -1);
}

TEST_F(PlainFunctions, ValuesThatWouldBreakTheEngineAreReportedNotCrashed) {
    const std::string ssb = R"("CarrierType": "DL", "Numerology": "SCS15k", "Downlink": {"SSPBCH": {"Enabled": true,)"
                            R"( "Numerology": "SCS15k", "Mu": 0, "Lmax": 4, "PowerLevelStr": "1")";
    const std::string ssbDocuments[] = {
        R"({"SampleRateAuto": 7.68e6, "NRCarriers": [{"CellID": 5000, )" + ssb + "}}}]}",
        R"({"SampleRateAuto": 7.68e6, "NRCarriers": [{)" + ssb + R"(, "PayloadDataLength": 1000000000}}}]})",
        R"({"SampleRateAuto": 7.68e6, "NRCarriers": [{)" + ssb + R"(, "Lmax": 100000000}}}]})",
        R"({"SampleRateAuto": 7.68e6, "NRCarriers": [{)" + ssb +
            R"x(, "PayloadData": {"PayLoadDataType": "Pattern", "PatternBits": "PN23(0:2147483647)"}}}}]})x",
        R"({"SampleRateAuto": 7.68e6, "NRCarriers": [{"WindowBeta": 2, )" + ssb + "}}}]}",
        R"({"SampleRateAuto": 7.68e6, "NRCarriers": [{"FrequencyOffsetOfPointA": 1e300, )" + ssb + "}}}]}",
        R"({"SampleRateAuto": 7.68e6, "NRCarriers": [{)" + ssb + R"(}, "LTECoexistence": {"Enabled": true,)"
            R"( "LTECRS": [{"MBSFNSubframeIndexArrayStr": "1,x"}]}}}]})",
        R"({"SampleRateAuto": 3e9, "AwgnEnabled": true})",
    };
    std::vector<std::string> documents = {R"({"SampleRateAuto": 0})", R"({"SampleRateAuto": 3.84e6, "NumberOfAntennas": -2})",
                                          R"({"SampleRateAuto": 3.84e6, "NumberOfFrames": -1})"};
    documents.insert(documents.end(), std::begin(ssbDocuments), std::end(ssbDocuments));
    for (const auto& text : documents) {
        const char* document = text.c_str();
        StartDeserialize(document);
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
    Cancel();                               // no running engine: nothing happens
    InitTestVectorGenerator(false, nullptr);

    StartDeserialize(goodDocument.c_str());
    InitEngine(path.c_str());
    RunEngine();
    ASSERT_EQ(GetStatus(), 0) << GetLog();
    RunEngine();  // a second run needs a new engine
    EXPECT_EQ(GetStatus(), -1);
    EXPECT_EQ(logText().rfind("Run Engine Error! \r\n", 0), 0u);
}

TEST_F(PlainFunctions, ReplacingTheSettingsKeepsTheEnginesTreeAlive) {
    StartDeserialize(goodDocument.c_str());
    InitEngine(path.c_str());
    StartDeserialize(waveform(7.68e6, 2, {cwCarrier()}).dump().c_str());  // a new tree before the run
    RunEngine();
    ASSERT_EQ(GetStatus(), 0) << GetLog();
    EXPECT_EQ(nrsynth_test::readSamples(path).size(), 38400u);  // the engine ran on the first tree
}

TEST_F(PlainFunctions, LogAddressIsStableAndLogStatusFollowsTheRule) {
    char* address = GetLog();
    char first[] = "one";
    char second[] = "two";
    LogStatus(first, true);
    LogStatus(second, false);
    EXPECT_EQ(GetLog(), address);
    EXPECT_STREQ(GetLog(), "one\r\ntwo");
    EXPECT_EQ(gLogLength, 9);
}

TEST(EngineWrapper, RunsAWaveformAndThrowsItsFailures) {
    nrsynth_test::ScratchFolder folder;
    auto settings = std::make_shared<Models::Nr5g::NR5GWaveformSettings>();
    settings->SampleRateAuto->setValue(3.84e6);
    settings->NRCarriers->getValue()->resize(1);
    settings->NRCarriers->getValue()->getItem(0)->CarrierType->setValue(Models::Nr5g::CarrierType::CW);

    Orvalis_NR::NR5GEngineWrapper wrapper;
    wrapper.Init(settings, folder.file("w.bin"));
    wrapper.Go();
    EXPECT_EQ(nrsynth_test::readSamples(folder.file("w.bin")).size(), 38400u);
    EXPECT_THROW(wrapper.Go(), std::exception);

    Orvalis_NR::NR5GEngineWrapper broken;
    EXPECT_THROW(broken.Init(settings, "x"), std::exception);
    EXPECT_THROW(broken.Init(nullptr, folder.file("w.bin")), std::invalid_argument);
}

TEST(CalculatorClass, ReachesTheRegistryOfModels) {
    Orvalis_NR::Calculator calculator;
    EXPECT_EQ(calculator.add(40, 2), 42);
    auto container = calculator.getModelContainer();
    ASSERT_TRUE(container);
    EXPECT_NE(container->findByName("NR5GWaveformSettings"), nullptr);
}

}  // namespace
