#pragma once
// ValueSetting<T>: a setting that holds one value of type T, with the change sequence of the
// active mode; and the four plain settings built on it.

#include <memory>
#include <string>
#include <vector>

#include "interceptor.h"
#include "setting.h"

namespace Orvalis::Tessaline {

template <class T>
class ValueSetting : public Setting {
  public:
    explicit ValueSetting(const char* name, ParameterBits flags = SettingFlags::SettingDefault)
        : Setting(name, flags), value_{}, defaultValue_{} {}

    /// The value as the engine reads it.
    const T& getValue() const { return value_; }
    const T& getDefaultValue() const { return defaultValue_; }

    /// Passive: stores the value, nothing else. Active: runs the change as a transaction.
    void setValue(const T& v);
    void internalSetValue(const T& v);
    void setValidValues(std::shared_ptr<std::vector<T>> values) {
        validValues_ = std::move(values);
    }
    const std::shared_ptr<std::vector<T>>& getValidValues() const { return validValues_; }

    virtual bool valueEquals(const T& v) const { return value_ == v; }
    virtual T validateValue(const T& v) const { return v; }
    virtual std::shared_ptr<Setting> createTempSetting(const T&) const { return nullptr; }

    bool isSubSetting() const override { return false; }
    std::shared_ptr<IModel> getCommonValue() const override { return nullptr; }
    void setCommonPointer(std::shared_ptr<IModel>) override {}

    void reset() override {
        if (flags_ & SettingFlags::Resettable) internalSetValue(defaultValue_);
    }
    bool isDefaultValue() const override { return valueEquals(defaultValue_); }
    void copyFrom(std::shared_ptr<Setting> other) override {
        if (auto typed = std::dynamic_pointer_cast<ValueSetting<T>>(other)) value_ = typed->value_;
    }
    bool equals(std::shared_ptr<IObject> other) const override {
        auto typed = std::dynamic_pointer_cast<ValueSetting<T>>(other);
        return typed && valueEquals(typed->value_);
    }

  protected:
    std::shared_ptr<std::vector<T>> validValues_;
    T value_;
    T defaultValue_;
};

template <class T>
void ValueSetting<T>::setValue(const T& v) {
    Interceptor* ic = interceptor_;
    if (!ic) {
        value_ = v;
        return;
    }
    if (ic->ownsTransaction()) {  // a coupling on the transaction's own thread
        internalSetValue(v);
        return;
    }
    std::lock_guard<std::mutex> lock(ic->mutex_);
    ic->threadId_.store(std::this_thread::get_id());
    Transaction transaction(ic, this, 1);
    transaction.setOldValue(createTempSetting(value_));
    ic->current_ = &transaction;
    struct Release {
        Interceptor* ic;
        ~Release() {
            ic->current_ = nullptr;
            ic->threadId_.store(std::thread::id{});
        }
    } release{ic};
    if (flags_ & SettingFlags::Frozen) return;
    internalSetValue(v);
    try {
        ic->couple(&transaction);
    } catch (...) {
        // Couplings are best effort: the value change itself stands.
    }
    transaction.setOldValue(nullptr);
}

template <class T>
void ValueSetting<T>::internalSetValue(const T& v) {
    if (valueEquals(v)) return;
    value_ = validateValue(v);
    if (owner_) owner_->onPropertyChanged(this);
    if (!interceptor_) return;
    onPropertyChanged(SettingFlags::ValueChanged);
    if ((flags_ & SettingFlags::Publish) && interceptor_->changes().hasObservers())
        interceptor_->changes().publish(this);
}

class Int32Setting : public ValueSetting<int> {
  public:
    Int32Setting() : ValueSetting<int>("") {}
    explicit Int32Setting(const char* name) : ValueSetting<int>(name) {}
    std::string toString() const override;
    bool parse(const std::string& text) override;
    int getInt32() const override { return value_; }
    std::int64_t getInt64() const override { return value_; }
    void setCommonValue(int v) override { setValue(v); }
    using Setting::setCommonValue;
    void visit(SettingVisitor* visitor) override { visitor->visit(this); }
};

class DoubleSetting : public ValueSetting<double> {
  public:
    explicit DoubleSetting(const char* name) : ValueSetting<double>(name) {}
    std::string toString() const override;
    bool parse(const std::string& text) override;
    double getDouble() const override { return value_; }
    void setCommonValue(double v) override { setValue(v); }
    using Setting::setCommonValue;
    void visit(SettingVisitor* visitor) override { visitor->visit(this); }
};

class BoolSetting : public ValueSetting<bool> {
  public:
    explicit BoolSetting(const char* name) : ValueSetting<bool>(name) {}
    std::string toString() const override { return value_ ? "true" : "false"; }
    bool parse(const std::string& text) override;
    bool getBool() const override { return value_; }
    void setCommonValue(bool v) override { setValue(v); }
    using Setting::setCommonValue;
    void visit(SettingVisitor* visitor) override { visitor->visit(this); }
};

class StringSetting : public ValueSetting<std::string> {
  public:
    explicit StringSetting(const char* name) : ValueSetting<std::string>(name) {}
    std::string toString() const override { return value_; }
    bool parse(const std::string& text) override {
        setValue(text);
        return true;
    }
    void setCommonValue(std::string v) override { setValue(v); }
    using Setting::setCommonValue;
    void visit(SettingVisitor* visitor) override { visitor->visit(this); }
};

/// Stands for a whole collection inside transactions; always named "Context".
class ContextSetting : public Setting {
  public:
    explicit ContextSetting(const char* name = "Context") : Setting(name) {}
    std::string toString() const override { return name_; }
    bool parse(const std::string&) override { return false; }
    bool isSubSetting() const override { return false; }
    std::shared_ptr<IModel> getCommonValue() const override { return nullptr; }
    void setCommonPointer(std::shared_ptr<IModel>) override {}
    void visit(SettingVisitor* visitor) override { visitor->visit(this); }
};

}  // namespace Orvalis::Tessaline
