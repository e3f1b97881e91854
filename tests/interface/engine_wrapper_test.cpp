// The engine for object-oriented hosts: the same waveform as the C interface, failures thrown as
// the library's text, and a tree that changes (or goes away) between Init and Go.

#include <gtest/gtest.h>

#include <filesystem>
#include <functional>
#include <fstream>
#include <iterator>
#include <memory>
#include <stdexcept>
#include <string>

#include "../engine/output_files.h"
#include "../engine/waveform_test_support.h"
#include "framework/json_serializer.h"
#include "interface/nr5g_engine_wrapper.h"
#include "models/nr5g_waveform_settings.h"

namespace {

using Models::Nr5g::NR5GWaveformSettings;
using nrsynth_test::cwCarrier;
using nrsynth_test::waveform;
using Orvalis_NR::NR5GEngineWrapper;

std::shared_ptr<NR5GWaveformSettings> tree(const nlohmann::json& document) {
    Orvalis::Tessaline::JsonSerializer serializer;
    auto settings = std::dynamic_pointer_cast<NR5GWaveformSettings>(serializer.deserialize(document.dump()));
    if (!settings) throw std::runtime_error("not a waveform document");
    return settings;
}

std::string bytesOf(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>()};
}

/// Runs `step` and returns the text it threw as the library's failure ("" when none).
template <class Step>
std::string failureOf(Step&& step) {
    try {
        step();
    } catch (const char* text) {
        return text ? text : "(null)";
    }
    return "";
}

class EngineWrapper : public ::testing::Test {
  protected:
    nrsynth_test::ScratchFolder folder;
    std::string path = folder.file("wave.bin");
    nlohmann::json document = waveform(3.84e6, 2, {cwCarrier(1000.0), cwCarrier(-2000.0)});
};

TEST_F(EngineWrapper, RunGivesTheSameFilesAsTheCInterfaceAndKeepsItsTree) {
    ASSERT_EQ(nrsynth_test::generate(document, folder.file("c.bin")), 0) << GetLog();
    NR5GEngineWrapper wrapper;
    auto settings = tree(document);
    wrapper.Init(settings, path);
    settings.reset();  // the wrapper holds the tree the engine reads
    wrapper.Go();
    const std::string expected = bytesOf(folder.file("c.bin"));
    ASSERT_EQ(expected.size(), 76800u * 16);
    EXPECT_TRUE(bytesOf(path) == expected);
    EXPECT_TRUE(bytesOf(path + ".mkr") == bytesOf(folder.file("c.bin.mkr")));

    // A new Init makes the same wrapper ready for another run.
    wrapper.Init(tree(document), folder.file("again.bin"));
    wrapper.Go();
    EXPECT_TRUE(bytesOf(folder.file("again.bin")) == expected);
}

TEST_F(EngineWrapper, FailuresReachTheCallerAsTheLibrarysText) {
    struct Case {
        const char* name;
        std::function<void(NR5GEngineWrapper&)> steps;
        const char* text;
    };
    const Case cases[] = {
        {"ShortPath", [&](NR5GEngineWrapper& w) { w.Init(tree(document), "a.b"); },
         "Output path shorter than four characters."},
        {"NoTree", [&](NR5GEngineWrapper& w) { w.Init(nullptr, path); }, "NR5GEngineWrapper::Init needs a settings tree."},
        {"GoWithoutInit", [&](NR5GEngineWrapper& w) { w.Go(); }, "The engine is not set up"},
        {"GoTwice",
         [&](NR5GEngineWrapper& w) {
             w.Init(tree(document), path);
             w.Go();
             w.Go();
         },
         "The engine has already run"},
    };
    for (const auto& c : cases) {
        NR5GEngineWrapper wrapper;
        const std::string text = failureOf([&] { c.steps(wrapper); });
        EXPECT_EQ(text.rfind(c.text, 0), 0u) << c.name << ": " << text;
    }
    // Without Init, the other operations do nothing.
    NR5GEngineWrapper idle;
    idle.Cancel();
    idle.InitTestVectorGenerator(true, folder.path().string());
}

// Generators and files are made for the carriers and antennas that Init saw; a tree changed
// before Go is refused instead of indexing past them, and a new Init takes the change.
TEST_F(EngineWrapper, TreeChangedBetweenInitAndGoIsRefused) {
    struct Case {
        const char* name;
        std::function<void(NR5GWaveformSettings&)> change;
        const char* text;
        std::size_t antennas;
    };
    const Case cases[] = {
        {"MoreCarriers", [](NR5GWaveformSettings& s) { s.NRCarriers->getValue()->resize(3); },
         "NRCarriers changed between Init and Go: a new Init is needed. NRCarriers 2 at Init, 3 now", 1},
        {"FewerCarriers", [](NR5GWaveformSettings& s) { s.NRCarriers->getValue()->resize(1); },
         "NRCarriers changed between Init and Go: a new Init is needed. NRCarriers 2 at Init, 1 now", 1},
        {"MoreAntennas", [](NR5GWaveformSettings& s) { s.NumberOfAntennas->setValue(3); },
         "NumberOfAntennas changed between Init and Go: a new Init is needed. NumberOfAntennas 1 at Init, 3 now", 3},
    };
    for (const auto& c : cases) {
        nrsynth_test::ScratchFolder out;
        auto settings = tree(document);
        NR5GEngineWrapper wrapper;
        wrapper.Init(settings, out.file("wave.bin"));
        c.change(*settings);
        EXPECT_EQ(failureOf([&] { wrapper.Go(); }), c.text) << c.name;

        wrapper.Init(settings, out.file("wave.bin"));
        EXPECT_EQ(failureOf([&] { wrapper.Go(); }), "") << c.name;
        const std::string first = c.antennas > 1 ? "wave0.bin" : "wave.bin";
        EXPECT_EQ(std::filesystem::file_size(out.file(first)), 76800u * 16) << c.name;
    }
}

}  // namespace
