#pragma once
// Bit vectors packed into 64-bit words, first bit least significant: bit i is bit i % 64 of
// word i / 64. The coding chain keeps transport blocks, code blocks and coded bits this way.
// Only out-of-line functions here: the AVX2 kernels include this header too.

#include <cstddef>
#include <cstdint>

namespace Orvalis_NR {

/// Words that hold `bits` bits.
constexpr std::size_t packedWords(std::size_t bits) { return (bits + 63) / 64; }

/// Copies n bits from `from` at bit `fromBit` to `to` at bit `toBit`; the bits of `to`
/// outside [toBit, toBit + n) are kept. Reads only words that hold source bits.
void copyBits(std::uint64_t* to, std::size_t toBit, const std::uint64_t* from, std::size_t fromBit,
              std::size_t n);

/// Inverts bits [begin, end).
void flipBits(std::uint64_t* words, std::size_t begin, std::size_t end);

/// Clears bits [begin, end).
void clearBits(std::uint64_t* words, std::size_t begin, std::size_t end);

/// n one-bit values (any non-zero value is 1) packed from bit 0 of `to`; the bits after them
/// up to the end of their last word are cleared.
void packBits(const char* from, std::size_t n, std::uint64_t* to);
void packBits(const int* from, std::size_t n, std::uint64_t* to);

/// n bits from bit `fromBit` as one value (0 or 1) per element.
void unpackBits(const std::uint64_t* from, std::size_t fromBit, std::size_t n, char* to);
void unpackBits(const std::uint64_t* from, std::size_t fromBit, std::size_t n, int* to);

}  // namespace Orvalis_NR
