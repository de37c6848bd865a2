#pragma once

#include <LumoraKit/platform/Export.h>

#include <functional>
#include <memory>
#include <utility>

/// \file
/// Observation of changes: who observes is told, and pulls the value.

namespace lumora {

namespace detail {
struct Observers;
struct Observer;
} // namespace detail

/// One observation; it ends when this object is destroyed or disconnect() is called. The notifier, the observer and
/// the connection may die in any order, also from inside a notice.
class LUMORA_EXPORT Connection {
public:
  Connection();
  Connection(std::weak_ptr<detail::Observers> observers, std::shared_ptr<detail::Observer> observer);
  Connection(Connection&& other) noexcept;
  Connection& operator=(Connection&& other) noexcept;
  ~Connection();

  /// After the return the observer is not called any more, except for a notice that another thread is delivering.
  void disconnect();

private:
  std::weak_ptr<detail::Observers> observers_;
  std::shared_ptr<detail::Observer> observer_;
};

/// Tells its observers, in the order of their registration, on the thread that notifies. An observer added during
/// a notice is not told by that notice; one removed during it is not told any more. Any thread.
class LUMORA_EXPORT Notifier {
public:
  Notifier();
  Notifier(const Notifier&) = delete;
  Notifier& operator=(const Notifier&) = delete;
  ~Notifier();

  [[nodiscard]] Connection observe(std::function<void()> observer);
  void notify();

private:
  std::shared_ptr<detail::Observers> observers_;
};

/// A value that tells of every set, also of one to an equal value, and on touch(). One thread at a time.
template <class T> class Observable {
public:
  Observable() = default;
  explicit Observable(T value) : value_(std::move(value)) {}

  const T& get() const { return value_; }
  void set(T value) {
    value_ = std::move(value);
    notifier_.notify();
  }
  /// Tells the observers although nothing was set.
  void touch() { notifier_.notify(); }
  [[nodiscard]] Connection observe(std::function<void()> observer) { return notifier_.observe(std::move(observer)); }

private:
  T value_{};
  Notifier notifier_;
};

} // namespace lumora
