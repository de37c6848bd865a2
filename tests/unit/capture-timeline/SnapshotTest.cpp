#include <LumoraKit/platform/linux/gstreamer/Snapshot.h>

#include <gtest/gtest.h>

#include <thread>

namespace lumora::backend {

TEST(Snapshot, showsTheLastValue_whenReplaced) {
  Snapshot<int> snapshot;
  EXPECT_EQ(*snapshot.read(), 0);
  snapshot.replace(7);
  EXPECT_EQ(*snapshot.read(), 7);
}

TEST(Snapshot, keepsAValue_whenItIsReplacedWhileRead) {
  Snapshot<std::shared_ptr<int>> snapshot;
  auto value = std::make_shared<int>(1);
  const std::weak_ptr<int> watched = value;
  snapshot.replace(std::move(value));
  {
    const auto reading = snapshot.read();
    snapshot.replace(nullptr);
    EXPECT_EQ(**reading, 1);
  }
  EXPECT_FALSE(watched.expired());
  snapshot.replace(nullptr);
  EXPECT_TRUE(watched.expired());
}

TEST(Snapshot, readersAlwaysSeeAWholeValue_whenItIsReplacedMeanwhile) {
  struct Pair {
    int first = 0;
    int second = 0;
  };
  Snapshot<std::shared_ptr<const Pair>> snapshot;
  snapshot.replace(std::make_shared<const Pair>());
  std::atomic<bool> done{false};
  std::vector<std::thread> readers;
  for (int i = 0; i < 3; ++i) {
    readers.emplace_back([&] {
      while (!done) {
        const auto reading = snapshot.read();
        ASSERT_EQ((*reading)->first, (*reading)->second);
      }
    });
  }
  for (int i = 1; i <= 5000; ++i) {
    snapshot.replace(std::make_shared<const Pair>(Pair{i, i}));
  }
  done = true;
  for (std::thread& reader : readers) {
    reader.join();
  }
}

} // namespace lumora::backend
