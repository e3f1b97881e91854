#pragma once
// Writer of one antenna's output: a raw sample file (complex double, little endian) and a
// marker file beside it (one byte per sample). Both are rings of totalSamples elements, so a
// carrier with a timing offset wraps round from the end to the start. The files are also the
// accumulator of the waveform: later carriers read, add and write back.

#include <complex>
#include <cstdint>
#include <cstdio>
#include <string>
#include <vector>

namespace Orvalis_NR {

class FileBuffer {
public:
    FileBuffer() = default;
    FileBuffer(const FileBuffer&) = delete;
    FileBuffer& operator=(const FileBuffer&) = delete;
    FileBuffer(FileBuffer&& other) noexcept;
    FileBuffer& operator=(FileBuffer&& other) noexcept;
    ~FileBuffer();

    /// Opens (creates, empties) `path` and `path` + ".mkr". Throws the library failure text
    /// "FileBuffer::Open file failed." naming the file.
    void Init(const char* path);
    /// Back to the start of both files.
    void Reset();
    /// Moves to `offset`: with `first` the ring is new and `offset` zero elements are written.
    void Seek(int offset, bool first);
    /// Handles one row at the current position (see file_buffer.cpp).
    void Save(std::vector<std::complex<double>>& samples, std::vector<char>& markers, bool writeAll,
              bool overwriteSamples, bool addSamples, char markerMask, int skip);
    /// The same for `count` samples and markers read from the two pointers.
    void Save(const std::complex<double>* samples, const char* markers, std::uint64_t count, bool writeAll,
              bool overwriteSamples, bool addSamples, char markerMask, int skip);
    void Close();
    /// Removes both files; failures are ignored.
    void Delete();

    std::uint64_t totalSamples = 0;
    std::uint64_t reserved = 0;
    std::uint64_t position = 0;
    std::FILE* sampleFile = nullptr;
    std::FILE* markerFile = nullptr;
    std::string markerFileName;
    std::string sampleFileName;
    std::vector<std::complex<double>> sampleScratch;
    std::vector<char> markerScratch;
    /// Elements per read-add-write step: the scratch rows stay this short and in cache.
    std::uint64_t chunkElements = std::uint64_t{1} << 15;

private:
    template <class T>
    void writeRing(std::FILE* file, const std::string& name, const T* data, std::uint64_t count);
    template <class T>
    void readRing(std::FILE* file, const std::string& name, T* data, std::uint64_t count);
    void seekRelative(std::FILE* file, const std::string& name, std::int64_t elements, long size);
    void seekForwardRing(std::FILE* file, const std::string& name, std::uint64_t count, long size);
    void advance(std::uint64_t count);
    void saveChunk(const std::complex<double>* samples, const char* markers, std::uint64_t count,
                   bool overwriteSamples, bool addSamples, char markerMask, std::uint64_t skip);
};

}  // namespace Orvalis_NR
