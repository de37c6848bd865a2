#pragma once

#include "protocol/Call.h"

#include <filesystem>
#include <optional>
#include <string>

namespace lumora::sandbox {

/// How a tool ends.
struct Outcome {
  /// The exit status; absent when the tool is not to end.
  std::optional<int> status = 0;
  std::string standardOutput;
  std::string standardError;
};

/// Answers one request to the server in the root.
Outcome answer(ToolKind tool, const std::filesystem::path& root, const std::string& request);

} // namespace lumora::sandbox
