#include "coding/crc.h"

#include <array>
#include <bit>
#include <cstdint>
#include <cstring>
#include <stdexcept>
#include <string>

namespace {

// The register is kept left-aligned in 32 bits: bit 31 is the bit that shifts out next. That
// lets one byte-wide table serve every length from 1 to 32, and shifting a one-bit register by
// one step is the D = 2R, subtract T, XOR P rule of TS 38.212 clause 5.1.
using Table = std::array<std::uint32_t, 256>;

struct Polynomial {
    int length;
    std::uint32_t pattern;  // without the leading term
};

constexpr std::array<Polynomial, 6> kPolynomials{{
    {24, 0x864CFB},  // gCRC24A
    {24, 0x800063},  // gCRC24B
    {24, 0xB2B117},  // gCRC24C
    {16, 0x1021},    // gCRC16
    {11, 0x621},     // gCRC11
    {6, 0x21},       // gCRC6
}};

constexpr Polynomial polynomialOf(CRC_LengthEnumList type) {
    const int index = static_cast<int>(type);
    return (index >= 0 && index < 6) ? kPolynomials[static_cast<std::size_t>(index)]
                                     : kPolynomials[0];
}

constexpr std::uint32_t lowBits(std::uint64_t value, int length) {
    return static_cast<std::uint32_t>(value & ((std::uint64_t{1} << length) - 1));
}

constexpr Table makeTable(std::uint32_t alignedPattern) {
    Table table{};
    for (std::uint32_t i = 0; i < 256; ++i) {
        std::uint32_t reg = i << 24;
        for (int b = 0; b < 8; ++b)
            reg = (reg & 0x80000000u) ? (reg << 1) ^ alignedPattern : reg << 1;
        table[i] = reg;
    }
    return table;
}

constexpr std::array<Table, 6> kTables = [] {
    std::array<Table, 6> tables{};
    for (std::size_t i = 0; i < kPolynomials.size(); ++i)
        tables[i] = makeTable(kPolynomials[i].pattern << (32 - kPolynomials[i].length));
    return tables;
}();

static_assert(std::endian::native == std::endian::little,
              "bit packing assumes little-endian bytes");

// Eight one-byte-per-bit inputs packed into one byte, first input most significant; any
// non-zero input byte is a 1.
inline std::uint8_t packEight(const char* in) {
    std::uint64_t w;
    std::memcpy(&w, in, 8);
    w |= w >> 4;
    w |= w >> 2;
    w |= w >> 1;
    w &= 0x0101010101010101ull;
    // Gathers bit 0 of byte k (little-endian) into bit 7-k of the top byte; no two partial
    // products land on the same bit, so nothing carries.
    return static_cast<std::uint8_t>((w * 0x8040201008040201ull) >> 56);
}

// Runs the left-aligned register over nBits input bits and writes the L-bit check.
void runRegister(int length, std::uint32_t pattern, std::uint32_t preset, int nBits,
                 const char* input, char* output, const Table* table) {
    const int align = 32 - length;
    const std::uint32_t alignedPattern = pattern << align;
    std::uint32_t reg = preset << align;
    int i = 0;
    if (table != nullptr) {
        for (; i + 8 <= nBits; i += 8)
            reg = (reg << 8) ^ (*table)[(reg >> 24) ^ packEight(input + i)];
    }
    for (; i < nBits; ++i) {
        const bool shiftedOut = (reg & 0x80000000u) != 0;
        reg <<= 1;
        if (shiftedOut != (input[i] != 0)) reg ^= alignedPattern;
    }
    for (int k = 0; k < length; ++k) output[k] = static_cast<char>((reg >> (31 - k)) & 1u);
}

// Slicing tables: slice k advances the register over a byte followed by k zero bytes.
using SliceTables = std::array<Table, 8>;

constexpr std::array<SliceTables, 6> kSlices = [] {
    std::array<SliceTables, 6> slices{};
    for (std::size_t p = 0; p < kTables.size(); ++p) {
        slices[p][0] = kTables[p];
        for (std::size_t k = 1; k < 8; ++k)
            for (std::size_t i = 0; i < 256; ++i) {
                const std::uint32_t prior = slices[p][k - 1][i];
                slices[p][k][i] = (prior << 8) ^ kTables[p][prior >> 24];
            }
    }
    return slices;
}();

// Packed words hold the first bit in bit 0; the register wants it in bit 7 of the first byte.
inline std::uint64_t reverseBitsInBytes(std::uint64_t v) {
    v = ((v >> 1) & 0x5555555555555555ull) | ((v & 0x5555555555555555ull) << 1);
    v = ((v >> 2) & 0x3333333333333333ull) | ((v & 0x3333333333333333ull) << 2);
    return ((v >> 4) & 0x0F0F0F0F0F0F0F0Full) | ((v & 0x0F0F0F0F0F0F0F0Full) << 4);
}

}  // namespace

