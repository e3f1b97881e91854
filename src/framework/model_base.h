#pragma once
// ModelBase: the base of every settings model. A model is a declaration of settings in a
// fixed order; it keeps no invariant of its own.

#include <memory>
#include <string>
#include <vector>

#include "interfaces.h"
#include "prototype.h"
#include "setting.h"
#include "tools.h"

namespace Orvalis::Tessaline {

class ModelBase : public IModel {
  public:
    explicit ModelBase(const std::string& typeName) : typeName_(typeName) {}
    ModelBase(const ModelBase&) = default;
    /// Copies every field; the settings list is copied as pointers, so the two models then
    /// share their setting objects.
    ModelBase& operator=(const ModelBase&) = default;
    ~ModelBase() override = default;

    /// Appends a setting to the declaration list and hands it back.
    template <class S>
    std::shared_ptr<S> init(std::shared_ptr<S> setting) {
        settings.push_back(setting);
        return setting;
    }

    bool isCollection() const override { return false; }
    std::shared_ptr<IModel> getItemPrototype() const override { return nullptr; }
    Metadata& getMetadata() override { return metadata_; }
    std::string getThisKey() override { return thisKey_; }
    void setThisKey(const std::string& key) override { thisKey_ = key; }
    void activateSettings(Interceptor* interceptor, IModel* owner) override;
    void deactivateSettings() override;
    void onPropertyChanged(ISetting*) override {}
    IModel* getOwner() const override { return owner_; }
    void setOwner(IModel* owner) override { owner_ = owner; }
    void reset() override;
    bool copyFrom(std::shared_ptr<IModel> other) override;
    std::shared_ptr<IModel> duplicate() const override;
    void setCouplings(std::shared_ptr<ICouplings> couplings) override {
        couplings_ = std::move(couplings);
    }
    std::shared_ptr<ICouplings> getCouplings() const override { return couplings_; }

    /// Path of this model from the root through the owners' keys: "NRCarriers[0].Downlink".
    virtual std::string makePath();
    virtual void initialize() {}
    /// Called by the reader when a model is complete.
    virtual void onDeserialized() {}
    /// Model couplings for one change; no model of this library has any.
    virtual void couple(Transaction*) {}

    std::string toString() const override;
    bool equals(std::shared_ptr<IObject> other) const override;

    /// The setting named `name`, or null.
    std::shared_ptr<Setting> findSetting(const std::string& name) const;

    /// Every setting of the model in declaration order.
    std::vector<std::shared_ptr<Setting>> settings;

  protected:
    virtual void setTypeName(std::string name) { typeName_ = std::move(name); }

    IModel* owner_ = nullptr;
    Interceptor* interceptor_ = nullptr;
    std::string typeName_;
    std::string thisKey_;
    Metadata metadata_;
    std::shared_ptr<void> userData_;
    std::shared_ptr<ICouplings> couplings_;
};

}  // namespace Orvalis::Tessaline

/// The type-name, factory and singleton overrides that every concrete model declares.
#define TESSALINE_MODEL_TYPE(ClassName)                                                     \
  public:                                                                                   \
    std::string getTypeName() const override {                                              \
        static const std::string s_typeName = ::Orvalis::Tessaline::RunTime::doGetTypeName( \
            __PRETTY_FUNCTION__, static_cast<int>(sizeof(__PRETTY_FUNCTION__)));            \
        return s_typeName;                                                                  \
    }                                                                                       \
    std::string getFullTypeName() const override {                                          \
        static const std::string s_fullTypeName =                                           \
            ::Orvalis::Tessaline::RunTime::doGetFullTypeName(                               \
                __PRETTY_FUNCTION__, static_cast<int>(sizeof(__PRETTY_FUNCTION__)));        \
        return s_fullTypeName;                                                              \
    }                                                                                       \
    std::shared_ptr<::Orvalis::Tessaline::IModel> create() const override {                 \
        return std::make_shared<ClassName>();                                               \
    }                                                                                       \
    std::shared_ptr<::Orvalis::Tessaline::IModel> getPrototype() const override {           \
        return ::Orvalis::Tessaline::Prototype::getInstance<ClassName>();                   \
    }
