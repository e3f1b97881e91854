// FileBuffer on its own: the sample and marker files as rings, read-add-write of later carriers,
// the marker merge through the blanking mask, and Seek's zero fill. The oracle is a ring held in
// memory, where element i of a row goes to (position + i) mod totalSamples.

#include <gtest/gtest.h>

#include <complex>
#include <cstdint>
#include <filesystem>
#include <random>
#include <string>
#include <vector>

#include "engine/file_buffer.h"
#include "output_files.h"

namespace {

using nrsynth_test::readMarkers;
using nrsynth_test::readSamples;
using Orvalis_NR::FileBuffer;
using Sample = std::complex<double>;

/// The files as they should be: rings of `total` elements, grown as far as anything was written.
struct Ring {
    explicit Ring(std::size_t total) : samples(total), markers(total) {}

    void reset() { position = 0; }
    void seek(std::size_t offset, bool first) {
        if (offset == 0) return;
        if (first) grow(sampleExtent, offset), grow(markerExtent, offset);  // zeros from the start
        position = offset;
    }
    void save(const std::vector<Sample>& row, const std::vector<char>& marks, bool writeAll, bool overwrite,
              bool add, char mask, std::size_t skip) {
        const std::size_t n = samples.size();
        for (std::size_t i = 0; i < row.size(); ++i) {
            const std::size_t at = (position + i) % n;
            if (writeAll || overwrite)
                samples[at] = row[i];
            else if (add && i >= skip)
                samples[at] += row[i];
            if (writeAll)
                markers[at] = static_cast<unsigned char>(marks[i]);
            else
                markers[at] = static_cast<unsigned char>(markers[at] | (marks[i] & mask));
        }
        // A file grows as far as something is written into it; the sample file is not written
        // when samples are neither replaced nor added.
        const std::size_t end = position + row.size(), reached = end > n ? n : end;
        if (writeAll || overwrite || add) grow(sampleExtent, reached);
        grow(markerExtent, reached);
        position = end > n ? end - n : end;
    }
    static void grow(std::size_t& extent, std::size_t to) { extent = std::max(extent, to); }

    std::vector<Sample> samples;
    std::vector<unsigned char> markers;
    std::size_t position = 0;
    std::size_t sampleExtent = 0, markerExtent = 0;  // elements each file holds
};

class FileBufferTest : public ::testing::Test {
  protected:
    nrsynth_test::ScratchFolder folder;
    std::string path = folder.file("ring.bin");