std::uint32_t PackedCrc(CRC_LengthEnumList type, const std::uint64_t* words, std::size_t nBits) {
    const int index = static_cast<int>(type);
    const std::size_t p = (index >= 0 && index < 6) ? static_cast<std::size_t>(index) : 0;
    const Polynomial poly = kPolynomials[p];
    const SliceTables& t = kSlices[p];
    const std::uint32_t alignedPattern = poly.pattern << (32 - poly.length);
    std::uint32_t reg = 0;
    const std::size_t whole = nBits / 64;
    for (std::size_t w = 0; w < whole; ++w) {
        // Byte k of the word is byte k of the stream: big-endian order puts the first on top.
        const std::uint64_t x = __builtin_bswap64(reverseBitsInBytes(words[w]));
        const std::uint32_t hi = static_cast<std::uint32_t>(x >> 32) ^ reg;
        const std::uint32_t lo = static_cast<std::uint32_t>(x);
        reg = t[7][hi >> 24] ^ t[6][(hi >> 16) & 0xFFu] ^ t[5][(hi >> 8) & 0xFFu] ^ t[4][hi & 0xFFu] ^
              t[3][lo >> 24] ^ t[2][(lo >> 16) & 0xFFu] ^ t[1][(lo >> 8) & 0xFFu] ^ t[0][lo & 0xFFu];
    }
    if (nBits % 64 != 0) {
        const std::uint64_t last = words[whole];
        const std::size_t rest = nBits % 64;
        std::size_t b = 0;
        for (; b + 8 <= rest; b += 8) {
            const auto byte = static_cast<std::uint32_t>(reverseBitsInBytes(last >> b) & 0xFFu);
            reg = (reg << 8) ^ t[0][(reg >> 24) ^ byte];
        }
        for (; b < rest; ++b) {
            const bool shiftedOut = (reg & 0x80000000u) != 0;
            reg <<= 1;
            if (shiftedOut != (((last >> b) & 1u) != 0)) reg ^= alignedPattern;
        }
    }
    return reg >> (32 - poly.length);
}

int CrcLength(CRC_LengthEnumList type) {
    return polynomialOf(type).length;
}

bool NR_CRC(CRC_LengthEnumList type, int nBits, BitSequence input, BitSequence& crc) {
    return NR_CRC(type, nBits, std::move(input), crc, 0);
}

bool NR_CRC(CRC_LengthEnumList type, int nBits, BitSequence input, BitSequence& crc,
            int initialState) {
    const Polynomial poly = polynomialOf(type);
    if (nBits <= 0 || input.size() < static_cast<std::size_t>(nBits) ||
        crc.size() != static_cast<std::size_t>(poly.length))
        return false;
    const int index = static_cast<int>(type);
    const Table& table = kTables[(index >= 0 && index < 6) ? static_cast<std::size_t>(index) : 0];
    runRegister(poly.length, poly.pattern,
                lowBits(static_cast<std::uint32_t>(initialState), poly.length), nBits, input.data(),
                crc.data(), &table);
    return true;
}

void CRC(int length, int polynomial, int initialState, int nBits, char* input, char* output) {
    if (length < 1 || length > 32)
        throw std::invalid_argument("CRC: length must be 1..32, got " + std::to_string(length));
    if (output == nullptr) throw std::invalid_argument("CRC: output is null");
    if (nBits > 0 && input == nullptr) throw std::invalid_argument("CRC: input is null");
    const std::uint32_t pattern = lowBits(static_cast<std::uint32_t>(polynomial), length);
    // A table pays for its 2048 register steps only on long inputs.
    Table table{};
    const bool useTable = nBits >= 4096;
    if (useTable) table = makeTable(pattern << (32 - length));
    runRegister(length, pattern, lowBits(static_cast<std::uint32_t>(initialState), length),
                nBits > 0 ? nBits : 0, input, output, useTable ? &table : nullptr);
}
