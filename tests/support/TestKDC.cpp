#include "TestKDC.h"

#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/linux/FileDescriptor.h>

#include <algorithm>
#include <cstdlib>
#include <stdexcept>

#include <arpa/inet.h>
#include <netinet/in.h>
#include <sys/socket.h>

namespace fs = std::filesystem;

namespace lumora::tests {
namespace {

constexpr const char* serverProgram = "/usr/sbin/krb5kdc";
constexpr const char* databaseProgram = "/usr/sbin/kdb5_util";
constexpr const char* administrationProgram = "/usr/sbin/kadmin.local";
constexpr const char* loginProgram = "/usr/bin/kinit";

// Somebody else may take it before it is used.
std::uint16_t freePort() {
  const backend::FileDescriptor probe(::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0));
  sockaddr_in address{};
  address.sin_family = AF_INET;
  address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
  socklen_t length = sizeof(address);
  ::bind(probe.get(), reinterpret_cast<const sockaddr*>(&address), length);
  ::getsockname(probe.get(), reinterpret_cast<sockaddr*>(&address), &length);
  return ntohs(address.sin_port);
}

std::string clientConfiguration(const std::string& realm, std::uint16_t port) {
  return "[libdefaults]\n default_realm = " + realm +
         "\n dns_lookup_kdc = false\n dns_lookup_realm = false\n rdns = false\n dns_canonicalize_hostname = false\n"
         " udp_preference_limit = 1\n[realms]\n " +
         realm + " = {\n  kdc = 127.0.0.1:" + std::to_string(port) + "\n }\n";
}

std::string serverConfiguration(const std::string& realm, std::uint16_t port, const fs::path& folder) {
  const std::string address = "127.0.0.1:" + std::to_string(port);
  return "[kdcdefaults]\n kdc_listen = " + address + "\n kdc_tcp_listen = " + address + "\n[realms]\n " + realm +
         " = {\n  database_name = " + (folder / "principal").string() +
         "\n  key_stash_file = " + (folder / "stash").string() + "\n  acl_file = " + (folder / "acl").string() +
         "\n }\n[logging]\n kdc = FILE:/dev/stdout\n";
}

} // namespace

std::optional<std::string> TestKDC::obstacle() {
  for (const char* const program : {serverProgram, databaseProgram, administrationProgram, loginProgram}) {
    if (!fs::exists(program)) {
      return "there is no " + std::string(program) + " (packages krb5-kdc, krb5-admin-server and krb5-user)";
    }
  }
  return std::nullopt;
}

TestKDC::TestKDC(std::string ownRealm) : realm_(std::move(ownRealm)), runner_(Platform::current().toolRunner) {
  ::setenv("KRB5_CONFIG", (folder_ / "krb5.conf").c_str(), 1);
  ::setenv("KRB5_KDC_PROFILE", (folder_ / "kdc.conf").c_str(), 1);
  ::setenv("KRB5CCNAME", ("FILE:" + (folder_ / "cache").string()).c_str(), 1);
}

TestKDC::~TestKDC() {
  for (const char* const variable : {"KRB5_CONFIG", "KRB5_KDC_PROFILE", "KRB5CCNAME"}) {
    ::unsetenv(variable);
  }
}

bool TestKDC::start() {
  constexpr int trials = 20;
  for (int trial = 0; trial < trials; ++trial) {
    if (startAt(freePort())) {
      return true;
    }
  }
  return false;
}

bool TestKDC::startAt(std::uint16_t port) {
  pointClientsAt(port);
  writeFile(folder_ / "kdc.conf", serverConfiguration(realm_, port, folder_.path()));
  if (!fs::exists(folder_ / "stash")) {
    require(databaseProgram, {"create", "-s", "-r", realm_, "-P", "test"});
  }
  server_ = ChildProgram::start({serverProgram, "-n", "-r", realm_});
  for (std::string line = server_->readLine(); !line.empty(); line = server_->readLine()) {
    if (line.find("commencing operation") != std::string::npos) {
      return true;
    }
  }
  return false;
}

void TestKDC::stop() {
  server_.reset();
}

void TestKDC::addUser(const std::string& name, const std::string& password) {
  administrate("addprinc -pw " + password + " " + name);
}

fs::path TestKDC::addService(const std::string& name) {
  std::string file = name + ".keytab";
  std::replace(file.begin(), file.end(), '/', '-');
  administrate("addprinc -randkey " + name);
  administrate("ktadd -k " + (folder_ / file).string() + " " + name);
  return folder_ / file;
}

bool TestKDC::logIn(const std::string& user, const std::string& password, const std::vector<std::string>& arguments) {
  std::vector<std::string> all = arguments;
  all.push_back(user);
  return run(loginProgram, all, password + "\n") == 0;
}

void TestKDC::logOut() {
  run("/usr/bin/kdestroy", {"-q"});
}

void TestKDC::pointClientsAt(std::uint16_t port) {
  writeFile(folder_ / "krb5.conf", clientConfiguration(realm_, port));
}

void TestKDC::forgetRealm() {
  writeFile(folder_ / "krb5.conf", "[libdefaults]\n dns_lookup_realm = false\n");
}

void TestKDC::administrate(const std::string& query) {
  require(administrationProgram, {"-r", realm_, "-q", query});
}

void TestKDC::require(const std::string& program, const std::vector<std::string>& arguments) {
  if (const int status = run(program, arguments); status != 0) {
    throw std::runtime_error(program + ": status " + std::to_string(status));
  }
}

int TestKDC::run(const std::string& program, const std::vector<std::string>& arguments, const std::string& input) {
  std::string output;
  std::string errors;
  return runner_->run(program, arguments, input, output, errors);
}

} // namespace lumora::tests
