// PBCH round trip: the bits of each mapped block are taken back out of the frame store,
// demodulated, descrambled and decoded with plain forms of TS 38.211 / 38.212 written here and
// in the polar reference of the coding tests, and compared with the MIB and timing bits the
// block must carry.

#include <gtest/gtest.h>

#include <ostream>
#include <set>
#include <string>
#include <vector>

#include "coding/polar_reference.h"
#include "downlink/pbch_test_support.h"
#include "downlink/ssb_reference.h"

namespace {

using ssb_ref::Bits;

struct RoundTripCase {
    std::string name;
    int mu;
    int option30k;
    int lmax;
    Models::Nr5g::SSBPeriod period;
    int halfFrame;
    int cellId;
    int sfnStart;
    int frame;
    int frequencyOffset;
    bool autoMib;
    bool scrambleBefore;
    bool scrambleAfter;
    friend void PrintTo(const RoundTripCase& c, std::ostream* os) { *os << c.name; }
};

constexpr int kA = 24;  // payload bits
constexpr int kK = kA + 8 + 24;
constexpr int kE = 864;
const std::string kPattern = "110100111000101011110010110";

// The BCCH-BCH-Message of TS 38.331 for the MIB settings of `setup`: the choice bit, then
// systemFrameNumber (6 MSBs), subCarrierSpacingCommon, ssb-SubcarrierOffset, dmrs-TypeA-Position,
// pdcch-ConfigSIB1, cellBarred, intraFreqReselection, spare.
Bits expectedMib(const Models::Nr5g::NRMIB& mib, int sfn) {
    Bits bits{0};
    auto put = [&bits](int value, int width) {
        for (int b = width - 1; b >= 0; --b) bits.push_back(static_cast<char>((value >> b) & 1));
    };
    put(sfn >> 4, 6);
    const auto scs = mib.SubcarrierSpacingCommon->getValue();
    put(scs == Models::Nr5g::SubcarrierSpacing::SCS30k ||
                scs == Models::Nr5g::SubcarrierSpacing::SCS120k
            ? 1
            : 0,
        1);
    put(mib.SsbSubcarrierOffset->getValue(), 4);
    put(mib.DmrstypeApos->getValue() == 3 ? 1 : 0, 1);
    put(mib.PdcchConfigSIB1->getValue(), 8);
    put(mib.CellBarred->getValue() == Models::Nr5g::CellBarred::notBarred ? 1 : 0, 1);
    put(mib.IntraFreqReselection->getValue() == Models::Nr5g::IntraFreqReselection::notAllowed ? 1
                                                                                               : 0,
        1);
    put(0, 1);
    return bits;
}

Bits patternStart(int length) {
    Bits bits;
    for (int i = 0; i < length; ++i) bits.push_back(static_cast<char>(kPattern[i] - '0'));
    return bits;
}

// a-bar of TS 38.212 clause 7.1.1: payload and the eight timing bits.
Bits withTiming(Bits payload, int sfn, int hrf, int candidate, int lmax, int kSsb) {
    for (int b = 3; b >= 0; --b) payload.push_back(static_cast<char>((sfn >> b) & 1));
    payload.push_back(static_cast<char>(hrf));
    if (lmax == 64) {
        for (int b = 5; b >= 3; --b) payload.push_back(static_cast<char>((candidate >> b) & 1));
    } else {
        payload.push_back(static_cast<char>((kSsb >> 4) & 1));
        payload.push_back(0);
        payload.push_back(0);
    }
    return payload;
}

// The interleaver of TS 38.212 clause 7.1.1: for each position of a-bar, its place in a-prime,
// and whether it is one of the bits that clause 7.1.2 leaves unscrambled.
struct Placement {
    std::vector<int> to;
    std::vector<bool> unscrambled;
};

Placement placement(int lmax) {
    const std::vector<int>& g = ssb_ref::pbchInterleaver();
    Placement p;
    int jSfn = 0, jSsb = 11, jOther = 14;
    for (int i = 0; i < kA + 8; ++i) {
        const bool sfn = (i >= 1 && i <= 6) || (i >= kA && i <= kA + 3);
        const bool hrf = i == kA + 4;
        const bool tail = i >= kA + 5;
        p.to.push_back(sfn ? g[jSfn++] : hrf ? g[10] : tail ? g[jSsb++] : g[jOther++]);
        p.unscrambled.push_back(i == kA + 1 || i == kA + 2 || hrf || (tail && lmax == 64));
    }
    return p;
}

class PbchRoundTrip : public ::testing::TestWithParam<RoundTripCase> {};

TEST_P(PbchRoundTrip, EveryMappedBlockDecodesToItsMibAndTimingBits) {
    const RoundTripCase& c = GetParam();
    ssb_test::SsbItem setup(c.mu, c.lmax, c.period, "1,0.5,2", c.cellId);
    auto& ssb = *setup.ssb;
    ssb.SSB30KSymbolIndex->setValue(static_cast<Models::Nr5g::SSB30KSymbolIndex>(c.option30k));
    ssb.HalfFrameIndex->setValue(c.halfFrame);
    ssb.SFNStart->setValue(c.sfnStart);
    ssb.FrequencyOffset->setValue(c.frequencyOffset);
    ssb.AutoMIB->setValue(c.autoMib);
    ssb.ScramblingBeforeChannelCoding->setValue(c.scrambleBefore);
    ssb.ScramblingAfterChannelCoding->setValue(c.scrambleAfter);
    ssb.PowerBoosting->setValue(3.0);
    auto payload = ssb.PayloadData->getValue();
    payload->PayLoadDataType->setValue(Models::Nr5g::PayloadDataType::Pattern);
    payload->PatternBits->setValue(kPattern);
    auto mib = ssb.MIB->getValue();
    mib->SubcarrierSpacingCommon->setValue(Models::Nr5g::SubcarrierSpacing::SCS120k);
    mib->SsbSubcarrierOffset->setValue(c.cellId % 2 ? 27 : 10);  // 27: k_SSB above 15
    mib->DmrstypeApos->setValue(3);
    mib->PdcchConfigSIB1->setValue(0xB4);
    mib->CellBarred->setValue(Models::Nr5g::CellBarred::notBarred);

    const int width = 512;
    auto generator = setup.make(width);
    ASSERT_TRUE(setup.initResult) << generator->ErrorMessage;
    ssb_test::Store store(c.mu, width);
    for (int f = 0; f <= c.frame; ++f)
        ASSERT_TRUE(generator->Generate(f));  // payload stream moves on
    ASSERT_TRUE(generator->Map(store.grid, store.occupancy, store.flags, true, c.mu, false));
    ASSERT_GT(generator->ActiveCount, 0);

    const int sfn = c.sfnStart + c.frame;
    const Placement place = placement(c.lmax);
    const polar_ref::Sets sets = polar_ref::sets(kK, kE, 9, 0, 0);
    ASSERT_EQ(sets.N, 512);
    const std::set<int> info(sets.info.begin(), sets.info.end());
    const Bits gold = ssb_ref::goldSequence(c.cellId, 8 * kE);
    const double levels[] = {1.0, 0.5, 2.0};

    for (int i = 0; i < generator->ActiveCount; ++i) {
        SCOPED_TRACE("block " + std::to_string(i));
        const int p = generator->ActiveBlocks[i];
        const int candidate = i % c.lmax;
        const int hrf =
            c.period == Models::Nr5g::SSBPeriod::HalfFrame ? (i >= c.lmax ? 1 : 0) : c.halfFrame;

        // Resource elements of the block, in the order of TS 38.211 clause 7.4.3.1.3.
        std::vector<complex> data, dmrs;
        for (int l = 1; l < 4; ++l)
            for (int k = 0; k < 240; ++k) {
                const std::size_t at = store.at(p + l, c.frequencyOffset - 120 + k);
                if (store.occupancy[0][at] == 400) data.push_back(store.grid[0][at]);
                if (store.occupancy[0][at] == 410) dmrs.push_back(store.grid[0][at]);
            }
        ASSERT_EQ(data.size(), 432u);
        ASSERT_EQ(dmrs.size(), 144u);

        // DM-RS: i-bar from the candidate index (and the half frame for Lmax 4).
        const double amplitude = levels[i % 3] * std::pow(10.0, 3.0 / 20.0);
        const int iBar = c.lmax == 4 ? candidate + 4 * hrf : candidate & 7;
        const auto refDmrs = ssb_ref::pbchDmrs(iBar, c.cellId);
        for (int m = 0; m < 144; ++m)
            ASSERT_NEAR(std::abs(dmrs[m] / amplitude - refDmrs[m]), 0.0, 1e-12) << "m=" << m;

        // QPSK hard decisions, then the second scrambling, v the 2 or 3 LSBs of the index.
        Bits e;
        for (const complex& x : data) {
            ASSERT_NEAR(std::abs(x), amplitude, 1e-12);
            e.push_back(x.real() < 0);
            e.push_back(x.imag() < 0);
        }
        const int v = candidate & (c.lmax == 4 ? 3 : 7);
        if (c.scrambleAfter)
            for (int n = 0; n < kE; ++n) e[n] ^= gold[v * kE + n];

        // Rate recovery (repetition: E > N), then u = d G_N since G_N is its own inverse.
        Bits d(512);
        for (int n = 0; n < 512; ++n) d[polar_ref::subBlockJ(n, 512)] = e[n];
        for (int k = 512; k < kE; ++k) ASSERT_EQ(e[k], e[k - 512]) << "repetition k=" << k;
        const Bits u = polar_ref::butterfly(d);
        Bits cPrime;
        for (int n = 0; n < 512; ++n) {
            if (info.count(n))
                cPrime.push_back(u[n]);
            else
                ASSERT_EQ(u[n], 0) << "frozen position " << n;
        }
        // Undo the input interleaver of TS 38.212 clause 5.3.1.1.
        Bits crcWord(kK);
        int k = 0;
        for (int m = 0; m < 164; ++m) {
            const int pi = polar_ref::interleavingPattern()[m];
            if (pi >= 164 - kK) crcWord[pi - (164 - kK)] = cPrime[k++];
        }
        ASSERT_EQ(ssb_ref::crc24cRemainder(crcWord), 0u);

        // The same code word re-encoded by the reference chain gives the same 864 bits.
        ASSERT_EQ(
            polar_ref::rateMatch(
                polar_ref::butterfly(polar_ref::encoderInput(crcWord, kE, 9, 1, 0, 0)), kK, kE, 0),
            e);

        // Undo the first scrambling and the payload interleaver.
        Bits aPrime(crcWord.begin(), crcWord.begin() + kA + 8);
        if (c.scrambleBefore) {
            const int mBits = c.lmax == 64 ? kA + 2 : kA + 5;
            const int vSfn = (sfn / 2) % 4;
            // Positions of a-prime that carry an unscrambled bit.
            std::vector<bool> skip(kA + 8, false);
            for (int j = 0; j < kA + 8; ++j)
                if (place.unscrambled[j]) skip[place.to[j]] = true;
            int used = 0;
            for (int j = 0; j < kA + 8; ++j)
                if (!skip[j]) aPrime[j] ^= gold[vSfn * mBits + used++];
            ASSERT_EQ(used, mBits);
        }
        Bits aBar(kA + 8);
        for (int j = 0; j < kA + 8; ++j) aBar[j] = aPrime[place.to[j]];

        // Without AutoMIB every block carries the pattern from its start.
        const Bits expected =
            withTiming(c.autoMib ? expectedMib(*mib, sfn) : patternStart(kA), sfn, hrf, candidate,
                       c.lmax, mib->SsbSubcarrierOffset->getValue());
        ASSERT_EQ(aBar, expected);
    }
}

using P = Models::Nr5g::SSBPeriod;
INSTANTIATE_TEST_SUITE_P(
    Cases, PbchRoundTrip,
    ::testing::Values(
        RoundTripCase{"CaseA_L4_10ms", 0, 0, 4, P::OneFrame, 0, 0, 0, 0, 0, true, true, true},
        RoundTripCase{"CaseB_L8_5ms", 1, 0, 8, P::HalfFrame, 0, 137, 517, 2, 24, true, true, true},
        RoundTripCase{"CaseC_L4_5ms_SfnPast1023", 1, 1, 4, P::HalfFrame, 0, 1007, 1023, 1, -36,
                      true, true, true},
        RoundTripCase{"CaseD_L64_20ms_SecondHalf", 3, 0, 64, P::TwoFrame, 1, 55, 6, 2, 0, true,
                      true, true},
        RoundTripCase{"CaseE_L64_10ms", 4, 0, 64, P::OneFrame, 0, 998, 300, 0, 12, true, true,
                      true},
        RoundTripCase{"Pattern_L8_OnlySecondScrambling", 0, 0, 8, P::OneFrame, 1, 21, 40, 1, 0,
                      false, false, true},
        RoundTripCase{"Pattern_L4_Unscrambled", 1, 0, 4, P::OneFrame, 0, 6, 3, 0, 0, false, false,
                      false}),
    [](const auto& info) { return info.param.name; });

}  // namespace
