#pragma once
// Candidate SS/PBCH blocks of a half frame, TS 38.213 clause 4.1: the first OFDM symbol of each
// candidate block, counted from the start of the half frame in symbols of the block's
// subcarrier spacing.

#include <vector>

#include "coding/coding_types.h"

/// First-symbol alternative of the 30 kHz pattern: Option0 is Case B ({4, 8, 16, 20} + 28n),
/// Option1 is Case C ({2, 8} + 14n).
enum SSOption30K_EnumList : int {
    SSOption30K_Option0 = 0,
    SSOption30K_Option1 = 1,
};

/// The candidate first symbols for numerology `mu` (0, 1, 3 or 4): 8 values for mu 0 and 1,
/// 64 for mu 3 and 4, none for any other mu. `ssb30kOption` (1 selects Case C) matters for
/// mu 1 only.
std::vector<int> GetSSBCandidateSymbols(int mu, int ssb30kOption);

/// Marks the first symbol of each of the `lmax` candidate blocks in a half frame of subcarrier
/// spacing `scs` (0 = 15 kHz .. 4 = 240 kHz) and cyclic prefix `cp`: `flags` is resized to the
/// symbols of half a frame and holds 1 at each first symbol, else 0. Known pairings: scs 0 with
/// lmax 4 or 8; scs 1 with lmax 4 or 8 and option 0 or 1; scs 3 or 4 with lmax 64. Any other
/// pairing returns false and leaves `flags` as it was.
bool Gen_SSflag_HalfFrame(int lmax, int scs, SSOption30K_EnumList option, CP_TypeEnumList cp,
                          BitSequence& flags);
