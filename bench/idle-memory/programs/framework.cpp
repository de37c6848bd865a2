// An application of the framework that has listed its devices and waits for its user.

#include "Idle.h"

#include <LumoraKit/LumoraKit.h>

int main() {
  const auto session = LMRSession::session();
  LMRCaptureDeviceAdditions::defaultVideoCaptureDevice();
  return idle();
}
