// cf32 and ci16 files made from complex-double files: read back, they equal the source within
// the format's quantisation; ci16 saturation is counted per sample; one scale holds for all
// antennas; the options refuse what they cannot use.

#include "sample_format.h"

#include <gtest/gtest.h>
#include <unistd.h>

#include <cmath>
#include <complex>
#include <cstdint>
#include <filesystem>
#include <fstream>
#include <random>
#include <string>
#include <vector>

#include "output_files.h"

namespace {

using nrsynth_cli::SampleFormat;
namespace fs = std::filesystem;
using Samples = std::vector<std::complex<double>>;

/// A folder of its own per test and process (parameterised names lose their '/'), removed after.
fs::path scratchPath(const std::string& prefix) {
    std::string name = ::testing::UnitTest::GetInstance()->current_test_info()->name();
    for (char& c : name)
        if (c == '/') c = '_';
    return fs::temp_directory_path() / (prefix + std::to_string(::getpid()) + "_" + name);
}

class ScratchFolder {
  public:
    ScratchFolder() : path_(scratchPath("nrsynth_formats_")) {
        fs::remove_all(path_);
        fs::create_directories(path_);
    }
    ~ScratchFolder() {
        std::error_code ignored;
        fs::remove_all(path_, ignored);
    }
    ScratchFolder(const ScratchFolder&) = delete;
    ScratchFolder& operator=(const ScratchFolder&) = delete;
    std::string file(const std::string& name) const { return (path_ / name).string(); }

