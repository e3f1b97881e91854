#pragma once
// TextModel: the simplest model, a single text.

#include "model_base.h"
#include "value_setting.h"

namespace Orvalis::Tessaline {

class TextModel : public ModelBase {
    TESSALINE_MODEL_TYPE(TextModel)
  public:
    TextModel() : ModelBase("TextModel") { init(Text); }
    std::shared_ptr<StringSetting> Text = std::make_shared<StringSetting>("Text");
};

}  // namespace Orvalis::Tessaline
