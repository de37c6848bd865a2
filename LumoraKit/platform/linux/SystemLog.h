#pragma once

#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/linux/FileDescriptor.h>

#include <cstddef>
#include <mutex>
#include <string>
#include <utility>

namespace lumora::backend {

/// Sends lines to the system's log daemon in the format of syslog(3), but without its fault: there a daemon that has
/// stopped reading blocks every thread that logs, for ever. Here a line waits a moment at most, then it is dropped;
/// the number of dropped lines is told as soon as the daemon reads again.
class LUMORA_INTERNAL SystemLog final : public Log {
public:
  explicit SystemLog(std::string socketPath = "/dev/log") : socketPath_(std::move(socketPath)) {}

  void write(std::string_view line) override;

private:
  bool send(std::string_view line);
  bool sendRecord(const std::string& record);
  bool connect();

  std::string socketPath_;
  std::mutex mutex_;
  FileDescriptor socket_;
  std::size_t dropped_ = 0;
};

} // namespace lumora::backend
