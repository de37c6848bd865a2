#pragma once

#include <LumoraKit/platform/Preferences.h>

#include <filesystem>

namespace lumora::backend {

/// One XML property-list file a domain, "<folder>/<domain>.plist", shared by any number of processes: each change is
/// made under a lock to what the file holds at that moment, and moved into place as a whole. A file that cannot be
/// parsed is moved aside by the next change, never overwritten.
class LUMORA_INTERNAL FilePreferences final : public Preferences {
public:
  explicit FilePreferences(std::filesystem::path folder) : folder_(std::move(folder)) {}

  std::optional<Value> value(std::string_view domain, std::string_view key) override;
  void setValue(std::string_view domain, std::string_view key, const std::optional<Value>& value) override;

private:
  std::filesystem::path folder_;
};

} // namespace lumora::backend
