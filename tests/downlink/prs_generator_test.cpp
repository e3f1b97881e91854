// PRS resources through the frame store, against TS 38.211 clause 7.4.1.7 worked in the test:
// the sequence of clause 7.4.1.7.2, the comb of clause 7.4.1.7.3 with k' typed from Table
// 7.4.1.7.3-1, and the occasions of clause 7.4.1.7.4 with both muting options.

#include <gtest/gtest.h>

#include <cmath>
#include <cstdint>
#include <memory>
#include <nlohmann/json.hpp>
#include <string>
#include <vector>

#include "downlink/frame_store.h"
#include "downlink/pdsch_receiver.h"
#include "downlink/prs_generator.h"
#include "framework/json_serializer.h"
#include "models/nr5g_waveform_settings.h"
#include "test_support.h"

namespace {

using Models::Nr5g::NR5GWaveformSettings;
using Sample = std::complex<double>;

using frame_store::at;
using frame_store::kFft;
using frame_store::kPointA;
using frame_store::kSlots;
using frame_store::kSymbols;
using frame_store::Store;

/// k' of Table 7.4.1.7.3-1 by comb size and l - l_start.
int kPrime(int comb, int i) {
    static const int k2[12] = {0, 1, 0, 1, 0, 1, 0, 1, 0, 1, 0, 1};
    static const int k4[12] = {0, 2, 1, 3, 0, 2, 1, 3, 0, 2, 1, 3};
    static const int k6[12] = {0, 3, 1, 4, 2, 5, 0, 3, 1, 4, 2, 5};
    static const int k12[12] = {0, 6, 3, 9, 1, 7, 4, 10, 2, 8, 5, 11};
    return (comb == 2 ? k2 : comb == 4 ? k4 : comb == 6 ? k6 : k12)[i];
}

/// r(0..count-1) of clause 7.4.1.7.2 for symbol l of slot n_s, sequence identity nId.
std::vector<Sample> sequence(int slot, int l, int nId, int count) {
    const std::uint64_t cInit = ((std::uint64_t{1} << 22) * static_cast<std::uint64_t>(nId / 1024) +
                                 (std::uint64_t{1} << 10) * static_cast<std::uint64_t>(14 * slot + l + 1) *
                                     static_cast<std::uint64_t>(2 * (nId % 1024) + 1) +
                                 static_cast<std::uint64_t>(nId % 1024)) %
                                (std::uint64_t{1} << 31);
    const auto c = pdsch_rx::gold(static_cast<std::uint32_t>(cInit), 2 * count);
    std::vector<Sample> r;
    for (int m = 0; m < count; ++m)
        r.push_back(pdsch_rx::dmrsValue(c, m));  // QPSK of TS 38.211 clause 5.1.3
    return r;
}

nlohmann::json document(const nlohmann::json& prs, int antennas) {
    nlohmann::json item = {{"Name", "PRS-A"}, {"Enabled", true}, {"SubcarrierSpacing", "SCS30k"},
                           {"FrequencyOffsetOfPointA", kPointA}, {"StartPRB", 0}, {"ResourceBandwidth", 24}};
    item.update(prs);
    return {{"SampleRateAuto", 30.72e6},
            {"NumberOfAntennas", antennas},
            {"NRCarriers",
             {{{"CarrierType", "DL"}, {"FrequencyOffsetOfPointA", kPointA}, {"Downlink", {{"PRS", {item}}}}}}}};
}

struct Built {
    std::shared_ptr<NR5GWaveformSettings> root;
    Orvalis_NR::PRS_Generator generator;
};

std::unique_ptr<Built> build(const nlohmann::json& doc) {
    auto built = std::make_unique<Built>();
    Orvalis::Tessaline::JsonSerializer reader;
    built->root = std::dynamic_pointer_cast<NR5GWaveformSettings>(reader.deserialize(doc.dump()));
    auto carrier = built->root->NRCarriers->getValue()->getItem(0);
    std::vector<Orvalis_NR::PBCH_Generator*> pbch;
    built->generator.Init(carrier.get(), carrier->Downlink->getValue()->PRS->getValue()->getItem(0).get(), kFft, pbch);
    return built;
}


struct CombCase {
    int comb, symbols, firstSymbol, reOffset, startPrb, bandwidth, sequenceId;
    double boostDb;
};

void PrintTo(const CombCase& c, std::ostream* os) { *os << "comb " << c.comb << ", " << c.symbols << " symbols"; }

const CombCase kCombs[] = {
    {2, 2, 3, 0, 2, 24, 7, 0.0},  {2, 12, 1, 1, 0, 32, 4095, 0.0}, {4, 4, 10, 3, 5, 28, 1500, 3.0},
    {6, 6, 8, 5, 0, 48, 1023, 0.0}, {12, 12, 0, 7, 4, 24, 3333, -2.0}, {4, 12, 2, 2, 1, 40, 1024, 0.0},
};

class PrsComb : public ::testing::TestWithParam<CombCase> {};

TEST_P(PrsComb, ElementsAndValuesAreThoseOfTheClause) {
    const auto& c = GetParam();
    auto built = build(document({{"CombSizeN", c.comb}, {"NumSymbols", c.symbols}, {"ResourceSymbolOffset", c.firstSymbol},
                                 {"ReOffset", c.reOffset}, {"StartPRB", c.startPrb}, {"ResourceBandwidth", c.bandwidth},
                                 {"SequenceId", c.sequenceId}, {"PowerBoosting", c.boostDb}, {"Periodicity", 8},
                                 {"ResourceSetSlotOffset", 3}},
                                1));
    Store store(1);
    built->generator.Map(store.grid, store.occupancy, 0, store.flags, false);

    // Period 8 from slot 3: slots 3, 11 and 19 of the frame.
    std::vector<int> expectedOccupancy(store.grid[0].size(), 0);
    std::vector<Sample> expected(store.grid[0].size());
    const double beta = std::pow(10.0, c.boostDb / 20.0);
    int elements = 0;
    for (int slot : {3, 11, 19})
        for (int i = 0; i < c.symbols; ++i) {
            const int l = c.firstSymbol + i;
            const auto r = sequence(slot, l, c.sequenceId, 12 * (c.startPrb + c.bandwidth));
            const int offset = (c.reOffset + kPrime(c.comb, i)) % c.comb;
            for (int m = 0;; ++m) {  // k = m comb + offset, within the resource's RBs
                const int k = m * c.comb + offset;
                if (k >= 12 * (c.startPrb + c.bandwidth)) break;
                if (k < 12 * c.startPrb) continue;
                expected[at(slot, l, k)] = beta * r[static_cast<std::size_t>(m)];
                expectedOccupancy[at(slot, l, k)] = 1500;
                ++elements;
            }
        }
    EXPECT_EQ(elements, 3 * c.symbols * 12 * c.bandwidth / c.comb);
    for (std::size_t i = 0; i < expected.size(); ++i) {
        ASSERT_EQ(store.occupancy[0][i], expectedOccupancy[i]) << "symbol " << i / kFft << " bin " << i % kFft;
        ASSERT_LT(std::abs(store.grid[0][i] - expected[i]), 1e-12) << "symbol " << i / kFft << " bin " << i % kFft;
    }
    for (int s = 0; s < kSymbols; ++s) {
        const int slot = s / 14, l = s % 14;
        const bool used = (slot == 3 || slot == 11 || slot == 19) && l >= c.firstSymbol && l < c.firstSymbol + c.symbols;
        EXPECT_EQ(store.flags[0][static_cast<std::size_t>(s)], used ? 1 : 0) << "symbol " << s;
    }
}

INSTANTIATE_TEST_SUITE_P(Combs, PrsComb, ::testing::ValuesIn(kCombs));

/// Occasions: period, offsets, repetition, gap and both muting options.
struct OccasionCase {
    const char* name;
    int period, setOffset, slotOffset, repetition, gap, bitRepetition;
    const char* muting1;
    const char* muting2;
};

void PrintTo(const OccasionCase& c, std::ostream* os) { *os << c.name; }

const OccasionCase kOccasions[] = {
    {"TwoConsecutiveSlotsPerPeriod", 10, 0, 0, 2, 1, 1, "", ""},
    {"EverySecondPeriodMuted", 10, 0, 0, 1, 1, 1, "10", ""},
    {"MutingBitsRepeatedTwice", 5, 2, 1, 1, 1, 2, "1101", ""},
    {"RepetitionsWithGapAndOption2", 16, 4, 0, 4, 2, 1, "", "1011"},
    {"BothOptionsAndNegativeOffset", 20, -3, 2, 2, 4, 1, "011", "01"},
    {"LongPeriodAcrossFrames", 40, 25, 0, 1, 1, 1, "", ""},
};

/// Clause 7.4.1.7.4 with the muting of TS 38.214 clause 5.1.6.5: an occasion when (N n_f + n_s
/// - T_offset - T_offset,res) mod T_per is i T_gap, i below T_rep; option 1 mutes instance
/// floor(d / T_per) by bit floor(instance / bit repetition) mod L, option 2 mutes repetition i
/// by bit i mod L.
bool occasion(const OccasionCase& c, int frame, int slot) {
    const long d = static_cast<long>(kSlots) * frame + slot - c.setOffset - c.slotOffset;
    const long r = ((d % c.period) + c.period) % c.period;
    if (r % c.gap != 0 || r / c.gap >= c.repetition) return false;
    const long instance = (d - r) / c.period;
    const std::string m1 = *c.muting1 ? c.muting1 : "1", m2 = *c.muting2 ? c.muting2 : "1";
    const long group = instance >= 0 ? instance / c.bitRepetition : -((-instance + c.bitRepetition - 1) / c.bitRepetition);
    const long bit1 = ((group % static_cast<long>(m1.size())) + static_cast<long>(m1.size())) % static_cast<long>(m1.size());
    return m1[static_cast<std::size_t>(bit1)] == '1' && m2[static_cast<std::size_t>((r / c.gap) % static_cast<long>(m2.size()))] == '1';
}

class PrsOccasions : public ::testing::TestWithParam<OccasionCase> {};

TEST_P(PrsOccasions, SlotsAreThoseOfTheClause) {
    const auto& c = GetParam();
    auto built = build(document({{"Periodicity", c.period}, {"ResourceSetSlotOffset", c.setOffset},
                                 {"ResourceSlotOffset", c.slotOffset}, {"ResourceRepetitionFactor", c.repetition},
                                 {"ResourceTimeGap", c.gap}, {"MutingBitRepetitionFactor", c.bitRepetition},
                                 {"MutingPattern1", c.muting1}, {"MutingPattern2", c.muting2}, {"StartPRB", 0},
                                 {"ResourceBandwidth", 24}},
                                1));
    int occasions = 0;
    for (int frame = 0; frame < 6; ++frame) {
        Store store(1);
        built->generator.Map(store.grid, store.occupancy, frame, store.flags, false);
        for (int slot = 0; slot < kSlots; ++slot) {
            const bool mapped = store.occupancy[0][at(slot, 0, 0)] == 1500;  // comb 2, offset 0, symbol 0
            EXPECT_EQ(mapped, occasion(c, frame, slot)) << "frame " << frame << " slot " << slot;
            occasions += mapped;
        }
    }
    EXPECT_GT(occasions, 0);
}

INSTANTIATE_TEST_SUITE_P(Cases, PrsOccasions, ::testing::ValuesIn(kOccasions),
                         [](const auto& info) { return std::string(info.param.name); });

TEST(PrsGenerator, ElementsHeldByAnEarlierChannelAreLeftOnThatAntennaOnly) {
    auto built = build(document({{"CombSizeN", 4}, {"NumSymbols", 4}, {"ResourceSymbolOffset", 2}, {"StartPRB", 0},
                                 {"ResourceBandwidth", 24}, {"Periodicity", 20}},
                                2));
    Store store(2);
    // An SS/PBCH element on antenna 0 at k = 8 of symbol 2 in slot 0 (the comb's third element).
    store.occupancy[0][at(0, 2, 8)] = 380;
    built->generator.Map(store.grid, store.occupancy, 0, store.flags, false);
    const auto r = sequence(0, 2, 0, 288);
    EXPECT_EQ(store.occupancy[0][at(0, 2, 8)], 380);
    EXPECT_EQ(store.grid[0][at(0, 2, 8)], Sample{});
    EXPECT_EQ(store.occupancy[1][at(0, 2, 8)], 1500);
    EXPECT_LT(std::abs(store.grid[1][at(0, 2, 8)] - r[2]), 1e-12);
    // The sequence moves on past it: m = 3 at k = 12 on both antennas.
    for (std::size_t a = 0; a < 2; ++a) EXPECT_LT(std::abs(store.grid[a][at(0, 2, 12)] - r[3]), 1e-12);
}

struct BadCase {
    const char* name;
    nlohmann::json settings;
    const char* message;
};

void PrintTo(const BadCase& c, std::ostream* os) { *os << c.name; }

const BadCase kBad[] = {
    {"CombThree", {{"CombSizeN", 3}}, "CombSizeN 3"},
    {"ThreeSymbols", {{"NumSymbols", 3}}, "NumSymbols 3, CombSizeN 2"},
    {"TwoSymbolsOfComb4", {{"NumSymbols", 2}, {"CombSizeN", 4}}, "NumSymbols 2, CombSizeN 4"},
    {"SymbolsPastSlot", {{"NumSymbols", 4}, {"ResourceSymbolOffset", 11}}, "ResourceSymbolOffset 11, NumSymbols 4"},
    {"PeriodZero", {{"Periodicity", 0}}, "Periodicity 0"},
    {"GapZero", {{"ResourceTimeGap", 0}}, "ResourceTimeGap 0"},
    {"RepetitionZero", {{"ResourceRepetitionFactor", 0}}, "ResourceRepetitionFactor 0"},
    {"MutingBitRepetitionZero", {{"MutingBitRepetitionFactor", 0}}, "MutingBitRepetitionFactor 0"},
    {"MutingNotBinary", {{"MutingPattern1", "1x"}}, "MutingPattern1 \"1x\""},
    {"NegativeStart", {{"StartPRB", -1}}, "StartPRB -1"},
    {"OutsideBand", {{"StartPRB", 60}, {"ResourceBandwidth", 100}}, "StartPRB 60, ResourceBandwidth 100"},
    {"ExtendedPrefixAt30kHz", {{"CyclicPrefix", "Extended"}}, "CyclicPrefix Extended"},
};

class PrsBadSetting : public ::testing::TestWithParam<BadCase> {};

TEST_P(PrsBadSetting, FailsNamingTheSetting) {
    const auto text = nrsynth_test::failureText([&] { build(document(GetParam().settings, 1)); });
    EXPECT_NE(text.find(GetParam().message), std::string::npos) << text;
    EXPECT_NE(text.find("PRS \"PRS-A\""), std::string::npos) << text;
}

INSTANTIATE_TEST_SUITE_P(Settings, PrsBadSetting, ::testing::ValuesIn(kBad),
                         [](const auto& info) { return std::string(info.param.name); });

}  // namespace
