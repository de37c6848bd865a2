// The run itself: it must see what goes wrong.
#include "FaultRun.h"

#include "support/TemporaryFolder.h"

#include <LumoraKit/platform/linux/AtomicFile.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <array>
#include <csignal>

#include <fcntl.h>
#include <spawn.h>
#include <unistd.h>

namespace lumora::tests {
namespace {

using testing::Each;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;

// Files are written in each of these ways. They are called by a library, as the framework's calls are.
class Writer : public FaultScenario {
public:
  explicit Writer(const std::filesystem::path& folder) : FaultScenario(folder) { writeFile(folder / "file", "old"); }

  void check(const Fault& /*fault*/) override {
    EXPECT_THAT(contentOf(folder_ / "file"), testing::AnyOf("old", "new"));
    EXPECT_EQ(contentOf(folder_ / "file") == "new", succeeded_);
  }

protected:
  bool succeeded_ = false;
};

class WholeWriter final : public Writer {
public:
  using Writer::Writer;
  void act() override { succeeded_ = !backend::replaceFile(folder_ / "file", "new"); }
};

TEST(FaultRun, findsNothing_whereNothingIsLost) {
  const auto findings = runWithFaults<WholeWriter>();
  EXPECT_THAT(findings.failures, IsEmpty());
  EXPECT_GT(findings.tries, 10U);
  EXPECT_TRUE(findings.functions.contains("rename"));
}

// Empties the file first, and says nothing of what goes wrong.
class LossyWriter final : public Writer {
public:
  using Writer::Writer;
  void act() override {
    const int file = open((folder_ / "file").c_str(), O_WRONLY | O_TRUNC | O_CLOEXEC);
    succeeded_ = write(file, "new", 3) != 0;
    close(file);
  }
};

TEST(FaultRun, namesTheCall_whereSomethingIsLost) {
  const auto findings = runWithFaults<LossyWriter>();
  EXPECT_THAT(findings.failures, testing::Contains(HasSubstr("write, call 1: No space left on device")));
  EXPECT_THAT(findings.failures, Each(Not(HasSubstr("close"))));
}

class CrashingReader final : public Writer {
public:
  using Writer::Writer;
  void act() override {
    const int file = open((folder_ / "file").c_str(), O_RDONLY | O_CLOEXEC);
    if (file < 0) {
      raise(SIGKILL);
    }
    close(file);
  }
};

TEST(FaultRun, seesThatAProcessDies) {
  const auto findings = runWithFaults<CrashingReader>();
  EXPECT_THAT(findings.failures, Not(IsEmpty()));
  EXPECT_THAT(findings.failures, Each(testing::AllOf(HasSubstr("open, call 1"), HasSubstr("it died of signal 9"))));
}

class PatientReader final : public Writer {
public:
  using Writer::Writer;
  void act() override {
    const int file = open((folder_ / "file").c_str(), O_RDONLY | O_CLOEXEC);
    while (file < 0) {
      pause();
    }
    close(file);
  }
};

TEST(FaultRun, seesThatAProcessHangs) {
  const auto findings = runWithFaults<PatientReader>(1);
  EXPECT_THAT(findings.failures, Not(IsEmpty()));
  EXPECT_THAT(findings.failures, Each(testing::AllOf(HasSubstr("open, call 1"), HasSubstr("it hung"))));
}

class ForgetfulReader final : public Writer {
public:
  using Writer::Writer;
  void act() override {
    const int file = open((folder_ / "file").c_str(), O_RDONLY | O_CLOEXEC);
    std::array<char, 4> buffer{};
    if (read(file, buffer.data(), buffer.size()) == 3) {
      close(file);
    }
  }
};

TEST(FaultRun, seesADescriptorThatIsLeftOpen) {
  const auto findings = runWithFaults<ForgetfulReader>();
  EXPECT_THAT(findings.failures,
              testing::Contains(testing::AllOf(HasSubstr("read, call 1"), HasSubstr("descriptors"))));
}

class ChildLosingRunner final : public Writer {
public:
  using Writer::Writer;
  void act() override {
    std::string name = "/bin/true";
    const std::array<char*, 2> arguments{name.data(), nullptr};
    pid_t child = 0;
    if (posix_spawn(&child, name.c_str(), nullptr, nullptr, arguments.data(), environ) == 0) {
      const int file = open((folder_ / "file").c_str(), O_RDONLY | O_CLOEXEC);
      if (file >= 0) {
        waitpid(child, nullptr, 0);
      }
      close(file);
    }
  }
};

TEST(FaultRun, seesAChildThatIsLeft) {
  const auto findings = runWithFaults<ChildLosingRunner>();
  EXPECT_THAT(findings.failures, testing::Contains(testing::AllOf(HasSubstr("open"), HasSubstr("a child is left"))));
}

} // namespace
} // namespace lumora::tests
