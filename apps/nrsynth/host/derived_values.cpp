#include "host/derived_values.h"

#include <algorithm>
#include <cmath>
#include <stdexcept>

#include "framework/json_serializer.h"
#include "host/shared_channel_size.h"
#include "host/slot_text.h"
#include "models/all_models.h"

namespace nrsynth_host {

using namespace Models::Nr5g;

namespace {

using Json = nlohmann::ordered_json;

/// The items of a collection as the document writes it: a plain array or {"$values": [...]}.
Json* collectionItems(Json& owner, const char* key) {
    if (!owner.is_object() || !owner.contains(key)) return nullptr;
    Json& value = owner[key];
    if (value.is_array()) return &value;
    if (value.is_object() && value.contains("$values") && value["$values"].is_array()) return &value["$values"];
    return nullptr;
}

Json* child(Json& owner, const char* key) {
    if (!owner.is_object() || !owner.contains(key) || !owner[key].is_object()) return nullptr;
    return &owner[key];
}

/// One object of the document beside the model the library reads from it.
template <typename Model>
struct Node {
    Json& json;
    std::shared_ptr<Model> model;
    std::string path;
};

/// Visits item i of a collection in the document and in the tree together.
template <typename Model, typename Collection, typename Visit>
void forEachItem(Json& owner, const char* key, const std::shared_ptr<Collection>& items, const std::string& path,
                 Visit&& visit) {
    Json* array = collectionItems(owner, key);
    if (!array || !items) return;
    for (int i = 0; i < items->getCount() && i < static_cast<int>(array->size()); ++i) {
        Json& item = (*array)[static_cast<std::size_t>(i)];
        if (!item.is_object()) continue;
        visit(Node<Model>{item, items->getItem(i), path + "." + key + "[" + std::to_string(i) + "]"});
    }
}

class Completer {
  public:
    explicit Completer(Completion& out) : out_(out) {}

    /// Fills `key` of `node` with `value` when the document leaves it out; the tree's setting
    /// takes the value too, so later rules see it.
    template <typename Model, typename Setting, typename Value>
    void fill(Node<Model>& node, Setting& setting, const Value& value) {
        const std::string key = setting->getName();
        if (node.json.contains(key)) return;
        setting->setValue(value);
        if constexpr (std::is_enum_v<Value>)
            node.json[key] = setting->toString();
        else
            node.json[key] = value;
        out_.derived.push_back({node.path + "." + key, node.json[key]});
    }

    void problem(const std::string& path, const std::string& text) { out_.problems.push_back(path + ": " + text); }

