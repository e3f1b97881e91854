#include "coding/ldpc_parity_matrix.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <stdexcept>
#include <vector>

#include "coding/ldpc_encoder_core.h"
#include "ldpc_test_support.h"

namespace {

using Orvalis_NR::LdpcEncoderCore;
using Orvalis_NR::LdpcParityMatrix;
using Rows = std::vector<std::vector<int>>;

// The shift form built from the generated pattern and shift tables equals the published JSON
// for every set index of both graphs.
TEST(LdpcParityMatrix, BaseMatrixMatchesThePublishedTables) {
    for (int bg = 0; bg < 2; ++bg) {
        for (int set = 1; set <= 8; ++set) {
            const int z = 384;
            Rows base;
            LdpcParityMatrix::GetBaseMatrix(bg, set, z, base);
            ASSERT_EQ(base.size(), bg == 0 ? 46u : 42u);
            Rows expected(base.size(), std::vector<int>(bg == 0 ? 68 : 52, -1));
            for (const auto& e : nrsynth_test::jsonBaseGraph(bg)) {
                expected[e.row][e.column] = e.shift[set - 1] % z;
            }
            EXPECT_EQ(base, expected) << "graph " << bg + 1 << " set " << set;
        }
    }
    Rows base;
    LdpcParityMatrix::GetBaseMatrix(0, 7, 13, base);
    EXPECT_EQ(base[1][22], 105 % 13);
    EXPECT_THROW(LdpcParityMatrix::GetBaseMatrix(0, 9, 13, base), std::invalid_argument);
    EXPECT_THROW(LdpcParityMatrix::GetBaseMatrix(2, 1, 2, base), std::invalid_argument);
}

// After sortToLT2 the rows are solvable strictly in order: row i lists its own parity column
// K + i and nothing that a later row writes.
TEST(LdpcParityMatrix, LiftedRowsAreLowerTriangularInTheParityPart) {
    for (int bg = 0; bg < 2; ++bg) {
        for (int z : {2, 3, 5, 7, 9, 11, 13, 15, 104, 208, 240}) {
            const int set = nrsynth_test::liftingSetOf(z) + 1;
            const int k = (bg == 0 ? 22 : 10) * z;
            Rows rows;
            LdpcParityMatrix::GetNRMatrix(bg, set, z, rows);
            ASSERT_EQ(rows.size(), static_cast<std::size_t>((bg == 0 ? 46 : 42) * z));
            for (std::size_t i = 0; i < rows.size(); ++i) {
                const int own = k + static_cast<int>(i);
                ASSERT_EQ(std::count(rows[i].begin(), rows[i].end(), own), 1)
                    << "graph " << bg + 1 << " Z " << z << " row " << i;
                ASSERT_LE(*std::max_element(rows[i].begin(), rows[i].end()), own)
                    << "graph " << bg + 1 << " Z " << z << " row " << i;
            }
        }
    }
}

TEST(LdpcParityMatrix, SortToLT2SumsTheHeadBlocksAndRotatesBlockZero) {
    const Rows lifted = {{0, 4}, {1, 5}, {4, 6}, {5, 7}, {6, 8}, {7, 9}, {8, 2}, {9, 3}};
    Rows rows = lifted;
    LdpcParityMatrix::sortToLT2(rows, 2, 0);
    const Rows expected = {{0, 2}, {1, 3}, {4, 2}, {5, 3}, {6, 2}, {7, 3}, {8, 2}, {9, 3}};
    EXPECT_EQ(rows, expected);

    rows = lifted;
    LdpcParityMatrix::sortToLT2(rows, 2, 1);
    const Rows rotated = {{1, 3}, {0, 2}, {4, 2}, {5, 3}, {6, 2}, {7, 3}, {8, 2}, {9, 3}};
    EXPECT_EQ(rows, rotated);

    Rows tooFew(7);
    EXPECT_THROW(LdpcParityMatrix::sortToLT2(tooFew, 2, 0), std::invalid_argument);
}

TEST(LdpcParityMatrix, InflatePlacesShiftedIdentities) {
    Rows h;
    LdpcParityMatrix::inflate({{1, -1}, {0, 5}}, h, 3);
    const Rows expected = {
        {0, 1, 0, 0, 0, 0}, {0, 0, 1, 0, 0, 0}, {1, 0, 0, 0, 0, 0},
        {1, 0, 0, 0, 0, 1}, {0, 1, 0, 1, 0, 0}, {0, 0, 1, 0, 1, 0},
    };
    EXPECT_EQ(h, expected);
}

TEST(LdpcEncoderCore, Encode2SolvesRowsInOrderAndCopiesTheWorkVector) {
    Rows rows = {{0, 2, 3}, {1, 3, 4}};
    std::vector<int> out(7, 9);
    LdpcEncoderCore::Encode2(out, 1, {8, 1, 1, 0}, 1, 3, 2, 5, rows);
    // work = 1 1 0 p0 p1; p0 = 1^0 = 1 (own column still 0), p1 = 1^p0 = 0.
    EXPECT_EQ(out, (std::vector<int>{9, 1, 1, 0, 1, 0, 9}));

    EXPECT_THROW(LdpcEncoderCore::Encode2(out, 3, {1, 1, 0}, 0, 3, 2, 5, rows), std::out_of_range);
    EXPECT_THROW(LdpcEncoderCore::Encode2(out, 0, {1, 1}, 0, 3, 2, 5, rows), std::out_of_range);
    Rows wild = {{0, 7}};
    EXPECT_THROW(LdpcEncoderCore::Encode2(out, 0, {1, 1, 0}, 0, 3, 2, 5, wild), std::out_of_range);
}

}  // namespace
