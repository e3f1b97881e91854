#pragma once
// EnumSetting<T>: a setting whose value is an enumerator, stored as its position in the
// enumeration's table; EnumConverter<T>: the display names of an enumeration.

#include <gsl/gsl>
#include <initializer_list>
#include <stdexcept>
#include <string_view>

#include "prototype.h"
#include "tools_enum.h"
#include "value_setting.h"

namespace Orvalis::Tessaline {

/// Specialised for every enumeration: `table` holds the enumerator names joined by ", ",
/// `displayNames` the display names in the same order.
template <class T>
struct EnumInfo;

class ConverterBase : public IConverter {
  public:
    std::string toString() const override { return "Converter"; }
    bool isStrict() const { return strict_; }
    void setStrict(bool strict) { strict_ = strict; }

  protected:
    bool strict_ = false;
};

class EnumConverterBase : public ConverterBase {};

template <class T>
class EnumConverter : public EnumConverterBase {
  public:
    void setDisplayNames(std::initializer_list<std::string> names) {
        setDisplayNames(std::vector<std::string>(names));
    }
    void setDisplayNames(std::vector<std::string> names) {
        displayNames_ = std::move(names);
        valueToName_.clear();
        for (std::size_t i = 0; i < displayNames_.size(); ++i)
            valueToName_[static_cast<int>(i)] = displayNames_[i];
        std::unordered_map<std::string, int> byName;
        byName.max_load_factor(1.0f);
        byName.rehash(8);
        for (const auto& [value, name] : valueToName_) byName[name] = value;
        nameToValue_ = std::move(byName);
    }

    std::string convertTo(ISetting* setting) override {
        const auto it = valueToName_.find(setting->getInt32());
        if (it != valueToName_.end()) return it->second;
        if (strict_) throw std::runtime_error("text");
        return {};
    }
    void convertBack(ISetting* setting, const std::string& text) override {
        const auto it = nameToValue_.find(text);
        if (it != nameToValue_.end()) {
            setting->setCommonValue(it->second);
            return;
        }
        if (strict_) throw std::runtime_error("text");
    }
    std::vector<std::string>& getDisplayNames() override { return displayNames_; }

    /// Value of a display name, -1 when unknown.
    int findDisplayName(const std::string& text) const {
        const auto it = nameToValue_.find(text);
        return it == nameToValue_.end() ? -1 : it->second;
    }

  private:
    std::vector<std::string> displayNames_;
    std::unordered_map<int, std::string> valueToName_;
    std::unordered_map<std::string, int> nameToValue_;
};

template <class T>
class EnumSetting : public ValueSetting<T> {
    using Base = ValueSetting<T>;

  public:
    explicit EnumSetting(const char* name) : Base(name, SettingFlags::EnumDefault) {}

    /// The enumerator names joined by ", ".
    static std::string staticGetTable() { return std::string(EnumInfo<T>::table); }
    /// The value as its position in the table.
    int getInt() const { return static_cast<int>(this->value_); }

    std::string toString() const override {
        return Tools::enumIndexToText(staticGetTable(), static_cast<int>(this->value_));
    }
    bool parse(const std::string& text) override {
        const auto& values = Tools::enumValueMap<T>();
        if (!values.empty()) {
            const auto it = values.find(text);
            if (it == values.end()) return false;
            this->value_ = it->second;
            return true;
        }
        const int index = findEnumIndex(text);
        if (index < 0) return false;
        this->value_ = static_cast<T>(index);
        return true;
    }
    int getInt32() const override { return static_cast<int>(this->value_); }
    int getEnumCount() const override { return static_cast<int>(EnumInfo<T>::displayNames.size()); }
    void setCommonValue(int v) override { this->setValue(static_cast<T>(v)); }
    using Setting::setCommonValue;
    int findEnumIndex(const std::string& text) override {
        return Tools::textToEnumIndex(staticGetTable(), text);
    }
    std::shared_ptr<IConverter> getConverter() override {
        if (this->converter_) return this->converter_;
        return Prototype::getInstance<EnumConverter<T>>();
    }
    gsl::span<int> getValidInt32Values() override {
        ensureValidStore();
        return gsl::span<int>(validInts_.data(), validInts_.size());
    }
    void setValidInt32Values(gsl::span<int> values) override {
        ensureValidStore();
        this->validValues_->resize(values.size());
        for (std::size_t i = 0; i < values.size(); ++i)
            (*this->validValues_)[i] = static_cast<T>(values[i]);
        validInts_.assign(values.begin(), values.end());
    }
    bool valueEquals(const T& v) const override {
        return static_cast<std::int32_t>(this->value_) == static_cast<std::int32_t>(v);
    }
    void visit(SettingVisitor* visitor) override { visitor->visit(this); }

  private:
    void ensureValidStore() {
        if (!this->validValues_) this->setValidValues(std::make_shared<std::vector<T>>());
        validInts_.resize(this->validValues_->size());
        for (std::size_t i = 0; i < validInts_.size(); ++i)
            validInts_[i] = static_cast<int>((*this->validValues_)[i]);
    }
    std::vector<int> validInts_;  // the valid values as ints, for the span view
};

template <class T>
const std::unordered_map<std::string, T>& Tools::enumValueMap() {
    static const std::unordered_map<std::string, T> values = [] {
        std::unordered_map<std::string, T> map;
        for (const auto& [value, name] : getEnumNames<T>(EnumSetting<T>::staticGetTable()))
            map.emplace(name, value);
        return map;
    }();
    return values;
}

}  // namespace Orvalis::Tessaline
