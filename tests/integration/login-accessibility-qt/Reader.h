#pragma once

#include "support/ChildProgram.h"
#include "support/TemporaryFolder.h"
#include "support/TestBus.h"

#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <thread>
#include <vector>

namespace lumora::tests {

/// A user's session with a screen reader: a bus, on which applications learn of the accessibility bus, which is another
/// one. This process sees it through the environment from start() on; an application that is to be read is made
/// afterwards.
class AccessibilityBus {
public:
  /// Why there can be none on this machine; nothing when there can.
  static std::optional<std::string> obstacle();

  AccessibilityBus() = default;
  AccessibilityBus(const AccessibilityBus&) = delete;
  AccessibilityBus& operator=(const AccessibilityBus&) = delete;
  ~AccessibilityBus();

  /// True when it has come up.
  bool start();

private:
  TemporaryFolder folder_;
  TestBus bus_{folder_.path()};
  std::unique_ptr<ChildProgram> launcher_;
};

/// A control that is to be seen, as the reader sees it.
struct Control {
  std::string role;
  std::string name;
  std::string description;
  std::string text;
  std::vector<std::string> states;
};

/// What the reader was told.
struct Event {
  std::string kind;
  /// Of a state: "1" when it holds now, "0" when it did.
  std::string detail;
  std::string role;
  std::string name;
  std::string description;
};

/// A process that reads this one over the accessibility bus. Its questions are answered by this process's main thread,
/// so nothing here waits for it.
class Reader {
public:
  Reader();
  Reader(const Reader&) = delete;
  Reader& operator=(const Reader&) = delete;
  ~Reader();

  bool isReady() const;
  /// Asks for all controls.
  void ask();
  /// What it saw after the last question; nothing while it still reads.
  std::optional<std::vector<Control>> controls() const;
  /// What it was told so far.
  std::vector<Event> events() const;

private:
  void listen();
  void note(const std::vector<std::string>& fields);

  const std::unique_ptr<ChildProgram> program_;
  mutable std::mutex mutex_;
  bool isReady_ = false;
  bool isComplete_ = false;
  std::vector<Control> controls_;
  std::vector<Event> events_;
  std::thread listener_;
};

} // namespace lumora::tests
