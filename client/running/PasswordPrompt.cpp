#include "PasswordPrompt.h"

#include "../Failure.h"
#include "../output/Text.h"
#include "Interrupts.h"

#include <cerrno>

#include <fcntl.h>
#include <poll.h>
#include <termios.h>
#include <unistd.h>

namespace lumora::client {

namespace {

/// The terminal, silent for as long as this lives.
class SilentTerminal {
public:
  SilentTerminal() : descriptor_(open("/dev/tty", O_RDWR | O_CLOEXEC | O_NOCTTY)) {
    if (descriptor_ >= 0 && tcgetattr(descriptor_, &before_) == 0) {
      isTerminal_ = true;
      termios silent = before_;
      silent.c_lflag &= ~static_cast<tcflag_t>(ECHO | ECHOE | ECHOK | ECHONL);
      // Stopped here, the program would leave a silent terminal behind.
      silent.c_cc[VSUSP] = _POSIX_VDISABLE;
      tcsetattr(descriptor_, TCSAFLUSH, &silent);
    }
  }
  SilentTerminal(const SilentTerminal&) = delete;
  SilentTerminal& operator=(const SilentTerminal&) = delete;
  ~SilentTerminal() {
    if (isTerminal_) {
      say("\n");
      tcsetattr(descriptor_, TCSAFLUSH, &before_);
    }
    if (descriptor_ >= 0) {
      close(descriptor_);
    }
  }

  bool isTerminal() const { return isTerminal_; }

  void say(const std::string& text) const {
    // A terminal that takes no prompt takes no complaint either.
    [[maybe_unused]] const ssize_t written = write(descriptor_, text.data(), text.size());
  }

  /// The next byte; nothing at the end of input.
  std::optional<char> readByte() const {
    for (;;) {
      constexpr int glance = 100; // milliseconds: the signal may have reached another thread
      pollfd polled{descriptor_, POLLIN, 0};
      const int ready = poll(&polled, 1, glance);
      throwIfInterrupted();
      char byte = 0;
      if (ready > 0) {
        const ssize_t count = read(descriptor_, &byte, 1);
        if (count >= 0 || errno != EINTR) {
          return count == 1 ? std::optional(byte) : std::nullopt;
        }
      }
    }
  }

private:
  int descriptor_;
  bool isTerminal_ = false;
  termios before_{};
};

} // namespace

std::optional<Secret> askForPassword(const std::string& prompt) {
  // Enough for any password, and what it grows by is not copied about in memory.
  constexpr std::size_t longest = 4096;
  const SilentTerminal terminal;
  if (!terminal.isTerminal()) {
    return std::nullopt;
  }
  terminal.say(printable(prompt));
  std::string typed;
  typed.reserve(longest);
  for (;;) {
    const auto byte = terminal.readByte();
    if (!byte) {
      throw Failure(exitNoInput, "No password was typed.");
    }
    if (*byte == '\n' || *byte == '\r') {
      return Secret(std::move(typed));
    }
    if (typed.size() < longest) {
      typed += *byte;
    }
  }
}

} // namespace lumora::client
