#include "Announcement.h"

#include <cstdlib>
#include <iostream>

#include <CLI/CLI.hpp>

int main(int argc, char** argv) {
  using lumora::backend::GLibPtr;
  CLI::App program("Announces a server to the network (DNS-SD, by the machine's Avahi daemon), until it is ended.",
                   "lumora-sandbox-announce");
  lumora::sandbox::AnnouncedServer server;
  program.add_option("NAME", server.name, "what users see")->required();
  program.add_option("PORT", server.port, "port that the server answers at")->required();
  program.add_option("STRING", server.record, "strings of the text record (host=studio.example.org)");
  CLI11_PARSE(program, argc, argv);
  GError* failure = nullptr;
  const GLibPtr<GDBusConnection> bus(g_bus_get_sync(G_BUS_TYPE_SYSTEM, nullptr, &failure));
  if (const GLibPtr<GError> error(failure); error) {
    std::cerr << "lumora-sandbox-announce: the system bus cannot be reached: " << error->message << '\n';
    return EXIT_FAILURE;
  }
  // A signal, or the loss of the bus, ends the process.
  const lumora::sandbox::Announcement announcement(bus.get(), std::move(server));
  const GLibPtr<GMainLoop> loop(g_main_loop_new(nullptr, FALSE));
  g_main_loop_run(loop.get());
}
