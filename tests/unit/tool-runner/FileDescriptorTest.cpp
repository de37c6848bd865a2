#include <LumoraKit/platform/linux/FileDescriptor.h>
#include <LumoraKit/platform/linux/SigPipeGuard.h>

#include <gmock/gmock.h>

#include <cerrno>

#include <fcntl.h>
#include <unistd.h>

namespace lumora::tests {
namespace {

using backend::FileDescriptor;
using backend::Pipe;

FileDescriptor opened() {
  return FileDescriptor(open("/dev/null", O_RDONLY | O_CLOEXEC));
}

bool isOpenInProcess(int descriptor) {
  return fcntl(descriptor, F_GETFD) >= 0;
}

TEST(FileDescriptor, closesItsDescriptor_whenItDies) {
  int number = -1;
  {
    const auto descriptor = opened();
    number = descriptor.get();
    EXPECT_TRUE(isOpenInProcess(number));
  }
  EXPECT_FALSE(isOpenInProcess(number));
}

TEST(FileDescriptor, handsOwnershipOn_whenMoved) {
  auto first = opened();
  const int number = first.get();
  FileDescriptor second(std::move(first));
  EXPECT_FALSE(first.isOpen()); // NOLINT(bugprone-use-after-move): a moved one is empty
  EXPECT_EQ(second.get(), number);
  auto third = opened();
  const int replaced = third.get();
  third = std::move(second);
  EXPECT_EQ(third.get(), number);
  EXPECT_FALSE(isOpenInProcess(replaced));
}

TEST(FileDescriptor, keepsDescriptorOpen_whenReleased) {
  auto descriptor = opened();
  const int number = descriptor.release();
  descriptor.close();
  EXPECT_TRUE(isOpenInProcess(number));
  close(number);
}

TEST(FileDescriptor, leavesErrno_whenClosing) {
  auto descriptor = opened();
  errno = ENOSPC;
  descriptor.close();
  EXPECT_EQ(errno, ENOSPC);
}

TEST(Pipe, isClosedOnExecAndAboveStandardDescriptors) {
  Pipe pipe;
  ASSERT_EQ(pipe.open(), 0);
  for (const int end : {pipe.readEnd.get(), pipe.writeEnd.get()}) {
    EXPECT_GT(end, 2);
    EXPECT_EQ(fcntl(end, F_GETFD), FD_CLOEXEC);
  }
}

TEST(SigPipeGuard, keepsSignalOff_whenPipeIsBroken) {
  Pipe pipe;
  ASSERT_EQ(pipe.open(), 0);
  pipe.readEnd.close();
  {
    backend::SigPipeGuard guard;
    EXPECT_EQ(write(pipe.writeEnd.get(), "x", 1), -1);
    EXPECT_EQ(errno, EPIPE);
    guard.noteBrokenPipe();
  }
  sigset_t pending;
  sigset_t blocked;
  sigpending(&pending);
  pthread_sigmask(SIG_SETMASK, nullptr, &blocked);
  EXPECT_EQ(sigismember(&pending, SIGPIPE), 0);
  EXPECT_EQ(sigismember(&blocked, SIGPIPE), 0);
}

} // namespace
} // namespace lumora::tests
