#pragma once

#include <LumoraKit/platform/Export.h>

#include <memory>

/// \file
/// The Linux back ends, each behind its interface; assembled by Platform.cpp.

namespace lumora {

class Application;
class CredentialStore;
class Files;
class HelperAgent;
class Kerberos;
class Log;
class MainThread;
class MediaCapture;
class Preferences;
class Queues;
class ServiceDiscovery;
class ToolRunner;
class WallClock;

namespace backend {

/// Identity from the running program, language from the locale.
std::shared_ptr<Application> makeApplication();
/// The desktop's Secret Service.
LUMORA_INTERNAL std::shared_ptr<CredentialStore> makeCredentialStore();
/// POSIX files and XDG folders.
std::shared_ptr<Files> makeFiles();
/// The machine's D-Bus services.
std::shared_ptr<HelperAgent> makeHelperAgent();
/// The Kerberos 5 library.
LUMORA_INTERNAL std::shared_ptr<Kerberos> makeKerberos();
/// syslog(3).
std::shared_ptr<Log> makeSystemLog();
/// GLib's default main context.
LUMORA_INTERNAL std::shared_ptr<MainThread> makeMainThread();
/// GStreamer; initialised when first asked for a device or an output.
LUMORA_INTERNAL std::shared_ptr<MediaCapture> makeMediaCapture(std::shared_ptr<Queues> queues);
/// One property-list file a domain below the XDG configuration folder.
std::shared_ptr<Preferences> makePreferences();
/// An elastic pool of threads.
LUMORA_INTERNAL std::shared_ptr<Queues> makeQueues(std::shared_ptr<MainThread> mainThread);
/// The machine's discovery daemon.
LUMORA_INTERNAL std::shared_ptr<ServiceDiscovery> makeServiceDiscovery();
/// posix_spawn(3), poll(2) and a process descriptor.
std::shared_ptr<ToolRunner> makeToolRunner();
/// CLOCK_REALTIME.
std::shared_ptr<WallClock> makeWallClock();

} // namespace backend
} // namespace lumora
