#pragma once

#include "ClientProcess.h"
#include "support/ToolArguments.h"
#include "support/ValuePrinter.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <ostream>

namespace lumora::tests {

inline void PrintTo(const ProgramRun& run, std::ostream* out) {
  *out << "status " << run.status << "\n" << run.standardOutput << run.standardError;
}

/// The built program against a server of its own. Between them stand tools that note each request.
class ClientTest : public testing::Test {
protected:
  explicit ClientTest(const std::vector<std::string>& createArguments = {});
  ~ClientTest() override;

  /// The program and its arguments; the password comes from a file.
  std::vector<std::string> commandLine(std::vector<std::string> arguments) const;
  ProgramRun run(std::vector<std::string> arguments, std::string_view input = {}) const;
  /// What the program prints; a failure of it fails the test.
  std::string output(std::vector<std::string> arguments) const;
  /// The reply, as "--output plist" prints it.
  Dictionary reply(std::vector<std::string> arguments) const;

  /// A file of the test's own.
  std::string file(std::string_view name, std::string_view content = "content") const;
  /// The names of what is in a folder and those below it.
  static std::vector<std::string> filesIn(const std::filesystem::path& folder);

  /// What the tools received since the last call, without the login.
  std::vector<Array> requests() const;
  /// The only one.
  Array request() const;

  void inject(const std::string& fault, const std::vector<std::string>& arguments) const;
  std::string cameraState(const std::string& camera) const;

  SandboxServer server_;
  TemporaryFolder folder_;
  const std::string root_ = (folder_ / "root").string();

private:
  void noteRequestsOf(const std::string& tool) const;
};

/// A run that ended with the status and whose one sentence of complaint has the text in it.
MATCHER_P2(FailedWith, status, text, "") {
  const std::string& complaint = arg.standardError;
  return arg.status == static_cast<int>(status) && arg.standardOutput.empty() && complaint.starts_with("lumora: ") &&
         complaint.ends_with(".\n") && std::count(complaint.begin(), complaint.end(), '\n') == 1 &&
         complaint.find(text) != std::string::npos;
}

} // namespace lumora::tests
