// PBCH round trip: the bits of each mapped block are taken back out of the frame store,
// demodulated and descrambled, and compared with the MIB (or pattern) and timing bits of the
// block coded by plain forms of TS 38.211 / 38.212 written here and in the polar reference of
// the coding tests.

#include <gtest/gtest.h>

#include <cmath>
#include <ostream>
#include <string>
#include <vector>

#include "coding/polar_reference.h"
#include "downlink/pbch_test_support.h"
#include "downlink/ssb_reference.h"

namespace {

using ssb_ref::Bits;

struct RoundTripCase {
    std::string name;
    int mu, option30k, lmax;
    Models::Nr5g::SSBPeriod period;
    int halfFrame, cellId, sfnStart, frame, frequencyOffset;
    bool autoMib, scrambleBefore, scrambleAfter;
    friend void PrintTo(const RoundTripCase& c, std::ostream* os) { *os << c.name; }
};

constexpr int kA = 24;  // payload bits
constexpr int kK = kA + 8 + 24;
constexpr int kE = 864;
const std::string kPattern = "110100111000101011110010110";

// The bits a block must carry, MSB first: the BCCH-BCH-Message of TS 38.331 for the MIB
// settings (choice bit, SFN 6 MSBs, subCarrierSpacingCommon, ssb-SubcarrierOffset,
// dmrs-TypeA-Position, pdcch-ConfigSIB1, cellBarred, intraFreqReselection, spare) or, without
// AutoMIB, the start of the pattern in every block; then the timing bits of a-bar, TS 38.212
// clause 7.1.1.
Bits expectedBits(const Models::Nr5g::NRMIB& mib, bool autoMib, int sfn, int hrf, int candidate,
                  int lmax) {
    using namespace Models::Nr5g;
    Bits bits;
    auto put = [&bits](int value, int width) {
        for (int b = width - 1; b >= 0; --b) bits.push_back(static_cast<char>((value >> b) & 1));
    };
    const int kSsb = mib.SsbSubcarrierOffset->getValue();
    if (autoMib) {
        const auto scs = mib.SubcarrierSpacingCommon->getValue();
        put(0, 1);
        put(sfn >> 4, 6);
        put(scs == SubcarrierSpacing::SCS30k || scs == SubcarrierSpacing::SCS120k, 1);
        put(kSsb, 4);
        put(mib.DmrstypeApos->getValue() == 3, 1);
        put(mib.PdcchConfigSIB1->getValue(), 8);
        put(mib.CellBarred->getValue() == CellBarred::notBarred, 1);
        put(mib.IntraFreqReselection->getValue() == IntraFreqReselection::notAllowed, 1);
        put(0, 1);
    } else {
        for (int i = 0; i < kA; ++i) bits.push_back(static_cast<char>(kPattern[i] - '0'));
    }
    put(sfn, 4);
    put(hrf, 1);
    put(lmax == 64 ? candidate >> 3 : (kSsb >> 4) << 2, 3);
    return bits;
}

// The interleaver of TS 38.212 clause 7.1.1: `to[i]` is the place in a-prime of bit i of a-bar;
// `skip[j]` marks the places of a-prime whose bits clause 7.1.2 leaves unscrambled.
struct Placement {
    std::vector<int> to;
    std::vector<bool> skip = std::vector<bool>(kA + 8);

