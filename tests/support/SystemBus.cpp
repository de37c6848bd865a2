#include "SystemBus.h"

#include <cstdlib>
#include <filesystem>

#include <unistd.h>

namespace fs = std::filesystem;

namespace lumora::tests {
namespace {

constexpr const char* polkitProgram = "/usr/lib/polkit-1/polkitd";
constexpr const char* actionsFolder = "/usr/share/polkit-1/actions";
constexpr const char* rulesFolder = "/etc/polkit-1/rules.d";
constexpr const char* addressVariable = "DBUS_SYSTEM_BUS_ADDRESS";

constexpr const char* agentFolder = LUMORA_SOURCE_DIR "/sandbox/agent";

// The rules of a machine's own bus, to which each service adds what it needs.
constexpr const char* machinePolicy = R"(
  <policy context="default">
    <allow user="*"/>
    <deny own="*"/>
    <deny send_type="method_call"/>
    <allow send_type="signal"/>
    <allow send_requested_reply="true" send_type="method_return"/>
    <allow send_requested_reply="true" send_type="error"/>
    <allow receive_type="method_call"/>
    <allow receive_type="method_return"/>
    <allow receive_type="error"/>
    <allow receive_type="signal"/>
    <allow send_destination="org.freedesktop.DBus" send_interface="org.freedesktop.DBus"/>
  </policy>
  <include ignore_missing="yes">/usr/share/dbus-1/system.d/org.freedesktop.PolicyKit1.conf</include>
  <include>)";

std::string rules(SystemBus::Policy policy) {
  return policy == SystemBus::Policy::Open
             ? TestBus::openRules
             : std::string(machinePolicy) + agentFolder + "/org.vantor.lumagentconfigd.conf</include>";
}

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

std::optional<std::string> SystemBus::obstacle() {
  return TestBus::obstacle();
}

std::optional<std::string> SystemBus::polkitObstacle() {
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

SystemBus::SystemBus(Policy policy) : bus_(folder_.path(), rules(policy)) {
  // Other users reach the socket, and polkit's own user its files.
  fs::permissions(folder_.path(), fs::perms(0755));
  ::setenv(addressVariable, bus_.address().c_str(), 1);
}

SystemBus::~SystemBus() {
  ::unsetenv(addressVariable);
}

bool SystemBus::startPolkit(const std::string& allowedUser) {
  const fs::path actions = folder_ / "actions";
  const fs::path rules = folder_ / "rules";
  fs::create_directories(actions);
  fs::create_directories(rules);
  fs::copy(fs::path(agentFolder) / "org.vantor.lumagentconfigd.policy", actions);
  writeFile(rules / "10-test.rules", ruleFor(allowedUser));
  for (const auto& entry : fs::recursive_directory_iterator(folder_.path())) {
    fs::permissions(entry.path(),
                    fs::perms::others_read | (entry.is_directory() ? fs::perms::others_exec : fs::perms()),
                    fs::perm_options::add);
  }
  const std::string script = "mount --bind '" + actions.string() + "' " + actionsFolder + " && mount --bind '" +
                             rules.string() + "' " + rulesFolder + " && exec " + polkitProgram + " --no-debug";
  polkit_ = ChildProgram::start({"unshare", "--mount", "sh", "-c", script});
  return polkit_ && bus_.waitForService("org.freedesktop.PolicyKit1");
}

} // namespace lumora::tests
