#include "FaultRun.h"

#include "support/Descriptors.h"
#include "support/TemporaryFolder.h"

#include <gmock/gmock.h>
#include <gtest/gtest-spi.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <new>

#include <poll.h>
#include <sys/mman.h>
#include <sys/syscall.h>
#include <sys/wait.h>
#include <unistd.h>

namespace lumora::tests {
namespace {

constexpr std::size_t mostFailures = 10;

// What a try tells: its fault, and what went wrong.
struct Telling {
  Fault fault;
  bool isOver = false;
  std::array<char, std::size_t{16} * 1024> text{};

  void tell(const std::string& what) { what.copy(text.data(), text.size() - 1); }
};

// Memory that a forked process shares with this one.
class SharedTelling {
public:
  SharedTelling()
      : place_(mmap(nullptr, sizeof(Telling), PROT_READ | PROT_WRITE, MAP_SHARED | MAP_ANONYMOUS, -1, 0)),
        telling_(new (place_) Telling) {}
  SharedTelling(const SharedTelling&) = delete;
  SharedTelling& operator=(const SharedTelling&) = delete;
  ~SharedTelling() { munmap(place_, sizeof(Telling)); }

  Telling* operator->() const { return telling_; }
  Telling& operator*() const { return *telling_; }

private:
  void* const place_;
  Telling* const telling_;
};

std::string textOf(const testing::TestPartResultArray& results) {
  std::string text;
  for (int i = 0; i < results.size(); ++i) {
    text += results.GetTestPartResult(i).message();
    text += '\n';
  }
  return text;
}

void expectNothingLeftOpen(std::size_t descriptorsBefore) {
  EXPECT_EQ(openDescriptors(), descriptorsBefore) << "descriptors";
  EXPECT_TRUE(waitpid(-1, nullptr, WNOHANG) == -1 && errno == ECHILD) << "a child is left";
}

// Runs in the forked process, which ends here.
[[noreturn]] void tryOnce(const MakeFaultScenario& make, const std::filesystem::path& folder,
                          Telling& telling) noexcept {
  testing::TestPartResultArray results;
  {
    const testing::ScopedFakeTestPartResultReporter reporter(
        testing::ScopedFakeTestPartResultReporter::INTERCEPT_ALL_THREADS, &results);
    const auto scenario = make(folder);
    const auto descriptors = openDescriptors();
    letFail(telling.fault);
    scenario->act();
    letSucceed();
    expectNothingLeftOpen(descriptors);
    scenario->check(telling.fault);
  }
  telling.tell(textOf(results));
  telling.isOver = true;
  // Not by _exit: the thread sanitizer's own one waits a second for other threads.
  syscall(SYS_exit_group, EXIT_SUCCESS);
  std::abort();
}

// False when it has not ended at the deadline.
bool endsInTime(pid_t child, int deadlineSeconds) {
  pollfd end{static_cast<int>(syscall(SYS_pidfd_open, child, 0)), POLLIN, 0};
  const bool hasEnded = poll(&end, 1, deadlineSeconds * 1000) == 1;
  close(end.fd);
  return hasEnded;
}

// How a try went; empty when all is well.
std::string outcomeOfTry(const MakeFaultScenario& make, Telling& telling, int deadlineSeconds) {
  const TemporaryFolder folder;
  const pid_t child = fork();
  if (child == 0) {
    tryOnce(make, folder.path(), telling);
  }
  const bool isInTime = endsInTime(child, deadlineSeconds);
  if (!isInTime) {
    kill(child, SIGKILL);
  }
  int status = 0;
  waitpid(child, &status, 0);
  if (!isInTime) {
    return "it hung";
  }
  if (WIFSIGNALED(status)) {
    return "it died of signal " + std::to_string(WTERMSIG(status));
  }
  return telling.isOver ? telling.text.data() : "it ended early, with status " + std::to_string(WEXITSTATUS(status));
}

// The tries of one scenario.
class Run {
public:
  Run(const MakeFaultScenario& make, int deadlineSeconds) : make_(make), deadlineSeconds_(deadlineSeconds) {}

  const FaultFindings& findings() const { return findings_; }

  // The functions that were called.
  std::vector<const char*> tryWithoutFault() {
    const SharedTelling telling;
    tryOut(*telling);
    return telling->fault.called();
  }

  // False when there is no such call, or enough has failed.
  bool failInEachWay(const char* function, std::size_t call) {
    std::size_t ways = 1;
    for (std::size_t way = 0; way < ways && findings_.failures.size() < mostFailures; ++way) {
      const SharedTelling telling;
      telling->fault.function = function;
      telling->fault.call = call;
      telling->fault.way = way;
      tryOut(*telling);
      ways = telling->fault.ways;
    }
    return ways > 0 && findings_.failures.size() < mostFailures;
  }

private:
  void tryOut(Telling& telling) {
    const std::string outcome = outcomeOfTry(make_, telling, deadlineSeconds_);
    if (!outcome.empty()) {
      findings_.failures.push_back(telling.fault.description() + ": " + outcome);
    }
    if (telling.fault.happened) {
      ++findings_.tries;
      findings_.functions.insert(telling.fault.function);
    }
  }

  const MakeFaultScenario& make_;
  const int deadlineSeconds_;
  FaultFindings findings_;
};

} // namespace

FaultScenario::~FaultScenario() = default;

FaultFindings runWithFaults(const MakeFaultScenario& make, int deadlineSeconds) {
  Run run(make, deadlineSeconds);
  for (const char* function : run.tryWithoutFault()) {
    for (std::size_t call = 1; run.failInEachWay(function, call); ++call) {
    }
  }
  return run.findings();
}

void expectHolds(const FaultFindings& findings, const std::vector<std::string>& functions) {
  EXPECT_THAT(findings.failures, testing::IsEmpty());
  EXPECT_THAT(findings.functions, testing::IsSupersetOf(functions));
  testing::Test::RecordProperty("tries", static_cast<int>(findings.tries));
}

std::vector<std::string> filesBelow(const std::filesystem::path& folder) {
  std::vector<std::string> names;
  if (!std::filesystem::exists(folder)) {
    return names;
  }
  for (const auto& entry : std::filesystem::recursive_directory_iterator(folder)) {
    if (!entry.is_directory()) {
      names.push_back(std::filesystem::relative(entry.path(), folder).string());
    }
  }
  std::ranges::sort(names);
  return names;
}

} // namespace lumora::tests
