#pragma once

#include <array>
#include <atomic>
#include <cstddef>
#include <string>
#include <vector>

namespace lumora::tests {

/// The system call that is to fail in this process, and what became of it. It lies in memory that is shared with the
/// process that looks on.
struct Fault {
  /// Which function, and which call of it, from 1 on; 0: none is to fail.
  const char* function = "";
  std::size_t call = 0;
  /// Which of the ways in which that function can fail.
  std::size_t way = 0;

  /// Whether it has failed, and then the error (0: a part of the data was transferred, and no more), and in how many
  /// ways it can fail.
  std::atomic<bool> happened = false;
  std::atomic<int> error = 0;
  std::atomic<std::size_t> ways = 0;

  /// "rename, call 2: No space left on device".
  std::string description() const;
  /// The functions that were called.
  std::vector<const char*> called() const;
  /// Notes that one is called.
  void noteCalled(const char* name);

private:
  std::array<std::atomic<const char*>, 64> called_{};
};

/// From now on the calls of that function are counted, and one of them fails. This program has a definition of its own
/// of each function that the framework asks the system by: it fails, or calls the system's one.
void letFail(Fault& fault);
/// From now on none is counted, and none fails.
void letSucceed();

/// While it lives, no call is counted, and none fails.
class WithoutFaults {
public:
  WithoutFaults();
  WithoutFaults(const WithoutFaults&) = delete;
  WithoutFaults& operator=(const WithoutFaults&) = delete;
  ~WithoutFaults();

private:
  Fault* const paused_;
};

} // namespace lumora::tests
