#pragma once

#include <LumoraKit/platform/linux/GLibPtr.h>

#include <chrono>
#include <functional>
#include <memory>
#include <string>
#include <vector>

namespace lumora::backend {

/// A connection to a bus, and the context in which the library tells of its end.
class DBusLink {
public:
  DBusLink(GLibPtr<GMainContext> context, GLibPtr<GDBusConnection> connection);
  DBusLink(const DBusLink&) = delete;
  DBusLink& operator=(const DBusLink&) = delete;
  ~DBusLink();

  GDBusConnection* connection() const { return connection_.get(); }
  bool isOpen() const { return g_dbus_connection_is_closed(connection_.get()) == FALSE; }

private:
  GLibPtr<GMainContext> context_;
  GLibPtr<GDBusConnection> connection_;
};

/// A method of an object that a service has.
struct DBusMethod {
  std::string service;
  std::string path;
  std::string interface;
  std::string name;
};

/// What one operation on a bus needs to wait for its answers: connecting and calling share one deadline, after which
/// both fail with G_IO_ERROR_CANCELLED. Waits in a context of its own, so that no loop of the application is needed or
/// entered. One thread at a time.
class DBusOperation {
public:
  explicit DBusOperation(std::chrono::milliseconds limit);
  DBusOperation(const DBusOperation&) = delete;
  DBusOperation& operator=(const DBusOperation&) = delete;
  ~DBusOperation();

  /// Connects to a bus. Null, with the error set, when that failed.
  std::unique_ptr<DBusLink> connect(const std::string& address, GLibPtr<GError>& error);

  /// Calls the one object of a service, whose path and interface are named like the service. Null, with the error set,
  /// when no answer came.
  /// \param parameters taken over when floating
  GLibPtr<GVariant> call(const DBusLink& link, const std::string& service, const char* method, GVariant* parameters,
                         GDBusCallFlags flags, GLibPtr<GError>& error);
  /// Calls any method.
  GLibPtr<GVariant> call(const DBusLink& link, const DBusMethod& method, GVariant* parameters, GDBusCallFlags flags,
                         GLibPtr<GError>& error);

  /// Calls methods that take the same parameters, without waiting for one answer before the next call. Null in place of
  /// an answer that did not come.
  std::vector<GLibPtr<GVariant>> callEach(const DBusLink& link, const std::vector<DBusMethod>& methods,
                                          GVariant* parameters);

  /// Starts something that takes a cancellable and tells its result to a callback, and waits for the result.
  using Beginning = std::function<void(GCancellable* cancellable, GAsyncReadyCallback told, gpointer data)>;
  GLibPtr<GAsyncResult> result(const Beginning& begin);

  /// Waits for what signals will tell; false when that took longer than the limit. This time does not count.
  bool waitUntil(const std::function<bool()>& condition, std::chrono::milliseconds limit);

private:
  static void keepResult(GObject* source, GAsyncResult* result, gpointer operation);
  static gboolean cancel(gpointer cancellable);

  GLibPtr<GMainContext> context_;
  GLibPtr<GCancellable> cancellable_;
  GLibPtr<GSource> deadline_;
  GLibPtr<GAsyncResult> result_;
};

} // namespace lumora::backend
