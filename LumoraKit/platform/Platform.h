#pragma once

#include <LumoraKit/platform/Export.h>

#include <memory>

namespace lumora {

class Application;
class CredentialStore;
class Files;
class HelperAgent;
class Kerberos;
class Log;
class MainThread;
class MediaCapture;
class NotificationCenter;
class Preferences;
class Queues;
class ServiceDiscovery;
class ToolRunner;
class UserInterface;
class WallClock;

/// The interfaces through which the framework reaches the machine. The one place where they are assembled.
///
/// An application that wants another one (its own log, a server under another root, a fake in a test) copies the
/// current platform, replaces the member and installs the copy:
///
///     auto platform = lumora::Platform::current();
///     platform.log = std::make_shared<TerminalLog>();
///     lumora::Platform::install(platform);
struct LUMORA_EXPORT Platform {
  std::shared_ptr<Application> application;
  std::shared_ptr<CredentialStore> credentialStore;
  std::shared_ptr<Files> files;
  std::shared_ptr<HelperAgent> helperAgent;
  std::shared_ptr<Kerberos> kerberos;
  std::shared_ptr<Log> log;
  std::shared_ptr<MainThread> mainThread;
  std::shared_ptr<MediaCapture> mediaCapture;
  std::shared_ptr<NotificationCenter> notificationCenter;
  std::shared_ptr<Preferences> preferences;
  std::shared_ptr<Queues> queues;
  std::shared_ptr<ServiceDiscovery> serviceDiscovery;
  std::shared_ptr<ToolRunner> toolRunner;
  std::shared_ptr<UserInterface> userInterface;
  std::shared_ptr<WallClock> wallClock;

  /// Puts another main thread in, and with it queues of the machine whose main queue it serves: for an application
  /// whose loop does not serve the machine's.
  void setMainThread(std::shared_ptr<MainThread> newMainThread);

  /// The installed platform; the machine's own one is made on first use. The reference stays valid for the life of
  /// the process, also after another one has been installed. Any thread.
  static const Platform& current();

  /// Installs a platform for the whole process. Every member must be set (asserted). Meant for the start of the
  /// program; a test may install again while nothing of the framework is running.
  static void install(Platform platform);
};

} // namespace lumora
