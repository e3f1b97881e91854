#pragma once
// LDPC encoding on whole Z-bit circulants held as machine words (TS 38.212 clause 5.3.2):
// each edge of the base graph costs a few word operations instead of Z list lookups.

#include <cstdint>
#include <vector>

namespace Orvalis_NR {

namespace ldpc_detail {
struct PackedPlanView;
}

/// How LDPC_Encoder computes a block. All forms give the same output.
enum class LdpcKernel {
    List,      // the row lists of LdpcEncoderCore::Encode2, the reference
    Portable,  // packed circulants on 64-bit words
    Avx2,      // packed circulants on 256-bit AVX2 registers
};

/// Whether this CPU runs the kernel (List and Portable always).
bool ldpcKernelSupported(LdpcKernel kernel);

/// The fastest supported packed kernel, chosen once from the CPU.
LdpcKernel ldpcPreferredKernel();

/// Encoding plan and workspace for one (base graph, Z); built in set-up, used per block.
class LdpcPackedEncoder {
public:
    /// base: the shift form of LdpcParityMatrix::GetBaseMatrix (-1 = no entry); kb: 22 or 10.
    void Build(const std::vector<std::vector<int>>& base, int kb, int z);

    /// Encodes in (K = kb Z ints) to out (N = (rows + kb - 2) Z ints) like LDPC_Encoder::Run.
    /// Returns false, touching nothing, for an input the packed form does not take (values
    /// other than 0, 1, -2, or -2 among the first 2Z); the caller then uses the list form.
    bool Encode(LdpcKernel kernel, int* in, int* out);

    /// Encodes packed bits (see common/packed_bits.h): `in` holds K bits with fillers as 0, `out`
    /// receives the N bits of the d sequence (input bits 2Z to K, then the parity), words
    /// enough for N bits. The list form, on request, runs as the portable kernel.
    void EncodeBits(LdpcKernel kernel, const std::uint64_t* in, std::uint64_t* out);

    bool Built() const { return Z > 0; }

private:
    ldpc_detail::PackedPlanView view();
    int Z = 0;
    int Kb = 0;
    int Rows = 0;
    int Words = 0;
    int PaddedWords = 0;
    int Stride = 0;
    int P0Rotation = 0;
    std::vector<int> RowBegin, RowInfoEnd, EdgeColumn, EdgeShift;
    std::vector<int> StepRow, StepColumn, StepRotation;
    std::vector<std::uint64_t> Columns, Packed, Acc;
};

}  // namespace Orvalis_NR
