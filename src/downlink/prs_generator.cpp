#include "downlink/prs_generator.h"

#include <algorithm>
#include <cmath>
#include <cstdint>

#include "coding/gold_sequence.h"
#include "common/failure.h"
#include "tables/csirs_prs_tables.h"

namespace Orvalis_NR {

namespace {

constexpr double kQpsk = 0.7071067811865476;

std::string quoted(const std::string& text) { return "\"" + text + "\""; }

/// Non-negative remainder of a by b (b > 0).
long long floorMod(long long a, long long b) { return ((a % b) + b) % b; }

/// Floor of a / b (b > 0).
long long floorDiv(long long a, long long b) { return (a - floorMod(a, b)) / b; }

}  // namespace

bool PRS_Generator::Init(Models::Nr5g::NRCarrier* carrier, Models::Nr5g::NRPRS* settings, int gridWidth,
                         std::vector<PBCH_Generator*>& pbch) {
    if (!carrier || !settings) fail("PRS_Generator::Init: missing settings.");
    Settings = settings;
    path_ = "PRS " + quoted(settings->Name->getValue());
    GridWidth = gridWidth;
    PbchGenerators = pbch;

    const int scs = static_cast<int>(settings->SubcarrierSpacing->getValue());
    const bool extended = settings->CyclicPrefix->getValue() == Models::Nr5g::CyclicPrefixType::Extended;
    if (scs < 0 || scs > 4) failWith("SubcarrierSpacing out of range.", path_ + " SubcarrierSpacing " + std::to_string(scs));
    if (extended && scs != 2)
        failWith("An extended cyclic prefix needs 60 kHz.", path_ + " CyclicPrefix Extended, SubcarrierSpacing " + std::to_string(scs));
    // 15, 30 kHz are numerologies 0, 1; 60 kHz is 2 or, with the extended prefix, 3; then 4, 5.
    numerology_ = scs < 2 ? scs : scs == 2 ? (extended ? 3 : 2) : scs + 1;
    SymbolsPerSlot = extended ? 12 : 14;
    SlotsPerFrame = 10 << scs;

    Comb = settings->CombSizeN->getValue();
    const int symbolCount = settings->NumSymbols->getValue();
    const int firstSymbol = settings->ResourceSymbolOffset->getValue();
    const bool allowed = std::any_of(tables::kPrsSymbolCombPairs.begin(), tables::kPrsSymbolCombPairs.end(),
                                     [&](const auto& pair) { return pair[0] == symbolCount && pair[1] == Comb; });
    if (Comb != 2 && Comb != 4 && Comb != 6 && Comb != 12)
        failWith("CombSizeN must be 2, 4, 6 or 12 (TS 38.211 clause 7.4.1.7.3).", path_ + " CombSizeN " + std::to_string(Comb));
    if (!allowed)
        failWith("NumSymbols is not allowed with this comb size (TS 38.211 clause 7.4.1.7.3).",
                 path_ + " NumSymbols " + std::to_string(symbolCount) + ", CombSizeN " + std::to_string(Comb));
    if (firstSymbol < 0 || firstSymbol + symbolCount > SymbolsPerSlot)
        failWith("The PRS symbols do not fit the slot.",
                 path_ + " ResourceSymbolOffset " + std::to_string(firstSymbol) + ", NumSymbols " + std::to_string(symbolCount));
    static constexpr int kCombs[4] = {2, 4, 6, 12};
    const auto combRow = static_cast<std::size_t>(std::find(kCombs, kCombs + 4, Comb) - kCombs);
    Symbols.clear();
    kPrime_.clear();
    for (int i = 0; i < symbolCount; ++i) {
        Symbols.push_back(firstSymbol + i);
        kPrime_.push_back(tables::kPrsKPrime[combRow][static_cast<std::size_t>(i)]);
    }

    auto atLeastOne = [&](int value, const char* name) {
        if (value < 1) failWith("The PRS setting must be 1 or more.", path_ + " " + name + " " + std::to_string(value));
        return value;
    };
    Period = atLeastOne(settings->Periodicity->getValue(), "Periodicity");
    Repetition = atLeastOne(settings->ResourceRepetitionFactor->getValue(), "ResourceRepetitionFactor");
    Gap = atLeastOne(settings->ResourceTimeGap->getValue(), "ResourceTimeGap");
    MutingBitRepetition = atLeastOne(settings->MutingBitRepetitionFactor->getValue(), "MutingBitRepetitionFactor");
    SetOffset = settings->ResourceSetSlotOffset->getValue();
    ResourceSlotOffset = settings->ResourceSlotOffset->getValue();

    // An empty pattern mutes nothing.
    Muting1 = settings->MutingPattern1->getValue();
    Muting2 = settings->MutingPattern2->getValue();
    if (Muting1.empty()) Muting1 = "11";
    if (Muting2.empty()) Muting2 = "11";
    for (const auto* pattern : {&Muting1, &Muting2})
        if (pattern->find_first_not_of("01") != std::string::npos)
            failWith("A muting pattern holds a character other than 0 and 1.",
                     path_ + (pattern == &Muting1 ? " MutingPattern1 " : " MutingPattern2 ") + quoted(*pattern));

    Amplitude = std::pow(10.0, settings->PowerBoosting->getValue() / 20.0);
    ReOffset = settings->ReOffset->getValue();
    sequenceId_ = settings->SequenceId->getValue();
    if (sequenceId_ < 0) failWith("SequenceId must not be negative.", path_ + " SequenceId " + std::to_string(sequenceId_));
    StartPrb = settings->StartPRB->getValue();
    Bandwidth = settings->ResourceBandwidth->getValue();
    if (StartPrb < 0 || StartPrb > 275 * 16 || Bandwidth < 0 || Bandwidth > 275 * 16)
        failWith("The PRS resource blocks are out of range.",
                 path_ + " StartPRB " + std::to_string(StartPrb) + ", ResourceBandwidth " + std::to_string(Bandwidth));

    // The PRS carries its own point A (a positioning resource may be configured apart from the
    // serving carrier's grid); a host sets it to the carrier's for a PRS of this carrier.
    const double pointA = settings->FrequencyOffsetOfPointA->getValue();
    if (!(std::abs(pointA) <= 1.0e10))
        failWith("FrequencyOffsetOfPointA out of range.", path_ + " FrequencyOffsetOfPointA " + std::to_string(pointA));
    PointOffset = static_cast<int>(pointA / ((SlotsPerFrame / 10) * 15000.0));
    if (Bandwidth > 0) {
        const long long low = PointOffset + 12LL * StartPrb, high = PointOffset + 12LL * (StartPrb + Bandwidth) - 1;
        if (GridWidth < 12 || low < -GridWidth || high >= 2LL * GridWidth || high - low >= GridWidth)
            failWith("The PRS lies outside the band of the sample rate.",
                     path_ + " StartPRB " + std::to_string(StartPrb) + ", ResourceBandwidth " + std::to_string(Bandwidth) +
                         ", grid width " + std::to_string(GridWidth));
    }

    // The sequence runs from point A: m = floor(k / comb) for subcarrier k of common RB 0 on.
    SequenceBits = 2 * (12 * (StartPrb + Bandwidth) / Comb);
    bits_.assign(static_cast<std::size_t>(SequenceBits), 0);
    Sequence.assign(Symbols.size(), std::vector<complex>(static_cast<std::size_t>(SequenceBits / 2)));
    return true;
}

bool PRS_Generator::Generate(int, int subframe, int slot) {
    const std::uint64_t n = static_cast<std::uint64_t>(subframe) * static_cast<std::uint64_t>(SlotsPerFrame / 10) +
                            static_cast<std::uint64_t>(slot);
    const std::uint64_t low = static_cast<std::uint64_t>(sequenceId_ % 1024), high = static_cast<std::uint64_t>(sequenceId_ / 1024);
    for (std::size_t i = 0; i < Symbols.size(); ++i) {
        // c_init of TS 38.211 clause 7.4.1.7.2.
        const std::uint64_t symbol = SymbolsPerSlot * n + static_cast<std::uint64_t>(Symbols[i]) + 1;
        const std::uint64_t cInit = (((symbol * (2 * low + 1)) << 10) + low + (high << 22)) & 0x7FFFFFFFu;
        PN_Generator(bits_, SequenceBits, static_cast<int>(cInit));
        auto& values = Sequence[i];
        for (std::size_t m = 0; m < values.size(); ++m)
            values[m] = complex(1.0 - 2.0 * bits_[2 * m], 1.0 - 2.0 * bits_[2 * m + 1]) * (kQpsk * Amplitude);
    }
    return true;
}

bool PRS_Generator::IsOccasion(int frame, int slot) const {
    // TS 38.211 clause 7.4.1.7.4 and TS 37.355: the slot offset within the period picks the
    // repetitions; muting option 1 goes by instance (in groups of the bit repetition factor),
    // option 2 by repetition within the instance.
    const long long d = static_cast<long long>(slot) + static_cast<long long>(SlotsPerFrame) * frame - SetOffset - ResourceSlotOffset;
    const long long r = floorMod(d, Period);
    if (r % Gap != 0 || r / Gap >= Repetition) return false;
    const long long instance = floorDiv(d, static_cast<long long>(Period) * MutingBitRepetition);
    if (Muting1[static_cast<std::size_t>(floorMod(instance, static_cast<long long>(Muting1.size())))] != '1') return false;
    return Muting2[static_cast<std::size_t>((r / Gap) % static_cast<long long>(Muting2.size()))] == '1';
}

bool PRS_Generator::Map(SlotGrid& grid, OccupancyGrid& occupancy, int frame, OccupancyGrid& symbolFlags, bool firstChannel) {
    const std::size_t symbolsPerFrame = static_cast<std::size_t>(SymbolsPerSlot * SlotsPerFrame);
    const std::size_t rowLength = symbolsPerFrame * static_cast<std::size_t>(GridWidth);
    const std::size_t antennas = grid.size();
    if (occupancy.size() != antennas || symbolFlags.size() < antennas)
        fail("PRS_Generator::Map: frame stores of different antenna counts.");
    for (std::size_t a = 0; a < antennas; ++a)
        if (grid[a].size() != rowLength || occupancy[a].size() != rowLength || symbolFlags[a].size() < symbolsPerFrame)
            failWith("The frame store does not match the PRS's numerology and sample rate.",
                     path_ + " grid width " + std::to_string(GridWidth));

    const int slotsPerSubframe = SlotsPerFrame / 10;
    for (int n = 0; n < SlotsPerFrame; ++n) {
        if (!IsOccasion(frame, n)) continue;
        Generate(frame, n / slotsPerSubframe, n % slotsPerSubframe);
        for (std::size_t i = 0; i < Symbols.size(); ++i) {
            const int l = Symbols[i];
            const std::size_t line = static_cast<std::size_t>(n * SymbolsPerSlot + l) * static_cast<std::size_t>(GridWidth);
            const auto& values = Sequence[i];
            // k = m comb + ((k_offset + k') mod comb), TS 38.211 clause 7.4.1.7.3.
            const int offset = static_cast<int>(floorMod(static_cast<long long>(ReOffset) + kPrime_[i], Comb));
            for (int k = 12 * StartPrb + offset; k < 12 * (StartPrb + Bandwidth); k += Comb) {
                int column = PointOffset + k;
                if (column >= GridWidth) column -= GridWidth;
                if (column < 0) column += GridWidth;
                const std::size_t at = line + static_cast<std::size_t>(column);
                const complex value = values[static_cast<std::size_t>(k / Comb)];
                for (std::size_t a = 0; a < antennas; ++a) {
                    if (occupancy[a][at] != 0) continue;  // an earlier channel holds it on this antenna
                    grid[a][at] = value;
                    occupancy[a][at] = 1500;
                }
            }
            for (std::size_t a = 0; a < antennas; ++a)
                symbolFlags[a][static_cast<std::size_t>(n * SymbolsPerSlot + l)] |= firstChannel ? 3 : 1;
        }
    }
    return true;
}

void PRS_Generator::GetScAllocation(int& first, int& last) const {
    first = 12 * StartPrb;
    last = 12 * (StartPrb + Bandwidth) - 1;
}

}  // namespace Orvalis_NR
