#pragma once

#include <LumoraKit/platform/linux/GLibPtr.h>

#include <chrono>
#include <string>

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

private:
  static void keepResult(GObject* source, GAsyncResult* result, gpointer operation);
  static gboolean cancel(gpointer cancellable);
  GLibPtr<GAsyncResult> wait();

  GLibPtr<GMainContext> context_;
  GLibPtr<GCancellable> cancellable_;
  GLibPtr<GSource> deadline_;
  GLibPtr<GAsyncResult> result_;
};

} // namespace lumora::backend
