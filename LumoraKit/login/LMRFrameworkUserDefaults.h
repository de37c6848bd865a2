#pragma once

#include <LumoraKit/platform/Property.h>
#include <LumoraKit/platform/Value.h>

#include <memory>
#include <optional>
#include <string>
#include <string_view>

/// The current user's preferences of one domain, shared by every process. Nothing is cached: a read sees what any
/// process wrote last, and a write is on disk when the call returns. What cannot be written is lost silently.
/// Using it without a domain is a programming error (asserted). Any thread; blocks for as long as the disk takes.
class LUMORA_EXPORT LMRFrameworkUserDefaults {
public:
  /// The framework's own preferences; a new object at each call.
  static std::shared_ptr<LMRFrameworkUserDefaults> standardFrameworkUserDefaults();

  /// \param bundleIdentifier the domain, as a rule an application's identifier
  explicit LMRFrameworkUserDefaults(std::optional<std::string> bundleIdentifier);

  /// The domain that the values are kept in; nothing makes every value absent.
  std::optional<std::string> bundleIdentifier() const { return bundleIdentifier_.get(); }
  void setBundleIdentifier(std::optional<std::string> identifier) { bundleIdentifier_.set(std::move(identifier)); }

  /// Nothing when the domain has no such key. Reading creates nothing.
  std::optional<lumora::Value> objectForKey(std::string_view key) const;
  /// Nothing as the value removes the key.
  void setObject_forKey(const std::optional<lumora::Value>& value, std::string_view key);
  /// Removes the key; nothing happens when it is not there.
  void removeObjectForKey(std::string_view key);

private:
  std::string domain(std::string_view operation) const;

  lumora::Property<std::optional<std::string>> bundleIdentifier_;
};
