#include "rule_support.h"

#include <algorithm>
#include <exception>

#include "common/list_text.h"
#include "models/nr_carrier.h"
#include "models/nr_dl_bwp.h"
#include "models/nr_dlsch.h"
#include "models/nr_downlink.h"
#include "models/nr_ul_bwp.h"
#include "models/nr_uplink.h"

namespace nrsynth_cli::validation {

std::vector<CarrierRef> activeCarriers(const nr::NR5GWaveformSettings& waveform) {
    std::vector<CarrierRef> carriers;
    if (waveform.Capability->getValue() != nr::CapabilityEnum::Arb) return carriers;
    const auto list = waveform.NRCarriers->getValue();
    for (int c = 0; c < list->getCount(); ++c) {
        const auto carrier = list->getItem(c);
        if (carrier->Enabled->getValue()) carriers.push_back({carrier.get(), itemPath("", "NRCarriers", c)});
    }
    return carriers;
}

int muOf(nr::Numerology numerology) {
    switch (numerology) {
        case nr::Numerology::SCS15k: return 0;
        case nr::Numerology::SCS30k: return 1;
        case nr::Numerology::SCS60kNCP:
        case nr::Numerology::SCS60kECP: return 2;
        case nr::Numerology::SCS120k: return 3;
        case nr::Numerology::SCS240k: return 4;
    }
    return 0;
}

int symbolsPerSlot(nr::CyclicPrefixType cp) { return cp == nr::CyclicPrefixType::Extended ? 12 : 14; }

int slotsInWaveform(const nr::NR5GWaveformSettings& waveform, int mu) {
    return std::clamp(waveform.NumberOfFrames->getValue(), 0, 1 << 16) * (10 << std::clamp(mu, 0, 4));
}

std::optional<std::vector<int>> intList(const std::string& text) {
    try {
        return Orvalis_NR::intsFromCommaList(text);
    } catch (const std::exception&) {
        return std::nullopt;
    }
}

std::string quoted(const std::string& text) { return "\"" + text + "\""; }

std::string itemPath(const std::string& parent, const char* collection, int index) {
    return (parent.empty() ? std::string() : parent + ".") + collection + "[" + std::to_string(index) + "]";
}

const nr::NRDLBWP* downlinkBwp(const nr::NRCarrier& carrier, int index) {
    return carrier.Downlink->getValue()->BWP->getValue()->getItem(index).get();
}

const nr::NRULBWP* uplinkBwp(const nr::NRCarrier& carrier, int index) {
    return carrier.Uplink->getValue()->BWP->getValue()->getItem(index).get();
}

const nr::NRCORESET* coresetAt(const nr::NRDLBWP& bwp, int position) {
    if (position < 0 || position > 2) return nullptr;
    if (position > 0 && bwp.NumberOfCoreset->getValue() < position + 1) return nullptr;
    const auto& setting = position == 0 ? bwp.Coreset0 : position == 1 ? bwp.Coreset1 : bwp.Coreset2;
    return setting->getValue().get();
}

int coresetFirstRb(const nr::NRCORESET& coreset, const nr::NRDLBWP& bwp) {
    const int offset = coreset.RBOffset->getValue();
    if (offset != -1) return offset;
    const int bwpStart = bwp.RBOffset->getValue();
    return ((6 - bwpStart % 6) % 6 + 6) % 6;
}

std::vector<int> coresetRbs(const nr::NRCORESET& coreset, const nr::NRDLBWP& bwp) {
    const int start = coresetFirstRb(coreset, bwp);
    if (start < -1 || start > (1 << 20)) return {start};  // far outside: its first RB tells the rule so
    if (coreset.ID->getValue() == 0 && bwp.InitialDLBWP->getValue())
        return rangeOf(start, std::clamp(coreset.RBNumber->getValue(), 0, 4096));
    std::vector<int> rbs;
    const std::string bitmap = coreset.FrequencyDomainBitmap->getValue();
    for (std::size_t g = 0; g < bitmap.size() && g < 4096; ++g)
        if (bitmap[g] == '1')
            for (int r = 0; r < 6; ++r) rbs.push_back(start + 6 * static_cast<int>(g) + r);
    return rbs;
}

int rbgCount(int start, int size, int p) {
    if (p < 1 || size < 1 || start < 0) return 0;
    return (size + start % p + p - 1) / p;
}

std::vector<int> pdschRbs(const nr::NRDLSCH& pdsch, const nr::NRDLBWP& bwp) {
    const int bwpSize = std::clamp(bwp.RBNumber->getValue(), 0, 4096);
    if (pdsch.RAType->getValue() != nr::RAType::RAType0) {
        const int start = pdsch.RBOffset->getValue();
        const int count = pdsch.RBNumber->getValue();
        if (start < 0 || count < 1 || start >= bwpSize) return {};
        return rangeOf(start, std::min(count, bwpSize - start));
    }
    const int p = pdsch.RBGSize->getValue();
    const int s = bwp.RBOffset->getValue();
    if (p < 1 || p > 16 || s < 0) return {};
    const std::string bitmap = pdsch.RBGBitmap->getValue();
    std::vector<int> rbs;
    const int firstGroupSize = p - s % p;
    for (int rb = 0; rb < bwpSize; ++rb) {
        const int group = rb < firstGroupSize ? 0 : 1 + (rb - firstGroupSize) / p;
        if (group < static_cast<int>(bitmap.size()) && bitmap[static_cast<std::size_t>(group)] == '1')
            rbs.push_back(rb);
    }
    return rbs;
}

std::vector<int> antennaRows(const std::string& antennaPortArray) {
    std::vector<int> rows;
    const auto ports = intList(antennaPortArray);
    if (!ports) return rows;
    for (std::size_t a = 0; a < ports->size(); ++a)
        if ((*ports)[a] != -1) rows.push_back(static_cast<int>(a));
    return rows;
}

bool overlaps(const std::vector<int>& a, const std::vector<int>& b) {
    for (int x : a)
        if (std::find(b.begin(), b.end(), x) != b.end()) return true;
    return false;
}

std::vector<int> rangeOf(int first, int count) {
    std::vector<int> values;
    for (int i = 0; i < count; ++i) values.push_back(first + i);
    return values;
}

std::vector<int> slotsOf(const std::string& slotIndexArrayStr) {
    auto slots = intList(slotIndexArrayStr);
    return slots ? *slots : std::vector<int>{};
}

}  // namespace nrsynth_cli::validation
