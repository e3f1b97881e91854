#include "coding/polar_coding.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <cstdint>
#include <stdexcept>

#include "coding/polar_mother_code.h"
#include "tables/polar_tables.h"

namespace Orvalis_NR {

namespace {

constexpr int kMaxCodeLength = 1024;  // length of the polar sequence of Table 5.3.1.2-1

// Status bits of a position.
constexpr int kFrozen = 1;
constexpr int kInfo = 2;
constexpr int kParity = 4;

}  // namespace

void PolarCoding::ReadTable5311() {
    PiMax = readPolarInterleavingPattern(Table5311Text);
}

void PolarCoding::ReadTable54111() {
    SubBlockPattern = readPolarSubBlockPattern(Table54111Text);
}

void PolarCoding::ReadTable5312(std::vector<int>& q, std::vector<int>& w) {
    q.assign(kMaxCodeLength, -1);
    w.assign(kMaxCodeLength, -1);
    auto place = [&](int W, int Q) {
        if (W < 0 || W >= kMaxCodeLength || Q < 0 || Q >= kMaxCodeLength)
            throw std::invalid_argument("Table5312Text: pair " + std::to_string(W) + " " +
                                        std::to_string(Q) + " outside 0..1023");
        q[static_cast<std::size_t>(W)] = Q;
        w[static_cast<std::size_t>(Q)] = W;
    };
    if (Table5312Text.empty()) {
        for (int W = 0; W < kMaxCodeLength; ++W)
            place(W, tables::kPolarSequence[static_cast<std::size_t>(W)]);
        return;
    }
    for (const auto& [W, Q] : parseIndexValuePairs(Table5312Text, "Table5312Text")) place(W, Q);
    if (std::count(q.begin(), q.end(), -1) != 0 || std::count(w.begin(), w.end(), -1) != 0)
        throw std::invalid_argument("Table5312Text: not a permutation of 0..1023");
}

bool PolarCoding::Init(int K, int E, int nMax, int interleave, int nPC, int nPCwm) {
    ErrorMessage.clear();
    if (nPC < 0)
        throw std::invalid_argument("nPC must not be negative, got " + std::to_string(nPC));
    if (nPCwm < 0 || nPCwm > nPC)
        throw std::invalid_argument("nPCwm must lie in 0..nPC (" + std::to_string(nPC) + "), got " +
                                    std::to_string(nPCwm));
    if (interleave != 0 && K > static_cast<int>(tables::kPolarInterleavingPattern.size()))
        throw std::invalid_argument("K must be at most 164 with the input interleaver, got " +
                                    std::to_string(K));
    N = polarCodeLength(K, E, nMax);
    if (N > kMaxCodeLength)
        throw std::invalid_argument("nMax gives N " + std::to_string(N) + " above 1024, nMax is " +
                                    std::to_string(nMax));
    this->nPC = nPC;

    // Input bit interleaver, TS 38.212 clause 5.3.1.1.
    ReadTable5311();
    InterleaverPattern.clear();
    InterleaverPattern.reserve(static_cast<std::size_t>(K));
    if (interleave == 0) {
        for (int k = 0; k < K; ++k) InterleaverPattern.push_back(k);
    } else {
        const int offset = static_cast<int>(PiMax.size()) - K;
        for (int pi : PiMax)
            if (pi >= offset) InterleaverPattern.push_back(pi - offset);
    }

    // Polar sequence of this N, least reliable first.
    std::vector<int> q, w;
    ReadTable5312(q, w);
    std::vector<int> sequence;
    sequence.reserve(static_cast<std::size_t>(N));
    for (int Q : q)
        if (Q < N) sequence.push_back(Q);

    // Positions the rate matcher will not send are frozen first, TS 38.212 clause 5.4.1.1.
    ReadTable54111();
    const std::vector<int> J = polarSubBlockInterleaver(SubBlockPattern, N);
    std::vector<char> preFrozen(static_cast<std::size_t>(N), 0);
    if (E < N) {
        if (polarPuncturing(K, E)) {
            for (int n = 0; n < N - E; ++n) preFrozen[static_cast<std::size_t>(J[n])] = 1;
            const double limit =
                E >= 0.75 * N ? std::ceil(0.75 * N - E / 2.0) : std::ceil(9.0 * N / 16.0 - E / 4.0);
            for (int n = 0; n < limit; ++n) preFrozen[static_cast<std::size_t>(n)] = 1;
        } else {
            for (int n = E; n < N; ++n) preFrozen[static_cast<std::size_t>(J[n])] = 1;
        }
    }

    // The K + nPC most reliable of the remaining positions carry information.
    std::vector<int> candidates;
    candidates.reserve(sequence.size());
    for (int Q : sequence)
        if (!preFrozen[static_cast<std::size_t>(Q)]) candidates.push_back(Q);
    const std::size_t infoCount = static_cast<std::size_t>(K) + static_cast<std::size_t>(nPC);
    if (infoCount > candidates.size())
        throw std::invalid_argument("K + nPC (" + std::to_string(infoCount) + ") exceed the " +
                                    std::to_string(candidates.size()) + " positions left for E " +
                                    std::to_string(E));
    const auto split = candidates.end() - static_cast<std::ptrdiff_t>(infoCount);
    FrozenSet.assign(candidates.begin(), split);
    InfoSet.assign(split, candidates.end());

    buildGeneratorColumns();

    // Parity check bits: the nPC - nPCwm least reliable information positions, plus nPCwm of
    // minimum row weight among the K most reliable ones (TS 38.212 clause 5.3.1.2).
    std::vector<int> paritySet(InfoSet.begin(), InfoSet.begin() + (nPC - nPCwm));
    for (int position : minimumWeightPositions(K, nPCwm)) paritySet.push_back(position);

    Status.assign(static_cast<std::size_t>(N), 0);
    for (int n : FrozenSet) Status[static_cast<std::size_t>(n)] += kFrozen;
    for (int n : InfoSet) Status[static_cast<std::size_t>(n)] += kInfo;
    for (int n : paritySet) Status[static_cast<std::size_t>(n)] += kParity;

    U.assign(static_cast<std::size_t>(N), 0);
    return true;
}

void PolarCoding::buildGeneratorColumns() {
    // G_2s = [G_s 0; G_s G_s], grown in place from G_1 = [1] up to G_N.
    const auto size = static_cast<std::size_t>(N);
    GeneratorColumns.assign(size, BitSequence(size, 0));
    GeneratorColumns[0][0] = 1;
    for (std::size_t s = 1; s < size; s *= 2) {
        for (std::size_t j = 0; j < s; ++j) {
            auto& left = GeneratorColumns[j];
            auto& right = GeneratorColumns[j + s];
            std::copy_n(left.begin(), s, left.begin() + static_cast<std::ptrdiff_t>(s));
            std::copy_n(left.begin(), s, right.begin() + static_cast<std::ptrdiff_t>(s));
        }
    }
}

std::vector<int> PolarCoding::minimumWeightPositions(int K, int nPCwm) const {
    std::vector<int> chosen;
    if (nPCwm <= 0) return chosen;
    std::vector<int> rowWeight(static_cast<std::size_t>(N), 0);
    for (const auto& column : GeneratorColumns)
        for (std::size_t i = 0; i < column.size(); ++i) rowWeight[i] += column[i];

    // Walk the K most reliable information positions from the most reliable one down, so that
    // a strict comparison keeps the most reliable of equal weights.
    const auto mostReliable = InfoSet.rbegin();
    for (int round = 0; round < nPCwm; ++round) {
        int best = -1;
        for (auto it = mostReliable; it != mostReliable + K; ++it) {
            if (std::find(chosen.begin(), chosen.end(), *it) != chosen.end()) continue;
            if (best < 0 || rowWeight[static_cast<std::size_t>(*it)] <
                                rowWeight[static_cast<std::size_t>(best)])
                best = *it;
        }
        chosen.push_back(best);
    }
    return chosen;
}

bool PolarCoding::Encode(const BitSequence& c, BitSequence& d) {
    if (d.size() != static_cast<std::size_t>(N)) {
        ErrorMessage = "u size error";
        return false;
    }
    if (c.size() < InterleaverPattern.size())
        throw std::invalid_argument("c holds " + std::to_string(c.size()) + " bits, K is " +
                                    std::to_string(InterleaverPattern.size()));

    // Information bits, frozen bits and parity check bits into u (TS 38.212 clause 5.3.1.2).
    std::size_t k = 0;
    auto nextBit = [&] { return static_cast<char>(c[InterleaverPattern[k++]] & 1); };
    if (nPC == 0) {
        for (int n = 0; n < N; ++n) U[n] = (Status[n] & kInfo) ? nextBit() : FrozenValue;
    } else {
        // Cyclic shift register y0..y4; `head` indexes y0 and moves on by one per position,
        // which rotates the register left.
        char y[5] = {0, 0, 0, 0, 0};
        int head = 0;
        for (int n = 0; n < N; ++n) {
            head = (head + 1) % 5;
            if (Status[n] == kInfo) {
                U[n] = nextBit();
                y[head] ^= U[n];
            } else if (Status[n] == (kInfo | kParity)) {
                U[n] = y[head];
            } else {
                U[n] = FrozenValue;
            }
        }
    }

    // d = u G_N by the butterfly: stage by stage, the lower half of each block of 2 half
    // positions takes the XOR of its upper half. Same result as the product with
    // GeneratorColumns in N log N steps; the bits are packed 64 to a word (position p at bit
    // p mod 64 of word p / 64) so that one stage is a few word operations.
    std::array<std::uint64_t, kMaxCodeLength / 64> words{};
    for (int n = 0; n < N; ++n) words[n / 64] |= static_cast<std::uint64_t>(U[n] & 1) << (n % 64);
    const int wordCount = (N + 63) / 64;
    // Within a word: positions whose bit `half` is clear take the bit `half` above them.
    static constexpr std::uint64_t kLowerHalves[6] = {0x5555555555555555ULL, 0x3333333333333333ULL,
                                                      0x0F0F0F0F0F0F0F0FULL, 0x00FF00FF00FF00FFULL,
                                                      0x0000FFFF0000FFFFULL, 0x00000000FFFFFFFFULL};
    for (int stage = 0; stage < 6 && (1 << stage) < N; ++stage)
        for (int w = 0; w < wordCount; ++w)
            words[w] ^= (words[w] >> (1 << stage)) & kLowerHalves[stage];
    // Across words: the same with whole words.
    for (int half = 1; half < wordCount; half *= 2)
        for (int block = 0; block < wordCount; block += 2 * half)
            for (int w = block; w < block + half; ++w) words[w] ^= words[w + half];
    for (int n = 0; n < N; ++n) d[n] = static_cast<char>((words[n / 64] >> (n % 64)) & 1);
    return true;
}

}  // namespace Orvalis_NR
