#include "DiscoveryTest.h"
#include "support/Descriptors.h"
#include "support/Sandbox.h"
#include "support/SilentSocket.h"

#include <glib.h>

#include <chrono>
#include <cstdlib>

using lumora::tests::serveUntil;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;

namespace {

// GLib keeps threads that it may need again for 15 seconds.
void keepNoUnusedThreads() {
  g_thread_pool_set_max_unused_threads(0);
}

class DaemonFaultsTest : public lumora::tests::DiscoveryTest {
protected:
  void startNetwork() override { ASSERT_TRUE(network_.startWithoutDaemon()); }
};

TEST_F(DaemonFaultsTest, services_areFound_whenTheDaemonComesLater) {
  network_.here().publish("Studio");
  browse();
  ASSERT_TRUE(network_.here().startDaemon());
  EXPECT_TRUE(waitFor("+Studio"));
}

TEST_F(DaemonFaultsTest, services_areLostAndFoundAgain_whenTheDaemonIsRestarted) {
  network_.here().publish("Studio");
  ASSERT_TRUE(network_.here().startDaemon());
  browse();
  ASSERT_TRUE(waitFor("+Studio"));
  network_.here().stopDaemon();
  ASSERT_TRUE(waitFor("-Studio"));
  ASSERT_TRUE(network_.here().startDaemon());
  ASSERT_TRUE(waitFor("+Studio", 2));
  EXPECT_THAT(listener_.told, ElementsAre("+Studio", "-Studio", "+Studio"));
}

TEST_F(DaemonFaultsTest, services_areLost_whenTheDaemonIsKilled) {
  network_.here().publish("Studio");
  network_.here().publish("Other");
  ASSERT_TRUE(network_.here().startDaemon());
  browse();
  ASSERT_TRUE(waitFor("+Studio"));
  ASSERT_TRUE(waitFor("+Other"));
  network_.here().killDaemon();
  EXPECT_TRUE(waitFor("-Studio"));
  EXPECT_TRUE(waitFor("-Other"));
}

TEST_F(DaemonFaultsTest, resolution_failsAtOnceWithTheReason_whenThereIsNoDaemon) {
  network_.here().publish("Studio");
  ASSERT_TRUE(network_.here().startDaemon());
  browse();
  const auto service = find("Studio");
  network_.here().killDaemon();
  ASSERT_TRUE(waitFor("-Studio"));
  resolve(service);
  EXPECT_THAT(resolver_->told, ElementsAre("failed Studio"));
  EXPECT_EQ(resolver_->error->localizedDescription(), "The service discovery daemon (Avahi) is not running");
}

TEST_F(DaemonFaultsTest, services_areLostAndFoundAgain_whenTheBusIsRestarted) {
  network_.here().publish("Studio");
  ASSERT_TRUE(network_.here().startDaemon());
  browse();
  const auto service = find("Studio");
  network_.here().bus().stop();
  ASSERT_TRUE(waitFor("-Studio"));
  resolve(service);
  EXPECT_THAT(resolver_->error->localizedDescription(), HasSubstr("bus"));
  network_.here().killDaemon();
  ASSERT_TRUE(network_.here().bus().start());
  ASSERT_TRUE(network_.here().startDaemon());
  EXPECT_TRUE(waitFor("+Studio", 2));
}

TEST_F(DaemonFaultsTest, threadsAndDescriptors_areGivenBack) {
  keepNoUnusedThreads();
  network_.here().publish("Studio");
  ASSERT_TRUE(network_.here().startDaemon());
  const auto searchOnce = [&] {
    browse();
    resolve(find("Studio"));
    browser_.reset();
    listener_ = {};
  };
  // GLib starts threads of its own with the first use, and keeps them.
  searchOnce();
  const auto threads = lumora::tests::threadCount();
  const auto descriptors = lumora::tests::openDescriptors();
  constexpr int searches = 30;
  for (int i = 0; i < searches; ++i) {
    searchOnce();
  }
  EXPECT_TRUE(serveUntil([&] { return lumora::tests::threadCount() <= threads; })) << lumora::tests::threadCount();
  EXPECT_TRUE(serveUntil([&] { return lumora::tests::openDescriptors() <= descriptors; }))
      << lumora::tests::openDescriptors();
}

/// A machine without a network: nothing of it is needed here.
class BusFaultsTest : public testing::Test {
protected:
  BusFaultsTest() { setBus("unix:path=" + (folder_ / "bus").string()); }
  void TearDown() override { ::unsetenv("DBUS_SYSTEM_BUS_ADDRESS"); }

