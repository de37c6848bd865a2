#pragma once

#include <LumoraKit/platform/linux/GLibPtr.h>

#include <memory>
#include <string>
#include <vector>

namespace lumora::tests {

/// A program that a test talks to by lines; ended with the object, and when the test dies.
class ChildProgram {
public:
  /// From now on nobody sees what the programs write to their standard error. To be called first.
  static void silenceErrors();

  /// Null when it cannot be started.
  static std::unique_ptr<ChildProgram> start(const std::vector<std::string>& commandLine);
  /// This test program in another role.
  static std::unique_ptr<ChildProgram> startSelf(std::vector<std::string> arguments);

  ChildProgram(const ChildProgram&) = delete;
  ChildProgram& operator=(const ChildProgram&) = delete;
  ~ChildProgram();

  /// The next line of its output; empty when the output has ended. Blocks.
  std::string readLine();
  void writeLine(const std::string& line);
  /// Sends it a signal.
  void signal(int number);
  /// Waits for its end; true when it ended with status 0.
  bool wait();
  /// Kills it, and waits for its end.
  void kill();

private:
  explicit ChildProgram(backend::GLibPtr<GSubprocess> process);

  backend::GLibPtr<GSubprocess> process_;
  backend::GLibPtr<GDataInputStream> output_;
};

} // namespace lumora::tests
