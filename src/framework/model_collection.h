#pragma once
// ModelCollection<T>: an ordered list of models of one type, with keyed edits that join the
// active mode when the collection is active.

#include <memory>
#include <string>
#include <vector>

#include "interceptor.h"
#include "model_base.h"
#include "value_setting.h"

namespace Orvalis::Tessaline {

template <class T>
class SubSetting;

class ModelCollectionBase : public ICollection {
  public:
    ModelCollectionBase() : context_(std::make_shared<ContextSetting>("Context")) {}

    virtual int getCount() const = 0;
    virtual std::shared_ptr<IModel> getCommonItem(int index) const = 0;
    virtual void setCommonItem(int index, std::shared_ptr<IModel> item) = 0;
    virtual std::shared_ptr<IModel> add(std::shared_ptr<IModel> item) = 0;
    virtual std::shared_ptr<IModel> add() = 0;
    virtual void removeAt(int index) = 0;
    virtual void resize(int count) = 0;
    virtual void clear() = 0;
    virtual void couple(Transaction* transaction) = 0;

    bool isCollection() const override { return true; }
    Metadata& getMetadata() override { return metadata_; }
    std::string getThisKey() override { return thisKey_; }
    void setThisKey(const std::string& key) override { thisKey_ = key; }
    void onPropertyChanged(ISetting*) override {}
    IModel* getOwner() const override { return owner_; }
    void setOwner(IModel* owner) override { owner_ = owner; }
    void setCouplings(std::shared_ptr<ICouplings> couplings) override {
        couplings_ = std::move(couplings);
    }
    std::shared_ptr<ICouplings> getCouplings() const override { return couplings_; }

    void setKeepMatching(bool on) { keepMatching_ = on; }
    void setKeepTail(bool on) { keepTail_ = on; }
    Interceptor* getInterceptor() const { return interceptor_; }

  protected:
    /// Guard of one edit: a SyncTransaction when active on another thread than the one
    /// already running a transaction, else the shared empty transaction.
    std::shared_ptr<Transaction> beginEdit(const std::string& name,
                                           std::shared_ptr<Setting> item = nullptr) {
        if (!interceptor_ || interceptor_->ownsTransaction()) return Transaction::empty();
        auto list = std::make_shared<std::vector<std::shared_ptr<Setting>>>();
        if (item) list->push_back(std::move(item));
        return std::make_shared<SyncTransaction>(interceptor_, context_.get(), name, list);
    }

    std::string thisKey_;
    Metadata metadata_;
    IModel* owner_ = nullptr;
    Interceptor* interceptor_ = nullptr;
    bool keepMatching_ = false;
    bool keepTail_ = false;
    std::shared_ptr<ContextSetting> context_;
    std::shared_ptr<ICouplings> couplings_;
};

/// A temporary sub-setting holding `item`: its representation inside a collection edit.
template <class T>
std::shared_ptr<Setting> toSetting(std::shared_ptr<T> item);

template <class T>
class ModelCollection : public ModelCollectionBase {
  public:
    using ItemType = T;

    std::string getTypeName() const override {
        static const std::string s_typeName =
            "ModelCollection`1[[" + Prototype::getInstance<T>()->getTypeName() + "]]";
        return s_typeName;
    }
    std::string getFullTypeName() const override {
        static const std::string s_fullTypeName =
            "Models.ModelCollection`1[[" + Prototype::getInstance<T>()->getFullTypeName() + "]]";
        return s_fullTypeName;
    }
    std::shared_ptr<IModel> getItemPrototype() const override {
        return Prototype::getInstance<T>();
    }
    std::shared_ptr<IModel> create() const override {
        return std::make_shared<ModelCollection<T>>();
    }
    std::shared_ptr<IModel> getPrototype() const override {
        return Prototype::getInstance<ModelCollection<T>>();
    }

    int getCount() const override { return static_cast<int>(items_.size()); }

    /// The item at `index`; null outside 0 .. count - 1.
    std::shared_ptr<T> getItem(int index) const {
        if (index < 0 || index >= getCount()) return nullptr;
        return items_[static_cast<std::size_t>(index)];
    }
    std::shared_ptr<IModel> getCommonItem(int index) const override { return getItem(index); }

    void setItem(int index, std::shared_ptr<T> item) {
        if (index < 0 || index >= getCount() || !item) return;
        auto& slot = items_[static_cast<std::size_t>(index)];
        if (!interceptor_) {
            slot = std::move(item);
            return;
        }
        auto guard = beginEdit("setItem", toSetting(item));
        if (slot) slot->deactivateSettings();
        slot = std::move(item);
        slot->activateSettings(interceptor_, this);
        slot->setThisKey(std::to_string(index));
    }
    void setCommonItem(int index, std::shared_ptr<IModel> item) override {
        if (auto typed = std::dynamic_pointer_cast<T>(item)) setItem(index, typed);
    }

    std::shared_ptr<IModel> add() override { return append(std::make_shared<T>(), nullptr); }
    std::shared_ptr<IModel> add(std::shared_ptr<IModel> item) override {
        auto typed = std::dynamic_pointer_cast<T>(item);
        if (!typed) return nullptr;
        return append(typed, toSetting(typed));
    }
    /// Typed form of add(): a new default item, appended.
    std::shared_ptr<T> addItem() { return std::static_pointer_cast<T>(add()); }

