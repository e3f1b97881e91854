#pragma once
// Internal to the packed LDPC encoder. The kernels see the plan as plain pointers and use no
// standard-library templates, because one of them is compiled for AVX2 in a file of its own:
// anything inline shared with the portable code could otherwise be emitted with AVX2
// instructions and picked by the linker for machines without them.
//
// Bit vectors: bit i of a Z-bit circulant vector is bit (i % 64) of word i / 64. A column
// buffer holds its vector periodically (bit t = x[t mod Z]) far enough that the cyclic shift
// rot(x, h)[r] = x[(r + h) mod Z] is a plain unaligned read starting at bit h.

#include <cstdint>
#include <bit>
#include <cstddef>
#include <cstring>

#include "common/packed_bits.h"

namespace Orvalis_NR::ldpc_detail {

static_assert(std::endian::native == std::endian::little,
              "the packed kernels read bit vectors as bytes and words alike");

/// One LDPC encoding plan for a (base graph, Z) and its workspace.
struct PackedPlanView {
    int z;           // lifting size
    int kb;          // information columns (22 or 10)
    int rows;        // base graph rows (46 or 42)
    int words;       // 64-bit words of one Z-bit vector
    int paddedWords; // words rounded up to a multiple of 4 (vector width of the AVX2 kernel)
    int stride;      // 64-bit words of one periodic column buffer
    int p0Rotation;  // rotation that turns the sum of the four head rows into p0
    const int* rowBegin;      // rows + 1 offsets into the edge arrays
    const int* rowInfoEnd;    // per row: end of its information-column edges
    const int* edgeColumn;    // base column of each edge (< kb + 4)
    const int* edgeShift;     // its shift, already reduced modulo z
    const int* stepRow;       // the head rows that give p1, p2, p3, in solving order
    const int* stepColumn;    // the parity column each of them gives
    const int* stepRotation;  // rotation undoing the shift of that column in that row
    std::uint64_t* columns;   // kb + 5 periodic buffers: information, p0..p3, scratch
    std::uint64_t* packed;    // the K input bits and two spare words
    std::uint64_t* acc;       // 6 vectors of paddedWords words
};

bool encodePackedPortable(const PackedPlanView& plan, int* in, int* out);
bool encodePackedAvx2(const PackedPlanView& plan, int* in, int* out);
void encodeBitsPortable(const PackedPlanView& plan, const std::uint64_t* in, std::uint64_t* out);
void encodeBitsAvx2(const PackedPlanView& plan, const std::uint64_t* in, std::uint64_t* out);

namespace {

struct PackScan {
    bool bad;     // a value other than 0, 1 and -2
    bool filler;  // a -2 somewhere
};

inline std::uint64_t load64(const unsigned char* p) {
    std::uint64_t v;
    std::memcpy(&v, p, sizeof v);
    return v;
}

inline void clearTail(std::uint64_t* v, int z, int words) {
    if (z % 64) v[z / 64] &= (std::uint64_t{1} << (z % 64)) - 1;
    for (int w = (z + 63) / 64; w < words; ++w) v[w] = 0;
}

// z bits of `src` from bit `offset` into v (clean above z).
inline void extractBits(const std::uint64_t* src, int offset, int z, std::uint64_t* v,
                        int words) {
    const int first = offset / 64;
    const int shift = offset % 64;
    const int used = (z + 63) / 64;
    for (int w = 0; w < used; ++w) {
        const std::uint64_t lo = src[first + w];
        v[w] = shift ? (lo >> shift) | (src[first + w + 1] << (64 - shift)) : lo;
    }
    clearTail(v, z, words);
}

// Repeats the clean z-bit vector v through the whole column buffer.
inline void fillPeriodic(std::uint64_t* column, int stride, const std::uint64_t* v, int z) {
    const int used = (z + 63) / 64;
    if (z >= 64) {
        // From bit z on, every word repeats the 64 bits found z bits earlier, all of which
        // are final by then; no read-modify-write passes.
        const int whole = z / 64;
        const int rest = z % 64;
        for (int w = 0; w < whole && w < stride; ++w) column[w] = v[w];
        if (rest && whole < stride) column[whole] = v[whole] | (column[0] << rest);
        for (int w = used; w < stride; ++w) {
            const int from = 64 * w - z;
            const int q = from / 64;
            const int s = from % 64;
            column[w] = s ? (column[q] >> s) | (column[q + 1] << (64 - s)) : column[q];
        }
        return;
    }
    for (int w = 0; w < stride; ++w) column[w] = 0;
    for (int pos = 0; pos < stride * 64; pos += z) {
        const int q = pos / 64;
        const int s = pos % 64;
        for (int w = 0; w < used && q + w < stride; ++w) {
            column[q + w] |= v[w] << s;
            if (s && q + w + 1 < stride) column[q + w + 1] |= v[w] >> (64 - s);
        }
    }
}

// Inputs and outputs as int vectors (one value per bit, -2 for a filler). load packs the
// input and writes the systematic output; it returns false, touching nothing, when the input
// holds a value other than 0, 1 or -2, or a -2 among the first 2Z bits: those inputs take the
// list form, which defines what they give.
template <class Ops>
struct IntVectors {
    int* in;
    int* out;

