// Packed LDPC encoding kernel in plain C++: 64-bit words, any CPU.

#include <array>

#include "coding/ldpc_packed_kernel.h"

namespace Orvalis_NR::ldpc_detail {
namespace {

// Byte value -> its eight bits as ints, least significant first.
constexpr auto kByteBits = [] {
    std::array<std::array<int, 8>, 256> table{};
    for (int v = 0; v < 256; ++v) {
        for (int j = 0; j < 8; ++j) table[v][j] = (v >> j) & 1;
    }
    return table;
}();

struct PortableOps {
    // Valid values are -2, 0, 1: u = v + 2 is 0, 2 or 3. Anything at or above 4 sets a high
    // bit of `high`; -1 (u = 1) is counted apart.
    static PackScan pack(const int* in, int n, std::uint64_t* bits) {
        unsigned high = 0;
        unsigned minusOne = 0;
        unsigned filler = 0;
        const auto scan = [&](int v) {
            const unsigned u = static_cast<unsigned>(v) + 2u;
            high |= u & ~3u;
            minusOne |= u == 1u;
            filler |= u == 0u;
        };
        const int full = n / 8;
        auto* bytes = reinterpret_cast<unsigned char*>(bits);
        for (int g = 0; g < full; ++g) {
            const int* chunk = in + 8 * g;
            unsigned byte = 0;
            for (int j = 0; j < 8; ++j) {
                byte |= static_cast<unsigned>(chunk[j] & 1) << j;
                scan(chunk[j]);
            }
            bytes[g] = static_cast<unsigned char>(byte);
        }
        unsigned byte = 0;
        for (int i = 8 * full; i < n; ++i) {
            byte |= static_cast<unsigned>(in[i] & 1) << (i - 8 * full);
            scan(in[i]);
        }
        // Clear the rest of the last word and the spare words after it.
        const int lastWord = n / 64;
        for (int b = full; b < 8 * (lastWord + 2); ++b) bytes[b] = 0;
        if (n % 8) bytes[full] = static_cast<unsigned char>(byte);
        return {high != 0 || minusOne != 0, filler != 0};
    }

    // Word w of rot(x, shift), read from the periodic buffer as two overlapping unaligned
    // loads: bits shift + 64w .. are split into a byte offset and a 0..7 bit remainder.
    static std::uint64_t rotatedWord(const unsigned char* base, int rest, int w) {
        return (load64(base + 8 * w) >> rest) | (load64(base + 8 * w + 1) << (8 - rest));
    }

    static void rowXor(std::uint64_t* dst, const PackedPlanView& p, int begin, int end,
                       int skipColumn = -1) {
        for (int w = 0; w < p.words; ++w) {
            std::uint64_t sum = 0;
            for (int e = begin; e < end; ++e) {
                const int c = p.edgeColumn[e];
                if (c == skipColumn) continue;
                const auto* base = reinterpret_cast<const unsigned char*>(
                                       p.columns + static_cast<std::size_t>(c) * p.stride) +
                                   p.edgeShift[e] / 8;
                sum ^= rotatedWord(base, p.edgeShift[e] % 8, w);
            }
            dst[w] = sum;
        }
    }

    static void rotate(std::uint64_t* dst, const std::uint64_t* column, int shift, int words) {
        const auto* base = reinterpret_cast<const unsigned char*>(column) + shift / 8;
        for (int w = 0; w < words; ++w) dst[w] = rotatedWord(base, shift % 8, w);
    }

    static void unpack(const std::uint64_t* v, int z, int* out) {
        const auto* bytes = reinterpret_cast<const unsigned char*>(v);
        const int full = z / 8;
        for (int g = 0; g < full; ++g) {
            std::memcpy(out + 8 * g, kByteBits[bytes[g]].data(), sizeof(int) * 8);
        }
        for (int i = 8 * full; i < z; ++i) out[i] = (bytes[i / 8] >> (i % 8)) & 1;
    }
};

}  // namespace

bool encodePackedPortable(const PackedPlanView& plan, int* in, int* out) {
    return runPackedPlan<PortableOps>(plan, IntVectors<PortableOps>{in, out});
}

void encodeBitsPortable(const PackedPlanView& plan, const std::uint64_t* in, std::uint64_t* out) {
    runPackedPlan<PortableOps>(plan, PackedVectors{in, out});
}

}  // namespace Orvalis_NR::ldpc_detail
