#pragma once
// Sequences of the SS/PBCH block: PSS and SSS (TS 38.211 clause 7.4.2), their sidelink forms
// (TS 38.211 clause 8.4.2) and the PBCH demodulation reference signal (TS 38.211 clause
// 7.4.1.4.1).

#include <vector>

#include "coding/coding_types.h"

/// Length of a PSS or SSS.
inline constexpr int kSyncSequenceLength = 127;
/// PBCH DM-RS values of one SS/PBCH block.
inline constexpr int kPbchDmrsLength = 144;

/// PSS d(n) = 1 - 2x(m), m = (n + 43 nId2) mod 127, written as +1/-1 signed bytes into the
/// first 127 elements of `d`. nId2: 0..2 (any value from 0 up is defined). A shorter `d` or a
/// negative nId2 is reported as a library failure.
void Generate_PSS_Signal(int nId2, BitSequence& d);

/// SSS of TS 38.211 clause 7.4.2.3 as +1/-1 signed bytes into the first 127 elements of `d`.
/// nId1: 0..335, nId2: 0..2 (any values from 0 up are defined). A shorter `d` or a negative
/// identity is reported as a library failure.
void Generate_SSS_Signal(int nId1, int nId2, BitSequence& d);

/// Sidelink PSS: the PSS recurrence read at m = (n + 22 + 43 nId2) mod 127.
void Generate_S_PSS_Signal(int nId2, BitSequence& d);

/// Sidelink SSS: the same sequence as Generate_SSS_Signal.
void Generate_S_SSS_Signal(int nId1, int nId2, BitSequence& d);

/// PBCH DM-RS of TS 38.211 clause 7.4.1.4.1: 144 QPSK values into the first 144 elements of
/// `dmrs`. iSsb: 0..7, nHf: 0..1 (the half frame bit, used with Lmax 4 only), cellId: 0..1007,
/// any value from 0 up being defined, cInit taken modulo 2^31.
/// With `swapIndex` the block index is taken as nHf + 4 iSsb instead of iSsb + 4 nHf, a
/// deliberate departure from the clause that the channel selects by its name.
/// A `dmrs` shorter than 144 or a negative argument is reported as a library failure.
void Generate_PBCH_DMRS_Signal(int iSsb, int cellId, int nHf, std::vector<complex>& dmrs,
                               bool swapIndex);
