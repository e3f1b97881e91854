// Host values written in the document that contradict what they are derived from: each is
// compared with the value the host would work out were the key left out.

#include "derived_rules.h"

#include <cmath>
#include <exception>
#include <string>

#include "host/derived_values.h"

namespace nrsynth_cli::validation {

namespace {

using Json = nlohmann::ordered_json;

struct DerivedKey {
    const char* key;
    const char* inputs[2];  ///< keys it follows from: one of them must be written for a contradiction
    const char* source;     ///< what the value follows from, for the message
    Severity severity;
};

// CodingRate only steers the base graph choice and the report; the others change the waveform.
constexpr DerivedKey kDerivedKeys[] = {
    {"Mu", {"Numerology", "Numerology"}, "Numerology", Severity::Error},
    {"SlotIndexArrayStr", {"SlotIndexStr", "SlotIndexStr"}, "SlotIndexStr over NumberOfFrames", Severity::Error},
    {"LastSymbol", {"FirstSymbol", "SymbolNumber"}, "FirstSymbol + SymbolNumber - 1", Severity::Error},
    {"TransportBlockSize", {"MCS", "MCS"},
     "MCS, MCSTable, layers, RBs, symbols, DM-RS and overhead (TS 38.214 clause 5.1.3.2)", Severity::Error},
    {"Modulation", {"MCS", "MCS"}, "MCS and MCSTable (TS 38.214 clause 5.1.3.1)", Severity::Error},
    {"CodingRate", {"MCS", "MCS"}, "MCS and MCSTable (TS 38.214 clause 5.1.3.1)", Severity::Warning},
};

void stripKey(Json& node, const std::string& key) {
    if (node.is_object()) {
        node.erase(key);
        for (auto& [name, value] : node.items()) stripKey(value, key);
    } else if (node.is_array()) {
        for (auto& value : node) stripKey(value, key);
    }
}

/// The value at a path such as NRCarriers[0].Downlink.DLSCH[1].MCS, through the "$values" form
/// of collections; null when absent. `parent` receives the object that holds it.
const Json* findPath(const Json& document, const std::string& path, const Json** parent) {
    const Json* node = &document;
    std::size_t at = 0;
    while (at < path.size()) {
        std::size_t end = path.find_first_of(".[", at);
        if (end == std::string::npos) end = path.size();
        const std::string key = path.substr(at, end - at);
        if (!key.empty()) {
            if (!node->is_object() || !node->contains(key)) return nullptr;
            *parent = node;
            node = &(*node)[key];
        }
        at = end;
        if (at < path.size() && path[at] == '[') {
            const std::size_t close = path.find(']', at);
            if (close == std::string::npos) return nullptr;
            const auto index = static_cast<std::size_t>(std::stoul(path.substr(at + 1, close - at - 1)));
            if (node->is_object() && node->contains("$values")) node = &(*node)["$values"];
            if (!node->is_array() || index >= node->size()) return nullptr;
            node = &(*node)[index];
            at = close + 1;
        }
        if (at < path.size() && path[at] == '.') ++at;
    }
    return node;
}

bool sameValue(const Json& written, const Json& derived, const char* key) {
    if (written.is_number() && derived.is_number()) {
        const double tolerance = std::string(key) == "CodingRate" ? 0.5 / 1024.0 : 1e-9;
        return std::abs(written.get<double>() - derived.get<double>()) <= tolerance;
    }
    return written == derived;
}

std::string shown(const Json& value) { return value.is_string() ? "\"" + value.get<std::string>() + "\"" : value.dump(); }

}  // namespace

void checkDerivedValues(const Json& document, FindingList& findings) {
    for (const auto& rule : kDerivedKeys) {
        Json stripped = document;
        stripKey(stripped, rule.key);
        nrsynth_host::Completion completion;
        try {
            completion = nrsynth_host::completeDocument(stripped);
        } catch (const std::exception&) {
            return;  // the reader's problems are reported on their own
        }
        for (const auto& derived : completion.derived) {
            const std::string suffix = std::string(".") + rule.key;
            if (derived.path.size() < suffix.size() || derived.path.compare(derived.path.size() - suffix.size(), suffix.size(), suffix) != 0)
                continue;
            const Json* parent = nullptr;
            const Json* written = findPath(document, derived.path, &parent);
            if (!written || !parent) continue;
            if (!parent->contains(rule.inputs[0]) && !parent->contains(rule.inputs[1])) continue;
            if (parent->contains("Enabled") && (*parent)["Enabled"].is_boolean() && !(*parent)["Enabled"].get<bool>()) continue;
            // With pi/2 BPSK written in, the modulation is an input of the uplink tables.
            if (std::string(rule.key) == "Modulation" && written->is_string() && written->get<std::string>() == "BPSK") continue;
            if (sameValue(*written, derived.value, rule.key)) continue;
            const std::string rule_text = "contradicts " + std::string(rule.source) + ", which give(s) " + shown(derived.value) +
                                          "; correct it or leave the key out to have it worked out";
            if (rule.severity == Severity::Error)
                findings.error(derived.path, shown(*written), rule_text);
            else
                findings.warning(derived.path, shown(*written), rule_text);
        }
    }
}

}  // namespace nrsynth_cli::validation
