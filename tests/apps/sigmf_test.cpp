// SigMF recordings of `nrsynth generate --sigmf`: the metadata keeps the rules of the SigMF core
// namespace (checked by sigmf_rules, itself checked on broken metadata first) and says what the
// document says: rate, centre frequency, the carriers' edges and one annotation per frame. The
// end-to-end cases run the tool on small waveforms and read the files back against a cf64 run.

#include <gtest/gtest.h>
#include <unistd.h>

#include <cmath>
#include <complex>
#include <cstdint>
#include <filesystem>
#include <fstream>
#include <functional>
#include <string>
#include <utility>
#include <vector>

#include "framework/json_serializer.h"
#include "generate.h"
#include "models/nr5g_waveform_settings.h"
#include "sigmf_recording.h"
#include "sigmf_rules.h"

namespace {

using nlohmann::json;
namespace fs = std::filesystem;

json validMetadata() {
    return json::parse(R"({
      "global": {"core:datatype": "ci16_le", "core:version": "1.2.0", "core:sample_rate": 3840000,
                 "core:author": "a", "core:num_channels": 1},
      "captures": [{"core:sample_start": 0, "core:frequency": 3.5e9}],
      "annotations": [
        {"core:sample_start": 0, "core:sample_count": 100, "core:freq_lower_edge": 3.49e9,
         "core:freq_upper_edge": 3.51e9, "core:label": "carrier 0 DL"},
        {"core:sample_start": 50, "core:sample_count": 50, "core:label": "frame 1"}]})");
}

struct Fault {
    const char* name;
    std::function<void(json&)> spoil;
    const char* reported;  // part of the problem text
};

class SigmfRules : public testing::TestWithParam<Fault> {};

TEST_P(SigmfRules, ReportBrokenMetadata) {
    ASSERT_TRUE(sigmf_rules::problems(validMetadata(), 100).empty());
    json metadata = validMetadata();
    GetParam().spoil(metadata);
    const auto found = sigmf_rules::problems(metadata, 100);
    ASSERT_FALSE(found.empty());
    EXPECT_NE(found.front().find(GetParam().reported), std::string::npos) << found.front();
}

