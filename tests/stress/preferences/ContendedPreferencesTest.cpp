#include "support/TemporaryFolder.h"

#include <LumoraKit/platform/PropertyList.h>
#include <LumoraKit/platform/linux/FilePreferences.h>

#include <gmock/gmock.h>

#include <atomic>
#include <csignal>
#include <functional>
#include <thread>
#include <vector>

#include <sys/wait.h>
#include <unistd.h>

namespace lumora::tests {
namespace {

using backend::FilePreferences;

constexpr int writers = 8;
constexpr int updates = 200;
const std::string domain = "org.vantor.lumora.test";

// Each update is a key of its own: one that is lost is missing at the end.
void update(const std::filesystem::path& folder, int writer) {
  FilePreferences preferences(folder);
  for (int i = 0; i < updates; ++i) {
    preferences.setValue(domain, std::to_string(writer) + "-" + std::to_string(i), i);
  }
}

pid_t inChild(const std::function<void()>& work) {
  const pid_t child = fork();
  if (child == 0) {
    work();
    _exit(EXIT_SUCCESS);
  }
  return child;
}

bool endedWell(pid_t child) {
  int status = -1;
  return waitpid(child, &status, 0) == child && WIFEXITED(status) && WEXITSTATUS(status) == EXIT_SUCCESS;
}

std::size_t storedKeys(const std::filesystem::path& folder) {
  const auto stored = dictionaryWithXMLDescription(contentOf(folder / (domain + ".plist")));
  return stored ? stored->size() : 0;
}

TEST(ContendedPreferences, keepEveryUpdate_whenProcessesWrite) {
  const TemporaryFolder folder;
  std::vector<pid_t> children;
  for (int writer = 0; writer < writers; ++writer) {
    children.push_back(inChild([&folder, writer] { update(folder.path(), writer); }));
  }
  for (const pid_t child : children) {
    EXPECT_TRUE(endedWell(child));
  }
  EXPECT_EQ(storedKeys(folder.path()), 1600U);
}

TEST(ContendedPreferences, keepEveryUpdate_whenThreadsWrite) {
  const TemporaryFolder folder;
  std::vector<std::thread> threads;
  for (int writer = 0; writer < writers; ++writer) {
    threads.emplace_back(update, folder.path(), writer);
  }
  for (std::thread& thread : threads) {
    thread.join();
  }
  EXPECT_EQ(storedKeys(folder.path()), 1600U);
}

TEST(ContendedPreferences, areNeverTorn_whenReadDuringWrites) {
  const TemporaryFolder folder;
  FilePreferences preferences(folder.path());
  preferences.setValue(domain, "always", "there");
  const pid_t writer = inChild([&folder] {
    FilePreferences mine(folder.path());
    for (std::size_t i = 0; i < 500; ++i) {
      mine.setValue(domain, "changing", std::string(100 + i * 97 % 50'000, 'x'));
    }
  });
  int reads = 0;
  int torn = 0;
  while (waitpid(writer, nullptr, WNOHANG) == 0) {
    ++reads;
    torn += preferences.value(domain, "always") != Value("there") ? 1 : 0;
  }
  EXPECT_GT(reads, 0);
  EXPECT_EQ(torn, 0);
}

TEST(ContendedPreferences, areWholeAndWritable_whenWritersAreKilled) {
  const TemporaryFolder folder;
  FilePreferences preferences(folder.path());
  preferences.setValue(domain, "always", "there");
  for (int round = 0; round < 20; ++round) {
    const pid_t writer = inChild([&folder] { update(folder.path(), 0); });
    while (preferences.value(domain, "0-" + std::to_string(round)) == std::nullopt) {
    }
    kill(writer, SIGKILL);
    waitpid(writer, nullptr, 0);
    EXPECT_EQ(preferences.value(domain, "always"), Value("there"));
    preferences.setValue(domain, "0-" + std::to_string(round + 1), std::nullopt);
    preferences.setValue(domain, "round", round);
    EXPECT_EQ(preferences.value(domain, "round"), Value(round));
  }
}

} // namespace
} // namespace lumora::tests
