#include <gtest/gtest.h>

#include <limits>

#include "framework/interceptor.h"
#include "test_models.h"

namespace framework_test {
namespace {

TEST(PassiveSetting, SetValueStoresWithoutNotification) {
    Int32Setting count("Count");
    int published = 0;
    auto subscription = count.changes().subscribe([&](const SettingChange&) { ++published; });
    count.setValue(42);
    EXPECT_EQ(count.getValue(), 42);
    EXPECT_EQ(count.getName(), "Count");
    EXPECT_EQ(published, 0);
    EXPECT_EQ(count.getOwnerModel(), nullptr);
}

TEST(PassiveSetting, DeclaredDefaultIsNotTheStoredDefault) {
    // A model constructor writes the declared default into the value only: reset() and
    // isDefaultValue() compare with the zero value of the type.
    Leaf leaf;
    EXPECT_EQ(leaf.Count->getValue(), 7);
    EXPECT_FALSE(leaf.Count->isDefaultValue());
    leaf.reset();
    EXPECT_EQ(leaf.Count->getValue(), 0);
    EXPECT_EQ(leaf.Label->getValue(), "");
    EXPECT_EQ(leaf.Colour->getValue(), Shade::Red);
    EXPECT_TRUE(leaf.Count->isDefaultValue());
}

TEST(PassiveSetting, ResetNeedsItsFlag) {
    Int32Setting count("Count");
    count.setValue(5);
    count.setFlags(count.getFlags() & ~SettingFlags::Resettable);
    count.reset();
    EXPECT_EQ(count.getValue(), 5);
}

TEST(PassiveSetting, GenericGettersOfOtherKindsAreNeutral) {
    StringSetting text("Text");
    text.setValue("12");
    EXPECT_EQ(text.getInt32(), 0);
    EXPECT_EQ(text.findEnumIndex("12"), -1);
    Int32Setting number("N");
    EXPECT_EQ(number.findEnumIndex("Red"), -1);
    EXPECT_FALSE(number.isEnumSetting());
    SubSetting<Leaf> sub("Sub");
    EXPECT_EQ(sub.getInt32(), 0);
    EXPECT_TRUE(sub.isSubSetting());
    EXPECT_TRUE(sub.parse("anything"));
    EXPECT_EQ(number.getCommonValue(), nullptr);
}

TEST(PlainSettings, ParseAcceptsOnlyWholeValues) {
    Int32Setting i("I");
    EXPECT_TRUE(i.parse("-17"));
    EXPECT_EQ(i.getValue(), -17);
    EXPECT_FALSE(i.parse("12x"));
    EXPECT_FALSE(i.parse("99999999999"));
    EXPECT_FALSE(i.parse(""));
    EXPECT_EQ(i.getValue(), -17);

    DoubleSetting d("D");
    EXPECT_TRUE(d.parse("-3.52182518111362"));
    EXPECT_DOUBLE_EQ(d.getValue(), -3.52182518111362);
    EXPECT_FALSE(d.parse("1.5 "));
    EXPECT_FALSE(d.parse("1e999"));
    d.setValue(0.1);
    DoubleSetting back("B");
    ASSERT_TRUE(back.parse(d.toString()));
    EXPECT_EQ(back.getValue(), 0.1);  // printed form reads back exactly

    BoolSetting b("B");
    EXPECT_TRUE(b.parse("true"));
    EXPECT_TRUE(b.getValue());
    EXPECT_TRUE(b.parse("False"));
    EXPECT_FALSE(b.getValue());
    EXPECT_FALSE(b.parse("yes"));
    EXPECT_EQ(b.toString(), "false");
}

TEST(PlainSettings, EqualsComparesValuesOfTheSameKind) {
    auto a = std::make_shared<Int32Setting>("A");
    auto b = std::make_shared<Int32Setting>("B");
    auto d = std::make_shared<DoubleSetting>("D");
    a->setValue(3);
    b->setValue(3);
    EXPECT_TRUE(a->equals(b));
    b->setValue(4);
    EXPECT_FALSE(a->equals(b));
    EXPECT_FALSE(a->equals(d));
    auto context = std::make_shared<ContextSetting>();
    EXPECT_EQ(context->getName(), "Context");
    EXPECT_TRUE(context->equals(context));
    EXPECT_FALSE(context->equals(std::make_shared<ContextSetting>()));  // identity only
}

TEST(EnumSettingTest, ParseByEnumeratorName) {
    EnumSetting<Shade> colour("Colour");
    EXPECT_EQ(EnumSetting<Shade>::staticGetTable(), "Red, Green, Blue");
    EXPECT_TRUE(colour.parse("Blue"));
    EXPECT_EQ(colour.getInt32(), 2);
    EXPECT_FALSE(colour.parse(""));
    EXPECT_FALSE(colour.parse("blue"));  // case-sensitive
    EXPECT_EQ(colour.getValue(), Shade::Blue);
    EXPECT_EQ(colour.toString(), "Blue");
    EXPECT_EQ(colour.findEnumIndex("Green"), 1);
    EXPECT_TRUE(colour.isEnumSetting());
    EXPECT_EQ(colour.getFlags(), SettingFlags::EnumDefault);
}

TEST(EnumSettingTest, ValueBeyondTheTablePrintsEmpty) {
    EnumSetting<Shade> colour("Colour");
    colour.setCommonValue(9);
    EXPECT_EQ(colour.getInt32(), 9);
    EXPECT_EQ(colour.toString(), "");
    colour.setCommonValue(-1);
    EXPECT_EQ(colour.toString(), "");
}

TEST(EnumSettingTest, ValidValuesAreStoredButNotEnforced) {
    EnumSetting<Shade> colour("Colour");
    EXPECT_TRUE(colour.getValidInt32Values().empty());
    std::vector<int> valid{0, 2};
    colour.setValidInt32Values(valid);
    const auto span = colour.getValidInt32Values();
    ASSERT_EQ(span.size(), 2u);
    EXPECT_EQ(span[1], 2);
    EXPECT_TRUE(colour.parse("Green"));  // not in the valid list, still accepted
    EXPECT_EQ(colour.getValue(), Shade::Green);
}

TEST(EnumSettingTest, EnumValuesMapNamesToPositions) {
    const auto values = Tools::enumValues<Shade>();
    ASSERT_EQ(values.size(), 3u);
    EXPECT_EQ(values.at("Blue"), Shade::Blue);
    const auto names = Tools::getEnumNames<Shade>(EnumSetting<Shade>::staticGetTable());
    EXPECT_EQ(names.at(Shade::Green), "Green");  // no blanks around names
}

class EnumConverterTest : public ::testing::Test {
  protected:
    void SetUp() override { converter.setDisplayNames({"red light", "green light", "blue light"}); }
    EnumConverter<Shade> converter;
    EnumSetting<Shade> colour{"Colour"};
};

TEST_F(EnumConverterTest, ConvertsBothWays) {
    colour.setValue(Shade::Blue);
    EXPECT_EQ(converter.convertTo(&colour), "blue light");
    converter.convertBack(&colour, "red light");
    EXPECT_EQ(colour.getValue(), Shade::Red);
    EXPECT_EQ(converter.getDisplayNames().size(), 3u);
}

TEST_F(EnumConverterTest, UnknownTextsDependOnStrictness) {
    colour.setCommonValue(5);
    EXPECT_EQ(converter.convertTo(&colour), "");
    converter.convertBack(&colour, "purple");
    EXPECT_EQ(colour.getInt32(), 5);
    converter.setStrict(true);
    EXPECT_THROW(converter.convertTo(&colour), std::runtime_error);
    EXPECT_THROW(converter.convertBack(&colour, "purple"), std::runtime_error);
}

TEST_F(EnumConverterTest, DisplayListIndependentOfTable) {
    converter.setDisplayNames({"only one"});
    colour.setValue(Shade::Blue);
    EXPECT_EQ(converter.convertTo(&colour), "");
    converter.setDisplayNames({"a", "b", "c", "d", "e"});
    converter.convertBack(&colour, "e");
    EXPECT_EQ(colour.getInt32(), 4);
    // A display name used twice maps to one of its values.
    converter.setDisplayNames({"same", "same"});
    converter.convertBack(&colour, "same");
    EXPECT_TRUE(colour.getInt32() == 0 || colour.getInt32() == 1);
}

TEST(EnumSettingTest, ConverterFallsBackToTheSingleton) {
    EnumSetting<Shade> colour("Colour");
    EXPECT_EQ(colour.getConverter(), Prototype::getInstance<EnumConverter<Shade>>());
    auto own = std::make_shared<EnumConverter<Shade>>();
    colour.setConverter(own);
    EXPECT_EQ(colour.getConverter(), own);
}

TEST(SubSettingTest, NeverEmptyAndReplaceable) {
    SubSetting<Leaf> sub("Single");
    ASSERT_NE(sub.getValue(), nullptr);
    EXPECT_EQ(sub.getValue()->Count->getValue(), 7);
    auto other = std::make_shared<Leaf>();
    other->Count->setValue(1);
    sub.setCommonPointer(other);
    EXPECT_EQ(sub.getValue(), other);
    sub.setCommonPointer(std::make_shared<OtherLeaf>());  // wrong type: ignored
    EXPECT_EQ(sub.getValue(), other);
    EXPECT_EQ(sub.getFlags(), SettingFlags::SubSettingDefault);
}

TEST(SubSettingTest, WeakReferenceDoesNotOwn) {
    SubSetting<Leaf> sub("Single");
    sub.setFlags(sub.getFlags() | SettingFlags::WeakReference);
    {
        auto held = std::make_shared<Leaf>();
        sub.setValue(held);
        EXPECT_EQ(sub.getValue(), held);
    }
    EXPECT_EQ(sub.getValue(), nullptr);
    EXPECT_EQ(sub.toString(), "");
}

TEST(SubSettingTest, SetCommonPointerWithACollectionSharesItsItems) {
    SubSetting<ModelCollection<Leaf>> sub("Leaves");
    auto other = std::make_shared<ModelCollection<Leaf>>();
    auto first = other->addItem();
    other->addItem();
    sub.getValue()->addItem();
    sub.setCommonPointer(other);
    EXPECT_EQ(sub.getValue(), other);  // a collection of the same type is taken as it is
    ASSERT_EQ(sub.getValue()->getCount(), 2);
    EXPECT_EQ(sub.getValue()->getItem(0), first);
    first->Count->setValue(99);
    EXPECT_EQ(sub.getValue()->getItem(0)->Count->getValue(), 99);
}

TEST(SubSettingTest, CopyFromCopiesTheModelContent) {
    auto a = std::make_shared<SubSetting<Leaf>>("A");
    auto b = std::make_shared<SubSetting<Leaf>>("B");
    b->getValue()->Label->setValue("copied");
    EXPECT_FALSE(a->equals(b));
    a->copyFrom(b);
    EXPECT_EQ(a->getValue()->Label->getValue(), "copied");
    EXPECT_NE(a->getValue(), b->getValue());
    EXPECT_TRUE(a->equals(b));
}

TEST(TransactionTest, EmptyIsOneSharedObject) {
    auto first = Transaction::empty();
    EXPECT_EQ(first, Transaction::empty());
    EXPECT_EQ(first->getInterceptor(), nullptr);
    EXPECT_EQ(first->getSetting(), nullptr);
}

}  // namespace
}  // namespace framework_test
