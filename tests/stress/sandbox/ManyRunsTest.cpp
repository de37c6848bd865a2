#include "support/Sandbox.h"

#include <gmock/gmock.h>

#include <chrono>
#include <fstream>
#include <functional>
#include <set>
#include <thread>

using namespace lumora;
using namespace lumora::tests;

namespace {

/// Runs at once.
constexpr int count = 200;

std::filesystem::path write(const std::filesystem::path& path, const std::string& content) {
  std::ofstream(path, std::ios::binary) << content;
  return path;
}

Array asUser(const SandboxServer& server, const Array& elements) {
  Array request = server.login();
  request.insert(request.end(), elements.begin(), elements.end());
  return request;
}

Array metadata(const SandboxServer& server, const std::string& title) {
  const auto path = write(server.folder() / (title + ".plist"),
                          "<plist version=\"1.0\"><dict><key>Title</key><string>" + title + "</string></dict></plist>");
  return {"metadata", path.string()};
}

const std::string filler(20'000, 'm');

ProgramRun submit(const SandboxServer& server, const std::string& title, bool isAsynchronous) {
  const auto file = write(server.folder() / (title + ".mov"), filler + title);
  Array elements{"submit"};
  if (isAsynchronous) {
    elements.emplace_back(Array{"async"});
  }
  for (const auto& element :
       {Array{"delete"}, Array{"file", file.string()}, metadata(server, title), Array{"workflow", "single-video"}}) {
    elements.emplace_back(element);
  }
  return server.request(asUser(server, elements));
}

std::string cameraName(int index) {
  return "Camera " + std::to_string(index);
}

ProgramRun start(const SandboxServer& server, int index) {
  return server.request(asUser(server, {Array{"start", cameraName(index)}, Array{"delay", 0}}));
}

ProgramRun stop(const SandboxServer& server, int index) {
  const std::string camera = cameraName(index);
  return server.request(
      asUser(server, {Array{"stop", camera}, metadata(server, camera), Array{"workflow", "single-video"}}));
}

/// Runs the numbers from 0 at once; each must succeed.
void runAtOnce(int number, const std::function<ProgramRun(int)>& run) {
  std::vector<ProgramRun> runs(static_cast<std::size_t>(number));
  std::vector<std::thread> threads;
  for (int index = 0; index < number; ++index) {
    threads.emplace_back([&, index] { runs[static_cast<std::size_t>(index)] = run(index); });
  }
  for (auto& thread : threads) {
    thread.join();
  }
  for (const auto& ended : runs) {
    EXPECT_EQ(ended.status, 0) << ended.standardError;
  }
}

/// The episodes, once there are so many: asynchronous submissions go on after their tools have ended.
std::vector<Dictionary> awaitEpisodes(const SandboxServer& server, std::size_t number) {
  const auto limit = std::chrono::steady_clock::now() + std::chrono::seconds(120);
  auto episodes = server.episodes();
  while (episodes.size() < number && std::chrono::steady_clock::now() < limit) {
    std::this_thread::sleep_for(std::chrono::milliseconds(20));
    episodes = server.episodes();
  }
  return episodes;
}

std::string contentOf(const std::string& path) {
  std::ifstream stream(path, std::ios::binary);
  return {std::istreambuf_iterator<char>(stream), {}};
}

} // namespace

TEST(SandboxStress, nothingIsLost_when200SubmitAtOnce) {
  const SandboxServer server;
  runAtOnce(count, [&](int index) { return submit(server, "Lecture " + std::to_string(index), index % 2 == 0); });
  std::set<std::string> titles;
  for (const auto& episode : awaitEpisodes(server, count)) {
    const auto title = episode.string("title").value();
    const auto path = episode.array("files")->front().dictionary()->string("path").value();
    EXPECT_EQ(contentOf(path), filler + title);
    titles.insert(title);
  }
  EXPECT_EQ(titles.size(), count);
}

TEST(SandboxStress, nothingIsLost_when200StartStopAndSubmitAtOnce) {
  constexpr int cameras = 50;
  constexpr int files = count - cameras;
  const SandboxServer server;
  for (int index = 0; index < cameras; ++index) {
    ASSERT_EQ(server.administrate({"camera", "add"}, {cameraName(index)}).status, 0);
  }
  // Some of the submissions are asynchronous.
  const auto wave = [&](const std::string& title, ProgramRun (*camera)(const SandboxServer&, int)) {
    runAtOnce(count, [&](int index) {
      return index < cameras ? camera(server, index) : submit(server, title + std::to_string(index), index % 4 == 0);
    });
  };
  wave("First ", start);
  wave("Second ", stop);
  std::multiset<std::string> titles;
  for (const auto& episode : awaitEpisodes(server, cameras + 2 * files)) {
    titles.insert(episode.string("title").value());
  }
  EXPECT_EQ(titles.size(), cameras + 2 * files);
  for (int index = 0; index < count; ++index) {
    const auto number = std::to_string(index);
    EXPECT_EQ(titles.count("Camera " + number), index < cameras ? 1U : 0U) << index;
    EXPECT_EQ(titles.count("First " + number), index < cameras ? 0U : 1U) << index;
    EXPECT_EQ(titles.count("Second " + number), index < cameras ? 0U : 1U) << index;
  }
}
