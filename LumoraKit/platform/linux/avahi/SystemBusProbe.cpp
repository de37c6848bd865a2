#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/linux/FileDescriptor.h>
#include <LumoraKit/platform/linux/GLibPtr.h>
#include <LumoraKit/platform/linux/avahi/SystemBusProbe.h>

#include <cerrno>
#include <cstring>
#include <optional>
#include <string_view>
#include <system_error>

#include <sys/socket.h>
#include <sys/un.h>

namespace lumora::backend {
namespace {

// The socket's path of an address that is nothing but one ("unix:path=/run/dbus/system_bus_socket"); others cannot be
// tried without waiting.
std::optional<std::string> socketPath(std::string_view address) {
  constexpr std::string_view prefix = "unix:path=";
  if (!address.starts_with(prefix) || address.find_first_of(";%") != std::string_view::npos) {
    return std::nullopt;
  }
  address.remove_prefix(prefix.size());
  return std::string(address.substr(0, address.find(',')));
}

// 0, or why nobody listens there. A listener that is too busy to be reached at once is one.
int connectionError(const std::string& path) {
  sockaddr_un address{};
  address.sun_family = AF_UNIX;
  if (path.size() >= sizeof(address.sun_path)) {
    return ENAMETOOLONG;
  }
  path.copy(address.sun_path, path.size());
  const FileDescriptor socket(::socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC | SOCK_NONBLOCK, 0));
  const bool reached =
      !socket.isOpen() || ::connect(socket.get(), reinterpret_cast<const sockaddr*>(&address), sizeof(address)) == 0;
  return reached || errno == EAGAIN ? 0 : errno;
}

} // namespace

std::string systemBusObstacle() {
  GError* failure = nullptr;
  const GLibPtr<gchar> address(g_dbus_address_get_for_bus_sync(G_BUS_TYPE_SYSTEM, nullptr, &failure));
  if (const GLibPtr<GError> error(failure); error) {
    return format("There is no system bus: %@", {text(error->message)});
  }
  const auto path = socketPath(address.get());
  const int error = path ? connectionError(*path) : 0;
  return error == 0 ? "" : format("There is no system bus at %@: %@", {*path, std::generic_category().message(error)});
}

} // namespace lumora::backend
