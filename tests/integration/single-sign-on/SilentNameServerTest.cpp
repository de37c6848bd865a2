#include "support/LoginTest.h"
#include "support/MainLoop.h"
#include "support/TemporaryFolder.h"

#include <LumoraKit/platform/linux/Backends.h>
#include <LumoraKit/platform/linux/FileDescriptor.h>

#include <gtest/gtest.h>

#include <cstdint>
#include <cstdlib>
#include <memory>
#include <string>

#include <arpa/inet.h>
#include <net/if.h>
#include <netinet/in.h>
#include <sched.h>
#include <sys/ioctl.h>
#include <sys/mount.h>
#include <sys/socket.h>
#include <sys/wait.h>
#include <unistd.h>

namespace {

using lumora::backend::FileDescriptor;
using lumora::fakes::ToolReply;
using lumora::tests::serveUntil;

constexpr int noNamespaces = 77;
constexpr std::uint16_t domainPort = 53;

// A network and mounts of this process's own; an ordinary user gets them with a namespace of users only.
bool enterNamespaces() {
  const std::string user = std::to_string(::getuid());
  const std::string group = std::to_string(::getgid());
  const bool isRoot = ::getuid() == 0;
  if (::unshare(CLONE_NEWNET | CLONE_NEWNS | (isRoot ? 0 : CLONE_NEWUSER)) != 0) {
    return false;
  }
  if (!isRoot) {
    lumora::tests::writeFile("/proc/self/setgroups", "deny");
    lumora::tests::writeFile("/proc/self/uid_map", user + " " + user + " 1");
    lumora::tests::writeFile("/proc/self/gid_map", group + " " + group + " 1");
  }
  return ::mount(nullptr, "/", nullptr, MS_REC | MS_PRIVATE, nullptr) == 0;
}

// Not by a program, which would not have this process's rights.
bool bringUpLoop() {
  const FileDescriptor socket(::socket(AF_INET, SOCK_DGRAM | SOCK_CLOEXEC, 0));
  ifreq request{};
  request.ifr_name[0] = 'l';
  request.ifr_name[1] = 'o';
  request.ifr_flags = IFF_UP;
  return ::ioctl(socket.get(), SIOCSIFFLAGS, &request) == 0;
}

/// The only name server there is: it takes queries and never answers.
class SilentNameServer {
public:
  explicit SilentNameServer(const lumora::tests::TemporaryFolder& folder) {
    const auto configuration = folder / "resolv.conf";
    lumora::tests::writeFile(configuration, "nameserver 127.0.0.1\n");
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_port = htons(domainPort);
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    if (enterNamespaces() && bringUpLoop() &&
        ::mount(configuration.c_str(), "/etc/resolv.conf", nullptr, MS_BIND, nullptr) == 0) {
      socket_ = FileDescriptor(::socket(AF_INET, SOCK_DGRAM | SOCK_CLOEXEC, 0));
      isThere_ = ::bind(socket_.get(), reinterpret_cast<const sockaddr*>(&address), sizeof(address)) == 0;
    }
  }

  bool isThere() const { return isThere_; }
  bool wasAsked() const {
    char query = 0;
    return ::recv(socket_.get(), &query, sizeof(query), MSG_DONTWAIT | MSG_PEEK) > 0;
  }

private:
  FileDescriptor socket_;
  bool isThere_ = false;
};

/// A machine whose realm is in the name service, and an application on it that shows the login panel.
class Machine {
public:
  Machine() {
    lumora::tests::writeFile(folder_ / "krb5.conf", "[libdefaults]\n dns_lookup_realm = true\n");
    ::setenv("KRB5_CONFIG", (folder_ / "krb5.conf").c_str(), 1);
    auto platform = lumora::Platform::current();
    platform.kerberos = lumora::backend::makeKerberos();
    lumora::Platform::install(platform);
    platform_.toolRunner->reply("listworkflows",
                                ToolReply::success({{"user_shortname", "alice"}, {"user_fullname", "Alice Smith"}}));
  }

  /// 0 when the user could log in to another server while the realm of the first one was being looked up.
  int run() {
    if (!nameServer_.isThere()) {
      return noNamespaces;
    }
    panel_->loadView();
    typeServer("tickets", {"kerberos", "basic"});
    if (!serveUntil([this] { return nameServer_.wasAsked(); })) {
      return 1;
    }
    typeServer("passwords", {"basic"});
    if (!serveUntil([this] { return !panel_->passwordControlsHidden(); })) {
      return 2;
    }
    user().typeUserName("alice");
    user().typePassword("sesame");
    panel_->attemptToLogInToServerWithTarget_selector(target_, &lumora::tests::LoginTarget::succeeded);
    const bool isLoggedIn = serveUntil([this] { return panel_->loginSession() != nullptr; });
    return isLoggedIn && panel_->loginSession()->server() == "passwords" ? 0 : 3;
  }

private:
  lumora::fakes::FakeLoginPanel& user() { return *platform_.userInterface->panel(); }
  void typeServer(const std::string& name, const lumora::Array& methods) {
    platform_.toolRunner->reply("listinfo", ToolReply::success({{"http_auth_type", methods}}));
    user().typeServer(name);
    user().finishServer();
  }

  const lumora::tests::TemporaryFolder folder_;
  const SilentNameServer nameServer_{folder_};
  lumora::fakes::FakePlatform platform_;
  const std::shared_ptr<lumora::tests::LoginTarget> target_ = std::make_shared<lumora::tests::LoginTarget>();
  const std::shared_ptr<LMRServerLoginViewController> panel_ = std::make_shared<LMRServerLoginViewController>();
};

// In a process that has no thread yet: such a one may get namespaces, and one that ends does not wait for the name
// server.
TEST(SilentNameServerTest, panel_staysUsable_whileTheRealmIsLookedUp) {
  GTEST_FLAG_SET(death_test_style, "threadsafe");
  int status = 0;
  EXPECT_EXIT(
      ::_exit(Machine().run()),
      [&](int ended) {
        status = WEXITSTATUS(ended);
        return WIFEXITED(ended) && (status == 0 || status == noNamespaces);
      },
      "");
  if (status == noNamespaces) {
    GTEST_SKIP() << "this machine allows no network and mount namespaces of one's own";
  }
}

} // namespace
