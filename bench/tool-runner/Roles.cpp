#include "Roles.h"

#include <LumoraKit/actions/LMRAction.h>
#include <LumoraKit/platform/KTRunTask.h>
#include <LumoraKit/platform/PropertyList.h>

#include <benchmark/benchmark.h>

#include <array>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <map>

#include <fcntl.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

namespace lumora::bench {
namespace {

constexpr std::size_t largeParentMemory = std::size_t{2} << 30U;
constexpr int largeParentDescriptors = 200;

void writeWhole(int descriptor, const char* data, std::size_t size) {
  while (size > 0) {
    const ssize_t written = write(descriptor, data, size);
    if (written <= 0) {
      std::abort();
    }
    data += written;
    size -= static_cast<std::size_t>(written);
  }
}

int emit() {
  const std::string block(outputBlock, 'x');
  const std::size_t outputsPerError = largeOutput / largeError;
  for (std::size_t emitted = 0; emitted < largeError; emitted += block.size()) {
    for (std::size_t i = 0; i < outputsPerError; ++i) {
      writeWhole(STDOUT_FILENO, block.data(), block.size());
    }
    writeWhole(STDERR_FILENO, block.data(), block.size());
  }
  writeWhole(STDOUT_FILENO, block.data(), block.size());
  return EXIT_SUCCESS;
}

std::size_t peakMemory() {
  std::ifstream status("/proc/self/status");
  for (std::string word; status >> word;) {
    std::size_t kilobytes = 0;
    if (word == "VmHWM:" && status >> kilobytes) {
      return kilobytes * 1024;
    }
  }
  std::abort();
}

int collect() {
  std::string output;
  std::string error;
  KTRunTask("/bin/true", {}, "", &output, &error, nullptr);
  const auto before = peakMemory();
  const int status = KTRunTask(ownExecutable(), emitter(), "", &output, &error, nullptr);
  std::cout << peakMemory() - before;
  return status == 0 && output.size() == largeOutput && error.size() == largeError ? EXIT_SUCCESS : EXIT_FAILURE;
}

int serveActions() {
  char request = 0;
  while (read(STDIN_FILENO, &request, 1) == 1) {
    const auto start = std::chrono::steady_clock::now();
    runTrivialAction();
    const double seconds = std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
    writeWhole(STDOUT_FILENO, reinterpret_cast<const char*>(&seconds), sizeof seconds);
  }
  return EXIT_SUCCESS;
}

int serveActionsFromLargeProcess() {
  const std::string memory(largeParentMemory, '\1');
  for (int i = 0; i < largeParentDescriptors; ++i) {
    if (open("/dev/null", O_RDONLY) < 0) { // NOLINT(android-cloexec-open): the worse case
      return EXIT_FAILURE;
    }
  }
  // The compiler may not take the memory for unused.
  benchmark::DoNotOptimize(memory.data());
  return serveActions();
}

} // namespace

std::optional<int> runRole(int argc, char** argv) {
  static const std::map<std::string, int (*)()> roles{{"--emit", emit},
                                                      {"--collect", collect},
                                                      {"--small-parent", serveActions},
                                                      {"--large-parent", serveActionsFromLargeProcess}};
  const auto role = argc == 2 ? roles.find(argv[1]) : roles.end();
  return role == roles.end() ? std::nullopt : std::optional(role->second());
}

std::string ownExecutable() {
  return std::filesystem::read_symlink("/proc/self/exe").string();
}

std::vector<std::string> emitter() {
  return {"--emit"};
}

std::vector<std::string> collector() {
  return {"--collect"};
}

const std::string& trivialRequest() {
  static const std::string request = xmlDescription(Array{"getconfig", "plist"}).value();
  return request;
}

void runTrivialAction() {
  const auto action = LMRAction::actionWithCommand_arguments("getconfig", Array{"plist"});
  action->setTool(trivialTool);
  action->setExpectXMLResponse(false);
  action->runSynchronously();
  if (action->error()) {
    std::cerr << action->error()->localizedDescription() << '\n';
    std::abort();
  }
}

Parent::Parent(Size size) {
  std::array<int, 2> requests{};
  std::array<int, 2> answers{};
  if (pipe2(requests.data(), O_CLOEXEC) != 0 || pipe2(answers.data(), O_CLOEXEC) != 0) {
    std::abort();
  }
  posix_spawn_file_actions_t actions;
  posix_spawn_file_actions_init(&actions);
  posix_spawn_file_actions_adddup2(&actions, requests[0], STDIN_FILENO);
  posix_spawn_file_actions_adddup2(&actions, answers[1], STDOUT_FILENO);
  std::string executable = ownExecutable();
  std::string role = size == Size::Large ? "--large-parent" : "--small-parent";
  const std::array<char*, 3> arguments{executable.data(), role.data(), nullptr};
  if (posix_spawn(&process_, executable.c_str(), &actions, nullptr, arguments.data(), environ) != 0) {
    std::abort();
  }
  posix_spawn_file_actions_destroy(&actions);
  close(requests[0]);
  close(answers[1]);
  requests_ = requests[1];
  answers_ = answers[0];
}

Parent::~Parent() {
  close(requests_);
  close(answers_);
  waitpid(process_, nullptr, 0);
}

double Parent::secondsOfAction() {
  writeWhole(requests_, "x", 1);
  double seconds = 0;
  if (read(answers_, &seconds, sizeof seconds) != sizeof seconds) {
    std::abort();
  }
  return seconds;
}

} // namespace lumora::bench
