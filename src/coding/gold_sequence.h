#pragma once
// Pseudo-random (length-31 Gold) sequence c(n) of TS 38.211 clause 5.2.1, Nc = 1600.

#include <cstdint>
#include <vector>

#include "coding/coding_types.h"

/// c[0..n-1] = sequence elements 0..n-1 for the initialisation cInit (taken modulo 2^31).
/// `c` must already hold at least n elements; throws std::out_of_range when it does not.
/// Nothing is written for n <= 0.
void PN_Generator(BitSequence& c, int n, int cInit);

/// c[i] = sequence element offset + i for i in 0..n-1 (element k follows 1600 + k register
/// steps). Returns false with `c` untouched when c.size() differs from n; returns true at
/// once when n + 1600 + offset is below 1. With offset below -1600 only the elements that
/// exist are written: c[i] for i >= -(1600 + offset).
bool PN_Generator(BitSequence& c, int n, int cInit, int offset);

/// The same elements 0..n-1 as the three-argument form, packed: element i is bit i % 64 of
/// words[i / 64]; bits past n in the last word are 0. `words` must already hold (n + 63) / 64
/// words; throws std::out_of_range when it does not. Nothing is written for n <= 0.
void PN_GeneratorWords(std::vector<std::uint64_t>& words, int n, int cInit);
