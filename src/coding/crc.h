#pragma once
// Cyclic redundancy check of TS 38.212 clause 5.1.

#include <cstddef>
#include <cstdint>

#include "coding/coding_types.h"

/// Length L in bits of the check selected by `type` (24, 16, 11 or 6; unknown values give 24).
int CrcLength(CRC_LengthEnumList type);

/// Check over the first `nBits` of `input`, register preset 0. See the five-argument form.
bool NR_CRC(CRC_LengthEnumList type, int nBits, BitSequence input, BitSequence& crc);

/// Check over the first `nBits` of `input` (any non-zero element counts as 1), written most
/// significant bit first into `crc`, which must already hold exactly L elements.
/// initialState: whole preset of the L-bit register (the DCI's leading ones are preset
/// 3334721 for CRC_24C); only its low L bits are used.
/// Returns false and leaves `crc` untouched unless nBits > 0, input.size() >= nBits and
/// crc.size() == L.
bool NR_CRC(CRC_LengthEnumList type, int nBits, BitSequence input, BitSequence& crc,
            int initialState);

/// The raw register over plain arrays: `length` 1..32 bits, `polynomial` masked to its low
/// `length` bits (leading term implied), `nBits` input bits, `length` output bits MSB first.
/// Throws std::invalid_argument for a length outside 1..32 or a null array with work to do.
void CRC(int length, int polynomial, int initialState, int nBits, char* input, char* output);

/// The check selected by `type` over `nBits` packed bits (bit i in bit i % 64 of word i / 64),
/// register preset 0: the L-bit value whose most significant bit is the first check bit.
/// Eight bytes per step through slicing tables.
std::uint32_t PackedCrc(CRC_LengthEnumList type, const std::uint64_t* words, std::size_t nBits);
