#include "TestKeyring.h"

#include "MainLoop.h"

#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <thread>
#include <vector>

namespace fs = std::filesystem;

namespace lumora::tests {
namespace {

constexpr const char* askProgram = "/usr/bin/dbus-send";
constexpr const char* serviceProgram = "/usr/bin/gnome-keyring-daemon";

void setVariable(const std::string& name, const std::optional<std::string>& value) {
  if (value) {
    ::setenv(name.c_str(), value->c_str(), 1);
  } else {
    ::unsetenv(name.c_str());
  }
}

} // namespace

std::optional<std::string> TestKeyring::obstacle() {
  if (!fs::exists(serviceProgram)) {
    return "there is no " + std::string(serviceProgram) + " (package gnome-keyring)";
  }
  return TestBus::obstacle();
}

TestKeyring::TestKeyring() {
  std::map<std::string, std::optional<std::string>> own{{"DBUS_SESSION_BUS_ADDRESS", bus_.address()},
                                                        {"DISPLAY", std::nullopt},
                                                        {"WAYLAND_DISPLAY", std::nullopt},
                                                        {"GNOME_KEYRING_CONTROL", std::nullopt}};
  for (const char* const variable : {"HOME", "XDG_RUNTIME_DIR", "XDG_DATA_HOME", "XDG_CONFIG_HOME", "XDG_CACHE_HOME"}) {
    fs::create_directory(folder_ / variable);
    fs::permissions(folder_ / variable, fs::perms::owner_all);
    own[variable] = folder_ / variable;
  }
  for (const auto& [name, value] : own) {
    const char* const before = std::getenv(name.c_str());
    environment_[name] = before ? std::optional<std::string>(before) : std::nullopt;
    setVariable(name, value);
  }
  writeFile(folder_ / "password", "keyring");
}

TestKeyring::~TestKeyring() {
  stopService();
  stopBus();
  for (const auto& [name, value] : environment_) {
    setVariable(name, value);
  }
}

bool TestKeyring::start() {
  return startBus() && startService();
}

bool TestKeyring::startService() {
  return startServiceWith("--unlock <'" + (folder_ / "password").string() + "'");
}

bool TestKeyring::startLockedService() {
  return startServiceWith("</dev/null");
}

bool TestKeyring::startServiceWith(const std::string& options) {
  service_ = ChildProgram::start(
      {"sh", "-c",
       "exec " + std::string(serviceProgram) + " --foreground --components=secrets " + options + " >/dev/null 2>&1"});
  return service_ && waitForService();
}

void TestKeyring::stopService() {
  service_.reset();
}

void TestKeyring::freeze() {
  service_->signal(SIGSTOP);
}

void TestKeyring::thaw() {
  service_->signal(SIGCONT);
}

bool TestKeyring::lock() {
  return ask("/org/freedesktop/secrets", "org.freedesktop.Secret.Service.Lock",
             "array:objpath:/org/freedesktop/secrets/aliases/default")
             .find("/org/freedesktop/secrets/") != std::string::npos;
}

int TestKeyring::countItems(const std::string& attribute, const std::string& value) {
  const std::string answer = ask("/org/freedesktop/secrets", "org.freedesktop.Secret.Service.SearchItems",
                                 "dict:string:string:" + attribute + "," + value);
  int count = 0;
  const std::string path = "/org/freedesktop/secrets/collection/";
  for (auto at = answer.find(path); at != std::string::npos; at = answer.find(path, at + 1)) {
    ++count;
  }
  return answer.empty() ? -1 : count;
}

std::string TestKeyring::ask(const std::string& object, const std::string& method, const std::string& argument) {
  const auto question = ChildProgram::start(
      {askProgram, "--session", "--print-reply=literal", "--dest=org.freedesktop.secrets", object, method, argument});
  std::string answer;
  for (std::string line = question->readLine(); !line.empty(); line = question->readLine()) {
    answer += line + "\n";
  }
  return answer;
}

bool TestKeyring::waitForService() {
  const auto limit = std::chrono::steady_clock::now() + generousLimit;
  while (std::chrono::steady_clock::now() < limit) {
    // An answer, whatever it is, says that it serves.
    if (!ask("/org/freedesktop/secrets", "org.freedesktop.Secret.Service.ReadAlias", "string:default").empty()) {
      return true;
    }
    std::this_thread::sleep_for(std::chrono::milliseconds(10));
  }
  return false;
}

} // namespace lumora::tests
