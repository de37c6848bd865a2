#include "Agent.h"

#include <LumoraKit/platform/linux/GLibPtr.h>

#include <iostream>

namespace lumora::sandbox {

using backend::GLibPtr;

Agent::Agent(std::unique_ptr<Authority> authority, Performer performer)
    : authority_(std::move(authority)), performer_(std::move(performer)) {}

std::string Agent::run() {
  const GLibPtr<GMainLoop> loop(g_main_loop_new(nullptr, FALSE));
  loop_ = loop.get();
  const guint owned = g_bus_own_name(
      G_BUS_TYPE_SYSTEM, agentName, G_BUS_NAME_OWNER_FLAGS_DO_NOT_QUEUE, &registerObject,
      [](GDBusConnection*, const gchar*, gpointer) { std::cout << "ready" << std::endl; }, &lose, this, nullptr);
  g_main_loop_run(loop_);
  g_bus_unown_name(owned);
  return failure_;
}

void Agent::registerObject(GDBusConnection* bus, const gchar* /*name*/, gpointer agent) {
  static const GDBusInterfaceVTable functions{&call, nullptr, nullptr, {}};
  g_dbus_connection_register_object(bus, agentPath, agentInterface(), &functions, agent, nullptr, nullptr);
  g_dbus_connection_signal_subscribe(bus, "org.freedesktop.DBus", "org.freedesktop.DBus", "NameOwnerChanged",
                                     "/org/freedesktop/DBus", nullptr, G_DBUS_SIGNAL_FLAGS_NONE, &forgetCaller, agent,
                                     nullptr);
}

void Agent::lose(GDBusConnection* bus, const gchar* name, gpointer agent) {
  auto& self = *static_cast<Agent*>(agent);
  self.failure_ = bus == nullptr ? "the system bus cannot be reached"
                                 : std::string("the bus does not give the name ") + name +
                                       ": another agent has it, or the bus's policy keeps it for another user";
  g_main_loop_quit(self.loop_);
}

void Agent::forgetCaller(GDBusConnection* /*bus*/, const gchar* /*sender*/, const gchar* /*path*/,
                         const gchar* /*interface*/, const gchar* /*signal*/, GVariant* parameters, gpointer agent) {
  const gchar* name = nullptr;
  const gchar* newOwner = nullptr;
  g_variant_get(parameters, "(&s&s&s)", &name, nullptr, &newOwner);
  if (*newOwner == '\0') {
    static_cast<Agent*>(agent)->authorizations_.forget(name);
  }
}

void Agent::call(GDBusConnection* bus, const gchar* /*sender*/, const gchar* /*path*/, const gchar* /*interface*/,
                 const gchar* /*method*/, GVariant* /*parameters*/, GDBusMethodInvocation* invocation, gpointer agent) {
  auto& self = *static_cast<Agent*>(agent);
  const AgentCall call = agentCall(*invocation);
  if (call.method == "Authorize") {
    self.authorize(*bus, call, *invocation);
  } else {
    self.perform(call, *invocation);
  }
}

void Agent::authorize(GDBusConnection& bus, const AgentCall& call, GDBusMethodInvocation& invocation) {
  if (call.subject != configureOperation) {
    return replyError(invocation, invalidArgumentsError, "there is no such operation");
  }
  authority_->check(bus, call.caller, call.subject, call.mayAskTheUser,
                    [this, caller = call.caller, &invocation](const std::optional<std::string>& refusal) {
                      if (refusal) {
                        return replyError(invocation, accessDeniedError, *refusal);
                      }
                      replyBytes(invocation, authorizations_.give(caller));
                    });
}

void Agent::perform(const AgentCall& call, GDBusMethodInvocation& invocation) const {
  if (!authorizations_.isGoodFor(call.caller, call.authorization)) {
    return replyError(invocation, accessDeniedError, "not your authorization");
  }
  std::cout << call.subject << std::endl;
  performer_(call, invocation);
}

} // namespace lumora::sandbox
