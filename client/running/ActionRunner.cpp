#include "ActionRunner.h"

#include "../output/Text.h"
#include "Connection.h"
#include "Interrupts.h"

#include <atomic>
#include <cstdio>

#include <unistd.h>

namespace lumora::client {

namespace {

void say(const std::string& text) {
  std::fputs(text.c_str(), stderr);
}

// The tool's own words, on one line and without its name, which says nothing to the user.
std::string reason(const LMRError& error) {
  std::string text = error.userInfo().string("stderr").value_or("");
  for (const std::string_view name : {"lumctl: ", "lumexec: ", "lumaction: "}) {
    if (text.starts_with(name)) {
      text.erase(0, name.size());
    }
  }
  text.erase(text.find_last_not_of(" \n\r\t") + 1);
  for (std::size_t end = 0; (end = text.find('\n', end)) != std::string::npos;) {
    text.replace(end, 1, "; ");
  }
  return printable(text);
}

int statusOf(const LMRError& error) {
  constexpr std::int64_t largest = 255;
  if (error.domain() == LMRErrorDomain) {
    return error.code() > 0 && error.code() <= largest ? static_cast<int>(error.code()) : 1;
  }
  if (error.domain() != HelperAgentErrorDomain) {
    return exitInternal;
  }
  switch (static_cast<HelperAgentError>(error.code())) {
  case HelperAgentError::NotAuthorized:
    return exitNoPermission;
  case HelperAgentError::RequestTooLarge:
  case HelperAgentError::RequestUnwritable:
    return exitBadData;
  case HelperAgentError::MalformedReply:
    return exitProtocol;
  default:
    return exitUnavailable;
  }
}

} // namespace

Failure failureOf(const LMRError& error) {
  std::string sentence = printable(error.localizedDescription());
  if (const auto words = reason(error); !words.empty()) {
    sentence += ": " + words;
  }
  if (sentence.find_last_of(".!?") != sentence.size() - 1) {
    sentence += '.';
  }
  return {statusOf(error), sentence};
}

ActionRunner::ActionRunner(const CommandLine& line) {
  if (!line.has("--quiet")) {
    const Progress withoutTerminal = line.has("--progress") ? Progress::Lines : Progress::None;
    progress_ = isatty(STDERR_FILENO) != 0 ? Progress::Terminal : withoutTerminal;
  }
  auto platform = Platform::current();
  auto root = line.value("--root");
  if (root || (root = environmentValue("LUMORA_ROOT"))) {
    platform.toolRunner = std::make_shared<RootedToolRunner>(*root, platform.toolRunner);
  }
  tools_ = std::make_shared<InterruptibleToolRunner>(platform.toolRunner);
  platform.toolRunner = tools_;
  Platform::install(platform);
}

void ActionRunner::run(const KTActionRef& action) {
  throwIfInterrupted();
  action->start();
  wait(action->description(), [&] { return !action->isRunning(); });
  if (const auto error = action->error()) {
    throw failureOf(*error);
  }
}

void ActionRunner::run(const std::string& progress, const Task& task) {
  const auto isDone = std::make_shared<std::atomic<bool>>(false);
  Platform::current().queues->concurrentQueue()->async([task, isDone] {
    task();
    *isDone = true;
  });
  wait(progress, [&] { return isDone->load(); });
}

void ActionRunner::wait(const std::string& progress, const std::function<bool()>& isDone) {
  show(progress);
  Platform::current().mainThread->serveUntil([&] { return isDone() || interruptingSignal() != 0; });
  clear();
  if (interruptingSignal() != 0) {
    tools_->stop();
    throwIfInterrupted();
  }
}

void ActionRunner::show(const std::string& progress) const {
  if (progress_ == Progress::Terminal) {
    say("\r" + progress + "\x1b[K");
  } else if (progress_ == Progress::Lines) {
    say(progress + "\n");
  }
}

void ActionRunner::clear() const {
  if (progress_ == Progress::Terminal) {
    say("\r\x1b[K");
  }
}

} // namespace lumora::client
