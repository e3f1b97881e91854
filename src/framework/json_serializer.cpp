#include "json_serializer.h"

#include <algorithm>
#include <limits>
#include <nlohmann/json.hpp>

#include "enum_setting.h"
#include "model_collection.h"
#include "model_container.h"
#include "value_setting.h"

namespace Orvalis::Tessaline {

using nlohmann::json;
using nlohmann::ordered_json;

namespace {

/// A bad value described by kind and size, never by a recursive dump: a scalar as its text
/// (a long string cut short), a container by its element count.
std::string kindOf(const json& value) {
    const auto count = [](std::size_t n, const char* one, const char* many) {
        return std::to_string(n) + " " + (n == 1 ? one : many);
    };
    switch (value.type()) {
        case json::value_t::array:
            return value.empty() ? "an empty array"
                                 : "an array of " + count(value.size(), "element", "elements");
        case json::value_t::object:
            return value.empty() ? "an empty object"
                                 : "an object with " + count(value.size(), "key", "keys");
        case json::value_t::string: {
            const auto& text = value.get_ref<const std::string&>();
            if (text.size() <= 60)
                return json(text).dump(-1, ' ', false, json::error_handler_t::replace);
            return json(text.substr(0, 57)).dump(-1, ' ', false, json::error_handler_t::replace) +
                   "... (" + std::to_string(text.size()) + " bytes)";
        }
        default:
            return value.dump();
    }
}

/// What a scan of the raw text tells before parsing: where it first nests deeper than the
/// limit (npos when never), and a bound on its number of values (one per separator and
/// container). Checked first, so that no stage, the parser included, sees such a document.
struct TextShape {
    std::size_t tooDeepAt = std::string::npos;
    std::size_t values = 1;
};

TextShape scanShape(const std::string& text, int depthLimit) {
    TextShape shape;
    int depth = 0;
    bool inString = false;
    for (std::size_t i = 0; i < text.size(); ++i) {
        const char c = text[i];
        if (inString) {
            if (c == '\\')
                ++i;
            else if (c == '"')
                inString = false;
        } else if (c == '"') {
            inString = true;
        } else if (c == '[' || c == '{') {
            ++shape.values;
            if (++depth > depthLimit) {
                shape.tooDeepAt = i;
                return shape;
            }
        } else if (c == ']' || c == '}') {
            --depth;
        } else if (c == ',') {
            ++shape.values;
        }
    }
    return shape;
}

/// Settings held by a model and everything below it.
std::size_t countSettings(const IModel& model) {
    std::size_t count = 0;
    if (model.isCollection()) {
        const auto& collection = static_cast<const ModelCollectionBase&>(model);
        for (int i = 0; i < collection.getCount(); ++i)
            if (auto item = collection.getCommonItem(i)) count += countSettings(*item);
        return count;
    }
    if (const auto* base = dynamic_cast<const ModelBase*>(&model)) {
        count += base->settings.size();
        for (const auto& setting : base->settings)
            if (setting->isSubSetting())
                if (auto held = setting->getCommonValue()) count += countSettings(*held);
    }
    return count;
}

std::string child(const std::string& path, const std::string& key) {
    return path.empty() ? key : path + "." + key;
}

std::string where(const std::string& path) {
    return path.empty() ? "(root)" : path;
}

}  // namespace

/// Walks a parsed document into a model tree.
class JsonReader {
  public:
    JsonReader(JsonSerializer& owner, std::size_t settingsBudget)
        : owner_(owner), settingsLeft_(settingsBudget) {}

    void fillModel(const json& value, IModel& model, const std::string& path) {
        if (model.isCollection()) {
            fillCollection(value, static_cast<ModelCollectionBase&>(model), path);
            return;
        }
        if (!value.is_object()) {
            fail(path, "expected an object of type " + model.getFullTypeName() + ", got " +
                           kindOf(value));
            return;
        }
        if (!checkType(value, model, path)) return;
        auto* base = dynamic_cast<ModelBase*>(&model);
        if (!base) return;
        for (const auto& [key, item] : value.items()) {
            if (key == "$type") continue;
            auto setting = base->findSetting(key);
            if (!setting) {
                owner_.unknownKeys_.push_back(child(path, key));
                continue;
            }
            fillSetting(item, *setting, child(path, key));
        }
        base->onDeserialized();
    }

