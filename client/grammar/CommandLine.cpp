#include "CommandLine.h"

#include "../Failure.h"
#include "../output/Text.h"
#include "NearestWord.h"
#include "Values.h"

#include <algorithm>

namespace lumora::client {

namespace {

[[noreturn]] void refuse(const std::string& sentence) {
  throw Failure(exitUsage, sentence);
}

// Of one name, options of different commands are alike in whether they take a value.
const std::vector<const Option*>& everyOption() {
  static const auto all = [] {
    std::vector<const Option*> options;
    for (const Option& option : commonOptions()) {
      options.push_back(&option);
    }
    for (const Command& command : allCommands()) {
      for (const Option& option : command.options) {
        options.push_back(&option);
      }
    }
    return options;
  }();
  return all;
}

std::vector<std::string_view> optionNames() {
  std::vector<std::string_view> names;
  for (const Option* option : everyOption()) {
    names.push_back(option->name);
  }
  return names;
}

const Option& optionNamed(std::string_view name) {
  for (const Option* option : everyOption()) {
    if (option->name == name) {
      return *option;
    }
  }
  refuse("There is no option " + inQuotes(name) + nearestHint(name, optionNames()) + ".");
}

const Option& optionOfLetter(char letter) {
  for (const Option* option : everyOption()) {
    if (option->letter == letter) {
      return *option;
    }
  }
  refuse("There is no option " + inQuotes(std::string("-") + letter) + ".");
}

// The arguments one by one.
class Cursor {
public:
  explicit Cursor(const std::vector<std::string>& arguments) : arguments_(arguments) {}

