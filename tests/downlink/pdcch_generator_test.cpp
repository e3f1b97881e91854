// PDCCH generator against the 3GPP text: the DM-RS of TS 38.211 clause 7.4.1.3.1 from a Gold
// register written here, the REG bundle interleaver of clause 7.3.2.2 worked by hand, the
// per-antenna rule of the frame store, and the clear failures of settings that cannot be mapped.

#include <gtest/gtest.h>

#include <cmath>
#include <complex>
#include <memory>
#include <stdexcept>
#include <string>
#include <vector>

#include "carrier/nr5g_numerology_generator.h"
#include "downlink/pdcch_generator.h"
#include "models/nr5g_waveform_settings.h"
#include "pdcch_reference.h"

namespace {

using Models::Nr5g::Numerology;
using Orvalis_NR::PDCCH_Generator;

/// A DCI with its bandwidth part, CORESET 1 and carrier: 30 kHz, 51 RBs at 30.72 MHz.
struct PdcchItem {
    std::shared_ptr<Models::Nr5g::NR5GWaveformSettings> waveform = std::make_shared<Models::Nr5g::NR5GWaveformSettings>();
    std::shared_ptr<Models::Nr5g::NRCarrier> carrier = std::make_shared<Models::Nr5g::NRCarrier>();
    std::shared_ptr<Models::Nr5g::NRDLBWP> bwp = std::make_shared<Models::Nr5g::NRDLBWP>();
    std::shared_ptr<Models::Nr5g::NRDCI> dci = std::make_shared<Models::Nr5g::NRDCI>();
    std::shared_ptr<Models::Nr5g::NRCORESET> coreset;

    PdcchItem() {
        waveform->SampleRateAuto->setValue(30.72e6);
        carrier->CellID->setValue(42);
        carrier->FrequencyOffsetOfPointA->setValue(-9180000.0);
        bwp->Numerology->setValue(Numerology::SCS30k);
        bwp->Mu->setValue(1);
        bwp->RBOffset->setValue(0);
        bwp->RBNumber->setValue(51);
        coreset = bwp->Coreset1->getValue();
        coreset->ID->setValue(1);
        coreset->FrequencyDomainBitmap->setValue(std::string("1111"));
        dci->CoresetIndex->setValue(1);
        dci->SlotIndexArrayStr->setValue(std::string("0"));
        dci->CCEOffsetStr->setValue(std::string("0"));
        dci->NumberOfCCE->setValue(1);
    }

    std::unique_ptr<PDCCH_Generator> make() {
        auto generator = std::make_unique<PDCCH_Generator>();
        generator->Init(waveform.get(), carrier.get(), dci.get(), bwp.get());
        return generator;
    }
};

/// The frame store of 30 kHz at 30.72 MHz.
struct Store {
    static constexpr int kWidth = 1024, kSymbols = 280;
    Orvalis_NR::SlotGrid grid;
    Orvalis_NR::OccupancyGrid occupancy, flags;

    explicit Store(int antennas)
        : grid(antennas, std::vector<std::complex<double>>(kWidth * kSymbols)),
          occupancy(antennas, std::vector<int>(kWidth * kSymbols)),
          flags(antennas, std::vector<int>(kSymbols)) {}

