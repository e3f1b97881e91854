#include "coding/ldpc_tables.h"

#include <cstddef>

#include "tables/ldpc_base_graphs.h"

namespace Orvalis_NR {
namespace {

// Pattern widths: the core columns plus the first extension identities; rows whose identity
// column lies past the pattern get it from the parity-matrix builder.
constexpr int kBg1PatternColumns = 27;
constexpr int kBg2PatternColumns = 17;

std::vector<std::vector<int>> liftingSets() {
    std::vector<std::vector<int>> sets;
    for (const auto& set : tables::kLdpcLiftingSets) {
        sets.emplace_back(set.sizes.begin(), set.sizes.begin() + set.count);
    }
    return sets;
}

template <std::size_t Count>
std::vector<std::vector<int>> pattern(const std::array<tables::LdpcBaseGraphEntry, Count>& entries,
                                      int rows, int columns) {
    std::vector<std::vector<int>> p(rows, std::vector<int>(columns, 0));
    for (const auto& e : entries) {
        if (e.column < columns) p[e.row][e.column] = 1;
    }
    return p;
}

template <std::size_t Count>
std::vector<std::vector<std::vector<int>>> shifts(
    const std::array<tables::LdpcBaseGraphEntry, Count>& entries, int rows, int columns) {
    std::vector<std::vector<std::vector<int>>> s(8, std::vector<std::vector<int>>(rows));
    // The generated entries are in row order with ascending columns.
    for (const auto& e : entries) {
        if (e.column >= columns) continue;
        for (int set = 0; set < 8; ++set) s[set][e.row].push_back(e.shift[set]);
    }
    return s;
}

}  // namespace

const std::vector<std::vector<int>> LiftingSizeSets = liftingSets();
const std::vector<std::vector<int>> BaseGraph1Pattern =
    pattern(tables::kLdpcBg1Entries, tables::kLdpcBg1Rows, kBg1PatternColumns);
const std::vector<std::vector<int>> BaseGraph2Pattern =
    pattern(tables::kLdpcBg2Entries, tables::kLdpcBg2Rows, kBg2PatternColumns);
const std::vector<std::vector<std::vector<int>>> BaseGraph1Shifts =
    shifts(tables::kLdpcBg1Entries, tables::kLdpcBg1Rows, kBg1PatternColumns);
const std::vector<std::vector<std::vector<int>>> BaseGraph2Shifts =
    shifts(tables::kLdpcBg2Entries, tables::kLdpcBg2Rows, kBg2PatternColumns);

}  // namespace Orvalis_NR
