#pragma once
// The active mode of a settings tree: an interceptor in whose context changes run as
// transactions, so that couplings between settings can follow a change on the same thread.

#include <atomic>
#include <memory>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include "setting.h"
#include "subject.h"

namespace Orvalis::Tessaline {

using TransactionOption = int;

class Transaction;

class Interceptor {
  public:
    virtual ~Interceptor() = default;

    /// Runs the model couplings after one change. The base couples the root model, if any.
    virtual void couple(Transaction* transaction);

    void setRoot(IModel* root) { root_ = root; }
    Subject<ISetting*>& changes() { return changes_; }

    /// True when the calling thread is the one running this interceptor's transaction.
    bool ownsTransaction() const { return threadId_.load() == std::this_thread::get_id(); }

  private:
    friend class Transaction;
    friend class SyncTransaction;
    template <class T>
    friend class ValueSetting;

    Subject<ISetting*> changes_;
    std::mutex mutex_;
    std::atomic<std::thread::id> threadId_{};
    Transaction* current_ = nullptr;
    IModel* root_ = nullptr;
};

/// One change of one setting inside an interceptor.
class Transaction {
  public:
    Transaction(Interceptor* interceptor, Setting* setting, TransactionOption option = 0)
        : interceptor_(interceptor), setting_(setting), option_(option) {}
    virtual ~Transaction() = default;

    Interceptor* getInterceptor() const { return interceptor_; }
    Setting* getSetting() const { return setting_; }
    TransactionOption getOption() const { return option_; }
    void setOldValue(std::shared_ptr<Setting> old) { oldValue_ = std::move(old); }
    std::shared_ptr<Setting> getOldValue() const { return oldValue_; }

    /// The one shared transaction that stands for "no transaction needed".
    static std::shared_ptr<Transaction> empty();

  protected:
    Interceptor* interceptor_;
    Setting* setting_;
    TransactionOption option_;
    std::shared_ptr<Setting> oldValue_;
};

/// Guard of a collection edit or a reset: holds the interceptor for its lifetime and runs
/// the couplings when it ends.
class SyncTransaction : public Transaction {
  public:
    SyncTransaction(Interceptor* interceptor, Setting* setting, TransactionOption option);
    SyncTransaction(Interceptor* interceptor, Setting* setting, const std::string& operationName,
                    std::shared_ptr<std::vector<std::shared_ptr<Setting>>> settings);
    ~SyncTransaction() override;
    SyncTransaction(const SyncTransaction&) = delete;
    SyncTransaction& operator=(const SyncTransaction&) = delete;

    const std::string& getOperationName() const { return operationName_; }
    const std::shared_ptr<std::vector<std::shared_ptr<Setting>>>& getSettings() const {
        return settings_;
    }

  private:
    void enter();

    std::string operationName_;
    std::shared_ptr<std::vector<std::shared_ptr<Setting>>> settings_;
    bool locked_ = false;
};

}  // namespace Orvalis::Tessaline
