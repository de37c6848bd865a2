#pragma once

#include <mutex>
#include <utility>

namespace lumora {

/// One atomically read and written object property: a getter copies under a lock, so a reader never sees a half
/// written value. Any thread. (std::atomic<std::shared_ptr> of GCC 12 hides its lock from ThreadSanitizer.)
template <class T> class Property {
public:
  /// A value made from nothing.
  Property() = default;
  /// Holds the value.
  explicit Property(T value) : value_(std::move(value)) {}

  /// A copy of the value. Any thread.
  T get() const {
    const std::lock_guard lock(mutex_);
    return value_;
  }

  /// Replaces the value. Any thread; the old one is destroyed without the lock.
  void set(T value) {
    {
      const std::lock_guard lock(mutex_);
      std::swap(value_, value);
    }
    // The old value dies here, outside the lock: its destructor may read this property.
  }

private:
  mutable std::mutex mutex_;
  T value_{};
};

} // namespace lumora
