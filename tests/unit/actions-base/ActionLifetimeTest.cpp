#include "SampleActions.h"
#include "support/MainLoop.h"

#include <gmock/gmock.h>

using lumora::tests::Listener;
using lumora::tests::listenerOf;
using lumora::tests::SampleAction;
using lumora::tests::serveUntil;
using testing::ElementsAre;

TEST(ActionLifetime, livesUntilTheEnd_whenTheCallerDropsIt) {
  auto action = SampleAction::waiting();
  const auto listener = listenerOf(*action);
  const std::weak_ptr<SampleAction> weak = action;
  action->start();
  action.reset();
  ASSERT_FALSE(weak.expired());
  weak.lock()->end();
  ASSERT_TRUE(serveUntil([&] { return weak.expired(); }));
  EXPECT_THAT(listener->events, ElementsAre("finished"));
}

TEST(ActionLifetime, dies_whenItIsNeverStarted) {
  auto action = SampleAction::waiting();
  const std::weak_ptr<SampleAction> weak = action;
  action.reset();
  EXPECT_TRUE(weak.expired());
}

TEST(ActionLifetime, doesNotKeepItsTargetAlive_whenRunning) {
  const auto action = SampleAction::waiting();
  auto listener = listenerOf(*action);
  const std::weak_ptr<Listener> weak = listener;
  action->start();
  listener.reset();
  EXPECT_TRUE(weak.expired());
  action->end();
  EXPECT_TRUE(serveUntil([&] { return !action->isRunning(); }));
}

TEST(ActionLifetime, survivesItsLastReference_whenAnObserverDropsIt) {
  auto action = SampleAction::succeeding();
  const auto listener = listenerOf(*action);
  lumora::Connection connection;
  connection = action->observeRunning([&] {
    connection.disconnect();
    action.reset();
  });
  SampleAction& started = *action;
  started.start();
  ASSERT_TRUE(serveUntil([&] { return !listener->events.empty(); }));
  EXPECT_THAT(listener->events, ElementsAre("finished"));
}

TEST(ActionLifetime, letsItsConnectionsOutliveIt_whenItDies) {
  auto action = SampleAction::waiting();
  auto connection = action->observeRunning([] {});
  action.reset();
  connection.disconnect();
}
