#include "coding/transport_block_size.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <bit>
#include <stdexcept>
#include <vector>

#include "vector_file.h"

namespace {

using Orvalis_NR::DeterminationTransportBlockSize;
using Orvalis_NR::TbsFromTable;

// TS 38.214 Table 5.1.3.2-1 read from the committed JSON.
const std::vector<int>& jsonTbsTable() {
    static const auto table = nrsynth_test::tableColumn("ts38214_table_5_1_3_2_1_tbs.json");
    return table;
}

int floorLog2(int x) {
    return std::bit_width(static_cast<unsigned>(x)) - 1;
}

// TS 38.214 clause 5.1.3.2 steps 3 and 4 with R above 1/4; `blocks` receives its C.
int directTbs(int nInfo, int* blocks = nullptr) {
    if (nInfo <= 3824) {
        const int n = std::max(3, floorLog2(nInfo) - 6);
        const int quantised = std::max(24, (1 << n) * (nInfo >> n));
        return *std::lower_bound(jsonTbsTable().begin(), jsonTbsTable().end(), quantised);
    }
    const int n = floorLog2(nInfo - 24) - 5;
    const int quantised = std::max(3840, (1 << n) * ((nInfo - 24 + (1 << (n - 1))) >> n));
    const int c = quantised > 8424 ? (quantised + 24 + 8423) / 8424 : 1;
    if (blocks) *blocks = c;
    return 8 * c * ((quantised + 24 + 8 * c - 1) / (8 * c)) - 24;
}

TEST(TransportBlockSize, HandWorkedValues) {
    int tbs = -5;
    // 273 PRBs, 256QAM, 4 layers: N_info 1261669, N' 1277952.
    ASSERT_TRUE(DeterminationTransportBlockSize(tbs, 152, 8, 4, 273));
    EXPECT_EQ(tbs, 1277992);
    ASSERT_TRUE(DeterminationTransportBlockSize(tbs, 1, 8, 4, 273));
    EXPECT_EQ(tbs, 1277952);
    // 10 PRBs, a = b = 1: N_info 4621, N' 4608, below 8425.
    ASSERT_TRUE(DeterminationTransportBlockSize(tbs, 99, 1, 1, 10));
    EXPECT_EQ(tbs, 4608);
    EXPECT_EQ(nrsynth_test::failureText([&] { DeterminationTransportBlockSize(tbs, 1, 0, 4, 10); }),
              "The limited-buffer transport block size has no positive N_info. a 0, b 4");
    EXPECT_EQ(nrsynth_test::failureText([&] { DeterminationTransportBlockSize(tbs, 0, 8, 4, 273); }),
              "The limited-buffer transport block size needs a positive code block count. C 0");
}

// With the standard's code block count the result is TS 38.214's TBS, for every PRB band and
// every (a, b) product.
TEST(TransportBlockSize, FollowsTheClauseOverAllBands) {
    const int bandRe[] = {4992, 10296, 16692, 21060, 25272, 33852, 42588};
    const int bandPrbs[] = {1, 33, 67, 108, 136, 163, 218};
    for (int band = 0; band < 7; ++band) {
        for (int a : {1, 2, 4, 6, 8}) {
            for (int b = 1; b <= 4; ++b) {
                const int nInfo = static_cast<int>(bandRe[band] * 0.92578125 * a * b);
                int c = 0;
                const int expected = directTbs(nInfo, &c);
                for (int prbs : {bandPrbs[band], band < 6 ? bandPrbs[band + 1] - 1 : 275}) {
                    int tbs = 0;
                    ASSERT_TRUE(DeterminationTransportBlockSize(tbs, c, a, b, prbs));
                    EXPECT_EQ(tbs, expected) << "prbs " << prbs << " a " << a << " b " << b;
                }
            }
        }
    }
}

TEST(TransportBlockSize, SmallInformationSizesUseTheTable) {
    for (int nInfo = 1; nInfo <= 3824; ++nInfo) {
        ASSERT_EQ(TbsFromTable(nInfo), directTbs(nInfo)) << "N_info " << nInfo;
    }
    EXPECT_EQ(nrsynth_test::failureText([] { TbsFromTable(0); }),
              "The transport block's N_info is not positive. N_info 0");
}

}  // namespace
