#pragma once
// The interfaces of the settings tree: objects, settings, models, collections, converters.
// Every waveform value is a typed setting held by a shared pointer in a public member of its
// model; models nest through sub-settings and collections.

#include <cstdint>
#include <gsl/span>
#include <memory>
#include <string>
#include <unordered_map>
#include <vector>

namespace Orvalis::Tessaline {

class Interceptor;
class Transaction;
class Setting;
class SettingVisitor;
class IModel;
class IConverter;
class ICouplings;

/// Flags word of a setting (bit meanings in setting.h).
using ParameterBits = std::uint32_t;

/// Free-form per-model annotations; nothing in the library stores anything in it.
class Metadata {
  public:
    Metadata() {
        entries_.max_load_factor(1.0f);
        entries_.rehash(8);
    }
    std::unordered_map<std::string, std::shared_ptr<void>>& entries() { return entries_; }

  private:
    std::unordered_map<std::string, std::shared_ptr<void>> entries_;
};

class IObject {
  public:
    virtual ~IObject() = default;
    /// Identity comparison unless a class compares by content.
    virtual bool equals(std::shared_ptr<IObject> other) const { return other.get() == this; }
    virtual std::string toString() const = 0;
};

class ISetting : public IObject {
  public:
    virtual bool parse(const std::string& text) = 0;
    virtual std::string getName() const = 0;
    virtual bool isSubSetting() const = 0;
    virtual bool isEnumSetting() const = 0;
    virtual std::shared_ptr<IModel> getCommonValue() const = 0;
    virtual gsl::span<int> getValidInt32Values() = 0;
    virtual void setCommonPointer(std::shared_ptr<IModel> model) = 0;
    virtual bool getBool() const = 0;
    virtual int getInt32() const = 0;
    virtual std::int64_t getInt64() const = 0;
    virtual double getDouble() const = 0;
    virtual void setCommonValue(std::string value) = 0;
    virtual void setCommonValue(bool value) = 0;
    virtual void setCommonValue(double value) = 0;
    virtual void setCommonValue(int value) = 0;
    virtual void setCommonValue(std::int64_t value) = 0;
    virtual int findEnumIndex(const std::string& text) = 0;
    virtual void activate(Interceptor* interceptor, IModel* owner) = 0;
    virtual void deactivate() = 0;
    virtual void reset() = 0;
    virtual void copyFrom(std::shared_ptr<Setting> other) = 0;
    virtual std::shared_ptr<IConverter> getConverter() = 0;
    virtual void setConverter(std::shared_ptr<IConverter> converter) = 0;

  protected:
    virtual void onPropertyChanged(ParameterBits bits) = 0;

  public:
    virtual bool isDefaultValue() const = 0;
    virtual void setValidInt32Values(gsl::span<int> values) = 0;
    virtual void visit(SettingVisitor* visitor) = 0;
};

class IModel : public IObject {
  public:
    virtual std::string getTypeName() const = 0;
    virtual std::string getFullTypeName() const = 0;
    virtual bool isCollection() const = 0;
    virtual std::shared_ptr<IModel> getItemPrototype() const = 0;
    /// A new model of the same type with its constructor defaults.
    virtual std::shared_ptr<IModel> create() const = 0;
    /// The process-wide singleton instance of this type.
    virtual std::shared_ptr<IModel> getPrototype() const = 0;
    virtual Metadata& getMetadata() = 0;
    virtual std::string getThisKey() = 0;
    virtual void setThisKey(const std::string& key) = 0;
    virtual void activateSettings(Interceptor* interceptor, IModel* owner) = 0;
    virtual void deactivateSettings() = 0;
    virtual void onPropertyChanged(ISetting* setting) = 0;
    virtual IModel* getOwner() const = 0;
    virtual void setOwner(IModel* owner) = 0;
    virtual void reset() = 0;
    virtual bool copyFrom(std::shared_ptr<IModel> other) = 0;
    virtual std::shared_ptr<IModel> duplicate() const = 0;
    virtual void setCouplings(std::shared_ptr<ICouplings> couplings) = 0;
    virtual std::shared_ptr<ICouplings> getCouplings() const = 0;
};

/// An ordered list of models (the operations follow in ModelCollectionBase).
class ICollection : public IModel {};

class IConverter : public IObject {
  public:
    /// Value of the setting as display text.
    virtual std::string convertTo(ISetting* setting) = 0;
    /// Display text into the setting.
    virtual void convertBack(ISetting* setting, const std::string& text) = 0;
    virtual std::vector<std::string>& getDisplayNames() = 0;
};

/// Couplings between settings of a model; left to hosts, passed through only.
class ICouplings {
  public:
    virtual ~ICouplings() = default;
};

/// Double dispatch over concrete settings.
class SettingVisitor {
  public:
    virtual ~SettingVisitor() = default;
    virtual void visit(ISetting* setting) = 0;
};

}  // namespace Orvalis::Tessaline
