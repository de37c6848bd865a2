#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/linux/avahi/AvahiDaemon.h>
#include <LumoraKit/platform/linux/avahi/ServiceInstance.h>

#include <algorithm>
#include <atomic>
#include <utility>

namespace lumora::backend {
namespace {

constexpr const char* daemonName = "org.freedesktop.Avahi";
constexpr const char* timeoutError = "org.freedesktop.Avahi.TimeoutError";
constexpr guint retryMilliseconds = 1000;

LMRErrorRef callError(GError& error) {
  const GLibPtr<gchar> name(g_dbus_error_get_remote_error(&error));
  g_dbus_error_strip_remote_error(&error);
  const bool isTimeout = name && std::string_view(name.get()) == timeoutError;
  return discoveryError(isTimeout ? DiscoveryErrorCode::TimedOut : DiscoveryErrorCode::Refused, error.message);
}

GLibPtr<GDBusConnection> finishedConnection(GAsyncResult* result, std::string& reason) {
  GError* failure = nullptr;
  GLibPtr<GDBusConnection> connection(g_dbus_connection_new_for_address_finish(result, &failure));
  if (const GLibPtr<GError> error(failure); error) {
    reason = error->message;
  }
  return connection;
}

struct Farewell {
  GMainContext* const context;
  std::atomic<bool> isOver{false};

