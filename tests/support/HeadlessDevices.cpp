#include "support/HeadlessDevices.h"

#include <csignal>
#include <cstdio>
#include <cstdlib>

#include <fcntl.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

// The media libraries that every user of these devices loads have no frame pointers: without this the stacks of their
// leaks are cut short and the suppressions match nothing. It costs time, so programs without devices do without.
extern "C" __attribute__((visibility("default"))) const char* __asan_default_options();
extern "C" const char* __asan_default_options() {
  return "fast_unwind_on_malloc=0";
}

namespace lumora::testing {
namespace {

constexpr int missingProgram = 77;
constexpr const char* script = LUMORA_SOURCE_DIR "/examples/headless-devices";

[[noreturn]] void runScript(int input, int output) {
  ::prctl(PR_SET_PDEATHSIG, SIGTERM);
  ::setpgid(0, 0);
  ::dup2(input, STDIN_FILENO);
  ::dup2(output, STDOUT_FILENO);
  ::execl(script, script, nullptr);
  ::_exit(127);
}

} // namespace

std::unique_ptr<HeadlessDevices> HeadlessDevices::start(std::string& reason) {
  std::unique_ptr<HeadlessDevices> devices(new HeadlessDevices);
  devices->spawn();
  if (devices->applyEnvironment()) {
    return devices;
  }
  if (devices->waitForEnd() != missingProgram) {
    std::fputs("The headless devices did not start\n", stderr);
    std::abort();
  }
  reason = "a program that the headless devices need is not installed";
  return nullptr;
}

void HeadlessDevices::spawn() {
  int input[2];
  int output[2];
  if (::pipe2(input, O_CLOEXEC) != 0 || ::pipe2(output, O_CLOEXEC) != 0) {
    std::abort();
  }
  pid_ = ::fork();
  if (pid_ == 0) {
    runScript(input[0], output[1]);
  }
  ::close(input[0]);
  ::close(output[1]);
  input_ = input[1];
  output_ = output[0];
}

bool HeadlessDevices::applyEnvironment() {
  for (std::string line = readLine(); !line.empty(); line = readLine()) {
    const auto equals = line.find('=');
    if (equals == std::string::npos) {
      return line == "READY";
    }
    const std::string name = line.substr(0, equals);
    const std::string value = line.substr(equals + 1);
    if (value.empty()) {
      ::unsetenv(name.c_str());
    } else {
      ::setenv(name.c_str(), value.c_str(), 1);
    }
  }
  return false;
}

HeadlessDevices::~HeadlessDevices() {
  if (pid_ > 0) {
    waitForEnd();
  }
}

bool HeadlessDevices::add(const std::string& kind, const std::string& name) {
  return request("add " + kind + " " + name);
}

bool HeadlessDevices::remove(const std::string& name) {
  return request("remove " + name);
}

bool HeadlessDevices::freeze(const std::string& name) {
  return request("freeze " + name);
}

bool HeadlessDevices::thaw(const std::string& name) {
  return request("thaw " + name);
}

bool HeadlessDevices::restart(const std::string& service) {
  return request("restart " + service);
}

bool HeadlessDevices::resizeScreen(int width, int height) {
  return request("resize " + std::to_string(width) + " " + std::to_string(height));
}

bool HeadlessDevices::request(const std::string& line) {
  const std::string text = line + "\n";
  return ::write(input_, text.data(), text.size()) == static_cast<ssize_t>(text.size()) && readLine() == "OK";
}

std::string HeadlessDevices::readLine() {
  std::string line;
  char character = 0;
  while (::read(output_, &character, 1) == 1 && character != '\n') {
    line += character;
  }
  return line;
}

int HeadlessDevices::waitForEnd() {
  ::close(input_);
  int status = 0;
  ::waitpid(pid_, &status, 0);
  ::close(output_);
  pid_ = -1;
  return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
}

} // namespace lumora::testing
