#include <LumoraKit/platform/linux/ToolExchange.h>

#include <algorithm>
#include <array>
#include <cerrno>

#include <fcntl.h>
#include <poll.h>
#include <sys/ioctl.h>
#include <unistd.h>

namespace lumora::backend {
namespace {

constexpr std::chrono::milliseconds graceAfterEnd{200};
// How often the child is asked for its end when the system gave no descriptor for that.
constexpr int reapIntervalMilliseconds = 20;
constexpr std::size_t readSize = std::size_t{64} * 1024;
constexpr std::size_t largeText = std::size_t{1024} * 1024;

bool isTemporary(int error) {
  return error == EAGAIN || error == EINTR;
}

// A string that doubles copies everything once on its way. From some size on it grows by four: memory that was never
// written to costs nothing, and a collected 256 MiB takes half the time.
void makeRoom(std::string& text, std::size_t more) {
  const std::size_t needed = text.size() + more;
  if (needed > text.capacity()) {
    const std::size_t factor = text.capacity() < largeText ? 2 : 4;
    text.reserve(std::max(needed, text.capacity() * factor));
  }
}

} // namespace

ToolInput::ToolInput(FileDescriptor descriptor, std::string_view text)
    : descriptor_(std::move(descriptor)), rest_(text) {
  if (rest_.empty()) {
    close();
    return;
  }
  // Only this end of the pipe: the child's is another file description and stays blocking.
  fcntl(descriptor_.get(), F_SETFL, O_NONBLOCK);
}

void ToolInput::writeSome(SigPipeGuard& guard) {
  const ssize_t written = write(descriptor_.get(), rest_.data(), rest_.size());
  if (written >= 0) {
    rest_.remove_prefix(static_cast<std::size_t>(written));
  } else if (errno == EPIPE) {
    // The child does not want the rest, which is its own business.
    guard.noteBrokenPipe();
    close();
  } else if (!isTemporary(errno)) {
    failure_ = errno;
    close();
  }
  if (rest_.empty()) {
    close();
  }
}

void ToolOutput::readSome() {
  std::array<char, readSize> buffer; // NOLINT(cppcoreguidelines-pro-type-member-init): filled by read
  const ssize_t count = read(descriptor_.get(), buffer.data(), buffer.size());
  if (count > 0) {
    makeRoom(text_, static_cast<std::size_t>(count));
    text_.append(buffer.data(), static_cast<std::size_t>(count));
  } else if (count == 0) {
    descriptor_.close();
  } else if (!isTemporary(errno)) {
    failure_ = errno;
    descriptor_.close();
  }
}

void ToolOutput::readWhatIsThere() {
  int available = 0;
  if (!isOpen() || ioctl(descriptor_.get(), FIONREAD, &available) != 0) {
    return;
  }
  const std::size_t wanted = text_.size() + static_cast<std::size_t>(available);
  while (isOpen() && text_.size() < wanted) {
    readSome();
  }
}

ToolExchange::ToolExchange(ChildProcess& child, ToolInput input, ToolOutput standardOutput, ToolOutput standardError)
    : child_(child), input_(std::move(input)), standardOutput_(std::move(standardOutput)),
      standardError_(std::move(standardError)) {}

int ToolExchange::run() {
  while (!isOver()) {
    serveOnce();
  }
  for (const int failure : {input_.failure(), standardOutput_.failure(), standardError_.failure()}) {
    if (failure != 0) {
      return failure;
    }
  }
  return 0;
}

bool ToolExchange::isOver() const {
  const bool collected = !standardOutput_.isOpen() && !standardError_.isOpen();
  return ended_ && (collected || Clock::now() >= graceEnd_);
}

int ToolExchange::pollTimeout() const {
  if (ended_) {
    const auto rest = std::chrono::ceil<std::chrono::milliseconds>(graceEnd_ - Clock::now());
    return static_cast<int>(std::max<std::chrono::milliseconds::rep>(rest.count(), 0));
  }
  return child_.endDescriptor().isOpen() ? -1 : reapIntervalMilliseconds;
}

void ToolExchange::serveOnce() {
  // poll passes over the closed ones: their descriptor is -1.
  std::array<pollfd, 4> polled{{{input_.descriptor(), POLLOUT, 0},
                                {standardOutput_.descriptor(), POLLIN, 0},
                                {standardError_.descriptor(), POLLIN, 0},
                                {ended_ ? -1 : child_.endDescriptor().get(), POLLIN, 0}}};
  if (poll(polled.data(), polled.size(), pollTimeout()) < 0) {
    return;
  }
  if (polled[0].revents != 0) {
    input_.writeSome(sigPipeGuard_);
  }
  if (polled[1].revents != 0) {
    standardOutput_.readSome();
  }
  if (polled[2].revents != 0) {
    standardError_.readSome();
  }
  if (!ended_ && (polled[3].revents != 0 || !child_.endDescriptor().isOpen()) && child_.tryReap()) {
    childEnded();
  }
}

void ToolExchange::childEnded() {
  ended_ = true;
  graceEnd_ = Clock::now() + graceAfterEnd;
  input_.close();
  standardOutput_.readWhatIsThere();
  standardError_.readWhatIsThere();
}

} // namespace lumora::backend