  static void setBus(const std::string& address) { ::setenv("DBUS_SYSTEM_BUS_ADDRESS", address.c_str(), 1); }
  std::unique_ptr<lumora::ServiceBrowser> browse() {
    error_ = nullptr;
    return discovery_->browse("_lumora._tcp", listener_.events(), &error_);
  }

  lumora::tests::TemporaryFolder folder_;
  std::shared_ptr<lumora::ServiceDiscovery> discovery_ = lumora::backend::makeServiceDiscovery();
  lumora::tests::Listener listener_;
  LMRErrorRef error_;
};

TEST_F(BusFaultsTest, search_isRefusedWithTheReason_whenThereIsNoBus) {
  EXPECT_FALSE(browse());
  ASSERT_TRUE(error_);
  EXPECT_EQ(error_->code(), -1);
  EXPECT_EQ(error_->localizedDescription(),
            "There is no system bus at " + (folder_ / "bus").string() + ": No such file or directory");
  EXPECT_FALSE(discovery_->browse("_lumora._tcp", listener_.events(), nullptr));
}

TEST_F(BusFaultsTest, search_isRefusedWithTheReason_whenTheBusIsDead) {
  { const lumora::tests::SilentSocket closed(folder_ / "bus"); }
  EXPECT_FALSE(browse());
  ASSERT_TRUE(error_);
  EXPECT_THAT(error_->localizedDescription(), HasSubstr("Connection refused"));
}

TEST_F(BusFaultsTest, search_isRefused_whenItsTypeIsNoText) {
  const lumora::tests::SilentSocket bus(folder_ / "bus");
  EXPECT_FALSE(discovery_->browse("\xff", listener_.events(), &error_));
  EXPECT_TRUE(error_);
}

TEST_F(BusFaultsTest, search_beginsAndEndsAtOnce_whenTheBusNeverAnswers) {
  keepNoUnusedThreads();
  const lumora::tests::SilentSocket bus(folder_ / "bus");
  ASSERT_TRUE(browse());
  const auto threads = lumora::tests::threadCount();
  const auto descriptors = lumora::tests::openDescriptors();
  constexpr int searches = 20;
  for (int i = 0; i < searches; ++i) {
    ASSERT_TRUE(browse());
  }
  EXPECT_TRUE(serveUntil([&] { return lumora::tests::threadCount() <= threads; }));
  EXPECT_TRUE(serveUntil([&] { return lumora::tests::openDescriptors() <= descriptors; }));
  EXPECT_THAT(listener_.told, IsEmpty());
}

TEST_F(BusFaultsTest, search_findsNothing_whenTheBusHasNoDaemon) {
  if (const auto obstacle = lumora::tests::TestBus::obstacle()) {
    GTEST_SKIP() << *obstacle;
  }
  lumora::tests::TestBus bus(folder_.path());
  ASSERT_TRUE(bus.start());
  const auto browser = browse();
  EXPECT_TRUE(browser);
  EXPECT_FALSE(error_);
}

TEST_F(BusFaultsTest, descriptors_areGivenBack_atWhicheverMomentASearchEnds) {
  if (const auto obstacle = lumora::tests::TestBus::obstacle()) {
    GTEST_SKIP() << *obstacle;
  }
  keepNoUnusedThreads();
  lumora::tests::TestBus bus(folder_.path());
  ASSERT_TRUE(bus.start());
  const auto searchFor = [&](std::chrono::microseconds time) {
    const auto browser = browse();
    ASSERT_TRUE(browser);
    const auto end = std::chrono::steady_clock::now() + time;
    serveUntil([&] { return std::chrono::steady_clock::now() >= end; });
  };
  searchFor(std::chrono::milliseconds(100));
  const auto descriptors = lumora::tests::openDescriptors();
  // From before the connection until after the bus has told that there is no daemon.
  constexpr int moments = 200;
  for (int moment = 0; moment < moments; ++moment) {
    searchFor(std::chrono::microseconds(50) * moment);
  }
  EXPECT_TRUE(serveUntil([&] { return lumora::tests::openDescriptors() <= descriptors; }))
      << lumora::tests::openDescriptors() << " descriptors, " << descriptors << " before";
}

TEST_F(BusFaultsTest, announcement_failsWithTheReason_whenThereIsNoBus) {
  const lumora::tests::SandboxServer server;
  const auto run = server.administrate({"announce"});
  EXPECT_EQ(run.status, 1);
  EXPECT_THAT(run.standardError, HasSubstr("lumora-sandbox-announce: the system bus cannot be reached: "));
}

} // namespace
