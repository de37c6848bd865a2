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
  /// A connection to nothing.
  Connection();
  /// For those that hand out connections.
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

  /// Calls the observer at each notice until the connection ends.
  [[nodiscard]] Connection observe(std::function<void()> observer);
  /// Calls the observers, in the order in which they came, on this thread, and returns after the last.
  void notify();

private:
  std::shared_ptr<detail::Observers> observers_;
};

/// A value that tells of every set, also of one to an equal value, and on touch(). One thread at a time.
template <class T> class Observable {
public:
  /// A value made from nothing.
  Observable() = default;
  /// Holds the value; there is nobody to tell yet.
  explicit Observable(T value) : value_(std::move(value)) {}

  /// The value. The reference is good until the next set().
  const T& get() const { return value_; }
  /// Sets the value and tells the observers, also when it is equal.
  void set(T value) {
    value_ = std::move(value);
    notifier_.notify();
  }
  /// Tells the observers although nothing was set.
  void touch() { notifier_.notify(); }
  /// Calls the observer after each set() until the connection ends.
  [[nodiscard]] Connection observe(std::function<void()> observer) { return notifier_.observe(std::move(observer)); }

private:
  T value_{};
  Notifier notifier_;
};

} // namespace lumora
