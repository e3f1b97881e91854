#include "coding/ldpc_symbol_rate_match.h"

#include <algorithm>
#include <cstring>
#include <string>

#if defined(__SSE2__)
#include <emmintrin.h>
#endif

#include "common/failure.h"

namespace Orvalis_NR {
namespace {

constexpr int kPadding = 8;  // one whole 64-bit load past the last selected bit

std::uint64_t load64(const std::uint8_t* p) {
    std::uint64_t v;
    std::memcpy(&v, p, sizeof v);
    return v;
}

// Eight symbols at a time: row i of the interleaver (bits e(i R + j), j = 0..7) goes to bit i
// of eight byte lanes. Each lane holds 0 or 1 before the shift, so lanes never carry.
template <int Q>
void interleaveToSymbols(const std::uint8_t* e, int rows, std::uint16_t* symbols) {
    int j = 0;
    for (; j + 8 <= rows; j += 8) {
        std::uint64_t lanes = 0;
        for (int i = 0; i < Q; ++i) lanes |= load64(e + static_cast<std::size_t>(i) * rows + j) << i;
        for (int k = 0; k < 8; ++k) symbols[j + k] = static_cast<std::uint16_t>((lanes >> (8 * k)) & 0xFFu);
    }
    for (; j < rows; ++j) {
        unsigned index = 0;
        for (int i = 0; i < Q; ++i) index |= static_cast<unsigned>(e[static_cast<std::size_t>(i) * rows + j]) << i;
        symbols[j] = static_cast<std::uint16_t>(index);
    }
}

// Any Qm up to 10, a symbol at a time.
void interleaveToSymbols(const std::uint8_t* e, int rows, int qm, std::uint16_t* symbols) {
    for (int j = 0; j < rows; ++j) {
        unsigned index = 0;
        for (int i = 0; i < qm; ++i) index |= static_cast<unsigned>(e[static_cast<std::size_t>(i) * rows + j]) << i;
        symbols[j] = static_cast<std::uint16_t>(index);
    }
}

// Encoder outputs (0 or 1 as int) to one byte each; SSE2 packs sixteen at a time.
void narrowBits(const int* from, int length, std::uint8_t* to) {
    int i = 0;
#if defined(__SSE2__)
    for (; i + 16 <= length; i += 16) {
        const __m128i a = _mm_loadu_si128(reinterpret_cast<const __m128i*>(from + i));
        const __m128i b = _mm_loadu_si128(reinterpret_cast<const __m128i*>(from + i + 4));
        const __m128i c = _mm_loadu_si128(reinterpret_cast<const __m128i*>(from + i + 8));
        const __m128i d = _mm_loadu_si128(reinterpret_cast<const __m128i*>(from + i + 12));
        const __m128i one = _mm_set1_epi32(1);
        const __m128i low = _mm_packs_epi32(_mm_and_si128(a, one), _mm_and_si128(b, one));
        const __m128i high = _mm_packs_epi32(_mm_and_si128(c, one), _mm_and_si128(d, one));
        _mm_storeu_si128(reinterpret_cast<__m128i*>(to + i), _mm_packus_epi16(low, high));
    }
#endif
    for (; i < length; ++i) to[i] = static_cast<std::uint8_t>(from[i] & 1);
}

}  // namespace

void LdpcSymbolRateMatch::select(const LdpcCircularBuffer& buffer, int e) {
    const int ncb = buffer.Ncb;
    // The filler run as it lies inside the circular buffer.
    const int fillerBegin = std::clamp(buffer.FillerBegin, 0, ncb);
    const int fillerEnd = std::clamp(buffer.FillerEnd, fillerBegin, ncb);
    if (ncb - (fillerEnd - fillerBegin) <= 0)
        failWith("The LDPC circular buffer holds only filler bits: the selection would never end.",
                 "Ncb " + std::to_string(ncb));
    int pos = buffer.K0 % ncb;
    if (pos < 0) pos += ncb;
    std::uint8_t* out = selected_.data();
    int gathered = 0;
    while (gathered < e) {
        if (pos >= fillerBegin && pos < fillerEnd) pos = fillerEnd;
        if (pos == ncb) pos = 0;
        if (pos >= fillerBegin && pos < fillerEnd) continue;  // a run at the buffer start
        const int end = pos < fillerBegin ? fillerBegin : ncb;
        const int length = std::min(end - pos, e - gathered);
        narrowBits(buffer.D + pos, length, out + gathered);
        gathered += length;
        pos += length;
        if (pos == ncb) pos = 0;
    }
}

void LdpcSymbolRateMatch::run(const LdpcCircularBuffer& buffer, int e, int qm, std::uint16_t* symbols) {
    if (e <= 0) return;
    if (buffer.D == nullptr || buffer.Ncb <= 0 || symbols == nullptr)
        failWith("LDPC rate matching needs a circular buffer.", "Ncb " + std::to_string(buffer.Ncb));
    if (qm < 1 || qm > 10) failWith("The modulation order must be 1 to 10.", "Qm " + std::to_string(qm));
    const std::size_t need = static_cast<std::size_t>(e) + kPadding;
    if (selected_.size() < need) selected_.resize(need);
    select(buffer, e);

    const int rows = e / qm;
    switch (qm) {
        case 1: interleaveToSymbols<1>(selected_.data(), rows, symbols); break;
        case 2: interleaveToSymbols<2>(selected_.data(), rows, symbols); break;
        case 4: interleaveToSymbols<4>(selected_.data(), rows, symbols); break;
        case 6: interleaveToSymbols<6>(selected_.data(), rows, symbols); break;
        case 8: interleaveToSymbols<8>(selected_.data(), rows, symbols); break;
        default: interleaveToSymbols(selected_.data(), rows, qm, symbols); break;
    }
}

}  // namespace Orvalis_NR
