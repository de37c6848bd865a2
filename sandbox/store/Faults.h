#pragma once

#include "Store.h"

#include <vector>

/// \file
/// Faults that a tester asks for: what a real server does on a bad day.

namespace lumora::sandbox {

struct Fault {
  enum class Kind {
    /// Answers `value` milliseconds later.
    Latency,
    /// Ends with the status `value` and `message` on standard error.
    Failure,
    /// Does its work, but answers with what is no property list.
    Garbage,
    /// Never answers.
    Hang,
    /// Dies of the signal `value`.
    Crash,
    /// Does its work, writes half of the reply and ends with the status `value`.
    Partial,
    /// Does its work, writes half of the reply and never ends.
    Stall,
  };

  std::int64_t id = 0;
  /// The command word, or "*" for every command; or `transferName`.
  std::string command;
  Kind kind = Kind::Failure;
  std::int64_t value = 0;
  std::optional<std::string> message;
  /// How many more runs it strikes; absent: every one.
  std::optional<std::int64_t> remaining;
};

/// Stands for the transfer that goes on when the tool of an asynchronous submission has ended; "*" does not.
constexpr const char* transferName = "transfer";

std::string_view nameOf(Fault::Kind kind);

void addFault(Store& store, const Fault& fault);
void clearFaults(Store& store);
std::vector<Fault> faults(Store& store);
/// The faults that strike this run of a command, in the order they were asked for. Each is counted.
std::vector<Fault> takeFaults(Store& store, const std::string& command);

} // namespace lumora::sandbox
