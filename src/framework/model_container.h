#pragma once
// The registry of model types, keyed by full type name.

#include <map>
#include <memory>
#include <string>
#include <vector>

#include "runtime_type.h"

namespace Orvalis::Tessaline {

class ModelContainer {
  public:
    struct Entry {
        std::shared_ptr<IModel> prototype;
        std::shared_ptr<RuntimeTypeBase> runtimeType;
    };

    /// Registers a type; a second registration of the same type keeps the one entry.
    void add(std::shared_ptr<IModel> prototype, std::shared_ptr<RuntimeTypeBase> runtimeType);

    /// The entry of a full type name ("Models.Nr5g.NRCarrier"), or null.
    const Entry* find(const std::string& fullTypeName) const;
    /// The entry of a bare ("NRCarrier") or full type name, or null.
    const Entry* findByName(const std::string& name) const;
    /// A collection singleton by its full type name
    /// ("Models.ModelCollection`1[[Models.Nr5g.NRCarrier]]"), or null.
    std::shared_ptr<ICollection> findCollection(const std::string& fullTypeName) const;

    std::size_t size() const { return entries_.size(); }
    /// Full type names of all registered types, sorted.
    std::vector<std::string> typeNames() const;

  private:
    std::map<std::string, Entry> entries_;
};

}  // namespace Orvalis::Tessaline
