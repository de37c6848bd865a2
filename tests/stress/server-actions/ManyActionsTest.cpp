#include "support/Descriptors.h"

#include <LumoraKit/actions/LMRActionFactory.h>

#include <gtest/gtest.h>

#include <atomic>
#include <string>
#include <thread>
#include <vector>

using lumora::tests::openDescriptors;
using lumora::tests::residentMemory;

namespace {

/// Real runs of the shortest tool there is.
class ManyActionsTest : public testing::Test {
protected:
  static constexpr int threads = 4;

  /// Runs so many actions on several threads; how many failed.
  static int run(int count) {
    std::atomic<int> failed = 0;
    {
      std::vector<std::jthread> runners;
      for (int thread = 0; thread < threads; ++thread) {
        runners.emplace_back([&failed, count] {
          for (int index = 0; index < count / threads; ++index) {
            failed += runOne() ? 0 : 1;
          }
        });
      }
    }
    return failed;
  }

  static bool runOne() {
    const auto action = LMRActionFactory::actionToListCurrentTransfers();
    action->setTool("/bin/true");
    action->setExpectXMLResponse(false);
    action->runSynchronously();
    return action->error() == nullptr;
  }
};

TEST_F(ManyActionsTest, leaveDescriptorsThreadsAndMemoryFlat) {
  // What is made once, and what the allocator keeps for each thread, is there after the first ones.
  ASSERT_EQ(run(1'000), 0);
  const auto descriptors = openDescriptors();
  const auto threadsBefore = lumora::tests::threadCount();
  const auto memory = residentMemory();
  EXPECT_EQ(run(10'000), 0);
  EXPECT_EQ(openDescriptors(), descriptors);
  EXPECT_EQ(lumora::tests::threadCount(), threadsBefore);
  if (!lumora::tests::memoryCanBeMeasured()) {
    GTEST_SKIP() << "memory is not measured under a sanitizer; descriptors and threads stayed flat";
  }
  EXPECT_LT(residentMemory(), memory + memory / 10 + 1024 * 1024);
  RecordProperty("memory_before", std::to_string(memory));
  RecordProperty("memory_after", std::to_string(residentMemory()));
}

} // namespace
