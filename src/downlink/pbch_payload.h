#pragma once
// PBCH payload generation of TS 38.212 clause 7.1.1: the eight timing bits after the payload,
// and the payload interleaver with the scrambling mask of clause 7.1.2 laid over its output.

#include <vector>

#include "coding/coding_types.h"

/// Writes the eight timing bits a(A)..a(A+7) after the first `payloadLength` (A) bits of
/// `payload`: SFN bits 3, 2, 1, 0; the half frame bit `hrf`; then for `lmax` 64 bits 5, 4, 3 of
/// `ssbIndex`, otherwise bit 4 of `kSsb` (the MSB of k_SSB) and two zeros.
/// `payload` must hold A + 8 elements, else std::out_of_range is thrown.
void Generate_PBCH_Payload(BitSequence& payload, int payloadLength, int sfn, int hrf, int ssbIndex,
                           int lmax, int kSsb);

/// Where each of the A + 8 bits of a PBCH payload goes, and which interleaved positions the
/// first scrambling covers.
struct PbchInterleaving {
    std::vector<int> destination;  ///< A + 8 entries: interleaved position of payload bit k
    BitSequence scrambleMask;      ///< A + 8 entries, by interleaved position: 1 = scrambled
};

/// The interleaver of TS 38.212 clause 7.1.1 for an A-bit payload (`payloadLength`) with the
/// pattern `table` (Table 7.1.1-1, 32 entries), walked with three running indices: the SFN bits
/// (payload bits 1..6 and the four appended SFN bits) from entry 0, the half frame bit at entry
/// 10, the three bits after it from entry 11, all others from entry 14. Unscrambled are SFN
/// bits 2 and 1, the half frame bit and, for `lmax` 64, the three block index bits.
/// The table fits A = 24 only; a payload it cannot place throws std::out_of_range.
PbchInterleaving GetPbchInterleaving(int payloadLength, int lmax, const std::vector<int>& table);