    /// Element of common RB `crb`, subcarrier k, with point A 306 subcarriers below the centre.
    static std::size_t at(int symbol, int crb, int k) {
        const int column = (-306 + 12 * crb + k + kWidth) % kWidth;
        return static_cast<std::size_t>(symbol) * kWidth + column;
    }
};

struct DmrsCase {
    int slot, firstSymbol, symbols, scramblingId, bwpOffset;
    Numerology numerology;
};

class PdcchDmrs : public testing::TestWithParam<DmrsCase> {};

TEST_P(PdcchDmrs, FollowsTheGoldSequenceFromPointA) {
    const auto& c = GetParam();
    PdcchItem item;
    item.bwp->Numerology->setValue(c.numerology);
    item.bwp->RBOffset->setValue(c.bwpOffset);
    item.bwp->RBNumber->setValue(40);
    item.coreset->SymbolNumber->setValue(c.symbols);
    item.dci->FirstSymbol->setValue(c.firstSymbol);
    item.dci->PDCCHDMRSScramblingID->setValue(c.scramblingId);
    auto generator = item.make();
    generator->Generate(c.slot);
    const int symbolsPerSlot = c.numerology == Numerology::SCS60kECP ? 12 : 14;
    const int nId = c.scramblingId == -1 ? 42 : c.scramblingId;
    ASSERT_EQ(generator->Dmrs.size(), static_cast<std::size_t>(c.symbols));
    for (int l = 0; l < c.symbols; ++l) {
        const auto& row = generator->Dmrs[static_cast<std::size_t>(l)];
        // Every CRB the CORESET can reach: BWP start plus six per bitmap character.
        ASSERT_GE(row.size(), static_cast<std::size_t>(3 * (c.bwpOffset + 24)));
        const auto expected = pdcch_ref::dmrs(c.slot, c.firstSymbol + l, nId, static_cast<int>(row.size()), symbolsPerSlot);
        for (std::size_t m = 0; m < row.size(); ++m)
            ASSERT_NEAR(std::abs(row[m] - expected[m]), 0.0, 1e-12) << "l " << l << " m " << m;
    }
}

const DmrsCase kDmrsCases[] = {
    {0, 0, 1, -1, 0, Numerology::SCS30k},      {19, 11, 3, 65535, 6, Numerology::SCS30k},
    {7, 2, 2, 0, 3, Numerology::SCS30k},       {39, 9, 3, 1007, 10, Numerology::SCS60kECP},
    {5, 1, 2, 40000, 0, Numerology::SCS15k},
};
INSTANTIATE_TEST_SUITE_P(Cases, PdcchDmrs, testing::ValuesIn(kDmrsCases));

struct InterleaverCase {
    const char* bitmap;
    int symbols, L, R, shift;
    std::vector<int> table;  // f(0), f(1), ... worked by hand from clause 7.3.2.2
    int cce;
    std::vector<std::vector<int>> rbsPerSymbol;  // CORESET RBs of that CCE, by symbol
};

class PdcchRegInterleaver : public testing::TestWithParam<InterleaverCase> {};

TEST_P(PdcchRegInterleaver, MatchesTheClauseWorkedByHand) {
    const auto& c = GetParam();
    PdcchItem item;
    item.coreset->FrequencyDomainBitmap->setValue(std::string(c.bitmap));
    item.coreset->SymbolNumber->setValue(c.symbols);
    item.coreset->CceInterleaved->setValue(true);
    item.coreset->RegBundleSize->setValue(c.L);
    item.coreset->InterleaverSize->setValue(c.R);
    item.coreset->ShiftIndex->setValue(c.shift);
    item.dci->CCEOffsetStr->setValue(std::to_string(c.cce));
    auto generator = item.make();
    const std::vector<int> head(generator->RegInterleaver.begin(),
                                generator->RegInterleaver.begin() + static_cast<long>(c.table.size()));
    EXPECT_EQ(head, c.table);
    for (int l = 0; l < c.symbols; ++l) {
        std::vector<int> rbs;
        const auto& mask = generator->OccasionMasks[static_cast<std::size_t>(l)];
        for (std::size_t r = 0; r < mask.size(); ++r)
            if (mask[r]) rbs.push_back(static_cast<int>(r));
        EXPECT_EQ(rbs, c.rbsPerSymbol[static_cast<std::size_t>(l)]) << "symbol " << l;
    }
}

// 24 RBs x 2 symbols = 48 REGs, L 6, R 2: C = 4, f(cR + r) = (rC + c + n) mod 8.
// 36 RBs x 1 symbol, L 2, R 3: C = 6, f(3c + r) = (6r + c + n) mod 18.
// 36 RBs x 3 symbols, L 3, R 6: C = 6, f(6c + r) = 6r + c mod 36.
// REG g lies in RB g / symbols, symbol g mod symbols.
const InterleaverCase kInterleaverCases[] = {
    {"1111", 2, 6, 2, 0, {0, 4, 1, 5, 2, 6, 3, 7}, 1, {{12, 13, 14}, {12, 13, 14}}},
    {"1111", 2, 6, 2, 3, {3, 7, 4, 0, 5, 1, 6, 2}, 3, {{0, 1, 2}, {0, 1, 2}}},
    {"111111", 1, 2, 3, 5, {5, 11, 17, 6, 12, 0, 7, 13, 1}, 0, {{10, 11, 22, 23, 34, 35}}},
    {"111111", 3, 3, 6, 0, {0, 6, 12, 18, 24, 30, 1, 7}, 0, {{0, 6}, {0, 6}, {0, 6}}},
};
INSTANTIATE_TEST_SUITE_P(Cases, PdcchRegInterleaver, testing::ValuesIn(kInterleaverCases));

TEST(PdcchGenerator, ThreeSymbolsOneCceCarry108Bits) {
    PdcchItem item;
    item.coreset->SymbolNumber->setValue(3);
    auto generator = item.make();
    EXPECT_EQ(generator->RegsPerSymbol, 2);
    EXPECT_EQ(generator->CodedBits, 108);
    EXPECT_EQ(generator->SymbolCount, 54);
}

TEST(PdcchGenerator, WithoutCodingTheSourceBitsAreScrambledStraightIntoQpsk) {
    PdcchItem item;
    item.dci->ChannelCoding->setValue(false);
    item.dci->AutoDCI->setValue(true);
    item.dci->DCIBits->setValue(std::string("110x"));  // anything but '1' is a 0
    item.dci->PDCCHDMRSScramblingID->setValue(321);
    item.dci->CRNTI->setValue(0x2468);
    for (bool scrambled : {true, false}) {
        item.dci->Scrambling->setValue(scrambled);
        auto generator = item.make();
        generator->Generate(3);
        ASSERT_EQ(generator->DataSymbols.size(), 54u);
        const auto c = pdcch_ref::gold((0x2468u << 16) + 321u, 108);
        for (int i = 0; i < 108; ++i) {
            const char source = "1100"[i % 4] == '1';
            const char bit = static_cast<char>(scrambled ? source ^ c[i] : source);
            const auto symbol = generator->DataSymbols[static_cast<std::size_t>(i / 2)];
            const double part = i % 2 ? symbol.imag() : symbol.real();
            EXPECT_NEAR(part, bit ? -std::sqrt(0.5) : std::sqrt(0.5), 1e-12) << i;
        }
    }
}

TEST(PdcchGenerator, CoresetMapFollowsTheSixRbGridOfTheBwp) {
    PdcchItem item;
    item.bwp->RBOffset->setValue(3);  // next multiple of 6 is CRB 6: BWP RB 3
    item.bwp->RBNumber->setValue(30);
    item.coreset->FrequencyDomainBitmap->setValue(std::string("101"));
    item.coreset->SymbolNumber->setValue(2);
    item.dci->FirstSymbol->setValue(4);
    auto generator = item.make();
    std::vector<int> map;
    generator->GetCoresetMap(map);
    std::vector<int> expected(30, 0);
    for (int r = 3; r < 9; ++r) expected[r] = 1;
    for (int r = 15; r < 21; ++r) expected[r] = 1;
    EXPECT_EQ(map, expected);
    int first = -1, last = -1;
    generator->GetCoresetSymbol(first, last);
    EXPECT_EQ(first, 4);
    EXPECT_EQ(last, 5);

    item.coreset->ID->setValue(0);  // CORESET 0 is not reported to the PDSCH
    item.coreset->RBNumber->setValue(24);
    generator = item.make();
    generator->GetCoresetMap(map);
    EXPECT_EQ(map, std::vector<int>(30, 0));
}

TEST(PdcchGenerator, HeldElementsDropTheSymbolOnThatAntennaOnly) {
    // One CCE, non-interleaved, 1 symbol: CORESET RBs 0..5, 54 data elements in slot 0.
    PdcchItem item;
    item.dci->PowerBoosting->setValue(6.0);
    item.dci->DMRSPowerBoosting->setValue(-6.0);
    auto generator = item.make();
    Store store(2);
    // Subcarrier 0 of RB 0 held on antenna 0 only; subcarrier 2 held on both antennas;
    // subcarrier 5 (a DM-RS position) held on both.
    store.occupancy[0][Store::at(0, 0, 0)] = 400;
    store.occupancy[0][Store::at(0, 0, 2)] = store.occupancy[1][Store::at(0, 0, 2)] = 7;
    store.occupancy[0][Store::at(0, 0, 5)] = store.occupancy[1][Store::at(0, 0, 5)] = 370;
    generator->Map(store.grid, store.occupancy, 0, store.flags, true);

    const double data = std::pow(10.0, 6.0 / 20.0);
    const auto& symbols = generator->DataSymbols;
    EXPECT_EQ(store.occupancy[0][Store::at(0, 0, 0)], 400);
    EXPECT_EQ(store.grid[0][Store::at(0, 0, 0)], std::complex<double>(0.0));
    EXPECT_EQ(store.occupancy[1][Store::at(0, 0, 0)], 5);
    EXPECT_NEAR(std::abs(store.grid[1][Store::at(0, 0, 0)] - symbols[0] * data), 0.0, 1e-12);
    // Symbol 1 on subcarrier 2 is taken by nobody: it moves on to subcarrier 3.
    for (int a = 0; a < 2; ++a) {
        EXPECT_EQ(store.occupancy[a][Store::at(0, 0, 2)], 7);
        EXPECT_NEAR(std::abs(store.grid[a][Store::at(0, 0, 3)] - symbols[1] * data), 0.0, 1e-12);
        EXPECT_EQ(store.occupancy[a][Store::at(0, 0, 5)], 6);  // the DM-RS overrides
        EXPECT_NEAR(std::abs(store.grid[a][Store::at(0, 0, 5)]), 1.0, 1e-12);  // +6 - 6 dB
        EXPECT_EQ(store.flags[a][0], 3);
        EXPECT_EQ(store.flags[a][1], 0);
    }
    // The last data symbol that found a place is the 53rd: one was pushed past the end.
    EXPECT_NEAR(std::abs(store.grid[1][Store::at(0, 5, 11)] - symbols[52] * data), 0.0, 1e-12);
}

TEST(PdcchGenerator, OccasionsOfOtherFramesAreLeftOut) {
    PdcchItem item;
    item.dci->SlotIndexArrayStr->setValue(std::string("3,21,45"));  // frames 0, 1, 2 at 30 kHz
    auto generator = item.make();
    Store store(1);
    generator->Map(store.grid, store.occupancy, 1, store.flags, false);
    for (int symbol = 0; symbol < Store::kSymbols; ++symbol)
        EXPECT_EQ(store.flags[0][symbol], symbol == 14 * 1 ? 1 : 0) << symbol;
}

struct BadSetting {
    const char* name;
    void (*apply)(PdcchItem&);
    const char* mentions;  // setting and value named in the failure
};

std::string failureText(PdcchItem& item) {
    try {
        item.make();
    } catch (const char* text) {
        return text;
    } catch (const std::exception& error) {
        return error.what();
    }
    return "no failure";
}

class PdcchBadSettings : public testing::TestWithParam<BadSetting> {};

TEST_P(PdcchBadSettings, FailWithTheSettingAndValue) {
    PdcchItem item;
    GetParam().apply(item);
    EXPECT_NE(failureText(item).find(GetParam().mentions), std::string::npos) << failureText(item);
}

const BadSetting kBadSettings[] = {
    {"AbsentCoreset", [](PdcchItem& i) { i.dci->CoresetIndex->setValue(3); }, "CoresetIndex 3"},
    {"EmptyCceOffsets", [](PdcchItem& i) { i.dci->CCEOffsetStr->setValue(std::string("")); }, "CCEOffsetStr"},
    {"MalformedCceOffsets", [](PdcchItem& i) { i.dci->CCEOffsetStr->setValue(std::string("0,x")); },
     "invalid stoi argument (DCI \"DCI1\" CCEOffsetStr \"0,x\")"},
    {"TrailingTextInSlots", [](PdcchItem& i) { i.dci->SlotIndexArrayStr->setValue(std::string("1,2a")); },
     "SlotIndexArrayStr \"1,2a\""},
    {"EmptySlots", [](PdcchItem& i) { i.dci->SlotIndexArrayStr->setValue(std::string("")); }, "SlotIndexArrayStr"},
    {"HugeSlot", [](PdcchItem& i) { i.dci->SlotIndexArrayStr->setValue(std::string("99999999999")); },
     "stoi argument out of range"},
    {"NegativeSlot", [](PdcchItem& i) { i.dci->SlotIndexArrayStr->setValue(std::string("-1")); },
     "SlotIndexArrayStr \"-1\""},
    {"CcesPastTheCoreset", [](PdcchItem& i) { i.dci->CCEOffsetStr->setValue(std::string("0,4")); },
     "CCE offset 4"},
    {"BitmapWiderThanTheBwp", [](PdcchItem& i) { i.coreset->FrequencyDomainBitmap->setValue(std::string("000000001")); },
     "FrequencyDomainBitmap \"000000001\""},
    {"BitmapWithOtherCharacters", [](PdcchItem& i) { i.coreset->FrequencyDomainBitmap->setValue(std::string("1x")); },
     "FrequencyDomainBitmap \"1x\""},
    {"FourSymbols", [](PdcchItem& i) { i.coreset->SymbolNumber->setValue(4); }, "SymbolNumber 4"},
    {"CoresetPastTheSlot", [](PdcchItem& i) { i.dci->FirstSymbol->setValue(13), i.coreset->SymbolNumber->setValue(2); },
     "FirstSymbol 13"},
    {"PayloadTooLong", [](PdcchItem& i) { i.dci->PayloadSize->setValue(141); }, "PayloadSize 141"},
    {"PayloadLongerThanItsCces", [](PdcchItem& i) { i.dci->PayloadSize->setValue(90); }, "PayloadSize 90"},
    {"AutoDciWithoutBits", [](PdcchItem& i) { i.dci->AutoDCI->setValue(true); }, "DCIBits"},
    {"OddBundleSize",
     [](PdcchItem& i) { i.coreset->CceInterleaved->setValue(true), i.coreset->RegBundleSize->setValue(4); },
     "RegBundleSize 4"},
    {"ZeroInterleaverSize",
     [](PdcchItem& i) { i.coreset->CceInterleaved->setValue(true), i.coreset->InterleaverSize->setValue(0); },
     "InterleaverSize 0"},
    {"Coreset0PastTheBwp",
     [](PdcchItem& i) {
         i.bwp->InitialDLBWP->setValue(true);
         i.dci->CoresetIndex->setValue(0);
         i.bwp->Coreset0->getValue()->RBOffset->setValue(40);
         i.bwp->Coreset0->getValue()->RBNumber->setValue(24);
     },
     "RBOffset 40"},
};
INSTANTIATE_TEST_SUITE_P(Cases, PdcchBadSettings, testing::ValuesIn(kBadSettings),
                         [](const testing::TestParamInfo<BadSetting>& info) { return std::string(info.param.name); });

TEST(PdcchNumerology, BuildsOneGeneratorPerEnabledDciOfItsNumerology) {
    Models::Nr5g::NR5GWaveformSettings settings;
    settings.SampleRateAuto->setValue(30.72e6);
    settings.NRCarriers->getValue()->resize(1);
    auto carrier = settings.NRCarriers->getValue()->getItem(0);
    carrier->CarrierType->setValue(Models::Nr5g::CarrierType::DL);
    carrier->FrequencyOffsetOfPointA->setValue(-9180000.0);
    auto downlink = carrier->Downlink->getValue();
    downlink->BWP->getValue()->resize(1);
    auto bwp = downlink->BWP->getValue()->getItem(0);
    bwp->Numerology->setValue(Numerology::SCS30k);
    bwp->Mu->setValue(1);
    bwp->RBNumber->setValue(51);
    bwp->Coreset1->getValue()->ID->setValue(1);
    bwp->Coreset1->getValue()->FrequencyDomainBitmap->setValue(std::string("0011"));
    auto dcis = downlink->DCI->getValue();
    dcis->resize(3);
    for (int i = 0; i < 3; ++i) {
        auto dci = dcis->getItem(i);
        dci->BWPIndex->setValue(0);
        dci->CoresetIndex->setValue(1);
        dci->SlotIndexArrayStr->setValue(std::string("0"));
        dci->CCEOffsetStr->setValue(std::string("0"));
        dci->NumberOfCCE->setValue(2);  // all of the CORESET's 12 REGs
    }
    dcis->getItem(1)->Enabled->setValue(false);

    Orvalis_NR::NR5GNumerologyGenerator other, thirty;
    other.Init(settings, *carrier, 0);
    EXPECT_FALSE(other.hasValidChannel);
    EXPECT_TRUE(other.pdcchGenerators.empty());
    thirty.Init(settings, *carrier, 1);
    EXPECT_TRUE(thirty.hasValidChannel);
    EXPECT_EQ(thirty.pdcchGenerators.size(), 2u);
    EXPECT_EQ(thirty.countChannels()[Orvalis_NR::PlacePDCCH], 2);
    int first = 0, last = 0;
    thirty.pdcchGenerators[0]->GetScAllocation(first, last);
    EXPECT_EQ(first, 12 * 12);  // bitmap groups 2 and 3: RBs 12..23
    EXPECT_EQ(last, 24 * 12 - 1);

    dcis->getItem(2)->BWPIndex->setValue(5);
    Orvalis_NR::NR5GNumerologyGenerator broken;
    try {
        broken.Init(settings, *carrier, 1);
        ADD_FAILURE() << "no failure";
    } catch (const char* text) {
        EXPECT_NE(std::string(text).find("Downlink.DCI[2].BWPIndex 5"), std::string::npos) << text;
    }
}

}  // namespace