    bool load(const PackedPlanView& p) {
        const int z = p.z;
        const int k = p.kb * z;
        const PackScan scan = Ops::pack(in, k, p.packed);
        if (scan.bad) return false;
        if (scan.filler) {
            for (int i = 0; i < 2 * z; ++i) {
                if (in[i] == -2) return false;
            }
        }
        // Systematic output, fillers marked; from here on a filler reads as 0 (its packed bit
        // already is 0, since -2 is even).
        std::memcpy(out, in + 2 * z, sizeof(int) * static_cast<std::size_t>(k - 2 * z));
        if (scan.filler) {
            for (int i = 2 * z; i < k; ++i) {
                if (in[i] == -2) in[i] = 0;
            }
        }
        return true;
    }
    // Parity vector v (z bits) at parity bit `at` of the output.
    void parity(const PackedPlanView& p, const std::uint64_t* v, int at) {
        Ops::unpack(v, p.z, out + (p.kb - 2) * p.z + at);
    }
};

// Inputs and outputs packed (see packed_bits.h): K input bits with fillers already 0, N output
// bits (the input from bit 2Z on, then the parity).
struct PackedVectors {
    const std::uint64_t* in;
    std::uint64_t* out;

    bool load(const PackedPlanView& p) {
        const int k = p.kb * p.z;
        const int used = (k + 63) / 64;
        std::memcpy(p.packed, in, sizeof(std::uint64_t) * static_cast<std::size_t>(used));
        if (k % 64) p.packed[used - 1] &= (std::uint64_t{1} << (k % 64)) - 1;
        for (int w = used; w <= k / 64 + 1; ++w) p.packed[w] = 0;  // the spare words, as pack leaves them
        copyBits(out, 0, in, static_cast<std::size_t>(2 * p.z), static_cast<std::size_t>(k - 2 * p.z));
        return true;
    }
    void parity(const PackedPlanView& p, const std::uint64_t* v, int at) {
        copyBits(out, static_cast<std::size_t>((p.kb - 2) * p.z + at), v, 0, static_cast<std::size_t>(p.z));
    }
};

// The encoding schedule, shared by the kernels; Ops supplies the row sums of rotated columns,
// Io the input and output forms.
template <class Ops, class Io>
bool runPackedPlan(const PackedPlanView& p, Io io) {
    if (!io.load(p)) return false;
    const int z = p.z;

    const auto column = [&](int c) { return p.columns + static_cast<std::size_t>(c) * p.stride; };
    const auto vec = [&](int i) { return p.acc + static_cast<std::size_t>(i) * p.paddedWords; };
    std::uint64_t* work = vec(4);
    std::uint64_t* parity = vec(5);
    std::uint64_t* scratch = column(p.kb + 4);

    for (int c = 0; c < p.kb; ++c) {
        extractBits(p.packed, c * z, z, work, p.paddedWords);
        fillPeriodic(column(c), p.stride, work, z);
    }

    // Head rows: information part of each, then p0 from their sum.
    for (int b = 0; b < 4; ++b) {
        Ops::rowXor(vec(b), p, p.rowBegin[b], p.rowInfoEnd[b]);
        clearTail(vec(b), z, p.paddedWords);
    }
    for (int w = 0; w < p.paddedWords; ++w) work[w] = vec(0)[w] ^ vec(1)[w] ^ vec(2)[w] ^ vec(3)[w];
    if (p.p0Rotation) {
        fillPeriodic(scratch, p.stride, work, z);
        Ops::rotate(parity, scratch, p.p0Rotation, p.paddedWords);
        clearTail(parity, z, p.paddedWords);
    } else {
        std::memcpy(parity, work, sizeof(std::uint64_t) * p.paddedWords);
    }
    fillPeriodic(column(p.kb), p.stride, parity, z);
    io.parity(p, parity, 0);

    // p1..p3, each from a head row whose other parity columns are known by then.
    for (int t = 0; t < 3; ++t) {
        const int b = p.stepRow[t];
        const int j = p.stepColumn[t];
        Ops::rowXor(work, p, p.rowInfoEnd[b], p.rowBegin[b + 1], j);
        for (int w = 0; w < p.paddedWords; ++w) work[w] ^= vec(b)[w];
        clearTail(work, z, p.paddedWords);
        if (p.stepRotation[t]) {
            fillPeriodic(scratch, p.stride, work, z);
            Ops::rotate(parity, scratch, p.stepRotation[t], p.paddedWords);
            clearTail(parity, z, p.paddedWords);
        } else {
            std::memcpy(parity, work, sizeof(std::uint64_t) * p.paddedWords);
        }
        fillPeriodic(column(j), p.stride, parity, z);
        io.parity(p, parity, (j - p.kb) * z);
    }

    // Extension rows: one parity block each, from information and head parity columns.
    for (int b = 4; b < p.rows; ++b) {
        Ops::rowXor(work, p, p.rowBegin[b], p.rowBegin[b + 1]);
        io.parity(p, work, b * z);
    }
    return true;
}

}  // namespace
}  // namespace Orvalis_NR::ldpc_detail
