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
    int symbols;
    int antennas;
    int windowLength;
    int centred;
    bool dcPunctured;
    double phaseStep;
    int firstFrame;
};

const OfdmCase kCases[] = {
    {"PlainNoWindow", 64, {20, 4}, 6, 2, 0, 1, false, 0.0, 0},
    {"CentredWindow", 64, {20, 4}, 6, 2, 8, 1, false, 0.0, 0},
    {"StartingWindow", 64, {20, 4}, 6, 2, 8, 0, false, 0.0, 0},
    {"OddCentredWindow", 64, {12, 6}, 4, 1, 7, 1, false, 0.0, 0},
    {"PhaseWindowDc", 128, {13, 9}, 4, 2, 16, 1, true, 0.013, 3},
    {"PhaseStartingWindow", 32, {6}, 5, 1, 4, 0, false, -0.7, 1},
    {"WindowAsLongAsSymbol", 32, {3, 2, 2}, 6, 1, 32, 1, false, 0.0, 0},
    {"ZeroPrefixFullWindow", 16, {0}, 3, 1, 16, 0, false, 0.0, 0},
    {"AnyLengthNoWindow", 48, {6}, 4, 1, 0, 1, true, 0.2, 2},
    // 80 samples per row: rowLength * frame passes 2^31 and the phase reference wraps.
    {"PhaseReferenceWraps", 16, {4}, 4, 1, 0, 1, false, 1e-3, 30000000},
    // The prefix index carries on into antenna 1, which starts at the second prefix.
    {"PrefixIndexCarriesOverAntennas", 32, {5, 3, 1}, 4, 2, 4, 1, false, 0.0, 0},
};

