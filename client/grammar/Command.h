#pragma once

#include <LumoraKit/LumoraKit.h>

#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

/// \file
/// The table of the commands: the one source of the parser, the help, the completions and the manual page.

namespace lumora::client {

class Context;

/// What an option's value or an operand is: it is checked and completed accordingly.
enum class Kind {
  /// An option without a value
  Flag,
  Text,
  /// A number of zero or more
  Number,
  /// The same with a fraction
  Seconds,
  /// ISO 8601 with its distance to UTC
  Date,
  /// KEY=VALUE
  Pair,
  File,
  Folder,
  /// One of the words
  Word,
};

struct Option {
  enum class Need {
    Optional,
    /// Exactly one of the command's options that say so
    OneOf,
  };

  /// With both dashes.
  std::string_view name;
  char letter = '\0';
  std::string_view value = {};
  Kind kind = Kind::Flag;
  std::string_view help = {};
  std::vector<std::string_view> words = {};
  bool repeats = false;
  Need need = Need::Optional;
};

struct Operand {
  enum class Count { One, Optional, Many };

  std::string_view name;
  Kind kind = Kind::Text;
  Count count = Count::One;
  /// Proposals; others are taken as well.
  std::vector<std::string_view> words = {};
};

struct Command {
  /// Which of the connection options the command heeds.
  enum class Needs { Nothing, Server, User, Login, PasswordLogin };

  /// One word, or a group and a word.
  std::string_view words;
  std::string_view help;
  std::vector<Operand> operands;
  std::vector<Option> options;
  Needs needs = Needs::Nothing;
  /// Does the work. What it returns is printed; nothing: there is nothing to print.
  std::optional<Dictionary> (*run)(Context& context);
  /// The reply as text for people, whole lines.
  std::string (*text)(const Context& context, const Dictionary& reply);
  /// Further sentences for the help and the manual page.
  std::string_view remark = {};
};

/// All commands, in the order in which they are explained.
std::span<const Command> allCommands();

/// The options that every command takes.
std::span<const Option> commonOptions();
/// Those of them about the server and the user that a command heeds.
std::span<const Option> connectionOptions(Command::Needs needs);

/// The commands with this word as their first.
std::vector<const Command*> commandsOfGroup(std::string_view word);
/// Null when there is none.
const Command* findCommand(std::string_view words);

/// "lumora camera start [OPTION...] CAMERA"
std::string synopsis(const Command& command);
/// "--delay SECONDS"
std::string spelling(const Option& option);
/// "[KEY]", "FILE..."
std::string spelling(const Operand& operand);

} // namespace lumora::client
