#include "Service.h"

#include <LumoraKit/platform/linux/GLibPtr.h>

namespace lumora::sandbox {

namespace {

using backend::GLibPtr;

constexpr const char* interfaceDescription = R"(<node><interface name="org.vantor.lumagentconfigd">
  <method name="Authorize">
    <arg name="operation" type="s" direction="in"/><arg name="authorization" type="ay" direction="out"/>
  </method>
  <method name="PerformCommand">
    <arg name="command" type="s" direction="in"/><arg name="authorization" type="ay" direction="in"/>
    <arg name="request" type="s" direction="in"/><arg name="reply" type="s" direction="out"/>
  </method>
</interface></node>)";

std::string textAt(GVariant& parameters, gsize index) {
  const GLibPtr<GVariant> child(g_variant_get_child_value(&parameters, index));
  gsize length = 0;
  const gchar* const text = g_variant_get_string(child.get(), &length);
  return {text, length};
}

std::string bytesAt(GVariant& parameters, gsize index) {
  const GLibPtr<GVariant> child(g_variant_get_child_value(&parameters, index));
  gsize length = 0;
  const auto* const bytes = static_cast<const char*>(g_variant_get_fixed_array(child.get(), &length, 1));
  return {bytes, length};
}

} // namespace

AgentCall agentCall(GDBusMethodInvocation& invocation) {
  GVariant& parameters = *g_dbus_method_invocation_get_parameters(&invocation);
  const auto flags = g_dbus_message_get_flags(g_dbus_method_invocation_get_message(&invocation));
  AgentCall call{g_dbus_method_invocation_get_sender(&invocation),
                 g_dbus_method_invocation_get_method_name(&invocation),
                 textAt(parameters, 0),
                 {},
                 {},
                 (flags & G_DBUS_MESSAGE_FLAGS_ALLOW_INTERACTIVE_AUTHORIZATION) != 0};
  if (g_variant_n_children(&parameters) == 3) {
    call.authorization = bytesAt(parameters, 1);
    call.request = textAt(parameters, 2);
  }
  return call;
}

GDBusInterfaceInfo* agentInterface() {
  static GDBusNodeInfo* const node = g_dbus_node_info_new_for_xml(interfaceDescription, nullptr);
  return node->interfaces[0];
}

void replyText(GDBusMethodInvocation& invocation, const std::string& text) {
  g_dbus_method_invocation_return_value(&invocation, g_variant_new("(s)", text.c_str()));
}

void replyBytes(GDBusMethodInvocation& invocation, const std::string& bytes) {
  GVariant* const array = g_variant_new_fixed_array(G_VARIANT_TYPE_BYTE, bytes.data(), bytes.size(), 1);
  g_dbus_method_invocation_return_value(&invocation, g_variant_new("(@ay)", array));
}

void replyError(GDBusMethodInvocation& invocation, const char* error, const std::string& reason) {
  g_dbus_method_invocation_return_dbus_error(&invocation, error, reason.c_str());
}

} // namespace lumora::sandbox
