#pragma once
// Runtime type objects: what the registry knows of each model type.

#include <memory>
#include <string>

#include "model_collection.h"
#include "prototype.h"
#include "tools.h"

namespace Orvalis::Tessaline {

class RuntimeTypeBase {
  public:
    virtual ~RuntimeTypeBase() = default;
    /// File name of the module that holds the type.
    virtual std::string getLibraryName() const = 0;
    /// The model singleton of the type.
    virtual std::shared_ptr<IModel> getPrototype() const = 0;
    virtual bool isAssignableFrom(std::shared_ptr<IModel> model) const = 0;
    /// The singleton of the type's collection; null for a collection type.
    virtual std::shared_ptr<ICollection> getCollection() const = 0;
    virtual std::shared_ptr<RuntimeTypeBase> getCollectionRuntimeType() const = 0;
};

/// Forces the instantiation of a type's templates; does nothing at run time.
template <class T>
struct TypeInstance {
    static void staticFunction() {}
};

template <class T>
class RuntimeType : public RuntimeTypeBase {
  public:
    std::string getLibraryName() const override {
        static const std::string s_libraryName =
            Tools::getLibraryName(reinterpret_cast<const void*>(&TypeInstance<T>::staticFunction));
        return s_libraryName;
    }
    std::shared_ptr<IModel> getPrototype() const override { return Prototype::getInstance<T>(); }
    bool isAssignableFrom(std::shared_ptr<IModel> model) const override {
        return std::dynamic_pointer_cast<T>(model) != nullptr;
    }
    std::shared_ptr<ICollection> getCollection() const override {
        return Prototype::getInstance<ModelCollection<T>>();
    }
    std::shared_ptr<RuntimeTypeBase> getCollectionRuntimeType() const override {
        return Prototype::getInstance<RuntimeType<ModelCollection<T>>>();
    }
};

template <class T>
class RuntimeType<ModelCollection<T>> : public RuntimeTypeBase {
  public:
    std::string getLibraryName() const override {
        return Prototype::getInstance<RuntimeType<T>>()->getLibraryName();
    }
    std::shared_ptr<IModel> getPrototype() const override {
        return Prototype::getInstance<ModelCollection<T>>();
    }
    bool isAssignableFrom(std::shared_ptr<IModel>) const override { return false; }
    std::shared_ptr<ICollection> getCollection() const override { return nullptr; }
    std::shared_ptr<RuntimeTypeBase> getCollectionRuntimeType() const override { return nullptr; }
};

}  // namespace Orvalis::Tessaline
