#include "downlink/ss_sequences.h"

#include <array>
#include <cstdint>
#include <string>

#include "coding/gold_sequence.h"
#include "common/failure.h"

namespace {

using Register = std::array<char, kSyncSequenceLength>;

/// Length-127 m-sequence x(i+7) = x(i+tap) + x(i) mod 2 from the seven start values x(0..6).
Register mSequence(const std::array<char, 7>& start, int tap) {
    Register x{};
    for (int i = 0; i < 7; ++i) x[i] = start[i];
    for (int i = 0; i + 7 < kSyncSequenceLength; ++i) x[i + 7] = x[i + tap] ^ x[i];
    return x;
}

void requireLength(const char* function, std::size_t size, int needed) {
    if (size < static_cast<std::size_t>(needed))
        Orvalis_NR::failWith("The output of a synchronisation sequence is too short.",
                 std::string(function) + " output of " + std::to_string(size) + " elements, " +
                     std::to_string(needed) + " needed");
}

// Identities and indices are shifts of the sequences: negative ones would read before them.
void requireNonNegative(const char* function, const char* name, int value) {
    if (value < 0)
        Orvalis_NR::failWith("An identity or index of an SS/PBCH sequence is negative.",
                 std::string(function) + " " + name + " " + std::to_string(value));
}

// TS 38.211 clause 7.4.2.2: x(i+7) = x(i+4) + x(i), started at 0 1 1 0 1 1 1.
void pssWithShift(const char* function, int nId2, int shift, BitSequence& d) {
    requireNonNegative(function, "nId2", nId2);
    requireLength(function, d.size(), kSyncSequenceLength);
    static const Register x = mSequence({0, 1, 1, 0, 1, 1, 1}, 4);
    const int m = (shift + 43 * (nId2 % kSyncSequenceLength)) % kSyncSequenceLength;
    for (int n = 0; n < kSyncSequenceLength; ++n)
        d[n] = static_cast<char>(1 - 2 * x[(n + m) % kSyncSequenceLength]);
}

}  // namespace

void Generate_PSS_Signal(int nId2, BitSequence& d) {
    pssWithShift("Generate_PSS_Signal", nId2, 0, d);
}

void Generate_S_PSS_Signal(int nId2, BitSequence& d) {
    pssWithShift("Generate_S_PSS_Signal", nId2, 22, d);
}

void Generate_SSS_Signal(int nId1, int nId2, BitSequence& d) {
    requireNonNegative("Generate_SSS_Signal", "nId1", nId1);
    requireNonNegative("Generate_SSS_Signal", "nId2", nId2);
    requireLength("Generate_SSS_Signal", d.size(), kSyncSequenceLength);
    // TS 38.211 clause 7.4.2.3: x0(i+7) = x0(i+4) + x0(i), x1(i+7) = x1(i+1) + x1(i), both
    // started at 1 0 0 0 0 0 0.
    static const Register x0 = mSequence({1, 0, 0, 0, 0, 0, 0}, 4);
    static const Register x1 = mSequence({1, 0, 0, 0, 0, 0, 0}, 1);
    // m0 = 5 (nId2 + 3 floor(nId1 / 112)) enters modulo 127 only; reduced first, it cannot
    // overflow for any identity.
    const int m0 = 5 * (nId2 % kSyncSequenceLength + 3 * (nId1 / 112 % kSyncSequenceLength));
    const int m1 = nId1 % 112;
    for (int n = 0; n < kSyncSequenceLength; ++n) {
        const int a = 1 - 2 * x0[(n + m0) % kSyncSequenceLength];
        const int b = 1 - 2 * x1[(n + m1) % kSyncSequenceLength];
        d[n] = static_cast<char>(a * b);
    }
}

void Generate_S_SSS_Signal(int nId1, int nId2, BitSequence& d) {
    Generate_SSS_Signal(nId1, nId2, d);
}

void Generate_PBCH_DMRS_Signal(int iSsb, int cellId, int nHf, std::vector<complex>& dmrs,
                               bool swapIndex) {
    requireNonNegative("Generate_PBCH_DMRS_Signal", "cellId", cellId);
    requireLength("Generate_PBCH_DMRS_Signal", dmrs.size(), kPbchDmrsLength);
    requireNonNegative("Generate_PBCH_DMRS_Signal", "iSsb", iSsb);
    requireNonNegative("Generate_PBCH_DMRS_Signal", "nHf", nHf);
    // 2^11 (iBar + 1)(floor(N/4) + 1) + 2^6 (iBar + 1) + (N mod 4). From N_ID of about 2^20 on
    // the value passes 2^31; like every cInit it enters the 31-bit register of the Gold
    // sequence modulo 2^31, so it is formed modulo 2^64 in unsigned arithmetic.
    using U = std::uint64_t;
    const U iBar = swapIndex ? U(nHf) + 4 * U(iSsb) : U(iSsb) + 4 * U(nHf);
    const U wide = (((U(cellId) / 4 + 1) << 11) | 64) * (iBar + 1) + U(cellId) % 4;
    const int cInit = static_cast<int>(wide & 0x7FFFFFFFu);
    // Called per SS block: the scratch is made once per thread, not per call.
    thread_local BitSequence c(2 * kPbchDmrsLength);
    PN_Generator(c, 2 * kPbchDmrsLength, cInit);
    constexpr double a = 0.7071067811865476;
    for (int m = 0; m < kPbchDmrsLength; ++m)
        dmrs[m] = complex((1 - 2 * c[2 * m]) * a, (1 - 2 * c[2 * m + 1]) * a);
}
