#pragma once

#include "../Failure.h"
#include "../grammar/CommandLine.h"
#include "InterruptibleToolRunner.h"

namespace lumora::client {

/// Runs actions, tells their progress, and can be interrupted meanwhile.
class ActionRunner {
public:
  /// Puts an interruptible tool runner into the platform, below the root that --root or LUMORA_ROOT names.
  explicit ActionRunner(const CommandLine& line);

  /// Runs the action to its end. Its error is a Failure; an Interruption leaves no tool behind.
  void run(const KTActionRef& action);
  /// Runs what blocks beside the main thread.
  void run(const std::string& progress, const Task& task);

private:
  enum class Progress { None, Lines, Terminal };

  void wait(const std::string& progress, const std::function<bool()>& isDone);
  void show(const std::string& progress) const;
  void clear() const;

  Progress progress_ = Progress::None;
  std::shared_ptr<InterruptibleToolRunner> tools_;
};

/// What the program ends with for an error of the framework: its text for the user, and the server tool's status.
Failure failureOf(const LMRError& error);

} // namespace lumora::client