  private:
    Completion& out_;
};

template <typename Model>
void fillMu(Completer& completer, Node<Model>& node) {
    completer.fill(node, node.model->Mu, muOfNumerology(static_cast<int>(node.model->Numerology->getValue())));
}

template <typename Model>
void fillLastSymbol(Completer& completer, Node<Model>& node) {
    completer.fill(node, node.model->LastSymbol,
                   node.model->FirstSymbol->getValue() + node.model->SymbolNumber->getValue() - 1);
}

/// BWPIndex is the place in the link's BWP collection of the part named BWPName.
template <typename Model, typename Bwps>
void fillBwpIndex(Completer& completer, Node<Model>& node, const std::shared_ptr<Bwps>& bwps) {
    const std::string name = node.model->BWPName->getValue();
    for (int i = 0; bwps && i < bwps->getCount(); ++i)
        if (bwps->getItem(i)->Name->getValue() == name) return completer.fill(node, node.model->BWPIndex, i);
    if (!node.json.contains("BWPIndex"))
        completer.problem(node.path + ".BWPIndex", "no bandwidth part is named \"" + name + "\"");
}

/// µ of the bandwidth part a channel uses, or the carrier's when the part is missing.
template <typename Model, typename Bwps>
int channelMu(const Node<Model>& node, const std::shared_ptr<Bwps>& bwps, const NRCarrier& carrier) {
    const auto bwp = bwps ? bwps->getItem(node.model->BWPIndex->getValue()) : nullptr;
    return muOfNumerology(static_cast<int>((bwp ? bwp->Numerology : carrier.Numerology)->getValue()));
}

template <typename Model>
void fillSlots(Completer& completer, Node<Model>& node, int mu, int frames) {
    if (node.json.contains("SlotIndexArrayStr")) return;
    try {
        completer.fill(node, node.model->SlotIndexArrayStr,
                       expandSlotText(node.model->SlotIndexStr->getValue(), 10 << mu, frames));
    } catch (const std::invalid_argument& e) {
        completer.problem(node.path + ".SlotIndexStr", "\"" + node.model->SlotIndexStr->getValue() + "\": " + e.what());
    }
}

/// Modulation, CodingRate and TransportBlockSize of a shared channel from its MCS.
template <typename Model>
void fillSharedChannel(Completer& completer, Node<Model>& node, const SharedChannelSize& size) {
    if (!size.valid) {
        const bool wanted = !node.json.contains("TransportBlockSize") || !node.json.contains("CodingRate") ||
                            !node.json.contains("Modulation");
        if (wanted) completer.problem(node.path + ".TransportBlockSize", size.reason);
        return;
    }
    completer.fill(node, node.model->Modulation, size.modulation);
    completer.fill(node, node.model->CodingRate, size.codeRate);
    completer.fill(node, node.model->TransportBlockSize, size.transportBlockSize);
}

void completeDownlink(Completer& completer, Json& carrierJson, const NRCarrier& carrier, const std::string& path,
                      int frames) {
    Json* downlinkJson = child(carrierJson, "Downlink");
    if (!downlinkJson) return;
    const auto downlink = carrier.Downlink->getValue();
    const std::string here = path + ".Downlink";
    const auto bwps = downlink->BWP->getValue();
    forEachItem<NRDLBWP>(*downlinkJson, "BWP", bwps, here, [&](Node<NRDLBWP> node) { fillMu(completer, node); });
    if (Json* ssb = child(*downlinkJson, "SSPBCH")) {
        Node<NRSSPBCH> node{*ssb, downlink->SSPBCH->getValue(), here + ".SSPBCH"};
        fillMu(completer, node);
    }
    forEachItem<NRDCI>(*downlinkJson, "DCI", downlink->DCI->getValue(), here, [&](Node<NRDCI> node) {
        fillBwpIndex(completer, node, bwps);
        fillSlots(completer, node, channelMu(node, bwps, carrier), frames);
    });
    forEachItem<NRCSIRS>(*downlinkJson, "CSIRS", downlink->CSIRS->getValue(), here, [&](Node<NRCSIRS> node) {
        fillBwpIndex(completer, node, bwps);
        fillSlots(completer, node, channelMu(node, bwps, carrier), frames);
    });
    forEachItem<NRDLSCH>(*downlinkJson, "DLSCH", downlink->DLSCH->getValue(), here, [&](Node<NRDLSCH> node) {
        fillBwpIndex(completer, node, bwps);
        fillLastSymbol(completer, node);
        fillSlots(completer, node, channelMu(node, bwps, carrier), frames);
        const auto bwp = bwps ? bwps->getItem(node.model->BWPIndex->getValue()) : nullptr;
        fillSharedChannel(completer, node, downlinkSharedChannelSize(*node.model, bwp.get()));
    });
}

void completeUplink(Completer& completer, Json& carrierJson, const NRCarrier& carrier, const std::string& path,
                    int frames) {
    Json* uplinkJson = child(carrierJson, "Uplink");
    if (!uplinkJson) return;
    const auto uplink = carrier.Uplink->getValue();
    const std::string here = path + ".Uplink";
    const auto bwps = uplink->BWP->getValue();
    forEachItem<NRULBWP>(*uplinkJson, "BWP", bwps, here, [&](Node<NRULBWP> node) { fillMu(completer, node); });
    forEachItem<NRUCI>(*uplinkJson, "UCI", uplink->UCI->getValue(), here, [&](Node<NRUCI> node) {
        fillBwpIndex(completer, node, bwps);
        fillLastSymbol(completer, node);
        fillSlots(completer, node, channelMu(node, bwps, carrier), frames);
    });
    forEachItem<NRSRS>(*uplinkJson, "SRSs", uplink->SRSs->getValue(), here, [&](Node<NRSRS> node) {
        fillBwpIndex(completer, node, bwps);
        fillSlots(completer, node, muOfNumerology(static_cast<int>(node.model->Numerology->getValue())), frames);
    });
    forEachItem<NRULSCH>(*uplinkJson, "ULSCH", uplink->ULSCH->getValue(), here, [&](Node<NRULSCH> node) {
        fillBwpIndex(completer, node, bwps);
        fillLastSymbol(completer, node);
        fillSlots(completer, node, channelMu(node, bwps, carrier), frames);
        const auto bwp = bwps ? bwps->getItem(node.model->BWPIndex->getValue()) : nullptr;
        const bool pi2Bpsk = node.json.contains("Modulation") && node.model->Modulation->getValue() == ModulationType::BPSK;
        fillSharedChannel(completer, node, uplinkSharedChannelSize(*node.model, bwp.get(), pi2Bpsk));
    });
}

double subcarrierSpacingHz(const NRCarrier& carrier) {
    return 15000.0 * (1 << muOfNumerology(static_cast<int>(carrier.Numerology->getValue())));
}

}  // namespace

int muOfNumerology(int numerologyPosition) {
    static constexpr int kMu[] = {0, 1, 2, 2, 3, 4};
    return numerologyPosition >= 0 && numerologyPosition < 6 ? kMu[numerologyPosition] : 0;
}

double autoSampleRate(const std::vector<double>& carrierOffsetsHz, const std::vector<double>& carrierWidthsHz) {
    double reach = 0.0;
    for (std::size_t i = 0; i < carrierOffsetsHz.size() && i < carrierWidthsHz.size(); ++i)
        reach = std::max(reach, std::abs(carrierOffsetsHz[i]) + carrierWidthsHz[i] / 2);
    for (int n = -4; n <= 4; ++n) {
        const double rate = std::ldexp(30.72e6, n);
        if (rate >= 1.25 * 2 * reach) return rate;
    }
    return 0.0;
}

Completion completeDocument(const nlohmann::ordered_json& document) {
    Completion out;
    out.document = document;
    Orvalis::Tessaline::JsonSerializer reader;
    const auto settings = std::dynamic_pointer_cast<NR5GWaveformSettings>(reader.deserialize(document.dump()));
    if (!settings) throw std::runtime_error("the document's root is not a waveform");
    Completer completer(out);
    const int frames = std::max(1, settings->NumberOfFrames->getValue());

    std::vector<double> offsets;
    std::vector<double> widths;
    forEachItem<NRCarrier>(out.document, "NRCarriers", settings->NRCarriers->getValue(), "",
                           [&](Node<NRCarrier> node) {
                               node.path.erase(0, 1);  // "NRCarriers[0]", not ".NRCarriers[0]"
                               fillMu(completer, node);
                               completeDownlink(completer, node.json, *node.model, node.path, frames);
                               completeUplink(completer, node.json, *node.model, node.path, frames);
                               if (!node.model->Enabled->getValue()) return;
                               offsets.push_back(node.model->FrequencyOffset->getValue());
                               widths.push_back(node.model->NumberOfRB->getValue() * 12 * subcarrierSpacingHz(*node.model));
                           });
    if (!out.document.contains("SampleRateAuto")) {
        const double rate = autoSampleRate(offsets, widths);
        if (rate > 0.0) {
            out.document["SampleRateAuto"] = rate;
            settings->SampleRateAuto->setValue(rate);
            out.derived.push_back({"SampleRateAuto", rate});
        } else {
            completer.problem("SampleRateAuto", "no rate of 30.72 MHz x 2^n up to 491.52 MHz holds the carriers");
        }
    }
    return out;
}

}  // namespace nrsynth_host
