#include "downlink/ssb_mapping.h"

#include <algorithm>
#include <string>

#include "common/failure.h"
#include "downlink/ss_sequences.h"

namespace {

constexpr int kSyncFirst = 56;    // PSS and SSS take subcarriers 56..182
constexpr int kSssGuardLow = 48;  // unused subcarriers 48..55 and 183..191 beside the SSS
constexpr int kSssGuardHigh = 191;
constexpr int kPbchDataLength = 432;

// Per PBCH symbol 1, 2, 3: where its DM-RS and data values start, and how many DM-RS it takes
// (the data fill the 180, 72 and 180 subcarriers left free).
constexpr int kDmrsStart[] = {0, 60, 84};
constexpr int kDmrsCount[] = {60, 24, 60};
constexpr int kDataStart[] = {0, 180, 252};

void require(bool ok, const char* function, const char* what, long long value) {
    if (!ok)
        Orvalis_NR::failWith("The SS/PBCH block mapping was given unusable sizes.",
                 std::string(function) + " " + what + " " + std::to_string(value));
}

void requireSymbol(const char* function, std::size_t symbolSize, std::size_t occupancySize) {
    require(symbolSize >= kSsbSubcarriers, function, "symbol size", symbolSize);
    require(occupancySize >= kSsbSubcarriers, function, "occupancy size", occupancySize);
}

void mapSync(const BitSequence& sequence, std::vector<complex>& symbol, double amp,
             std::vector<int>& occupancy, int value) {
    for (int n = 0; n < kSyncSequenceLength; ++n) {
        symbol[kSyncFirst + n] = complex(sequence[n] == 1 ? amp : -amp, 0.0);
        occupancy[kSyncFirst + n] = value;
    }
}

void mapPss(const BitSequence& pss, std::vector<complex>& symbol, double amp,
            std::vector<int>& occupancy) {
    require(pss.size() >= kSyncSequenceLength, "Map_PSS_Signal", "pss size", pss.size());
    requireSymbol("Map_PSS_Signal", symbol.size(), occupancy.size());
    for (int k = 0; k < kSsbSubcarriers; ++k) {
        symbol[k] = 0.0;
        occupancy[k] = kOccupancySsbUnused;
    }
    mapSync(pss, symbol, amp, occupancy, kOccupancyPss);
}

void mapSss(const BitSequence& sss, std::vector<complex>& symbol, double amp,
            std::vector<int>& occupancy) {
    require(sss.size() >= kSyncSequenceLength, "Map_SSS_Signal", "sss size", sss.size());
    requireSymbol("Map_SSS_Signal", symbol.size(), occupancy.size());
    for (int k = kSssGuardLow; k <= kSssGuardHigh; ++k) occupancy[k] = kOccupancySsbUnused;
    mapSync(sss, symbol, amp, occupancy, kOccupancySss);
}

void mapPbch(const std::vector<complex>& data, const std::vector<complex>& dmrs,
             std::vector<complex>& symbol, double dmrsAmp, double dataAmp, int cellId,
             int symbolIndex, std::vector<int>& occupancy) {
    const char* function = "Map_PBCH_Signal";
    require(symbolIndex >= 1 && symbolIndex <= 3, function, "symbolIndex", symbolIndex);
    require(cellId >= 0, function, "cellId", cellId);
    require(dmrs.size() >= kPbchDmrsLength, function, "dmrs size", dmrs.size());
    require(data.size() >= kPbchDataLength, function, "data size", data.size());
    requireSymbol(function, symbol.size(), occupancy.size());

    const int row = symbolIndex - 1;
    const int v = cellId % 4;
    const complex dmrsScale(dmrsAmp, 0.0);
    const complex dataScale(dataAmp, 0.0);
    for (int i = 0; i < kDmrsCount[row]; ++i) {
        // The upper half of symbol 2's DM-RS lies above the SSS: subcarriers 192..239.
        const int k = 4 * i + v + (symbolIndex == 2 && i >= 12 ? 144 : 0);
        symbol[k] = dmrs[kDmrsStart[row] + i] * dmrsScale;
        occupancy[k] = kOccupancyPbchDmrs;
    }
    // At most 240 minus the DM-RS subcarriers are free, so symbol 3 ends at 432 at the latest.
    int next = kDataStart[row];
    for (int k = 0; k < kSsbSubcarriers; ++k) {
        if (occupancy[k] != 0) continue;
        symbol[k] = data[next++] * dataScale;
        occupancy[k] = kOccupancyPbchData;
    }
}

}  // namespace

void Map_PSS_Signal(BitSequence pss, std::vector<complex>& symbol, double amp,
                    std::vector<int>& occupancy) {
    mapPss(pss, symbol, amp, occupancy);
}

void Map_SSS_Signal(BitSequence sss, std::vector<complex>& symbol, double amp,
                    std::vector<int>& occupancy) {
    mapSss(sss, symbol, amp, occupancy);
}

void Map_PBCH_Signal(std::vector<complex> data, std::vector<complex> dmrs,
                     std::vector<complex>& symbol, double dmrsAmp, double dataAmp, int cellId,
                     int symbolIndex, std::vector<int>& occupancy) {
    mapPbch(data, dmrs, symbol, dmrsAmp, dataAmp, cellId, symbolIndex, occupancy);
}

void Map_SSBlock_Signal(BitSequence pss, BitSequence sss, std::vector<complex> data,
                        std::vector<complex> dmrs, std::vector<complex>& block, int width,
                        double pssAmp, double sssAmp, double dmrsAmp, double dataAmp, int cellId,
                        std::vector<int>& occupancy) {
    const char* function = "Map_SSBlock_Signal";
    require(width >= kSsbSubcarriers, function, "width", width);
    const std::size_t needed = static_cast<std::size_t>(kSsbSymbols) * width;
    require(block.size() >= needed, function, "block size", block.size());
    require(occupancy.size() >= needed, function, "occupancy size", occupancy.size());

    std::vector<complex> symbol(kSsbSubcarriers);
    std::vector<int> used(kSsbSubcarriers);
    for (int s = 0; s < kSsbSymbols; ++s) {
        std::fill(symbol.begin(), symbol.end(), complex(0.0, 0.0));
        std::fill(used.begin(), used.end(), 0);
        if (s == 0) {
            mapPss(pss, symbol, pssAmp, used);
        } else {
            if (s == 2) mapSss(sss, symbol, sssAmp, used);
            mapPbch(data, dmrs, symbol, dmrsAmp, dataAmp, cellId, s, used);
        }
        std::copy(symbol.begin(), symbol.end(), block.begin() + s * width);
        std::copy(used.begin(), used.end(), occupancy.begin() + s * width);
    }
}
