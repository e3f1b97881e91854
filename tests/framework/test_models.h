#pragma once
// Small models and an enumeration of the tests' own, to exercise the framework alone.

#include "framework/enum_setting.h"
#include "framework/model_base.h"
#include "framework/sub_setting.h"
#include "framework/value_setting.h"

namespace framework_test {

enum class Shade : int { Red, Green, Blue };

}  // namespace framework_test

template <>
struct Orvalis::Tessaline::EnumInfo<framework_test::Shade> {
    static constexpr const char* table = "Red, Green, Blue";
    static constexpr std::array<const char*, 3> displayNames{"red light", "green light",
                                                             "blue light"};
};

namespace framework_test {

using namespace Orvalis::Tessaline;

class Leaf : public ModelBase {
    TESSALINE_MODEL_TYPE(Leaf)
  public:
    Leaf() : ModelBase("Leaf") {
        init(Count)->setValue(7);
        init(Level)->setValue(0.5);
        init(Label)->setValue("leaf");
        init(Colour)->setValue(Shade::Green);
    }
    std::shared_ptr<Int32Setting> Count = std::make_shared<Int32Setting>("Count");
    std::shared_ptr<DoubleSetting> Level = std::make_shared<DoubleSetting>("Level");
    std::shared_ptr<StringSetting> Label = std::make_shared<StringSetting>("Label");
    std::shared_ptr<EnumSetting<Shade>> Colour = std::make_shared<EnumSetting<Shade>>("Colour");
};

class OtherLeaf : public ModelBase {
    TESSALINE_MODEL_TYPE(OtherLeaf)
  public:
    OtherLeaf() : ModelBase("OtherLeaf") { init(On)->setValue(true); }
    std::shared_ptr<BoolSetting> On = std::make_shared<BoolSetting>("On");
};

class Tree : public ModelBase {
    TESSALINE_MODEL_TYPE(Tree)
  public:
    Tree() : ModelBase("Tree") {
        init(Name)->setValue("tree");
        init(Single);
        init(Leaves);
    }
    std::shared_ptr<StringSetting> Name = std::make_shared<StringSetting>("Name");
    std::shared_ptr<SubSetting<Leaf>> Single = std::make_shared<SubSetting<Leaf>>("Single");
    std::shared_ptr<SubSetting<ModelCollection<Leaf>>> Leaves =
        std::make_shared<SubSetting<ModelCollection<Leaf>>>("Leaves");
};

}  // namespace framework_test
