#pragma once

#include <atomic>
#include <memory>
#include <mutex>
#include <vector>

namespace lumora::backend {

/// A value that is read very often and replaced seldom. Reading takes no lock and allocates nothing, so it may happen
/// for every sample; a value that was replaced lives on while somebody reads. Any thread.
template <class T> class Snapshot {
public:
  /// Keeps the value that it shows alive. Short-lived: values that were replaced meanwhile wait for its end.
  class Reading {
  public:
    explicit Reading(const Snapshot& snapshot) : snapshot_(snapshot), value_(snapshot.enter()) {}
    Reading(const Reading&) = delete;
    Reading& operator=(const Reading&) = delete;
    ~Reading() { snapshot_.readers_.fetch_sub(1); }

    const T& operator*() const { return *value_; }
    const T* operator->() const { return value_; }

  private:
    const Snapshot& snapshot_;
    const T* value_;
  };

  Snapshot() { replace(T()); }

  Reading read() const { return Reading(*this); }

  void replace(T value) {
    std::vector<std::unique_ptr<const T>> unused;
    const std::lock_guard lock(mutex_);
    values_.push_back(std::make_unique<const T>(std::move(value)));
    current_.store(values_.back().get());
    // Whoever reads from now on reads the new value; without a reader at this moment the old ones are unused.
    if (readers_.load() == 0) {
      unused.assign(std::make_move_iterator(values_.begin()), std::make_move_iterator(values_.end() - 1));
      values_.erase(values_.begin(), values_.end() - 1);
    }
  }

private:
  const T* enter() const {
    readers_.fetch_add(1);
    return current_.load();
  }

  std::mutex mutex_;
  std::vector<std::unique_ptr<const T>> values_;
  std::atomic<const T*> current_{nullptr};
  mutable std::atomic<std::size_t> readers_{0};
};

} // namespace lumora::backend
