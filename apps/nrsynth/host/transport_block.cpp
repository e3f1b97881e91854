#include "host/transport_block.h"

#include <algorithm>
#include <cmath>
#include <cstdint>

#include "tables/mcs_tables.h"
#include "tables/tbs_table.h"

namespace nrsynth_host {
namespace {

const std::array<Orvalis_NR::tables::McsRow, 32>& rows(McsTable table) {
    using namespace Orvalis_NR::tables;
    switch (table) {
        case McsTable::Table51312: return kMcsTable51312;
        case McsTable::Table51313: return kMcsTable51313;
        case McsTable::Table61411: return kMcsTable61411;
        case McsTable::Table61412: return kMcsTable61412;
        case McsTable::Table51311: break;
    }
    return kMcsTable51311;
}

std::int64_t ceilDiv(std::int64_t a, std::int64_t b) { return (a + b - 1) / b; }

// The N_info > 3824 branch: quantise, then make the size fill C equal code blocks.
int largeSize(double nInfo, double rate) {
    const int n = std::ilogb(nInfo - 24) - 5;
    const double step = std::ldexp(1.0, n);
    const auto quantised = std::max<std::int64_t>(3840, static_cast<std::int64_t>(step * std::round((nInfo - 24) / step)));
    std::int64_t blocks = 1;
    if (rate <= 0.25)
        blocks = ceilDiv(quantised + 24, 3816);
    else if (quantised > 8424)
        blocks = ceilDiv(quantised + 24, 8424);
    const std::int64_t unit = 8 * blocks;
    return static_cast<int>(unit * ceilDiv(quantised + 24, unit) - 24);
}

// The N_info <= 3824 branch: quantise down, then the first size of Table 5.1.3.2-1 at or above.
int smallSize(double nInfo) {
    const int n = std::max(3, std::ilogb(nInfo) - 6);
    const double step = std::ldexp(1.0, n);
    const auto quantised = std::max(24, static_cast<int>(step * std::floor(nInfo / step)));
    const auto& table = Orvalis_NR::tables::kTbsTable;
    return *std::lower_bound(table.begin(), table.end(), quantised);
}

}  // namespace

std::optional<McsEntry> mcsEntry(McsTable table, int index, bool pi2Bpsk) {
    if (index < 0 || index > 31) return std::nullopt;
    const auto& row = rows(table)[static_cast<std::size_t>(index)];
    if (row.rateX1024 <= 0.0) return std::nullopt;
    if (pi2Bpsk && row.rateX1024Pi2Bpsk > 0.0) return McsEntry{1, row.rateX1024Pi2Bpsk};
    return McsEntry{row.modulationOrder, row.rateX1024};
}

int resourceElements(const TransportBlockInput& input) {
    const int perPrb = 12 * input.symbols - input.dmrsPerPrb - input.overheadPerPrb;
    return std::clamp(perPrb, 0, 156) * std::max(0, input.resourceBlocks);
}

int transportBlockSize(const TransportBlockInput& input) {
    const double rate = input.mcs.rateX1024 / 1024.0;
    const double nInfo = input.scaling * resourceElements(input) * rate * input.mcs.modulationOrder * input.layers;
    if (!(nInfo > 0.0)) return 0;
    // 3824 < N_info: the table ends at 3824, so the two branches meet without a gap.
    return nInfo <= 3824 ? smallSize(nInfo) : largeSize(nInfo, rate);
}

}  // namespace nrsynth_host
