#pragma once
// The LDPC tables of TS 38.212 clause 5.3.2 in the form the parity-matrix builder reads:
// presence patterns and per-row shift lists, built once at load from src/tables/.

#include <vector>

namespace Orvalis_NR {

/// TS 38.212 Table 5.3.2-1: entry i holds the lifting sizes of set index i + 1 (iLS = i).
extern const std::vector<std::vector<int>> LiftingSizeSets;

/// Where Table 5.3.2-2 (base graph 1) has an entry: 46 rows of 27 columns, 1 or 0. The
/// identity entries of the extension columns past the pattern are implied.
extern const std::vector<std::vector<int>> BaseGraph1Pattern;
/// Where Table 5.3.2-3 (base graph 2) has an entry: 42 rows of 17 columns, 1 or 0.
extern const std::vector<std::vector<int>> BaseGraph2Pattern;

/// BaseGraph1Shifts[iLS][row]: V_ij of the row's pattern entries, in column order.
extern const std::vector<std::vector<std::vector<int>>> BaseGraph1Shifts;
/// BaseGraph2Shifts[iLS][row]: V_ij of the row's pattern entries, in column order.
extern const std::vector<std::vector<std::vector<int>>> BaseGraph2Shifts;

}  // namespace Orvalis_NR
