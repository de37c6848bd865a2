#pragma once

#include "support/Sandbox.h"

#include <LumoraKit/platform/PropertyList.h>

#include <gmock/gmock.h>

#include <chrono>
#include <fstream>
#include <functional>
#include <string>
#include <thread>

/// What the tests of the tools share.

namespace lumora::tests {

/// A request of the server's user: the login, then the elements.
inline Array asUser(const SandboxServer& server, const Array& elements) {
  Array request = server.login();
  request.insert(request.end(), elements.begin(), elements.end());
  return request;
}

inline Array asUser(const std::string& user, const std::string& password, const Array& elements) {
  Array request{Array{"server", "localhost:8170"}, Array{"auth", "Password"}, Array{"user", user},
                Array{"pass", password}};
  request.insert(request.end(), elements.begin(), elements.end());
  return request;
}

inline std::filesystem::path writeFile(const std::filesystem::path& path, const std::string& content) {
  std::ofstream(path, std::ios::binary) << content;
  return path;
}

inline std::string contentOf(const std::filesystem::path& path) {
  std::ifstream stream(path, std::ios::binary);
  return {std::istreambuf_iterator<char>(stream), {}};
}

inline Array pair(const char* key, const std::filesystem::path& path) {
  return Array{key, path.string()};
}

/// Writes a metadata file with the title.
inline std::filesystem::path writeMetadata(const SandboxServer& server, const std::string& title = "Title") {
  return writeFile(server.folder() / (title + ".plist"),
                   "<plist version=\"1.0\"><dict><key>Title</key><string>" + title +
                       "</string><key>Description</key><string>About it</string></dict></plist>");
}

/// Waits until the condition holds; false when that took longer than a test may.
inline bool waitUntil(const std::function<bool()>& condition) {
  const auto limit = std::chrono::steady_clock::now() + std::chrono::seconds(60);
  while (!condition()) {
    if (std::chrono::steady_clock::now() > limit) {
      return false;
    }
    std::this_thread::sleep_for(std::chrono::milliseconds(1));
  }
  return true;
}

/// A program that ended with a status and a part of its standard error.
MATCHER_P2(EndedWith, status, reason, "") {
  *result_listener << "status " << arg.status << ", " << arg.standardError;
  return arg.status == status && arg.standardError.find(reason) != std::string::npos;
}

MATCHER(Succeeded, "") {
  *result_listener << "status " << arg.status << ", " << arg.standardError;
  return arg.status == 0 && arg.standardError.empty();
}

/// The reply of a tool that must have succeeded; empty when it has not.
inline Dictionary replyTo(const ProgramRun& run) {
  EXPECT_THAT(run, Succeeded());
  return dictionaryWithXMLDescription(run.standardOutput).value_or(Dictionary{});
}

} // namespace lumora::tests
