// The output files as a ring: wrap at the waveform's end, read-add-write of later carriers and
// marker merging through the blanking mask.

#include "engine/file_buffer.h"

#include <gtest/gtest.h>

#include <complex>
#include <vector>

#include "output_files.h"

namespace {

using nrsynth_test::readMarkers;
using nrsynth_test::readSamples;
using Orvalis_NR::FileBuffer;
using Sample = std::complex<double>;

std::vector<Sample> ramp(int count, double base) {
    std::vector<Sample> row;
    for (int i = 0; i < count; ++i) row.emplace_back(base + i, -base - i);
    return row;
}

TEST(FileBuffer, RowsWrapRoundTheEndAndLaterCarriersAddWithMaskedMarkers) {
    nrsynth_test::ScratchFolder folder;
    const std::string path = folder.file("wave.bin");
    FileBuffer buffer;
    buffer.Init(path.c_str());
    buffer.totalSamples = 8;
    // The first carrier starts 3 samples in and wraps; it writes its markers as they are.
    buffer.Reset();
    buffer.Seek(3, true);
    auto first = ramp(8, 1.0);
    std::vector<char> firstMarkers(8, 0x01);
    buffer.Save(first, firstMarkers, true, false, true, 0x04, 0);
    // A second one 5 samples in adds to what is there from its third sample on, and ORs only the
    // blanking bit of its markers in.
    buffer.Reset();
    buffer.Seek(5, false);
    auto second = ramp(8, 100.0);
    std::vector<char> secondMarkers(8, 0x0F);
    buffer.Save(second, secondMarkers, false, false, true, 0x04, 2);
    buffer.Close();

    const auto samples = readSamples(path);
    ASSERT_EQ(samples.size(), 8u);
    for (std::size_t f = 0; f < 8; ++f) {
        const std::size_t late = (f + 3) % 8;  // index in the second row
        EXPECT_EQ(samples[f], first[(f + 5) % 8] + (late >= 2 ? second[late] : Sample{})) << f;
    }
    const auto markers = readMarkers(path + ".mkr");
    EXPECT_EQ(markers, std::vector<unsigned char>(8, 0x05));
}

}  // namespace
