#pragma once

#include "Command.h"

#include <map>

namespace lumora::client {

/// What the user typed, matched with the table. Options may stand anywhere, "--" ends them, and of a repeated one that
/// does not collect its values the last counts.
class CommandLine {
public:
  /// \param arguments without the program's name
  /// A mistake is a Failure with exitUsage and a sentence that tells what would have been right.
  static CommandLine parse(const std::vector<std::string>& arguments);

  /// Null when help or the version was asked for.
  const Command* command() const { return command_; }
  /// The words that are no options, for the help.
  const std::vector<std::string>& words() const { return words_; }

  bool has(std::string_view option) const { return options_.find(option) != options_.end(); }
  /// The last value; nothing when the option is not there.
  std::optional<std::string> value(std::string_view option) const;
  std::vector<std::string> values(std::string_view option) const;

  /// The one value of an operand that the table requires.
  const std::string& operand(std::string_view name) const { return operands_.find(name)->second.front(); }
  std::vector<std::string> operands(std::string_view name) const;

private:
  using Values = std::map<std::string, std::vector<std::string>, std::less<>>;

  void split(const std::vector<std::string>& arguments);
  void matchCommand();
  void matchOperands(std::size_t commandWords);
  void checkOptions() const;

  const Command* command_ = nullptr;
  std::vector<std::string> words_;
  Values options_;
  Values operands_;
};

} // namespace lumora::client
