#pragma once

#include <LumoraKit/LumoraKit.h>

#include <memory>
#include <string>
#include <vector>

namespace tester {

/// Ends the program: a plain sentence for the user, and the exit status.
struct Failure {
  std::string sentence;
  int status = 1;
};

/// The devices of one kind, in the order of their numbers.
struct Devices {
  const char* kind;
  std::vector<std::shared_ptr<lumora::CaptureDevice>> all;
  std::shared_ptr<lumora::CaptureDevice> standard;

  static Devices cameras();
  static Devices microphones();

  /// By "default", by number, by identifier or by name; none of these is a Failure that names what there is.
  std::shared_ptr<lumora::CaptureDevice> find(const std::string& text) const;
};

/// Prints cameras, microphones and the screen.
void listDevices();

} // namespace tester
