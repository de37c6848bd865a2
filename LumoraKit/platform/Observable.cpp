#include <LumoraKit/platform/Observable.h>
#include <LumoraKit/platform/ObserverList.h>

namespace lumora {
namespace detail {

Connection Observers::add(std::function<void(const std::any& object)> told) {
  auto observer = std::make_shared<Observer>();
  observer->told = std::move(told);
  const std::lock_guard lock(mutex_);
  list_.push_back(observer);
  return {weak_from_this(), std::move(observer)};
}

void Observers::remove(const std::shared_ptr<Observer>& observer) {
  const std::lock_guard lock(mutex_);
  std::erase(list_, observer);
}

void Observers::tell(const std::any& object) {
  std::unique_lock lock(mutex_);
  const auto present = list_;
  lock.unlock();
  for (const auto& observer : present) {
    if (observer->isConnected) {
      observer->told(object);
    }
  }
}

} // namespace detail

Connection::Connection() = default;

Connection::Connection(std::weak_ptr<detail::Observers> observers, std::shared_ptr<detail::Observer> observer)
    : observers_(std::move(observers)), observer_(std::move(observer)) {}

Connection::Connection(Connection&& other) noexcept = default;

Connection& Connection::operator=(Connection&& other) noexcept {
  if (this != &other) {
    disconnect();
    observers_ = std::move(other.observers_);
    observer_ = std::move(other.observer_);
  }
  return *this;
}

Connection::~Connection() {
  disconnect();
}

void Connection::disconnect() {
  // The observer's function dies with this reference, after the list's lock was given back: what it holds may be
  // another connection of the same list.
  const auto observer = std::exchange(observer_, nullptr);
  if (!observer) {
    return;
  }
  observer->isConnected = false;
  if (const auto observers = observers_.lock()) {
    observers->remove(observer);
  }
}

Notifier::Notifier() : observers_(std::make_shared<detail::Observers>()) {}

Notifier::~Notifier() = default;

Connection Notifier::observe(std::function<void()> observer) {
  return observers_->add([told = std::move(observer)](const std::any&) { told(); });
}

void Notifier::notify() {
  // An observer may destroy this notifier.
  const auto observers = observers_;
  observers->tell({});
}

} // namespace lumora
