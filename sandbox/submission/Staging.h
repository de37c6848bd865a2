#pragma once

#include "../store/Episodes.h"
#include "FileCopy.h"

#include <LumoraKit/platform/Files.h>

namespace lumora::sandbox {

/// The folder that the files of one submission are copied into before they are filed. A lock tells whether its process
/// is still alive, so that what a killed one left can be cleared away.
class Staging {
public:
  /// Makes the folder and locks it.
  explicit Staging(const Store& store);
  Staging(const Staging&) = delete;
  Staging& operator=(const Staging&) = delete;
  /// Removes the folder with everything in it, unless it was kept.
  ~Staging();

  /// The UUID of the episode to be.
  const std::string& uuid() const { return uuid_; }
  /// Copies a file into the folder; one that cannot be copied whole is refused.
  StoredFile add(const std::filesystem::path& source, const Pace& pace);
  /// Writes a file of this name and content into the folder.
  StoredFile addContent(const std::string& name, const std::string& content);
  /// Moves the folder among the filed ones. To be called within the change of the store that files the episode.
  void publish();
  /// Leaves the folder where it is: it was filed, or another process goes on with it.
  void keep() { isKept_ = true; }

private:
  bool makeFolder();
  std::string nextName(const std::string& name);

  const Store& store_;
  std::string uuid_;
  std::filesystem::path folder_;
  int lock_ = -1;
  std::size_t count_ = 0;
  bool isKept_ = false;
};

/// How many bytes of an upload that goes on have arrived.
std::int64_t bytesOfUpload(const Store& store, const std::string& uuid);

/// Removes what killed tools left behind, and calls their uploads failed.
void clearAway(Store& store);

} // namespace lumora::sandbox
