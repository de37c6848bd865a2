#pragma once

#include "Authority.h"
#include "Authorizations.h"
#include "Service.h"

#include <functional>
#include <memory>
#include <string>

namespace lumora::sandbox {

/// The machine's service org.vantor.lumagentconfigd: hands out authorizations to whom an authority allows it, and has
/// commands performed for who shows his own one.
class Agent {
public:
  /// Performs a command for a caller who may have it, and answers the invocation: at once or later, exactly once.
  using Performer = std::function<void(const AgentCall& call, GDBusMethodInvocation& invocation)>;

  Agent(std::unique_ptr<Authority> authority, Performer performer);

  /// Serves on the system bus until the process is ended; prints the line "ready" as soon as it can be called. Returns
  /// only when it cannot serve: the reason.
  std::string run();

private:
  static void registerObject(GDBusConnection* bus, const gchar* name, gpointer agent);
  static void lose(GDBusConnection* bus, const gchar* name, gpointer agent);
  static void call(GDBusConnection* bus, const gchar* sender, const gchar* path, const gchar* interface,
                   const gchar* method, GVariant* parameters, GDBusMethodInvocation* invocation, gpointer agent);
  static void forgetCaller(GDBusConnection* bus, const gchar* sender, const gchar* path, const gchar* interface,
                           const gchar* signal, GVariant* parameters, gpointer agent);

  void authorize(GDBusConnection& bus, const AgentCall& call, GDBusMethodInvocation& invocation);
  void perform(const AgentCall& call, GDBusMethodInvocation& invocation) const;

  std::unique_ptr<Authority> authority_;
  Performer performer_;
  Authorizations authorizations_;
  GMainLoop* loop_ = nullptr;
  std::string failure_;
};

} // namespace lumora::sandbox
