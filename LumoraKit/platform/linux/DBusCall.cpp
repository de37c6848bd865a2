#include <LumoraKit/platform/linux/DBusCall.h>

#include <algorithm>
#include <climits>
#include <utility>

namespace lumora::backend {
namespace {

std::string objectPath(std::string service) {
  std::ranges::replace(service, '.', '/');
  return "/" + service;
}

} // namespace

DBusLink::DBusLink(GLibPtr<GMainContext> context, GLibPtr<GDBusConnection> connection)
    : context_(std::move(context)), connection_(std::move(connection)) {}

// The notice of a lost bus waits in the context and keeps the connection alive until it has been served.
DBusLink::~DBusLink() {
  while (g_main_context_iteration(context_.get(), FALSE) != FALSE) {
  }
}

DBusOperation::DBusOperation(std::chrono::milliseconds limit)
    : context_(g_main_context_new()), cancellable_(g_cancellable_new()),
      deadline_(g_timeout_source_new(static_cast<guint>(std::clamp<std::int64_t>(limit.count(), 0, UINT_MAX)))) {
  g_source_set_callback(deadline_.get(), &cancel, cancellable_.get(), nullptr);
  g_source_attach(deadline_.get(), context_.get());
  g_main_context_push_thread_default(context_.get());
}

DBusOperation::~DBusOperation() {
  g_main_context_pop_thread_default(context_.get());
}

gboolean DBusOperation::cancel(gpointer cancellable) {
  g_cancellable_cancel(static_cast<GCancellable*>(cancellable));
  return G_SOURCE_REMOVE;
}

void DBusOperation::keepResult(GObject* /*source*/, GAsyncResult* result, gpointer operation) {
  static_cast<DBusOperation*>(operation)->result_.reset(G_ASYNC_RESULT(g_object_ref(result)));
}

// Always ends: at the deadline what is waited for is cancelled, and then it reports that.
GLibPtr<GAsyncResult> DBusOperation::wait() {
  while (!result_) {
    g_main_context_iteration(context_.get(), TRUE);
  }
  return std::move(result_);
}

std::unique_ptr<DBusLink> DBusOperation::connect(const std::string& address, GLibPtr<GError>& error) {
  const auto flags = static_cast<GDBusConnectionFlags>(G_DBUS_CONNECTION_FLAGS_AUTHENTICATION_CLIENT |
                                                       G_DBUS_CONNECTION_FLAGS_MESSAGE_BUS_CONNECTION);
  g_dbus_connection_new_for_address(address.c_str(), flags, nullptr, cancellable_.get(), &keepResult, this);
  GError* reason = nullptr;
  GLibPtr<GDBusConnection> connection(g_dbus_connection_new_for_address_finish(wait().get(), &reason));
  error.reset(reason);
  return connection ? std::make_unique<DBusLink>(GLibPtr<GMainContext>(g_main_context_ref(context_.get())),
                                                 std::move(connection))
                    : nullptr;
}

GLibPtr<GVariant> DBusOperation::call(const DBusLink& link, const std::string& service, const char* method,
                                      GVariant* parameters, GDBusCallFlags flags, GLibPtr<GError>& error) {
  // The library's own limit is left out: it would end the call alone.
  g_dbus_connection_call(link.connection(), service.c_str(), objectPath(service).c_str(), service.c_str(), method,
                         parameters, nullptr, flags, G_MAXINT, cancellable_.get(), &keepResult, this);
  GError* reason = nullptr;
  GLibPtr<GVariant> answer(g_dbus_connection_call_finish(link.connection(), wait().get(), &reason));
  error.reset(reason);
  return answer;
}

} // namespace lumora::backend