INSTANTIATE_TEST_SUITE_P(
    SigmfRules, SigmfRules,
    testing::Values(
        Fault{"NoGlobal", [](json& m) { m.erase("global"); }, "global: is required"},
        Fault{"NoAnnotations", [](json& m) { m.erase("annotations"); }, "annotations: is required"},
        Fault{"ExtraTopLevel", [](json& m) { m["extra"] = 1; }, "extra: is not a top-level"},
        Fault{"NoDatatype", [](json& m) { m["global"].erase("core:datatype"); },
              "core:datatype is required"},
        Fault{"DatatypeWithoutEndianness", [](json& m) { m["global"]["core:datatype"] = "ci16"; },
              "dataset format"},
        Fault{"ByteWithEndianness", [](json& m) { m["global"]["core:datatype"] = "cu8_le"; },
              "dataset format"},
        Fault{"UnknownWidth", [](json& m) { m["global"]["core:datatype"] = "cf16_le"; },
              "dataset format"},
        Fault{"NoVersion", [](json& m) { m["global"].erase("core:version"); },
              "core:version is required"},
        Fault{"TwoPartVersion", [](json& m) { m["global"]["core:version"] = "1.2"; },
              "version X.Y.Z"},
        Fault{"NumericVersion", [](json& m) { m["global"]["core:version"] = 1.2; },
              "version X.Y.Z"},
        Fault{"RateAsText", [](json& m) { m["global"]["core:sample_rate"] = "3840000"; },
              "core:sample_rate"},
        Fault{"RateZero", [](json& m) { m["global"]["core:sample_rate"] = 0; }, "core:sample_rate"},
        Fault{"AuthorNumber", [](json& m) { m["global"]["core:author"] = 5; },
              "core:author: must be a string"},
        Fault{"ChannelsZero", [](json& m) { m["global"]["core:num_channels"] = 0; },
              "core:num_channels"},
        Fault{"CaptureWithoutStart", [](json& m) { m["captures"][0].erase("core:sample_start"); },
              "captures[0]: core:sample_start"},
        Fault{"CaptureStartAsFloat", [](json& m) { m["captures"][0]["core:sample_start"] = 0.5; },
              "captures[0].core:sample_start"},
        Fault{"CapturesUnsorted",
              [](json& m) {
                  m["captures"] =
                      json::parse(R"([{"core:sample_start": 9}, {"core:sample_start": 3}])");
              },
              "captures[1]: not sorted"},
        Fault{"FrequencyAsText", [](json& m) { m["captures"][0]["core:frequency"] = "3.5 GHz"; },
              "core:frequency"},
        Fault{"AnnotationsUnsorted",
              [](json& m) { std::swap(m["annotations"][0], m["annotations"][1]); },
              "annotations[1]: not sorted"},
        Fault{"NegativeStart", [](json& m) { m["annotations"][0]["core:sample_start"] = -1; },
              "annotations[0].core:sample_start"},
        Fault{"EmptyAnnotation", [](json& m) { m["annotations"][1]["core:sample_count"] = 0; },
              "core:sample_count: must be an integer above 0"},
        Fault{"PastTheEnd", [](json& m) { m["annotations"][1]["core:sample_count"] = 51; },
              "runs past the end"},
        Fault{"OneEdgeOnly", [](json& m) { m["annotations"][0].erase("core:freq_upper_edge"); },
              "go together"},
        Fault{"EdgesReversed",
              [](json& m) { m["annotations"][0]["core:freq_lower_edge"] = 3.52e9; }, "is above"},
        Fault{"LongLabel",
              [](json& m) { m["annotations"][0]["core:label"] = "a label of more than twenty"; },
              "20 characters"}),
    [](const testing::TestParamInfo<Fault>& info) { return std::string(info.param.name); });

TEST(SigmfRules, DatasetFormatGrammar) {
    for (const char* good : {"cf32_le", "cf64_le", "ci16_le", "ri32_be", "cu16_le", "ci8", "ru8"})
        EXPECT_TRUE(sigmf_rules::isDatasetFormat(good)) << good;
    for (const char* bad : {"", "cf32", "xf32_le", "cf32_LE", "ci8_le", "cf32_le ", "c"})
        EXPECT_FALSE(sigmf_rules::isDatasetFormat(bad)) << bad;
    for (const char* good : {"1.2.0", "10.0.12"}) EXPECT_TRUE(sigmf_rules::isVersion(good)) << good;
    for (const char* bad : {"", "1.2", "1..2", "1.2.", "v1.2.0", "1.2.0.4"})
        EXPECT_FALSE(sigmf_rules::isVersion(bad)) << bad;
}

std::shared_ptr<Models::Nr5g::NR5GWaveformSettings> settingsOf(const std::string& document) {
    Orvalis::Tessaline::JsonSerializer reader;
    return std::dynamic_pointer_cast<Models::Nr5g::NR5GWaveformSettings>(
        reader.deserialize(document));
}

// Three carriers, one disabled: 51 RB at 30 kHz span 18.36 MHz, 25 RB at 15 kHz 4.5 MHz.
constexpr const char* kThreeCarriers =
    R"({"RadioFrequency": 3.5e9, "WaveformName": "three carriers",
  "NRCarriers": [
    {"CarrierType": "DL", "Numerology": "SCS30k", "NumberOfRB": 51, "FrequencyOffset": -20e6},
    {"CarrierType": "UL", "Numerology": "SCS15k", "NumberOfRB": 25, "FrequencyOffset": 5e6, "Enabled": false},
    {"CarrierType": "CW", "FrequencyOffset": 12e6}]})";

