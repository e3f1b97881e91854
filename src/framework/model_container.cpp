#include "model_container.h"

namespace Orvalis::Tessaline {

void ModelContainer::add(std::shared_ptr<IModel> prototype,
                         std::shared_ptr<RuntimeTypeBase> runtimeType) {
    if (!prototype) return;
    const std::string name = prototype->getFullTypeName();
    entries_[name] = Entry{std::move(prototype), std::move(runtimeType)};
}

const ModelContainer::Entry* ModelContainer::find(const std::string& fullTypeName) const {
    const auto it = entries_.find(fullTypeName);
    return it == entries_.end() ? nullptr : &it->second;
}

const ModelContainer::Entry* ModelContainer::findByName(const std::string& name) const {
    if (const auto* entry = find(name)) return entry;
    for (const auto& [fullName, entry] : entries_)
        if (entry.prototype->getTypeName() == name) return &entry;
    return nullptr;
}

std::shared_ptr<ICollection> ModelContainer::findCollection(const std::string& fullTypeName) const {
    for (const auto& [name, entry] : entries_) {
        if (!entry.runtimeType) continue;
        auto collection = entry.runtimeType->getCollection();
        if (collection && collection->getFullTypeName() == fullTypeName) return collection;
    }
    return nullptr;
}

std::vector<std::string> ModelContainer::typeNames() const {
    std::vector<std::string> names;
    for (const auto& [name, entry] : entries_) names.push_back(name);
    return names;
}

}  // namespace Orvalis::Tessaline
