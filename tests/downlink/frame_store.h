#pragma once
// A frame's resource-element store for generator tests: one 30 kHz frame (20 slots of 14
// symbols) on a 1024-column grid with point A 300 subcarriers below the centre column.

#include <complex>
#include <cstddef>
#include <vector>

#include "dsp/slot_grid.h"

namespace frame_store {

constexpr int kFft = 1024, kSlots = 20, kSymbols = 14 * kSlots;
constexpr double kPointA = -9.0e6;  // FrequencyOffsetOfPointA: -300 subcarriers of 30 kHz
constexpr int kPointAOffset = -300;

/// Sample, occupancy and symbol-flag stores of every antenna, all zero.
struct Store {
    Orvalis_NR::SlotGrid grid;
    Orvalis_NR::OccupancyGrid occupancy, flags;
    explicit Store(int antennas)
        : grid(static_cast<std::size_t>(antennas),
               std::vector<std::complex<double>>(static_cast<std::size_t>(kSymbols) * kFft)),
          occupancy(static_cast<std::size_t>(antennas), std::vector<int>(grid[0].size(), 0)),
          flags(static_cast<std::size_t>(antennas), std::vector<int>(kSymbols, 0)) {}
};

/// Store index of subcarrier k from point A in symbol l of slot `slot` (FFT order, wrapped).
inline std::size_t at(int slot, int l, int k) {
    return static_cast<std::size_t>((14 * slot + l) * kFft + ((kPointAOffset + k) % kFft + kFft) % kFft);
}

}  // namespace frame_store
