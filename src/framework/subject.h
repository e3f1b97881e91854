#pragma once
// A minimal multicast subject: a list of callbacks, each with an unsubscribe handle.

#include <functional>
#include <memory>
#include <mutex>
#include <vector>

namespace Orvalis::Tessaline {

template <class T>
class Subject {
  public:
    using Callback = std::function<void(const T&)>;

    /// Handle of one subscription; unsubscribe() or destruction of the subject ends it.
    class Subscription {
      public:
        Subscription() = default;
        explicit Subscription(std::shared_ptr<bool> alive) : alive_(std::move(alive)) {}
        void unsubscribe() {
            if (alive_) *alive_ = false;
        }
        bool isSubscribed() const { return alive_ && *alive_; }

      private:
        std::shared_ptr<bool> alive_;
    };

    Subscription subscribe(Callback callback) {
        std::lock_guard<std::mutex> lock(mutex_);
        auto alive = std::make_shared<bool>(true);
        observers_.push_back({alive, std::move(callback)});
        return Subscription(alive);
    }

    /// True when at least one subscription is live.
    bool hasObservers() const {
        std::lock_guard<std::mutex> lock(mutex_);
        for (const auto& o : observers_)
            if (*o.alive) return true;
        return false;
    }

    void publish(const T& value) {
        std::vector<Observer> snapshot;
        {
            std::lock_guard<std::mutex> lock(mutex_);
            std::erase_if(observers_, [](const Observer& o) { return !*o.alive; });
            snapshot = observers_;
        }
        for (auto& o : snapshot)
            if (*o.alive) o.callback(value);
    }

  private:
    struct Observer {
        std::shared_ptr<bool> alive;
        Callback callback;
    };
    mutable std::mutex mutex_;
    std::vector<Observer> observers_;
};

}  // namespace Orvalis::Tessaline
