#include "ScriptedService.h"

#include <LumoraKit/platform/linux/GLibPtr.h>

#include <gio/gio.h>

#include <cstdlib>
#include <iostream>

namespace lumora::tests {
namespace {

using backend::GLibPtr;

constexpr const char* item = "/org/freedesktop/secrets/collection/one/1";
constexpr const char* prompt = "/org/freedesktop/secrets/prompt/1";

constexpr const char* interfaces = R"xml(<node>
  <interface name="org.freedesktop.Secret.Service">
    <method name="OpenSession">
      <arg type="s" direction="in"/><arg type="v" direction="in"/>
      <arg type="v" direction="out"/><arg type="o" direction="out"/>
    </method>
    <method name="ReadAlias"><arg type="s" direction="in"/><arg type="o" direction="out"/></method>
    <method name="SearchItems">
      <arg type="a{ss}" direction="in"/><arg type="ao" direction="out"/><arg type="ao" direction="out"/>
    </method>
    <method name="Unlock">
      <arg type="ao" direction="in"/><arg type="ao" direction="out"/><arg type="o" direction="out"/>
    </method>
  </interface>
  <interface name="org.freedesktop.Secret.Item">
    <method name="GetSecret"><arg type="o" direction="in"/><arg type="(oayays)" direction="out"/></method>
  </interface>
  <interface name="org.freedesktop.Secret.Prompt">
    <method name="Prompt"><arg type="s" direction="in"/></method>
    <signal name="Completed"><arg type="b"/><arg type="v"/></signal>
  </interface>
</node>)xml";

// The script, and whether the user agreed.
struct Service {
  std::string script;
  bool isUnlocked = false;
};

GVariant* answerOf(const Service& service, const std::string& method) {
  if (method == "ReadAlias") {
    return g_variant_new("(o)", "/org/freedesktop/secrets/collection/one");
  }
  if (method == "SearchItems") {
    const char* const unlocked[] = {item, nullptr};
    const char* const none[] = {nullptr};
    return service.isUnlocked ? g_variant_new("(^ao^ao)", unlocked, none) : g_variant_new("(^ao^ao)", none, unlocked);
  }
  if (method == "Unlock") {
    const char* const none[] = {nullptr};
    return g_variant_new("(^aoo)", none, prompt);
  }
  return method == "GetSecret"
             ? g_variant_new_parsed(
                   "((objectpath '/session', @ay [], @ay [0x61, 0x70, 0x70, 0x6c, 0x65], 'text/plain'),)")
             : g_variant_new("()");
}

void answerPrompt(Service& service, GDBusConnection* connection) {
  if (service.script == "die") {
    g_dbus_connection_flush_sync(connection, nullptr, nullptr);
    std::_Exit(EXIT_SUCCESS);
  }
  if (service.script == "hang") {
    return;
  }
  service.isUnlocked = service.script == "agree";
  g_dbus_connection_emit_signal(connection, nullptr, prompt, "org.freedesktop.Secret.Prompt", "Completed",
                                g_variant_new("(bv)", service.isUnlocked ? FALSE : TRUE, g_variant_new_string("")),
                                nullptr);
}

void answer(GDBusConnection* connection, const gchar*, const gchar*, const gchar*, const gchar* method,
            GVariant* parameters, GDBusMethodInvocation* invocation, gpointer data) {
  auto& service = *static_cast<Service*>(data);
  const std::string name = method;
  if (name == "OpenSession") {
    const char* algorithm = nullptr;
    g_variant_get_child(parameters, 0, "&s", &algorithm);
    if (std::string(algorithm) != "plain") {
      g_dbus_method_invocation_return_error_literal(invocation, G_DBUS_ERROR, G_DBUS_ERROR_NOT_SUPPORTED, "plain only");
    } else {
      g_dbus_method_invocation_return_value(invocation, g_variant_new("(vo)", g_variant_new_string(""), "/session"));
    }
    return;
  }
  g_dbus_method_invocation_return_value(invocation, answerOf(service, name));
  if (name == "Prompt") {
    answerPrompt(service, connection);
  }
}

// Whatever is asked: a number.
GDBusMessage* answerNonsense(GDBusConnection* connection, GDBusMessage* message, gboolean isIncoming, gpointer) {
  const bool isCall = g_dbus_message_get_message_type(message) == G_DBUS_MESSAGE_TYPE_METHOD_CALL;
  if (isIncoming == FALSE || !isCall) {
    return message;
  }
  const GLibPtr<GDBusMessage> reply(g_dbus_message_new_method_reply(message));
  g_dbus_message_set_body(reply.get(), g_variant_new("(u)", 7U));
  g_dbus_connection_send_message(connection, reply.get(), G_DBUS_SEND_MESSAGE_FLAGS_NONE, nullptr, nullptr);
  g_object_unref(message);
  return nullptr;
}

void serve(GDBusConnection* connection, Service& service) {
  const GDBusInterfaceVTable table{&answer, nullptr, nullptr, {}};
  GDBusNodeInfo* const node = g_dbus_node_info_new_for_xml(interfaces, nullptr);
  const char* const paths[] = {"/org/freedesktop/secrets", item, prompt};
  for (int i = 0; i < 3; ++i) {
    g_dbus_connection_register_object(connection, paths[i], node->interfaces[i], &table, &service, nullptr, nullptr);
  }
  g_dbus_node_info_unref(node);
}

void nameAcquired(GDBusConnection*, const gchar*, gpointer) {
  std::cout << "ready" << std::endl;
}

} // namespace

int runScriptedService(const std::vector<std::string>& arguments) {
  Service service{arguments.at(1)};
  const GLibPtr<GMainLoop> loop(g_main_loop_new(nullptr, FALSE));
  const GLibPtr<GDBusConnection> connection(g_bus_get_sync(G_BUS_TYPE_SESSION, nullptr, nullptr));
  if (!connection) {
    return EXIT_FAILURE;
  }
  serve(connection.get(), service);
  g_bus_own_name_on_connection(connection.get(), "org.freedesktop.secrets", G_BUS_NAME_OWNER_FLAGS_NONE, &nameAcquired,
                               nullptr, nullptr, nullptr);
  if (service.script == "nonsense") {
    g_dbus_connection_add_filter(connection.get(), &answerNonsense, nullptr, nullptr);
  }
  g_main_loop_run(loop.get());
  return EXIT_SUCCESS;
}

} // namespace lumora::tests