  private:
    bool checkType(const json& value, IModel& model, const std::string& path) {
        const auto it = value.find("$type");
        if (it == value.end()) return true;
        if (it->is_string() && it->get<std::string>() == model.getFullTypeName()) return true;
        fail(path, "$type " + kindOf(*it) + " is not the expected type " + model.getFullTypeName());
        return false;
    }

    void fillCollection(const json& value, ModelCollectionBase& collection,
                        const std::string& path) {
        const json* items = &value;
        if (value.is_object()) {
            if (!checkType(value, collection, path)) return;
            const auto it = value.find("$values");
            if (it == value.end()) {
                fail(path, "expected an array or an object with \"$values\", got " + kindOf(value));
                return;
            }
            items = &*it;
        }
        if (!items->is_array()) {
            fail(path, "expected an array of " + collection.getItemPrototype()->getFullTypeName() +
                           ", got " + kindOf(*items));
            return;
        }
        reserveItems(*items, collection, path);
        collection.clear();
        int index = 0;
        for (const auto& element : *items) {
            auto item = collection.add();
            fillModel(element, *item, path + "[" + std::to_string(index++) + "]");
        }
    }

    void fillSetting(const json& value, Setting& setting, const std::string& path) {
        if (setting.isSubSetting()) {
            auto held = setting.getCommonValue();
            if (held) fillModel(value, *held, path);
            return;
        }
        if (setting.isEnumSetting()) {
            fillEnum(value, setting, path);
            return;
        }
        if (auto* s = dynamic_cast<Int32Setting*>(&setting)) {
            if (value.is_number_integer()) {
                const bool fits =
                    value.is_number_unsigned()
                        ? value.get<std::uint64_t>() <=
                              static_cast<std::uint64_t>(std::numeric_limits<int>::max())
                        : value.get<std::int64_t>() >= std::numeric_limits<int>::min() &&
                              value.get<std::int64_t>() <= std::numeric_limits<int>::max();
                if (fits) {
                    s->setValue(static_cast<int>(value.get<std::int64_t>()));
                    return;
                }
                fail(path, "integer " + kindOf(value) + " is out of the 32-bit range");
                return;
            }
            fail(path, "expected an integer, got " + kindOf(value));
        } else if (auto* d = dynamic_cast<DoubleSetting*>(&setting)) {
            if (value.is_number()) {
                d->setValue(value.get<double>());
                return;
            }
            fail(path, "expected a number, got " + kindOf(value));
        } else if (auto* b = dynamic_cast<BoolSetting*>(&setting)) {
            if (value.is_boolean()) {
                b->setValue(value.get<bool>());
                return;
            }
            fail(path, "expected true or false, got " + kindOf(value));
        } else if (auto* t = dynamic_cast<StringSetting*>(&setting)) {
            if (value.is_string()) {
                t->setValue(value.get<std::string>());
                return;
            }
            fail(path, "expected a string, got " + kindOf(value));
        }
    }

    void fillEnum(const json& value, Setting& setting, const std::string& path) {
        const int count = setting.getEnumCount();
        if (value.is_number_integer()) {
            const bool inRange =
                value.is_number_unsigned()
                    ? value.get<std::uint64_t>() < static_cast<std::uint64_t>(count)
                    : value.get<std::int64_t>() >= 0 && value.get<std::int64_t>() < count;
            if (inRange) {
                setting.setCommonValue(static_cast<int>(value.get<std::int64_t>()));
                return;
            }
            fail(path, "enumerator position " + kindOf(value) + " is out of the range 0.." +
                           std::to_string(count - 1));
            return;
        }
        if (value.is_string()) {
            const auto text = value.get<std::string>();
            if (setting.parse(text)) return;
            if (auto converter = setting.getConverter()) {
                const auto& names = converter->getDisplayNames();
                for (std::size_t i = 0; i < names.size(); ++i) {
                    if (names[i] == text) {
                        setting.setCommonValue(static_cast<int>(i));
                        return;
                    }
                }
            }
            fail(path, "unknown enumerator " + kindOf(value));
            return;
        }
        fail(path, "expected an enumerator name, display name or position, got " + kindOf(value));
    }

