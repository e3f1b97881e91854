#include "downlink/pbch_generator.h"

#include <gtest/gtest.h>

#include <climits>
#include <cmath>
#include <functional>
#include <ostream>
#include <set>
#include <stdexcept>
#include <string>
#include <vector>

#include "downlink/pbch_test_support.h"
#include "downlink/ssb_reference.h"
#include "test_support.h"

namespace {

using Models::Nr5g::SSBPeriod;
using ssb_test::SsbItem;
using ssb_test::Store;

struct PeriodCase {
    std::string name;
    int mu;
    SSBPeriod period;
    int halfFrame, frame;
    std::vector<int> halves;  // the half frames that carry the burst
    friend void PrintTo(const PeriodCase& c, std::ostream* os) { *os << c.name; }
};

class PbchPeriods : public ::testing::TestWithParam<PeriodCase> {};

TEST_P(PbchPeriods, ActiveBlocksFollowPeriodAndHalfFrame) {
    const PeriodCase& c = GetParam();
    SsbItem setup(c.mu, 4, c.period);
    setup.ssb->HalfFrameIndex->setValue(c.halfFrame);
    auto generator = setup.make(512);
    ASSERT_TRUE(generator->Generate(c.frame));
    ASSERT_EQ(generator->CandidateSymbols.size(), 4u);
    // The candidates (checked on their own) of each half frame that carries the burst.
    std::vector<int> expected;
    for (int h : c.halves)
        for (int s : generator->CandidateSymbols) expected.push_back(s + h * (70 << c.mu));
    EXPECT_EQ(generator->ActiveBlocks, expected);
    EXPECT_EQ(generator->ActiveCount, static_cast<int>(expected.size()));
}

// Inactive frames are those a shorter period would have taken.
INSTANTIATE_TEST_SUITE_P(
    Table, PbchPeriods,
    ::testing::Values(PeriodCase{"Every5ms", 0, SSBPeriod::HalfFrame, 1, 3, {0, 1}},
                      PeriodCase{"Every10ms_SecondHalf", 1, SSBPeriod::OneFrame, 1, 0, {1}},
                      PeriodCase{"Every20ms_OddFrame", 0, SSBPeriod::TwoFrame, 0, 3, {}},
                      PeriodCase{"Every40ms_Frame4", 1, SSBPeriod::FourFrame, 0, 4, {0}},
                      PeriodCase{"Every80ms_Frame12", 1, SSBPeriod::EightFrame, 0, 12, {}},
                      PeriodCase{"Every160ms_Frame32", 0, SSBPeriod::SixteenFrame, 0, 32, {0}},
                      PeriodCase{"Every160ms_Frame8", 0, SSBPeriod::SixteenFrame, 0, 8, {}}),
    [](const auto& info) { return info.param.name; });

TEST(PbchDmrsIndex, TheNameF00SwapsBlockIndexAndHalfFrameBit) {
    // Lmax 4 every 5 ms: i-bar is i + 4 hrf, or hrf + 4 i on a channel named with "F00".
    const std::pair<const char*, bool> names[] = {
        {"SSB F00", true}, {"f00 test", true}, {"F0 0, F01", false}};
    for (auto [name, swapped] : names) {
        SsbItem setup(0, 4, SSBPeriod::HalfFrame, "1", 12);
        setup.ssb->Name->setValue(std::string(name));
        auto generator = setup.make(512);
        generator->Generate(0);
        for (int i = 0; i < 8; ++i) {
            const int hrf = i >= 4, iSsb = i & 3;
            const auto ref = ssb_ref::pbchDmrs(swapped ? hrf + 4 * iSsb : iSsb + 4 * hrf, 12);
            const auto& dmrs = generator->DmrsSymbols[static_cast<std::size_t>(i)];
            for (std::size_t m = 0; m < ref.size(); ++m)
                ASSERT_NEAR(std::abs(dmrs[m] - ref[m]), 0.0, 1e-15) << name << " i=" << i;
        }
    }
}

TEST(PbchMap, EveryAntennaGetsTheBlockAndOnlyTheFirstBlockCarriesTheAlcBit) {
    for (bool firstChannel : {true, false}) {
        SsbItem setup(1, 4);  // Case B: blocks at 4, 8, 16, 20
        auto generator = setup.make(512);
        Store store(1, 512, 2);
        generator->Generate(0);
        generator->Map(store.grid, store.occupancy, store.flags, firstChannel, 1, false);
        EXPECT_EQ(store.grid[1], store.grid[0]);
        EXPECT_EQ(store.occupancy[1], store.occupancy[0]);
        EXPECT_EQ(store.flags[1], store.flags[0]);
        EXPECT_EQ(store.occupancy[0][store.at(4, -64)], 380);  // the first PSS element
        for (int s = 0; s < store.symbols; ++s) {
            int expected = (s >= 4 && s < 12) || (s >= 16 && s < 24) ? 1 : 0;
            if (firstChannel && s >= 4 && s < 8) expected = 3;
            ASSERT_EQ(store.flags[0][s], expected) << "s=" << s << " first=" << firstChannel;
        }
    }
}

TEST(PbchMap, ReservationWithholdsWholeResourceBlocksOnTheBlockSymbols) {
    SsbItem setup(1, 4);
    setup.ssb->FrequencyOffset->setValue(5);  // block at -115..124: not on a resource block edge
    const int width = 512;
    auto generator = setup.make(width);
    Store store(1, width);
    generator->Generate(0);
    generator->Map(store.grid, store.occupancy, store.flags, false, 1, false);
    const std::set<int> blockSymbols{4, 5, 6, 7, 8, 9, 10, 11, 16, 17, 18, 19, 20, 21, 22, 23};
    for (int s = 0; s < store.symbols; ++s)
        for (int k = -width / 2; k < width / 2; ++k) {
            const int value = store.occupancy[0][store.at(s, k)];
            const bool inBlock = blockSymbols.count(s) && k >= -115 && k < 125;
            const bool inRbs = blockSymbols.count(s) && k >= -120 && k < 132;
            if (inBlock) continue;
            ASSERT_EQ(value, inRbs ? 370 : 0) << "s=" << s << " k=" << k;
        }
}

TEST(PbchMap, AllSlotInTheNameReservesEverySymbolOfTheBlocksSlot) {
    SsbItem setup(0, 4);
    setup.ssb->Name->setValue(std::string("SSB ALLSLOT"));
    auto generator = setup.make(512);
    EXPECT_FALSE(generator->SsbSymbolsOnly);
    Store store(0, 512);
    generator->Generate(0);
    generator->Map(store.grid, store.occupancy, store.flags, false, 0, false);
    for (int s = 0; s < store.symbols; ++s) {
        const bool slot = s < 28;  // Case A, Lmax 4: blocks in slots 0 and 1
        for (int k = -120; k < 120; ++k)
            ASSERT_EQ(store.occupancy[0][store.at(s, k)] != 0, slot) << "s=" << s << " k=" << k;
        ASSERT_EQ(store.occupancy[0][store.at(s, 120)], 0);
        const int l = s % 14;  // blocks at symbols 2 and 8 of each slot
        ASSERT_EQ(store.flags[0][s] != 0, slot && ((l >= 2 && l < 6) || (l >= 8 && l < 12)))
            << "s=" << s;
    }
}

struct PlaceholderCase {
    std::string name;
    int gridMu, gridWidth;
    bool extendedCp;
    std::vector<std::pair<int, int>> symbols;  // first and last reserved symbol per block
    int firstColumn, endColumn;
    friend void PrintTo(const PlaceholderCase& c, std::ostream* os) { *os << c.name; }
};

class PbchPlaceholder : public ::testing::TestWithParam<PlaceholderCase> {};

TEST_P(PbchPlaceholder, ReservesTheScaledFootprintAndSendsNothing) {
    const PlaceholderCase& c = GetParam();
    SsbItem setup(1, 4);  // 30 kHz: Case B, blocks at 4, 8, 16, 20
    auto generator = setup.make(c.gridWidth);
    generator->ReserveOnly = true;
    Store store(c.gridMu, c.gridWidth, 2, c.extendedCp);
    generator->Generate(0);
    generator->Map(store.grid, store.occupancy, store.flags, true, c.gridMu, c.extendedCp);
    for (int a = 0; a < 2; ++a) {
        for (const complex& x : store.grid[a]) ASSERT_EQ(x, complex(0.0, 0.0));
        for (int f : store.flags[a]) ASSERT_EQ(f, 0);
        for (int s = 0; s < store.symbols; ++s) {
            bool reservedSymbol = false;
            for (auto [first, last] : c.symbols) reservedSymbol |= s >= first && s <= last;
            for (int k = -c.gridWidth / 2; k < c.gridWidth / 2; ++k) {
                const bool reserved = reservedSymbol && k >= c.firstColumn && k < c.endColumn;
                ASSERT_EQ(store.occupancy[a][store.at(s, k)], reserved ? 370 : 0)
                    << "a=" << a << " s=" << s << " k=" << k;
            }
        }
    }
}

// A 15 kHz store sees half the symbols and twice the subcarriers, a 60 kHz store the reverse;
// with the extended cyclic prefix the symbol numbers scale by 12/14.
INSTANTIATE_TEST_SUITE_P(
    Numerologies, PbchPlaceholder,
    ::testing::Values(
        PlaceholderCase{"In15k", 0, 1024, false, {{2, 3}, {4, 5}, {8, 9}, {10, 11}}, -240, 240},
        PlaceholderCase{"In60k", 2, 256, false, {{8, 15}, {16, 23}, {32, 39}, {40, 47}}, -60, 60},
        PlaceholderCase{
            "In60kExt", 2, 256, true, {{6, 13}, {13, 20}, {27, 34}, {34, 41}}, -60, 60}),
    [](const auto& info) { return info.param.name; });

TEST(PbchLevels, EachBlockTakesItsTokenModuloTheListAndZeroSwitchesABlockOff) {
    SsbItem setup(0, 4, SSBPeriod::OneFrame, "1,0,0.5");
    setup.ssb->PowerBoosting->setValue(6.0);
    setup.ssb->PSSPowerBoosting->setValue(-3.0);
    auto generator = setup.make(512);
    Store store(0, 512);
    generator->Generate(0);
    generator->Map(store.grid, store.occupancy, store.flags, false, 0, false);
    const double boost = std::pow(10.0, 6.0 / 20.0), pssBoost = std::pow(10.0, -3.0 / 20.0);
    const double levels[] = {1.0, 0.0, 0.5, 1.0};  // block 3 wraps to the first token
    const int first[] = {2, 8, 16, 22};
    for (int b = 0; b < 4; ++b) {
        const double level = levels[b] * boost;
        EXPECT_EQ(store.flags[0][first[b]] != 0, level != 0.0) << "block " << b;
        for (int l = 0; l < 4; ++l)
            for (int k = -120; k < 120; ++k) {
                // A block at level 0 reserves nothing, unused elements send nothing, and the PSS
                // has its own boost on top.
                const std::size_t at = store.at(first[b] + l, k);
                const int occupancy = store.occupancy[0][at];
                ASSERT_TRUE(level != 0.0 || occupancy == 0) << "block " << b;
                const double expected = occupancy == 370   ? 0.0
                                        : occupancy == 380 ? level * pssBoost
                                                           : level;
                ASSERT_NEAR(std::abs(store.grid[0][at]), expected, 1e-12)
                    << "block " << b << " occupancy " << occupancy;
            }
    }
}

TEST(PbchLevels, AnInactiveFrameLeavesTheStoreUntouchedAndAnEmptyListIsRefusedWhenDue) {
    SsbItem setup(0, 4, SSBPeriod::TwoFrame, "");
    auto generator = setup.make(512);
    Store store(0, 512);
    EXPECT_TRUE(generator->Generate(1));  // no block in an odd frame
    generator->Map(store.grid, store.occupancy, store.flags, true, 0, false);
    EXPECT_EQ(store.occupancy[0], std::vector<int>(store.occupancy[0].size(), 0));
    EXPECT_EQ(store.flags[0], std::vector<int>(store.flags[0].size(), 0));
    EXPECT_EQ(nrsynth_test::failureText([&] { generator->Generate(0); }),
              "PowerLevelStr holds no level. SSPBCH.PowerLevelStr \"\"");
}

TEST(PbchSetup, LevelTextIsReadAsAListWithTheTextsOfTheListSettings) {
    EXPECT_EQ(SsbItem(0, 4, SSBPeriod::OneFrame, " 0.25, 2").make(512)->DataAmplitude,
              (std::vector<double>{0.25, 2.0}));
    EXPECT_THROW(
        {
            try {
                SsbItem(0, 4, SSBPeriod::OneFrame, "1,x").make(512);
            } catch (const std::invalid_argument& e) {
                EXPECT_STREQ(e.what(), "invalid stod argument");
                throw;
            }
        },
        std::invalid_argument);
}

// Settings that would make the block overrun or overflow: each is reported, at the step that
// uses it, with the setting and its value.
struct RefusalCase {
    std::string name;
    std::function<void(SsbItem&)> set;
    int gridWidth;
    std::string expected;
    friend void PrintTo(const RefusalCase& c, std::ostream* os) { *os << c.name; }
};

class PbchRefusal : public ::testing::TestWithParam<RefusalCase> {};

TEST_P(PbchRefusal, ReportsTheSettingAndItsValue) {
    const RefusalCase& c = GetParam();
    SsbItem setup(1, 4);
    c.set(setup);
    const std::string text = nrsynth_test::failureText([&] {
        auto generator = setup.make(c.gridWidth);
        Store store(1, c.gridWidth);
        generator->Generate(0);
        generator->Map(store.grid, store.occupancy, store.flags, false, 1, false);
    });
    EXPECT_EQ(text, c.expected);
}

const std::string kPayloadText = "PayloadDataLength does not fit the PBCH payload interleaver. ";
const std::string kOffsetText = "FrequencyOffset puts the SS/PBCH block outside every frame store. ";
const std::string kHalfText = "HalfFrameIndex puts the SS/PBCH burst outside the radio frame. ";

INSTANTIATE_TEST_SUITE_P(
    Settings, PbchRefusal,
    ::testing::Values(
        // The interleaver of TS 38.212 Table 7.1.1-1 places A + 8 <= 32 bits, and A = 20 would
        // send bits to places 28..31 of a 28-bit word.
        RefusalCase{"PayloadLongerThanTheInterleaver",
                    [](SsbItem& s) { s.ssb->PayloadDataLength->setValue(30); }, 512,
                    kPayloadText + "SSPBCH.PayloadDataLength 30"},
        RefusalCase{"PayloadAtIntMax",
                    [](SsbItem& s) { s.ssb->PayloadDataLength->setValue(INT_MAX); }, 512,
                    kPayloadText + "SSPBCH.PayloadDataLength 2147483647"},
        RefusalCase{"PayloadShorterThanTheInterleaverReaches",
                    [](SsbItem& s) { s.ssb->PayloadDataLength->setValue(20); }, 512,
                    kPayloadText + "SSPBCH.PayloadDataLength 20"},
        RefusalCase{"PayloadNegative",
                    [](SsbItem& s) { s.ssb->PayloadDataLength->setValue(-1); }, 512,
                    kPayloadText + "SSPBCH.PayloadDataLength -1"},
        RefusalCase{"CellIdNegative", [](SsbItem& s) { s.carrier->CellID->setValue(-3); }, 512,
                    "CellID is negative: the PSS and SSS have no shift for it. CellID -3"},
        RefusalCase{"LmaxNegative", [](SsbItem& s) { s.ssb->Lmax->setValue(-1); }, 512,
                    "Lmax is negative. SSPBCH.Lmax -1"},
        RefusalCase{"LmaxAboveTheCandidates", [](SsbItem& s) { s.ssb->Lmax->setValue(9); }, 512,
                    "SSBlock Position Calculation Error SSPBCH.Lmax 9 with SSPBCH.Mu 1"},
        RefusalCase{"FrequencyOffsetAtIntMin",
                    [](SsbItem& s) { s.ssb->FrequencyOffset->setValue(INT_MIN); }, 512,
                    kOffsetText + "SSPBCH.FrequencyOffset -2147483648"},
        RefusalCase{"FrequencyOffsetAtIntMax",
                    [](SsbItem& s) { s.ssb->FrequencyOffset->setValue(INT_MAX); }, 512,
                    kOffsetText + "SSPBCH.FrequencyOffset 2147483647"},
        // Block up to subcarrier 219 of a store 200 wide.
        RefusalCase{"BlockBeyondTheStore",
                    [](SsbItem& s) { s.ssb->FrequencyOffset->setValue(100); }, 200,
                    "FrequencyOffset puts the SS/PBCH block outside the frame store. "
                    "SSPBCH.FrequencyOffset 100 in a store of 200 subcarriers"},
        RefusalCase{"HalfFrameIndexTwo", [](SsbItem& s) { s.ssb->HalfFrameIndex->setValue(2); },
                    512, kHalfText + "SSPBCH.HalfFrameIndex 2"},
        RefusalCase{"HalfFrameIndexAtIntMax",
                    [](SsbItem& s) { s.ssb->HalfFrameIndex->setValue(INT_MAX); }, 512,
                    kHalfText + "SSPBCH.HalfFrameIndex 2147483647"},
        RefusalCase{"HalfFrameIndexNegative",
                    [](SsbItem& s) { s.ssb->HalfFrameIndex->setValue(-1); }, 512,
                    kHalfText + "SSPBCH.HalfFrameIndex -1"}),
    [](const auto& info) { return info.param.name; });

TEST(PbchSetup, SettingsThatAreNotUsedAreNotRefused) {
    // True when the block is generated and mapped without a failure.
    auto mapsTheBlock = [](SsbItem& setup) {
        Store store(1, 512);
        const std::string text = nrsynth_test::failureText([&] {
            auto generator = setup.make(512);
            generator->Generate(0);
            generator->Map(store.grid, store.occupancy, store.flags, false, 1, false);
        });
        EXPECT_EQ(text, "");
        return setup.initResult && store.occupancy[0][store.at(4, -64)] == 380;  // first PSS
    };
    // A 5 ms burst takes its half-frame bit from the block index, not from HalfFrameIndex.
    SsbItem fiveMs(1, 4, SSBPeriod::HalfFrame);
    fiveMs.ssb->HalfFrameIndex->setValue(INT_MAX);
    EXPECT_TRUE(mapsTheBlock(fiveMs));
    // Without channel coding the block carries 864 source bits; the payload length is unused.
    for (int length : {INT_MIN, -1, 0, 30, INT_MAX}) {
        SsbItem uncoded(1, 4);
        uncoded.ssb->ChannelCoding->setValue(false);
        uncoded.ssb->PayloadDataLength->setValue(length);
        EXPECT_TRUE(mapsTheBlock(uncoded)) << "PayloadDataLength " << length;
    }
}

TEST(PbchSetup, TheSystemFrameNumberEntersTheBlockModulo1024) {
    // Only the ten LSBs of the SFN are sent: a start at the top of int followed by a few frames
    // gives the block of the SFN that the sum has modulo 1024, and nothing overflows.
    auto blockOf = [](int sfnStart, int frame) {
        SsbItem setup(0, 4, SSBPeriod::OneFrame, "1", 7);
        setup.ssb->SFNStart->setValue(sfnStart);
        auto generator = setup.make(512);
        generator->Generate(frame);
        return generator->PbchSymbols;
    };
    EXPECT_EQ(blockOf(INT_MAX, 5), blockOf(4, 0));      // 2^31 + 4
    EXPECT_EQ(blockOf(INT_MIN, 6), blockOf(0, 6));      // -2^31 is 0 modulo 1024
    EXPECT_NE(blockOf(INT_MAX, 5), blockOf(INT_MAX, 6));  // the SFN still moves on
}

TEST(PbchUncoded, SourceBitsGoStraightToTheSecondScramblingAndFlowOnAcrossBlocks) {
    const std::string pattern = "1110010";
    SsbItem setup(0, 4, SSBPeriod::OneFrame, "1", 33);
    setup.ssb->ChannelCoding->setValue(false);
    setup.ssb->PayloadDataLength->setValue(INT_MAX);  // not used without coding
    auto payload = setup.ssb->PayloadData->getValue();
    payload->PayLoadDataType->setValue(Models::Nr5g::PayloadDataType::Pattern);
    payload->PatternBits->setValue(pattern);
    auto generator = setup.make(512);
    generator->Generate(0);
    const ssb_ref::Bits gold = ssb_ref::goldSequence(33, 4 * 864);
    for (int i = 0; i < 4; ++i) {
        const auto& symbols = generator->PbchSymbols[static_cast<std::size_t>(i)];
        for (int n = 0; n < 864; ++n) {
            const double part = n % 2 ? symbols[n / 2].imag() : symbols[n / 2].real();
            const int bit = (part < 0) ^ gold[static_cast<std::size_t>(i * 864 + n)];
            ASSERT_EQ(bit, pattern[(i * 864 + n) % pattern.size()] - '0')
                << "block " << i << " n " << n;
        }
    }
}

}  // namespace
