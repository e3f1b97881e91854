#include "dsp/ofdm_modulator.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <stdexcept>
#include <string>

#include "dsp_oracles.h"

namespace dsp_test {
namespace {

using Orvalis_NR::OfdmModulator;
using Orvalis_NR::SlotGrid;
using Rows = std::vector<Samples>;

struct OfdmCase {
    const char* name;
    int fftSize;
    std::vector<int> cpLengths;
    int symbols, antennas, windowLength, centred;
    bool dcPunctured;
    double phaseStep;  // compensation, radians per sample
    int firstFrame;
};

// Windowed symbols are checked where the fade fits in the prefix (windowLength <= cp).
const OfdmCase kCases[] = {
    {"PlainNoWindow", 64, {20, 4}, 6, 2, 0, 1, false, 0.0, 0},
    {"OddCentredWindow", 64, {12, 6}, 4, 1, 7, 1, false, 0.0, 0},
    {"PhaseWindowDc", 128, {13, 9}, 4, 2, 8, 1, true, 0.013, 3},
    {"PhaseStartingWindow", 32, {6}, 5, 1, 4, 0, false, -0.7, 1},
    {"AnyLengthNoWindow", 48, {6}, 4, 1, 0, 1, true, 0.2, 2},
    // 80 samples per row: rowLength * frame passes 2^31 and the phase reference wraps.
    {"PhaseReferenceWraps", 16, {4}, 4, 1, 0, 1, false, 1e-3, 30000000},
    // The prefix index carries on into antenna 1, which starts at the second prefix.
    {"PrefixIndexCarriesOverAntennas", 32, {5, 3, 1}, 4, 2, 4, 1, false, 0.0, 0},
};

// Room for every symbol with the longest prefix, plus a margin that must stay untouched.
int rowLengthOf(const OfdmCase& c) {
    return c.symbols * (c.fftSize + *std::max_element(c.cpLengths.begin(), c.cpLengths.end())) + 5;
}

SlotGrid randomGrid(const OfdmCase& c, unsigned seed) {
    SlotGrid grid;
    for (int a = 0; a < c.antennas; ++a)
        grid.push_back(randomSamples(static_cast<std::size_t>(c.symbols * c.fftSize), seed + a));
    return grid;
}

OfdmModulator makeModulator(const OfdmCase& c) {
    OfdmModulator modulator;
    modulator.windowLength = c.windowLength;
    modulator.centred = c.centred;
    EXPECT_TRUE(modulator.Init(c.fftSize, c.cpLengths, c.symbols, c.dcPunctured, c.antennas));
    return modulator;
}

class OfdmModulation : public ::testing::TestWithParam<OfdmCase> {};

TEST_P(OfdmModulation, ForwardTransformOfEachUsefulPartReturnsTheGrid) {
    const OfdmCase& c = GetParam();
    const int h = c.centred ? c.windowLength / 2 : 0;
    const int rowLength = rowLengthOf(c);
    OfdmModulator modulator = makeModulator(c);
    SlotGrid grid = randomGrid(c, 11);
    const SlotGrid original = grid;
    Rows output(c.antennas, Samples(rowLength));
    modulator.Go(grid, output, c.phaseStep, c.firstFrame);

    std::size_t cpIndex = 0;
    for (int a = 0; a < c.antennas; ++a) {
        int position = 0;
        for (int s = 0; s < c.symbols; ++s) {
            const int cp = c.cpLengths[cpIndex++ % c.cpLengths.size()];
            const int usefulStart = position + h + cp;  // content is late by h when centred
            const int symbolStart = position;
            position += c.fftSize + cp;
            // Read one period clear of both crossfades: from the end of this symbol's fade-in,
            // which needs the fade to fit in the prefix.
            if (c.windowLength > cp) continue;
            const int readStart = symbolStart + c.windowLength;
            const int shift = usefulStart - readStart;
            Samples useful(c.fftSize);
            for (int i = 0; i < c.fftSize; ++i)
                useful[i] = output[a][readStart + (i + shift) % c.fftSize];
            // Undo the compensation: back to the phase of the carrier at the useful start.
            // The modulator counts samples in 32 bits, so the reference wraps with it.
            const auto sample = static_cast<std::int32_t>(static_cast<std::uint32_t>(
                static_cast<std::int64_t>(rowLength) * c.firstFrame + usefulStart - h));
            const double x = c.phaseStep * sample;
            for (auto& v : useful) v *= std::polar(1.0, x);
            const Samples spectrum = directDft(useful);

            Samples expected(original[a].begin() + s * c.fftSize,
                             original[a].begin() + (s + 1) * c.fftSize);
            if (c.dcPunctured) {
                expected[0] = 0.0;
                EXPECT_EQ(grid[a][s * c.fftSize], Complex(0.0)) << "DC left in the grid";
            }
            EXPECT_LE(maxAbsDifference(spectrum, expected), 1e-12)
                << "antenna " << a << " symbol " << s;

            // The prefix is a copy of the symbol's end, where no crossfade touches either.
            for (int j = std::max(0, c.windowLength - h); j < cp - h; ++j)
                EXPECT_EQ(output[a][usefulStart - cp + j],
                          output[a][usefulStart + c.fftSize - cp + j]);
        }
        // Nothing is written past the last symbol.
        for (int i = position; i < rowLength; ++i) EXPECT_EQ(output[a][i], Complex(0.0));
    }
}

INSTANTIATE_TEST_SUITE_P(Cases, OfdmModulation, ::testing::ValuesIn(kCases),
                         [](const auto& info) { return std::string(info.param.name); });

// Over the first W samples a symbol fades in from the previous symbol's cyclic continuation
// (silence for a fresh modulator), with 0.5 - 0.5 cos((i + 0.5) pi / W) and pi cut to 3.1415926.
// One period after a faded sample the same symbol sample stands unfaded; the previous symbol's
// continuation is its own sample one period before, just past its prefix.
TEST(OfdmModulator, CrossfadeWithinAndAcrossFrames) {
    for (int centred : {0, 1}) {
        const OfdmCase c{"", 32, {10}, 2, 1, 8, centred, false, 0.0, 0};
        const int n = 32, cp = 10, w = 8, rowLength = rowLengthOf(c);
        OfdmModulator modulator = makeModulator(c);
        SlotGrid first = randomGrid(c, 1), second = randomGrid(c, 2);
        Rows frame0(1, Samples(rowLength)), frame1(1, Samples(rowLength));
        modulator.Go(first, frame0, 0.0, 0);
        modulator.Go(second, frame1, 0.0, 1);
        const Samples &a = frame0[0], &b = frame1[0];
        for (int j = 0; j < w; ++j) {
            const double fade = 0.5 - 0.5 * std::cos((j + 0.5) * 3.1415926 / w);
            EXPECT_LE(std::abs(a[j] - fade * a[j + n]), 1e-12) << j;
            const Complex secondSymbol = fade * a[n + cp + j + n] + (1.0 - fade) * a[cp + j];
            EXPECT_LE(std::abs(a[n + cp + j] - secondSymbol), 1e-12) << j;
            const Complex nextFrame = fade * b[j + n] + (1.0 - fade) * a[n + cp + cp + j];
            EXPECT_LE(std::abs(b[j] - nextFrame), 1e-12) << j;
        }
    }
}

TEST(OfdmModulator, WrongRowCountLeavesEverythingUntouchedAndOverrunsAreRefused) {
    const OfdmCase c{"", 16, {4}, 2, 2, 4, 1, true, 0.5, 0};
    OfdmModulator modulator = makeModulator(c);
    SlotGrid grid = randomGrid(c, 3);
    const SlotGrid original = grid;
    Rows oneRow(1, Samples(100, Complex(7.0)));
    EXPECT_FALSE(modulator.Go(grid, oneRow, c.phaseStep, 0));
    EXPECT_EQ(grid, original);
    EXPECT_EQ(oneRow[0], Samples(100, Complex(7.0)));
    for (const auto& tail : modulator.tails) EXPECT_EQ(tail, Samples(4));

    // Rows or grids too short for the symbols are refused.
    SlotGrid shortGrid(2, Samples(31));
    Rows output(2, Samples(40)), shortOutput(2, Samples(39));
    EXPECT_THROW(modulator.Go(grid, shortOutput, 0.0, 0), std::invalid_argument);
    EXPECT_THROW(modulator.Go(shortGrid, output, 0.0, 0), std::invalid_argument);
    modulator.windowLength = 17;  // longer than the symbol
    EXPECT_THROW(modulator.Init(16, {4}, 1, false, 1), std::invalid_argument);
}

}  // namespace
}  // namespace dsp_test
