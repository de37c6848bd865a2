#include "Agent.h"

#include "sandbox/agent/Agent.h"

#include <LumoraKit/platform/PropertyList.h>
#include <LumoraKit/platform/linux/GLibPtr.h>

#include <cstdlib>

#include <unistd.h>

namespace lumora::tests {
namespace {

using backend::GLibPtr;
using sandbox::replyText;

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

void perform(const sandbox::AgentCall& call, GDBusMethodInvocation& invocation) {
  const std::string& command = call.subject;
  if (command == "echo") {
    replyText(invocation, call.request);
  } else if (command == "setconfig") {
    const Dictionary output{{"changed", firstArgument(call.request)}};
    replyDictionary(invocation, {{"terminationStatus", 0}, {"standardOutput", xmlDescription(output).value()}});
  } else if (command == "bind") {
    replyDictionary(invocation, {{"terminationStatus", 35}, {"standardError", "the camera is taken"}});
  } else if (command == "crash") {
    _exit(EXIT_FAILURE);
  } else if (command == "fail") {
    sandbox::replyError(invocation, "org.vantor.lumagentconfigd.Failed", "disk on fire");
  } else if (command == "garbage") {
    replyText(invocation, "no property list");
  } else if (command == "array") {
    replyText(invocation, xmlDescription(Array{1, 2}).value());
  } else if (command == "number") {
    replyNumber(invocation);
  }
}

} // namespace

int runAgent() {
  sandbox::Agent agent(sandbox::ownerAuthority(), &perform);
  agent.run();
  return EXIT_FAILURE;
}

} // namespace lumora::tests
