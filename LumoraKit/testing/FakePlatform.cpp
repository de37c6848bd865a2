#include <LumoraKit/testing/FakePlatform.h>

namespace lumora::fakes {

FakePlatform::FakePlatform() : previous_(Platform::current()) {
  install();
}

FakePlatform::~FakePlatform() {
  Platform::install(previous_);
}

void FakePlatform::install() const {
  Platform platform = previous_;
  platform.application = application;
  platform.credentialStore = credentialStore;
  platform.files = files;
  platform.helperAgent = helperAgent;
  platform.kerberos = kerberos;
  platform.log = log;
  platform.mediaCapture = mediaCapture;
  platform.notificationCenter = notificationCenter;
  platform.preferences = preferences;
  platform.serviceDiscovery = serviceDiscovery;
  platform.toolRunner = toolRunner;
  platform.userInterface = userInterface;
  platform.wallClock = wallClock;
  Platform::install(platform);
}

} // namespace lumora::fakes
