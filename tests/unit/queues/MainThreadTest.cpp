#include "support/MainLoop.h"

#include <LumoraKit/platform/MainThread.h>
#include <LumoraKit/platform/linux/Backends.h>

#include <glib.h>
#include <gmock/gmock.h>

#include <atomic>
#include <chrono>
#include <memory>
#include <optional>
#include <thread>
#include <vector>

using lumora::tests::generousLimit;
using testing::ElementsAre;
using testing::IsEmpty;

namespace {

class MainThread : public testing::Test {
protected:
  bool serveUntil(const std::function<bool()>& condition) { return main_->serveUntil(condition, generousLimit); }

  const std::shared_ptr<lumora::MainThread> main_ = lumora::backend::makeMainThread();
  std::vector<int> ran_;
};

using MainThreadDeathTest = MainThread;

} // namespace

TEST_F(MainThread, isCurrent_onTheFirstThreadOnly) {
  EXPECT_TRUE(main_->isCurrent());
  bool elsewhere = true;
  std::thread([&] { elsewhere = main_->isCurrent(); }).join();
  EXPECT_FALSE(elsewhere);
}

TEST_F(MainThread, runsTasksInTheOrderOfTheCalls_whenServed) {
  for (int i = 1; i <= 3; ++i) {
    main_->post([this, i] { ran_.push_back(i); });
  }
  ASSERT_TRUE(serveUntil([&] { return ran_.size() == 3; }));
  EXPECT_THAT(ran_, ElementsAre(1, 2, 3));
}

TEST_F(MainThread, doesNotRunInline_whenPostedOnTheMainThread) {
  main_->post([this] { ran_.push_back(1); });
  EXPECT_THAT(ran_, IsEmpty());
  ASSERT_TRUE(serveUntil([&] { return !ran_.empty(); }));
}

TEST_F(MainThread, keepsTasks_whenPostedWhileNobodyServes) {
  std::thread([&] {
    for (int i = 1; i <= 3; ++i) {
      main_->post([this, i] { ran_.push_back(i); });
    }
  }).join();
  EXPECT_THAT(ran_, IsEmpty());
  ASSERT_TRUE(serveUntil([&] { return ran_.size() == 3; }));
  EXPECT_THAT(ran_, ElementsAre(1, 2, 3));
}

TEST_F(MainThread, runsATaskPostedByATask_whenServed) {
  main_->post([this] { main_->post([this] { ran_.push_back(2); }); });
  ASSERT_TRUE(serveUntil([&] { return !ran_.empty(); }));
  EXPECT_THAT(ran_, ElementsAre(2));
}

TEST_F(MainThread, servesTasksBehind_whenATaskRunsALoopOfItsOwn) {
  main_->post([this] {
    EXPECT_TRUE(serveUntil([&] { return !ran_.empty(); }));
    ran_.push_back(2);
  });
  main_->post([this] { ran_.push_back(1); });
  ASSERT_TRUE(serveUntil([&] { return ran_.size() == 2; }));
  EXPECT_THAT(ran_, ElementsAre(1, 2));
}

TEST_F(MainThread, runAndWaitRunsInline_whenAlreadyThere) {
  main_->runAndWait([this] { ran_.push_back(1); });
  EXPECT_THAT(ran_, ElementsAre(1));
}

TEST_F(MainThread, runAndWaitReturnsAfterTheTask_whenCalledElsewhere) {
  std::atomic<bool> returned{false};
  std::jthread other([&] {
    main_->runAndWait([this] {
      EXPECT_TRUE(main_->isCurrent());
      ran_.push_back(1);
    });
    ran_.push_back(2);
    returned = true;
  });
  ASSERT_TRUE(serveUntil([&] { return returned.load(); }));
  EXPECT_THAT(ran_, ElementsAre(1, 2));
}

TEST_F(MainThread, runAndWaitComesInTurn_whenTasksWereQueuedBefore) {
  std::atomic<bool> returned{false};
  main_->post([this] { ran_.push_back(1); });
  std::jthread other([&] {
    main_->runAndWait([this] { ran_.push_back(2); });
    returned = true;
  });
  ASSERT_TRUE(serveUntil([&] { return returned.load(); }));
  EXPECT_THAT(ran_, ElementsAre(1, 2));
}

TEST_F(MainThread, serveUntilReturnsAtOnce_whenTheConditionHoldsAlready) {
  main_->post([this] { ran_.push_back(1); });
  EXPECT_TRUE(main_->serveUntil([] { return true; }, std::chrono::milliseconds(0)));
  EXPECT_THAT(ran_, IsEmpty());
}

TEST_F(MainThread, serveUntilGivesUp_whenTheTimeIsOver) {
  EXPECT_FALSE(main_->serveUntil([] { return false; }, std::chrono::milliseconds(1)));
}

TEST_F(MainThread, serveUntilSeesTheCondition_whenAnotherThreadOnlySetsAFlag) {
  std::atomic<bool> flag{false};
  std::jthread other([&] { flag = true; });
  EXPECT_TRUE(main_->serveUntil([&] { return flag.load(); }));
}

TEST_F(MainThread, serveUntilStopsAfterThePieceOfWork_whenTheConditionHolds) {
  for (int i = 1; i <= 3; ++i) {
    main_->post([this, i] { ran_.push_back(i); });
  }
  ASSERT_TRUE(serveUntil([&] { return ran_.size() == 2; }));
  EXPECT_THAT(ran_, ElementsAre(1, 2));
}

TEST_F(MainThreadDeathTest, stopsTheProcess_whenServedByAnotherThread) {
  // The dying process starts a thread, which a plain fork of this one may not do.
  GTEST_FLAG_SET(death_test_style, "threadsafe");
  EXPECT_DEATH(std::thread([&] { serveUntil([] { return true; }); }).join(),
               "the caller is on the main thread, in serveUntil of MainThread");
}

TEST_F(MainThread, dropsItsTasks_whenItDies) {
  const auto life = std::make_shared<int>(0);
  auto main = lumora::backend::makeMainThread();
  main->post([life] { ++*life; });
  main.reset();
  EXPECT_EQ(*life, 0);
  EXPECT_EQ(life.use_count(), 1);
}

TEST_F(MainThread, runsTasks_whenTheApplicationRunsAGLibMainLoop) {
  GMainLoop* const loop = g_main_loop_new(nullptr, FALSE);
  std::atomic<int> onMain{0};
  std::jthread other([&] {
    for (int i = 0; i < 100; ++i) {
      main_->runAndWait([&] { onMain += main_->isCurrent(); });
    }
    main_->post([&] { g_main_loop_quit(loop); });
  });
  g_main_loop_run(loop);
  g_main_loop_unref(loop);
  EXPECT_EQ(onMain, 100);
}

TEST_F(MainThread, letsTheApplicationsOwnEventsIn_whenATaskAlwaysPostsAnother) {
  std::function<void()> again = [&] { main_->post(again); };
  again();
  bool sourceRan = false;
  g_timeout_add(
      0,
      [](gpointer flag) -> gboolean {
        *static_cast<bool*>(flag) = true;
        return G_SOURCE_REMOVE;
      },
      &sourceRan);
  EXPECT_TRUE(serveUntil([&] { return sourceRan; }));
}
