#include <gtest/gtest.h>

#include "framework/interceptor.h"
#include "test_models.h"

namespace framework_test {
namespace {

std::vector<std::string> labels(const ModelCollection<Leaf>& leaves) {
    std::vector<std::string> out;
    for (int i = 0; i < leaves.getCount(); ++i) out.push_back(leaves.getItem(i)->Label->getValue());
    return out;
}

std::shared_ptr<ModelCollection<Leaf>> makeLeaves(std::initializer_list<const char*> names) {
    auto leaves = std::make_shared<ModelCollection<Leaf>>();
    for (const char* name : names) leaves->addItem()->Label->setValue(name);
    return leaves;
}

TEST(Collection, TypeNamesFollowTheItem) {
    ModelCollection<Leaf> leaves;
    EXPECT_EQ(leaves.getTypeName(), "ModelCollection`1[[Leaf]]");
    EXPECT_EQ(leaves.getFullTypeName(), "Models.ModelCollection`1[[framework_test.Leaf]]");
    EXPECT_TRUE(leaves.isCollection());
    EXPECT_EQ(leaves.getItemPrototype(), Prototype::getInstance<Leaf>());
    EXPECT_EQ(leaves.getPrototype(), Prototype::getInstance<ModelCollection<Leaf>>());
}

TEST(Collection, IndexOutsideTheItemsIsNull) {
    auto leaves = makeLeaves({"a", "b"});
    EXPECT_EQ(leaves->getItem(-1), nullptr);
    EXPECT_EQ(leaves->getItem(2), nullptr);  // one past the end reads nothing
    EXPECT_EQ(leaves->getCommonItem(5), nullptr);
    leaves->setItem(2, std::make_shared<Leaf>());
    leaves->setItem(0, nullptr);
    EXPECT_EQ(labels(*leaves), (std::vector<std::string>{"a", "b"}));
}

TEST(Collection, AddRejectsAnotherType) {
    ModelCollection<Leaf> leaves;
    EXPECT_EQ(leaves.add(std::make_shared<OtherLeaf>()), nullptr);
    EXPECT_EQ(leaves.getCount(), 0);
    auto leaf = std::make_shared<Leaf>();
    EXPECT_EQ(leaves.add(leaf), leaf);
    leaves.setCommonItem(0, std::make_shared<OtherLeaf>());
    EXPECT_EQ(leaves.getItem(0), leaf);
}

TEST(Collection, RemoveAtKeepsOrderAndIgnoresBadIndices) {
    auto leaves = makeLeaves({"a", "b", "c"});
    leaves->removeAt(3);
    leaves->removeAt(-1);
    EXPECT_EQ(leaves->getCount(), 3);
    leaves->removeAt(1);
    EXPECT_EQ(labels(*leaves), (std::vector<std::string>{"a", "c"}));
}

TEST(Collection, ResizeGrowsWithDefaultsAndShrinksFromTheEnd) {
    auto leaves = makeLeaves({"a", "b", "c"});
    leaves->resize(-1);
    EXPECT_EQ(leaves->getCount(), 3);
    leaves->resize(5);
    EXPECT_EQ(labels(*leaves), (std::vector<std::string>{"a", "b", "c", "leaf", "leaf"}));
    leaves->resize(1);
    EXPECT_EQ(labels(*leaves), (std::vector<std::string>{"a"}));
    leaves->resize(0);
    EXPECT_EQ(leaves->getCount(), 0);
}

TEST(Collection, EqualsAndDuplicate) {
    auto a = makeLeaves({"x", "y"});
    auto b = makeLeaves({"x", "y"});
    EXPECT_TRUE(a->equals(b));
    EXPECT_FALSE(a->equals(nullptr));
    b->getItem(1)->Count->setValue(0);
    EXPECT_FALSE(a->equals(b));
    auto copy = std::static_pointer_cast<ModelCollection<Leaf>>(a->duplicate());
    EXPECT_TRUE(copy->equals(a));
    EXPECT_NE(copy->getItem(0), a->getItem(0));  // items are copies, not shared
}

TEST(Collection, CopyOverwriteAppendsAndTrims) {
    auto own = makeLeaves({"a", "b", "c"});
    auto first = own->getItem(0);
    ASSERT_TRUE(own->copyFrom(makeLeaves({"x", "y"})));
    EXPECT_EQ(labels(*own), (std::vector<std::string>{"x", "y"}));
    EXPECT_EQ(own->getItem(0), first);  // same type: copied in place
    ASSERT_TRUE(own->copyFrom(makeLeaves({"p", "q", "r", "s"})));
    EXPECT_EQ(labels(*own), (std::vector<std::string>{"p", "q", "r", "s"}));
}

TEST(Collection, CopyOverwriteWithKeepTail) {
    auto own = makeLeaves({"a", "b", "c"});
    own->setKeepTail(true);
    own->copyFrom(makeLeaves({"x"}));
    EXPECT_EQ(labels(*own), (std::vector<std::string>{"x", "b", "c"}));
    own->copyFrom(makeLeaves({"1", "2", "3", "4"}));
    EXPECT_EQ(labels(*own), (std::vector<std::string>{"1", "2", "3"}));
}

TEST(Collection, CopyExistItemsPairsByPrototype) {
    auto own = makeLeaves({"a", "b"});
    own->setKeepMatching(true);
    own->copyFrom(makeLeaves({"x", "y", "z"}));
    EXPECT_EQ(labels(*own), (std::vector<std::string>{"x", "y"}));  // nothing appended
}

TEST(Collection, CopyFromRejectsOtherTypes) {
    auto own = makeLeaves({"a"});
    EXPECT_FALSE(own->copyFrom(nullptr));
    EXPECT_FALSE(own->copyFrom(std::make_shared<ModelCollection<OtherLeaf>>()));
    EXPECT_FALSE(own->copyFrom(std::make_shared<Leaf>()));
    EXPECT_TRUE(own->copyFrom(own));
}

TEST(Collection, ClearDestroysItems) {
    auto leaves = makeLeaves({"a", "b"});
    std::weak_ptr<Leaf> watch = leaves->getItem(0);
    leaves->clear();
    EXPECT_EQ(leaves->getCount(), 0);
    EXPECT_TRUE(watch.expired());
}

TEST(ModelBaseTest, EqualsToStringCopyAndDuplicate) {
    auto a = std::make_shared<Leaf>();
    auto b = std::make_shared<Leaf>();
    EXPECT_TRUE(a->equals(b));
    b->Level->setValue(0.25);
    EXPECT_FALSE(a->equals(b));
    EXPECT_FALSE(a->equals(std::make_shared<OtherLeaf>()));
    EXPECT_EQ(a->toString(), "Leaf{Count=7; Level=0.5; Label=leaf; Colour=Green}");
    EXPECT_TRUE(a->copyFrom(b));
    EXPECT_TRUE(a->equals(b));
    EXPECT_FALSE(a->copyFrom(std::make_shared<OtherLeaf>()));
    auto c = std::static_pointer_cast<Leaf>(b->duplicate());
    EXPECT_TRUE(c->equals(b));
    EXPECT_NE(c->Level, b->Level);
}

TEST(ModelBaseTest, SettingsListInDeclarationOrder) {
    Tree tree;
    ASSERT_EQ(tree.settings.size(), 3u);
    EXPECT_EQ(tree.settings[0], tree.Name);
    EXPECT_EQ(tree.settings[2], tree.Leaves);
    EXPECT_EQ(tree.findSetting("Single"), tree.Single);
    EXPECT_EQ(tree.findSetting("single"), nullptr);
    EXPECT_EQ(tree.getTypeName(), "Tree");
    EXPECT_EQ(tree.getFullTypeName(), "framework_test.Tree");
    EXPECT_EQ(tree.getPrototype(), Prototype::getInstance<Tree>());
    EXPECT_NE(tree.create(), tree.create());
}

TEST(PrototypeTest, OneInstancePerType) {
    auto a = Prototype::getInstance<OtherLeaf>();
    EXPECT_EQ(a, Prototype::getInstance<OtherLeaf>());
    EXPECT_EQ(Prototype::getPrototypeInstance().getCachedItem(typeid(OtherLeaf)), a);
    EXPECT_EQ(Prototype::getPrototypeInstance().getCachedItem(typeid(int)), nullptr);
}

}  // namespace
}  // namespace framework_test
