#pragma once
// Modulation mappers of TS 38.211 clause 5.1.

#include <vector>

#include "coding/coding_types.h"

/// Fills the caller's tables of 2, 4, 16, 64 and 256 points. Each table is indexed by the bits
/// of one symbol, first bit most significant; the points are the odd integers of clauses
/// 5.1.2 to 5.1.5 (BPSK 1+1j and -1-1j), scaled to unit average power when `normalise`.
/// Throws std::invalid_argument when any pointer is null.
void GetConstellation(complex* bpsk, complex* qpsk, complex* qam16, complex* qam64, complex* qam256,
                      bool normalise);

/// pi/2-BPSK, clause 5.1.1: symbol n is +-(1+j)/sqrt(2), times j for odd n; only a byte equal
/// to 1 is a bit 1. `symbols` must hold at least bits.size() elements (std::out_of_range).
void HalfPiBPSK(BitSequence& bits, std::vector<complex>& symbols);
