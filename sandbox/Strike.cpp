#include "Strike.h"

#include "Status.h"

#include <csignal>
#include <cstdlib>
#include <thread>

#include <sys/prctl.h>
#include <unistd.h>

namespace lumora::sandbox {

namespace {

[[noreturn]] void dieOf(int signal) {
  // A crash that was asked for leaves no core file and no sanitizer's report.
  prctl(PR_SET_DUMPABLE, 0);
  std::signal(signal, SIG_DFL);
  std::raise(signal);
  // The signal was one that does not kill.
  std::abort();
}

void strike(const Fault& fault, Damage& damage) {
  switch (fault.kind) {
  case Fault::Kind::Latency:
    std::this_thread::sleep_for(std::chrono::milliseconds(fault.value));
    break;
  case Fault::Kind::Failure:
    throw Refusal(static_cast<Status>(fault.value), fault.message.value_or("the failure that was asked for"));
  case Fault::Kind::Hang:
    hang();
  case Fault::Kind::Crash:
    dieOf(static_cast<int>(fault.value));
  case Fault::Kind::Garbage:
    damage.reply = Damage::Reply::Garbage;
    break;
  case Fault::Kind::Partial:
    damage = {Damage::Reply::Half, static_cast<int>(fault.value)};
    break;
  case Fault::Kind::Stall:
    damage = {Damage::Reply::Half, std::nullopt};
    break;
  }
}

} // namespace

Damage strike(Store& store, const std::string& command) {
  Damage damage;
  for (const auto& fault : takeFaults(store, command)) {
    strike(fault, damage);
  }
  return damage;
}

std::chrono::milliseconds strikeTransfer(Store& store) {
  std::chrono::milliseconds latency{0};
  Damage none;
  for (const auto& fault : takeFaults(store, transferName)) {
    if (fault.kind == Fault::Kind::Latency) {
      latency += std::chrono::milliseconds(fault.value);
    } else {
      strike(fault, none);
    }
  }
  return latency;
}

void hang() {
  for (;;) {
    pause();
  }
}

} // namespace lumora::sandbox