TEST(SigmfMetadata, CarriersFramesAndFieldsFollowTheDocument) {
    const auto settings = settingsOf(kThreeCarriers);
    ASSERT_TRUE(settings);
    nrsynth_cli::RecordingFacts facts;
    facts.datatype = "cf32_le";
    facts.sampleRate = 61.44e6;
    facts.radioFrequency = settings->RadioFrequency->getValue();
    facts.description = nrsynth_cli::recordingDescription(*settings, "x/three.json", 1, 2);
    facts.samples = 2 * 614400 + 1000;  // two frames and the head of a third
    facts.frameLength = 614400;
    facts.carriers = nrsynth_cli::carrierBands(*settings);
    const json metadata = json::parse(nrsynth_cli::sigmfMetadata(facts).dump());
    const auto found = sigmf_rules::problems(metadata, static_cast<std::int64_t>(facts.samples));
    EXPECT_TRUE(found.empty()) << found.front();

    EXPECT_EQ(metadata["global"]["core:datatype"], "cf32_le");
    EXPECT_EQ(metadata["global"]["core:sample_rate"], 61.44e6);
    EXPECT_EQ(metadata["global"]["core:description"], "three carriers, antenna 1 of 2");
    EXPECT_EQ(metadata["captures"].size(), 1u);
    EXPECT_EQ(metadata["captures"][0]["core:frequency"], 3.5e9);
    const auto& notes = metadata["annotations"];
    ASSERT_EQ(notes.size(), 5u);  // two enabled carriers, three frames
    EXPECT_EQ(notes[0]["core:label"], "carrier 0 DL");
    EXPECT_DOUBLE_EQ(notes[0]["core:freq_lower_edge"].get<double>(), 3.5e9 - 20e6 - 9.18e6);
    EXPECT_DOUBLE_EQ(notes[0]["core:freq_upper_edge"].get<double>(), 3.5e9 - 20e6 + 9.18e6);
    EXPECT_EQ(notes[1]["core:label"], "carrier 2 CW");
    EXPECT_DOUBLE_EQ(notes[1]["core:freq_lower_edge"].get<double>(), 3.512e9);
    EXPECT_DOUBLE_EQ(notes[1]["core:freq_upper_edge"].get<double>(), 3.512e9);
    for (int f = 0; f < 3; ++f) {
        const auto& frame = notes[static_cast<std::size_t>(2 + f)];
        EXPECT_EQ(frame["core:label"], "frame " + std::to_string(f));
        EXPECT_EQ(frame["core:sample_start"], 614400 * f);
        EXPECT_EQ(frame["core:sample_count"], f < 2 ? 614400 : 1000);
    }
}

TEST(SigmfMetadata, EmptyRecordingHasNoAnnotationsAndNoRateOfZero) {
    const auto settings = settingsOf(R"({"NRCarriers": [{"CarrierType": "DL"}]})");
    nrsynth_cli::RecordingFacts facts;
    facts.datatype = "cf64_le";
    facts.carriers = nrsynth_cli::carrierBands(*settings);
    facts.description = nrsynth_cli::recordingDescription(*settings, "dir/plain.json", 0, 1);
    const json metadata = json::parse(nrsynth_cli::sigmfMetadata(facts).dump());
    const auto found = sigmf_rules::problems(metadata, 0);
    EXPECT_TRUE(found.empty()) << found.front();
    EXPECT_FALSE(metadata["global"].contains("core:sample_rate"));
    EXPECT_TRUE(metadata["annotations"].empty());
    EXPECT_EQ(metadata["global"]["core:description"], "5G NR waveform plain.json");
}

// ---- end to end: the tool on a small waveform -------------------------------------------