    void removeAt(int index) override {
        auto guard = beginEdit("removeAt");
        if (index < 0 || index >= getCount()) return;
        items_[static_cast<std::size_t>(index)]->deactivateSettings();
        items_.erase(items_.begin() + index);
        for (int i = index; i < getCount(); ++i)
            items_[static_cast<std::size_t>(i)]->setThisKey(std::to_string(i));
    }
    void resize(int count) override {
        if (count < 0) return;
        auto guard = beginEdit("resize");
        while (getCount() > count) removeAt(getCount() - 1);
        while (getCount() < count) add();
    }
    void clear() override {
        std::shared_ptr<Transaction> guard;
        if (interceptor_) {
            guard = beginEdit("clear");
            for (auto& item : items_) item->deactivateSettings();
        }
        items_.clear();
    }
    void reset() override {
        std::shared_ptr<SyncTransaction> guard;
        if (interceptor_ && !interceptor_->ownsTransaction())
            guard = std::make_shared<SyncTransaction>(interceptor_, context_.get(), 1);
        for (int i = 0; i < getCount(); ++i) items_[static_cast<std::size_t>(i)]->reset();
    }
    void couple(Transaction* transaction) override {
        for (auto& item : items_)
            if (item) item->couple(transaction);
    }

    void activateSettings(Interceptor* interceptor, IModel* owner) override {
        setOwner(owner);
        interceptor_ = interceptor;
        context_->activate(interceptor, this);
        for (int i = 0; i < getCount(); ++i) {
            auto& item = items_[static_cast<std::size_t>(i)];
            if (!item) continue;
            item->activateSettings(interceptor, this);
            item->setThisKey(std::to_string(i));
        }
    }
    void deactivateSettings() override {
        setOwner(nullptr);
        interceptor_ = nullptr;
        context_->deactivate();
        for (auto& item : items_)
            if (item) item->deactivateSettings();
        thisKey_.clear();
    }

    bool equals(std::shared_ptr<IObject> other) const override {
        if (!other) return false;
        if (other.get() == this) return true;
        auto typed = std::dynamic_pointer_cast<ModelCollection<T>>(other);
        if (!typed || typed->getCount() != getCount()) return false;
        for (int i = 0; i < getCount(); ++i)
            if (!items_[static_cast<std::size_t>(i)]->equals(typed->getItem(i))) return false;
        return true;
    }
    std::string toString() const override {
        std::string text = "[";
        for (std::size_t i = 0; i < items_.size(); ++i)
            text += (i ? ", " : "") + items_[i]->toString();
        return text + "]";
    }
    std::shared_ptr<IModel> duplicate() const override {
        auto copy = std::make_shared<ModelCollection<T>>();
        copy->copyFrom(std::shared_ptr<IModel>(std::shared_ptr<IModel>{},
                                               const_cast<ModelCollection<T>*>(this)));
        return copy;
    }
    bool copyFrom(std::shared_ptr<IModel> other) override {
        if (!other) return false;
        if (other.get() == this) return true;
        auto source = std::dynamic_pointer_cast<ModelCollection<T>>(other);
        if (!source || source->getPrototype() != getPrototype()) return false;
        std::shared_ptr<SyncTransaction> guard;
        if (interceptor_ && !interceptor_->ownsTransaction())
            guard = std::make_shared<SyncTransaction>(interceptor_, context_.get(), 1);
        if (keepMatching_)
            copyExistItems(source);
        else
            copyOverwrite(source);
        return true;
    }

    void copyOverwrite(std::shared_ptr<ModelCollection<T>> source) {
        for (int i = 0; i < source->getCount(); ++i) {
            auto from = source->getItem(i);
            if (i >= getCount()) {
                if (keepTail_) break;
                items_.push_back(copyOf(from));
                joinActive(i);
                continue;
            }
            auto& own = items_[static_cast<std::size_t>(i)];
            if (!own || own->getTypeName() != from->getTypeName()) {
                if (own && interceptor_) own->deactivateSettings();
                own = copyOf(from);
                joinActive(i);
            } else {
                own->copyFrom(from);
            }
        }
        if (!keepTail_)
            while (getCount() > source->getCount()) removeAt(getCount() - 1);
    }

    void copyExistItems(std::shared_ptr<ModelCollection<T>> source) {
        std::vector<bool> ownPaired(items_.size()), sourcePaired(source->items_.size());
        const auto common = std::min(items_.size(), source->items_.size());
        for (std::size_t i = 0; i < common; ++i) {
            if (items_[i]->getPrototype() != source->items_[i]->getPrototype()) continue;
            items_[i]->copyFrom(source->items_[i]);
            ownPaired[i] = sourcePaired[i] = true;
        }
        for (std::size_t i = 0; i < items_.size(); ++i) {
            if (ownPaired[i]) continue;
            for (std::size_t j = 0; j < source->items_.size(); ++j) {
                if (sourcePaired[j] ||
                    items_[i]->getPrototype() != source->items_[j]->getPrototype())
                    continue;
                items_[i]->copyFrom(source->items_[j]);
                ownPaired[i] = sourcePaired[j] = true;
                break;
            }
        }
    }

  private:
    std::shared_ptr<IModel> append(std::shared_ptr<T> item, std::shared_ptr<Setting> asSetting) {
        auto guard = beginEdit("add", std::move(asSetting));
        items_.push_back(item);
        joinActive(getCount() - 1);
        return item;
    }
    void joinActive(int index) {
        if (!interceptor_) return;
        auto& item = items_[static_cast<std::size_t>(index)];
        item->activateSettings(interceptor_, this);
        item->setThisKey(std::to_string(index));
    }
    static std::shared_ptr<T> copyOf(const std::shared_ptr<T>& from) {
        auto item = std::static_pointer_cast<T>(from->create());
        item->copyFrom(from);
        return item;
    }

    std::vector<std::shared_ptr<T>> items_;
};

}  // namespace Orvalis::Tessaline