    void expectFilesMatch(const Ring& ring, const std::string& when) {
        const auto samples = readSamples(path);
        const auto markers = readMarkers(path + ".mkr");
        ASSERT_EQ(samples.size(), ring.sampleExtent) << when;
        ASSERT_EQ(markers.size(), ring.markerExtent) << when;
        for (std::size_t i = 0; i < samples.size(); ++i) ASSERT_EQ(samples[i], ring.samples[i]) << when << ", sample " << i;
        for (std::size_t i = 0; i < markers.size(); ++i) ASSERT_EQ(markers[i], ring.markers[i]) << when << ", marker " << i;
    }
};

std::vector<Sample> row(std::size_t count, double base) {
    std::vector<Sample> values(count);
    for (std::size_t i = 0; i < count; ++i) values[i] = {base + static_cast<double>(i), -base};
    return values;
}

// The edge cases one at a time: a first carrier whose rows wrap, a later one that adds with
// a skip and merges only the masked marker bits, and one that only merges markers.
TEST_F(FileBufferTest, RowsWrapAddAndMergeMarkersAsARing) {
    FileBuffer buffer;
    buffer.Init(path.c_str());
    buffer.totalSamples = 10;
    Ring ring(10);

    std::vector<char> frameStart(4, 0x02), blanking(4, 0x0C);
    frameStart[0] = 0x03;
    // First carrier from offset 3: zeros before it, then rows of 4: 3..6, then 7..9 and 0 (a
    // wrap), then 1..4.
    buffer.Reset();
    buffer.Seek(3, true);
    ring.seek(3, true);
    EXPECT_EQ(buffer.position, 3u);
    for (double base : {10.0, 20.0, 30.0}) {
        auto samples = row(4, base);
        buffer.Save(samples, frameStart, true, false, true, 0x04, 0);
        ring.save(samples, frameStart, true, false, true, 0x04, 0);
        EXPECT_EQ(buffer.position, ring.position);
        expectFilesMatch(ring, "first carrier, row " + std::to_string(base));
    }
    EXPECT_EQ(buffer.position, 5u);  // 3 + 12 - 10

    // A later carrier from offset 8 adds, leaving out the first `skip` elements of its first
    // row, and ORs in only the bits of the mask.
    buffer.Reset();
    ring.reset();
    buffer.Seek(8, false);
    ring.seek(8, false);
    for (std::size_t skip : {std::size_t{2}, std::size_t{0}, std::size_t{4}}) {
        auto samples = row(4, 100.0 * static_cast<double>(skip + 1));
        buffer.Save(samples, blanking, false, false, true, 0x04, static_cast<int>(skip));
        ring.save(samples, blanking, false, false, true, 0x04, skip);
        expectFilesMatch(ring, "later carrier, skip " + std::to_string(skip));
    }

    // Neither overwrite nor add: samples stay, markers still merge; mask 0 merges nothing.
    for (char mask : {char{0x08}, char{0}}) {
        auto samples = row(7, 1000.0);
        std::vector<char> marks(7, 0x0F);
        buffer.Save(samples, marks, false, false, false, mask, 0);
        ring.save(samples, marks, false, false, false, mask, 0);
        expectFilesMatch(ring, "markers only, mask " + std::to_string(mask));
    }

    // Overwrite (the second writing of frame 0's first half): samples replaced, markers merged.
    buffer.Reset();
    ring.reset();
    auto samples = row(3, 5000.0);
    buffer.Save(samples, blanking, false, true, true, 0x04, 0);
    ring.save(samples, blanking, false, true, true, 0x04, 0);
    expectFilesMatch(ring, "overwrite");
}

// Random sequences of the engine's operations against the ring, on rings of several lengths,
// with rows read, added and written back whole and in chunks of a few elements.
TEST_F(FileBufferTest, RandomOperationsMatchTheRing) {
    std::mt19937 random(20260101);
    for (std::uint64_t chunk : {std::uint64_t{1} << 15, std::uint64_t{3}})
    for (std::size_t total : {1u, 7u, 64u, 1000u}) {
        FileBuffer buffer;
        buffer.Init(path.c_str());
        buffer.totalSamples = total;
        buffer.chunkElements = chunk;
        Ring ring(total);
        for (int step = 0; step < 60; ++step) {
            const bool first = step < 15;  // the first carrier writes, later ones add
            if (step % 15 == 0) {         // a new carrier: Reset, then Seek to its offset
                const std::size_t offset = random() % (total + 1);
                buffer.Reset();
                ring.reset();
                buffer.Seek(static_cast<int>(offset), first);
                ring.seek(offset, first);
            }
            const std::size_t count = random() % (total + 1);
            std::vector<Sample> samples(count);
            std::vector<char> marks(count);
            for (std::size_t i = 0; i < count; ++i) {
                samples[i] = {static_cast<double>(random() % 1000), static_cast<double>(random() % 1000)};
                marks[i] = static_cast<char>(random() % 16);
            }
            const bool writeAll = first, overwrite = random() % 4 == 0, add = random() % 4 != 0;
            const char mask = static_cast<char>(random() % 16);
            const std::size_t skip = random() % (count + 1);
            buffer.Save(samples, marks, writeAll, overwrite, add, mask, static_cast<int>(skip));
            ring.save(samples, marks, writeAll, overwrite, add, mask, skip);
            const std::string where =
                "ring " + std::to_string(total) + ", chunk " + std::to_string(chunk) + ", step " + std::to_string(step);
            ASSERT_EQ(buffer.position, ring.position) << where;
            expectFilesMatch(ring, where);
            if (HasFatalFailure()) return;
        }
    }
}

TEST_F(FileBufferTest, SeekFillsOnlyANewRingAndZeroDoesNothing) {
    FileBuffer buffer;
    buffer.Init(path.c_str());
    buffer.totalSamples = 100;
    buffer.Seek(0, true);
    EXPECT_EQ(std::filesystem::file_size(path), 0u);
    EXPECT_EQ(buffer.position, 0u);
    buffer.Seek(40, true);
    EXPECT_EQ(buffer.position, 40u);
    const auto samples = readSamples(path);
    ASSERT_EQ(samples.size(), 40u);
    for (const auto& s : samples) ASSERT_EQ(s, Sample{});
    const auto markers = readMarkers(path + ".mkr");
    ASSERT_EQ(markers.size(), 40u);
    for (auto m : markers) ASSERT_EQ(m, 0);
    // On an existing ring, Seek moves without writing; the position is the offset, not a sum.
    buffer.Reset();
    buffer.Seek(25, false);
    EXPECT_EQ(buffer.position, 25u);
    EXPECT_EQ(std::filesystem::file_size(path), 40u * sizeof(Sample));
}

TEST_F(FileBufferTest, DeleteRemovesBothFilesAndIgnoresMissingOnes) {
    FileBuffer buffer;
    buffer.Init(path.c_str());
    buffer.Close();
    ASSERT_TRUE(std::filesystem::exists(path + ".mkr"));
    buffer.Delete();
    EXPECT_FALSE(std::filesystem::exists(path));
    EXPECT_FALSE(std::filesystem::exists(path + ".mkr"));
    buffer.Delete();  // nothing there any more: no failure
}

TEST_F(FileBufferTest, OpenFailureIsTheLibraryTextNamingTheFile) {
    FileBuffer buffer;
    const std::string missing = folder.file("no/such/folder.bin");
    try {
        buffer.Init(missing.c_str());
        ADD_FAILURE() << "no failure";
    } catch (const char* text) {
        EXPECT_EQ(std::string(text), "FileBuffer::Open file failed. " + missing);
    }
}

}  // namespace
