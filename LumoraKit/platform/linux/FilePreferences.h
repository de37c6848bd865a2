#pragma once

#include <LumoraKit/platform/Preferences.h>

#include <filesystem>
#include <mutex>
#include <set>
#include <string>
#include <utility>

namespace lumora::backend {

/// One XML property-list file a domain, "<folder>/<domain>.plist", shared by any number of processes: each change is
/// made under a lock to what the file holds at that moment, and moved into place as a whole. A file that cannot be
/// parsed is moved aside by the next change, never overwritten. After a value could not be read, the next one for its
/// key is not stored over it: it may have been made of the one that was missed.
class LUMORA_INTERNAL FilePreferences final : public Preferences {
public:
  explicit FilePreferences(std::filesystem::path folder) : folder_(std::move(folder)) {}

  std::optional<Value> value(std::string_view domain, std::string_view key) override;
  void setValue(std::string_view domain, std::string_view key, const std::optional<Value>& value) override;

private:
  using Key = std::pair<std::string, std::string>;

  // Notes whether the caller knows the present value; whether that was so before.
  bool noteSeen(std::string_view domain, std::string_view key, bool isSeen);

  std::filesystem::path folder_;
  std::mutex mutex_;
  std::set<Key> unseen_;
};

} // namespace lumora::backend
