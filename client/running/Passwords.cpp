#include "Passwords.h"

#include "../Failure.h"
#include "../output/Text.h"
#include "Interrupts.h"
#include "PasswordPrompt.h"

#include <glib.h>

#include <cerrno>
#include <cstring>

#include <fcntl.h>
#include <unistd.h>

namespace lumora::client {

namespace {

[[noreturn]] void fail(const std::string& path, const std::string& reason) {
  const std::string name = path == "-" ? "standard input" : "the file " + inQuotes(path);
  throw Failure(exitNoInput, "No password can be read from " + name + ": " + reason + ".");
}

/// Standard input, or a file that is closed in the end.
class Input {
public:
  explicit Input(const std::string& path)
      : descriptor_(path == "-" ? STDIN_FILENO : open(path.c_str(), O_RDONLY | O_CLOEXEC)) {
    if (descriptor_ < 0) {
      fail(path, std::strerror(errno));
    }
  }
  Input(const Input&) = delete;
  Input& operator=(const Input&) = delete;
  ~Input() {
    if (descriptor_ > STDIN_FILENO) {
      close(descriptor_);
    }
  }

  /// Byte by byte, so that another password can be read from the next line. False at the end, with errno 0, and when
  /// it cannot be read.
  bool readByte(char& byte) const {
    for (;;) {
      errno = 0;
      const ssize_t count = read(descriptor_, &byte, 1);
      const bool wasInterrupted = count < 0 && errno == EINTR;
      throwIfInterrupted();
      if (!wasInterrupted) {
        return count == 1;
      }
    }
  }

private:
  int descriptor_;
};

Secret checked(Secret secret) {
  if (g_utf8_validate_len(secret.text().data(), secret.text().size(), nullptr) == FALSE) {
    throw Failure(exitBadData, "The password is not valid UTF-8.");
  }
  return secret;
}

Secret firstLine(const std::string& path) {
  constexpr std::size_t longest = 4096;
  const Input input(path);
  std::string line;
  line.reserve(longest);
  char byte = 0;
  bool isThere = false;
  while ((isThere = input.readByte(byte)) && byte != '\n' && line.size() < longest) {
    line += byte;
  }
  if (!isThere && errno != 0) {
    fail(path, std::strerror(errno));
  }
  if (line.size() >= longest) {
    wipe(line);
    fail(path, "its first line is too long");
  }
  if (!line.empty() && line.back() == '\r') {
    line.pop_back();
  }
  if (line.empty()) {
    fail(path, "its first line is empty");
  }
  return checked(Secret(std::move(line)));
}

Secret asked(const std::string& prompt, const std::string& option) {
  auto typed = askForPassword(prompt);
  if (!typed) {
    throw Failure(exitUsage, "There is no terminal to ask for the password at: give " + option + ".");
  }
  return checked(std::move(*typed));
}

} // namespace

Secret Passwords::login(const std::string& server, const std::string& user) const {
  if (const auto path = line_.value("--password-file")) {
    return firstLine(*path);
  }
  if (passwordFromKeychain_) {
    if (auto kept = passwordFromKeychain_(server, user)) {
      return std::move(*kept);
    }
  }
  return asked("Password of " + user + " at " + server + ": ", "--password-file");
}

std::optional<Secret> Passwords::master() const {
  if (const auto path = line_.value("--master-password-file")) {
    return firstLine(*path);
  }
  return line_.has("--ask-master-password") ? std::optional(asked("Master password: ", "--master-password-file"))
                                            : std::nullopt;
}

} // namespace lumora::client
