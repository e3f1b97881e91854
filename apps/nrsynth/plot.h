#pragma once
// `nrsynth plot`: pictures of a waveform, drawn by the Python script installed beside the tool.

#include <string>

namespace nrsynth_cli {

struct PlotOptions {
    std::string wave;       ///< sample file written by `generate`
    std::string document;   ///< waveform document it came from; empty for none
    std::string kind;       ///< spectrum, ccdf, power, grid or constellation
    std::string output;     ///< PNG to write
    int carrier = 0;        ///< carrier of the grid and constellation pictures
    std::string labels;     ///< grid: also write each element's channel to this .npz; empty for none
};

/// The picture kinds, in the order of the help text.
inline constexpr const char* plotKinds[] = {"spectrum", "ccdf", "power", "grid", "constellation"};

/// Finds the script beside the executable and a Python 3 with numpy and matplotlib, and runs it.
/// Exit code: the script's, or 1 with a message when one of them is missing.
int plotWaveform(const PlotOptions& options, const char* argv0);

}  // namespace nrsynth_cli
