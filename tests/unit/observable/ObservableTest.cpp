#include <LumoraKit/platform/Observable.h>

#include <gmock/gmock.h>

#include <memory>
#include <optional>
#include <string>
#include <thread>
#include <vector>

using lumora::Connection;
using lumora::Notifier;
using lumora::Observable;
using testing::ElementsAre;
using testing::IsEmpty;

TEST(Observable, tellsItsObserver_whenAnEqualValueIsSet) {
  Observable<int> value(1);
  int told = 0;
  const auto connection = value.observe([&] { ++told; });
  value.set(2);
  value.set(2);
  EXPECT_EQ(told, 2);
  EXPECT_EQ(value.get(), 2);
}

TEST(Observable, tellsItsObserver_whenTouched) {
  Observable<std::string> value("unchanged");
  std::vector<std::string> seen;
  const auto connection = value.observe([&] { seen.push_back(value.get()); });
  value.touch();
  EXPECT_THAT(seen, ElementsAre("unchanged"));
}

TEST(Observable, observerPullsTheNewestValue_whenAnObserverSetsItAgain) {
  Observable<int> value(0);
  std::vector<int> seen;
  const auto setting = value.observe([&] {
    if (value.get() == 1) {
      value.set(2);
    }
  });
  const auto seeing = value.observe([&] { seen.push_back(value.get()); });
  value.set(1);
  EXPECT_THAT(seen, ElementsAre(2, 2));
}

TEST(Notifier, tellsInTheOrderOfRegistration_whenNotified) {
  Notifier notifier;
  std::vector<int> told;
  const auto first = notifier.observe([&] { told.push_back(1); });
  const auto second = notifier.observe([&] { told.push_back(2); });
  const auto third = notifier.observe([&] { told.push_back(3); });
  notifier.notify();
  EXPECT_THAT(told, ElementsAre(1, 2, 3));
}

TEST(Notifier, doesNotTell_whenTheConnectionIsDisconnected) {
  Notifier notifier;
  int told = 0;
  auto connection = notifier.observe([&] { ++told; });
  connection.disconnect();
  connection.disconnect();
  notifier.notify();
  EXPECT_EQ(told, 0);
}

TEST(Notifier, doesNotTell_whenTheConnectionWasDestroyed) {
  Notifier notifier;
  int told = 0;
  {
    const auto connection = notifier.observe([&] { ++told; });
  }
  notifier.notify();
  EXPECT_EQ(told, 0);
}

TEST(Notifier, goesOnTelling_whenTheConnectionIsMoved) {
  Notifier notifier;
  int told = 0;
  auto connection = notifier.observe([&] { ++told; });
  const Connection moved = std::move(connection);
  notifier.notify();
  EXPECT_EQ(told, 1);
}

TEST(Notifier, endsTheObservationBefore_whenAConnectionIsAssigned) {
  Notifier notifier;
  std::vector<int> told;
  auto connection = notifier.observe([&] { told.push_back(1); });
  connection = notifier.observe([&] { told.push_back(2); });
  notifier.notify();
  EXPECT_THAT(told, ElementsAre(2));
}

TEST(Notifier, doesNotTellAnObserver_whenItWasAddedDuringTheNotice) {
  Notifier notifier;
  std::vector<int> told;
  Connection late;
  const auto first = notifier.observe([&] {
    told.push_back(1);
    late = notifier.observe([&] { told.push_back(2); });
  });
  notifier.notify();
  EXPECT_THAT(told, ElementsAre(1));
  notifier.notify();
  EXPECT_THAT(told, ElementsAre(1, 1));
}

TEST(Notifier, doesNotTellAnObserver_whenItWasRemovedDuringTheNotice) {
  Notifier notifier;
  std::vector<int> told;
  Connection second;
  const auto first = notifier.observe([&] { second.disconnect(); });
  second = notifier.observe([&] { told.push_back(2); });
  notifier.notify();
  EXPECT_THAT(told, IsEmpty());
}

TEST(Notifier, isTold_whenAnObserverDisconnectsItself) {
  Notifier notifier;
  const auto life = std::make_shared<int>(0);
  Connection connection;
  connection = notifier.observe([&connection, life] {
    connection.disconnect();
    ++*life;
  });
  notifier.notify();
  notifier.notify();
  EXPECT_EQ(*life, 1);
  EXPECT_EQ(life.use_count(), 1);
}

// The notifier, the observer and the connection, dying in each order.

TEST(NotifierLifetime, connectionEndsQuietly_whenTheNotifierDiedBefore) {
  auto notifier = std::make_unique<Notifier>();
  auto connection = notifier->observe([] {});
  notifier.reset();
  connection.disconnect();
}

TEST(NotifierLifetime, tellsEveryObserver_whenTheNotifierDiesInsideANotice) {
  auto notifier = std::make_unique<Notifier>();
  std::vector<int> told;
  const auto first = notifier->observe([&] {
    told.push_back(1);
    notifier.reset();
  });
  const auto second = notifier->observe([&] { told.push_back(2); });
  notifier->notify();
  EXPECT_THAT(told, ElementsAre(1, 2));
}

TEST(NotifierLifetime, releasesTheObserver_whenTheNotifierDiesAndThenTheConnection) {
  auto notifier = std::make_unique<Notifier>();
  const auto life = std::make_shared<int>(0);
  auto connection = notifier->observe([life] {});
  notifier.reset();
  connection.disconnect();
  EXPECT_EQ(life.use_count(), 1);
}

TEST(NotifierLifetime, releasesTheObserver_whenTheConnectionDiesFirst) {
  Notifier notifier;
  const auto life = std::make_shared<int>(0);
  {
    const auto connection = notifier.observe([life] {});
  }
  EXPECT_EQ(life.use_count(), 1);
}

TEST(NotifierLifetime, doesNotLock_whenAnObserverHoldsAnotherConnectionOfTheSameNotifier) {
  Notifier notifier;
  auto inner = std::make_shared<Connection>(notifier.observe([] {}));
  auto outer = std::make_optional(notifier.observe([inner] {}));
  inner.reset();
  outer.reset();
  notifier.notify();
}

TEST(NotifierThreads, tellsOnTheNotifyingThread_whenObserversComeAndGoOnOthers) {
  Notifier notifier;
  std::atomic<int> elsewhere{0};
  const auto here = std::this_thread::get_id();
  std::atomic<bool> stop{false};
  std::vector<std::jthread> threads;
  for (int i = 0; i < 4; ++i) {
    threads.emplace_back([&] {
      while (!stop) {
        const auto connection = notifier.observe([&] { elsewhere += std::this_thread::get_id() != here; });
      }
    });
  }
  for (int i = 0; i < 1000; ++i) {
    notifier.notify();
  }
  stop = true;
  EXPECT_EQ(elsewhere, 0);
}
