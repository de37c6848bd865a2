#include "SampleActions.h"

#include <gmock/gmock.h>

using lumora::tests::Listener;
using lumora::tests::listenerOf;
using lumora::tests::SampleAction;
using testing::ElementsAre;
using testing::IsEmpty;

namespace {

class OtherAction : public KTAction {
private:
  void startExecution() override { finish(); }
};

class DerivedListener : public Listener {};

} // namespace

TEST(ActionTarget, receivesTheAction_whenTheSelectorTakesItsClass) {
  const auto action = SampleAction::succeeding();
  const auto listener = std::make_shared<Listener>();
  action->setFinishTarget_selector(listener, &Listener::finishedWithAction);
  action->runSynchronously();
  EXPECT_EQ(listener->received, action);
}

TEST(ActionTarget, receivesTheAction_whenTheSelectorTakesTheBaseClass) {
  const auto action = SampleAction::failing();
  const auto listener = std::make_shared<Listener>();
  action->setErrorTarget_selector(listener, &Listener::failedWithBase);
  action->runSynchronously();
  EXPECT_EQ(listener->received, action);
}

TEST(ActionTarget, isTold_whenTheSelectorIsOfABaseClass) {
  const auto action = SampleAction::succeeding();
  const auto listener = std::make_shared<DerivedListener>();
  action->setFinishTarget_selector(listener, &Listener::finishedWithAction);
  action->runSynchronously();
  EXPECT_THAT(listener->events, ElementsAre("finished"));
}

TEST(ActionTargetDeathTest, stopsTheProcess_whenTheSelectorTakesAnotherClass) {
  const auto listener = std::make_shared<Listener>();
  const auto action = std::make_shared<OtherAction>();
  action->setFinishTarget_selector(listener, &Listener::finishedWithAction);
  EXPECT_DEATH(action->runSynchronously(), "the selector takes the action's own class, in finish of KTAction");
}

TEST(ActionTarget, isNotTold_whenItDiedBeforeTheEnd) {
  const auto action = SampleAction::succeeding();
  auto listener = listenerOf(*action);
  const std::weak_ptr<Listener> weak = listener;
  listener.reset();
  EXPECT_TRUE(weak.expired());
  action->runSynchronously();
  EXPECT_FALSE(action->isRunning());
}

TEST(ActionTarget, isNotTold_whenCleared) {
  const auto action = SampleAction::succeeding();
  const auto listener = listenerOf(*action);
  action->setFinishTarget(nullptr);
  action->runSynchronously();
  EXPECT_THAT(listener->events, IsEmpty());
}

TEST(ActionTarget, isNotTold_whenANullTargetReplacedIt) {
  const auto action = SampleAction::failing();
  const auto listener = listenerOf(*action);
  action->setErrorTarget_selector(std::shared_ptr<Listener>(), &Listener::failed);
  action->runSynchronously();
  EXPECT_THAT(listener->events, IsEmpty());
}

TEST(ActionTarget, errorTargetStays_whenTheFinishTargetIsCleared) {
  const auto action = SampleAction::failing();
  const auto listener = listenerOf(*action);
  action->setFinishTarget(nullptr);
  action->runSynchronously();
  EXPECT_THAT(listener->events, ElementsAre("failed"));
}

TEST(ActionTarget, lastOneIsTold_whenSetTwice) {
  const auto action = SampleAction::succeeding();
  const auto first = listenerOf(*action);
  const auto second = listenerOf(*action);
  action->runSynchronously();
  EXPECT_THAT(first->events, IsEmpty());
  EXPECT_THAT(second->events, ElementsAre("finished"));
}

TEST(ActionTarget, isNotTold_whenClearedByStopExecution) {
  const auto action = SampleAction::succeeding();
  const auto listener = listenerOf(*action);
  action->whenStopping = [](SampleAction& self) { self.setFinishTarget(nullptr); };
  action->runSynchronously();
  EXPECT_THAT(listener->events, IsEmpty());
}
