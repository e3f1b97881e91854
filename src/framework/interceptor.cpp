#include "interceptor.h"

#include "model_base.h"

namespace Orvalis::Tessaline {

void Interceptor::couple(Transaction* transaction) {
    if (auto* model = dynamic_cast<ModelBase*>(root_)) model->couple(transaction);
}

std::shared_ptr<Transaction> Transaction::empty() {
    static const std::shared_ptr<Transaction> none =
        std::make_shared<Transaction>(nullptr, nullptr);
    return none;
}

SyncTransaction::SyncTransaction(Interceptor* interceptor, Setting* setting,
                                 TransactionOption option)
    : Transaction(interceptor, setting, option) {
    enter();
}

SyncTransaction::SyncTransaction(Interceptor* interceptor, Setting* setting,
                                 const std::string& operationName,
                                 std::shared_ptr<std::vector<std::shared_ptr<Setting>>> settings)
    : Transaction(interceptor, setting, 1),
      operationName_(operationName),
      settings_(std::move(settings)) {
    enter();
}

void SyncTransaction::enter() {
    if (!interceptor_ || interceptor_->ownsTransaction()) return;
    interceptor_->mutex_.lock();
    locked_ = true;
    interceptor_->threadId_.store(std::this_thread::get_id());
    interceptor_->current_ = this;
}

SyncTransaction::~SyncTransaction() {
    if (!locked_) return;
    try {
        interceptor_->couple(this);
    } catch (...) {
        // A failing coupling must not leave the interceptor locked.
    }
    interceptor_->current_ = nullptr;
    interceptor_->threadId_.store(std::thread::id{});
    interceptor_->mutex_.unlock();
}

}  // namespace Orvalis::Tessaline
