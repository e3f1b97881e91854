#pragma once
// Transport block size and code rate of a shared channel as a host works them out: the MCS
// tables of TS 38.214 clauses 5.1.3.1 and 6.1.4.1 and the TBS determination of clause 5.1.3.2
// (clause 6.1.4.2 for the PUSCH refers to it).

#include <optional>

namespace nrsynth_host {

/// The MCS tables by their clause; the DL-SCH and UL-SCH enumerations map onto these.
enum class McsTable { Table51311, Table51312, Table51313, Table61411, Table61412 };

struct McsEntry {
    int modulationOrder = 0;
    double rateX1024 = 0.0;
};

/// Row `index` of `table`; rows printed with q take q = 1 when `pi2Bpsk`, else q = 2. Empty for
/// an index outside 0..31 or a reserved row.
std::optional<McsEntry> mcsEntry(McsTable table, int index, bool pi2Bpsk);

/// What the size depends on, per code word.
struct TransportBlockInput {
    int resourceBlocks = 0;
    int symbols = 0;          // N_symb^sh, the scheduled symbols of the slot
    int dmrsPerPrb = 0;       // N_DMRS^PRB, DM-RS and DM-RS CDM groups without data
    int overheadPerPrb = 0;   // N_oh^PRB, xOverhead
    int layers = 1;           // v
    double scaling = 1.0;     // S of TS 38.214 Table 5.1.3.2-2
    McsEntry mcs;
};

/// N_RE of TS 38.214 clause 5.1.3.2: min(156, N'_RE) x n_PRB, N'_RE never below 0.
int resourceElements(const TransportBlockInput& input);

/// TBS of TS 38.214 clause 5.1.3.2; 0 when N_info is not positive.
int transportBlockSize(const TransportBlockInput& input);

}  // namespace nrsynth_host
