#include "coding/transport_block_size.h"

#include <algorithm>
#include <cmath>
#include <string>

#include "common/failure.h"
#include "tables/tbs_table.h"

namespace Orvalis_NR {
namespace {

// Resource elements per PRB band, for the limited-buffer size of TS 38.212 clause 5.4.2.1.
int resourceElements(int prbs) {
    if (prbs < 33) return 4992;
    if (prbs <= 66) return 10296;
    if (prbs <= 107) return 16692;
    if (prbs <= 135) return 21060;
    if (prbs <= 162) return 25272;
    if (prbs <= 217) return 33852;
    return 42588;
}

int truncatedLog2(double x) { return static_cast<int>(std::log10(x) / std::log10(2.0)); }

}  // namespace

int TbsFromTable(int nInfo) {
    if (nInfo <= 0) failWith("The transport block's N_info is not positive.", "N_info " + std::to_string(nInfo));
    const int n = std::max(3, truncatedLog2(nInfo) - 6);
    const int step = 1 << n;
    const int quantised = std::max(24, step * (nInfo / step));
    const auto& table = tables::kTbsTable;
    const auto it = std::lower_bound(table.begin(), table.end(), quantised);
    return it == table.end() ? -1 : *it;
}

bool DeterminationTransportBlockSize(int& tbs, int blocks, int a, int b, int prbs) {
    // R = 948/1024 = 0.92578125, exact in binary.
    const double product = resourceElements(prbs) * 0.92578125 * b * a;
    // N_info must be a positive int: far above any real buffer, 2 10^9 still leaves room for
    // the rounding steps below.
    if (!(product >= 1.0) || product > 2.0e9)
        failWith("The limited-buffer transport block size has no positive N_info.",
                 "a " + std::to_string(a) + ", b " + std::to_string(b));
    const int nInfo = static_cast<int>(product);
    if (nInfo > 3824) {
        const int x = nInfo - 24;
        const int n = truncatedLog2(x) - 5;
        const double step = std::ldexp(1.0, n);
        const int quantised = std::max(static_cast<int>(step * std::floor(x / step + 0.5)), 3840);
        if (quantised < 8425) {
            tbs = 8 * ((quantised + 24 + 7) / 8) - 24;
        } else {
            if (blocks <= 0)
                failWith("The limited-buffer transport block size needs a positive code block count.",
                         "C " + std::to_string(blocks));
            const long long unit = 8LL * blocks;
            tbs = static_cast<int>(unit * ((quantised + 24 + unit - 1) / unit) - 24);
        }
        return true;
    }
    const int fromTable = TbsFromTable(nInfo);
    if (fromTable > 0) tbs = fromTable;
    return true;
}

}  // namespace Orvalis_NR
