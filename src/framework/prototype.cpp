#include "prototype.h"

namespace Orvalis::Tessaline {

Prototype& Prototype::getPrototypeInstance() {
    static Prototype store;
    return store;
}

std::shared_ptr<void> Prototype::getCachedItem(std::type_index type) const {
    const auto it = items_.find(type);
    return it == items_.end() ? nullptr : it->second;
}

void Prototype::setCachedItem(std::type_index type, std::shared_ptr<void> item) {
    items_[type] = std::move(item);
}

}  // namespace Orvalis::Tessaline
