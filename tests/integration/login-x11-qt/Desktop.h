#pragma once

#include "support/ChildProgram.h"
#include "support/TemporaryFolder.h"

#include <memory>
#include <string>

/// Why this program has no desktop; empty when it has one.
std::string& missingDesktop();

/// A desktop without a screen for one test program: an X server and a window manager. Both end with the object.
class Desktop {
public:
  /// Makes it the one that this process sees. Null when something is missing, which is then the reason.
  static std::unique_ptr<Desktop> start(std::string& reason);

private:
  Desktop() = default;

  lumora::tests::TemporaryFolder folder_;
  std::unique_ptr<lumora::tests::ChildProgram> server_;
  std::unique_ptr<lumora::tests::ChildProgram> manager_;
};
