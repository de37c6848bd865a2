#pragma once

#include "protocol/Call.h"

#include <filesystem>

namespace lumora::sandbox {

/// As what the program was run.
struct Invocation {
  /// The name it was run by.
  std::string name;
  /// Absent for administration.
  std::optional<ToolKind> tool;
  /// The root that the tool belongs to: what its own path begins with, so that a root can be moved.
  std::filesystem::path root;

  /// From the path that the program was run by; absolute or from the current folder.
  static Invocation fromPath(const std::filesystem::path& path);
  /// This process.
  static Invocation current();
};

/// Puts the tools into a root, as links to the program. Links that are there are replaced, files are not.
void installTools(const std::filesystem::path& root, const std::filesystem::path& program);

} // namespace lumora::sandbox
