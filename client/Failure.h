#pragma once

#include <stdexcept>
#include <string>

namespace lumora::client {

/// What the program itself ends with, as sysexits(3) has it. A failed server tool's own status comes before these.
enum ExitStatus : int {
  exitUsage = 64,
  exitBadData = 65,
  exitNoInput = 66,
  exitUnavailable = 69,
  exitInternal = 70,
  exitCannotCreate = 73,
  exitInputOutput = 74,
  exitProtocol = 76,
  exitNoPermission = 77,
};

/// Ends the program with a sentence for the user and an exit status. Used inside this program only.
class Failure : public std::runtime_error {
public:
  Failure(int status, const std::string& sentence) : std::runtime_error(sentence), status_(status) {}
  int status() const { return status_; }

private:
  int status_;
};

/// The program was told by a signal to end. Whoever holds something unfinished gives it back as this passes.
struct Interruption {
  int signal;
};

} // namespace lumora::client
