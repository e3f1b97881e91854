#include "model_base.h"

namespace Orvalis::Tessaline {

void ModelBase::activateSettings(Interceptor* interceptor, IModel* owner) {
    owner_ = owner;
    interceptor_ = interceptor;
    for (auto& setting : settings) setting->activate(interceptor, this);
}

void ModelBase::deactivateSettings() {
    for (auto& setting : settings) setting->deactivate();
    owner_ = nullptr;
    interceptor_ = nullptr;
}

void ModelBase::reset() {
    for (auto& setting : settings) setting->reset();
}

bool ModelBase::copyFrom(std::shared_ptr<IModel> other) {
    auto source = std::dynamic_pointer_cast<ModelBase>(other);
    if (!source || source->getTypeName() != getTypeName()) return false;
    if (source.get() == this) return true;
    const auto count = std::min(settings.size(), source->settings.size());
    for (std::size_t i = 0; i < count; ++i) settings[i]->copyFrom(source->settings[i]);
    return true;
}

std::shared_ptr<IModel> ModelBase::duplicate() const {
    auto copy = create();
    // A non-owning handle on this model, only for the duration of the copy.
    copy->copyFrom(
        std::shared_ptr<IModel>(std::shared_ptr<IModel>{}, const_cast<ModelBase*>(this)));
    return copy;
}

std::string ModelBase::makePath() {
    std::vector<IModel*> chain;
    for (IModel* node = this; node; node = node->getOwner()) chain.push_back(node);
    std::string path;
    for (auto it = chain.rbegin(); it != chain.rend(); ++it) {
        const std::string key = (*it)->getThisKey();
        if (key.empty()) continue;
        IModel* owner = (*it)->getOwner();
        if (owner && owner->isCollection())
            path += "[" + key + "]";
        else
            path += (path.empty() ? "" : ".") + key;
    }
    return path;
}

std::string ModelBase::toString() const {
    std::string text = typeName_ + "{";
    for (std::size_t i = 0; i < settings.size(); ++i) {
        if (i) text += "; ";
        text += settings[i]->getName() + "=" + settings[i]->toString();
    }
    return text + "}";
}

bool ModelBase::equals(std::shared_ptr<IObject> other) const {
    auto model = std::dynamic_pointer_cast<ModelBase>(other);
    if (!model) return false;
    if (model.get() == this) return true;
    if (model->getTypeName() != getTypeName() || model->settings.size() != settings.size())
        return false;
    for (std::size_t i = 0; i < settings.size(); ++i)
        if (!settings[i]->equals(model->settings[i])) return false;
    return true;
}

std::shared_ptr<Setting> ModelBase::findSetting(const std::string& name) const {
    for (const auto& setting : settings)
        if (setting->getName() == name) return setting;
    return nullptr;
}

}  // namespace Orvalis::Tessaline
