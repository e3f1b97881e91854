#pragma once
// Low-PAPR base sequences of TS 38.211 clauses 5.2.2 (type 1) and 5.2.3 (type 2), and the
// phase-rotated Zadoff-Chu form of PUCCH format 0. Each function resizes `r` to M itself.

#include <vector>

#include "coding/coding_types.h"

/// Type-1 sequence r(n) = exp(j (n alpha + phase(n))), n = 0..M-1, TS 38.211 clause 5.2.2.
/// M of 6, 12, 18, 24: phase from the table of that length (lengths 12, 18, 24 read the
/// first-edition tables while specVersion is 151); M of 30: the closed formula; M of 36 or
/// more: the Zadoff-Chu sequence of the largest prime below M with group u (0..29) and
/// base sequence number v (0, 1); any other M leaves the pure ramp n alpha.
/// alpha: cyclic shift in radians per element. `reserved` is not read.
/// Throws std::invalid_argument for negative M and std::out_of_range for u outside 0..29
/// where a table is read.
void LowPaprSequenceGenerate(std::vector<complex>& r, int M, double alpha, int reserved, int u,
                             int v);

/// Type-2 sequence, TS 38.211 clause 5.2.3: the unscaled DFT of a time sequence divided by
/// sqrt(M). The time sequence is exp(j pi phi / 8) for M of 6, the pi/2-BPSK table bits for
/// 12, 18, 24, the pi/2-BPSK of the Gold sequence of cInit for M of 30 or more, and zero for
/// any other length. `alpha`, `reserved` and `v` are not read.
void LowPapr2SequenceGenerate(std::vector<complex>& r, int M, double alpha, int reserved, int u,
                              int v, int cInit);

/// PUCCH format 0 sequence: M of 12 or 24 from the first-edition length-12 table or TS 36.211
/// Table 5.5.1.2-2, M of 36 to 1249 from the Zadoff-Chu root of the prime below M; each
/// element turned by exp(j (n + s) alpha), s = (k mod 2) delta / 2 (sign of k). Other M
/// give zeros. Throws std::out_of_range for M above 1249 or u outside 0..29 where a table is
/// read, std::invalid_argument for negative M.
void ZC_Generator(std::vector<complex>& r, int M, int k, int u, int v, double alpha, double delta);

/// False below 2, true for 2; otherwise tests the divisors 2 up to but not including
/// floor(sqrt(x)), so squares of primes (4, 9, 25, ...) and some small composites report true.
/// Kept in this form for callers outside the library; nothing inside relies on it.
bool IsPrime(int x);
