#include "Agent.h"

#include <LumoraKit/platform/PropertyList.h>
#include <LumoraKit/platform/linux/GLibPtr.h>

#include <algorithm>
#include <cstdlib>
#include <iostream>
#include <map>
#include <random>

#include <unistd.h>

namespace lumora::tests {
namespace {

using backend::GLibPtr;

constexpr const char* name = "org.vantor.lumagentconfigd";
constexpr const char* accessDenied = "org.freedesktop.DBus.Error.AccessDenied";

constexpr const char* interfaceDescription = R"(<node><interface name="org.vantor.lumagentconfigd">
  <method name="Authorize">
    <arg name="operation" type="s" direction="in"/><arg name="authorization" type="ay" direction="out"/>
  </method>
  <method name="PerformCommand">
    <arg name="command" type="s" direction="in"/><arg name="authorization" type="ay" direction="in"/>
    <arg name="request" type="s" direction="in"/><arg name="reply" type="s" direction="out"/>
  </method>
</interface></node>)";

class Agent {
public:
  explicit Agent(bool trustsEveryone) : trustsEveryone_(trustsEveryone) {}

  int run();

private:
  static void registerObject(GDBusConnection* connection, const gchar*, gpointer agent);
  static void call(GDBusConnection*, const gchar* sender, const gchar*, const gchar*, const gchar* method,
                   GVariant* parameters, GDBusMethodInvocation* invocation, gpointer agent);

  void authorize(GDBusMethodInvocation& invocation, const std::string& sender, const std::string& operation);
  void perform(GDBusMethodInvocation& invocation, const std::string& command, const std::string& request) const;
  bool isAllowed(const std::string& sender, const std::string& operation) const;

