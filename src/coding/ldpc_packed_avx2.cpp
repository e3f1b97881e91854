// Packed LDPC encoding kernel for AVX2: 256-bit circulant slices, SIMD packing and unpacking
// of the int bit vectors. This file alone is compiled with -mavx2; it is entered only after a
// run-time check of the CPU (ldpcKernelSupported).

#include <immintrin.h>

#include "coding/ldpc_packed_kernel.h"

namespace Orvalis_NR::ldpc_detail {
namespace {

struct Avx2Ops {
    // Packs 32 ints at a time: saturating packs narrow them to bytes (0, 1 and -2 stay
    // themselves, every other value becomes a byte outside that set), one permute restores
    // the order the 128-bit lanes of the packs mixed up, and the low bits go to a movemask.
    static PackScan pack(const int* in, int n, std::uint64_t* bits) {
        const __m256i notOne = _mm256_set1_epi8(~1);
        const __m256i fillerValue = _mm256_set1_epi8(-2);
        const __m256i zero = _mm256_setzero_si256();
        const __m256i laneOrder = _mm256_setr_epi32(0, 4, 1, 5, 2, 6, 3, 7);
        __m256i valid = _mm256_set1_epi8(-1);
        __m256i filler = zero;
        const auto load = [in](int i) {
            return _mm256_loadu_si256(reinterpret_cast<const __m256i*>(in + i));
        };
        // Low bits of in[i..i+31] as a 32-bit mask; validity and fillers folded in.
        const auto pack32 = [&](int i) {
            const __m256i shorts01 = _mm256_packs_epi32(load(i), load(i + 8));
            const __m256i shorts23 = _mm256_packs_epi32(load(i + 16), load(i + 24));
            const __m256i b =
                _mm256_permutevar8x32_epi32(_mm256_packs_epi16(shorts01, shorts23), laneOrder);
            const __m256i isFiller = _mm256_cmpeq_epi8(b, fillerValue);
            const __m256i isBit = _mm256_cmpeq_epi8(_mm256_and_si256(b, notOne), zero);
            valid = _mm256_and_si256(valid, _mm256_or_si256(isBit, isFiller));
            filler = _mm256_or_si256(filler, isFiller);
            return static_cast<std::uint32_t>(_mm256_movemask_epi8(_mm256_slli_epi16(b, 7)));
        };
        const int full = n / 64;
        for (int w = 0; w < full; ++w) {
            const std::uint64_t low = pack32(64 * w);
            bits[w] = low | (std::uint64_t{pack32(64 * w + 32)} << 32);
        }
        bool bad = _mm256_movemask_epi8(valid) != -1;
        bool anyFiller = _mm256_movemask_epi8(filler) != 0;
        std::uint64_t word = 0;
        for (int i = 64 * full; i < n; ++i) {
            const int v = in[i];
            word |= static_cast<std::uint64_t>(v & 1) << (i - 64 * full);
            bad |= (v & ~1) != 0 && v != -2;
            anyFiller |= v == -2;
        }
        bits[full] = word;
        bits[full + 1] = 0;
        return {bad, anyFiller};
    }

    // Four words of rot(x, shift) from byte `base` (see the portable kernel).
    static __m256i rotated(const unsigned char* base, __m128i right, __m128i left) {
        const __m256i a = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(base));
        const __m256i b = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(base + 1));
        return _mm256_or_si256(_mm256_srl_epi64(a, right), _mm256_sll_epi64(b, left));
    }

    // Z <= 384 fits in two 256-bit slices (the plan guarantees paddedWords <= 8); both sums
    // stay in registers across the row's edges.
    static void rowXor(std::uint64_t* dst, const PackedPlanView& p, int begin, int end,
                       int skipColumn = -1) {
        const auto* columns = reinterpret_cast<const unsigned char*>(p.columns);
        const std::size_t strideBytes = static_cast<std::size_t>(p.stride) * 8;
        __m256i sum0 = _mm256_setzero_si256();
        __m256i sum1 = _mm256_setzero_si256();
        const bool two = p.paddedWords > 4;
        for (int e = begin; e < end; ++e) {
            const int c = p.edgeColumn[e];
            if (c == skipColumn) continue;
            const int shift = p.edgeShift[e];
            const unsigned char* base =
                columns + static_cast<std::size_t>(c) * strideBytes + shift / 8;
            const __m128i right = _mm_cvtsi32_si128(shift % 8);
            const __m128i left = _mm_cvtsi32_si128(8 - shift % 8);
            sum0 = _mm256_xor_si256(sum0, rotated(base, right, left));
            if (two) sum1 = _mm256_xor_si256(sum1, rotated(base + 32, right, left));
        }
        _mm256_storeu_si256(reinterpret_cast<__m256i*>(dst), sum0);
        if (two) _mm256_storeu_si256(reinterpret_cast<__m256i*>(dst + 4), sum1);
    }

    static void rotate(std::uint64_t* dst, const std::uint64_t* column, int shift, int words) {
        const auto* base = reinterpret_cast<const unsigned char*>(column) + shift / 8;
        const __m128i right = _mm_cvtsi32_si128(shift % 8);
        const __m128i left = _mm_cvtsi32_si128(8 - shift % 8);
        for (int w = 0; w < words; w += 4) {
            _mm256_storeu_si256(reinterpret_cast<__m256i*>(dst + w),
                                rotated(base + 8 * w, right, left));
        }
    }

    // One 32-bit load feeds four stores of eight ints: each lane shifts its own bit down.
    static void unpack(const std::uint64_t* v, int z, int* out) {
        const auto* bytes = reinterpret_cast<const unsigned char*>(v);
        const __m256i one = _mm256_set1_epi32(1);
        const __m256i lanes = _mm256_setr_epi32(0, 1, 2, 3, 4, 5, 6, 7);
        const __m256i step = _mm256_set1_epi32(8);
        const int full = z / 32;
        for (int g = 0; g < full; ++g) {
            std::uint32_t word;
            std::memcpy(&word, bytes + 4 * g, sizeof word);
            const __m256i all = _mm256_set1_epi32(static_cast<int>(word));
            __m256i shift = lanes;
            for (int q = 0; q < 4; ++q) {
                _mm256_storeu_si256(reinterpret_cast<__m256i*>(out + 32 * g + 8 * q),
                                    _mm256_and_si256(_mm256_srlv_epi32(all, shift), one));
                shift = _mm256_add_epi32(shift, step);
            }
        }
        for (int i = 32 * full; i < z; ++i) out[i] = (bytes[i / 8] >> (i % 8)) & 1;
    }
};

}  // namespace

bool encodePackedAvx2(const PackedPlanView& plan, int* in, int* out) {
    return runPackedPlan<Avx2Ops>(plan, IntVectors<Avx2Ops>{in, out});
}

void encodeBitsAvx2(const PackedPlanView& plan, const std::uint64_t* in, std::uint64_t* out) {
    runPackedPlan<Avx2Ops>(plan, PackedVectors{in, out});
}

}  // namespace Orvalis_NR::ldpc_detail
