#include "carrier/nr5g_numerology_generator.h"

#include <algorithm>
#include <cmath>
#include <string>

#include "downlink/csi_rs_generator.h"
#include "downlink/pbch_generator.h"
#include "downlink/pdcch_generator.h"
#include "downlink/pdsch_generator.h"
#include "downlink/prs_generator.h"
#include "dsp/sinc_low_pass.h"
#include "common/failure.h"
#include "common/large_buffer.h"
#include "common/list_text.h"
#include "common/sample_rate_guard.h"
#include "common/log.h"

namespace Orvalis_NR {

using Models::Nr5g::CarrierType;
using Models::Nr5g::PhaseCompensationMode;
using Models::Nr5g::WindowingMethod;

namespace {

struct NumerologyGeometry {
    int mu;
    bool extendedCp;
    int symbolsPerSlot;
};

// Numerology (position of the enumeration) to mu, prefix and symbols per slot.
constexpr NumerologyGeometry kGeometry[6] = {{0, false, 14}, {1, false, 14}, {2, false, 14},
                                             {2, true, 12},  {3, false, 14}, {4, false, 14}};

// Point A further away than this (2^29 subcarriers of 15 kHz) overflows the filter's centre,
// which adds its subcarrier offset twice.
constexpr double kFarthestPointA = 15000.0 * (1 << 29);

bool isRealTime(PhaseCompensationMode mode) {
    return mode == PhaseCompensationMode::AutoRT || mode == PhaseCompensationMode::ManualRT;
}

}  // namespace

NR5GNumerologyGenerator::~NR5GNumerologyGenerator() {
    for (auto* generator : pbchGenerators) delete generator;
    for (auto* generator : pdcchGenerators) delete generator;
    for (auto* generator : pdschGenerators) delete generator;
    for (auto* generator : csiRsGenerators) delete generator;
    for (auto* generator : prsGenerators) delete generator;
}

void NR5GNumerologyGenerator::Init(Models::Nr5g::NR5GWaveformSettings& waveform, Models::Nr5g::NRCarrier& owner,
                                   int index) {
    Log("Start Init MuGen");
    if (index < 0 || index > 5) failWith("Numerology index out of range.", std::to_string(index));
    settings = &waveform;
    carrier = &owner;
    numerology = index;
    numberOfAntennas = waveform.NumberOfAntennas->getValue();
    cellId = owner.CellID->getValue();
    sampleDelay = 0;
    isPrimary = false;
    hasValidChannel = false;

    // Relate the sample rate to the base rate of 30.72 MHz.
    sampleRate = waveform.SampleRateAuto->getValue();
    requireGeneratingSampleRate(sampleRate);
    const double ratio = sampleRate > 3.072e7 ? sampleRate / 3.072e7 : 3.072e7 / sampleRate;
    const int up = sampleRate > 3.072e7 ? static_cast<int>(ratio) : 1;
    const int down = sampleRate > 3.072e7 ? 1 : static_cast<int>(ratio);

    const auto& geometry = kGeometry[index];
    mu = geometry.mu;
    extendedCp = geometry.extendedCp;
    symbolsPerSlot = geometry.symbolsPerSlot;
    slotsPerSubframe = 1 << mu;
    symbolsPerFrame = symbolsPerSlot * slotsPerSubframe * 10;
    fftSize = (2048 / down * up) / (1 << mu);

    const double pointA = owner.FrequencyOffsetOfPointA->getValue();
    if (!(std::abs(pointA) <= kFarthestPointA))
        failWith("FrequencyOffsetOfPointA is too far from the carrier centre: its distance in subcarriers, taken "
                 "twice, would overflow an int.",
                 "FrequencyOffsetOfPointA " + numberText(pointA));

    for (auto* generator : pbchGenerators) delete generator;
    pbchGenerators.clear();
    for (auto* generator : pdcchGenerators) delete generator;
    pdcchGenerators.clear();
    for (auto* generator : pdschGenerators) delete generator;
    pdschGenerators.clear();
    for (auto* generator : csiRsGenerators) delete generator;
    csiRsGenerators.clear();
    for (auto* generator : prsGenerators) delete generator;
    prsGenerators.clear();
    lowestSubcarrier = 360000;
    highestSubcarrier = 0;
    transformPrecoded = false;
    if (owner.CarrierType->getValue() == CarrierType::DL) {
        buildDownlinkChannels();
        buildReferenceSignals();
        buildPdschChannels();
    }
    if (!hasValidChannel) return;
    if (fftSize < 1)
        failWith("SampleRateAuto is too low for a channel in this numerology: its transform would have no sample.",
                 "SampleRateAuto " + numberText(sampleRate) + ", numerology " + std::to_string(index));
    const auto phaseMode = waveform.PhaseCompensation->getValue();
    const double windowBeta = owner.WindowBeta->getValue();
    if (!isRealTime(phaseMode) && !(windowBeta >= 0.0 && windowBeta <= 1.0))
        failWith("WindowBeta must lie from 0 to 1: a symbol's window cannot be longer than its transform.",
                 "WindowBeta " + numberText(windowBeta));

    // The first symbol of each half subframe carries the longer prefix.
    cpLengths.assign(static_cast<std::size_t>(symbolsPerSlot * slotsPerSubframe / 2), extendedCp ? fftSize / 4 : fftSize * 9 / 128);
    if (!extendedCp) cpLengths[0] = 16 / down * up + fftSize * 9 / 128;

    modulator.windowLength = isRealTime(phaseMode) ? 0 : static_cast<int>(std::lround(fftSize * windowBeta));
    modulator.centred = owner.WindowingMethod->getValue() == WindowingMethod::CenteredAtSymbolBoundary ? 1 : 0;
    modulator.oversampling = 1;
    modulator.Init(fftSize, cpLengths, symbolsPerFrame, owner.DCPunctured->getValue(), numberOfAntennas);
    modulatedLength = 0;
    for (int s = 0; s < symbolsPerFrame; ++s)
        modulatedLength += static_cast<std::size_t>(fftSize + cpLengths[static_cast<std::size_t>(s) % cpLengths.size()]);
    const auto rows = static_cast<std::size_t>(numberOfAntennas);
    const auto elements = static_cast<std::size_t>(symbolsPerFrame) * static_cast<std::size_t>(fftSize);
    assignZeroedRows(grid, rows, elements);
    assignZeroedRows(occupancy, rows, elements);
    assignZeroedRows(symbolMarks, rows, static_cast<std::size_t>(symbolsPerFrame));
    storesClear = true;  // assigned zero just now: the first frame need not clear them again
    Log("End Init OFDM");

    filters.clear();
    if (owner.BasebandFilter->getValue() && !isRealTime(phaseMode)) designFilter();
}

void NR5GNumerologyGenerator::buildDownlinkChannels() {
    auto downlink = carrier->Downlink->getValue();
    auto ssb = downlink->SSPBCH->getValue();
    Log("Start Init PBCH");
    if (ssb->Enabled->getValue()) {
        auto* generator = new PBCH_Generator();
        pbchGenerators.push_back(generator);
        generator->Init(ssb.get(), carrier, fftSize);
        // Blocks of another numerology only keep their footprint clear here.
        generator->ReserveOnly = static_cast<int>(ssb->Numerology->getValue()) != numerology;
        if (!generator->ReserveOnly) {
            hasValidChannel = true;
            // Counted from point A; the filter design adds point A back.
            const int first = generator->BlockStart - generator->PointAOffset;
            lowestSubcarrier = std::min(first, lowestSubcarrier);
            highestSubcarrier = std::max(first + generator->BlockWidth - 1, 0);
        }
    }

    Log("Start Init PDCCH");
    auto dcis = downlink->DCI->getValue();
    for (int i = 0; i < dcis->getCount(); ++i) {
        auto dci = dcis->getItem(i);
        if (!dci->Enabled->getValue()) continue;
        auto bwp = downlinkBwp(dci->BWPIndex->getValue(), "Downlink.DCI[" + std::to_string(i) + "]");
        if (static_cast<int>(bwp->Numerology->getValue()) != numerology) continue;
        auto* generator = new PDCCH_Generator();
        pdcchGenerators.push_back(generator);
        generator->Init(settings, carrier, dci.get(), bwp.get());
        hasValidChannel = true;
        int low = 0, high = 0;
        generator->GetScAllocation(low, high);
        lowestSubcarrier = std::min(low, lowestSubcarrier);
        highestSubcarrier = std::max(high, highestSubcarrier);
    }
    Log("End Init PDCCH");
}

std::shared_ptr<Models::Nr5g::NRDLBWP> NR5GNumerologyGenerator::downlinkBwp(int index, const std::string& item) const {
    auto bwp = carrier->Downlink->getValue()->BWP->getValue()->getItem(index);
    if (!bwp) failWith("The channel names no bandwidth part.", item + ".BWPIndex " + std::to_string(index));
    return bwp;
}

void NR5GNumerologyGenerator::buildReferenceSignals() {
    auto downlink = carrier->Downlink->getValue();
    Log("Start Init CSI-RS");
    auto csiRsItems = downlink->CSIRS->getValue();
    for (int i = 0; i < csiRsItems->getCount(); ++i) {
        auto item = csiRsItems->getItem(i);
        if (!item->Enabled->getValue()) continue;
        auto bwp = downlinkBwp(item->BWPIndex->getValue(), "Downlink.CSIRS[" + std::to_string(i) + "]");
        if (static_cast<int>(bwp->Numerology->getValue()) != numerology) continue;
        auto* generator = new CSI_RS_Generator();
        csiRsGenerators.push_back(generator);
        generator->Init(settings, carrier, bwp.get(), item.get());
        hasValidChannel = true;
        if (generator->RbNumber <= 0) continue;
        int low = 0, high = 0;
        generator->GetScAllocation(low, high);
        lowestSubcarrier = std::min(low, lowestSubcarrier);
        highestSubcarrier = std::max(high, highestSubcarrier);
    }
    Log("End Init CSI-RS");

    // A PRS names its spacing and prefix itself; 60 kHz is numerology 2 or, extended, 3.
    Log("Start Init PRS");
    auto prsItems = downlink->PRS->getValue();
    for (int i = 0; i < prsItems->getCount(); ++i) {
        auto item = prsItems->getItem(i);
        if (!item->Enabled->getValue()) continue;
        const int scs = static_cast<int>(item->SubcarrierSpacing->getValue());
        const bool extended = item->CyclicPrefix->getValue() == Models::Nr5g::CyclicPrefixType::Extended;
        if (scs != mu || extended != extendedCp) continue;
        auto* generator = new PRS_Generator();
        prsGenerators.push_back(generator);
        generator->Init(carrier, item.get(), fftSize, pbchGenerators);
        hasValidChannel = true;
        if (generator->Bandwidth <= 0) continue;
        int low = 0, high = 0;
        generator->GetScAllocation(low, high);
        lowestSubcarrier = std::min(low, lowestSubcarrier);
        highestSubcarrier = std::max(high, highestSubcarrier);
    }
    Log("End Init PRS");
}

void NR5GNumerologyGenerator::buildPdschChannels() {
    auto downlink = carrier->Downlink->getValue();
    auto items = downlink->DLSCH->getValue();
    std::vector<const CsiRsFootprint*> footprints;
    for (const auto* csiRs : csiRsGenerators) footprints.push_back(&csiRs->Footprint);
    Log("Start Init PDSCH");
    for (int i = 0; i < items->getCount(); ++i) {
        auto item = items->getItem(i);
        if (!item->Enabled->getValue()) continue;
        auto bwp = downlinkBwp(item->BWPIndex->getValue(), "Downlink.DLSCH[" + std::to_string(i) + "]");
        if (static_cast<int>(bwp->Numerology->getValue()) != numerology) continue;
        auto* generator = new PDSCH_Generator();
        pdschGenerators.push_back(generator);
        generator->Init(carrier, item.get(), bwp.get(), fftSize, pbchGenerators, pdcchGenerators, prsGenerators,
                        footprints);
        hasValidChannel = true;
        int smallest = -1, largest = -1;
        for (int n = 0; n < static_cast<int>(generator->RbMask.size()); ++n)
            if (generator->RbMask[static_cast<std::size_t>(n)]) {
                if (smallest < 0) smallest = n;
                largest = n;
            }
        if (smallest < 0) continue;
        const int offset = generator->Bwp->RBOffset->getValue();
        lowestSubcarrier = std::min((offset + smallest) * 12, lowestSubcarrier);
        highestSubcarrier = std::max((offset + largest) * 12 + 11, highestSubcarrier);
    }
    Log("End Init PDSCH");
}

int NR5GNumerologyGenerator::filterGuard() const {
    std::string name;
    if (carrier->CarrierType->getValue() == CarrierType::UL) {
        auto bwps = carrier->Uplink->getValue()->BWP->getValue();
        if (bwps->getCount() >= 1) name = bwps->getItem(0)->Name->getValue();
    } else if (carrier->CarrierType->getValue() == CarrierType::DL) {
        auto bwps = carrier->Downlink->getValue()->BWP->getValue();
        if (bwps->getCount() >= 2) name = bwps->getItem(1)->Name->getValue();
    }
    const auto at = name.find("FB");
    // The guard is the one character after "FB"; no digit there is the conversion's failure.
    if (at != std::string::npos) return intFromText(name.substr(at + 2, 1));
    return fftSize > 8192 ? fftSize / 8192 : 1;
}

void NR5GNumerologyGenerator::designFilter() {
    int taps = 1025;
    const int n = static_cast<int>(sampleRate / (15000.0 * (1 << mu)));
    const int cp = numerology == 3 ? n * 512 / 2048 : n * 144 / 2048;
    if (transformPrecoded) taps = std::min(cp, 1025);
    if (taps < 1) failWith("The baseband filter would have no taps.", "SampleRateAuto " + std::to_string(sampleRate));

    const int guard = filterGuard();
    const double x = static_cast<double>(highestSubcarrier - lowestSubcarrier + 1) / fftSize + guard * 24.0 / fftSize;
    const auto prototype = Generate_SincLowPass(x, taps, 1, true);

    // Shift the low-pass to the middle of the occupied span.
    const int pointA = static_cast<int>(carrier->FrequencyOffsetOfPointA->getValue() / 15000.0 / (1 << mu));
    const int centre = lowestSubcarrier + 2 * pointA + highestSubcarrier;
    const double step = centre * 0.5 * 2.0 * 3.141592653589793 / fftSize;
    const double gain = std::sqrt(x);
    std::vector<std::complex<double>> coefficients(static_cast<std::size_t>(taps));
    for (int i = 0; i < taps; ++i) {
        const double phase = (i - taps * 0.5) * step;
        const double h = prototype[static_cast<std::size_t>(i)] * gain;
        coefficients[static_cast<std::size_t>(i)] = {std::cos(phase) * h, std::sin(phase) * h};
    }
    for (int a = 0; a < numberOfAntennas; ++a) filters.push_back(FilterCreator::createForFrames(coefficients));
}

std::vector<int> NR5GNumerologyGenerator::countChannels() const {
    std::vector<int> counts(8, 0);
    for (const auto* generator : pbchGenerators)
        if (!generator->ReserveOnly) ++counts[static_cast<std::size_t>(channelOrder[PlacePBCH])];
    counts[static_cast<std::size_t>(channelOrder[PlacePDCCH])] += static_cast<int>(pdcchGenerators.size());
    counts[static_cast<std::size_t>(channelOrder[PlacePDSCH])] += static_cast<int>(pdschGenerators.size());
    counts[static_cast<std::size_t>(channelOrder[PlaceCSIRS])] += static_cast<int>(csiRsGenerators.size());
    counts[static_cast<std::size_t>(channelOrder[PlacePRS])] += static_cast<int>(prsGenerators.size());
    return counts;
}

void NR5GNumerologyGenerator::MarkUnavailable() {
    if (carrier->CarrierType->getValue() != CarrierType::DL || numerology != 0) return;
    auto coexistence = carrier->Downlink->getValue()->LTECoexistence->getValue();
    if (!coexistence->Enabled->getValue()) return;
    static constexpr int kRbCount[6] = {6, 15, 25, 50, 75, 100};
    const int pointA = static_cast<int>(carrier->FrequencyOffsetOfPointA->getValue() / 15000.0);
    auto crsList = coexistence->LTECRS->getValue();
    for (int c = 0; c < crsList->getCount(); ++c) {
        auto crs = crsList->getItem(c);
        const int bandwidth = static_cast<int>(crs->LTEBandwidth->getValue());
        const int rbCount = bandwidth >= 0 && bandwidth < 6 ? kRbCount[bandwidth] : 0;
        const int halfWidth = rbCount * 6;
        const int offset = crs->OffsetToPointA->getValue();
        const int ports = crs->NumberOfCRSAntennaPorts->getValue();
        const int vShift = crs->VShift->getValue();
        bool mbsfn[10] = {};
        for (const int subframe : intsFromCommaList(crs->MBSFNSubframeIndexArrayStr->getValue()))
            if (subframe >= 0 && subframe < 10) mbsfn[subframe] = true;
        auto usesSymbol = [ports](int l) {
            if (ports == 1 || ports == 2) return l == 0 || l == 4 || l == 7 || l == 11;
            if (ports == 4) return l == 0 || l == 1 || l == 4 || l == 7 || l == 8 || l == 11;
            return true;
        };
        for (int sf = 0; sf < 10; ++sf) {
            const int symbolCount = mbsfn[sf] ? 2 : 14;
            for (int l = 0; l < symbolCount; ++l) {
                if (!usesSymbol(l)) continue;
                for (int r = 0; r < rbCount; ++r) {
                    const int base = offset - halfWidth + 12 * r;
                    int first = 0;
                    int spacing = 3;
                    if (ports == 1) {
                        first = (l == 0 || l == 7) ? vShift : (l == 4 || l == 11) ? (vShift + 3) % 6 : 0;
                        spacing = 6;
                    } else {
                        first = vShift % 3;
                    }
                    for (int p = first; p < 12; p += spacing) {
                        if (p < 0 || static_cast<unsigned>(base + p) >= 3300u) continue;
                        int k = base + p + pointA + (12 * r + p >= halfWidth ? 1 : 0);
                        if (k >= fftSize / 2) continue;
                        if (k < 0) k += fftSize;
                        if (k < 0) continue;
                        const auto at = static_cast<std::size_t>(14 * sf + l) * static_cast<std::size_t>(fftSize) +
                                        static_cast<std::size_t>(k);
                        for (auto& row : occupancy)
                            if (at < row.size()) row[at] = 1600;
                    }
                }
            }
        }
    }
}

void NR5GNumerologyGenerator::ResetDataSource() {
    for (auto* generator : pbchGenerators) if (generator->Source) generator->Source->Reset();
    for (auto* generator : pdcchGenerators) if (generator->Source) generator->Source->Reset();
    for (auto* generator : pdschGenerators)
        for (auto& codeWord : generator->CodeWords)
            if (codeWord.Source) codeWord.Source->Reset();
}

bool NR5GNumerologyGenerator::mapCsiRs(int frame, bool puncture, bool& anyMapped) {
    if (csiRsGenerators.empty()) return true;
    // The two halves of the list log alike; the texts are kept as they have always been.
    Log(puncture ? "Start Generate CSI-RS [PunctureMode]" : "Start Generate CSI-RS [RateMatchMode]");
    const bool markAlc = isPrimary && pdschGenerators.empty() && pbchGenerators.empty();
    for (auto* generator : csiRsGenerators) {
        if (generator->Settings->REUsedForPDSCH->getValue() != puncture) continue;
        if (static_cast<int>(generator->GetNumerology()) != numerology) continue;
        generator->GenerateAndMap(grid, occupancy, frame, symbolMarks, markAlc);
        anyMapped = true;
        if (takeCancel()) return false;
    }
    Log(puncture ? "Start Generate CSI-RS [PunctureMode]" : "End Generate CSI-RS [RateMatchMode]");
    return !takeCancel();
}

bool NR5GNumerologyGenerator::mapPrs(int frame, bool& anyMapped) {
    if (prsGenerators.empty()) return true;
    Log("Start Generate PRS");
    const bool markAlc = isPrimary && pdschGenerators.empty() && pbchGenerators.empty() && csiRsGenerators.empty();
    for (auto* generator : prsGenerators) {
        if (generator->GetNumerology() != numerology) continue;
        generator->Map(grid, occupancy, frame, symbolMarks, markAlc);
        anyMapped = true;
        if (takeCancel()) return false;
    }
    Log("End Generate CSI-RS [RateMatchMode]");
    return !takeCancel();
}

bool NR5GNumerologyGenerator::takeCancel() { return cancelRequested.exchange(0, std::memory_order_relaxed) != 0; }

void NR5GNumerologyGenerator::blankOutsideWaveform() {
    const int subframes = settings->NumberOfSubframes->getValue();
    if (subframes >= 10) return;
    const int offset = settings->SubframeOffset->getValue();
    const int slotOffset = settings->SlotOffsetInSubframe->getValue();
    const int slotCount = settings->NumberOfSlotsInSubframe->getValue();
    for (auto& row : grid) {
        const std::size_t subframeSize = row.size() / 10;
        const std::size_t slotSize = subframeSize / static_cast<std::size_t>(slotsPerSubframe);
        for (int sf = 0; sf < 10; ++sf) {
            auto* subframe = row.data() + subframeSize * static_cast<std::size_t>(sf);
            if (sf < offset || sf >= offset + subframes) {
                std::fill(subframe, subframe + subframeSize, std::complex<double>{});
            } else if (subframes == 1 && slotOffset != -1) {
                for (int slot = 0; slot < slotsPerSubframe; ++slot)
                    if (slot < slotOffset || slot >= slotOffset + slotCount)
                        std::fill(subframe + slotSize * static_cast<std::size_t>(slot),
                                  subframe + slotSize * static_cast<std::size_t>(slot + 1), std::complex<double>{});
            }
        }
    }
}

void NR5GNumerologyGenerator::deriveMarkers(const std::vector<std::vector<int>>& marks,
                                            std::vector<std::vector<int>>& sampleMarkers, int markerExtension) {
    const int cpCount = static_cast<int>(cpLengths.size());
    for (int a = 0; a < numberOfAntennas && a < static_cast<int>(sampleMarkers.size()); ++a) {
        auto& words = sampleMarkers[static_cast<std::size_t>(a)];
        const auto& flags = marks[static_cast<std::size_t>(a)];
        if (words.empty()) continue;
        const std::size_t length = words.size();
        std::size_t pos = 0;
        // ORs `bits` into samples i of the symbol starting at `pos`, from <= i < to, wrapping at
        // the row's end.
        const auto mark = [&](int from, int to, int bits) {
            std::size_t at = (pos + static_cast<std::size_t>(from)) % length;
            for (int i = from; i < to; ++i) {
                words[at] |= bits;
                if (++at == length) at = 0;
            }
        };
        for (int s = 0; s < symbolsPerFrame; ++s) {
            const int symbolLength = cpLengths[static_cast<std::size_t>(s % cpCount)] + fftSize;
            const int flag = flags[static_cast<std::size_t>(s)];
            const bool previous = flags[static_cast<std::size_t>((s + symbolsPerFrame - 1) % symbolsPerFrame)] & 1;
            const bool next = flags[static_cast<std::size_t>((s + 1) % symbolsPerFrame)] & 1;
            if (flag == 3) mark(0, symbolLength, 12);  // RF ALC and RF blanking
            // RF blanking over the symbol, or over the extension next to a blanked neighbour.
            if (flag == 1)
                mark(0, symbolLength, 8);
            else if (previous && markerExtension >= 0)
                mark(0, std::min(symbolLength, markerExtension + 1), 8);
            if (next) mark(std::max(0, symbolLength - 1 - markerExtension), symbolLength, 8);
            pos += static_cast<std::size_t>(symbolLength);
            if (cancelRequested.load(std::memory_order_relaxed)) return;
        }
    }
}

void NR5GNumerologyGenerator::Go(int frame, int, std::vector<std::vector<std::complex<double>>>& output,
                                 std::vector<std::vector<int>>& sampleMarkers) {
    if (!hasValidChannel) {
        for (auto& row : output) std::fill(row.begin(), row.end(), std::complex<double>{});
        return;
    }
    for (auto& row : symbolMarks) std::fill(row.begin(), row.end(), 0);
    if (takeCancel()) return;
    if (!storesClear) {
        for (auto& row : grid) std::fill(row.begin(), row.end(), std::complex<double>{});
        for (auto& row : occupancy) std::fill(row.begin(), row.end(), 0);
    }
    storesClear = false;
    MarkUnavailable();
    if (takeCancel()) return;

    // The channels in their order of precedence: what is mapped first owns its elements.
    bool anyMapped = false;
    Log("Start Generate PBCH");
    for (auto* generator : pbchGenerators) {
        const bool markAlc = isPrimary && !generator->ReserveOnly && pdschGenerators.empty();
        generator->Generate(frame);
        generator->Map(grid, occupancy, symbolMarks, markAlc, mu, extendedCp);
        if (!generator->ReserveOnly) anyMapped = true;
        if (takeCancel()) return;
    }
    if (!pbchGenerators.empty()) Log("End Generate PBCH");
    if (takeCancel()) return;

    if (!pdcchGenerators.empty()) Log("Start Generate PDCCH");
    for (auto* generator : pdcchGenerators) {
        if (static_cast<int>(generator->GetNumerology()) != numerology) continue;
        const bool markAlc = isPrimary && pbchGenerators.empty() && pdschGenerators.empty();
        generator->Map(grid, occupancy, frame, symbolMarks, markAlc);
        anyMapped = true;
    }
    if (!pdcchGenerators.empty()) Log("End Generate PDCCH");
    if (takeCancel()) return;

    if (!mapCsiRs(frame, false, anyMapped)) return;
    if (!mapPrs(frame, anyMapped)) return;

    if (!pdschGenerators.empty()) Log("Start Generate PDSCH");
    for (std::size_t i = 0; i < pdschGenerators.size(); ++i) {
        auto* generator = pdschGenerators[i];
        if (static_cast<int>(generator->GetNumerology()) != numerology) continue;
        generator->Map(grid, occupancy, frame, symbolMarks, isPrimary && i == 0);
        anyMapped = true;
        if (takeCancel()) return;
    }
    if (!pdschGenerators.empty()) Log("End Generate PDSCH");
    if (takeCancel()) return;
    if (!mapCsiRs(frame, true, anyMapped)) return;
    if (!anyMapped) {
        for (auto& row : output) std::fill(row.begin(), row.end(), std::complex<double>{});
        return;
    }

    Log("Start OFDM");
    const auto phaseMode = settings->PhaseCompensation->getValue();
    double phaseStep = 0.0;
    if (phaseMode == PhaseCompensationMode::Auto || phaseMode == PhaseCompensationMode::Manual)
        phaseStep = (carrier->FrequencyOffset->getValue() + settings->RadioFrequency->getValue()) * 6.283185307179586 /
                    sampleRate;
    blankOutsideWaveform();
    if (takeCancel()) return;
    modulator.Go(grid, output, phaseStep, frame);
    // The symbols cover the frame but for what the truncated transform and prefix lengths of an
    // odd sample rate leave over at its end.
    for (auto& row : output)
        std::fill(row.begin() + static_cast<std::ptrdiff_t>(std::min(modulatedLength, row.size())), row.end(),
                  std::complex<double>{});
    Log("End OFDM");
    if (takeCancel()) return;

    // 30 kHz is the reference level when several numerologies, carriers or noise are summed.
    const bool scale = carrier->NumerologyMode->getValue() == Models::Nr5g::NumerologyMode::MultipleNumerologies ||
                       settings->NRCarriers->getValue()->getCount() >= 2 || settings->AwgnEnabled->getValue();
    if (scale && mu != 1) {
        const double factor = 1.0 / std::sqrt((1 << mu) * 0.5);
        for (auto& row : output)
            for (auto& sample : row) sample *= factor;
    }
    if (frame == 0 && testVectorEnabled) cpAddedFrame = output;

    if (!filters.empty() && static_cast<int>(filters.size()) == numberOfAntennas) {
        for (int a = 0; a < numberOfAntennas; ++a) {
            auto& row = output[static_cast<std::size_t>(a)];
            if (!row.empty())
                filters[static_cast<std::size_t>(a)]->filter(row.data(), static_cast<int>(row.size()), row.data(),
                                                             static_cast<int>(row.size()));
            if (takeCancel()) return;
        }
    }

    const int filterDelay = filters.empty() ? 0 : (static_cast<int>(filters[0]->getDelayLine().size()) - 1) >> 1;
    const int windowSpan =
        isRealTime(phaseMode) ? 0 : static_cast<int>(fftSize * carrier->WindowBeta->getValue());
    const bool centred = carrier->WindowingMethod->getValue() == WindowingMethod::CenteredAtSymbolBoundary;
    sampleDelay = centred ? filterDelay + windowSpan / 2 : filterDelay;
    deriveMarkers(symbolMarks, sampleMarkers, filterDelay + windowSpan / 2);
    takeCancel();
}

}  // namespace Orvalis_NR
