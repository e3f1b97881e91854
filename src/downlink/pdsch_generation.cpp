// Per-slot PDSCH bits and symbols: transport block CRC, code block segmentation and CRC, LDPC,
// rate matching (TS 38.212 clauses 7.2.1-7.2.5), scrambling, modulation and layer mapping
// (TS 38.211 clauses 7.3.1.1-7.3.1.3), then the slot's DM-RS and PT-RS sequences.

#include <algorithm>

#include "coding/crc.h"
#include "coding/gold_sequence.h"
#include "downlink/pdsch_generator.h"

namespace Orvalis_NR {

namespace {

constexpr int kCrc16 = 0x1021;
constexpr int kCrc24A = 0x864CFB;
constexpr int kCrc24B = 0x800063;

/// TS 38.212 clause 5.4.2.2 bit interleaving for any Qm: f(i + j Qm) = e(i E/Qm + j).
void interleaveBits(const std::vector<int>& e, std::vector<int>& f, int qm) {
    const int rows = static_cast<int>(e.size()) / qm;
    for (int j = 0; j < rows; ++j)
        for (int i = 0; i < qm; ++i)
            f[static_cast<std::size_t>(i + j * qm)] = e[static_cast<std::size_t>(i * rows + j)];
}

}  // namespace

void PDSCH_Generator::encodeCodeWord(SchCodeWord& cw) {
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
        if (e <= 0 || out + static_cast<std::size_t>(e) > cw.CodedBits.size()) continue;
        // The rate matcher knows the interleaver for Qm 1, 2, 4, 6 and 8; 8PSK and 1024QAM take
        // the same clause with their own Qm.
        const bool ownInterleaver = cw.Qm == 3 || cw.Qm == 10;
        cw.RateMatch.Initialize(cw.BaseGraph != 1 ? LDPC_BG2 : LDPC_BG1, cw.Z, c, std::min(cw.Nref, cw.N), cw.N, e,
                                cw.Rv, ownInterleaver ? 1 : cw.Qm);
        cw.RateMatched.resize(static_cast<std::size_t>(e));
        cw.RateMatch.Run(cw.EncoderOut, cw.RateMatched);
        if (ownInterleaver) {
            cw.Interleaved.resize(static_cast<std::size_t>(e));
            interleaveBits(cw.RateMatched, cw.Interleaved, cw.Qm);
            std::copy(cw.Interleaved.begin(), cw.Interleaved.end(), cw.CodedBits.begin() + static_cast<std::ptrdiff_t>(out));
        } else {
            std::copy(cw.RateMatched.begin(), cw.RateMatched.end(), cw.CodedBits.begin() + static_cast<std::ptrdiff_t>(out));
        }
        out += static_cast<std::size_t>(e);
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
    const int l = NumberOfLayers / NumberOfCodewords;
    for (auto& cw : CodeWords) {
        const std::size_t g = cw.CodedBits.size();
        if (!CodingOn) {
            cw.Source->GetOneFrame(cw.CodedBits, static_cast<int>(g));
            std::copy(cw.CodedBits.begin(), cw.CodedBits.end(), cw.ScrambledBits.begin());
        } else {
            encodeCodeWord(cw);
            // TS 38.211 clause 7.3.1.1 with the code word term q 2^14 left out.
            cw.PnBits.resize(g);
            PN_Generator(cw.PnBits, static_cast<int>(g), cInit);
            for (std::size_t i = 0; i < g; ++i)
                cw.ScrambledBits[i] = (cw.CodedBits[i] ^ cw.PnBits[i]) & 1;
        }
        // Modulation and layer mapping: symbol L i + j goes to layer j at position i.
        const int qm = cw.Qm;
        const std::size_t r = cw.Layers.empty() ? 0 : cw.Layers[0].size();
        std::size_t bit = 0;
        for (std::size_t i = 0; i < r; ++i)
            for (int j = 0; j < l; ++j) {
                unsigned index = 0;
                for (int b = 0; b < qm; ++b) index = (index << 1) | static_cast<unsigned>(cw.ScrambledBits[bit++] & 1);
                cw.Layers[static_cast<std::size_t>(j)][i] = cw.Constellation[index];
            }
    }
    if (HighestPrb >= LowestPrb) generateDmrs(subframe, slot);
    return true;
}

}  // namespace Orvalis_NR
