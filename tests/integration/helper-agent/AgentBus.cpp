#include "AgentBus.h"

#include "support/MainLoop.h"

#include <cstdlib>
#include <filesystem>
#include <thread>

#include <unistd.h>

namespace fs = std::filesystem;

namespace lumora::tests {
namespace {

constexpr const char* busProgram = "/usr/bin/dbus-daemon";
constexpr const char* polkitProgram = "/usr/lib/polkit-1/polkitd";
constexpr const char* actionsFolder = "/usr/share/polkit-1/actions";
constexpr const char* rulesFolder = "/etc/polkit-1/rules.d";
constexpr const char* addressVariable = "DBUS_SYSTEM_BUS_ADDRESS";

// A bus for everybody on this machine, as the real one is, but without its rules about who may serve what.
std::string busConfiguration(const fs::path& socket) {
  return R"(<!DOCTYPE busconfig PUBLIC "-//freedesktop//DTD D-BUS Bus Configuration 1.0//EN"
 "http://www.freedesktop.org/standards/dbus/1.0/busconfig.dtd">
<busconfig>
  <listen>unix:path=)" +
         socket.string() + R"(</listen>
  <auth>EXTERNAL</auth>
  <policy context="default">
    <allow user="*"/>
    <allow own="*"/>
    <allow send_destination="*" eavesdrop="false"/>
    <allow receive_sender="*"/>
  </policy>
</busconfig>
)";
}

constexpr const char* agentPolicy = R"(<?xml version="1.0" encoding="UTF-8"?>
<!DOCTYPE policyconfig PUBLIC "-//freedesktop//DTD PolicyKit Policy Configuration 1.0//EN"
 "http://www.freedesktop.org/standards/PolicyKit/1/policyconfig.dtd">
<policyconfig>
  <action id="org.vantor.lumagentconfigd.configure">
    <description>Configure camera sharing</description>
    <message>Authentication is required</message>
    <defaults>
      <allow_any>auth_admin</allow_any>
      <allow_inactive>auth_admin</allow_inactive>
      <allow_active>auth_admin</allow_active>
    </defaults>
  </action>
</policyconfig>
)";

std::string ruleFor(const std::string& user) {
  return R"(polkit.addRule(function(action, subject) {
  if (action.id == "org.vantor.lumagentconfigd.configure" && subject.user == ")" +
         user + R"(") {
    return polkit.Result.YES;
  }
});
)";
}

} // namespace

std::optional<std::string> AgentBus::obstacle() {
  return fs::exists(busProgram) ? std::nullopt : std::optional<std::string>("there is no dbus-daemon");
}

std::optional<std::string> AgentBus::polkitObstacle() {
  if (!fs::exists(polkitProgram)) {
    return "there is no polkitd";
  }
  if (getuid() != 0) {
    return "polkitd must be started by root, with an action of its own in " + std::string(actionsFolder);
  }
  const std::string mount = std::string("mount --bind /tmp ") + rulesFolder + " && echo mounted";
  const auto trial = ChildProgram::start({"unshare", "--mount", "sh", "-c", mount});
  if (!trial || trial->readLine() != "mounted") {
    return "this machine allows no mount namespace of its own";
  }
  return std::nullopt;
}

AgentBus::AgentBus() {
  // Other users reach the socket, and polkit's own user its files.
  fs::permissions(folder_.path(), fs::perms(0755));
  writeFile(folder_ / "bus.conf", busConfiguration(folder_ / "bus"));
  ::setenv(addressVariable, ("unix:path=" + (folder_ / "bus").string()).c_str(), 1);
}

AgentBus::~AgentBus() {
  ::unsetenv(addressVariable);
}

bool AgentBus::start() {
  bus_ = ChildProgram::start(
      {busProgram, "--nofork", "--nopidfile", "--print-address=1", "--config-file=" + (folder_ / "bus.conf").string()});
  return bus_ && !bus_->readLine().empty();
}

void AgentBus::stop() {
  bus_->kill();
}

bool AgentBus::startAgent(std::vector<std::string> arguments) {
  arguments.insert(arguments.begin(), "--agent");
  agent_ = ChildProgram::startSelf(std::move(arguments));
  return agent_ && agent_->readLine() == "ready";
}

bool AgentBus::startPolkit(const std::string& allowedUser) {
  const fs::path actions = folder_ / "actions";
  const fs::path rules = folder_ / "rules";
  fs::create_directories(actions);
  fs::create_directories(rules);
  writeFile(actions / "org.vantor.lumagentconfigd.policy", agentPolicy);
  writeFile(rules / "10-test.rules", ruleFor(allowedUser));
  for (const auto& entry : fs::recursive_directory_iterator(folder_.path())) {
    fs::permissions(entry.path(),
                    fs::perms::others_read | (entry.is_directory() ? fs::perms::others_exec : fs::perms()),
                    fs::perm_options::add);
  }
  const std::string script = "mount --bind '" + actions.string() + "' " + actionsFolder + " && mount --bind '" +
                             rules.string() + "' " + rulesFolder + " && exec " + polkitProgram + " --no-debug";
  polkit_ = ChildProgram::start({"unshare", "--mount", "sh", "-c", script});
  return polkit_ && waitForService("org.freedesktop.PolicyKit1");
}

bool AgentBus::waitForService(const std::string& service) {
  const auto limit = std::chrono::steady_clock::now() + generousLimit;
  while (std::chrono::steady_clock::now() < limit) {
    const auto probe =
        ChildProgram::start({"dbus-send", "--system", "--print-reply=literal", "--dest=org.freedesktop.DBus",
                             "/org/freedesktop/DBus", "org.freedesktop.DBus.NameHasOwner", "string:" + service});
    if (!probe || probe->readLine().find("true") != std::string::npos) {
      return probe != nullptr;
    }
    std::this_thread::sleep_for(std::chrono::milliseconds(10));
  }
  return false;
}

} // namespace lumora::tests
