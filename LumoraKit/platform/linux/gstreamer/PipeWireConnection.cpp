#include <LumoraKit/platform/linux/FileDescriptor.h>
#include <LumoraKit/platform/linux/gstreamer/PipeWireConnection.h>

#include <cstdlib>
#include <cstring>
#include <filesystem>

#include <sys/socket.h>
#include <sys/un.h>

namespace lumora::backend {
namespace {

std::string environment(const char* name) {
  const char* const value = std::getenv(name);
  return value ? value : "";
}

// As PipeWire's own clients find it.
std::filesystem::path socketPath() {
  const std::string remote = environment("PIPEWIRE_REMOTE");
  const std::string ownFolder = environment("PIPEWIRE_RUNTIME_DIR");
  const std::filesystem::path folder = ownFolder.empty() ? environment("XDG_RUNTIME_DIR") : ownFolder;
  return folder / (remote.empty() ? "pipewire-0" : remote);
}

FileDescriptor connectToServer() {
  const std::string path = socketPath();
  sockaddr_un address{};
  address.sun_family = AF_UNIX;
  FileDescriptor connection(::socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0));
  if (!connection.isOpen() || path.size() >= sizeof address.sun_path) {
    return {};
  }
  std::memcpy(address.sun_path, path.c_str(), path.size());
  if (::connect(connection.get(), reinterpret_cast<const sockaddr*>(&address), sizeof address) != 0) {
    return {};
  }
  return connection;
}

} // namespace

// The source takes a duplicate, but knows its connection by the number: it stays taken as long as the source lives.
void connectApart(GstElement& source) {
  FileDescriptor connection = connectToServer();
  if (!connection.isOpen()) {
    return;
  }
  const int number = connection.release();
  g_object_set(&source, "fd", number, nullptr);
  g_object_set_data_full(G_OBJECT(&source), "lumora-connection", GINT_TO_POINTER(number),
                         [](gpointer data) { FileDescriptor(GPOINTER_TO_INT(data)).close(); });
}

} // namespace lumora::backend
