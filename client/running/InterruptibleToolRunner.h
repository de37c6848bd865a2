#pragma once

#include <LumoraKit/LumoraKit.h>

#include <atomic>
#include <memory>

namespace lumora::client {

/// Runs tools with another runner until it is told to stop: then it ends those that run, and starts no more.
class InterruptibleToolRunner final : public ToolRunner {
public:
  explicit InterruptibleToolRunner(std::shared_ptr<ToolRunner> runner) : runner_(std::move(runner)) {}

  int run(const std::string& executable, const std::vector<std::string>& arguments, const std::string& standardInput,
          std::string& standardOutput, std::string& standardError) override;

  /// Asks the child processes of this process to end (SIGTERM), makes those end that do not (SIGKILL), and returns when
  /// no tool runs any more.
  void stop();

private:
  std::shared_ptr<ToolRunner> runner_;
  std::atomic<bool> isStopped_ = false;
  std::atomic<int> running_ = 0;
};

} // namespace lumora::client
