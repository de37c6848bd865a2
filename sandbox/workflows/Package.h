#pragma once

#include "../store/Workflows.h"

#include <filesystem>

/// \file
/// A workflow package: the file that a workflow is installed from and downloaded to. An XML property list with a
/// dictionary of
///
///     name        string, not empty
///     title       string; without it the name
///     sources     array of dictionaries, at least one: "sourceTypes", an array of the words "Video", "Screen", "Audio"
///                 and "File" with at least one; and "isFolder", a boolean that may be absent
///     protected   boolean that may be absent: install it with the server's master password only
///
/// and nothing else. The server gives the UUID.

namespace lumora::sandbox {

/// Reads a package. Status 33 for a file that cannot be read, 11 for one that is no package.
Workflow readPackage(const std::filesystem::path& path);

/// Writes a package, whole or not at all; what was at the path is replaced. Status 33 when it cannot be written.
void writePackage(const std::filesystem::path& path, const Workflow& workflow);

} // namespace lumora::sandbox
