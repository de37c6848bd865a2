#pragma once

#include <LumoraKit/platform/linux/GLibPtr.h>

#include <cstdint>
#include <string>
#include <vector>

namespace lumora::sandbox {

/// What the network is told of a server.
struct AnnouncedServer {
  /// What users see. While another server has it, the daemon's next one ("Studio #2").
  std::string name;
  std::uint16_t port = 0;
  /// The strings of the text record ("host=studio.example.org").
  std::vector<std::string> record;
};

/// The announcement of a server through the machine's Avahi daemon, made again with every daemon. Prints the name
/// whenever the network has been told. The default main context must be iterated; the daemon takes it back when the
/// process ends, so it must live until then.
class Announcement {
public:
  /// \param bus the machine's, which outlives it
  Announcement(GDBusConnection* bus, AnnouncedServer server);
  Announcement(const Announcement&) = delete;
  Announcement& operator=(const Announcement&) = delete;

private:
  static void daemonCame(GDBusConnection* bus, const gchar* name, const gchar* owner, gpointer self);
  static void daemonWent(GDBusConnection* bus, const gchar* name, gpointer self);
  static void stateChanged(GDBusConnection* bus, const gchar* sender, const gchar* path, const gchar* interface,
                           const gchar* signal, GVariant* parameters, gpointer self);

  backend::GLibPtr<GVariant> call(const std::string& path, const char* interface, const char* method,
                                  GVariant* parameters, backend::GLibPtr<GError>& error) const;
  std::string textFrom(const char* method, GVariant* parameters) const;
  gint32 state() const;
  void announce();
  void announceByOtherName();

  GDBusConnection* const bus_;
  AnnouncedServer server_;
  // The daemon's object for what is announced; empty while there is none.
  std::string group_;
};

} // namespace lumora::sandbox
