#include "TestAvahi.h"

#include <chrono>
#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <utility>

#include <unistd.h>

namespace fs = std::filesystem;

namespace lumora::tests {
namespace {

constexpr const char* daemonProgram = "/usr/sbin/avahi-daemon";
constexpr const char* busVariable = "DBUS_SYSTEM_BUS_ADDRESS";
constexpr const char* daemonName = "org.freedesktop.Avahi";
constexpr const char* hostsProgram = LUMORA_SOURCE_DIR "/tests/support/avahi-hosts";

// A program in namespaces for networks and mounts, which an ordinary user gets with a namespace of users only.
std::vector<std::string> inNewNamespaces(const std::vector<std::string>& words) {
  std::vector<std::string> all{"unshare", "--net", "--mount"};
  if (::getuid() != 0) {
    all.insert(all.end(), {"--user", "--map-current-user", "--keep-caps"});
  }
  all.insert(all.end(), words.begin(), words.end());
  return all;
}

// The same in those of a process. Entering them may make the kernel forget that the program is to end with the test.
std::vector<std::string> inNamespacesOf(const std::string& process, const std::vector<std::string>& words) {
  std::vector<std::string> all{"nsenter", "--target", process, "--net", "--mount"};
  if (::getuid() != 0) {
    all.insert(all.end(), {"--user", "--preserve-credentials"});
  }
  all.insert(all.end(), {"setpriv", "--pdeathsig", "KILL"});
  all.insert(all.end(), words.begin(), words.end());
  return all;
}

std::string configuration(const std::string& host) {
  return "[server]\nhost-name=" + host +
         "\nuse-ipv4=yes\nuse-ipv6=yes\nratelimit-interval-usec=0\n[publish]\npublish-hinfo=no\n"
         "publish-workstation=no\n";
}

fs::path withServices(fs::path folder) {
  fs::create_directories(folder / "services");
  return folder;
}

std::string hexadecimal(const std::string& bytes) {
  constexpr const char* digits = "0123456789abcdef";
  std::string text;
  for (const char byte : bytes) {
    const auto number = static_cast<unsigned char>(byte);
    text += digits[number / 16];
    text += digits[number % 16];
  }
  return text;
}

std::string recordElement(const RecordString& string) {
  return string.value ? "<txt-record value-format=\"binary-hex\">" + string.key + "=" + hexadecimal(*string.value) +
                            "</txt-record>"
                      : "<txt-record>" + string.key + "</txt-record>";
}

} // namespace

AvahiHost::AvahiHost(std::string name, fs::path folder)
    : name_(std::move(name)), folder_(withServices(std::move(folder))), bus_(folder_) {
  writeFile(folder_ / "avahi.conf", configuration(name_));
}

bool AvahiHost::startDaemon() {
  daemon_ = ChildProgram::start(inNamespacesOf(
      process_, {"env", std::string(busVariable) + "=" + bus_.address(), daemonProgram, "--file",
                 (folder_ / "avahi.conf").string(), "--no-drop-root", "--no-chroot", "--no-rlimits", "--syslog"}));
  return daemon_ && bus_.waitForService(daemonName);
}

void AvahiHost::stopDaemon() {
  daemon_->signal(SIGTERM);
  daemon_->wait();
}

void AvahiHost::killDaemon() {
  daemon_->kill();
}

void AvahiHost::freezeDaemon() {
  daemon_->signal(SIGSTOP);
}

void AvahiHost::thawDaemon() {
  daemon_->signal(SIGCONT);
}

// The daemon sees a file that is moved there, never half of one. It takes a file for unchanged whose time is in the
// same second.
void AvahiHost::publish(const std::string& name, std::uint16_t port, const std::vector<RecordString>& record) const {
  std::string text = "<service-group><name>" + name + "</name><service><type>_lumora._tcp</type><port>" +
                     std::to_string(port) + "</port>";
  for (const auto& string : record) {
    text += recordElement(string);
  }
  const fs::path fresh = folder_ / "service";
  const fs::path published = folder_ / "services" / (name + ".service");
  writeFile(fresh, text + "</service></service-group>\n");
  if (fs::exists(published)) {
    fs::last_write_time(fresh, fs::last_write_time(published) + std::chrono::seconds(1));
  }
  fs::rename(fresh, published);
}

void AvahiHost::withdraw(const std::string& name) const {
  fs::remove(folder_ / "services" / (name + ".service"));
}

std::optional<std::string> TestAvahi::obstacle() {
  if (auto noBus = TestBus::obstacle()) {
    return noBus;
  }
  for (const char* const program : {daemonProgram, "/usr/sbin/ip"}) {
    if (!fs::exists(program)) {
      return "there is no " + std::string(program) + " (packages avahi-daemon and iproute2)";
    }
  }
  const std::string trial = "mount -t tmpfs tmpfs /run && ip link add a0 type veth peer name a1 && echo made";
  const auto attempt = ChildProgram::start(inNewNamespaces({"sh", "-c", trial + " 2>/dev/null"}));
  if (!attempt || attempt->readLine() != "made") {
    return "this machine allows no network and mount namespaces of one's own";
  }
  return std::nullopt;
}

TestAvahi::TestAvahi() {
  ::setenv(busVariable, here().bus().address().c_str(), 1);
}

TestAvahi::~TestAvahi() {
  ::unsetenv(busVariable);
}

bool TestAvahi::startWithoutDaemon() {
  wire_ = ChildProgram::start(inNewNamespaces({hostsProgram, folder_.path().string()}));
  if (!wire_) {
    return false;
  }
  first_.setNamespaces(wire_->readLine());
  second_.setNamespaces(wire_->readLine());
  return second_.hasNamespaces() && first_.bus().start();
}

bool TestAvahi::start() {
  return startWithoutDaemon() && first_.startDaemon();
}

bool TestAvahi::startOtherHost() {
  return second_.bus().start() && second_.startDaemon();
}

} // namespace lumora::tests
