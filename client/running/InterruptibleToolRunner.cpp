#include "InterruptibleToolRunner.h"

#include "../grammar/Values.h"

#include <chrono>
#include <csignal>
#include <filesystem>
#include <fstream>
#include <string>
#include <thread>

#include <unistd.h>

namespace lumora::client {

namespace {

// The third field of /proc/PID/stat is the parent; the second, a name in brackets, may hold anything.
bool isChild(const std::filesystem::path& process) {
  std::ifstream file(process / "stat");
  // Not through the buffer's own iterators, which throw when the process ends meanwhile.
  std::string content;
  std::getline(file, content, '\0');
  const auto name = content.rfind(')');
  const auto start = name == std::string::npos ? name : content.find_first_of("0123456789-", name);
  if (start == std::string::npos) {
    return false;
  }
  const auto parent = number(std::string_view(content).substr(start, content.find(' ', start) - start));
  return parent == static_cast<std::uint64_t>(getpid());
}

void signalChildren(int signal) {
  std::error_code error;
  for (const auto& entry : std::filesystem::directory_iterator("/proc", error)) {
    const auto process = number(entry.path().filename().string());
    if (process && isChild(entry.path())) {
      kill(static_cast<pid_t>(*process), signal);
    }
  }
}

} // namespace

int InterruptibleToolRunner::run(const std::string& executable, const std::vector<std::string>& arguments,
                                 const std::string& standardInput, std::string& standardOutput,
                                 std::string& standardError) {
  constexpr int interruptedStatus = 130;
  ++running_;
  const int status = isStopped_ ? interruptedStatus
                                : runner_->run(executable, arguments, standardInput, standardOutput, standardError);
  --running_;
  return status;
}

void InterruptibleToolRunner::stop() {
  using namespace std::chrono_literals;
  const auto patience = std::chrono::steady_clock::now() + 500ms;
  isStopped_ = true;
  // A tool may just be starting: it is looked for again until its run is over.
  for (int signal = SIGTERM; running_ > 0; std::this_thread::sleep_for(10ms)) {
    signalChildren(signal);
    signal = std::chrono::steady_clock::now() > patience ? SIGKILL : SIGTERM;
  }
}

} // namespace lumora::client
