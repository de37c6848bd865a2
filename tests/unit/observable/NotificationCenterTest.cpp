#include <LumoraKit/platform/NotificationCenter.h>

#include <gmock/gmock.h>

#include <any>
#include <string>
#include <thread>
#include <vector>

using lumora::NotificationCenter;
using testing::ElementsAre;
using testing::IsEmpty;

namespace {

class NotificationCenterTest : public testing::Test {
protected:
  NotificationCenter::Observer noting() {
    return [this](const std::any& object) { objects_.push_back(std::any_cast<std::string>(object)); };
  }

  NotificationCenter center_;
  std::vector<std::string> objects_;
};

} // namespace

TEST_F(NotificationCenterTest, tellsWithTheObject_whenANoticeOfThatNameIsPosted) {
  const auto connection = center_.observe("login", noting());
  center_.post("login", std::string("session"));
  EXPECT_THAT(objects_, ElementsAre("session"));
}

TEST_F(NotificationCenterTest, tellsNobody_whenTheNameIsAnother) {
  const auto connection = center_.observe("login", noting());
  center_.post("logout", std::string("session"));
  EXPECT_THAT(objects_, IsEmpty());
}

TEST_F(NotificationCenterTest, tellsEverybodyBeforeTheReturn_whenThereAreSeveral) {
  const auto first = center_.observe("login", noting());
  const auto second = center_.observe("login", noting());
  center_.post("login", std::string("session"));
  EXPECT_THAT(objects_, ElementsAre("session", "session"));
}

TEST_F(NotificationCenterTest, doesNotTell_whenTheConnectionEnded) {
  { const auto connection = center_.observe("login", noting()); }
  center_.post("login", std::string("session"));
  EXPECT_THAT(objects_, IsEmpty());
}

TEST_F(NotificationCenterTest, tellsOfBoth_whenAnObserverPostsAnotherNotice) {
  const auto second = center_.observe("second", noting());
  const auto first = center_.observe("first", [&](const std::any& object) { center_.post("second", object); });
  center_.post("first", std::string("object"));
  EXPECT_THAT(objects_, ElementsAre("object"));
}

TEST_F(NotificationCenterTest, tellsOnThePostingThread_whenThatIsAnother) {
  std::thread::id where;
  const auto connection = center_.observe("login", [&](const std::any&) { where = std::this_thread::get_id(); });
  std::thread::id poster;
  std::thread([&] {
    poster = std::this_thread::get_id();
    center_.post("login", {});
  }).join();
  EXPECT_EQ(where, poster);
}

TEST(NotificationCenterLifetime, connectionEndsQuietly_whenTheCenterDiedBefore) {
  lumora::Connection connection;
  {
    NotificationCenter center;
    connection = center.observe("login", [](const std::any&) {});
  }
  connection.disconnect();
}
