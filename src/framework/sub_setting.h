#pragma once
// SubSetting<T>: a setting that holds a nested model or a collection. It is never empty: a
// fresh one holds a default T.

#include <memory>

#include "model_collection.h"

namespace Orvalis::Tessaline {

template <class T>
class SubSetting : public Setting {
  public:
    explicit SubSetting(const char* name)
        : Setting(name, SettingFlags::SubSettingDefault),
          value_(std::make_shared<T>()),
          weak_(value_) {}

    /// The held model: the owning reference, or the locked weak one when held by reference.
    std::shared_ptr<T> getValue() const {
        return (flags_ & SettingFlags::WeakReference) ? weak_.lock() : value_;
    }
    void setValue(const std::shared_ptr<T>& model) {
        if (flags_ & SettingFlags::WeakReference) {
            weak_ = model;
            return;
        }
        if (interceptor_ && model) {
            model->deactivateSettings();
            model->activateSettings(interceptor_, owner_);
        }
        value_ = model;
        weak_ = model;
    }

    std::shared_ptr<IModel> getCommonValue() const override { return getValue(); }
    void setCommonPointer(std::shared_ptr<IModel> model) override {
        if (auto typed = std::dynamic_pointer_cast<T>(model)) {
            setValue(typed);
            return;
        }
        auto source = std::dynamic_pointer_cast<ModelCollectionBase>(model);
        auto own = std::dynamic_pointer_cast<ModelCollectionBase>(getCommonValue());
        if (!source || !own) return;
        own->clear();
        for (int i = 0; i < source->getCount(); ++i) own->add(source->getCommonItem(i));
    }

    void activate(Interceptor* interceptor, IModel* owner) override {
        Setting::activate(interceptor, owner);
        if (auto model = getValue()) {
            model->activateSettings(interceptor, owner);
            model->setThisKey(name_);
        }
    }
    void deactivate() override {
        Setting::deactivate();
        if (auto model = getValue()) model->deactivateSettings();
    }
    void reset() override {
        if (auto model = getValue()) model->reset();
    }
    std::string toString() const override {
        auto model = getValue();
        return model ? model->toString() : std::string{};
    }
    bool isSubSetting() const override { return true; }
    bool parse(const std::string&) override { return true; }

    void copyFrom(std::shared_ptr<Setting> other) override {
        auto typed = std::dynamic_pointer_cast<SubSetting<T>>(other);
        if (!typed) return;
        auto own = getValue();
        auto source = typed->getValue();
        if (!own || !source) return;
        if (own->copyFrom(source)) return;
        auto copy = std::static_pointer_cast<T>(source->duplicate());
        setValue(copy);
        if (owner_) owner_->onPropertyChanged(this);
        onPropertyChanged(SettingFlags::WeakReference);
    }
    bool equals(std::shared_ptr<IObject> other) const override {
        auto typed = std::dynamic_pointer_cast<SubSetting<T>>(other);
        if (!typed) return false;
        auto a = getValue();
        auto b = typed->getValue();
        return a && b && a->equals(b);
    }
    void visit(SettingVisitor* visitor) override { visitor->visit(this); }

  private:
    std::shared_ptr<T> value_;
    std::weak_ptr<T> weak_;
};

template <class T>
std::shared_ptr<Setting> toSetting(std::shared_ptr<T> item) {
    auto setting = std::make_shared<SubSetting<T>>("");
    setting->setValue(item);
    return setting;
}

}  // namespace Orvalis::Tessaline