  const bool trustsEveryone_;
  GDBusConnection* connection_ = nullptr;
  /// Each authorization with the connection that it belongs to.
  std::map<std::string, std::string> owners_;
};

std::string randomBytes() {
  std::random_device source;
  std::string bytes(32, '\0');
  std::ranges::generate(bytes, [&source] { return static_cast<char>(source()); });
  return bytes;
}

GVariant* bytesVariant(const std::string& bytes) {
  return g_variant_new_fixed_array(G_VARIANT_TYPE_BYTE, bytes.data(), bytes.size(), 1);
}

void replyText(GDBusMethodInvocation& invocation, const std::string& text) {
  g_dbus_method_invocation_return_value(&invocation, g_variant_new("(s)", text.c_str()));
}

void replyDictionary(GDBusMethodInvocation& invocation, const Dictionary& reply) {
  replyText(invocation, xmlDescription(reply).value());
}

// Past the library, which would not let a reply of another type go.
void replyNumber(GDBusMethodInvocation& invocation) {
  const GLibPtr<GDBusMessage> reply(g_dbus_message_new_method_reply(g_dbus_method_invocation_get_message(&invocation)));
  g_dbus_message_set_body(reply.get(), g_variant_new("(u)", 42U));
  g_dbus_connection_send_message(g_dbus_method_invocation_get_connection(&invocation), reply.get(),
                                 G_DBUS_SEND_MESSAGE_FLAGS_NONE, nullptr, nullptr);
  g_object_unref(&invocation);
}

std::string firstArgument(const std::string& request) {
  const auto dictionary = dictionaryWithXMLDescription(request).value();
  return *dictionary.array("subarguments")->at(0).string();
}

int Agent::run() {
  const GLibPtr<GMainLoop> loop(g_main_loop_new(nullptr, FALSE));
  g_bus_own_name(
      G_BUS_TYPE_SYSTEM, name, G_BUS_NAME_OWNER_FLAGS_NONE, &registerObject,
      [](GDBusConnection*, const gchar*, gpointer) { std::cout << "ready" << std::endl; },
      [](GDBusConnection*, const gchar*, gpointer) { _exit(EXIT_FAILURE); }, this, nullptr);
  g_main_loop_run(loop.get());
  return EXIT_SUCCESS;
}

void Agent::registerObject(GDBusConnection* connection, const gchar*, gpointer agent) {
  static const GDBusInterfaceVTable functions{&call, nullptr, nullptr, {}};
  GDBusNodeInfo* const node = g_dbus_node_info_new_for_xml(interfaceDescription, nullptr);
  static_cast<Agent*>(agent)->connection_ = connection;
  g_dbus_connection_register_object(connection, "/org/vantor/lumagentconfigd", node->interfaces[0], &functions, agent,
                                    nullptr, nullptr);
}

void Agent::call(GDBusConnection*, const gchar* sender, const gchar*, const gchar*, const gchar* method,
                 GVariant* parameters, GDBusMethodInvocation* invocation, gpointer agent) {
  auto& self = *static_cast<Agent*>(agent);
  const gchar* text = nullptr;
  if (std::string(method) == "Authorize") {
    g_variant_get(parameters, "(&s)", &text);
    return self.authorize(*invocation, sender, text);
  }
  GVariant* authorization = nullptr;
  const gchar* request = nullptr;
  g_variant_get(parameters, "(&s@ay&s)", &text, &authorization, &request);
  const GLibPtr<GVariant> owned(authorization);
  gsize length = 0;
  const auto* const bytes = static_cast<const char*>(g_variant_get_fixed_array(authorization, &length, 1));
  const auto found = self.owners_.find(std::string(bytes, length));
  if (found == self.owners_.end() || found->second != sender) {
    return g_dbus_method_invocation_return_dbus_error(invocation, accessDenied, "not your authorization");
  }
  self.perform(*invocation, text, request);
}

void Agent::authorize(GDBusMethodInvocation& invocation, const std::string& sender, const std::string& operation) {
  if (!trustsEveryone_ && !isAllowed(sender, operation)) {
    return g_dbus_method_invocation_return_dbus_error(&invocation, accessDenied, "polkit says no");
  }
  const auto bytes = randomBytes();
  owners_[bytes] = sender;
  g_dbus_method_invocation_return_value(&invocation, g_variant_new("(@ay)", bytesVariant(bytes)));
}

// The caller is named by its connection, which nobody else can take over.
bool Agent::isAllowed(const std::string& sender, const std::string& operation) const {
  GVariantBuilder subject;
  g_variant_builder_init(&subject, G_VARIANT_TYPE("a{sv}"));
  g_variant_builder_add(&subject, "{sv}", "name", g_variant_new_string(sender.c_str()));
  GError* error = nullptr;
  const GLibPtr<GVariant> answer(
      g_dbus_connection_call_sync(connection_, "org.freedesktop.PolicyKit1", "/org/freedesktop/PolicyKit1/Authority",
                                  "org.freedesktop.PolicyKit1.Authority", "CheckAuthorization",
                                  g_variant_new("((sa{sv})s@a{ss}us)", "system-bus-name", &subject, operation.c_str(),
                                                g_variant_new_array(G_VARIANT_TYPE("{ss}"), nullptr, 0), 0U, ""),
                                  G_VARIANT_TYPE("((bba{ss}))"), G_DBUS_CALL_FLAGS_NONE, G_MAXINT, nullptr, &error));
  const GLibPtr<GError> reason(error);
  if (!answer) {
    std::cerr << "polkit: " << reason->message << '\n';
    return false;
  }
  gboolean isAuthorized = FALSE;
  g_variant_get(answer.get(), "((bba{ss}))", &isAuthorized, nullptr, nullptr);
  return isAuthorized != FALSE;
}

void Agent::perform(GDBusMethodInvocation& invocation, const std::string& command, const std::string& request) const {
  std::cout << command << std::endl;
  if (command == "echo") {
    replyText(invocation, request);
  } else if (command == "setconfig") {
    const Dictionary output{{"changed", firstArgument(request)}};
    replyDictionary(invocation, {{"terminationStatus", 0}, {"standardOutput", xmlDescription(output).value()}});
  } else if (command == "bind") {
    replyDictionary(invocation, {{"terminationStatus", 35}, {"standardError", "the camera is taken"}});
  } else if (command == "crash") {
    _exit(EXIT_FAILURE);
  } else if (command == "fail") {
    g_dbus_method_invocation_return_dbus_error(&invocation, "org.vantor.lumagentconfigd.Failed", "disk on fire");
  } else if (command == "garbage") {
    replyText(invocation, "no property list");
  } else if (command == "array") {
    replyText(invocation, xmlDescription(Array{1, 2}).value());
  } else if (command == "number") {
    replyNumber(invocation);
  }
}

} // namespace

int runAgent(const std::vector<std::string>& arguments) {
  Agent agent(std::ranges::count(arguments, "--trust-everyone") > 0);
  return agent.run();
}

} // namespace lumora::tests