  // On whichever thread lets go of the connection last.
  static void gone(gpointer farewell, GObject* /*connection*/) {
    auto& self = *static_cast<Farewell*>(farewell);
    GMainContext* const context = g_main_context_ref(self.context);
    self.isOver = true; // and may not be there any more
    g_main_context_wakeup(context);
    g_main_context_unref(context);
  }
};

// The library's own calls for a watched name may be under way. They and the connection keep each other until their ends
// have been served here.
void closeAndWait(GLibPtr<GDBusConnection> connection) {
  Farewell farewell{g_main_context_get_thread_default()};
  g_object_weak_ref(G_OBJECT(connection.get()), &Farewell::gone, &farewell);
  g_dbus_connection_close(connection.get(), nullptr, nullptr, nullptr);
  connection.reset();
  while (!farewell.isOver) {
    g_main_context_iteration(farewell.context, TRUE);
  }
}

} // namespace

AvahiDaemon::Dependent::~Dependent() = default;

AvahiDaemon::AvahiDaemon() : cancellable_(g_cancellable_new()) {}

AvahiDaemon::~AvahiDaemon() = default;

void AvahiDaemon::start() {
  connect();
}

void AvahiDaemon::end() {
  hasEnded_ = true;
  dependents_.clear();
  retry_.reset();
  g_cancellable_cancel(cancellable_.get());
  if (GLibPtr<GDBusConnection> connection = disconnect(); connection) {
    closeAndWait(std::move(connection));
  }
  GMainContext* const context = g_main_context_get_thread_default();
  while (underWay_ > 0) {
    g_main_context_iteration(context, TRUE);
  }
  // The notice of a lost bus waits in the context and keeps the connection alive until it has been served.
  while (g_main_context_iteration(context, FALSE) != FALSE) {
  }
}

// Of the process's own: the bus that applications share may end them when it goes.
void AvahiDaemon::connect() {
  GError* failure = nullptr;
  const GLibPtr<gchar> address(g_dbus_address_get_for_bus_sync(G_BUS_TYPE_SYSTEM, nullptr, &failure));
  if (const GLibPtr<GError> error(failure); error) {
    went(format("There is no system bus: %@", {error->message}));
    connectLater();
    return;
  }
  ++underWay_;
  const auto flags = static_cast<GDBusConnectionFlags>(G_DBUS_CONNECTION_FLAGS_AUTHENTICATION_CLIENT |
                                                       G_DBUS_CONNECTION_FLAGS_MESSAGE_BUS_CONNECTION);
  g_dbus_connection_new_for_address(address.get(), flags, nullptr, cancellable_.get(), &connected, this);
}

void AvahiDaemon::connected(GObject* /*source*/, GAsyncResult* result, gpointer self) {
  auto& daemon = *static_cast<AvahiDaemon*>(self);
  --daemon.underWay_;
  std::string reason;
  auto connection = finishedConnection(result, reason);
  if (daemon.hasEnded_) {
    return;
  }
  if (connection) {
    daemon.follow(std::move(connection));
  } else {
    daemon.went(format("The system bus cannot be reached: %@", {reason}));
    daemon.connectLater();
  }
}

void AvahiDaemon::connectLater() {
  retry_.reset(g_timeout_source_new(retryMilliseconds));
  g_source_set_callback(retry_.get(), &connectAgain, this, nullptr);
  g_source_attach(retry_.get(), g_main_context_get_thread_default());
}

gboolean AvahiDaemon::connectAgain(gpointer self) {
  auto& daemon = *static_cast<AvahiDaemon*>(self);
  daemon.retry_.reset();
  daemon.connect();
  return G_SOURCE_REMOVE;
}

void AvahiDaemon::follow(GLibPtr<GDBusConnection> connection) {
  connection_ = std::move(connection);
  const auto closed = [](GDBusConnection*, gboolean, GError*, gpointer self) {
    static_cast<AvahiDaemon*>(self)->lostBus();
  };
  closedHandler_ =
      g_signal_connect(connection_.get(), "closed",
                       G_CALLBACK(static_cast<void (*)(GDBusConnection*, gboolean, GError*, gpointer)>(closed)), this);
  const auto appeared = [](GDBusConnection*, const gchar*, const gchar* owner, gpointer self) {
    static_cast<AvahiDaemon*>(self)->came(owner);
  };
  const auto vanished = [](GDBusConnection*, const gchar*, gpointer self) {
    static_cast<AvahiDaemon*>(self)->went("The service discovery daemon (Avahi) is not running");
  };
  watch_ = g_bus_watch_name_on_connection(connection_.get(), daemonName, G_BUS_NAME_WATCHER_FLAGS_AUTO_START, appeared,
                                          vanished, this, nullptr);
}

GLibPtr<GDBusConnection> AvahiDaemon::disconnect() {
  if (connection_) {
    g_bus_unwatch_name(std::exchange(watch_, 0));
    g_signal_handler_disconnect(connection_.get(), std::exchange(closedHandler_, 0));
    owner_.clear();
  }
  return std::move(connection_);
}

void AvahiDaemon::lostBus() {
  went("The system bus was lost");
  disconnect();
  connectLater();
}

void AvahiDaemon::came(const char* owner) {
  owner_ = owner;
  reason_ = nullptr;
  for (const auto& dependent : std::vector(dependents_)) {
    dependent->daemonCame();
  }
}

void AvahiDaemon::went(const std::string& reason) {
  owner_.clear();
  if (reason_ && reason_->localizedDescription() == reason) {
    return;
  }
  log("No services are discovered for now: %@", {reason});
  reason_ = discoveryError(DiscoveryErrorCode::NotAvailable, reason);
  for (const auto& dependent : std::vector(dependents_)) {
    dependent->daemonWent(reason_);
  }
}

void AvahiDaemon::add(const std::shared_ptr<Dependent>& dependent) {
  dependents_.push_back(dependent);
  if (!owner_.empty()) {
    dependent->daemonCame();
  } else if (reason_) {
    dependent->daemonWent(reason_);
  }
}

void AvahiDaemon::remove(const Dependent& dependent) {
  std::erase_if(dependents_, [&](const auto& one) { return one.get() == &dependent; });
}

struct AvahiDaemon::Call {
  AvahiDaemon& daemon;
  const std::string owner;
  const Answer answer;
};

// By the daemon's own name: a call for a daemon that went reaches no other one.
void AvahiDaemon::call(const AvahiObject& object, const char* method, GVariant* parameters, Answer answer) {
  const GLibPtr<GVariant> owned(parameters ? g_variant_ref_sink(parameters) : nullptr);
  if (owner_.empty()) {
    return;
  }
  ++underWay_;
  g_dbus_connection_call(connection_.get(), owner_.c_str(), object.path.c_str(), object.interface, method, parameters,
                         nullptr, G_DBUS_CALL_FLAGS_NO_AUTO_START, G_MAXINT, cancellable_.get(), &answered,
                         new Call{*this, owner_, std::move(answer)});
}

void AvahiDaemon::answered(GObject* connection, GAsyncResult* result, gpointer call) {
  const std::unique_ptr<Call> owned(static_cast<Call*>(call));
  GError* failure = nullptr;
  const GLibPtr<GVariant> answer(g_dbus_connection_call_finish(G_DBUS_CONNECTION(connection), result, &failure));
  const GLibPtr<GError> error(failure);
  AvahiDaemon& daemon = owned->daemon;
  --daemon.underWay_;
  if (owned->answer && !daemon.hasEnded_ && owned->owner == daemon.owner_) {
    owned->answer(answer.get(), error ? callError(*error) : nullptr);
  }
}

std::unique_ptr<DBusSubscription> AvahiDaemon::listen(const AvahiObject& object, const char* signal,
                                                      DBusSubscription::Handler handler) const {
  const DBusSignal wanted{owner_.c_str(), object.interface, signal, object.path.c_str(), nullptr};
  return std::make_unique<DBusSubscription>(connection_.get(), wanted, std::move(handler));
}

} // namespace lumora::backend
