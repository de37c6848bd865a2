#include "Announcement.h"

#include <iostream>
#include <string_view>
#include <utility>

namespace lumora::sandbox {

using backend::GLibPtr;

namespace {

constexpr const char* daemonName = "org.freedesktop.Avahi";
constexpr const char* serverPath = "/";
constexpr const char* serverInterface = "org.freedesktop.Avahi.Server";
constexpr const char* groupInterface = "org.freedesktop.Avahi.EntryGroup";
constexpr const char* serviceType = "_lumora._tcp";
constexpr const char* collisionError = "org.freedesktop.Avahi.CollisionError";

constexpr gint32 everyInterface = -1;
constexpr gint32 everyProtocol = -1;
constexpr int callMilliseconds = 10'000;

// States of a group of entries.
constexpr gint32 established = 2;
constexpr gint32 collided = 3;

void complain(std::string_view reason) {
  std::cerr << "lumora-sandbox-announce: " << reason << '\n';
}

GVariant* arrayOfBytes(const std::vector<std::string>& strings) {
  GVariantBuilder builder;
  g_variant_builder_init(&builder, G_VARIANT_TYPE("aay"));
  for (const auto& string : strings) {
    g_variant_builder_add_value(&builder,
                                g_variant_new_fixed_array(G_VARIANT_TYPE_BYTE, string.data(), string.size(), 1));
  }
  return g_variant_builder_end(&builder);
}

bool isCollision(const GError& error) {
  const GLibPtr<gchar> name(g_dbus_error_get_remote_error(&error));
  return name && std::string_view(name.get()) == collisionError;
}

} // namespace

Announcement::Announcement(GDBusConnection* bus, AnnouncedServer server) : bus_(bus), server_(std::move(server)) {
  g_dbus_connection_signal_subscribe(bus_, daemonName, groupInterface, "StateChanged", nullptr, nullptr,
                                     G_DBUS_SIGNAL_FLAGS_NONE, &stateChanged, this, nullptr);
  g_bus_watch_name_on_connection(bus_, daemonName, G_BUS_NAME_WATCHER_FLAGS_AUTO_START, &daemonCame, &daemonWent, this,
                                 nullptr);
}

GLibPtr<GVariant> Announcement::call(const std::string& path, const char* interface, const char* method,
                                     GVariant* parameters, GLibPtr<GError>& error) const {
  GError* failure = nullptr;
  GLibPtr<GVariant> answer(g_dbus_connection_call_sync(bus_, daemonName, path.c_str(), interface, method, parameters,
                                                       nullptr, G_DBUS_CALL_FLAGS_NO_AUTO_START, callMilliseconds,
                                                       nullptr, &failure));
  error.reset(failure);
  return answer;
}

std::string Announcement::textFrom(const char* method, GVariant* parameters) const {
  GLibPtr<GError> error;
  const auto answer = call(serverPath, serverInterface, method, parameters, error);
  if (!answer) {
    complain(error->message);
    return "";
  }
  const GLibPtr<GVariant> text(g_variant_get_child_value(answer.get(), 0));
  return g_variant_get_string(text.get(), nullptr);
}

void Announcement::daemonCame(GDBusConnection* /*bus*/, const gchar* /*name*/, const gchar* /*owner*/, gpointer self) {
  auto& announcement = *static_cast<Announcement*>(self);
  announcement.group_ = announcement.textFrom("EntryGroupNew", nullptr);
  announcement.announce();
}

void Announcement::daemonWent(GDBusConnection* /*bus*/, const gchar* /*name*/, gpointer self) {
  complain("the service discovery daemon (Avahi) is not running");
  static_cast<Announcement*>(self)->group_.clear();
}

void Announcement::announce() {
  if (group_.empty()) {
    return;
  }
  GLibPtr<GError> error;
  call(group_, groupInterface, "AddService",
       g_variant_new("(iiussssq@aay)", everyInterface, everyProtocol, 0U, server_.name.c_str(), serviceType, "", "",
                     server_.port, arrayOfBytes(server_.record)),
       error);
  if (!error) {
    call(group_, groupInterface, "Commit", nullptr, error);
  } else if (isCollision(*error)) {
    return announceByOtherName();
  }
  if (error) {
    complain(error->message);
  }
}

// The daemon's own rule: "Studio", "Studio #2", "Studio #3".
void Announcement::announceByOtherName() {
  server_.name = textFrom("GetAlternativeServiceName", g_variant_new("(s)", server_.name.c_str()));
  GLibPtr<GError> error;
  call(group_, groupInterface, "Reset", nullptr, error);
  announce();
}

// Now: a collision is told several times, also of a name that was given up meanwhile.
gint32 Announcement::state() const {
  GLibPtr<GError> error;
  const auto answer = call(group_, groupInterface, "GetState", nullptr, error);
  gint32 state = 0;
  if (answer) {
    g_variant_get_child(answer.get(), 0, "i", &state);
  }
  return state;
}

void Announcement::stateChanged(GDBusConnection* /*bus*/, const gchar* /*sender*/, const gchar* path,
                                const gchar* /*interface*/, const gchar* /*signal*/, GVariant* parameters,
                                gpointer self) {
  auto& announcement = *static_cast<Announcement*>(self);
  if (announcement.group_ != path) {
    return;
  }
  gint32 state = 0;
  g_variant_get_child(parameters, 0, "i", &state);
  if (state == established) {
    std::cout << "Announced as \"" << announcement.server_.name << "\"." << std::endl;
  } else if (state == collided && announcement.state() == collided) {
    announcement.announceByOtherName();
  }
}

} // namespace lumora::sandbox