  private:
    fs::path path_;
};

void writeCf64(const std::string& path, const Samples& samples) {
    std::ofstream out(path, std::ios::binary);
    out.write(reinterpret_cast<const char*>(samples.data()),
              static_cast<std::streamsize>(samples.size() * sizeof(samples[0])));
}

template <typename T>
std::vector<T> readComponents(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    std::vector<T> values(fs::file_size(path) / sizeof(T));
    in.read(reinterpret_cast<char*>(values.data()),
            static_cast<std::streamsize>(values.size() * sizeof(T)));
    return values;
}

/// Components spread over [-amplitude, amplitude], a fixed seed so that a failure repeats.
Samples randomSamples(std::size_t count, double amplitude, unsigned seed = 7) {
    std::mt19937 generator(seed);
    std::uniform_real_distribution<double> uniform(-amplitude, amplitude);
    Samples samples(count);
    for (auto& sample : samples) sample = {uniform(generator), uniform(generator)};
    return samples;
}

double largestComponent(const Samples& samples) {
    double peak = 0.0;
    for (const auto& s : samples) peak = std::max({peak, std::abs(s.real()), std::abs(s.imag())});
    return peak;
}

TEST(SampleLevels, EnergyPeaksAndCountOfAHandWorkedFile) {
    ScratchFolder folder;
    const auto path = folder.file("levels.bin");
    writeCf64(path, {{3, 4}, {0, -5}, {1, 0}, {0, 0}, {-4.5, 0.5}});
    {
        std::ofstream tail(path, std::ios::binary | std::ios::app);
        tail.write("12345", 5);  // a partial sample at the end does not count
    }
    for (const std::size_t block :
         {std::size_t{1}, std::size_t{2}, nrsynth_cli::kConversionBlock}) {
        const auto levels = nrsynth_cli::measureLevels(path, block);
        EXPECT_EQ(levels.samples, 5u);
        EXPECT_DOUBLE_EQ(levels.energy, 25 + 25 + 1 + 0 + 20.5);
        EXPECT_DOUBLE_EQ(levels.peakMagnitude, 5.0);
        EXPECT_DOUBLE_EQ(levels.peakComponent, 5.0);
        EXPECT_DOUBLE_EQ(levels.rms(), std::sqrt(71.5 / 5));
    }
    EXPECT_THROW(nrsynth_cli::measureLevels(folder.file("missing.bin")), std::runtime_error);
}

// Sizes around the block length catch a lost or doubled tail block.
class Conversion : public testing::TestWithParam<std::size_t> {};

TEST_P(Conversion, Cf32ReadBackEqualsTheSourceWithinFloatRounding) {
    ScratchFolder folder;
    const auto samples = randomSamples(GetParam(), 3.0);
    writeCf64(folder.file("a.bin"), samples);
    const auto result = nrsynth_cli::convertSamples(folder.file("a.bin"), folder.file("a.cf32"),
                                                    SampleFormat::Cf32, 1.0, 64);
    EXPECT_EQ(result.samples, samples.size());
    EXPECT_EQ(result.clipped, 0u);
    const auto values = readComponents<float>(folder.file("a.cf32"));
    ASSERT_EQ(values.size(), 2 * samples.size());
    for (std::size_t i = 0; i < samples.size(); ++i) {
        // Round to nearest: within half a unit in the last place, 2^-24 relative.
        EXPECT_NEAR(values[2 * i], samples[i].real(), std::abs(samples[i].real()) * 0x1p-24) << i;
        EXPECT_NEAR(values[2 * i + 1], samples[i].imag(), std::abs(samples[i].imag()) * 0x1p-24)
            << i;
    }
}

TEST_P(Conversion, Ci16AtTheDefaultScalePutsTheLargestComponentAtFullScale) {
    ScratchFolder folder;
    auto samples = randomSamples(GetParam(), 0.8);
    samples[samples.size() / 2] = {0.1, -0.93};  // the largest component, negative
    writeCf64(folder.file("a.bin"), samples);
    const double scale = nrsynth_cli::ci16ScaleForPeak(
        nrsynth_cli::measureLevels(folder.file("a.bin")).peakComponent);
    EXPECT_DOUBLE_EQ(scale, 32767 / 0.93);
    const auto result = nrsynth_cli::convertSamples(folder.file("a.bin"), folder.file("a.ci16"),
                                                    SampleFormat::Ci16, scale, 64);
    EXPECT_EQ(result.clipped, 0u);
    const auto values = readComponents<std::int16_t>(folder.file("a.ci16"));
    ASSERT_EQ(values.size(), 2 * samples.size());
    int largest = 0;
    for (std::size_t i = 0; i < samples.size(); ++i) {
        EXPECT_LE(std::abs(values[2 * i] - samples[i].real() * scale), 0.5 + 1e-9) << i;
        EXPECT_LE(std::abs(values[2 * i + 1] - samples[i].imag() * scale), 0.5 + 1e-9) << i;
        largest =
            std::max({largest, std::abs(int{values[2 * i]}), std::abs(int{values[2 * i + 1]})});
    }
    EXPECT_EQ(largest, 32767);
    EXPECT_EQ(values[2 * (samples.size() / 2) + 1], -32767);
}

INSTANTIATE_TEST_SUITE_P(SampleFormats, Conversion, testing::Values(1, 63, 64, 65, 1000));

TEST(SampleFormats, Ci16CountsEachSampleWithASaturatedComponentOnce) {
    ScratchFolder folder;
    // At scale 32767 a component saturates from |x| * 32767 >= 32767.5 on, i.e. above
    // 1 + 1/65534 (1.0000152590...).
    const Samples samples{
        {0.25, -0.5},       // inside
        {1.0, -1.0},        // exactly full scale: not clipped
        {1.0000152, 0.0},   // 32767.498: rounds to 32767, not clipped
        {0.0, -1.0000153},  // 32767.501: clipped (Q)
        {2.0, 0.1},         // clipped (I)
        {-3.0, 5.0},        // both clipped: one sample
        {0.0, 0.0},
    };
    writeCf64(folder.file("a.bin"), samples);
    const auto result = nrsynth_cli::convertSamples(folder.file("a.bin"), folder.file("a.ci16"),
                                                    SampleFormat::Ci16, 32767.0, 2);
    EXPECT_EQ(result.samples, samples.size());
    EXPECT_EQ(result.clipped, 3u);
    const std::vector<std::int16_t> expected{8192,   -16384, 32767, -32767, 32767, 0, 0,
                                             -32767, 32767,  3277,  -32767, 32767, 0, 0};
    EXPECT_EQ(readComponents<std::int16_t>(folder.file("a.ci16")), expected);
}

TEST(SampleFormats, Ci16BackOffPutsTheRmsThatFarBelowFullScaleAndClipsAboveIt) {
    ScratchFolder folder;
    // A unit circle every half degree: RMS 1, and max(|I|, |Q|) from cos 45 deg to 1.
    Samples samples(720);
    for (std::size_t n = 0; n < samples.size(); ++n)
        samples[n] = std::polar(1.0, M_PI * static_cast<double>(n) / 360.0);
    writeCf64(folder.file("a.bin"), samples);
    struct Case {
        double backoffDb;
        std::uint64_t clipped;
    };
    // At -3 dB the radius is 1.41254 x full scale: a component saturates when its |cos| passes
    // 32767.5 / 32767 / 1.41254 = 0.70797, i.e. everywhere but at the four diagonals
    // (0.70711 x 1.41254 = 0.99882 of full scale).
    for (const Case c : {Case{12.0, 0}, Case{0.0, 0}, Case{-3.0, 716}}) {
        const double scale = nrsynth_cli::ci16ScaleForBackoff(
            nrsynth_cli::measureLevels(folder.file("a.bin")).rms(), c.backoffDb);
        const auto result = nrsynth_cli::convertSamples(folder.file("a.bin"), folder.file("a.ci16"),
                                                        SampleFormat::Ci16, scale);
        EXPECT_EQ(result.clipped, c.clipped) << c.backoffDb;
        const auto values = readComponents<std::int16_t>(folder.file("a.ci16"));
        double energy = 0.0;
        for (const auto v : values) energy += static_cast<double>(v) * v;
        const double rmsDbfs = 10 * std::log10(energy / static_cast<double>(samples.size())) -
                               20 * std::log10(32767.0);
        if (c.clipped == 0) {
            EXPECT_NEAR(rmsDbfs, -c.backoffDb, 0.01) << c.backoffDb;
        }
        for (std::size_t i = 0; i < values.size(); ++i) {
            const double exact = (i % 2 ? samples[i / 2].imag() : samples[i / 2].real()) * scale;
            EXPECT_EQ(values[i], std::abs(exact) >= 32767.5 ? std::copysign(32767.0, exact)
                                                            : std::round(exact))
                << i;
        }
    }
}

TEST(SampleFormats, SilentWaveformKeepsScaleOne) {
    EXPECT_EQ(nrsynth_cli::ci16ScaleForPeak(0.0), 1.0);
    EXPECT_EQ(nrsynth_cli::ci16ScaleForBackoff(0.0, 6.0), 1.0);
}

TEST(SampleFormats, NamesAndSizes) {
    struct Row {
        const char* text;
        SampleFormat format;
        const char* datatype;
        std::size_t bytes;
    };
    for (const Row row : {Row{"cf64", SampleFormat::Cf64, "cf64_le", 16},
                          Row{"cf32", SampleFormat::Cf32, "cf32_le", 8},
                          Row{"ci16", SampleFormat::Ci16, "ci16_le", 4}}) {
        ASSERT_EQ(nrsynth_cli::parseSampleFormat(row.text), row.format) << row.text;
        EXPECT_STREQ(nrsynth_cli::formatName(row.format), row.text);
        EXPECT_STREQ(nrsynth_cli::sigmfDatatype(row.format), row.datatype);
        EXPECT_EQ(nrsynth_cli::bytesPerSample(row.format), row.bytes);
    }
    for (const char* text : {"", "CF32", "ci8", "cf64_le"})
        EXPECT_FALSE(nrsynth_cli::parseSampleFormat(text)) << text;
}

struct OptionCase {
    const char* format;
    const char* backoff;
    const char* message;  // empty: accepted
};

class OutputOptions : public testing::TestWithParam<OptionCase> {};

TEST_P(OutputOptions, RefuseWhatTheyCannotUseNamingOptionAndValue) {
    const auto& c = GetParam();
    if (*c.message == '\0') {
        const auto request = nrsynth_cli::outputRequest(c.format, c.backoff, false);
        EXPECT_EQ(request.backoffDb.has_value(), *c.backoff != '\0');
        return;
    }
    try {
        nrsynth_cli::outputRequest(c.format, c.backoff, false);
        ADD_FAILURE() << "accepted " << c.format << " " << c.backoff;
    } catch (const std::invalid_argument& e) {
        EXPECT_NE(std::string(e.what()).find(c.message), std::string::npos) << e.what();
    }
}

INSTANTIATE_TEST_SUITE_P(
    SampleFormats, OutputOptions,
    testing::Values(OptionCase{"cf64", "", ""}, OptionCase{"ci16", "12.5", ""},
                    OptionCase{"ci16", "-3", ""},
                    OptionCase{"cf16", "", "--format \"cf16\": unknown sample format"},
                    OptionCase{"ci16", "nan", "--backoff-db \"nan\": give a finite number"},
                    OptionCase{"ci16", "inf", "--backoff-db \"inf\": give a finite number"},
                    OptionCase{"ci16", "12dB", "--backoff-db \"12dB\""},
                    OptionCase{"cf32", "6", "applies to --format ci16 only"}));

TEST(SampleFormats, OneCi16ScaleForAllAntennasKeepsTheirRelativeLevels) {
    ScratchFolder folder;
    const auto strong = randomSamples(500, 1.0, 1);
    auto weak = randomSamples(500, 1.0, 2);
    for (auto& s : weak) s *= 0.25;  // 12 dB below
    writeCf64(folder.file("wave0.bin"), strong);
    writeCf64(folder.file("wave1.bin"), weak);
    std::vector<nrsynth_cli::AntennaFile> antennas;
    for (const char* name : {"wave0.bin", "wave1.bin"})
        antennas.push_back(
            {folder.file(name), nrsynth_cli::measureLevels(folder.file(name)), name});
    nrsynth_cli::OutputRequest request;
    request.format = SampleFormat::Ci16;
    const auto conversion = nrsynth_cli::convertOutputs(request, antennas, {});
    EXPECT_DOUBLE_EQ(conversion.scale, 32767 / largestComponent(strong));
    EXPECT_EQ(conversion.clipped, 0u);
    ASSERT_EQ(conversion.files.size(), 2u);
    // Converted in place under the same names; the weak antenna stays a quarter of the strong.
    EXPECT_EQ(conversion.files[1].samplePath, folder.file("wave1.bin"));
    EXPECT_EQ(fs::file_size(folder.file("wave1.bin")), 500u * 4);
    const auto values = readComponents<std::int16_t>(folder.file("wave1.bin"));
    for (std::size_t i = 0; i < weak.size(); ++i)
        EXPECT_LE(std::abs(values[2 * i] - weak[i].real() * conversion.scale), 0.5 + 1e-9) << i;
    EXPECT_FALSE(fs::exists(folder.file("wave1.bin.part")));
}

TEST(SampleFormats, SigmfMovesTheSamplesBesideUntouchedMarkers) {
    ScratchFolder folder;
    const auto samples = randomSamples(300, 0.5);
    writeCf64(folder.file("wave.bin"), samples);
    {
        std::ofstream markers(folder.file("wave.bin.mkr"), std::ios::binary);
        markers << std::string(300, '\3');
    }
    const std::vector<nrsynth_cli::AntennaFile> antennas{
        {folder.file("wave.bin"), nrsynth_cli::measureLevels(folder.file("wave.bin")), "test"}};
    for (const auto format : {SampleFormat::Cf32, SampleFormat::Cf64}) {
        nrsynth_cli::OutputRequest request;
        request.format = format;
        request.sigmf = true;
        const auto conversion = nrsynth_cli::convertOutputs(request, antennas, {});
        EXPECT_EQ(conversion.files[0].samplePath, folder.file("wave.sigmf-data"));
        EXPECT_EQ(conversion.files[0].metaPath, folder.file("wave.sigmf-meta"));
        EXPECT_FALSE(fs::exists(folder.file("wave.bin")));
        EXPECT_EQ(fs::file_size(folder.file("wave.sigmf-data")),
                  300 * nrsynth_cli::bytesPerSample(format));
        EXPECT_EQ(fs::file_size(folder.file("wave.bin.mkr")), 300u);
        std::ifstream meta(folder.file("wave.sigmf-meta"));
        const auto metadata = nlohmann::json::parse(meta);
        EXPECT_EQ(metadata["global"]["core:datatype"], nrsynth_cli::sigmfDatatype(format));
        // Next round: the cf64 file again, as the library leaves it.
        writeCf64(folder.file("wave.bin"), samples);
    }
    const auto values = readComponents<double>(folder.file("wave.sigmf-data"));
    EXPECT_EQ(values[1], samples[0].imag());
}

TEST(SampleFormats, SigmfRefusesAntennasThatWouldShareOneRecording) {
    ScratchFolder folder;
    // -o w.sigmf-data with two antennas: the library writes w.sigmf-0data and w.sigmf-1data.
    std::vector<nrsynth_cli::AntennaFile> antennas;
    for (const char* name : {"w.sigmf-0data", "w.sigmf-1data"}) {
        writeCf64(folder.file(name), randomSamples(10, 1.0));
        antennas.push_back(
            {folder.file(name), nrsynth_cli::measureLevels(folder.file(name)), name});
    }
    nrsynth_cli::OutputRequest request;
    request.sigmf = true;
    try {
        nrsynth_cli::convertOutputs(request, antennas, {});
        ADD_FAILURE() << "no error";
    } catch (const std::runtime_error& e) {
        EXPECT_NE(std::string(e.what()).find("would both become " + folder.file("w.sigmf-data")),
                  std::string::npos)
            << e.what();
    }
    EXPECT_TRUE(fs::exists(folder.file("w.sigmf-0data")));  // nothing moved
}

TEST(SampleFormats, AnUnwritableTargetIsReportedWithItsName) {
    ScratchFolder folder;
    writeCf64(folder.file("a.bin"), randomSamples(10, 1.0));
    try {
        nrsynth_cli::convertSamples(folder.file("a.bin"), folder.file("no/such/folder/a.ci16"),
                                    SampleFormat::Ci16, 1.0);
        ADD_FAILURE() << "no error";
    } catch (const std::runtime_error& e) {
        EXPECT_NE(std::string(e.what()).find("no/such/folder/a.ci16"), std::string::npos)
            << e.what();
    }
}

}  // namespace