class GeneratedFiles : public testing::Test {
  protected:
    void SetUp() override {
        folder = fs::temp_directory_path() /
                 ("nrsynth_sigmf_" + std::to_string(::getpid()) + "_" +
                  testing::UnitTest::GetInstance()->current_test_info()->name());
        fs::remove_all(folder);
        fs::create_directories(folder);
        // An SS burst on two antennas: silent between the blocks, so the peak is far above the
        // RMS and a back-off of 0 dB clips. (No noise: each run would draw other noise.)
        std::ofstream(folder / "wave.json") << R"({"SampleRateAuto": 7680000, "NumberOfFrames": 2,
          "NumberOfAntennas": 2, "RadioFrequency": 2.1e9, "WaveformName": "burst",
          "NRCarriers": [{"CarrierType": "DL", "Numerology": "SCS15k", "Mu": 0, "NumberOfRB": 25, "CellID": 3,
            "FrequencyOffsetOfPointA": -2250000, "BasebandFilter": false,
            "Downlink": {"SSPBCH": {"Enabled": true, "Numerology": "SCS15k", "Mu": 0, "SSBlockPattern": "CaseA",
              "Lmax": 4, "PowerLevelStr": "1"}}}]})";
    }
    void TearDown() override {
        std::error_code ignored;
        fs::remove_all(folder, ignored);
    }

    /// Runs `generate` with the options; returns its exit code and keeps its stdout.
    int generate(const std::string& name, const std::string& format, const std::string& backoff,
                 bool sigmf) {
        nrsynth_cli::GenerateOptions options;
        options.wave = (folder / "wave.json").string();
        options.output = (folder / (name + ".bin")).string();
        options.format = format;
        options.backoffDb = backoff;
        options.sigmf = sigmf;
        testing::internal::CaptureStdout();
        const int code = nrsynth_cli::generateWaveform(options);
        printed = testing::internal::GetCapturedStdout();
        return code;
    }

    template <typename T>
    std::vector<T> read(const std::string& name) const {
        const auto path = folder / name;
        std::vector<T> values(fs::file_size(path) / sizeof(T));
        std::ifstream(path, std::ios::binary)
            .read(reinterpret_cast<char*>(values.data()),
                  static_cast<std::streamsize>(values.size() * sizeof(T)));
        return values;
    }

    fs::path folder;
    std::string printed;
};

TEST_F(GeneratedFiles, Cf32AndCi16ReadBackEqualTheCf64RunAndKeepItsMarkers) {
    ASSERT_EQ(generate("ref", "cf64", "", false), 0) << printed;
    ASSERT_EQ(generate("f32", "cf32", "", false), 0) << printed;
    ASSERT_EQ(generate("i16", "ci16", "", false), 0) << printed;
    std::vector<std::vector<double>> reference(2);
    double peak = 0.0;
    for (int a = 0; a < 2; ++a) {
        reference[a] = read<double>("ref" + std::to_string(a) + ".bin");
        for (const double v : reference[a]) peak = std::max(peak, std::abs(v));
    }
    ASSERT_EQ(reference[0].size(), 2u * 2 * 76800);
    const double scale = 32767 / peak;
    for (int a = 0; a < 2; ++a) {
        const auto antenna = std::to_string(a);
        const auto floats = read<float>("f32" + antenna + ".bin");
        const auto shorts = read<std::int16_t>("i16" + antenna + ".bin");
        ASSERT_EQ(floats.size(), reference[a].size());
        ASSERT_EQ(shorts.size(), reference[a].size());
        double worstFloat = 0.0;
        double worstShort = 0.0;
        for (std::size_t i = 0; i < shorts.size(); ++i) {
            worstFloat = std::max(worstFloat, std::abs(floats[i] - reference[a][i]) /
                                                  std::max(std::abs(reference[a][i]), 1e-300));
            worstShort = std::max(worstShort, std::abs(shorts[i] - reference[a][i] * scale));
        }
        EXPECT_LE(worstFloat, 0x1p-24) << "antenna " << a;
        EXPECT_LE(worstShort, 0.5 + 1e-9) << "antenna " << a;
        EXPECT_EQ(read<char>("i16" + antenna + ".bin.mkr"),
                  read<char>("ref" + antenna + ".bin.mkr"));
        EXPECT_EQ(read<char>("f32" + antenna + ".bin.mkr"),
                  read<char>("ref" + antenna + ".bin.mkr"));
    }
    EXPECT_NE(printed.find("0 of 307200 samples clipped"), std::string::npos) << printed;
    EXPECT_NE(printed.find("largest |I|/|Q| 0.00 dBFS"), std::string::npos) << printed;
}

