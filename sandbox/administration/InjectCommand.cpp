#include "../commands/Command.h"
#include "../store/Faults.h"
#include "Commands.h"

#include <csignal>
#include <iostream>
#include <memory>
#include <set>

namespace lumora::sandbox {

namespace {

struct Options {
  std::string root;
  std::string command = "*";
  std::int64_t latency = 0;
  std::int64_t status = 0;
  std::int64_t signal = SIGSEGV;
  std::string message;
  std::int64_t times = 0;
};

void inject(const Options& options, Fault::Kind kind, std::int64_t value) {
  Store store = Store::open(options.root);
  Fault fault{0, options.command, kind, value, std::nullopt, std::nullopt};
  if (!options.message.empty()) {
    fault.message = options.message;
  }
  if (options.times > 0) {
    fault.remaining = options.times;
  }
  addFault(store, fault);
}

void list(const Options& options) {
  Store store = Store::open(options.root);
  for (const auto& fault : faults(store)) {
    std::cout << fault.id << '\t' << fault.command << '\t' << nameOf(fault.kind) << '\t' << fault.value << '\t'
              << (fault.remaining ? std::to_string(*fault.remaining) + " times" : "always") << '\t'
              << fault.message.value_or("") << '\n';
  }
}

void clear(const Options& options) {
  Store store = Store::open(options.root);
  clearFaults(store);
}

/// What a transfer that nobody waits for can meet: one that hung would stay for ever.
bool strikesTransfers(const std::string& kind) {
  return kind == "latency" || kind == "failure" || kind == "crash";
}

/// A fault for a mistyped command would never strike.
std::set<std::string> commandNames(const std::string& kind) {
  std::set<std::string> names{"*"};
  if (strikesTransfers(kind)) {
    names.emplace(transferName);
  }
  for (const auto tool : {ToolKind::Main, ToolKind::Action}) {
    for (const auto& command : commandsOf(tool)) {
      names.emplace(command.word);
    }
  }
  return names;
}

CLI::App& addKind(CLI::App& group, const std::string& name, const std::string& text,
                  const std::shared_ptr<Options>& options) {
  auto& command = *group.add_subcommand(name, text);
  addRootArgument(command, options->root);
  command
      .add_option("--command", options->command,
                  "command that it strikes, * for every one; for latency, failure and crash also transfer")
      ->check(CLI::IsMember(commandNames(name)).description(""))
      ->capture_default_str();
  command.add_option("--times", options->times, "how many runs it strikes; without it every one")
      ->check(CLI::PositiveNumber);
  return command;
}

void addFailure(CLI::App& group, const std::shared_ptr<Options>& options) {
  constexpr int highestStatus = 255;
  auto& failure = addKind(group, "failure", "End with a status", options);
  failure.add_option("--status", options->status, "exit status")->required()->check(CLI::Range(1, highestStatus));
  failure.add_option("--message", options->message, "text for standard error");
  failure.callback([options] { inject(*options, Fault::Kind::Failure, options->status); });
}

void addCrash(CLI::App& group, const std::shared_ptr<Options>& options) {
  auto& crash = addKind(group, "crash", "Die of a signal", options);
  crash.add_option("--signal", options->signal, "number of the signal")
      ->check(CLI::Range(1, SIGRTMIN - 1))
      ->capture_default_str();
  crash.callback([options] { inject(*options, Fault::Kind::Crash, options->signal); });
}

void addHalfReplies(CLI::App& group, const std::shared_ptr<Options>& options) {
  constexpr int highestStatus = 255;
  auto& partial = addKind(group, "partial", "Do the work, write half of the reply and end", options);
  partial.add_option("--status", options->status, "exit status")
      ->check(CLI::Range(0, highestStatus))
      ->capture_default_str();
  partial.callback([options] { inject(*options, Fault::Kind::Partial, options->status); });
  addKind(group, "stall", "Do the work, write half of the reply and never end", options).callback([options] {
    inject(*options, Fault::Kind::Stall, 0);
  });
}

} // namespace

void addInjectCommand(CLI::App& program) {
  auto options = std::make_shared<Options>();
  auto& group = *program.add_subcommand("inject", "Make the tools fail as real servers do")->require_subcommand(1);

  auto& latency = addKind(group, "latency", "Answer late", options);
  latency.add_option("--milliseconds", options->latency, "how late")->required()->check(CLI::NonNegativeNumber);
  latency.callback([options] { inject(*options, Fault::Kind::Latency, options->latency); });

  addFailure(group, options);
  addCrash(group, options);
  addKind(group, "garbage", "Do the work, but reply with what is no property list", options).callback([options] {
    inject(*options, Fault::Kind::Garbage, 0);
  });
  addHalfReplies(group, options);
  addKind(group, "hang", "Never answer", options).callback([options] { inject(*options, Fault::Kind::Hang, 0); });

  auto& listing = *group.add_subcommand("list", "List the faults: number, command, kind, value, times, message");
  addRootArgument(listing, options->root);
  listing.callback([options] { list(*options); });

  auto& clearing = *group.add_subcommand("clear", "Remove all faults");
  addRootArgument(clearing, options->root);
  clearing.callback([options] { clear(*options); });
}

} // namespace lumora::sandbox
