#include "DiscoveryTest.h"

#include <LumoraKit/platform/MainThread.h>
#include <LumoraKit/testing/ManualQueues.h>

#include <functional>
#include <thread>

using lumora::Platform;
using lumora::tests::Listener;
using lumora::tests::serveUntil;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::UnorderedElementsAre;

namespace {

using SearchTest = lumora::tests::DiscoveryTest;

// The daemon tells of each service five times: on loopback and on the wire, over both protocols each.
TEST_F(SearchTest, service_isFoundOnceAndLostOnce_howeverManyNetworks) {
  network_.here().publish("Studio");
  browse();
  ASSERT_TRUE(waitFor("+Studio"));
  network_.here().publish("Later");
  ASSERT_TRUE(waitFor("+Later"));
  network_.here().withdraw("Studio");
  ASSERT_TRUE(waitFor("-Studio"));
  network_.here().withdraw("Later");
  ASSERT_TRUE(waitFor("-Later"));
  EXPECT_THAT(listener_.told, ElementsAre("+Studio", "+Later", "-Studio", "-Later"));
}

TEST_F(SearchTest, lost_isToldWithTheSameObject) {
  network_.here().publish("Studio");
  browse();
  const auto service = find("Studio");
  network_.here().withdraw("Studio");
  ASSERT_TRUE(waitFor("-Studio"));
  EXPECT_THAT(listener_.services, IsEmpty());
}

TEST_F(SearchTest, names_mayBeAnyText) {
  for (const char* const name : {"Stüdio №1. (Ground floor)", "日本語", "a.b\\c"}) {
    network_.here().publish(name);
  }
  browse();
  EXPECT_TRUE(serveUntil([&] { return listener_.told.size() == 3; }));
  EXPECT_THAT(listener_.told, UnorderedElementsAre("+Stüdio №1. (Ground floor)", "+日本語", "+a.b\\c"));
  resolve(find("a.b\\c"));
  EXPECT_THAT(resolver_->told, ElementsAre("resolved a.b\\c"));
}

TEST_F(SearchTest, searches_areEachToldOfEverything) {
  network_.here().publish("Studio");
  browse();
  ASSERT_TRUE(waitFor("+Studio"));
  Listener other;
  const auto second = browse(other);
  ASSERT_TRUE(serveUntil([&] { return other.count("+Studio") == 1; }));
  EXPECT_NE(other.service("Studio"), listener_.service("Studio"));
  browser_.reset();
  network_.here().withdraw("Studio");
  ASSERT_TRUE(serveUntil([&] { return other.count("-Studio") == 1; }));
  EXPECT_THAT(listener_.told, ElementsAre("+Studio"));
}

TEST_F(SearchTest, ofAnotherType_findsNothing) {
  network_.here().publish("Studio");
  Listener other;
  const auto browser = discovery_->browse("_ipp._tcp", other.events(), nullptr);
  browse();
  ASSERT_TRUE(waitFor("+Studio"));
  EXPECT_THAT(other.told, IsEmpty());
}

TEST_F(SearchTest, ofATypeThatIsNone_findsNothingAndHurtsNobody) {
  Listener other;
  const auto browser = discovery_->browse("no type", other.events(), nullptr);
  network_.here().publish("Studio");
  browse();
  ASSERT_TRUE(waitFor("+Studio"));
  EXPECT_THAT(other.told, IsEmpty());
}

TEST_F(SearchTest, mayEndWhileItTells) {
  network_.here().publish("Studio");
  network_.here().publish("Other");
  int told = 0;
  browser_ = discovery_->browse(type,
                                {.found =
                                     [&](const auto&) {
                                       ++told;
                                       browser_.reset();
                                     },
                                 .lost = [](const auto&) {}},
                                nullptr);
  ASSERT_TRUE(serveUntil([&] { return told > 0; }));
  browse();
  ASSERT_TRUE(waitFor("+Studio"));
  ASSERT_TRUE(waitFor("+Other"));
  EXPECT_EQ(told, 1);
}

TEST_F(SearchTest, mayEndAtOnce) {
  constexpr int searches = 50;
  network_.here().publish("Studio");
  for (int i = 0; i < searches; ++i) {
    Listener dead;
    browse(dead);
  }
  browse();
  EXPECT_TRUE(waitFor("+Studio"));
}

TEST_F(SearchTest, outlivesItsDiscovery) {
  browse();
  discovery_.reset();
  network_.here().publish("Studio");
  EXPECT_TRUE(waitFor("+Studio"));
}

/// A main thread that is served by a loop of the application's own.
class OwnLoop {
public:
  OwnLoop() {
    auto platform = previous_;
    platform.mainThread = queues_->mainThread();
    Platform::install(platform);
  }
  OwnLoop(const OwnLoop&) = delete;
  OwnLoop& operator=(const OwnLoop&) = delete;
  ~OwnLoop() { Platform::install(previous_); }

  bool serveUntil(const std::function<bool()>& condition) {
    const auto limit = std::chrono::steady_clock::now() + lumora::tests::generousLimit;
    while (!condition() && std::chrono::steady_clock::now() < limit) {
      queues_->runAll();
      std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }
    return condition();
  }

private:
  const Platform previous_ = Platform::current();
  const std::shared_ptr<lumora::fakes::ManualQueues> queues_ = std::make_shared<lumora::fakes::ManualQueues>();
};

// Nobody iterates GLib's default context here.
TEST_F(SearchTest, isTold_whateverLoopServesTheMainThread) {
  OwnLoop loop;
  network_.here().publish("Studio");
  browse();
  ASSERT_TRUE(loop.serveUntil([&] { return listener_.count("+Studio") == 1; }));
  const auto service = listener_.service("Studio");
  service->setDelegate(resolver_);
  service->resolveWithTimeout(longLimit);
  EXPECT_TRUE(loop.serveUntil([&] { return !resolver_->told.empty(); }));
  EXPECT_THAT(resolver_->told, ElementsAre("resolved Studio"));
  browser_.reset();
}

class TwoHostsTest : public lumora::tests::DiscoveryTest {
protected:
  void startNetwork() override {
    DiscoveryTest::startNetwork();
    ASSERT_TRUE(network_.startOtherHost());
  }
};

TEST_F(TwoHostsTest, serviceOfTheOtherHost_isFoundResolvedAndLost) {
  network_.there().publish("Studio", 8171, {{"host", "studio.example.org"}, {"port", "8171"}});
  browse();
  const auto service = find("Studio");
  ASSERT_TRUE(service);
  resolve(service);
  EXPECT_EQ(service->textRecord(), (lumora::TextRecord{{"host", "studio.example.org"}, {"port", "8171"}}));
  network_.there().stopDaemon();
  ASSERT_TRUE(waitFor("-Studio"));
  EXPECT_THAT(listener_.told, ElementsAre("+Studio", "-Studio"));
}

TEST_F(TwoHostsTest, servicesOfBoth_areFound) {
  network_.here().publish("Near");
  network_.there().publish("Far");
  browse();
  EXPECT_TRUE(waitFor("+Near"));
  EXPECT_TRUE(waitFor("+Far"));
}

} // namespace
