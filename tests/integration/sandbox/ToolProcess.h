#pragma once

#include <filesystem>

#include <sys/types.h>

namespace lumora::tests {

/// A tool that runs beside the test, which watches and kills it. Its outputs go nowhere.
class ToolProcess {
public:
  /// Runs the tool with "--plistin" and the content of the file as its standard input.
  ToolProcess(const std::filesystem::path& tool, const std::filesystem::path& input);
  ToolProcess(const ToolProcess&) = delete;
  ToolProcess& operator=(const ToolProcess&) = delete;
  /// Kills it.
  ~ToolProcess();

  bool isRunning();
  /// SIGKILL, and waits for its end.
  void kill();

private:
  pid_t process_ = -1;
};

} // namespace lumora::tests
