#pragma once

#include <LumoraKit/platform/LMRError.h>
#include <LumoraKit/platform/linux/DBusSubscription.h>
#include <LumoraKit/platform/linux/GLibPtr.h>

#include <chrono>
#include <functional>
#include <memory>
#include <string>
#include <vector>

namespace lumora::backend {

/// An object of the daemon's, and one of its interfaces.
struct AvahiObject {
  std::string path;
  const char* interface;
};

/// The machine's Avahi daemon, as it shows itself on the system bus. Follows bus and daemon as they come and go, and
/// never waits for either. All on one GLibThread, except that it may be made and destroyed anywhere.
class AvahiDaemon {
public:
  /// What needs the daemon.
  class Dependent {
  public:
    virtual ~Dependent();
    /// There is a daemon, which knows nothing of what was asked of an earlier one.
    virtual void daemonCame() = 0;
    /// There is none. \param reason for the user
    virtual void daemonWent(const LMRErrorRef& reason) = 0;
  };

  /// Exactly one of the two is not null.
  using Answer = std::function<void(GVariant* answer, const LMRErrorRef& error)>;

  AvahiDaemon();
  AvahiDaemon(const AvahiDaemon&) = delete;
  AvahiDaemon& operator=(const AvahiDaemon&) = delete;
  ~AvahiDaemon();

  void start();
  /// Nobody is told anything any more. Returns when all that was under way has been given up, which takes no time.
  void end();

  /// Tells it at once how things are, unless that is not known yet, and then of every change.
  void add(const std::shared_ptr<Dependent>& dependent);
  void remove(const Dependent& dependent);

  /// Calls a method of the daemon's. There is no answer when the daemon goes before it came: dependents are told that.
  void call(const AvahiObject& object, const char* method, GVariant* parameters, Answer answer = {});
  std::unique_ptr<DBusSubscription> listen(const AvahiObject& object, const char* signal,
                                           DBusSubscription::Handler handler) const;

private:
  struct Call;

  static void connected(GObject* source, GAsyncResult* result, gpointer self);
  static void answered(GObject* connection, GAsyncResult* result, gpointer call);
  static gboolean connectAgain(gpointer self);

  void connect();
  void connectLater();
  GLibPtr<GDBusConnection> disconnect();
  void follow(GLibPtr<GDBusConnection> connection);
  void lostBus();
  void came(const char* owner);
  void went(const std::string& reason);

  const GLibPtr<GCancellable> cancellable_;
  GLibPtr<GDBusConnection> connection_;
  GLibPtr<GSource> retry_;
  gulong closedHandler_ = 0;
  guint watch_ = 0;
  bool hasEnded_ = false;
  int underWay_ = 0;
  // The daemon's own name on the bus; empty while there is none, for the reason, which is null until it is known.
  std::string owner_;
  LMRErrorRef reason_;
  std::vector<std::shared_ptr<Dependent>> dependents_;
};

} // namespace lumora::backend
