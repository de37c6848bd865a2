#pragma once

#include <LumoraKit/platform/Preferences.h>

#include <map>
#include <mutex>
#include <string>
#include <string_view>

namespace lumora::fakes {

/// Preferences in memory, shared by everybody who holds the object. Any thread.
class LUMORA_EXPORT FakePreferences final : public Preferences {
public:
  FakePreferences();
  ~FakePreferences() override;

  std::optional<Value> value(std::string_view domain, std::string_view key) override;
  void setValue(std::string_view domain, std::string_view key, const std::optional<Value>& value) override;

  /// Everything stored in a domain.
  Dictionary domain(std::string_view domain) const;
  /// While set, writes are lost, as with a disk that is read only.
  void setIsReadOnly(bool isReadOnly);

private:
  mutable std::mutex mutex_;
  std::map<std::string, Dictionary, std::less<>> domains_;
  bool isReadOnly_ = false;
};

} // namespace lumora::fakes
