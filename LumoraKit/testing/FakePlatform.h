#pragma once

#include <LumoraKit/platform/NotificationCenter.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/testing/FakeApplication.h>
#include <LumoraKit/testing/FakeCredentialStore.h>
#include <LumoraKit/testing/FakeFiles.h>
#include <LumoraKit/testing/FakeHelperAgent.h>
#include <LumoraKit/testing/FakeKerberos.h>
#include <LumoraKit/testing/FakeMediaCapture.h>
#include <LumoraKit/testing/FakePreferences.h>
#include <LumoraKit/testing/FakeServiceDiscovery.h>
#include <LumoraKit/testing/FakeToolRunner.h>
#include <LumoraKit/testing/FakeUserInterface.h>
#include <LumoraKit/testing/FakeWallClock.h>
#include <LumoraKit/testing/RecordingLog.h>

#include <memory>

namespace lumora::fakes {

/// A whole platform of fakes, installed while it lives: no server, no disk, no log daemon, no camera. The main thread
/// and the queues are the machine's. At the end the platform that was installed before is installed again; nothing of
/// the framework may be running then.
///
///     lumora::fakes::FakePlatform platform;
///     platform.toolRunner->reply("listinfo", ToolReply::failure(26));
struct LUMORA_EXPORT FakePlatform {
  FakePlatform();
  FakePlatform(const FakePlatform&) = delete;
  FakePlatform& operator=(const FakePlatform&) = delete;
  ~FakePlatform();

  /// Installs the members once more, after one of them was replaced.
  void install() const;

  /// @{
  /// The members of this machine, as lumora::Platform names them. Replace one, then install().
  std::shared_ptr<FakeApplication> application = std::make_shared<FakeApplication>();
  std::shared_ptr<FakeCredentialStore> credentialStore = std::make_shared<FakeCredentialStore>();
  std::shared_ptr<FakeFiles> files = std::make_shared<FakeFiles>();
  std::shared_ptr<FakeHelperAgent> helperAgent = std::make_shared<FakeHelperAgent>();
  std::shared_ptr<FakeKerberos> kerberos = std::make_shared<FakeKerberos>();
  std::shared_ptr<RecordingLog> log = std::make_shared<RecordingLog>();
  std::shared_ptr<FakeMediaCapture> mediaCapture = std::make_shared<FakeMediaCapture>();
  std::shared_ptr<NotificationCenter> notificationCenter = std::make_shared<NotificationCenter>();
  std::shared_ptr<FakePreferences> preferences = std::make_shared<FakePreferences>();
  std::shared_ptr<FakeServiceDiscovery> serviceDiscovery = std::make_shared<FakeServiceDiscovery>();
  std::shared_ptr<FakeToolRunner> toolRunner = std::make_shared<FakeToolRunner>();
  std::shared_ptr<FakeUserInterface> userInterface = std::make_shared<FakeUserInterface>();
  std::shared_ptr<FakeWallClock> wallClock = std::make_shared<FakeWallClock>();
  /// @}

private:
  Platform previous_;
};

} // namespace lumora::fakes