    /// Refuses a collection whose items would make the tree unreasonably large, before any
    /// of them is built: a default item alone may hold hundreds of settings.
    void reserveItems(const json& items, ModelCollectionBase& collection, const std::string& path) {
        const std::size_t count = items.size();
        if (count > JsonSerializer::maxCollectionItems)
            throw DeserializeError(where(path) + ": " + std::to_string(count) +
                                   " items are more than a collection may hold (" +
                                   std::to_string(JsonSerializer::maxCollectionItems) + ")");
        const std::size_t perItem =
            std::max<std::size_t>(1, countSettings(*collection.getItemPrototype()));
        if (count > settingsLeft_ / perItem)
            throw DeserializeError(where(path) + ": " + std::to_string(count) +
                                   " items would take the document past " +
                                   std::to_string(JsonSerializer::maxTreeSettings) +
                                   " settings in all");
        settingsLeft_ -= count * perItem;
    }

    void fail(const std::string& path, const std::string& message) {
        const std::string text = where(path) + ": " + message;
        if (!owner_.collectIssues_) throw DeserializeError(text);
        owner_.issues_.push_back(text);
    }

    JsonSerializer& owner_;
    std::size_t settingsLeft_;
};

std::shared_ptr<ModelBase> JsonSerializer::deserialize(const std::string& text) {
    return deserialize(text, defaultRootType);
}

std::shared_ptr<ModelBase> JsonSerializer::deserialize(const std::string& text,
                                                       const std::string& rootType) {
    unknownKeys_.clear();
    issues_.clear();
    const auto* entry = Prototype::getInstance<ModelContainer>()->findByName(rootType);
    if (!entry) throw DeserializeError("root type " + rootType + " is not registered");
    auto root = std::dynamic_pointer_cast<ModelBase>(entry->prototype->create());
    if (!root) throw DeserializeError("root type " + rootType + " is not a model");

    if (text.size() > maxDocumentBytes)
        throw DeserializeError("document of " + std::to_string(text.size()) +
                               " bytes is larger than " + std::to_string(maxDocumentBytes) +
                               " bytes");
    const TextShape shape = scanShape(text, maxNestingDepth);
    if (shape.tooDeepAt != std::string::npos)
        throw DeserializeError("document nests deeper than " + std::to_string(maxNestingDepth) +
                               " levels (at byte " + std::to_string(shape.tooDeepAt) + ")");
    if (shape.values > maxJsonValues)
        throw DeserializeError("document holds " + std::to_string(shape.values) +
                               " values, more than " + std::to_string(maxJsonValues));

    json document;
    try {
        document = json::parse(text);
    } catch (const json::exception& e) {
        std::string reason = e.what();
        if (reason.size() > 200) reason = reason.substr(0, 197) + "...";
        throw DeserializeError("malformed JSON: " + reason);
    }
    const std::size_t rootSettings = countSettings(*root);
    JsonReader(*this, maxTreeSettings > rootSettings ? maxTreeSettings - rootSettings : 0)
        .fillModel(document, *root, "");
    return root;
}

namespace {

ordered_json toJson(const IModel& model);

ordered_json settingToJson(Setting& setting) {
    if (setting.isSubSetting()) {
        auto held = setting.getCommonValue();
        return held ? toJson(*held) : ordered_json();
    }
    if (setting.isEnumSetting()) {
        const std::string name = setting.toString();
        if (!name.empty()) return name;
        return setting.getInt32();  // a value beyond the table keeps its number
    }
    if (auto* s = dynamic_cast<Int32Setting*>(&setting)) return s->getValue();
    if (auto* d = dynamic_cast<DoubleSetting*>(&setting)) return d->getValue();
    if (auto* b = dynamic_cast<BoolSetting*>(&setting)) return b->getValue();
    if (auto* t = dynamic_cast<StringSetting*>(&setting)) return t->getValue();
    return setting.toString();
}

ordered_json toJson(const IModel& model) {
    if (model.isCollection()) {
        const auto& collection = static_cast<const ModelCollectionBase&>(model);
        ordered_json array = ordered_json::array();
        for (int i = 0; i < collection.getCount(); ++i)
            if (auto item = collection.getCommonItem(i)) array.push_back(toJson(*item));
        return array;
    }
    ordered_json object = ordered_json::object();
    if (const auto* base = dynamic_cast<const ModelBase*>(&model))
        for (const auto& setting : base->settings)
            object[setting->getName()] = settingToJson(*setting);
    return object;
}

}  // namespace

std::string JsonSerializer::serialize(const IModel& model, int indent) {
    return toJson(model).dump(indent, ' ', false, ordered_json::error_handler_t::replace);
}

}  // namespace Orvalis::Tessaline
