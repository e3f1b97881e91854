// Per-slot PDSCH bits and symbols: transport block CRC, code block segmentation and CRC, LDPC,
// rate matching (TS 38.212 clauses 7.2.1-7.2.5), scrambling, modulation and layer mapping
// (TS 38.211 clauses 7.3.1.1-7.3.1.3), then the slot's DM-RS and PT-RS sequences.

#include <algorithm>
#include <cstdint>

#include "coding/crc.h"
#include "coding/gold_sequence.h"
#include "common/packed_bits.h"
#include "downlink/pdsch_generator.h"

namespace Orvalis_NR {

namespace {

constexpr int kCrc16 = 0x1021;
constexpr int kCrc24A = 0x864CFB;
constexpr int kCrc24B = 0x800063;

// The check of the first `bits` bits written after them, first check bit most significant.
void appendCrc(std::uint64_t* words, int bits, CRC_LengthEnumList type, int length) {
    const std::uint32_t crc = PackedCrc(type, words, static_cast<std::size_t>(bits));
    std::uint64_t reversed = 0;
    for (int k = 0; k < length; ++k) reversed |= static_cast<std::uint64_t>((crc >> (length - 1 - k)) & 1u) << k;
    copyBits(words, static_cast<std::size_t>(bits), &reversed, 0, static_cast<std::size_t>(length));
}

// Scrambling and modulation for the orders that divide 64 (a symbol's Gold bits never straddle
// two words), one layer after another so that each layer is written in order.
template <int Q>
void scrambleAndModulate(const std::uint16_t* symbols, const std::uint64_t* pn, const complex* table,
                         std::vector<std::vector<complex>>& layers, std::size_t perLayer) {
    constexpr unsigned mask = (1u << Q) - 1u;
    const std::size_t l = layers.size();
    for (std::size_t j = 0; j < l; ++j) {
        complex* out = layers[j].data();
        std::size_t s = j;
        for (std::size_t i = 0; i < perLayer; ++i, s += l) {
            const std::size_t bit = s * Q;
            const auto c = static_cast<unsigned>(pn[bit >> 6] >> (bit & 63u));
            out[i] = table[(symbols[s] ^ c) & mask];
        }
    }
}

}  // namespace

void SchCodeWord::appendTransportBlock(std::vector<char>& out) const {
    const std::size_t a = std::min(TbBits.size(), static_cast<std::size_t>(std::max(TbsBits, 0)));
    if (!PackedSlot) {
        out.insert(out.end(), TbBits.begin(), TbBits.begin() + static_cast<std::ptrdiff_t>(a));
        return;
    }
    const std::size_t at = out.size();
    out.resize(at + a);
    unpackBits(TbWords.data(), 0, a, out.data() + at);
}

void SchCodeWord::appendTransportBlockWithCrc(std::vector<char>& out) const {
    const std::size_t b = std::min(TbWithCrc.size(), static_cast<std::size_t>(std::max(TbWithCrcBits, 0)));
    if (!PackedSlot) {
        out.insert(out.end(), TbWithCrc.begin(), TbWithCrc.begin() + static_cast<std::ptrdiff_t>(b));
        return;
    }
    const std::size_t at = out.size();
    out.resize(at + b);
    unpackBits(TbWords.data(), 0, b, out.data() + at);
}

void SchCodeWord::appendEncoderOutput(std::vector<int>& out) const {
    if (!PackedSlot) {
        out.insert(out.end(), EncoderOut.begin(), EncoderOut.end());
        return;
    }
    const std::size_t at = out.size();
    out.resize(at + EncoderOut.size());
    unpackBits(DWords.data(), 0, EncoderOut.size(), out.data() + at);
    for (int i = std::max(LastFillerBegin, 0); i < K - 2 * Z && static_cast<std::size_t>(i) < EncoderOut.size(); ++i)
        out[at + static_cast<std::size_t>(i)] = -2;
}

// The rate matcher checks the geometry and gives k0; 8PSK and 1024QAM pass Qm 1 to it, as it
// knows only the square constellations' interleavers.
void PDSCH_Generator::initRateMatch(SchCodeWord& cw, int e) {
    const bool ownInterleaver = cw.Qm == 3 || cw.Qm == 10;
    cw.RateMatch.Initialize(cw.BaseGraph != 1 ? LDPC_BG2 : LDPC_BG1, cw.Z, cw.Blocks, std::min(cw.Nref, cw.N), cw.N, e,
                            cw.Rv, ownInterleaver ? 1 : cw.Qm);
}

// The chain on packed bits; the transport block is already in TbWords. The same steps and
// the same bits as encodeCodeWordBits.
void PDSCH_Generator::encodeCodeWordPacked(SchCodeWord& cw) {
    cw.PackedSlot = true;
    std::uint64_t* tb = cw.TbWords.data();
    const int a = cw.TbsBits;
    const int b = cw.TbWithCrcBits;
    appendCrc(tb, a, cw.CrcSelector == CRC_16 ? CRC_16 : CRC_24A, cw.TbCrcBits);
    if (!CbgOn && !CrcErrorFlags.empty() && CrcErrorFlags[0] == 1)
        flipBits(tb, static_cast<std::size_t>(a), static_cast<std::size_t>(b));

    const int c = cw.Blocks;
    const int big = b % c;
    int taken = 0;
    int coded = 0;
    std::size_t out = 0;
    std::uint64_t* block = cw.CbWords.data();
    for (int r = 0; r < c; ++r) {
        const int kPrime = r < big ? cw.CeilBlockBits : cw.FloorBlockBits;
        const int payload = kPrime - cw.CbCrcBits;
        const bool send = !CbgOn || (r < static_cast<int>(CbgFlags.size()) && CbgFlags[static_cast<std::size_t>(r)] != 0);
        if (!send) {
            taken += payload;
            continue;
        }
        copyBits(block, 0, tb, static_cast<std::size_t>(taken), static_cast<std::size_t>(payload));
        if (c > 1) {
            appendCrc(block, payload, CRC_24B, 24);
            if (r < static_cast<int>(CrcErrorFlags.size()) && CrcErrorFlags[static_cast<std::size_t>(r)] == 1)
                flipBits(block, static_cast<std::size_t>(payload), static_cast<std::size_t>(kPrime));
        }
        taken += payload;
        clearBits(block, static_cast<std::size_t>(kPrime), static_cast<std::size_t>(cw.K));  // fillers encode as 0
        cw.Encoder.RunPacked(block, cw.DWords.data());
        // The encoder output drops the first 2Z systematic bits; the fillers follow K'.
        cw.LastFillerBegin = kPrime - 2 * cw.Z;

        const int e = coded < static_cast<int>(cw.PerBlockE.size()) ? cw.PerBlockE[static_cast<std::size_t>(coded)] : 0;
        ++coded;
        if (e <= 0 || static_cast<long long>(out) + e > cw.G) continue;
        initRateMatch(cw, e);
        const LdpcPackedCircularBuffer buffer{cw.DWords.data(), cw.RateMatch.Ncb, cw.RateMatch.K0, kPrime - 2 * cw.Z,
                                              cw.K - 2 * cw.Z};
        cw.SymbolRateMatch.run(buffer, e, cw.Qm, cw.CodedSymbols.data() + out / static_cast<std::size_t>(cw.Qm));
        out += static_cast<std::size_t>(e);
    }
}

// One value per bit: the chain for payloads that hold values other than 0 and 1, whose
// quirks the per-bit steps define.
void PDSCH_Generator::encodeCodeWordBits(SchCodeWord& cw) {
    cw.PackedSlot = false;
    cw.Source->GetOneFrame(cw.TbBits, cw.TbsBits);
    const int a = cw.TbsBits;
    std::copy(cw.TbBits.begin(), cw.TbBits.begin() + a, cw.TbWithCrc.begin());
    CRC(cw.TbCrcBits, cw.CrcSelector == CRC_16 ? kCrc16 : kCrc24A, 0, a, cw.TbBits.data(), cw.TbWithCrc.data() + a);
    if (!CbgOn && !CrcErrorFlags.empty() && CrcErrorFlags[0] == 1)
        for (int i = a; i < cw.TbWithCrcBits; ++i) cw.TbWithCrc[static_cast<std::size_t>(i)] ^= 1;

    const int c = cw.Blocks;
    const int big = cw.TbWithCrcBits % c;
    int taken = 0;
    int coded = 0;
    std::size_t out = 0;
    cw.EncoderIn.resize(static_cast<std::size_t>(cw.K));
    for (int r = 0; r < c; ++r) {
        const int kPrime = r < big ? cw.CeilBlockBits : cw.FloorBlockBits;
        const int payload = kPrime - cw.CbCrcBits;
        const bool send = !CbgOn || (r < static_cast<int>(CbgFlags.size()) && CbgFlags[static_cast<std::size_t>(r)] != 0);
        if (!send) {
            taken += payload;
            continue;
        }
        for (int i = 0; i < payload; ++i)
            cw.CbBits[static_cast<std::size_t>(i)] = cw.TbWithCrc[static_cast<std::size_t>(taken + i)];
        if (c > 1) {
            CRC(24, kCrc24B, 0, payload, cw.CbBits.data(), cw.CbBits.data() + payload);
            if (r < static_cast<int>(CrcErrorFlags.size()) && CrcErrorFlags[static_cast<std::size_t>(r)] == 1)
                for (int i = payload; i < kPrime; ++i) cw.CbBits[static_cast<std::size_t>(i)] ^= 1;
        }
        taken += payload;
        for (int i = 0; i < kPrime; ++i) cw.EncoderIn[static_cast<std::size_t>(i)] = cw.CbBits[static_cast<std::size_t>(i)];
        for (int i = kPrime; i < cw.K; ++i) cw.EncoderIn[static_cast<std::size_t>(i)] = -2;
        cw.Encoder.Run(cw.EncoderIn, cw.EncoderOut);

        const int e = coded < static_cast<int>(cw.PerBlockE.size()) ? cw.PerBlockE[static_cast<std::size_t>(coded)] : 0;
        ++coded;
        if (e <= 0 || static_cast<long long>(out) + e > cw.G) continue;
        initRateMatch(cw, e);
        // The encoder output drops the first 2Z systematic bits; the fillers follow K'.
        LdpcCircularBuffer buffer;
        buffer.D = cw.EncoderOut.data();
        buffer.Ncb = cw.RateMatch.Ncb;
        buffer.K0 = cw.RateMatch.K0;
        buffer.FillerBegin = kPrime - 2 * cw.Z;
        buffer.FillerEnd = cw.K - 2 * cw.Z;
        cw.SymbolRateMatch.run(buffer, e, cw.Qm, cw.CodedSymbols.data() + out / static_cast<std::size_t>(cw.Qm));
        out += static_cast<std::size_t>(e);
    }
}

// Modulation and layer mapping (TS 38.211 clauses 7.3.1.2 and 7.3.1.3): symbol L i + j goes to
// layer j at position i. Coded symbols are scrambled here, Qm bits of the Gold sequence at once.
void PDSCH_Generator::modulateAndMapLayers(SchCodeWord& cw, bool scrambled) {
    const int qm = cw.Qm;
    const std::size_t l = cw.Layers.size();
    const std::size_t r = l == 0 ? 0 : cw.Layers[0].size();
    const unsigned mask = (1u << qm) - 1u;
    const complex* table = cw.SymbolTable.data();
    std::size_t s = 0;
    if (!scrambled) {
        const int* bits = cw.CodedBits.data();
        for (std::size_t i = 0; i < r; ++i)
            for (std::size_t j = 0; j < l; ++j, ++s) {
                unsigned index = 0;
                for (int b = 0; b < qm; ++b) index |= static_cast<unsigned>(bits[s * qm + b] & 1) << b;
                cw.Layers[j][i] = table[index];
            }
        return;
    }
    const std::uint16_t* symbols = cw.CodedSymbols.data();
    const std::uint64_t* pn = cw.PnWords.data();
    switch (qm) {
        case 2: scrambleAndModulate<2>(symbols, pn, table, cw.Layers, r); return;
        case 4: scrambleAndModulate<4>(symbols, pn, table, cw.Layers, r); return;
        case 8: scrambleAndModulate<8>(symbols, pn, table, cw.Layers, r); return;
        default: break;
    }
    std::size_t bit = 0;
    for (std::size_t i = 0; i < r; ++i)
        for (std::size_t j = 0; j < l; ++j, ++s, bit += static_cast<std::size_t>(qm)) {
            const std::size_t word = bit >> 6;
            const unsigned shift = static_cast<unsigned>(bit & 63u);
            std::uint64_t c = pn[word] >> shift;
            if (shift + static_cast<unsigned>(qm) > 64u) c |= pn[word + 1] << (64u - shift);
            cw.Layers[j][i] = table[(symbols[s] ^ static_cast<unsigned>(c)) & mask];
        }
}

bool PDSCH_Generator::Generate(int frame, int subframe, int slot) {
    CalculateRateMathingParameters(frame, subframe, slot);

    LowestPrb = BwpSize;
    HighestPrb = -1;
    for (int n = AllocRbStart; n < AllocRbStart + AllocRbCount; ++n) {
        if (!RbMask[static_cast<std::size_t>(n)]) continue;
        LowestPrb = std::min(LowestPrb, VrbToPrb[static_cast<std::size_t>(n)]);
        HighestPrb = std::max(HighestPrb, VrbToPrb[static_cast<std::size_t>(n)]);
    }

    const int cInit = static_cast<int>((static_cast<long long>(Rnti) << 15) + NId);
    for (auto& cw : CodeWords) {
        if (!CodingOn) {
            cw.Source->GetOneFrame(cw.CodedBits, static_cast<int>(cw.CodedBits.size()));
            modulateAndMapLayers(cw, false);
        } else {
            // The packed chain needs the fillers clear of the 2Z bits the encoder drops.
            if (cw.FloorBlockBits >= 2 * cw.Z && cw.Source->GetPackedFrame(cw.TbWords.data(), cw.TbsBits))
                encodeCodeWordPacked(cw);
            else
                encodeCodeWordBits(cw);
            // TS 38.211 clause 7.3.1.1 with the code word term q 2^14 left out.
            const std::size_t used = cw.Layers.size() * (cw.Layers.empty() ? 0 : cw.Layers[0].size());
            // The same for every slot: generated again only for a longer slot or a new cInit.
            const long long bits = static_cast<long long>(used) * cw.Qm;
            if (cInit != cw.PnCInit || bits > cw.PnBits) {
                PN_GeneratorWords(cw.PnWords, static_cast<int>(bits), cInit);
                cw.PnCInit = cInit;
                cw.PnBits = bits;
            }
            modulateAndMapLayers(cw, true);
        }
    }
    if (HighestPrb >= LowestPrb) generateDmrs(subframe, slot);
    return true;
}

}  // namespace Orvalis_NR
