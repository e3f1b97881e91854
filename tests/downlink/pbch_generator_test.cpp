#include "downlink/pbch_generator.h"

#include <gtest/gtest.h>

#include <cmath>
#include <ostream>
#include <set>
#include <stdexcept>
#include <string>
#include <vector>

#include "downlink/pbch_test_support.h"
#include "downlink/ssb_reference.h"

namespace {

using Models::Nr5g::SSBPeriod;
using ssb_test::SsbItem;
using ssb_test::Store;

std::vector<int> plus(std::vector<int> symbols, int offset) {
    for (int& s : symbols) s += offset;
    return symbols;
}

std::vector<int> concat(std::vector<int> a, const std::vector<int>& b) {
    a.insert(a.end(), b.begin(), b.end());
    return a;
}

// ---------------------------------------------------------------------------- MIB

struct MibCase {
    Models::Nr5g::SubcarrierSpacing scs;
    int kSsb, dmrsPos, sib1;
    Models::Nr5g::CellBarred barred;
    Models::Nr5g::IntraFreqReselection reselection;
    int sfn;
    std::string bits;  // TS 38.331 MIB, choice bit first
};

class PbchMib : public ::testing::TestWithParam<MibCase> {};

TEST_P(PbchMib, FieldsFollowTheOrderOfTheMessage) {
    const MibCase& c = GetParam();
    SsbItem setup(1, 4);
    auto mib = setup.ssb->MIB->getValue();
    mib->SubcarrierSpacingCommon->setValue(c.scs);
    mib->SsbSubcarrierOffset->setValue(c.kSsb);
    mib->DmrstypeApos->setValue(c.dmrsPos);
    mib->PdcchConfigSIB1->setValue(c.sib1);
    mib->CellBarred->setValue(c.barred);
    mib->IntraFreqReselection->setValue(c.reselection);
    auto generator = setup.make(512);
    BitSequence bits(26, 7);
    generator->GenerateMIB(bits, c.sfn);
    std::string text;
    for (int i = 0; i < 24; ++i) text += static_cast<char>('0' + bits[i]);
    EXPECT_EQ(text, c.bits);
    EXPECT_EQ(bits[24], 7);  // nothing past the 24 bits
}

using S = Models::Nr5g::SubcarrierSpacing;
using B = Models::Nr5g::CellBarred;
using R = Models::Nr5g::IntraFreqReselection;
INSTANTIATE_TEST_SUITE_P(Fields, PbchMib,
                         ::testing::Values(
                             //               choice sfn    scs kSSB pos sib1     barred resel spare
                             MibCase{S::SCS30k, 11, 3, 0xA5, B::notBarred, R::notAllowed, 695,
                                     "0"
                                     "101011"
                                     "1"
                                     "1011"
                                     "1"
                                     "10100101"
                                     "1"
                                     "1"
                                     "0"},
                             MibCase{S::SCS15k, 0, 2, 0, B::barred, R::allowed, 0,
                                     "0"
                                     "000000"
                                     "0"
                                     "0000"
                                     "0"
                                     "00000000"
                                     "0"
                                     "0"
                                     "0"},
                             MibCase{S::SCS60k, 5, 2, 0xFF, B::barred, R::notAllowed, 1023,
                                     "0"
                                     "111111"
                                     "0"
                                     "0101"
                                     "0"
                                     "11111111"
                                     "0"
                                     "1"
                                     "0"},
                             MibCase{S::SCS120k, 16, 3, 1, B::notBarred, R::allowed,
                                     1024 + 16,  // kSSB 16: 4 LSBs only
                                     "0"
                                     "000001"
                                     "1"
                                     "0000"
                                     "1"
                                     "00000001"
                                     "1"
                                     "0"
                                     "0"}));

TEST(PbchMibSize, AShortVectorIsRefused) {
    SsbItem setup(1, 4);
    auto generator = setup.make(512);
    BitSequence bits(23);
    EXPECT_THROW(generator->GenerateMIB(bits, 0), std::out_of_range);
}

// ---------------------------------------------------------------------------- active blocks

struct PeriodCase {
    std::string name;
    int mu, lmax;
    SSBPeriod period;
    int halfFrame, frame;
    std::vector<int> expected;
    friend void PrintTo(const PeriodCase& c, std::ostream* os) { *os << c.name; }
};

const std::vector<int> kCaseA8 = {2, 8, 16, 22, 30, 36, 44, 50};
const std::vector<int> kCaseA4 = {2, 8, 16, 22};
const std::vector<int> kCaseB8 = {4, 8, 16, 20, 32, 36, 44, 48};

class PbchPeriods : public ::testing::TestWithParam<PeriodCase> {};

TEST_P(PbchPeriods, ActiveBlocksFollowPeriodAndHalfFrame) {
    const PeriodCase& c = GetParam();
    SsbItem setup(c.mu, c.lmax, c.period);
    setup.ssb->HalfFrameIndex->setValue(c.halfFrame);
    auto generator = setup.make(512);
    ASSERT_TRUE(setup.initResult);
    ASSERT_TRUE(generator->Generate(c.frame));
    EXPECT_EQ(generator->ActiveCount, static_cast<int>(c.expected.size()));
    EXPECT_EQ(generator->ActiveBlocks, c.expected);
    EXPECT_EQ(generator->ActiveBase, 0);
}

INSTANTIATE_TEST_SUITE_P(
    Table, PbchPeriods,
    ::testing::Values(
        PeriodCase{"Every5ms_BothHalves", 0, 4, SSBPeriod::HalfFrame, 1, 3,
                   concat(kCaseA4, plus(kCaseA4, 70))},
        PeriodCase{"Every10ms_FirstHalf", 0, 8, SSBPeriod::OneFrame, 0, 5, kCaseA8},
        PeriodCase{"Every10ms_SecondHalf", 1, 8, SSBPeriod::OneFrame, 1, 0, plus(kCaseB8, 140)},
        PeriodCase{"Every20ms_EvenFrame", 0, 4, SSBPeriod::TwoFrame, 0, 2, kCaseA4},
        PeriodCase{"Every20ms_OddFrame", 0, 4, SSBPeriod::TwoFrame, 0, 3, {}},
        PeriodCase{"Every40ms_Frame4", 0, 4, SSBPeriod::FourFrame, 0, 4, kCaseA4},
        PeriodCase{"Every40ms_Frame2", 0, 4, SSBPeriod::FourFrame, 0, 2, {}},
        PeriodCase{"Every80ms_Frame8", 1, 8, SSBPeriod::EightFrame, 1, 8, plus(kCaseB8, 140)},
        PeriodCase{"Every80ms_Frame12", 1, 8, SSBPeriod::EightFrame, 0, 12, {}},
        PeriodCase{"Every160ms_Frame32", 0, 4, SSBPeriod::SixteenFrame, 0, 32, kCaseA4},
        PeriodCase{"Every160ms_Frame8", 0, 4, SSBPeriod::SixteenFrame, 0, 8, {}}),
    [](const auto& info) { return info.param.name; });

TEST(PbchPeriodsStore, AnInactiveFrameLeavesTheStoreUntouched) {
    SsbItem setup(0, 4, SSBPeriod::TwoFrame);
    auto generator = setup.make(512);
    Store store(0, 512);
    generator->Generate(1);
    generator->Map(store.grid, store.occupancy, store.flags, true, 0, false);
    for (std::size_t i = 0; i < store.occupancy[0].size(); ++i) ASSERT_EQ(store.occupancy[0][i], 0);
    for (int f : store.flags[0]) ASSERT_EQ(f, 0);
}

// ---------------------------------------------------------------------------- DM-RS indices

std::vector<complex> dmrsOf(const Orvalis_NR::PBCH_Generator& g, int block) {
    return g.DmrsSymbols[static_cast<std::size_t>(block)];
}

void expectDmrs(const std::vector<complex>& actual, int iBar, int cellId) {
    const auto ref = ssb_ref::pbchDmrs(iBar, cellId);
    ASSERT_EQ(actual.size(), ref.size());
    for (std::size_t m = 0; m < ref.size(); ++m)
        ASSERT_NEAR(std::abs(actual[m] - ref[m]), 0.0, 1e-15) << "iBar=" << iBar << " m=" << m;
}

TEST(PbchDmrsIndex, Lmax4Every5msTakesTheHalfFrameBitIntoIBar) {
    SsbItem setup(0, 4, SSBPeriod::HalfFrame, "1", 301);
    auto generator = setup.make(512);
    generator->Generate(0);
    ASSERT_EQ(generator->ActiveCount, 8);
    for (int i = 0; i < 8; ++i) expectDmrs(dmrsOf(*generator, i), i, 301);  // i-bar 0..7
}

TEST(PbchDmrsIndex, Lmax8Every5msRepeatsTheIndicesInTheSecondHalf) {
    SsbItem setup(1, 8, SSBPeriod::HalfFrame, "1", 77);
    auto generator = setup.make(512);
    generator->Generate(0);
    ASSERT_EQ(generator->ActiveCount, 16);
    for (int i = 0; i < 16; ++i) expectDmrs(dmrsOf(*generator, i), i & 7, 77);
}

TEST(PbchDmrsIndex, Lmax4InTheSecondHalfFrameOfA10msPeriod) {
    SsbItem setup(1, 4, SSBPeriod::OneFrame, "1", 5);
    setup.ssb->HalfFrameIndex->setValue(1);
    auto generator = setup.make(512);
    generator->Generate(0);
    for (int i = 0; i < 4; ++i) expectDmrs(dmrsOf(*generator, i), i + 4, 5);
}

TEST(PbchDmrsIndex, TheNameF00SwapsBlockIndexAndHalfFrameBit) {
    for (const char* name : {"SSB F00", "f00 test"}) {
        SsbItem setup(0, 4, SSBPeriod::HalfFrame, "1", 12);
        setup.ssb->Name->setValue(std::string(name));
        auto generator = setup.make(512);
        generator->Generate(0);
        for (int i = 0; i < 8; ++i) expectDmrs(dmrsOf(*generator, i), (i >= 4) + 4 * (i & 3), 12);
    }
    SsbItem plain(0, 4, SSBPeriod::HalfFrame, "1", 12);
    plain.ssb->Name->setValue(std::string("F0 0, F01"));  // no exact "F00"
    auto generator = plain.make(512);
    generator->Generate(0);
    expectDmrs(dmrsOf(*generator, 5), 5, 12);
}

// ---------------------------------------------------------------------------- mapping

TEST(PbchMap, BlockLandsAroundTheCentreWithNegativeSubcarriersAtTheTop) {
    SsbItem setup(1, 4, SSBPeriod::OneFrame, "1", 4);  // Case B: blocks at 4, 8, 16, 20
    setup.ssb->FrequencyOffset->setValue(10);
    const int width = 512;
    auto generator = setup.make(width);
    Store store(1, width, 2);
    generator->Generate(0);
    generator->Map(store.grid, store.occupancy, store.flags, true, 1, false);
    EXPECT_EQ(generator->BlockStart, -110);
    for (int a = 0; a < 2; ++a) {
        for (int p : {4, 8, 16, 20}) {
            // PSS element n at block subcarrier 56 + n, that is -110 + 56 + n from the centre.
            for (int n = 0; n < 127; ++n) {
                const std::size_t at = store.at(p, -54 + n);
                ASSERT_EQ(store.occupancy[a][at], 380);
                ASSERT_EQ(store.grid[a][at], complex(generator->Pss[n], 0.0));
            }
            EXPECT_EQ(store.occupancy[a][store.at(p + 2, -110 + 56)], 390);
            EXPECT_EQ(store.occupancy[a][store.at(p + 3, 129)], 400);  // block subcarrier 239
        }
    }
}

TEST(PbchMap, SymbolMarksCarryTheAlcBitOnlyOnTheFirstBlock) {
    for (bool firstChannel : {true, false}) {
        SsbItem setup(1, 4);
        auto generator = setup.make(512);
        Store store(1, 512, 2);
        generator->Generate(0);
        generator->Map(store.grid, store.occupancy, store.flags, firstChannel, 1, false);
        for (int a = 0; a < 2; ++a)
            for (int s = 0; s < store.symbols; ++s) {
                int expected = 0;
                if ((s >= 4 && s < 12) || (s >= 16 && s < 24)) expected = 1;
                if (firstChannel && s >= 4 && s < 8) expected = 3;
                ASSERT_EQ(store.flags[a][s], expected)
                    << "s=" << s << " firstChannel=" << firstChannel;
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
    EXPECT_EQ(generator->RbStart, -10);
    EXPECT_EQ(generator->RbEnd, 11);
    const std::set<int> blockSymbols{4, 5, 6, 7, 8, 9, 10, 11, 16, 17, 18, 19, 20, 21, 22, 23};
    for (int s = 0; s < store.symbols; ++s)
        for (int k = -width / 2; k < width / 2; ++k) {
            const int value = store.occupancy[0][store.at(s, k)];
            const bool inBlock = blockSymbols.count(s) && k >= -115 && k < 125;
            const bool inRbs = blockSymbols.count(s) && k >= -120 && k < 132;
            if (inBlock) continue;
            ASSERT_EQ(value, inRbs ? 370 : 0) << "s=" << s << " k=" << k;
        }
    EXPECT_EQ(generator->FirstSymbol, (std::vector<int>{4, 8, 16, 20}));
    EXPECT_EQ(generator->LastSymbol, (std::vector<int>{7, 11, 19, 23}));
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

TEST(PbchMap, AStoreThatCannotHoldTheBlockIsRefused) {
    SsbItem setup(1, 4);
    setup.ssb->FrequencyOffset->setValue(100);  // block up to subcarrier 219 of a 200-wide store
    auto generator = setup.make(200);
    Store store(1, 200);
    generator->Generate(0);
    EXPECT_THROW(generator->Map(store.grid, store.occupancy, store.flags, false, 1, false),
                 std::out_of_range);
}

// ---------------------------------------------------------------------------- placeholders

struct PlaceholderCase {
    std::string name;
    int blockMu, gridMu, gridWidth;
    bool extendedCp;
    std::vector<std::pair<int, int>> symbols;  // first and last reserved symbol per block
    int firstColumn, endColumn;
    friend void PrintTo(const PlaceholderCase& c, std::ostream* os) { *os << c.name; }
};

class PbchPlaceholder : public ::testing::TestWithParam<PlaceholderCase> {};

TEST_P(PbchPlaceholder, ReservesTheScaledFootprintAndSendsNothing) {
    const PlaceholderCase& c = GetParam();
    SsbItem setup(c.blockMu, 4);  // 30 kHz: Case B, blocks at 4, 8, 16, 20
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

INSTANTIATE_TEST_SUITE_P(
    Numerologies, PbchPlaceholder,
    ::testing::Values(
        // 30 kHz blocks seen from a 15 kHz store: half the symbols, twice the subcarriers.
        PlaceholderCase{
            "Block30kInStore15k", 1, 0, 1024, false, {{2, 3}, {4, 5}, {8, 9}, {10, 11}}, -240, 240},
        // From a 60 kHz store: twice the symbols, half the subcarriers.
        PlaceholderCase{"Block30kInStore60k",
                        1,
                        2,
                        256,
                        false,
                        {{8, 15}, {16, 23}, {32, 39}, {40, 47}},
                        -60,
                        60},
        // 60 kHz extended cyclic prefix: symbol numbers scaled by 12/14.
        PlaceholderCase{"Block30kInStore60kExtended",
                        1,
                        2,
                        256,
                        true,
                        {{6, 13}, {13, 20}, {27, 34}, {34, 41}},
                        -60,
                        60},
        PlaceholderCase{
            "SameNumerology", 1, 1, 512, false, {{4, 7}, {8, 11}, {16, 19}, {20, 23}}, -120, 120}),
    [](const auto& info) { return info.param.name; });

// ---------------------------------------------------------------------------- levels

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
        const int p = first[b];
        const double level = levels[b] * boost;
        for (int k = -120; k < 120; ++k)
            for (int l = 0; l < 4; ++l) {
                const std::size_t at = store.at(p + l, k);
                const int occupancy = store.occupancy[0][at];
                if (levels[b] == 0.0) {  // no samples and no reservation
                    ASSERT_EQ(occupancy, 0) << "block " << b;
                    ASSERT_EQ(store.grid[0][at], complex(0.0, 0.0));
                    continue;
                }
                // Unused block elements carry nothing; PSS has its own boost on top.
                double expected = level;
                if (occupancy == 370) expected = 0.0;
                if (occupancy == 380) expected = level * pssBoost;
                ASSERT_NEAR(std::abs(store.grid[0][at]), expected, 1e-12)
                    << "block " << b << " occupancy " << occupancy;
            }
        EXPECT_EQ(store.flags[0][p] != 0, levels[b] != 0.0) << "block " << b;
    }
}

// Init of an item whose PowerLevelStr is `levels` must throw E with the text `what`.
template <class E>
void expectLevelFailure(const std::string& levels, const char* what) {
    SsbItem setup(0, 4, SSBPeriod::OneFrame, levels);
    try {
        setup.make(512);
        FAIL() << "no exception for " << levels;
    } catch (const E& e) {
        EXPECT_STREQ(e.what(), what);
    }
}

TEST(PbchLevels, LevelTextIsReadLikeTheOtherListSettings) {
    expectLevelFailure<std::invalid_argument>("1,x", "invalid stod argument");
    expectLevelFailure<std::invalid_argument>("1,,2", "invalid stod argument");
    expectLevelFailure<std::out_of_range>("1e999", "stod argument out of range");
    SsbItem setup(0, 4, SSBPeriod::OneFrame, " 0.25, 2");
    auto generator = setup.make(512);
    EXPECT_EQ(generator->DataAmplitude, (std::vector<double>{0.25, 2.0}));
}

TEST(PbchLevels, AnEmptyLevelListIsRefusedOnceABlockIsDue) {
    SsbItem setup(0, 4, SSBPeriod::TwoFrame, "");
    auto generator = setup.make(512);
    EXPECT_TRUE(generator->Generate(1));  // no block in an odd frame
    EXPECT_THROW(generator->Generate(0), std::invalid_argument);
}

// ---------------------------------------------------------------------------- set-up

TEST(PbchSetup, InitDerivesGeometryAndSizes) {
    SsbItem setup(1, 8, SSBPeriod::OneFrame, "1", 1001);
    setup.ssb->FrequencyOffset->setValue(-300);
    setup.ssb->Numerology->setValue(Models::Nr5g::Numerology::SCS30k);
    setup.carrier->FrequencyOffsetOfPointA->setValue(-18000000.0);
    auto generator = setup.make(1024);
    ASSERT_TRUE(setup.initResult);
    EXPECT_EQ(generator->BlockWidth, 240);
    EXPECT_EQ(generator->BlockStart, -420);
    EXPECT_EQ(generator->PointAOffset, -600);  // -18 MHz / 30 kHz
    EXPECT_EQ(generator->PayloadLength, 24);
    EXPECT_EQ(generator->InterleavedLength, 32);
    EXPECT_EQ(generator->PbchSymbols.size(), 16u);
    EXPECT_EQ(generator->DmrsSymbols.size(), 16u);
    EXPECT_EQ(generator->GetNumerology(), Models::Nr5g::Numerology::SCS30k);
    EXPECT_EQ(generator->Polar.N, 512);
    const auto pss = ssb_ref::pss(1001 % 3), sss = ssb_ref::sss(1001 / 3, 1001 % 3);
    EXPECT_EQ(std::vector<int>(generator->Pss.begin(), generator->Pss.end()), pss);
    EXPECT_EQ(std::vector<int>(generator->Sss.begin(), generator->Sss.end()), sss);

    setup.ssb->ChannelCoding->setValue(false);
    EXPECT_EQ(setup.make(1024)->PayloadLength, 864);
}

TEST(PbchSetup, APayloadTheInterleaverCannotPlaceIsRefused) {
    SsbItem setup(1, 4);
    setup.ssb->PayloadDataLength->setValue(30);
    EXPECT_THROW(setup.make(512), std::out_of_range);
    setup.ssb->ChannelCoding->setValue(false);  // without coding the length is not used
    EXPECT_NO_THROW(setup.make(512));
}

TEST(PbchSetup, SixtyKilohertzBlocksFailInitAndAreRefusedWhenDue) {
    SsbItem setup(2, 4);
    auto generator = setup.make(512);
    EXPECT_FALSE(setup.initResult);
    EXPECT_THROW(generator->Generate(0), std::out_of_range);
}

// ---------------------------------------------------------------------------- without coding

TEST(PbchUncoded, SourceBitsGoStraightToTheSecondScramblingAndFlowOnAcrossBlocks) {
    const std::string pattern = "1110010";
    SsbItem setup(0, 4, SSBPeriod::OneFrame, "1", 33);
    setup.ssb->ChannelCoding->setValue(false);
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

TEST(PbchCapture, TheFirstBlockOfTheFrameKeepsItsCodingStages) {
    SsbItem setup(1, 8, SSBPeriod::OneFrame, "0,1", 9);  // block 0 is off: block 1 is captured
    auto generator = setup.make(512);
    generator->Generate(0);
    ASSERT_EQ(generator->CapturedInterleaved.size(), 32u);
    ASSERT_EQ(generator->CapturedCrcAttached.size(), 56u);
    ASSERT_EQ(generator->CapturedPolar.size(), 512u);
    ASSERT_EQ(generator->CapturedRateMatched.size(), 864u);
    EXPECT_EQ(ssb_ref::crc24cRemainder(generator->CapturedCrcAttached), 0u);
    // Block 1's rate-matched bits, scrambled with v = 1, are what it sends.
    const ssb_ref::Bits gold = ssb_ref::goldSequence(9, 2 * 864);
    const auto& symbols = generator->PbchSymbols[1];
    for (int n = 0; n < 864; ++n) {
        const double part = n % 2 ? symbols[n / 2].imag() : symbols[n / 2].real();
        ASSERT_EQ((part < 0) ^ gold[static_cast<std::size_t>(864 + n)],
                  generator->CapturedRateMatched[n])
            << n;
    }
}

}  // namespace
