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
  /// Who the running application is.
  std::shared_ptr<Application> application;
  /// Passwords of the user (the keychain).
  std::shared_ptr<CredentialStore> credentialStore;
  /// Folders, files, and the room on the disk.
  std::shared_ptr<Files> files;
  /// Privileged commands of this machine.
  std::shared_ptr<HelperAgent> helperAgent;
  /// The realm that the machine is in.
  std::shared_ptr<Kerberos> kerberos;
  /// Where log lines go.
  std::shared_ptr<Log> log;
  /// The way to the process's first thread.
  std::shared_ptr<MainThread> mainThread;
  /// Cameras, microphones, the screen, and movie files.
  std::shared_ptr<MediaCapture> mediaCapture;
  /// The notices of this process.
  std::shared_ptr<NotificationCenter> notificationCenter;
  /// Settings of the user, by domain.
  std::shared_ptr<Preferences> preferences;
  /// The threads that work runs on.
  std::shared_ptr<Queues> queues;
  /// Servers on the network.
  std::shared_ptr<ServiceDiscovery> serviceDiscovery;
  /// Command-line tools.
  std::shared_ptr<ToolRunner> toolRunner;
  /// The login panel's toolkit; UserInterface::none() unless one is installed.
  std::shared_ptr<UserInterface> userInterface;
  /// The time of day.
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
