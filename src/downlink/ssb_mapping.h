#pragma once
// Placement of PSS, SSS, PBCH and its DM-RS inside one SS/PBCH block of 4 OFDM symbols by 240
// subcarriers, TS 38.211 clause 7.4.3.1 (Table 7.4.3.1-1). Subcarrier k counts from the lowest
// subcarrier of the block. Every function writes the occupancy values of the frame store:
// 370 unused block element, 380 PSS, 390 SSS, 400 PBCH data, 410 PBCH DM-RS.

#include <vector>

#include "coding/coding_types.h"

inline constexpr int kSsbSubcarriers = 240;
inline constexpr int kSsbSymbols = 4;

inline constexpr int kOccupancySsbUnused = 370;
inline constexpr int kOccupancyPss = 380;
inline constexpr int kOccupancySss = 390;
inline constexpr int kOccupancyPbchData = 400;
inline constexpr int kOccupancyPbchDmrs = 410;

/// Symbol 0 of the block: the 127 PSS elements (+1/-1) as +amp/-amp at subcarriers 56..182
/// (occupancy 380), zero and occupancy 370 at all other subcarriers of `symbol` (240 values).
void Map_PSS_Signal(BitSequence pss, std::vector<complex>& symbol, double amp,
                    std::vector<int>& occupancy);

/// The SSS part of symbol 2: +amp/-amp at subcarriers 56..182 (occupancy 390) and the guard
/// subcarriers 48..55 and 183..191 marked 370. Other subcarriers are left as they are.
void Map_SSS_Signal(BitSequence sss, std::vector<complex>& symbol, double amp,
                    std::vector<int>& occupancy);

/// PBCH symbol `symbolIndex` (1, 2 or 3) of the block: DM-RS at subcarriers 4i + cellId mod 4
/// (60, 24 and 60 values from index 0, 60, 84 of `dmrs`; in symbol 2 the upper twelve move up
/// by 144), then the data values (180, 72, 180 from index 0, 180, 252 of `data`) on every
/// subcarrier whose occupancy is still 0, in rising order. `symbol` and `occupancy` hold 240
/// values; `dmrs` 144 and `data` 432.
void Map_PBCH_Signal(std::vector<complex> data, std::vector<complex> dmrs,
                     std::vector<complex>& symbol, double dmrsAmp, double dataAmp, int cellId,
                     int symbolIndex, std::vector<int>& occupancy);

/// The whole block into `block` and `occupancy`, row s (0..3) at s * width: symbol 0 PSS,
/// symbols 1 and 3 PBCH, symbol 2 SSS with PBCH at its edges. Each row is built from zero.
/// width: at least 240; `block` and `occupancy` hold at least 4 width values.
void Map_SSBlock_Signal(BitSequence pss, BitSequence sss, std::vector<complex> data,
                        std::vector<complex> dmrs, std::vector<complex>& block, int width,
                        double pssAmp, double sssAmp, double dmrsAmp, double dataAmp, int cellId,
                        std::vector<int>& occupancy);
