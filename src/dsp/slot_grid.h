#pragma once
// The frame store of one numerology. Per antenna one row holding every OFDM symbol of a radio
// frame back to back: element (symbol s, subcarrier k) lies at s * fftSize + k, with k in
// transform order (0 is the DC subcarrier, a negative subcarrier k is stored at k + fftSize).

#include <complex>
#include <vector>

namespace Orvalis_NR {

/// Resource elements of one radio frame, one row per antenna.
using SlotGrid = std::vector<std::vector<std::complex<double>>>;

/// Same shape as SlotGrid: one int per resource element saying which channel holds it.
using OccupancyGrid = std::vector<std::vector<int>>;

}  // namespace Orvalis_NR