TEST_F(GeneratedFiles, SigmfRecordingsWithAForcedClipCountTheClippedSamples) {
    ASSERT_EQ(generate("ref", "cf64", "", false), 0) << printed;
    ASSERT_EQ(generate("rec", "ci16", "0", true), 0) << printed;
    // The RMS of the stronger antenna at full scale: count by hand what saturates.
    std::uint64_t expectedClipped = 0;
    double rms = 0.0;
    std::vector<std::vector<double>> reference(2);
    for (int a = 0; a < 2; ++a) {
        reference[a] = read<double>("ref" + std::to_string(a) + ".bin");
        double energy = 0.0;
        for (const double v : reference[a]) energy += v * v;
        rms = std::max(rms, std::sqrt(energy / (reference[a].size() / 2)));
    }
    const double scale = 32767 / rms;
    for (int a = 0; a < 2; ++a) {
        const auto antenna = std::to_string(a);
        const auto shorts = read<std::int16_t>("rec" + antenna + ".sigmf-data");
        ASSERT_EQ(shorts.size(), reference[a].size());
        for (std::size_t i = 0; i < shorts.size(); i += 2) {
            const bool clipI = std::abs(reference[a][i] * scale) >= 32767.5;
            const bool clipQ = std::abs(reference[a][i + 1] * scale) >= 32767.5;
            expectedClipped += (clipI || clipQ) ? 1 : 0;
            if (!clipI) {
                EXPECT_LE(std::abs(shorts[i] - reference[a][i] * scale), 0.5 + 1e-9);
            }
        }
        EXPECT_FALSE(fs::exists(folder / ("rec" + antenna + ".bin")));
        EXPECT_EQ(read<char>("rec" + antenna + ".bin.mkr"),
                  read<char>("ref" + antenna + ".bin.mkr"));

        std::ifstream in(folder / ("rec" + antenna + ".sigmf-meta"));
        const json metadata = json::parse(in);
        const auto found =
            sigmf_rules::problems(metadata, static_cast<std::int64_t>(shorts.size() / 2));
        EXPECT_TRUE(found.empty()) << found.front();
        EXPECT_EQ(metadata["global"]["core:datatype"], "ci16_le");
        EXPECT_EQ(metadata["global"]["core:sample_rate"], 7680000.0);
        EXPECT_EQ(metadata["global"]["core:description"], "burst, antenna " + antenna + " of 2");
        EXPECT_EQ(metadata["captures"][0]["core:frequency"], 2.1e9);
        const auto& notes = metadata["annotations"];
        ASSERT_EQ(notes.size(), 3u);  // the carrier and two frames of 76800 samples
        EXPECT_DOUBLE_EQ(notes[0]["core:freq_lower_edge"].get<double>(), 2.1e9 - 2.25e6);
        EXPECT_DOUBLE_EQ(notes[0]["core:freq_upper_edge"].get<double>(), 2.1e9 + 2.25e6);
        EXPECT_EQ(notes[2]["core:sample_start"], 76800);
        EXPECT_EQ(notes[2]["core:sample_count"], 76800);
    }
    EXPECT_GT(expectedClipped, 0u);
    EXPECT_NE(printed.find(" " + std::to_string(expectedClipped) + " of 307200 samples clipped"),
              std::string::npos)
        << printed;
    EXPECT_NE(printed.find("(back-off 0.00 dB)"), std::string::npos) << printed;
}

TEST_F(GeneratedFiles, BadOptionsStopBeforeTheRun) {
    nrsynth_cli::GenerateOptions options;
    options.wave = (folder / "wave.json").string();
    options.output = (folder / "bad.bin").string();
    options.format = "ci12";
    testing::internal::CaptureStderr();
    EXPECT_EQ(nrsynth_cli::generateWaveform(options), 1);
    EXPECT_NE(
        testing::internal::GetCapturedStderr().find("--format \"ci12\": unknown sample format"),
        std::string::npos);
    EXPECT_FALSE(fs::exists(folder / "bad.bin"));
}

}  // namespace
