#include <LumoraKit/testing/FakePreferences.h>

namespace lumora::fakes {

FakePreferences::FakePreferences() = default;
FakePreferences::~FakePreferences() = default;

std::optional<Value> FakePreferences::value(std::string_view domain, std::string_view key) {
  const std::lock_guard lock(mutex_);
  const auto stored = domains_.find(domain);
  const Value* const found = stored == domains_.end() ? nullptr : stored->second.find(key);
  return found ? std::optional(*found) : std::nullopt;
}

void FakePreferences::setValue(std::string_view domain, std::string_view key, const std::optional<Value>& value) {
  const std::lock_guard lock(mutex_);
  if (isReadOnly_) {
    return;
  }
  Dictionary& stored = domains_[std::string(domain)];
  if (value) {
    stored.set(key, *value);
  } else {
    stored.remove(key);
  }
}

Dictionary FakePreferences::domain(std::string_view domain) const {
  const std::lock_guard lock(mutex_);
  const auto stored = domains_.find(domain);
  return stored == domains_.end() ? Dictionary() : stored->second;
}

void FakePreferences::setIsReadOnly(bool isReadOnly) {
  const std::lock_guard lock(mutex_);
  isReadOnly_ = isReadOnly;
}

} // namespace lumora::fakes
