// Channels that meet on one resource element of one antenna where the generators do not
// rate-match one around the other: the waveform would not carry what the user meant.

#include <algorithm>
#include <string>

#include "models/nr_carrier.h"
#include "models/nr_coreset.h"
#include "models/nr_csirs.h"
#include "models/nr_dci.h"
#include "models/nr_dl_bwp.h"
#include "models/nr_dlsch.h"
#include "models/nr_downlink.h"
#include "models/nr_sspbch.h"
#include "rule_support.h"
#include "ssb_overlap.h"
#include "tables/csirs_prs_tables.h"

namespace nrsynth_cli::validation {

namespace {

/// Where a downlink channel lies: numerology, slots, symbols of the slot, common RBs, antennas.
struct Footprint {
    std::string path;
    int mu = 0;
    int bwpIndex = 0;
    int perSlot = 14;
    std::vector<int> slots;
    std::vector<int> symbols;
    std::vector<int> rbs;  ///< common RBs (from point A)
    std::vector<int> antennas;
};

std::vector<int> commonRbs(const std::vector<int>& bwpRbs, const nr::NRDLBWP& bwp) {
    std::vector<int> rbs;
    if (bwp.RBOffset->getValue() < 0 || bwp.RBOffset->getValue() > (1 << 20)) return rbs;  // the grid rules report it
    for (int rb : bwpRbs) rbs.push_back(rb + bwp.RBOffset->getValue());
    return rbs;
}

std::string firstShared(const std::vector<int>& a, const std::vector<int>& b) {
    for (int x : a)
        if (std::find(b.begin(), b.end(), x) != b.end()) return std::to_string(x);
    return "?";
}

bool meet(const Footprint& a, const Footprint& b) {
    return a.mu == b.mu && overlaps(a.slots, b.slots) && overlaps(a.symbols, b.symbols) && overlaps(a.rbs, b.rbs) &&
           overlaps(a.antennas, b.antennas);
}

std::string whereTheyMeet(const Footprint& a, const Footprint& b) {
    return "slot " + firstShared(a.slots, b.slots) + ", symbol " + firstShared(a.symbols, b.symbols) + ", common RB " +
           firstShared(a.rbs, b.rbs) + ", antenna " + firstShared(a.antennas, b.antennas);
}

/// Symbols of a CSI-RS resource in its slot: l0 or l1 plus the l offset and l' of each entry of
/// TS 38.211 Table 7.4.1.5.3-1.
std::vector<int> csiRsSymbols(const nr::NRCSIRS& csiRs) {
    const int row = csiRs.RowIndex->getValue();
    std::vector<int> symbols;
    if (row < 1 || row > 18) return symbols;
    const auto& entry = Orvalis_NR::tables::kCsiRsLocations[static_cast<std::size_t>(row - 1)];
    for (int e = 0; e < entry.entryCount; ++e) {
        const auto& location = entry.entries[static_cast<std::size_t>(e)];
        const int base = (location.lIndex == 0 ? csiRs.FirstSymbol->getValue() : csiRs.FirstSymbol2->getValue()) + location.lOffset;
        for (int l = 0; l < entry.lPrimes; ++l)
            if (std::find(symbols.begin(), symbols.end(), base + l) == symbols.end()) symbols.push_back(base + l);
    }
    return symbols;
}

struct DownlinkChannels {
    std::vector<Footprint> pdschs;
    std::vector<int> pdschRmCoreset;  ///< CoresetIdForRM per PDSCH
    std::vector<Footprint> coresets;  ///< one per enabled DCI: its CORESET in its slots
    std::vector<int> coresetIds;
    std::vector<Footprint> csiRs;
    std::vector<bool> csiRsPunctures;  ///< REUsedForPDSCH: the PDSCH is not rate-matched around it
};

DownlinkChannels collect(const CarrierRef& ref) {
    DownlinkChannels channels;
    const auto& carrier = *ref.carrier;
    const auto downlink = carrier.Downlink->getValue();
    const std::string base = ref.path + ".Downlink";

    const auto pdschs = downlink->DLSCH->getValue();
    for (int i = 0; i < pdschs->getCount(); ++i) {
        const auto& pdsch = *pdschs->getItem(i);
        const auto* bwp = downlinkBwp(carrier, pdsch.BWPIndex->getValue());
        if (!pdsch.Enabled->getValue() || !bwp) continue;
        Footprint f;
        f.path = itemPath(base, "DLSCH", i);
        f.mu = muOf(bwp->Numerology->getValue());
        f.bwpIndex = pdsch.BWPIndex->getValue();
        f.slots = slotsOf(pdsch.SlotIndexArrayStr->getValue());
        f.symbols = rangeOf(pdsch.FirstSymbol->getValue(), std::clamp(pdsch.SymbolNumber->getValue(), 0, 14));
        f.rbs = commonRbs(pdschRbs(pdsch, *bwp), *bwp);
        f.antennas = antennaRows(pdsch.AntennaPortArray->getValue());
        channels.pdschs.push_back(std::move(f));
        channels.pdschRmCoreset.push_back(pdsch.CoresetIdForRM->getValue());
    }

    const auto dcis = downlink->DCI->getValue();
    for (int i = 0; i < dcis->getCount(); ++i) {
        const auto& dci = *dcis->getItem(i);
        const auto* bwp = downlinkBwp(carrier, dci.BWPIndex->getValue());
        if (!dci.Enabled->getValue() || !bwp) continue;
        const auto* coreset = coresetAt(*bwp, dci.CoresetIndex->getValue());
        if (!coreset) continue;
        Footprint f;
        f.path = itemPath(base, "DCI", i);
        f.mu = muOf(bwp->Numerology->getValue());
        f.bwpIndex = dci.BWPIndex->getValue();
        f.slots = slotsOf(dci.SlotIndexArrayStr->getValue());
        f.symbols = rangeOf(dci.FirstSymbol->getValue(), std::clamp(coreset->SymbolNumber->getValue(), 0, 3));
        f.rbs = commonRbs(coresetRbs(*coreset, *bwp), *bwp);
        f.antennas = antennaRows(dci.AntennaPortArray->getValue());
        f.perSlot = symbolsPerSlot(bwp->CPType->getValue());
        channels.coresets.push_back(std::move(f));
        channels.coresetIds.push_back(coreset->ID->getValue());
    }

    const auto csiRss = downlink->CSIRS->getValue();
    for (int i = 0; i < csiRss->getCount(); ++i) {
        const auto& csiRs = *csiRss->getItem(i);
        const auto* bwp = downlinkBwp(carrier, csiRs.BWPIndex->getValue());
        if (!csiRs.Enabled->getValue() || !bwp) continue;
        Footprint f;
        f.path = itemPath(base, "CSIRS", i);
        f.mu = muOf(bwp->Numerology->getValue());
        f.bwpIndex = csiRs.BWPIndex->getValue();
        f.slots = slotsOf(csiRs.SlotIndexArrayStr->getValue());
        f.symbols = csiRsSymbols(csiRs);
        const int offset = csiRs.RBOffset->getValue();
        f.rbs = commonRbs(rangeOf(offset, std::clamp(csiRs.RBNumber->getValue(), 0, std::max(0, bwp->RBNumber->getValue() - offset))), *bwp);
        f.antennas = antennaRows(csiRs.AntennaPortArray->getValue());
        f.perSlot = symbolsPerSlot(bwp->CPType->getValue());
        channels.csiRs.push_back(std::move(f));
        channels.csiRsPunctures.push_back(csiRs.REUsedForPDSCH->getValue());
    }
    return channels;
}

/// The first SS/PBCH block that a channel meets, or null; `slotMet` receives the channel's slot.
const SsbBlock* blockMet(const Footprint& f, const std::vector<SsbBlock>& blocks, int& slotMet) {
    if (f.rbs.empty()) return nullptr;
    const double rbWidth = 12 * 15000.0 * (1 << f.mu);
    const auto [lowRb, highRb] = std::minmax_element(f.rbs.begin(), f.rbs.end());
    const double low = *lowRb * rbWidth;
    const double high = (*highRb + 1) * rbWidth;
    for (const auto& block : blocks) {
        if (high <= block.lowHz || low >= block.highHz) continue;
        for (int slot : f.slots)
            for (int symbol : f.symbols) {
                const long long start = symbolStart(f.mu, slot, symbol, f.perSlot);
                if (start < block.timeEnd && start + symbolLength(f.mu) > block.timeStart) {
                    slotMet = slot;
                    return &block;
                }
            }
    }
    return nullptr;
}

/// Neither the PDCCH nor a CSI-RS is mapped around an SS/PBCH block (the PDSCH is, always).
void checkOverSsb(const CarrierRef& ref, const DownlinkChannels& channels, int frames, FindingList& findings) {
    const auto& ssb = *ref.carrier->Downlink->getValue()->SSPBCH->getValue();
    const auto blocks = ssbBlocks(ssb, *ref.carrier, frames);
    if (blocks.empty()) return;
    const auto ssbAntennas = antennaRows(ssb.AntennaPortArray->getValue());
    int slot = 0;
    const auto report = [&](const Footprint& f, const char* what) {
        if (!overlaps(f.antennas, ssbAntennas)) return;
        const auto* block = blockMet(f, blocks, slot);
        if (!block) return;
        findings.error(f.path + ".SlotIndexArrayStr", "slot " + std::to_string(slot),
                       std::string(what) + " meets SS/PBCH block " + std::to_string(block->index) + " of frame " +
                           std::to_string(block->frame) +
                           " on one antenna: the SS/PBCH block's resource elements are not available to it "
                           "(TS 38.213 clause 4.1); move it in slots, symbols or RBs");
    };
    for (const auto& coreset : channels.coresets) report(coreset, "the CORESET of this PDCCH");
    for (const auto& csiRs : channels.csiRs) report(csiRs, "the CSI-RS");
    // The PDSCH is rate-matched around the block on every antenna: worth knowing, since the
    // transport block size does not count those elements and the code rate rises.
    for (const auto& pdsch : channels.pdschs)
        if (const auto* block = blockMet(pdsch, blocks, slot))
            findings.warning(pdsch.path + ".SlotIndexArrayStr", "slot " + std::to_string(slot),
                             "the PDSCH's RBs meet SS/PBCH block " + std::to_string(block->index) + " of frame " +
                                 std::to_string(block->frame) +
                                 ": it is rate-matched around the block, which the transport block size of TS 38.214 "
                                 "clause 5.1.3.2 does not count, so the effective code rate rises");
}

void checkDownlink(const CarrierRef& ref, int frames, FindingList& findings) {
    const auto channels = collect(ref);
    checkOverSsb(ref, channels, frames, findings);
    const auto& pdschs = channels.pdschs;
    for (std::size_t i = 0; i < pdschs.size(); ++i) {
        for (std::size_t j = 0; j < i; ++j)
            if (meet(pdschs[i], pdschs[j]))
                findings.error(pdschs[i].path, "on " + pdschs[j].path,
                               "two PDSCHs share resource elements of one antenna (" + whereTheyMeet(pdschs[i], pdschs[j]) +
                                   "): move one in slots, symbols, RBs or AntennaPortArray");
        for (std::size_t c = 0; c < channels.coresets.size(); ++c) {
            const auto& coreset = channels.coresets[c];
            const bool rateMatched = coreset.bwpIndex == pdschs[i].bwpIndex && channels.pdschRmCoreset[i] == channels.coresetIds[c];
            if (rateMatched || !meet(pdschs[i], coreset)) continue;
            findings.error(pdschs[i].path + ".CoresetIdForRM", std::to_string(channels.pdschRmCoreset[i]),
                           "the PDSCH crosses the CORESET (ID " + std::to_string(channels.coresetIds[c]) + ") of " +
                               coreset.path + " (" + whereTheyMeet(pdschs[i], coreset) +
                               "): set CoresetIdForRM to " + std::to_string(channels.coresetIds[c]) +
                               " so that the PDSCH is rate-matched around it (TS 38.214 clause 5.1.4.1)");
        }
        for (std::size_t c = 0; c < channels.csiRs.size(); ++c)
            if (const auto& csiRs = channels.csiRs[c]; channels.csiRsPunctures[c] && meet(pdschs[i], csiRs))
                findings.warning(csiRs.path + ".REUsedForPDSCH", "true",
                                 "the CSI-RS punctures the data of " + pdschs[i].path + " (" + whereTheyMeet(pdschs[i], csiRs) +
                                     "); set REUsedForPDSCH to false to rate-match the PDSCH around it (TS 38.214 clause 5.1.4)");
    }
}

}  // namespace

void checkCollisions(const nr::NR5GWaveformSettings& waveform, FindingList& findings) {
    for (const auto& ref : activeCarriers(waveform))
        if (ref.carrier->CarrierType->getValue() == nr::CarrierType::DL)
            checkDownlink(ref, waveform.NumberOfFrames->getValue(), findings);
}

}  // namespace nrsynth_cli::validation
