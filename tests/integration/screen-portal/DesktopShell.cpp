#include "DesktopShell.h"

#include <LumoraKit/platform/linux/GLibPtr.h>

#include <cstdio>
#include <cstdlib>
#include <map>
#include <set>

namespace lumora::tests {
namespace {

using backend::GLibPtr;

constexpr const char* interfaces = R"(<node>
  <interface name="org.freedesktop.impl.portal.ScreenCast">
    <method name="CreateSession">
      <arg type="o" direction="in"/><arg type="o" direction="in"/><arg type="s" direction="in"/>
      <arg type="a{sv}" direction="in"/><arg type="u" direction="out"/><arg type="a{sv}" direction="out"/>
    </method>
    <method name="SelectSources">
      <arg type="o" direction="in"/><arg type="o" direction="in"/><arg type="s" direction="in"/>
      <arg type="a{sv}" direction="in"/><arg type="u" direction="out"/><arg type="a{sv}" direction="out"/>
    </method>
    <method name="Start">
      <arg type="o" direction="in"/><arg type="o" direction="in"/><arg type="s" direction="in"/>
      <arg type="s" direction="in"/><arg type="a{sv}" direction="in"/>
      <arg type="u" direction="out"/><arg type="a{sv}" direction="out"/>
    </method>
    <property name="AvailableSourceTypes" type="u" access="read"/>
    <property name="AvailableCursorModes" type="u" access="read"/>
    <property name="version" type="u" access="read"/>
  </interface>
  <interface name="org.freedesktop.impl.portal.Session">
    <method name="Close"/>
    <signal name="Closed"/>
    <property name="version" type="u" access="read"/>
  </interface>
  <interface name="org.freedesktop.impl.portal.Request">
    <method name="Close"/>
  </interface>
</node>)";

constexpr std::uint32_t success = 0;
constexpr std::uint32_t refused = 1;
constexpr std::uint32_t cancelled = 2;

void tell(const std::string& line) {
  std::puts(line.c_str());
  std::fflush(stdout);
}

GVariant* emptyResults() {
  return g_variant_new("a{sv}", nullptr);
}

void answer(GDBusMethodInvocation* invocation, std::uint32_t code, GVariant* results) {
  g_dbus_method_invocation_return_value(invocation, g_variant_new("(u@a{sv})", code, results));
}

std::uint32_t number(GVariant* dictionary, const char* key) {
  std::uint32_t value = 0;
  g_variant_lookup(dictionary, key, "u", &value);
  return value;
}

class DesktopShell {
public:
  explicit DesktopShell(std::uint32_t node)
      : node_(node), information_(g_dbus_node_info_new_for_xml(interfaces, nullptr)) {}
  DesktopShell(const DesktopShell&) = delete;
  DesktopShell& operator=(const DesktopShell&) = delete;
  ~DesktopShell() { g_dbus_node_info_unref(information_); }

  void serve();

private:
  // A dialog that is open.
  struct Dialog {
    GDBusMethodInvocation* invocation = nullptr;
    std::string session;
    guint request = 0;
  };
  struct Session {
    guint object = 0;
    std::uint32_t persistMode = 0;
    bool isRestored = false;
  };

  guint serveObject(const char* path, const char* interface);
  void obey(const std::string& order);
  void called(const std::string& object, const std::string& interface, const std::string& method, GVariant* parameters,
              GDBusMethodInvocation* invocation);
  void createSession(const std::string& path, GDBusMethodInvocation* invocation);
  void selectSources(const std::string& path, GVariant* parameters, GDBusMethodInvocation* invocation);
  void start(const char* request, const std::string& path, GDBusMethodInvocation* invocation);
  void closeRequest(const std::string& path, GDBusMethodInvocation* invocation);
  void closeSession(const std::string& path);
  void endSessions();
  void answerDialogs();
  void answerDialog(const Dialog& dialog, const std::string& how);
  GVariant* stream(const Session& session) const;