    explicit Placement(int lmax) {
        const std::vector<int>& g = ssb_ref::pbchInterleaver();
        int jSfn = 0, jSsb = 11, jOther = 14;
        for (int i = 0; i < kA + 8; ++i) {
            const bool sfn = (i >= 1 && i <= 6) || (i >= kA && i <= kA + 3);
            const bool hrf = i == kA + 4, tail = i >= kA + 5;
            to.push_back(sfn ? g[jSfn++] : hrf ? g[10] : tail ? g[jSsb++] : g[jOther++]);
            if (i == kA + 1 || i == kA + 2 || hrf || (tail && lmax == 64)) skip[to.back()] = true;
        }
    }
};

// TS 38.211 Table 7.4.3.1-1 written out: the content of symbol l, subcarrier k, of an SS/PBCH
// block for v = cellId mod 4, as its occupancy value (PSS 380, SSS 390, unused 370, PBCH data
// 400, DM-RS 410).
int expectedOccupancy(int l, int k, int v) {
    const bool sync = k >= 56 && k <= 182, dmrsComb = (k - v) % 4 == 0 && k >= v;
    if (l == 0) return sync ? 380 : 370;
    if (l == 2 && sync) return 390;
    if (l == 2 && ((k >= 48 && k <= 55) || (k >= 183 && k <= 191))) return 370;
    return dmrsComb ? 410 : 400;
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
    auto& mib = *ssb.MIB->getValue();
    // The MIB fields follow the cell id, so that each value of each field is sent by some case.
    using Models::Nr5g::CellBarred, Models::Nr5g::IntraFreqReselection;
    const bool odd = c.cellId % 2;
    mib.SubcarrierSpacingCommon->setValue(
        static_cast<Models::Nr5g::SubcarrierSpacing>(c.cellId % 4));  // 15k..120k
    mib.SsbSubcarrierOffset->setValue(odd ? 27 : 10);                 // 27: k_SSB above 15
    mib.DmrstypeApos->setValue(odd ? 3 : 2);
    mib.PdcchConfigSIB1->setValue(odd ? 0x4B : 0xB4);
    mib.CellBarred->setValue(odd ? CellBarred::notBarred : CellBarred::barred);
    mib.IntraFreqReselection->setValue(odd ? IntraFreqReselection::allowed
                                           : IntraFreqReselection::notAllowed);

    const int width = 512;
    auto generator = setup.make(width);
    ASSERT_TRUE(setup.initResult) << generator->ErrorMessage;
    ssb_test::Store store(c.mu, width);
    for (int f = 0; f <= c.frame; ++f)
        ASSERT_TRUE(generator->Generate(f));  // payload stream moves on
    ASSERT_TRUE(generator->Map(store.grid, store.occupancy, store.flags, true, c.mu, false));
    ASSERT_GT(generator->ActiveCount, 0);

    // The system frame number counts modulo 1024 (TS 38.331): a start near the top of int wraps.
    const int sfn = static_cast<int>((static_cast<long long>(c.sfnStart) + c.frame) % 1024);
    const Placement place(c.lmax);
    const Bits gold = ssb_ref::goldSequence(c.cellId, 8 * kE);
    const double levels[] = {1.0, 0.5, 2.0};

    for (int i = 0; i < generator->ActiveCount; ++i) {
        SCOPED_TRACE("block " + std::to_string(i));
        const int p = generator->ActiveBlocks[i];
        const int candidate = i % c.lmax;
        const int hrf =
            c.period == Models::Nr5g::SSBPeriod::HalfFrame ? (i >= c.lmax ? 1 : 0) : c.halfFrame;

        // Every element of the block holds the content of the table; PBCH data and DM-RS are
        // read in the order of TS 38.211 clause 7.4.3.1.3.
        std::vector<complex> data, dmrs;
        for (int l = 0; l < 4; ++l)
            for (int k = 0; k < 240; ++k) {
                const std::size_t at = store.at(p + l, c.frequencyOffset - 120 + k);
                const int occupancy = store.occupancy[0][at];
                ASSERT_EQ(occupancy, expectedOccupancy(l, k, c.cellId % 4)) << l << ", " << k;
                if (occupancy == 400) data.push_back(store.grid[0][at]);
                if (occupancy == 410) dmrs.push_back(store.grid[0][at]);
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

        // The bits the block must carry through the reference chain: payload interleaver and
        // first scrambling (TS 38.212 clauses 7.1.1, 7.1.2), CRC24C, polar coding with the input
        // interleaver, rate matching (clauses 5.1, 5.3.1, 5.4.1).
        const Bits aBar = expectedBits(mib, c.autoMib, sfn, hrf, candidate, c.lmax);
        Bits word(kA + 8);
        for (int j = 0; j < kA + 8; ++j) word[place.to[j]] = aBar[j];
        if (c.scrambleBefore) {
            const int mBits = c.lmax == 64 ? kA + 2 : kA + 5, vSfn = (sfn / 2) % 4;
            int used = 0;
            for (int j = 0; j < kA + 8; ++j)
                if (!place.skip[j]) word[j] ^= gold[vSfn * mBits + used++];
            ASSERT_EQ(used, mBits);
        }
        const unsigned parity = ssb_ref::crc24cRemainder(word);
        for (int b = 23; b >= 0; --b) word.push_back(static_cast<char>((parity >> b) & 1));
        const Bits d = polar_ref::butterfly(polar_ref::encoderInput(word, kE, 9, 1, 0, 0));
        ASSERT_EQ(e, polar_ref::rateMatch(d, kK, kE, 0));
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
        // N_ID past 1007, and so large that the DM-RS cInit passes 2^31; SFN start at the top.
        RoundTripCase{"CaseA_L8_CellIdPast1007_SfnStartAtIntMax", 0, 0, 8, P::OneFrame, 0, 8000001,
                      2147483647, 2, 0, true, true, true},
        RoundTripCase{"CaseB_L4_5ms_CellId1008", 1, 0, 4, P::HalfFrame, 0, 1008, 77, 0, 0, true,
                      true, true},
        RoundTripCase{"Pattern_L8_OnlySecondScrambling", 0, 0, 8, P::OneFrame, 1, 21, 40, 1, 0,
                      false, false, true},
        RoundTripCase{"Pattern_L4_SecondHalf_Unscrambled", 1, 0, 4, P::OneFrame, 1, 6, 3, 0, 0,
                      false, false, false}),
    [](const auto& info) { return info.param.name; });

}  // namespace
