#include "engine/file_buffer.h"

#include <algorithm>
#include <cstring>
#include <utility>

#include "common/failure.h"

namespace Orvalis_NR {

namespace {

constexpr long kSampleBytes = static_cast<long>(sizeof(std::complex<double>));

void requireOpen(std::FILE* file, const std::string& name) {
    if (!file) failWith("FileBuffer: file is not open.", name);
}

void seekTo(std::FILE* file, const std::string& name, long offset, int whence) {
    if (std::fseek(file, offset, whence) != 0) failWith("FileBuffer: seek failed.", name);
}

}  // namespace

FileBuffer::FileBuffer(FileBuffer&& other) noexcept { *this = std::move(other); }

FileBuffer& FileBuffer::operator=(FileBuffer&& other) noexcept {
    if (this == &other) return *this;
    Close();
    totalSamples = other.totalSamples;
    position = other.position;
    sampleFile = std::exchange(other.sampleFile, nullptr);
    markerFile = std::exchange(other.markerFile, nullptr);
    markerFileName = std::move(other.markerFileName);
    sampleFileName = std::move(other.sampleFileName);
    sampleScratch = std::move(other.sampleScratch);
    markerScratch = std::move(other.markerScratch);
    chunkElements = other.chunkElements;
    return *this;
}

FileBuffer::~FileBuffer() {
    if (sampleFile) std::fclose(sampleFile);
    if (markerFile) std::fclose(markerFile);
}

void FileBuffer::Init(const char* path) {
    sampleFileName = path ? path : "";
    markerFileName = sampleFileName + ".mkr";
    sampleFile = std::fopen(sampleFileName.c_str(), "wb+");
    if (!sampleFile) failWith("FileBuffer::Open file failed.", sampleFileName);
    markerFile = std::fopen(markerFileName.c_str(), "wb+");
    if (!markerFile) failWith("FileBuffer::Open file failed.", markerFileName);
}

void FileBuffer::Reset() {
    if (sampleFile) seekTo(sampleFile, sampleFileName, 0, SEEK_SET);
    if (markerFile) seekTo(markerFile, markerFileName, 0, SEEK_SET);
    position = 0;
}

void FileBuffer::Seek(int offset, bool first) {
    if (offset == 0) return;
    if (offset < 0) failWith("FileBuffer: negative timing offset.", std::to_string(offset) + " samples");
    if (first) {
        requireOpen(sampleFile, sampleFileName);
        requireOpen(markerFile, markerFileName);
        const std::vector<std::complex<double>> zeros(static_cast<std::size_t>(offset));
        const std::vector<char> zeroBytes(static_cast<std::size_t>(offset));
        if (std::fwrite(zeros.data(), sizeof zeros[0], zeros.size(), sampleFile) != zeros.size() ||
            std::fflush(sampleFile) != 0)
            failWith("FileBuffer: write failed.", sampleFileName);
        if (std::fwrite(zeroBytes.data(), 1, zeroBytes.size(), markerFile) != zeroBytes.size() ||
            std::fflush(markerFile) != 0)
            failWith("FileBuffer: write failed.", markerFileName);
    } else if (sampleFile) {
        seekRelative(sampleFile, sampleFileName, offset, kSampleBytes);
        if (markerFile) seekRelative(markerFile, markerFileName, offset, 1);
    }
    position = static_cast<std::uint64_t>(offset);
}

void FileBuffer::seekRelative(std::FILE* file, const std::string& name, std::int64_t elements, long size) {
    seekTo(file, name, static_cast<long>(elements * size), SEEK_CUR);
}

// Writes `count` elements at `position`, wrapping to the start at totalSamples.
template <class T>
void FileBuffer::writeRing(std::FILE* file, const std::string& name, const T* data, std::uint64_t count) {
    requireOpen(file, name);
    std::uint64_t first = count;
    if (position + count > totalSamples) first = totalSamples > position ? totalSamples - position : 0;
    if (first > 0 && std::fwrite(data, sizeof(T), first, file) != first) failWith("FileBuffer: write failed.", name);
    if (first < count) {
        seekTo(file, name, 0, SEEK_SET);
        if (std::fwrite(data + first, sizeof(T), count - first, file) != count - first)
            failWith("FileBuffer: write failed.", name);
    }
    if (std::fflush(file) != 0) failWith("FileBuffer: write failed.", name);
}

// Reads `count` elements at `position` with the same wrap, then seeks back to where it began,
// so that a following write lands on the same elements.
template <class T>
void FileBuffer::readRing(std::FILE* file, const std::string& name, T* data, std::uint64_t count) {
    requireOpen(file, name);
    const long start = std::ftell(file);
    std::uint64_t first = count;
    if (position + count > totalSamples) first = totalSamples > position ? totalSamples - position : 0;
    // Elements not yet written (the ring is still growing) read as zero.
    std::fill(data, data + count, T{});
    std::uint64_t got = first > 0 ? std::fread(data, sizeof(T), first, file) : 0;
    if (first < count) {
        seekTo(file, name, 0, SEEK_SET);
        got = std::fread(data + first, sizeof(T), count - first, file);
    }
    (void)got;
    // A short read at the end of a growing file is expected; a read error is not.
    if (std::ferror(file)) failWith("FileBuffer: read failed.", name);
    std::clearerr(file);
    seekTo(file, name, start, SEEK_SET);
}

void FileBuffer::seekForwardRing(std::FILE* file, const std::string& name, std::uint64_t count, long size) {
    requireOpen(file, name);
    if (position + count > totalSamples)
        seekTo(file, name, static_cast<long>((position + count - totalSamples) * static_cast<std::uint64_t>(size)),
               SEEK_SET);
    else
        seekTo(file, name, static_cast<long>(count * static_cast<std::uint64_t>(size)), SEEK_CUR);
}

void FileBuffer::advance(std::uint64_t count) {
    if (position + count > totalSamples && totalSamples > 0)
        position = position + count - totalSamples;
    else
        position += count;
}

void FileBuffer::Save(std::vector<std::complex<double>>& samples, std::vector<char>& markers, bool writeAll,
                      bool overwriteSamples, bool addSamples, char markerMask, int skip) {
    if (markers.size() < samples.size()) failWith("FileBuffer: marker row shorter than sample row.", sampleFileName);
    Save(samples.data(), markers.data(), samples.size(), writeAll, overwriteSamples, addSamples, markerMask, skip);
}

// The first carrier writes its rows as they are (writeAll). A later one replaces the samples
// (overwriteSamples), adds its own from element `skip` on (addSamples), or leaves them, and ORs
// its markers, through `markerMask`, into those in the file. Read, add and write go a chunk at a
// time, so that the scratch rows stay small.
void FileBuffer::Save(const std::complex<double>* samples, const char* markers, std::uint64_t count, bool writeAll,
                      bool overwriteSamples, bool addSamples, char markerMask, int skip) {
    if (count > totalSamples) failWith("FileBuffer: row longer than the waveform.", sampleFileName);
    if (count == 0) return;
    if (writeAll) {
        writeRing(sampleFile, sampleFileName, samples, count);
        writeRing(markerFile, markerFileName, markers, count);
        advance(count);
        return;
    }
    const std::uint64_t chunk = std::max<std::uint64_t>(chunkElements, 1);
    const std::uint64_t from = static_cast<std::uint64_t>(std::max(skip, 0));
    for (std::uint64_t done = 0; done < count; done += chunk) {
        const std::uint64_t length = std::min(chunk, count - done);
        const std::uint64_t skipHere = from > done ? std::min(from - done, length) : 0;
        saveChunk(samples + done, markers + done, length, overwriteSamples, addSamples, markerMask, skipHere);
    }
}

void FileBuffer::saveChunk(const std::complex<double>* samples, const char* markers, std::uint64_t count,
                           bool overwriteSamples, bool addSamples, char markerMask, std::uint64_t skip) {
    if (overwriteSamples) {
        writeRing(sampleFile, sampleFileName, samples, count);
    } else if (addSamples) {
        if (sampleScratch.size() < count) sampleScratch.resize(count);
        readRing(sampleFile, sampleFileName, sampleScratch.data(), count);
        for (std::uint64_t i = skip; i < count; ++i) sampleScratch[i] += samples[i];
        writeRing(sampleFile, sampleFileName, sampleScratch.data(), count);
    } else {
        seekForwardRing(sampleFile, sampleFileName, count, kSampleBytes);
    }

    if (markerScratch.size() < count) markerScratch.resize(count);
    readRing(markerFile, markerFileName, markerScratch.data(), count);
    for (std::uint64_t i = 0; i < count; ++i)
        markerScratch[i] = static_cast<char>(markerScratch[i] | (markers[i] & markerMask));
    writeRing(markerFile, markerFileName, markerScratch.data(), count);
    advance(count);
}

void FileBuffer::Close() {
    if (sampleFile) {
        std::fflush(sampleFile);
        std::fclose(sampleFile);
        sampleFile = nullptr;
    }
    if (markerFile) {
        std::fflush(markerFile);
        std::fclose(markerFile);
        markerFile = nullptr;
    }
}

void FileBuffer::Delete() {
    if (!sampleFileName.empty()) std::remove(sampleFileName.c_str());
    if (!markerFileName.empty()) std::remove(markerFileName.c_str());
}

}  // namespace Orvalis_NR
