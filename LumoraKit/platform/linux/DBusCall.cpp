#include <LumoraKit/platform/linux/DBusCall.h>

#include <algorithm>
#include <climits>
#include <utility>

namespace lumora::backend {
namespace {

// A bus refuses calls when more answers than it likes are missing: 128 where nothing else is configured.
constexpr std::size_t mostCallsAtOnce = 64;

std::string objectPath(std::string service) {
  std::ranges::replace(service, '.', '/');
  return "/" + service;
}

// The library's own limit is left out: it would end the call alone.
void begin(const DBusLink& link, const DBusMethod& method, GVariant* parameters, GDBusCallFlags flags,
           GCancellable* cancellable, GAsyncReadyCallback told, gpointer data) {
  g_dbus_connection_call(link.connection(), method.service.c_str(), method.path.c_str(), method.interface.c_str(),
                         method.name.c_str(), parameters, nullptr, flags, G_MAXINT, cancellable, told, data);
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
GLibPtr<GAsyncResult> DBusOperation::result(const Beginning& begin) {
  begin(cancellable_.get(), &keepResult, this);
  while (!result_) {
    g_main_context_iteration(context_.get(), TRUE);
  }
  return std::move(result_);
}

std::unique_ptr<DBusLink> DBusOperation::connect(const std::string& address, GLibPtr<GError>& error) {
  const auto flags = static_cast<GDBusConnectionFlags>(G_DBUS_CONNECTION_FLAGS_AUTHENTICATION_CLIENT |
                                                       G_DBUS_CONNECTION_FLAGS_MESSAGE_BUS_CONNECTION);
  const auto connected = result([&](GCancellable* cancellable, GAsyncReadyCallback told, gpointer data) {
    g_dbus_connection_new_for_address(address.c_str(), flags, nullptr, cancellable, told, data);
  });
  GError* reason = nullptr;
  GLibPtr<GDBusConnection> connection(g_dbus_connection_new_for_address_finish(connected.get(), &reason));
  error.reset(reason);
  return connection ? std::make_unique<DBusLink>(GLibPtr<GMainContext>(g_main_context_ref(context_.get())),
                                                 std::move(connection))
                    : nullptr;
}

GLibPtr<GVariant> DBusOperation::call(const DBusLink& link, const std::string& service, const char* method,
                                      GVariant* parameters, GDBusCallFlags flags, GLibPtr<GError>& error) {
  return call(link, {service, objectPath(service), service, method}, parameters, flags, error);
}

GLibPtr<GVariant> DBusOperation::call(const DBusLink& link, const DBusMethod& method, GVariant* parameters,
                                      GDBusCallFlags flags, GLibPtr<GError>& error) {
  const auto answered = result([&](GCancellable* cancellable, GAsyncReadyCallback told, gpointer data) {
    begin(link, method, parameters, flags, cancellable, told, data);
  });
  GError* reason = nullptr;
  GLibPtr<GVariant> answer(g_dbus_connection_call_finish(link.connection(), answered.get(), &reason));
  error.reset(reason);
  return answer;
}

std::vector<GLibPtr<GVariant>> DBusOperation::callEach(const DBusLink& link, const std::vector<DBusMethod>& methods,
                                                       GVariant* parameters) {
  struct Answers {
    std::size_t missing = 0;
    std::vector<GLibPtr<GVariant>> values;
  } answers{0, std::vector<GLibPtr<GVariant>>(methods.size())};
  struct Place {
    Answers& answers;
    GLibPtr<GVariant>& value;
  };
  const auto keep = [](GObject* connection, GAsyncResult* answered, gpointer data) {
    const std::unique_ptr<Place> place(static_cast<Place*>(data));
    place->value.reset(g_dbus_connection_call_finish(G_DBUS_CONNECTION(connection), answered, nullptr));
    --place->answers.missing;
  };
  const GLibPtr<GVariant> shared(g_variant_ref_sink(parameters));
  for (std::size_t i = 0; i < methods.size() || answers.missing > 0;) {
    if (i < methods.size() && answers.missing < mostCallsAtOnce) {
      ++answers.missing;
      begin(link, methods[i], shared.get(), G_DBUS_CALL_FLAGS_NONE, cancellable_.get(), keep,
            new Place{answers, answers.values[i]});
      ++i;
    } else {
      g_main_context_iteration(context_.get(), TRUE);
    }
  }
  return std::move(answers.values);
}

bool DBusOperation::waitUntil(const std::function<bool()>& condition, std::chrono::milliseconds limit) {
  const gint64 beginning = g_get_monotonic_time();
  const gint64 due = g_source_get_ready_time(deadline_.get());
  g_source_set_ready_time(deadline_.get(), -1);
  bool isOver = false;
  const GLibPtr<GSource> end(g_timeout_source_new(static_cast<guint>(limit.count())));
  const auto note = [](gpointer over) {
    *static_cast<bool*>(over) = true;
    return static_cast<gboolean>(G_SOURCE_REMOVE);
  };
  g_source_set_callback(end.get(), note, &isOver, nullptr);
  g_source_attach(end.get(), context_.get());
  while (!condition() && !isOver) {
    g_main_context_iteration(context_.get(), TRUE);
  }
  g_source_set_ready_time(deadline_.get(), due + g_get_monotonic_time() - beginning);
  return condition();
}

} // namespace lumora::backend
