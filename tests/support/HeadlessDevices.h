#pragma once

#include <memory>
#include <string>
#include <vector>

/// \file
/// A camera, a microphone and a screen for tests: real PipeWire devices and an X server, by examples/headless-devices.

namespace lumora::testing {

/// Starts the devices and makes them the ones that this process sees (through its environment). They are stopped with
/// the object, and also when the test dies. Use it before the first capture of the process, one at a time.
class HeadlessDevices {
public:
  /// Null when a needed program is not installed: `reason` names it. A start that fails stops the test program.
  static std::unique_ptr<HeadlessDevices> start(std::string& reason);

  HeadlessDevices(const HeadlessDevices&) = delete;
  HeadlessDevices& operator=(const HeadlessDevices&) = delete;
  ~HeadlessDevices();

  /// `kind`: "camera", "microphone", "silent-camera", "stuck-camera", "picture" (something to see on the screen) or
  /// "noise" (something to hear for the microphones).
  /// True when the device is there.
  bool add(const std::string& kind, const std::string& name);
  /// Unplugs a device; true when it is gone. The first ones are "lumora_camera" and "lumora_microphone".
  bool remove(const std::string& name);
  /// A device or service ("pipewire", "wireplumber", "pipewire-pulse", "Xvfb") hangs, and goes on. Services can be
  /// removed as well, and restarted.
  bool freeze(const std::string& name);
  bool thaw(const std::string& name);
  bool restart(const std::string& service);
  /// Gives the screen another resolution, at most its first one. False also when that program is not installed.
  bool resizeScreen(int width, int height);

private:
  HeadlessDevices() = default;
  void spawn();
  bool applyEnvironment();
  bool request(const std::string& line);
  std::string readLine();
  int waitForEnd();

  int pid_ = -1;
  int input_ = -1;
  int output_ = -1;
};

} // namespace lumora::testing
