// The output files as a ring: wrap at the waveform's end, read-add-write of later carriers,
// marker merging through the blanking mask, and Seek.

#include <gtest/gtest.h>

#include <complex>
#include <filesystem>
#include <vector>

#include "engine/engine_failure.h"
#include "engine/file_buffer.h"
#include "output_files.h"

namespace {

using Orvalis_NR::FileBuffer;
using nrsynth_test::readMarkers;
using nrsynth_test::readSamples;
using Sample = std::complex<double>;

std::vector<Sample> ramp(int count, double base) {
    std::vector<Sample> row;
    for (int i = 0; i < count; ++i) row.emplace_back(base + i, -base - i);
    return row;
}

class FileBufferTest : public ::testing::Test {
protected:
    nrsynth_test::ScratchFolder folder;
    std::string path = folder.file("wave.bin");
};

TEST_F(FileBufferTest, FirstSeekWritesZerosAndTheRowWrapsRoundTheEnd) {
    FileBuffer buffer;
    buffer.Init(path.c_str());
    buffer.totalSamples = 10;
    buffer.Reset();
    buffer.Seek(3, true);
    EXPECT_EQ(buffer.position, 3u);
    auto row = ramp(10, 1.0);
    std::vector<char> markers(10, 5);
    buffer.Save(row, markers, true, false, true, 0, 0);
    EXPECT_EQ(buffer.position, 3u);  // wrapped remainder
    buffer.Close();

    const auto samples = readSamples(path);
    ASSERT_EQ(samples.size(), 10u);
    for (int i = 0; i < 10; ++i) EXPECT_EQ(samples[static_cast<std::size_t>((3 + i) % 10)], row[static_cast<std::size_t>(i)]) << i;
    const auto bytes = readMarkers(path + ".mkr");
    ASSERT_EQ(bytes.size(), 10u);
    for (auto byte : bytes) EXPECT_EQ(byte, 5);
}

TEST_F(FileBufferTest, LaterCarrierAddsFromSkipAndMergesOnlyMaskedMarkerBits) {
    FileBuffer buffer;
    buffer.Init(path.c_str());
    buffer.totalSamples = 8;
    buffer.Reset();
    buffer.Seek(0, true);
    auto first = ramp(8, 1.0);
    std::vector<char> firstMarkers(8, 0x01);
    buffer.Save(first, firstMarkers, true, false, true, 0x04, 0);

    // A second carrier starting 5 samples in: wraps, skips its first two samples.
    buffer.Reset();
    buffer.Seek(5, false);
    auto second = ramp(8, 100.0);
    std::vector<char> secondMarkers(8, 0x0F);
    buffer.Save(second, secondMarkers, false, false, true, 0x04, 2);
    buffer.Close();

    const auto samples = readSamples(path);
    ASSERT_EQ(samples.size(), 8u);
    for (int i = 0; i < 8; ++i) {
        const auto at = static_cast<std::size_t>((5 + i) % 8);
        const Sample expected = first[at] + (i >= 2 ? second[static_cast<std::size_t>(i)] : Sample{});
        EXPECT_EQ(samples[at], expected) << i;
    }
    for (auto byte : readMarkers(path + ".mkr")) EXPECT_EQ(byte, 0x05);  // only the blanking bit joins
}

TEST_F(FileBufferTest, OverwriteAndPassOverLeaveTheOtherSamplesAlone) {
    FileBuffer buffer;
    buffer.Init(path.c_str());
    buffer.totalSamples = 6;
    buffer.Reset();
    buffer.Seek(0, true);
    auto base = ramp(6, 1.0);
    std::vector<char> none(6, 0);
    buffer.Save(base, none, true, false, true, 0, 0);

    buffer.Reset();
    buffer.Seek(2, false);
    auto replacement = ramp(3, 50.0);
    std::vector<char> blank(3, 0x04);
    buffer.Save(replacement, blank, false, true, false, 0x04, 0);  // overwrite samples 2..4
    auto ignored = ramp(3, 900.0);
    buffer.Save(ignored, blank, false, false, false, 0x04, 0);     // passes over 5, 0, 1
    buffer.Close();

    const auto samples = readSamples(path);
    ASSERT_EQ(samples.size(), 6u);
    EXPECT_EQ(samples[0], base[0]);
    EXPECT_EQ(samples[1], base[1]);
    for (int i = 0; i < 3; ++i) EXPECT_EQ(samples[static_cast<std::size_t>(2 + i)], replacement[static_cast<std::size_t>(i)]);
    EXPECT_EQ(samples[5], base[5]);
    for (auto byte : readMarkers(path + ".mkr")) EXPECT_EQ(byte, 0x04);  // both passes OR the mask in
}

TEST_F(FileBufferTest, DeleteRemovesBothFiles) {
    FileBuffer buffer;
    buffer.Init(path.c_str());
    EXPECT_TRUE(std::filesystem::exists(path));
    EXPECT_TRUE(std::filesystem::exists(path + ".mkr"));
    buffer.Close();
    buffer.Delete();
    EXPECT_FALSE(std::filesystem::exists(path));
    EXPECT_FALSE(std::filesystem::exists(path + ".mkr"));
}

TEST_F(FileBufferTest, UnopenableFileIsAFailureNamingIt) {
    FileBuffer buffer;
    const auto missing = folder.file("no/such/folder/wave.bin");
    try {
        buffer.Init(missing.c_str());
        FAIL() << "expected a failure";
    } catch (const Orvalis_NR::EngineFailure& failure) {
        EXPECT_STREQ(failure.text, "FileBuffer::Open file failed.");
        EXPECT_NE(failure.detail.find("wave.bin"), std::string::npos);
    }
}

}  // namespace
