#pragma once
// Transport block size of TS 38.214 clause 5.1.3.2, in the form TS 38.212 clause 5.4.2.1 uses
// for the limited-buffer rate matching (TBS_LBRM).

namespace Orvalis_NR {

/// TBS for `prbs` resource blocks (N_RE from the PRB band: 4992 below 33 up to 42588 from
/// 218), `a` the modulation order and `b` the layer count (callers give 8 and 4), coding rate
/// 948/1024. Above 8424 bits the caller's code block count `blocks` rounds the size. Always
/// true; a library failure when N_info is not a positive int, or when `blocks` is not
/// positive where it is needed.
bool DeterminationTransportBlockSize(int& tbs, int blocks, int a, int b, int prbs);

/// The N_info <= 3824 step of TS 38.214 clause 5.1.3.2: quantise N_info (> 0) and take the
/// first entry of Table 5.1.3.2-1 at or above it; -1 past the table's end.
int TbsFromTable(int nInfo);

}  // namespace Orvalis_NR
