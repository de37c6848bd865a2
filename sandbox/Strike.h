#pragma once

#include "store/Faults.h"

#include <chrono>

namespace lumora::sandbox {

/// What the faults that struck leave of the reply.
struct Damage {
  enum class Reply { Whole, Garbage, Half };

  Reply reply = Reply::Whole;
  /// The exit status behind half a reply; absent: the tool does not end.
  std::optional<int> status = 0;
};

/// Lets the faults that were asked for strike this run of a command: waits, throws a Refusal, hangs or dies here, and
/// tells what is to be done to the reply later.
Damage strike(Store& store, const std::string& command);

/// The same for the transfer behind an asynchronous submission. Latency is not waited for here but told.
std::chrono::milliseconds strikeTransfer(Store& store);

/// Never returns.
[[noreturn]] void hang();

} // namespace lumora::sandbox
