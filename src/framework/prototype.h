#pragma once
// Process-wide store of singletons, one instance per type.

#include <memory>
#include <typeindex>
#include <unordered_map>

namespace Orvalis::Tessaline {

class Prototype {
  public:
    static Prototype& getPrototypeInstance();

    /// The stored instance of a type; empty when none was stored yet.
    std::shared_ptr<void> getCachedItem(std::type_index type) const;
    void setCachedItem(std::type_index type, std::shared_ptr<void> item);

    /// The per-type singleton, created with its default constructor on first use.
    template <class X>
    static std::shared_ptr<X> getInstance() {
        static std::shared_ptr<X> instance;
        if (instance) return instance;
        auto& store = getPrototypeInstance();
        auto cached = store.getCachedItem(typeid(X));
        if (!cached) {
            cached = std::make_shared<X>();
            store.setCachedItem(typeid(X), cached);
        }
        instance = std::static_pointer_cast<X>(cached);
        return instance;
    }

  private:
    std::unordered_map<std::type_index, std::shared_ptr<void>> items_;
};

}  // namespace Orvalis::Tessaline
