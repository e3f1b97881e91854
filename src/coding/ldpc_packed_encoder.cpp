#include "coding/ldpc_packed_encoder.h"

#include <map>
#include <stdexcept>
#include <string>

#include "coding/ldpc_packed_kernel.h"

namespace Orvalis_NR {

bool ldpcKernelSupported(LdpcKernel kernel) {
    switch (kernel) {
        case LdpcKernel::List:
        case LdpcKernel::Portable:
            return true;
        case LdpcKernel::Avx2:
#if defined(NRSYNTH_HAVE_AVX2_KERNELS)
        {
            static const bool hasAvx2 = [] {
                __builtin_cpu_init();
                return __builtin_cpu_supports("avx2") != 0;
            }();
            return hasAvx2;
        }
#else
            return false;
#endif
    }
    return false;
}

LdpcKernel ldpcPreferredKernel() {
    static const LdpcKernel preferred =
        ldpcKernelSupported(LdpcKernel::Avx2) ? LdpcKernel::Avx2 : LdpcKernel::Portable;
    return preferred;
}

void LdpcPackedEncoder::Build(const std::vector<std::vector<int>>& base, int kb, int z) {
    if (z < 2 || z > 384) {
        throw std::invalid_argument("LdpcPackedEncoder: z must be 2..384, got " +
                                    std::to_string(z));
    }
    const int rows = static_cast<int>(base.size());
    if (rows < 4 || static_cast<int>(base[0].size()) < kb + rows) {
        throw std::invalid_argument("LdpcPackedEncoder: base matrix of " + std::to_string(rows) +
                                    " rows is too small for kb = " + std::to_string(kb));
    }

    // Edges of every row over the information and head parity columns, information first;
    // the extension rows' own identity column is the output and carries no edge.
    RowBegin.assign(1, 0);
    RowInfoEnd.clear();
    EdgeColumn.clear();
    EdgeShift.clear();
    for (int b = 0; b < rows; ++b) {
        for (int c = 0; c < kb + 4; ++c) {
            if (c == kb) RowInfoEnd.push_back(static_cast<int>(EdgeColumn.size()));
            if (base[b][c] < 0) continue;
            EdgeColumn.push_back(c);
            EdgeShift.push_back(base[b][c] % z);
        }
        RowBegin.push_back(static_cast<int>(EdgeColumn.size()));
    }

    // The sum of the four head rows must leave one circulant, on the first parity column.
    std::map<std::pair<int, int>, int> headSum;
    for (int b = 0; b < 4; ++b) {
        for (int e = RowInfoEnd[b]; e < RowBegin[b + 1]; ++e) {
            headSum[{EdgeColumn[e], EdgeShift[e]}] ^= 1;
        }
    }
    int remaining = 0;
    int headShift = -1;
    for (const auto& [key, odd] : headSum) {
        if (!odd) continue;
        ++remaining;
        if (key.first == kb) headShift = key.second;
    }
    if (remaining != 1 || headShift < 0) {
        throw std::logic_error("LdpcPackedEncoder: head rows do not sum to one circulant on p0");
    }
    P0Rotation = (z - headShift) % z;

    // Then p1..p3, each from a head row in which it is the only unknown.
    StepRow.clear();
    StepColumn.clear();
    StepRotation.clear();
    bool known[4] = {true, false, false, false};
    bool used[4] = {false, false, false, false};
    for (int step = 0; step < 3; ++step) {
        bool found = false;
        for (int b = 0; b < 4 && !found; ++b) {
            if (used[b]) continue;
            int unknown = 0;
            int column = -1;
            int shift = 0;
            for (int e = RowInfoEnd[b]; e < RowBegin[b + 1]; ++e) {
                if (!known[EdgeColumn[e] - kb]) {
                    ++unknown;
                    column = EdgeColumn[e];
                    shift = EdgeShift[e];
                }
            }
            if (unknown != 1) continue;
            used[b] = true;
            known[column - kb] = true;
            StepRow.push_back(b);
            StepColumn.push_back(column);
            StepRotation.push_back((z - shift) % z);
            found = true;
        }
        if (!found) throw std::logic_error("LdpcPackedEncoder: head rows cannot be solved in order");
    }

    Z = z;
    Kb = kb;
    Rows = rows;
    Words = (z + 63) / 64;
    PaddedWords = (Words + 3) / 4 * 4;
    // Reads of a rotation reach one vector plus a few bytes past the shift (< z).
    Stride = (z + 64 * PaddedWords + 128 + 63) / 64;
    Columns.assign(static_cast<std::size_t>(kb + 5) * Stride, 0);
    Packed.assign(static_cast<std::size_t>(kb * z / 64 + 2), 0);
    Acc.assign(static_cast<std::size_t>(6 * PaddedWords), 0);
}

ldpc_detail::PackedPlanView LdpcPackedEncoder::view() {
    return ldpc_detail::PackedPlanView{Z,
                                           Kb,
                                           Rows,
                                           Words,
                                           PaddedWords,
                                           Stride,
                                           P0Rotation,
                                           RowBegin.data(),
                                           RowInfoEnd.data(),
                                           EdgeColumn.data(),
                                           EdgeShift.data(),
                                           StepRow.data(),
                                           StepColumn.data(),
                                           StepRotation.data(),
                                           Columns.data(),
                                           Packed.data(),
                                           Acc.data()};
}

void LdpcPackedEncoder::EncodeBits(LdpcKernel kernel, const std::uint64_t* in, std::uint64_t* out) {
    if (!Built()) throw std::logic_error("LdpcPackedEncoder::EncodeBits before Build");
    const ldpc_detail::PackedPlanView plan = view();
#if defined(NRSYNTH_HAVE_AVX2_KERNELS)
    if (kernel == LdpcKernel::Avx2 && ldpcKernelSupported(LdpcKernel::Avx2)) {
        ldpc_detail::encodeBitsAvx2(plan, in, out);
        return;
    }
#endif
    if (kernel == LdpcKernel::Avx2) throw std::invalid_argument("LdpcPackedEncoder: this CPU has no AVX2");
    ldpc_detail::encodeBitsPortable(plan, in, out);
}

bool LdpcPackedEncoder::Encode(LdpcKernel kernel, int* in, int* out) {
    if (!Built()) throw std::logic_error("LdpcPackedEncoder::Encode before Build");
    const ldpc_detail::PackedPlanView plan = view();
    switch (kernel) {
        case LdpcKernel::Portable:
            return ldpc_detail::encodePackedPortable(plan, in, out);
        case LdpcKernel::Avx2:
#if defined(NRSYNTH_HAVE_AVX2_KERNELS)
            if (ldpcKernelSupported(LdpcKernel::Avx2)) {
                return ldpc_detail::encodePackedAvx2(plan, in, out);
            }
#endif
            throw std::invalid_argument("LdpcPackedEncoder: this CPU has no AVX2");
        case LdpcKernel::List:
            break;
    }
    throw std::invalid_argument("LdpcPackedEncoder: the list form is not a packed kernel");
}

}  // namespace Orvalis_NR
