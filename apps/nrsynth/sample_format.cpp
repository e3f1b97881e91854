#include "sample_format.h"

#include <algorithm>
#include <bit>
#include <cerrno>
#include <cmath>
#include <complex>
#include <cstdio>
#include <cstring>
#include <memory>
#include <stdexcept>
#include <vector>

namespace nrsynth_cli {

// The files are little endian; the conversion copies memory images.
static_assert(std::endian::native == std::endian::little,
              "the sample formats are written on little-endian hosts");

namespace {

struct FileCloser {
    void operator()(std::FILE* file) const { std::fclose(file); }
};
using File = std::unique_ptr<std::FILE, FileCloser>;

File openFile(const std::string& path, const char* mode) {
    File file(std::fopen(path.c_str(), mode));
    if (!file) throw std::runtime_error(path + ": " + std::strerror(errno));
    return file;
}

/// Reads up to `block.size()` samples; 0 at the end. A trailing partial sample is ignored, as
/// the summary always did.
std::size_t readBlock(std::FILE* file, std::vector<std::complex<double>>& block,
                      const std::string& path) {
    const std::size_t count = std::fread(block.data(), sizeof(block[0]), block.size(), file);
    if (count < block.size() && std::ferror(file)) throw std::runtime_error(path + ": read error");
    return count;
}

void writeAll(std::FILE* file, const void* data, std::size_t bytes, const std::string& path) {
    if (bytes > 0 && std::fwrite(data, 1, bytes, file) != bytes)
        throw std::runtime_error(path + ": write error (disk full?)");
}

/// One ci16 component: round half away from zero inside full scale, else saturate. The sign
/// of the half comes by copysign, not by a branch on the sign, which a noise-like signal
/// mispredicts half of the time. NaN saturates to 0 rather than reaching an undefined
/// conversion.
inline std::int16_t toCi16(double y, bool& clipped) {
    if (std::abs(y) < kCi16FullScale + 0.5) [[likely]]
        return static_cast<std::int16_t>(y + std::copysign(0.5, y));
    clipped = true;
    return static_cast<std::int16_t>(y > 0.0 ? kCi16FullScale : (y < 0.0 ? -kCi16FullScale : 0.0));
}

}  // namespace

std::optional<SampleFormat> parseSampleFormat(std::string_view text) {
    if (text == "cf64") return SampleFormat::Cf64;
    if (text == "cf32") return SampleFormat::Cf32;
    if (text == "ci16") return SampleFormat::Ci16;
    return std::nullopt;
}

const char* formatName(SampleFormat format) {
    switch (format) {
        case SampleFormat::Cf32:
            return "cf32";
        case SampleFormat::Ci16:
            return "ci16";
        case SampleFormat::Cf64:
            break;
    }
    return "cf64";
}

const char* sigmfDatatype(SampleFormat format) {
    switch (format) {
        case SampleFormat::Cf32:
            return "cf32_le";
        case SampleFormat::Ci16:
            return "ci16_le";
        case SampleFormat::Cf64:
            break;
    }
    return "cf64_le";
}

std::size_t bytesPerSample(SampleFormat format) {
    switch (format) {
        case SampleFormat::Cf32:
            return 8;
        case SampleFormat::Ci16:
            return 4;
        case SampleFormat::Cf64:
            break;
    }
    return 16;
}

double SampleLevels::rms() const {
    return samples > 0 ? std::sqrt(energy / static_cast<double>(samples)) : 0.0;
}

SampleLevels measureLevels(const std::string& cf64Path, std::size_t blockSamples) {
    const auto in = openFile(cf64Path, "rb");
    std::vector<std::complex<double>> block(std::max<std::size_t>(blockSamples, 1));
    SampleLevels levels;
    double peakPower = 0.0;
    while (const std::size_t count = readBlock(in.get(), block, cf64Path)) {
        double energy = 0.0;  // per block, so that a long file does not lose the small terms
        for (std::size_t i = 0; i < count; ++i) {
            const double re = block[i].real();
            const double im = block[i].imag();
            const double power = re * re + im * im;
            energy += power;
            peakPower = std::max(peakPower, power);
            levels.peakComponent =
                std::max(levels.peakComponent, std::max(std::abs(re), std::abs(im)));
        }
        levels.energy += energy;
        levels.samples += count;
    }
    levels.peakMagnitude = std::sqrt(peakPower);
    return levels;
}

double ci16ScaleForPeak(double peakComponent) {
    return peakComponent > 0.0 && std::isfinite(peakComponent) ? kCi16FullScale / peakComponent
                                                               : 1.0;
}

double ci16ScaleForBackoff(double rms, double backoffDb) {
    return rms > 0.0 && std::isfinite(rms)
               ? kCi16FullScale * std::pow(10.0, -backoffDb / 20.0) / rms
               : 1.0;
}

ConversionResult convertSamples(const std::string& cf64Path, const std::string& outPath,
                                SampleFormat format, double scale, std::size_t blockSamples) {
    const auto in = openFile(cf64Path, "rb");
    const auto out = openFile(outPath, "wb");
    std::vector<std::complex<double>> block(std::max<std::size_t>(blockSamples, 1));
    std::vector<float> floats(format == SampleFormat::Cf32 ? 2 * block.size() : 0);
    std::vector<std::int16_t> shorts(format == SampleFormat::Ci16 ? 2 * block.size() : 0);
    ConversionResult result;
    while (const std::size_t count = readBlock(in.get(), block, cf64Path)) {
        switch (format) {
            case SampleFormat::Cf64:
                writeAll(out.get(), block.data(), count * sizeof(block[0]), outPath);
                break;
            case SampleFormat::Cf32:
                for (std::size_t i = 0; i < count; ++i) {
                    floats[2 * i] = static_cast<float>(block[i].real());
                    floats[2 * i + 1] = static_cast<float>(block[i].imag());
                }
                writeAll(out.get(), floats.data(), 2 * count * sizeof(float), outPath);
                break;
            case SampleFormat::Ci16:
                for (std::size_t i = 0; i < count; ++i) {
                    bool clipped = false;
                    shorts[2 * i] = toCi16(block[i].real() * scale, clipped);
                    shorts[2 * i + 1] = toCi16(block[i].imag() * scale, clipped);
                    result.clipped += clipped ? 1 : 0;
                }
                writeAll(out.get(), shorts.data(), 2 * count * sizeof(std::int16_t), outPath);
                break;
        }
        result.samples += count;
    }
    if (std::fflush(out.get()) != 0)
        throw std::runtime_error(outPath + ": write error (disk full?)");
    return result;
}

}  // namespace nrsynth_cli
