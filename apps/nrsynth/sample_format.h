#pragma once
// Sample formats the command-line tool writes. The library always writes complex doubles; the
// smaller formats are made from that file afterwards, block by block, so that a waveform larger
// than memory converts as well as a small one.

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace nrsynth_cli {

enum class SampleFormat { Cf64, Cf32, Ci16 };

/// "cf64", "cf32" or "ci16"; nothing for any other text.
std::optional<SampleFormat> parseSampleFormat(std::string_view text);
const char* formatName(SampleFormat format);
/// The SigMF dataset type of the format: "cf64_le", "cf32_le", "ci16_le".
const char* sigmfDatatype(SampleFormat format);
/// Bytes of one complex sample (I and Q).
std::size_t bytesPerSample(SampleFormat format);

/// Full scale of one ci16 component. The scale is symmetric, so -32768 is never written.
inline constexpr double kCi16FullScale = 32767.0;
/// Samples per block of the streaming passes (1 MiB of complex doubles).
inline constexpr std::size_t kConversionBlock = std::size_t{1} << 16;

/// Levels of one complex-double sample file, read in blocks.
struct SampleLevels {
    std::uint64_t samples = 0;
    double energy = 0.0;         ///< sum of |x|^2
    double peakMagnitude = 0.0;  ///< max |x|
    double peakComponent = 0.0;  ///< max over samples of max(|I|, |Q|)
    double rms() const;
};

/// Throws std::runtime_error naming the file when it cannot be read.
SampleLevels measureLevels(const std::string& cf64Path,
                           std::size_t blockSamples = kConversionBlock);

/// ci16 scale that puts the largest component exactly at full scale (1 for a silent waveform).
double ci16ScaleForPeak(double peakComponent);
/// ci16 scale that puts the RMS `backoffDb` dB below full scale (1 for a silent waveform).
double ci16ScaleForBackoff(double rms, double backoffDb);

struct ConversionResult {
    std::uint64_t samples = 0;
    std::uint64_t clipped = 0;  ///< samples of which I or Q saturated (ci16 only)
};

/// Writes the complex-double file `cf64Path` to `outPath` in `format`. ci16 components are
/// x * scale rounded to the nearest integer (halves away from zero) and held to +-32767; cf32
/// rounds each component to the nearest float. Throws std::runtime_error naming the file on an
/// I/O failure.
ConversionResult convertSamples(const std::string& cf64Path, const std::string& outPath,
                                SampleFormat format, double scale,
                                std::size_t blockSamples = kConversionBlock);

}  // namespace nrsynth_cli
