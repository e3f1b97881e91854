#include "coding/ldpc_encoder.h"

#include <algorithm>
#include <stdexcept>
#include <string>

#include "coding/ldpc_encoder_core.h"
#include "coding/ldpc_parity_matrix.h"
#include "coding/ldpc_tables.h"
#include "common/failure.h"

namespace Orvalis_NR {

bool LDPC_Encoder::Initialize(int baseGraph, int z) {
    if (baseGraph < 0 || baseGraph > 1) return false;

    // One-based place of the first lifting set that holds z.
    int setIndex = 0;
    for (std::size_t s = 0; s < LiftingSizeSets.size() && setIndex == 0; ++s) {
        const auto& sizes = LiftingSizeSets[s];
        if (std::find(sizes.begin(), sizes.end(), z) != sizes.end()) {
            setIndex = static_cast<int>(s) + 1;
        }
    }
    if (setIndex == 0)
        failWith("The LDPC lifting size is not one of TS 38.212 Table 5.3.2-1.", "Z " + std::to_string(z));

    Z = z;
    BaseGraph = baseGraph;
    N = (baseGraph == 0 ? 66 : 50) * z;
    K = (baseGraph == 0 ? 22 : 10) * z;
    M = 2 * z + N - K;
    SetIndex = setIndex;
    LdpcParityMatrix::GetNRMatrix(baseGraph, setIndex, z, ParityRows);
    InfoBits.assign(static_cast<std::size_t>(K), 0);
    CodedBits.assign(static_cast<std::size_t>(N), 0);

    std::vector<std::vector<int>> base;
    LdpcParityMatrix::GetBaseMatrix(baseGraph, setIndex, z, base);
    Packed.Build(base, K / z, z);
    Work.assign(static_cast<std::size_t>(N + 2 * z), 0);
    return true;
}

bool LDPC_Encoder::Run(std::vector<int>& in, std::vector<int>& out) {
    return RunWith(ldpcPreferredKernel(), in, out);
}

void LDPC_Encoder::RunPacked(const std::uint64_t* in, std::uint64_t* out) {
    if (Z == 0) throw std::logic_error("LDPC_Encoder::RunPacked before Initialize");
    const LdpcKernel kernel = ldpcPreferredKernel();
    Packed.EncodeBits(kernel == LdpcKernel::List ? LdpcKernel::Portable : kernel, in, out);
}

bool LDPC_Encoder::Run() { return Run(InfoBits, CodedBits); }

bool LDPC_Encoder::RunWith(LdpcKernel kernel, std::vector<int>& in, std::vector<int>& out) {
    if (Z == 0) throw std::logic_error("LDPC_Encoder::Run before Initialize");
    if (in.size() != static_cast<std::size_t>(K) || out.size() != static_cast<std::size_t>(N)) {
        return false;
    }
    if (!ldpcKernelSupported(kernel)) {
        throw std::invalid_argument("LDPC_Encoder::RunWith: kernel not supported by this CPU");
    }
    if (kernel != LdpcKernel::List && Packed.Encode(kernel, in.data(), out.data())) return true;
    return runList(in, out);
}

bool LDPC_Encoder::runList(std::vector<int>& in, std::vector<int>& out) {
    // Systematic part from 2Z on; a filler goes out as -2 and is encoded as 0.
    for (int i = 2 * Z; i < K; ++i) {
        if (in[i] == -2) {
            in[i] = 0;
            out[i - 2 * Z] = -2;
        } else {
            out[i - 2 * Z] = in[i];
        }
    }
    LdpcEncoderCore::Encode2(Work, 0, in, 0, K, N - K + 2 * Z, N + 2 * Z, ParityRows);
    // The parity part; the first 2Z columns are never sent.
    std::copy(Work.begin() + K, Work.end(), out.begin() + (K - 2 * Z));
    return true;
}

}  // namespace Orvalis_NR
