#include "DiscoveryTest.h"

#include <LumoraKit/platform/MainThread.h>

using lumora::TextRecord;
using lumora::tests::serveUntil;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;

namespace {

constexpr int timedOut = -2;

class ResolutionTest : public lumora::tests::DiscoveryTest {
protected:
  std::shared_ptr<lumora::NetService> findStudio() {
    browse();
    return find("Studio");
  }
};

TEST_F(ResolutionTest, record_isThere_afterASuccess) {
  network_.here().publish("Studio", 8171, {{"host", "studio.example.org"}, {"port", "8171"}});
  const auto service = findStudio();
  EXPECT_EQ(service->textRecord(), std::nullopt);
  resolve(service);
  EXPECT_THAT(resolver_->told, ElementsAre("resolved Studio"));
  EXPECT_EQ(service->textRecord(), (TextRecord{{"host", "studio.example.org"}, {"port", "8171"}}));
}

TEST_F(ResolutionTest, values_mayBeBinaryEmptyOrAbsent) {
  const std::string binary("\0\x01\xff=\x80", 5);
  network_.here().publish("Studio", 8170, {{"Binary", binary}, {"empty", ""}, {"absent", std::nullopt}});
  const auto service = findStudio();
  resolve(service);
  EXPECT_EQ(service->textRecord(), (TextRecord{{"binary", binary}, {"empty", ""}, {"absent", std::nullopt}}));
}

TEST_F(ResolutionTest, record_isNone_whenTheServiceHasNone) {
  network_.here().publish("Studio");
  const auto service = findStudio();
  resolve(service);
  EXPECT_THAT(resolver_->told, ElementsAre("resolved Studio"));
  EXPECT_EQ(service->textRecord(), std::nullopt);
}

TEST_F(ResolutionTest, record_isTheNewOne_whenResolvedAgain) {
  network_.here().publish("Studio", 8170, {{"host", "old"}});
  const auto old = findStudio();
  resolve(old);
  network_.here().publish("Studio", 8170, {{"host", "new"}});
  EXPECT_TRUE(serveUntil([&] {
    const auto current = listener_.service("Studio");
    if (!current) {
      return false;
    }
    resolve(current);
    return current->textRecord() == TextRecord{{"host", "new"}};
  }));
}

TEST_F(ResolutionTest, fails_whenTheServiceIsGone) {
  network_.here().publish("Studio");
  const auto service = findStudio();
  network_.here().withdraw("Studio");
  ASSERT_TRUE(waitFor("-Studio"));
  resolve(service, std::chrono::milliseconds(200));
  EXPECT_THAT(resolver_->told, ElementsAre("failed Studio"));
  EXPECT_EQ(resolver_->error->code(), timedOut);
  EXPECT_EQ(resolver_->error->localizedDescription(), "'Studio' did not answer within 200 ms");
}

TEST_F(ResolutionTest, goesOn_whenTheLimitIsLongerThanTheDaemonsOwn) {
  network_.here().publish("Studio");
  const auto service = findStudio();
  network_.here().withdraw("Studio");
  ASSERT_TRUE(waitFor("-Studio"));
  service->setDelegate(resolver_);
  service->resolveWithTimeout(longLimit);
  // The daemon asks for five seconds.
  EXPECT_FALSE(lumora::Platform::current().mainThread->serveUntil([&] { return !resolver_->told.empty(); },
                                                                  std::chrono::seconds(6)));
  network_.here().publish("Studio");
  EXPECT_TRUE(serveUntil([&] { return !resolver_->told.empty(); }));
  EXPECT_THAT(resolver_->told, ElementsAre("resolved Studio"));
}

TEST_F(ResolutionTest, isToldOnce_whenBegunAnew) {
  network_.here().publish("Studio");
  const auto service = findStudio();
  service->setDelegate(resolver_);
  constexpr int beginnings = 20;
  for (int i = 0; i < beginnings; ++i) {
    service->resolveWithTimeout(longLimit);
  }
  ASSERT_TRUE(serveUntil([&] { return !resolver_->told.empty(); }));
  // What else was to come would be before this.
  network_.here().publish("Other");
  ASSERT_TRUE(waitFor("+Other"));
  EXPECT_THAT(resolver_->told, ElementsAre("resolved Studio"));
}

TEST_F(ResolutionTest, isToldNobody_whenTheServiceOrTheDelegateDied) {
  network_.here().publish("Studio");
  const auto service = findStudio();
  auto dead = std::make_shared<lumora::tests::Resolver>();
  service->setDelegate(dead);
  service->resolveWithTimeout(longLimit);
  dead.reset();
  listener_.services.clear();
  browser_.reset();
  browse();
  const auto second = find("Studio");
  second->setDelegate(resolver_);
  second->resolveWithTimeout(std::chrono::milliseconds(0));
  listener_.services.clear();
  browser_.reset();
  EXPECT_TRUE(serveUntil([&] { return !resolver_->told.empty(); }));
}

TEST_F(ResolutionTest, isToldOnALaterTurn_alsoWithoutAnyTime) {
  network_.here().publish("Studio");
  const auto service = findStudio();
  service->setDelegate(resolver_);
  service->resolveWithTimeout(std::chrono::milliseconds(0));
  EXPECT_THAT(resolver_->told, IsEmpty());
  EXPECT_TRUE(serveUntil([&] { return !resolver_->told.empty(); }));
}

TEST_F(ResolutionTest, works_whenTheSearchIsOver) {
  network_.here().publish("Studio");
  const auto service = findStudio();
  browser_.reset();
  discovery_.reset();
  resolve(service);
  EXPECT_THAT(resolver_->told, ElementsAre("resolved Studio"));
}

TEST_F(ResolutionTest, endsAtItsLimit_whenTheDaemonIsFrozen) {
  network_.here().publish("Studio");
  const auto service = findStudio();
  network_.here().freezeDaemon();
  resolve(service, std::chrono::milliseconds(200));
  EXPECT_EQ(resolver_->error->code(), timedOut);
  network_.here().thawDaemon();
  resolve(service);
  EXPECT_THAT(resolver_->told, ElementsAre("failed Studio", "resolved Studio"));
}

TEST_F(ResolutionTest, fails_whenTheDaemonDies) {
  network_.here().publish("Studio");
  const auto service = findStudio();
  service->setDelegate(resolver_);
  network_.here().freezeDaemon();
  service->resolveWithTimeout(longLimit);
  network_.here().killDaemon();
  ASSERT_TRUE(serveUntil([&] { return !resolver_->told.empty(); }));
  EXPECT_THAT(resolver_->told, ElementsAre("failed Studio"));
  EXPECT_THAT(resolver_->error->localizedDescription(), HasSubstr("is not running"));
}

} // namespace