int rowLengthOf(const OfdmCase& c) {
    // Long enough for every antenna's prefix sequence, plus a margin that must stay untouched.
    int longest = 0;
    for (int a = 0; a < c.antennas; ++a) {
        int total = 0;
        for (int s = 0; s < c.symbols; ++s)
            total += c.fftSize + c.cpLengths[(a * c.symbols + s) % c.cpLengths.size()];
        longest = std::max(longest, total);
    }
    return longest + 5;
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

/// Phase of the compensation carrier at an absolute sample index, in the modulator's 32-bit
/// sample count.
double compensationAngle(double phaseStep, std::int64_t sample) {
    return static_cast<double>(static_cast<std::int32_t>(static_cast<std::uint32_t>(sample))) *
           phaseStep;
}

/// The time-domain symbols of one frame as the modulator must see them: inverse DFT of the grid
/// row (DC cleared if punctured), rotated so the useful part starts at phase 0 of the
/// compensation carrier.
struct SymbolPlan {
    Samples useful;  // one period, starting at the useful part
    int position;    // first output sample of the symbol
    int cp;
};

std::vector<std::vector<SymbolPlan>> planFrame(const OfdmCase& c, const SlotGrid& grid, int frame,
                                               int rowLength) {
    std::vector<std::vector<SymbolPlan>> plan(c.antennas);
    std::size_t cpIndex = 0;
    for (int a = 0; a < c.antennas; ++a) {
        int position = 0;
        for (int s = 0; s < c.symbols; ++s) {
            const int cp = c.cpLengths[cpIndex++ % c.cpLengths.size()];
            Samples row(grid[a].begin() + s * c.fftSize, grid[a].begin() + (s + 1) * c.fftSize);
            if (c.dcPunctured) row[0] = 0.0;
            Samples time = directIdft(row);
            if (c.phaseStep != 0.0) {
                const std::int64_t usefulStart =
                    static_cast<std::int64_t>(rowLength) * frame + position + cp;
                const double x = -compensationAngle(c.phaseStep, usefulStart);
                for (auto& v : time) v *= std::polar(1.0, x);
            }
            plan[a].push_back({time, position, cp});
            position += c.fftSize + cp;
        }
    }
    return plan;
}

double windowValue(int i, int w) {
    return 0.5 - 0.5 * std::cos((i + 0.5) * 3.1415926 / w);
}

int positiveMod(int v, int n) {
    return ((v % n) + n) % n;
}

/// Expected output rows: each symbol's prefix and useful part, delayed by half the window when
/// centred; over the first W samples a raised-cosine fade from the previous symbol's cyclic
/// continuation (`previous`, zero for the first symbol of a fresh modulator).
Rows expectedFrame(const OfdmCase& c, const std::vector<std::vector<SymbolPlan>>& plan,
                   std::vector<const Samples*>& previous, int rowLength) {
    const int n = c.fftSize, w = c.windowLength, h = c.centred ? w / 2 : 0;
    const Samples zeros(n);
    Rows rows(c.antennas, Samples(rowLength));
    for (int a = 0; a < c.antennas; ++a) {
        for (const auto& symbol : plan[a]) {
            const Samples& before = previous[a] ? *previous[a] : zeros;
            for (int j = 0; j < n + symbol.cp; ++j) {
                Complex value = symbol.useful[positiveMod(j - h - symbol.cp, n)];
                if (j < w) {
                    // `before` starts at its useful part; its prefix-free continuation past its
                    // last output sample (index n - h - 1) is index n - h + j.
                    value = value * windowValue(j, w) +
                            before[positiveMod(n - h + j, n)] * (1.0 - windowValue(j, w));
                }
                rows[a][symbol.position + j] = value;
            }
            previous[a] = &symbol.useful;
        }
    }
    return rows;
}

class OfdmModulation : public ::testing::TestWithParam<OfdmCase> {};

TEST_P(OfdmModulation, TwoFramesEqualTheCrossfadedPrefixedSymbols) {
    const OfdmCase& c = GetParam();
    const int rowLength = rowLengthOf(c);
    OfdmModulator modulator = makeModulator(c);
    std::vector<const Samples*> previous(c.antennas, nullptr);
    std::vector<std::vector<std::vector<SymbolPlan>>> plans;  // keeps `previous` alive
    plans.reserve(2);

    for (int f = 0; f < 2; ++f) {
        const int frame = c.firstFrame + f;
        SlotGrid grid = randomGrid(c, 100u * f + 7u);
        plans.push_back(planFrame(c, grid, frame, rowLength));
        const Rows expected = expectedFrame(c, plans.back(), previous, rowLength);

        Rows output(c.antennas, Samples(rowLength));
        EXPECT_FALSE(modulator.Go(grid, output, c.phaseStep, frame));
        for (int a = 0; a < c.antennas; ++a)
            EXPECT_LE(maxAbsDifference(output[a], expected[a]), 1e-12)
                << "frame " << frame << " antenna " << a;
    }
}

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
            const double x = compensationAngle(
                c.phaseStep, static_cast<std::int64_t>(rowLength) * c.firstFrame + usefulStart - h);
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

TEST(OfdmModulator, WindowUsesTheTruncatedPi) {
    OfdmModulator modulator;
    modulator.windowLength = 10;
    modulator.Init(64, {8}, 1, false, 1);
    ASSERT_EQ(modulator.window.size(), 10u);
    for (int i = 0; i < 10; ++i) {
        EXPECT_NEAR(modulator.window[i], windowValue(i, 10), 1e-16);
        // Full pi would differ by up to ~1e-8 here: large enough to tell apart.
        EXPECT_GT(std::abs(modulator.window[i] -
                           (0.5 - 0.5 * std::cos((i + 0.5) * std::numbers::pi / 10))),
                  1e-10);
    }
    EXPECT_EQ(modulator.maxSymbolLength, 72);
    EXPECT_EQ(modulator.centred, 1);
    EXPECT_EQ(modulator.oversampling, 1);
}

TEST(OfdmModulator, FreshModulatorStartsFromSilenceButAContinuedOneDoesNot) {
    const OfdmCase c{"", 32, {4}, 2, 1, 8, 1, false, 0.0, 0};
    const int rowLength = rowLengthOf(c);
    OfdmModulator continued = makeModulator(c);
    OfdmModulator fresh = makeModulator(c);
    SlotGrid first = randomGrid(c, 1), second = randomGrid(c, 2), secondCopy = second;
    Rows out0(1, Samples(rowLength)), out1(1, Samples(rowLength)), outFresh(1, Samples(rowLength));
    continued.Go(first, out0, 0.0, 0);
    continued.Go(second, out1, 0.0, 1);
    fresh.Go(secondCopy, outFresh, 0.0, 1);
    // Only the crossfade region depends on the history.
    EXPECT_GT(maxAbsDifference(out1[0].data(), outFresh[0].data(), 8), 1e-3);
    EXPECT_EQ(maxAbsDifference(out1[0].data() + 8, outFresh[0].data() + 8, rowLength - 8), 0.0);
}

TEST(OfdmModulator, WrongRowCountLeavesEverythingUntouched) {
    const OfdmCase c{"", 16, {4}, 2, 2, 4, 1, true, 0.5, 0};
    OfdmModulator modulator = makeModulator(c);
    SlotGrid grid = randomGrid(c, 3);
    const SlotGrid original = grid;
    Rows output(1, Samples(100, Complex(7.0)));
    EXPECT_FALSE(modulator.Go(grid, output, c.phaseStep, 0));
    EXPECT_EQ(grid, original);
    EXPECT_EQ(output[0], Samples(100, Complex(7.0)));
    for (const auto& tail : modulator.tails) EXPECT_EQ(tail, Samples(4));
}

TEST(OfdmModulator, EmptyPuncturedRowGivesSilence) {
    const OfdmCase c{"", 16, {4}, 2, 1, 0, 1, true, 0.3, 0};
    OfdmModulator modulator = makeModulator(c);
    SlotGrid grid(1, Samples(32));
    grid[0][16] = 1.0;  // DC of symbol 1 only
    Rows output(1, Samples(40, Complex(9.0)));
    modulator.Go(grid, output, c.phaseStep, 0);
    EXPECT_EQ(output[0], Samples(40));
    EXPECT_EQ(grid[0][16], Complex(0.0));
}

TEST(OfdmModulator, RefusesSizesThatWouldOverrun) {
    const OfdmCase c{"", 16, {4}, 2, 1, 0, 1, false, 0.0, 0};
    OfdmModulator modulator = makeModulator(c);
    SlotGrid grid = randomGrid(c, 3);
    Rows shortOutput(1, Samples(39));
    EXPECT_THROW(modulator.Go(grid, shortOutput, 0.0, 0), std::invalid_argument);
    SlotGrid shortGrid(1, Samples(31));
    Rows output(1, Samples(40));
    EXPECT_THROW(modulator.Go(shortGrid, output, 0.0, 0), std::invalid_argument);

    OfdmModulator bad;
    EXPECT_THROW(bad.Init(0, {4}, 1, false, 1), std::invalid_argument);
    EXPECT_THROW(bad.Init(16, {}, 1, false, 1), std::invalid_argument);
    EXPECT_THROW(bad.Init(16, {-1}, 1, false, 1), std::invalid_argument);
    EXPECT_THROW(bad.Init(16, {17}, 1, false, 1), std::invalid_argument);
    bad.windowLength = 17;
    EXPECT_THROW(bad.Init(16, {4}, 1, false, 1), std::invalid_argument);
    bad.windowLength = 4;
    bad.Init(16, {4}, 1, false, 1);
    bad.windowLength = 8;  // changed behind Init's back
    EXPECT_THROW(bad.Go(grid, output, 0.0, 0), std::invalid_argument);
}

}  // namespace
}  // namespace dsp_test
