#include "support/Sandbox.h"

#include <gmock/gmock.h>

#include <chrono>
#include <fstream>
#include <set>
#include <thread>

using namespace lumora;
using namespace lumora::tests;

namespace {

constexpr int count = 200;

std::filesystem::path write(const std::filesystem::path& path, const std::string& content) {
  std::ofstream(path, std::ios::binary) << content;
  return path;
}

/// Every second one is asynchronous.
ProgramRun submit(const SandboxServer& server, int index) {
  const std::string name = "Lecture " + std::to_string(index);
  const auto file = write(server.folder() / (name + ".mov"), std::string(20'000, 'm') + name);
  const auto metadata =
      write(server.folder() / (name + ".plist"),
            "<plist version=\"1.0\"><dict><key>Title</key><string>" + name + "</string></dict></plist>");
  Array request = server.login();
  request.emplace_back("submit");
  if (index % 2 == 0) {
    request.emplace_back(Array{"async"});
  }
  for (const auto& element : {Array{"delete"}, Array{"file", file.string()}, Array{"metadata", metadata.string()},
                              Array{"workflow", "single-video"}}) {
    request.emplace_back(element);
  }
  return server.request(request);
}

std::string contentOf(const std::string& path) {
  std::ifstream stream(path, std::ios::binary);
  return {std::istreambuf_iterator<char>(stream), {}};
}

} // namespace

TEST(SandboxStress, nothingIsLost_when200SubmitAtOnce) {
  const SandboxServer server;
  std::vector<ProgramRun> runs(count);
  std::vector<std::thread> threads;
  for (int index = 0; index < count; ++index) {
    threads.emplace_back([&, index] { runs[static_cast<std::size_t>(index)] = submit(server, index); });
  }
  for (auto& thread : threads) {
    thread.join();
  }
  for (const auto& run : runs) {
    EXPECT_EQ(run.status, 0) << run.standardError;
  }
  // The asynchronous ones go on after their tools have ended.
  const auto limit = std::chrono::steady_clock::now() + std::chrono::seconds(120);
  while (server.episodes().size() < count && std::chrono::steady_clock::now() < limit) {
    std::this_thread::sleep_for(std::chrono::milliseconds(20));
  }
  std::set<std::string> titles;
  for (const auto& episode : server.episodes()) {
    const auto title = episode.string("title").value();
    const auto path = episode.array("files")->front().dictionary()->string("path").value();
    EXPECT_EQ(contentOf(path), std::string(20'000, 'm') + title);
    titles.insert(title);
  }
  EXPECT_EQ(titles.size(), count);
}
