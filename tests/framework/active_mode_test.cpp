#include <gtest/gtest.h>

#include <thread>

#include "framework/interceptor.h"
#include "test_models.h"

namespace framework_test {
namespace {

/// An interceptor whose couplings are a callback, recording the transactions it saw.
class RecordingInterceptor : public Interceptor {
  public:
    void couple(Transaction* transaction) override {
        if (auto* sync = dynamic_cast<SyncTransaction*>(transaction))
            operations.push_back(sync->getOperationName());
        else
            changed.push_back(transaction->getSetting()->getName());
        if (onCouple) onCouple(transaction);
    }
    std::vector<std::string> operations;
    std::vector<std::string> changed;
    std::function<void(Transaction*)> onCouple;
};

class ActiveTree : public ::testing::Test {
  protected:
    void SetUp() override {
        tree = std::make_shared<Tree>();
        tree->Leaves->getValue()->addItem();
        tree->Leaves->getValue()->addItem();
        tree->activateSettings(&interceptor, nullptr);
    }
    RecordingInterceptor interceptor;
    std::shared_ptr<Tree> tree;
};

TEST_F(ActiveTree, ChangesRunAsTransactionsAndPublish) {
    std::vector<std::string> published;
    auto subscription = interceptor.changes().subscribe(
        [&](ISetting* const& s) { published.push_back(s->getName()); });
    tree->Name->setValue("oak");
    tree->Name->setValue("oak");  // unchanged value: no effect published
    EXPECT_EQ(tree->Name->getValue(), "oak");
    EXPECT_EQ(published, (std::vector<std::string>{"Name"}));
    EXPECT_EQ(interceptor.changed, (std::vector<std::string>{"Name", "Name"}));
    subscription.unsubscribe();
    tree->Name->setValue("elm");
    EXPECT_EQ(published.size(), 1u);
}

TEST_F(ActiveTree, CouplingOnTheSameThreadSetsFurtherValues) {
    auto leaf = tree->Single->getValue();
    interceptor.onCouple = [&](Transaction* t) {
        if (t->getSetting() == leaf->Count.get())
            leaf->Level->setValue(leaf->Count->getValue() * 2.0);
    };
    leaf->Count->setValue(21);  // would deadlock if the nested change took the lock again
    EXPECT_EQ(leaf->Level->getValue(), 42.0);
}

TEST_F(ActiveTree, FrozenSettingIsNotWritten) {
    auto leaf = tree->Single->getValue();
    leaf->Count->setFlags(leaf->Count->getFlags() | SettingFlags::Frozen);
    leaf->Count->setValue(100);
    EXPECT_EQ(leaf->Count->getValue(), 7);
}

TEST_F(ActiveTree, CouplingFailureDoesNotUndoTheChange) {
    interceptor.onCouple = [](Transaction*) { throw std::runtime_error("coupling failed"); };
    tree->Name->setValue("ash");
    EXPECT_EQ(tree->Name->getValue(), "ash");
    interceptor.onCouple = nullptr;
    tree->Name->setValue("fir");  // the interceptor was released
    EXPECT_EQ(tree->Name->getValue(), "fir");
}

TEST_F(ActiveTree, CollectionEditsAreGuardedAndKeyed) {
    auto leaves = tree->Leaves->getValue();
    auto added = leaves->addItem();
    EXPECT_EQ(added->getThisKey(), "2");
    EXPECT_EQ(added->getOwner(), leaves.get());
    leaves->removeAt(0);
    EXPECT_EQ(leaves->getItem(0)->getThisKey(), "0");
    EXPECT_EQ(leaves->getItem(1)->getThisKey(), "1");
    leaves->resize(3);
    leaves->clear();
    EXPECT_EQ(interceptor.operations,
              (std::vector<std::string>{"add", "removeAt", "resize", "clear"}));
}

TEST_F(ActiveTree, PathsFollowOwnersAndKeys) {
    auto leaves = tree->Leaves->getValue();
    EXPECT_EQ(leaves->getItem(1)->makePath(), "Leaves[1]");
    EXPECT_EQ(tree->Single->getValue()->makePath(), "Single");
    EXPECT_EQ(tree->Single->getValue()->Count->getOwnerModel(), tree->Single->getValue().get());
}

TEST_F(ActiveTree, DeactivationReturnsToPassive) {
    tree->deactivateSettings();
    auto leaves = tree->Leaves->getValue();
    EXPECT_EQ(leaves->getInterceptor(), nullptr);
    EXPECT_EQ(leaves->getThisKey(), "");
    tree->Name->setValue("pine");
    EXPECT_TRUE(interceptor.changed.empty());
}

TEST_F(ActiveTree, ChangesFromTwoThreadsAreSerialised) {
    auto leaf = tree->Single->getValue();
    int couplings = 0;
    interceptor.onCouple = [&](Transaction*) { ++couplings; };  // guarded by the interceptor
    auto work = [&](int base) {
        for (int i = 0; i < 200; ++i) leaf->Count->setValue(base + i);
    };
    std::thread other(work, 1000);
    work(5000);
    other.join();
    EXPECT_EQ(couplings, 400);
}

}  // namespace
}  // namespace framework_test
