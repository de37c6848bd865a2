#include <LumoraKit/platform/linux/Backends.h>
#include <LumoraKit/platform/linux/SystemLog.h>

#include <array>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <ctime>

#include <poll.h>
#include <sys/socket.h>
#include <sys/un.h>
#include <syslog.h>
#include <unistd.h>

namespace lumora::backend {
namespace {

constexpr int patienceMilliseconds = 50;
// Well below what a datagram socket takes at once.
constexpr std::size_t longestLine = std::size_t{64} * 1024;

// RFC 3164 as the local daemons read it: "<14>Jan 20 15:04:05 program[123]: ". No locale: the month is English.
std::string recordHead() {
  constexpr std::array<const char*, 12> months{"Jan", "Feb", "Mar", "Apr", "May", "Jun",
                                               "Jul", "Aug", "Sep", "Oct", "Nov", "Dec"};
  const std::time_t now = std::time(nullptr);
  std::tm local{};
  localtime_r(&now, &local);
  std::array<char, 64> stamp{};
  std::snprintf(stamp.data(), stamp.size(), "<%d>%s %2d %02d:%02d:%02d ", LOG_USER | LOG_NOTICE,
                months[static_cast<std::size_t>(local.tm_mon)], local.tm_mday, local.tm_hour, local.tm_min,
                local.tm_sec);
  return std::string(stamp.data()) + program_invocation_short_name + '[' + std::to_string(getpid()) + "]: ";
}

bool becomesWritable(int descriptor, int milliseconds) {
  pollfd polled{descriptor, POLLOUT, 0};
  return poll(&polled, 1, milliseconds) > 0;
}

} // namespace

void SystemLog::write(std::string_view line) {
  const std::lock_guard lock(mutex_);
  if (dropped_ > 0 && send(std::to_string(dropped_) + " log lines were dropped")) {
    dropped_ = 0;
  }
  if (!send(line)) {
    ++dropped_;
  }
}

bool SystemLog::send(std::string_view line) {
  const std::string record = recordHead() + std::string(line.substr(0, longestLine));
  if (socket_.isOpen() && sendRecord(record)) {
    return true;
  }
  // Either there was no connection, or the daemon was started anew and the old one is dead.
  return !socket_.isOpen() && connect() && sendRecord(record);
}

bool SystemLog::sendRecord(const std::string& record) {
  constexpr int flags = MSG_DONTWAIT | MSG_NOSIGNAL;
  // Only the first line after a success waits, so that a dead daemon does not slow down everybody.
  const int patience = dropped_ == 0 ? patienceMilliseconds : 0;
  ssize_t sent = ::send(socket_.get(), record.data(), record.size(), flags);
  if (sent < 0 && errno == EAGAIN && becomesWritable(socket_.get(), patience)) {
    sent = ::send(socket_.get(), record.data(), record.size(), flags);
  }
  if (sent < 0 && errno != EAGAIN) {
    socket_.close();
  }
  return sent >= 0;
}

bool SystemLog::connect() {
  FileDescriptor connection(socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC, 0));
  sockaddr_un address{};
  address.sun_family = AF_UNIX;
  if (!connection.isOpen() || socketPath_.size() >= sizeof address.sun_path) {
    return false;
  }
  std::memcpy(address.sun_path, socketPath_.data(), socketPath_.size());
  if (::connect(connection.get(), reinterpret_cast<const sockaddr*>(&address), sizeof address) != 0) {
    return false;
  }
  socket_ = std::move(connection);
  return true;
}

std::shared_ptr<Log> makeSystemLog() {
  return std::make_shared<SystemLog>();
}

} // namespace lumora::backend