  const std::uint32_t node_;
  GDBusNodeInfo* const information_;
  GLibPtr<GDBusConnection> connection_;
  std::string mode_ = "allow";
  std::map<std::string, Session> sessions_;
  std::map<std::string, Dialog> dialogs_;
};

void DesktopShell::serve() {
  connection_.reset(g_bus_get_sync(G_BUS_TYPE_SESSION, nullptr, nullptr));
  serveObject("/org/freedesktop/portal/desktop", "org.freedesktop.impl.portal.ScreenCast");
  g_bus_own_name_on_connection(
      connection_.get(), desktopShellName, G_BUS_NAME_OWNER_FLAGS_NONE,
      [](GDBusConnection*, const gchar*, gpointer) { tell("ready"); }, nullptr, nullptr, nullptr);
  GIOChannel* const orders = g_io_channel_unix_new(fileno(stdin));
  g_io_add_watch(
      orders, static_cast<GIOCondition>(G_IO_IN | G_IO_HUP),
      [](GIOChannel* channel, GIOCondition, gpointer self) -> gboolean {
        gchar* line = nullptr;
        if (g_io_channel_read_line(channel, &line, nullptr, nullptr, nullptr) != G_IO_STATUS_NORMAL) {
          std::_Exit(EXIT_SUCCESS);
        }
        static_cast<DesktopShell*>(self)->obey(g_strstrip(line));
        g_free(line);
        return G_SOURCE_CONTINUE;
      },
      this);
  const GLibPtr<GMainLoop> loop(g_main_loop_new(nullptr, FALSE));
  g_main_loop_run(loop.get());
}

guint DesktopShell::serveObject(const char* path, const char* interface) {
  static const GDBusInterfaceVTable table{
      [](GDBusConnection*, const gchar*, const gchar* object, const gchar* ofInterface, const gchar* method,
         GVariant* parameters, GDBusMethodInvocation* invocation, gpointer self) {
        static_cast<DesktopShell*>(self)->called(object, ofInterface, method, parameters, invocation);
      },
      [](GDBusConnection*, const gchar*, const gchar*, const gchar*, const gchar* property, GError**, gpointer) {
        constexpr std::uint32_t everyKind = 7;
        constexpr std::uint32_t version = 4;
        return g_variant_new_uint32(std::string(property) == "version" ? version : everyKind);
      },
      nullptr,
      {}};
  return g_dbus_connection_register_object(connection_.get(), path,
                                           g_dbus_node_info_lookup_interface(information_, interface), &table, this,
                                           nullptr, nullptr);
}

void DesktopShell::obey(const std::string& order) {
  if (order == "end") {
    endSessions();
  } else {
    mode_ = order;
    answerDialogs();
  }
  tell("ok");
}

void DesktopShell::called(const std::string& object, const std::string& interface, const std::string& method,
                          GVariant* parameters, GDBusMethodInvocation* invocation) {
  if (interface == "org.freedesktop.impl.portal.Request") {
    closeRequest(object, invocation);
    return;
  }
  if (interface == "org.freedesktop.impl.portal.Session") {
    closeSession(object);
    g_dbus_method_invocation_return_value(invocation, nullptr);
    return;
  }
  const char* request = nullptr;
  const char* session = nullptr;
  g_variant_get_child(parameters, 0, "&o", &request);
  g_variant_get_child(parameters, 1, "&o", &session);
  if (method == "Start") {
    start(request, session, invocation);
  } else if (mode_ == "hang") {
    tell("hanging");
    g_object_unref(invocation);
  } else if (method == "CreateSession") {
    createSession(session, invocation);
  } else {
    selectSources(session, parameters, invocation);
  }
}

void DesktopShell::createSession(const std::string& path, GDBusMethodInvocation* invocation) {
  sessions_[path] = {serveObject(path.c_str(), "org.freedesktop.impl.portal.Session"), 0, false};
  answer(invocation, success, emptyResults());
}

void DesktopShell::selectSources(const std::string& path, GVariant* parameters, GDBusMethodInvocation* invocation) {
  const GLibPtr<GVariant> options(g_variant_get_child_value(parameters, 3));
  Session& session = sessions_[path];
  session.persistMode = number(options.get(), "persist_mode");
  session.isRestored = GLibPtr<GVariant>(g_variant_lookup_value(options.get(), "restore_data", nullptr)) != nullptr;
  tell("selected types=" + std::to_string(number(options.get(), "types")) + " cursor=" +
       std::to_string(number(options.get(), "cursor_mode")) + " persist=" + std::to_string(session.persistMode));
  answer(invocation, success, emptyResults());
}

void DesktopShell::start(const char* request, const std::string& path, GDBusMethodInvocation* invocation) {
  const Dialog dialog{invocation, path, serveObject(request, "org.freedesktop.impl.portal.Request")};
  if (sessions_[path].isRestored && mode_ == "allow") {
    tell("restored");
    answerDialog(dialog, mode_);
    return;
  }
  tell("asked");
  dialogs_[request] = dialog;
  answerDialogs();
}

void DesktopShell::closeRequest(const std::string& path, GDBusMethodInvocation* invocation) {
  g_dbus_method_invocation_return_value(invocation, nullptr);
  if (const auto dialog = dialogs_.extract(path)) {
    tell("dialog closed");
    answerDialog(dialog.mapped(), "cancel");
  }
}

void DesktopShell::closeSession(const std::string& path) {
  if (const auto session = sessions_.extract(path)) {
    g_dbus_connection_unregister_object(connection_.get(), session.mapped().object);
    tell("session closed");
  }
}

void DesktopShell::endSessions() {
  for (const auto& [path, session] : sessions_) {
    g_dbus_connection_emit_signal(connection_.get(), nullptr, path.c_str(), "org.freedesktop.impl.portal.Session",
                                  "Closed", nullptr, nullptr);
    g_dbus_connection_unregister_object(connection_.get(), session.object);
  }
  sessions_.clear();
}

void DesktopShell::answerDialogs() {
  if (mode_ == "wait" || mode_ == "hang") {
    return;
  }
  for (const auto& [request, dialog] : dialogs_) {
    answerDialog(dialog, mode_);
  }
  dialogs_.clear();
}

void DesktopShell::answerDialog(const Dialog& dialog, const std::string& how) {
  g_dbus_connection_unregister_object(connection_.get(), dialog.request);
  if (how == "allow") {
    answer(dialog.invocation, success, stream(sessions_[dialog.session]));
  } else {
    answer(dialog.invocation, how == "refuse" ? refused : cancelled, emptyResults());
  }
}

GVariant* DesktopShell::stream(const Session& session) const {
  GVariantBuilder results;
  g_variant_builder_init(&results, G_VARIANT_TYPE_VARDICT);
  g_variant_builder_add(&results, "{sv}", "streams",
                        g_variant_new_parsed("[(%u, {'source_type': <uint32 1>})]", node_));
  if (session.persistMode != 0) {
    g_variant_builder_add(&results, "{sv}", "persist_mode", g_variant_new_uint32(session.persistMode));
    g_variant_builder_add(&results, "{sv}", "restore_data", g_variant_new_parsed("('lumora', uint32 1, <'screen'>)"));
  }
  return g_variant_builder_end(&results);
}

} // namespace

int runDesktopShell(const std::string& node) {
  DesktopShell(static_cast<std::uint32_t>(std::stoul(node))).serve();
  return EXIT_FAILURE;
}

} // namespace lumora::tests
