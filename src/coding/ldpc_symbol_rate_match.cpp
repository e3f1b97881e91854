#include "coding/ldpc_symbol_rate_match.h"

#include <algorithm>
#include <cstring>
#include <string>

#if defined(__SSE2__)
#include <emmintrin.h>
#endif

#include "common/failure.h"
#include "common/packed_bits.h"

namespace Orvalis_NR {
namespace {

constexpr std::size_t kSpareWords = 2;  // one unaligned 64-bit read past the last selected bit

inline std::uint64_t load64(const unsigned char* p) {
    std::uint64_t v;
    std::memcpy(&v, p, sizeof v);
    return v;
}

// Bit `at` of the packed selection and the 16 after it (fewer near the end: spare words).
inline unsigned bits16(const unsigned char* e, std::size_t at) {
    return static_cast<unsigned>(load64(e + at / 8) >> (at % 8)) & 0xFFFFu;
}

// One symbol: bit i of symbol j is e(i R + j), R = rows.
inline std::uint16_t gatherSymbol(const unsigned char* e, int rows, int qm, int j) {
    unsigned index = 0;
    for (int i = 0; i < qm; ++i) {
        const std::size_t at = static_cast<std::size_t>(i) * static_cast<std::size_t>(rows) + static_cast<std::size_t>(j);
        index |= ((static_cast<unsigned>(e[at / 8]) >> (at % 8)) & 1u) << i;
    }
    return static_cast<std::uint16_t>(index);
}

// Sixteen symbols at a time for Qm up to 8: 16 bits of interleaver row i are spread over
// byte lanes (lane 2m bit m of the low byte, lane 2m + 1 bit m of the high byte), reduced to
// 0 or 1 and shifted to bit i. The even lanes then hold symbols j..j+7, the odd ones j+8..15.
template <int Q>
void interleave(const unsigned char* e, int rows, std::uint16_t* symbols) {
    int j = 0;
#if defined(__SSE2__)
    const __m128i laneBit = _mm_setr_epi8(1, 1, 2, 2, 4, 4, 8, 8, 16, 16, 32, 32, 64, 64, -128, -128);
    const __m128i one = _mm_set1_epi8(1);
    const __m128i lowByte = _mm_set1_epi16(0x00FF);
    for (; j + 16 <= rows; j += 16) {
        __m128i acc = _mm_setzero_si128();
        for (int i = 0; i < Q; ++i) {
            const std::size_t at = static_cast<std::size_t>(i) * static_cast<std::size_t>(rows) + static_cast<std::size_t>(j);
            const __m128i row = _mm_set1_epi16(static_cast<short>(bits16(e, at)));
            const __m128i bit = _mm_min_epu8(_mm_and_si128(row, laneBit), one);
            acc = _mm_or_si128(acc, _mm_sll_epi16(bit, _mm_cvtsi32_si128(i)));
        }
        _mm_storeu_si128(reinterpret_cast<__m128i*>(symbols + j), _mm_and_si128(acc, lowByte));
        _mm_storeu_si128(reinterpret_cast<__m128i*>(symbols + j + 8), _mm_srli_epi16(acc, 8));
    }
#endif
    for (; j < rows; ++j) symbols[j] = gatherSymbol(e, rows, Q, j);
}

void interleaveAnyOrder(const unsigned char* e, int rows, int qm, std::uint16_t* symbols) {
    for (int j = 0; j < rows; ++j) symbols[j] = gatherSymbol(e, rows, qm, j);
}

}  // namespace

void LdpcSymbolRateMatch::select(const LdpcPackedCircularBuffer& buffer, int e) {
    const int ncb = buffer.Ncb;
    // The filler run as it lies inside the circular buffer.
    const int fillerBegin = std::clamp(buffer.FillerBegin, 0, ncb);
    const int fillerEnd = std::clamp(buffer.FillerEnd, fillerBegin, ncb);
    if (ncb - (fillerEnd - fillerBegin) <= 0)
        failWith("The LDPC circular buffer holds only filler bits: the selection would never end.",
                 "Ncb " + std::to_string(ncb));
    int pos = buffer.K0 % ncb;
    if (pos < 0) pos += ncb;
    std::uint64_t* out = selected_.data();
    int gathered = 0;
    while (gathered < e) {
        if (pos >= fillerBegin && pos < fillerEnd) pos = fillerEnd;
        if (pos == ncb) pos = 0;
        if (pos >= fillerBegin && pos < fillerEnd) continue;  // a run at the buffer start
        const int end = pos < fillerBegin ? fillerBegin : ncb;
        const int length = std::min(end - pos, e - gathered);
        copyBits(out, static_cast<std::size_t>(gathered), buffer.Bits, static_cast<std::size_t>(pos),
                 static_cast<std::size_t>(length));
        gathered += length;
        pos += length;
        if (pos == ncb) pos = 0;
    }
}

void LdpcSymbolRateMatch::run(const LdpcPackedCircularBuffer& buffer, int e, int qm, std::uint16_t* symbols) {
    if (e <= 0) return;
    if (buffer.Bits == nullptr || buffer.Ncb <= 0 || symbols == nullptr)
        failWith("LDPC rate matching needs a circular buffer.", "Ncb " + std::to_string(buffer.Ncb));
    if (qm < 1 || qm > 10) failWith("The modulation order must be 1 to 10.", "Qm " + std::to_string(qm));
    const std::size_t need = packedWords(static_cast<std::size_t>(e)) + kSpareWords;
    if (selected_.size() < need) selected_.resize(need);
    select(buffer, e);

    const auto* bytes = reinterpret_cast<const unsigned char*>(selected_.data());
    const int rows = e / qm;
    switch (qm) {
        case 1: interleave<1>(bytes, rows, symbols); break;
        case 2: interleave<2>(bytes, rows, symbols); break;
        case 4: interleave<4>(bytes, rows, symbols); break;
        case 6: interleave<6>(bytes, rows, symbols); break;
        case 8: interleave<8>(bytes, rows, symbols); break;
        default: interleaveAnyOrder(bytes, rows, qm, symbols); break;
    }
}

void LdpcSymbolRateMatch::run(const LdpcCircularBuffer& buffer, int e, int qm, std::uint16_t* symbols) {
    if (e <= 0) return;
    if (buffer.D == nullptr || buffer.Ncb <= 0 || symbols == nullptr)
        failWith("LDPC rate matching needs a circular buffer.", "Ncb " + std::to_string(buffer.Ncb));
    // Bit 0 of each output is what goes on (a filler's -2 reads 0 and is skipped anyway).
    const std::size_t n = static_cast<std::size_t>(buffer.Ncb);
    if (unpacked_.size() < packedWords(n)) unpacked_.resize(packedWords(n));
    std::fill(unpacked_.begin(), unpacked_.begin() + static_cast<std::ptrdiff_t>(packedWords(n)), 0);
    for (std::size_t i = 0; i < n; ++i)
        unpacked_[i / 64] |= static_cast<std::uint64_t>(buffer.D[i] & 1) << (i % 64);
    run(LdpcPackedCircularBuffer{unpacked_.data(), buffer.Ncb, buffer.K0, buffer.FillerBegin, buffer.FillerEnd}, e, qm,
        symbols);
}

}  // namespace Orvalis_NR
