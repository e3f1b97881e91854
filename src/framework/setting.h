#pragma once
// Base of every setting: name, owner, interceptor, converter and the flags word.

#include <string>

#include "interfaces.h"
#include "subject.h"

namespace Orvalis::Tessaline {

/// Bits of the flags word whose meaning shows in this library.
namespace SettingFlags {
inline constexpr ParameterBits Frozen = 0x1;              ///< set inside an interceptor: no write
inline constexpr ParameterBits Resettable = 0x40;         ///< reset restores the stored default
inline constexpr ParameterBits Enumeration = 0x1000;      ///< enumeration setting
inline constexpr ParameterBits Publish = 0x10000;         ///< publish changes on the interceptor
inline constexpr ParameterBits ValueChanged = 0x80000;    ///< passed on a value change
inline constexpr ParameterBits WeakReference = 0x800000;  ///< sub-setting holds a non-owning ref
inline constexpr ParameterBits SettingDefault = 0x180FC;
inline constexpr ParameterBits EnumDefault = 0x190FC;
inline constexpr ParameterBits SubSettingDefault = 0xF0;
}  // namespace SettingFlags

/// Payload of a setting's own change subject.
struct SettingChange {
    ISetting* setting = nullptr;
    ParameterBits bits = 0;
};

class Setting : public ISetting {
  public:
    explicit Setting(const char* name, ParameterBits flags = SettingFlags::SettingDefault)
        : name_(name ? name : ""), flags_(flags) {}

    std::string getName() const override { return name_; }
    bool isEnumSetting() const override { return (flags_ & SettingFlags::Enumeration) != 0; }
    gsl::span<int> getValidInt32Values() override { return {}; }
    bool getBool() const override { return false; }
    int getInt32() const override { return 0; }
    std::int64_t getInt64() const override { return 0; }
    double getDouble() const override { return 0.0; }
    void setCommonValue(std::string) override {}
    void setCommonValue(bool) override {}
    void setCommonValue(double) override {}
    void setCommonValue(int) override {}
    void setCommonValue(std::int64_t) override {}
    int findEnumIndex(const std::string&) override { return -1; }
    void activate(Interceptor* interceptor, IModel* owner) override {
        interceptor_ = interceptor;
        owner_ = owner;
    }
    void deactivate() override {
        interceptor_ = nullptr;
        owner_ = nullptr;
    }
    void reset() override {}
    void copyFrom(std::shared_ptr<Setting>) override {}
    std::shared_ptr<IConverter> getConverter() override { return converter_; }
    void setConverter(std::shared_ptr<IConverter> converter) override {
        converter_ = std::move(converter);
    }
    bool isDefaultValue() const override { return false; }
    void setValidInt32Values(gsl::span<int>) override {}

    /// Number of enumerators of an enumeration setting; 0 for every other setting.
    virtual int getEnumCount() const { return 0; }

    ParameterBits getFlags() const { return flags_; }
    void setFlags(ParameterBits flags) { flags_ = flags; }
    IModel* getOwnerModel() const { return owner_; }
    Interceptor* getInterceptor() const { return interceptor_; }
    Subject<SettingChange>& changes() { return changes_; }

  protected:
    void onPropertyChanged(ParameterBits) override {}

    IModel* owner_ = nullptr;
    Interceptor* interceptor_ = nullptr;
    Subject<SettingChange> changes_;
    std::string name_;
    std::string tag_;  // second text field, kept for hosts
    std::shared_ptr<IConverter> converter_;
    ParameterBits flags_;
};

}  // namespace Orvalis::Tessaline
