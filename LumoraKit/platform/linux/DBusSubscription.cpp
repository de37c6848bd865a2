#include <LumoraKit/platform/linux/DBusSubscription.h>

#include <utility>

namespace lumora::backend {
namespace {

void tell(GDBusConnection* /*connection*/, const gchar* /*sender*/, const gchar* /*object*/, const gchar* /*interface*/,
          const gchar* /*signal*/, GVariant* arguments, gpointer handler) {
  (*static_cast<DBusSubscription::Handler*>(handler))(*arguments);
}

} // namespace

DBusSubscription::DBusSubscription(GDBusConnection* connection, const DBusSignal& signal, Handler handler)
    : connection_(G_DBUS_CONNECTION(g_object_ref(connection))), handler_(std::move(handler)),
      id_(g_dbus_connection_signal_subscribe(connection, signal.sender, signal.interface, signal.name, signal.object,
                                             signal.firstArgument, G_DBUS_SIGNAL_FLAGS_NONE, &tell, &handler_,
                                             nullptr)) {}

DBusSubscription::~DBusSubscription() {
  g_dbus_connection_signal_unsubscribe(connection_.get(), id_);
}

} // namespace lumora::backend
