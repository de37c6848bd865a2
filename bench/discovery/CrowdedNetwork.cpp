#include "CrowdedNetwork.h"

#include <string_view>

namespace lumora::bench {
namespace {

constexpr const char* daemonName = "org.freedesktop.Avahi";
constexpr const char* browserPath = "/browser";
constexpr const char* browserInterface = "org.freedesktop.Avahi.ServiceBrowser";
constexpr int places = 5;

// As much of the daemon's interfaces as a search calls.
constexpr const char* interfaces = R"(<node>
  <interface name="org.freedesktop.Avahi.Server2">
    <method name="ServiceBrowserPrepare">
      <arg type="i" direction="in"/><arg type="i" direction="in"/><arg type="s" direction="in"/>
      <arg type="s" direction="in"/><arg type="u" direction="in"/><arg type="o" direction="out"/>
    </method>
  </interface>
  <interface name="org.freedesktop.Avahi.ServiceBrowser">
    <method name="Start"/>
    <method name="Free"/>
  </interface>
</node>)";

} // namespace

CrowdedNetwork::CrowdedNetwork(const std::string& address)
    : bus_(g_dbus_connection_new_for_address_sync(
          address.c_str(),
          static_cast<GDBusConnectionFlags>(G_DBUS_CONNECTION_FLAGS_AUTHENTICATION_CLIENT |
                                            G_DBUS_CONNECTION_FLAGS_MESSAGE_BUS_CONNECTION),
          nullptr, nullptr, nullptr)),
      name_(g_bus_own_name_on_connection(bus_.get(), daemonName, G_BUS_NAME_OWNER_FLAGS_NONE, nullptr, nullptr, nullptr,
                                         nullptr)) {
  serve("/");
  serve(browserPath);
}

CrowdedNetwork::~CrowdedNetwork() {
  g_bus_unown_name(name_);
}

void CrowdedNetwork::serve(const char* path) {
  static const GDBusInterfaceVTable functions{&called, nullptr, nullptr, {}};
  static GDBusNodeInfo* const description = g_dbus_node_info_new_for_xml(interfaces, nullptr);
  for (GDBusInterfaceInfo** interface = description->interfaces; *interface != nullptr; ++interface) {
    g_dbus_connection_register_object(bus_.get(), path, *interface, &functions, this, nullptr, nullptr);
  }
}

void CrowdedNetwork::called(GDBusConnection* /*bus*/, const gchar* /*sender*/, const gchar* /*path*/,
                            const gchar* /*interface*/, const gchar* method, GVariant* /*parameters*/,
                            GDBusMethodInvocation* invocation, gpointer self) {
  if (std::string_view(method) == "Start") {
    ++static_cast<CrowdedNetwork*>(self)->searches_;
  }
  const bool namesBrowser = std::string_view(method) == "ServiceBrowserPrepare";
  g_dbus_method_invocation_return_value(invocation, namesBrowser ? g_variant_new("(o)", browserPath) : nullptr);
}

void CrowdedNetwork::tellOf(const char* signal, int count) const {
  for (int service = 0; service < count; ++service) {
    const std::string name = "Studio " + std::to_string(service);
    for (int place = 0; place < places; ++place) {
      g_dbus_connection_emit_signal(bus_.get(), nullptr, browserPath, browserInterface, signal,
                                    g_variant_new("(iisssu)", place, 0, name.c_str(), "_lumora._tcp", "local", 0U),
                                    nullptr);
    }
  }
}

} // namespace lumora::bench
