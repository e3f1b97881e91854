#include "coding/ldpc_parity_matrix.h"

#include <algorithm>
#include <stdexcept>
#include <string>

#include "coding/ldpc_tables.h"

namespace Orvalis_NR {
namespace {

struct GraphShape {
    int rows;
    int columns;
    int infoColumns;
    const std::vector<std::vector<int>>* pattern;
    const std::vector<std::vector<std::vector<int>>>* shifts;
};

GraphShape shapeOf(int baseGraph) {
    if (baseGraph == 0) return {46, 68, 22, &BaseGraph1Pattern, &BaseGraph1Shifts};
    if (baseGraph == 1) return {42, 52, 10, &BaseGraph2Pattern, &BaseGraph2Shifts};
    throw std::invalid_argument("LdpcParityMatrix: baseGraph must be 0 or 1, got " +
                                std::to_string(baseGraph));
}

void checkLifting(int setIndex, int z) {
    if (setIndex < 1 || setIndex > 8) {
        throw std::invalid_argument("LdpcParityMatrix: setIndex must be 1..8, got " +
                                    std::to_string(setIndex));
    }
    if (z < 1) {
        throw std::invalid_argument("LdpcParityMatrix: z must be positive, got " +
                                    std::to_string(z));
    }
}

// Head correction of sortToLT2: the shift left on the first parity block once the four head
// blocks are summed (TS 38.212 Tables 5.3.2-2/3: the 105 of base graph 1 at iLS 6, the
// shift-1 diagonal of base graph 2 at every iLS but 3 and 7).
int headCorrection(int baseGraph, int setIndex, int z) {
    if (baseGraph == 0) return setIndex == 7 ? 105 % z : 0;
    return (setIndex == 4 || setIndex == 8) ? 0 : 1 % z;
}

// rows[a] becomes the symmetric difference of rows[a] and rows[b], keeping the order of the
// surviving entries of rows[a] and appending the new ones.
void symmetricDifference(std::vector<int>& a, const std::vector<int>& b) {
    const std::size_t original = a.size();
    std::vector<char> erase(original, 0);
    for (int index : b) {
        const auto end = a.begin() + static_cast<std::ptrdiff_t>(original);
        const auto found = std::find(a.begin(), end, index);
        if (found != end) {
            erase[static_cast<std::size_t>(found - a.begin())] = 1;
        } else {
            a.push_back(index);
        }
    }
    std::size_t out = 0;
    for (std::size_t i = 0; i < a.size(); ++i) {
        if (i < original && erase[i]) continue;
        a[out++] = a[i];
    }
    a.resize(out);
}

}  // namespace

void LdpcParityMatrix::GetBaseMatrix(int baseGraph, int setIndex, int z,
                                     std::vector<std::vector<int>>& base) {
    const GraphShape shape = shapeOf(baseGraph);
    checkLifting(setIndex, z);
    const auto& pattern = *shape.pattern;
    const auto& shifts = (*shape.shifts)[static_cast<std::size_t>(setIndex - 1)];
    const int patternColumns = static_cast<int>(pattern[0].size());

    base.assign(static_cast<std::size_t>(shape.rows),
                std::vector<int>(static_cast<std::size_t>(shape.columns), -1));
    for (int b = 0; b < shape.rows; ++b) {
        // A running counter walks the row's shift list as the pattern's entries come by.
        std::size_t next = 0;
        for (int c = 0; c < patternColumns; ++c) {
            if (pattern[b][c]) base[b][c] = shifts[b][next++] % z;
        }
        const int identity = shape.infoColumns + b;
        if (identity >= patternColumns) base[b][identity] = 0;
    }
}

void LdpcParityMatrix::GetNRMatrix(int baseGraph, int setIndex, int z,
                                   std::vector<std::vector<int>>& rows) {
    std::vector<std::vector<int>> base;
    GetBaseMatrix(baseGraph, setIndex, z, base);

    rows.assign(base.size() * static_cast<std::size_t>(z), {});
    for (std::size_t b = 0; b < base.size(); ++b) {
        std::vector<int> columns;
        for (std::size_t c = 0; c < base[b].size(); ++c) {
            if (base[b][c] >= 0) columns.push_back(static_cast<int>(c));
        }
        for (int r = 0; r < z; ++r) {
            auto& row = rows[b * static_cast<std::size_t>(z) + static_cast<std::size_t>(r)];
            row.reserve(columns.size());
            for (int c : columns) row.push_back(c * z + (base[b][c] + r) % z);
        }
    }
    sortToLT2(rows, z, headCorrection(baseGraph, setIndex, z));
}

void LdpcParityMatrix::inflate(std::vector<std::vector<int>> base,
                               std::vector<std::vector<int>>& h, int z) {
    if (z < 1) throw std::invalid_argument("LdpcParityMatrix::inflate: z must be positive");
    const std::size_t columns = base.empty() ? 0 : base[0].size();
    h.assign(base.size() * static_cast<std::size_t>(z),
             std::vector<int>(columns * static_cast<std::size_t>(z), 0));
    for (std::size_t b = 0; b < base.size(); ++b) {
        if (base[b].size() != columns) {
            throw std::invalid_argument("LdpcParityMatrix::inflate: base rows differ in length");
        }
        for (std::size_t c = 0; c < columns; ++c) {
            if (base[b][c] < 0) continue;
            for (int r = 0; r < z; ++r) {
                h[b * z + r][c * z + (base[b][c] + r) % z] = 1;
            }
        }
    }
}

void LdpcParityMatrix::sortToLT2(std::vector<std::vector<int>>& rows, int z, int shift) {
    if (z < 1 || rows.size() < 4 * static_cast<std::size_t>(z)) {
        throw std::invalid_argument("LdpcParityMatrix::sortToLT2: need 4 row blocks of z = " +
                                    std::to_string(z) + " rows, got " +
                                    std::to_string(rows.size()) + " rows");
    }
    if (shift < 0) {
        throw std::invalid_argument("LdpcParityMatrix::sortToLT2: shift must not be negative, got " +
                                    std::to_string(shift));
    }
    const auto uz = static_cast<std::size_t>(z);
    for (int b = 2; b >= 0; --b) {
        for (std::size_t r = 0; r < uz; ++r) {
            symmetricDifference(rows[b * uz + r], rows[(b + 1) * uz + r]);
        }
    }
    if (shift != 0) {
        std::vector<std::vector<int>> head(rows.begin(), rows.begin() + z);
        for (std::size_t r = 0; r < uz; ++r) {
            const std::size_t from = (uz - static_cast<std::size_t>(shift) % uz + r) % uz;
            rows[r] = std::move(head[from]);
        }
    }
}

}  // namespace Orvalis_NR
