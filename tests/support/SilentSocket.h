#pragma once

#include <LumoraKit/platform/linux/FileDescriptor.h>

#include <gtest/gtest.h>

#include <cstring>
#include <string>

#include <sys/socket.h>
#include <sys/un.h>

namespace lumora::tests {

/// A socket that takes connections and never says anything.
class SilentSocket {
public:
  explicit SilentSocket(const std::string& path) : socket_(::socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0)) {
    sockaddr_un address{};
    address.sun_family = AF_UNIX;
    std::strncpy(address.sun_path, path.c_str(), sizeof(address.sun_path) - 1);
    EXPECT_EQ(::bind(socket_.get(), reinterpret_cast<const sockaddr*>(&address), sizeof(address)), 0);
    EXPECT_EQ(::listen(socket_.get(), 8), 0);
  }

private:
  backend::FileDescriptor socket_;
};

} // namespace lumora::tests