  bool isAtEnd() const { return next_ == arguments_.size(); }
  const std::string& take() { return arguments_[next_++]; }
  const std::string& takeValue(const Option& option) {
    if (isAtEnd()) {
      refuse("The option " + inQuotes(option.name) + " needs a value: " + spelling(option) + ".");
    }
    return take();
  }

private:
  const std::vector<std::string>& arguments_;
  std::size_t next_ = 0;
};

// "--name", "--name=value" or "--name" and "value".
std::pair<std::string, std::string> longOption(const std::string& argument, Cursor& cursor) {
  const auto equals = argument.find('=');
  const Option& option = optionNamed(std::string_view(argument).substr(0, equals));
  const std::string name(option.name);
  if (option.kind != Kind::Flag) {
    return {name, equals == std::string::npos ? cursor.takeValue(option) : argument.substr(equals + 1)};
  }
  if (equals != std::string::npos) {
    refuse("The option " + inQuotes(name) + " takes no value.");
  }
  return {name, ""};
}

// "-q", "-ojson", "-o json" or "-qo json".
template <class Options> void letters(const std::string& argument, Cursor& cursor, Options& options) {
  for (std::size_t at = 1; at < argument.size(); ++at) {
    const Option& option = optionOfLetter(argument[at]);
    auto& values = options[std::string(option.name)];
    if (option.kind == Kind::Flag) {
      values.emplace_back();
      continue;
    }
    values.push_back(at + 1 < argument.size() ? argument.substr(at + 1) : cursor.takeValue(option));
    return;
  }
}

std::vector<std::string_view> firstWords() {
  std::vector<std::string_view> words{"help"};
  for (const Command& command : allCommands()) {
    words.push_back(command.words.substr(0, command.words.find(' ')));
  }
  return words;
}

[[noreturn]] void refuseWord(const std::string& first, const std::vector<std::string>& words) {
  std::vector<std::string_view> seconds;
  std::string list;
  for (const Command* command : commandsOfGroup(first)) {
    const auto second = command->words.substr(std::min(command->words.size(), first.size() + 1));
    seconds.push_back(second);
    list += (list.empty() ? "" : ", ") + std::string(second);
  }
  if (seconds.empty()) {
    refuse("There is no command " + inQuotes(first) + nearestHint(first, firstWords()) + ".");
  }
  if (words.size() < 2) {
    refuse("After " + inQuotes(first) + " one of these words is needed: " + list + ".");
  }
  refuse("There is no command " + inQuotes(first + " " + words[1]) + nearestHint(words[1], seconds) +
         ". There are: " + list + ".");
}

void checkValue(const std::string& what, Kind kind, const std::vector<std::string_view>& words,
                const std::string& value) {
  if (const auto wrong = fault(kind, words, value)) {
    refuse("The value " + inQuotes(value) + " of " + what + " " + *wrong + ".");
  }
}

template <class Options> const Option* findOption(const Options& options, std::string_view name) {
  const auto found = std::ranges::find(options, name, &Option::name);
  return found == options.end() ? nullptr : &*found;
}

} // namespace

CommandLine CommandLine::parse(const std::vector<std::string>& arguments) {
  CommandLine line;
  line.split(arguments);
  const bool asksForHelp = line.has("--help") || (!line.words_.empty() && line.words_.front() == "help");
  if (!asksForHelp && !line.has("--version")) {
    line.matchCommand();
    line.checkOptions();
  }
  return line;
}

std::optional<std::string> CommandLine::value(std::string_view option) const {
  const auto found = options_.find(option);
  return found == options_.end() ? std::nullopt : std::optional(found->second.back());
}

std::vector<std::string> CommandLine::values(std::string_view option) const {
  const auto found = options_.find(option);
  return found == options_.end() ? std::vector<std::string>() : found->second;
}

std::vector<std::string> CommandLine::operands(std::string_view name) const {
  const auto found = operands_.find(name);
  return found == operands_.end() ? std::vector<std::string>() : found->second;
}

void CommandLine::split(const std::vector<std::string>& arguments) {
  Cursor cursor(arguments);
  bool optionsEnded = false;
  while (!cursor.isAtEnd()) {
    const std::string& argument = cursor.take();
    if (optionsEnded || argument.size() < 2 || argument.front() != '-') {
      words_.push_back(argument);
    } else if (argument == "--") {
      optionsEnded = true;
    } else if (argument.starts_with("--")) {
      auto [name, value] = longOption(argument, cursor);
      options_[name].push_back(std::move(value));
    } else {
      letters(argument, cursor, options_);
    }
  }
}

void CommandLine::matchCommand() {
  if (words_.empty()) {
    refuse("A command is needed.");
  }
  if (words_.size() > 1) {
    command_ = findCommand(words_[0] + " " + words_[1]);
  }
  const std::size_t commandWords = command_ != nullptr ? 2 : 1;
  if (command_ == nullptr) {
    command_ = findCommand(words_[0]);
  }
  if (command_ == nullptr) {
    refuseWord(words_[0], words_);
  }
  matchOperands(commandWords);
}

void CommandLine::matchOperands(std::size_t commandWords) {
  const std::string name = inQuotes(command_->words);
  std::size_t next = commandWords;
  for (const Operand& operand : command_->operands) {
    const bool isMany = operand.count == Operand::Count::Many;
    if (next == words_.size() && operand.count != Operand::Count::Optional) {
      refuse("The command " + name + " needs " + std::string(operand.name) + ": " + synopsis(*command_) + ".");
    }
    const std::size_t end = isMany ? words_.size() : std::min(next + 1, words_.size());
    for (; next < end; ++next) {
      checkValue(std::string(operand.name), operand.kind, operand.words, words_[next]);
      operands_[std::string(operand.name)].push_back(words_[next]);
    }
  }
  if (next < words_.size()) {
    refuse("The command " + name + " does not take " + inQuotes(words_[next]) + ": " + synopsis(*command_) + ".");
  }
}

void CommandLine::checkOptions() const {
  std::size_t chosen = 0;
  std::string choices;
  for (const auto& [name, values] : options_) {
    const Option* option = findOption(command_->options, name);
    if (option == nullptr && (option = findOption(commonOptions(), name)) == nullptr) {
      refuse("The command " + inQuotes(command_->words) + " takes no option " + inQuotes(name) + ".");
    }
    for (const auto& value : values) {
      checkValue(inQuotes(name), option->kind, option->words, value);
    }
    chosen += option->need == Option::Need::OneOf ? 1 : 0;
  }
  for (const Option& option : command_->options) {
    if (option.need == Option::Need::OneOf) {
      choices += (choices.empty() ? "" : " or ") + spelling(option);
    }
  }
  if (!choices.empty() && chosen != 1) {
    refuse("The command " + inQuotes(command_->words) + " needs " + (chosen == 0 ? "" : "only one of ") + choices +
           ".");
  }
}

} // namespace lumora::client
