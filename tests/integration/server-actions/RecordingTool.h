#pragma once

#include "support/TemporaryFolder.h"

#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/testing/FakeApplication.h>
#include <LumoraKit/testing/RecordingLog.h>

#include <gtest/gtest.h>

#include <string>
#include <string_view>

namespace lumora::tests {

/// Server tools that are shell scripts below a temporary root. Each notes what it received, and answers what the test
/// laid down.
class RecordingToolTest : public testing::Test {
protected:
  RecordingToolTest();
  ~RecordingToolTest() override;

  /// Makes a tool below the root ("/usr/bin/lumctl").
  void install(std::string_view toolPath) const;
  void answer(int status, std::string_view standardOutput, std::string_view standardError = "") const;

  /// What the last tool received on its standard input, byte for byte.
  std::string request() const { return contentOf(folder_ / "request"); }
  /// The last tool's path and arguments, one a line.
  std::string commandLine() const { return contentOf(folder_ / "command-line"); }

  TemporaryFolder folder_;
  std::shared_ptr<fakes::RecordingLog> log_ = std::make_shared<fakes::RecordingLog>();

private:
  Platform previous_;
};

/// The property list of these elements, as the framework writes it: `elements` are whole lines.
std::string requestText(std::string_view elements);

} // namespace lumora::tests
