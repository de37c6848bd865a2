#pragma once

#include "support/Sandbox.h"
#include "support/TemporaryFolder.h"

#include <string>
#include <string_view>
#include <vector>

#include <sys/types.h>

namespace lumora::tests {

/// A program in a session of its own, with or without a terminal. Ended with the object.
class ClientProcess {
public:
  enum class Terminal {
    None,
    /// A terminal that the test holds: standard input and standard error lead there, standard output into a file.
    Controlling,
    /// The same with standard output there too, as an interactive shell has it.
    Everywhere,
  };

  /// \param input on standard input, when there is no terminal
  explicit ClientProcess(const std::vector<std::string>& commandLine, Terminal terminal = Terminal::None,
                         std::string_view input = {});
  ClientProcess(const ClientProcess&) = delete;
  ClientProcess& operator=(const ClientProcess&) = delete;
  ~ClientProcess();

  pid_t process() const { return process_; }
  void signal(int number) const;
  /// Waits for the end. The exit status, or 128 and the signal, as a shell tells it.
  int wait();

  /// What was written so far.
  std::string standardOutput() const { return contentOf(folder_ / "output"); }
  std::string standardError() const { return contentOf(folder_ / "error"); }

  /// Reads from the terminal until the text has come; everything since the last call. What came instead when the
  /// program has ended or nothing comes for a long time.
  std::string readUntil(std::string_view text);
  void type(std::string_view text) const;
  bool echoes() const;

private:
  int openTerminal();

  TemporaryFolder folder_;
  int terminal_ = -1;
  pid_t process_ = -1;
};

/// Runs a program to its end without a terminal.
ProgramRun runToEnd(const std::vector<std::string>& commandLine, std::string_view input = {});

} // namespace lumora::tests
