#include "downlink/pbch_payload.h"

#include <string>

#include "common/failure.h"

void Generate_PBCH_Payload(BitSequence& payload, int payloadLength, int sfn, int hrf, int ssbIndex,
                           int lmax, int kSsb) {
    if (payloadLength < 0 || payload.size() < static_cast<std::size_t>(payloadLength) + 8)
        Orvalis_NR::failWith("The PBCH payload vector is shorter than PayloadDataLength + 8.",
                             "SSPBCH.PayloadDataLength " + std::to_string(payloadLength) + ", " +
                                 std::to_string(payload.size()) + " bits");
    char* timing = payload.data() + payloadLength;
    for (int b = 0; b < 4; ++b) timing[b] = static_cast<char>((sfn >> (3 - b)) & 1);
    timing[4] = static_cast<char>(hrf & 1);
    if (lmax == 64) {
        for (int b = 0; b < 3; ++b) timing[5 + b] = static_cast<char>((ssbIndex >> (5 - b)) & 1);
    } else {
        timing[5] = static_cast<char>((kSsb >> 4) & 1);
        timing[6] = 0;
        timing[7] = 0;
    }
}

PbchInterleaving GetPbchInterleaving(int payloadLength, int lmax, const std::vector<int>& table) {
    const int a = payloadLength;
    const std::string value = "SSPBCH.PayloadDataLength " + std::to_string(a);
    const char* doesNotFit = "PayloadDataLength does not fit the PBCH payload interleaver.";
    if (a < 0 || a > static_cast<int>(table.size()) - 8) Orvalis_NR::failWith(doesNotFit, value);
    const int total = a + 8;
    PbchInterleaving result;
    result.destination.resize(static_cast<std::size_t>(total));
    result.scrambleMask.assign(static_cast<std::size_t>(total), 1);

    int jSfn = 0;
    const int jHrf = 10;
    int jSsb = 11;
    int jOther = 14;
    for (int k = 0; k < total; ++k) {
        const bool sfnBit = (k >= 1 && k <= 6 && k < a) || (k >= a && k <= a + 3);
        int j;
        if (sfnBit)
            j = jSfn++;
        else if (k == a + 4)
            j = jHrf;
        else if (k >= a + 5)
            j = jSsb++;
        else
            j = jOther++;
        if (j >= static_cast<int>(table.size()) || table[j] < 0 || table[j] >= total)
            Orvalis_NR::failWith(doesNotFit, value);
        const int to = table[j];
        result.destination[k] = to;
        // TS 38.212 clause 7.1.2: the bits the receiver learns from the block's position in
        // time stay unscrambled.
        const bool known = k == a + 1 || k == a + 2 || k == a + 4 || (lmax == 64 && k >= a + 5);
        if (known) result.scrambleMask[to] = 0;
    }
    return result;
}
