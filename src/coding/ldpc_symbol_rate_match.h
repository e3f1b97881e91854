#pragma once
// LDPC rate matching of one code block straight into modulation symbol indices: bit selection
// (TS 38.212 clause 5.4.2.1) and bit interleaving (clause 5.4.2.2) fused, for the shared
// channels, whose E is always a whole number of symbols.

#include <cstdint>
#include <vector>

namespace Orvalis_NR {

/// Where one code block's selection reads: the first Ncb encoder outputs from K0, circularly,
/// skipping the filler run [FillerBegin, FillerEnd) that segmentation placed there.
struct LdpcCircularBuffer {
    const int* D = nullptr;  ///< encoder outputs, 0 or 1 outside the filler run (bit 0 is used)
    int Ncb = 0;
    int K0 = 0;
    int FillerBegin = 0;
    int FillerEnd = 0;
};

/// The same with the encoder outputs packed (common/packed_bits.h), as LDPC_Encoder::RunPacked
/// writes them; the words must hold Ncb bits.
struct LdpcPackedCircularBuffer {
    const std::uint64_t* Bits = nullptr;
    int Ncb = 0;
    int K0 = 0;
    int FillerBegin = 0;
    int FillerEnd = 0;
};

class LdpcSymbolRateMatch {
public:
    /// Writes E / Qm symbol indices: symbols[j] holds the interleaved bits f(j Qm + i),
    /// i = 0..Qm-1, with f(j Qm) in bit 0 (first bit least significant). The E mod Qm bits
    /// after the last whole symbol are selected but not written. qm: 1 to 10. A buffer with
    /// no bit outside its filler run fails naming Ncb. Allocates only when E or Ncb grows.
    void run(const LdpcCircularBuffer& buffer, int e, int qm, std::uint16_t* symbols);
    void run(const LdpcPackedCircularBuffer& buffer, int e, int qm, std::uint16_t* symbols);

private:
    std::vector<std::uint64_t> selected_;  // e of clause 5.4.2.1, packed, plus spare words
    std::vector<std::uint64_t> unpacked_;  // the int form's buffer, packed
    void select(const LdpcPackedCircularBuffer& buffer, int e);
};

}  // namespace Orvalis_NR
