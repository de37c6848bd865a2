#include "Help.h"

#include "../Failure.h"
#include "../output/Text.h"
#include "Command.h"
#include "NearestWord.h"

#include <algorithm>

namespace lumora::client {

namespace {

constexpr std::size_t lineWidth = 88;

struct Entry {
  std::string name;
  std::string help;
};

// Words into lines that begin at a column.
std::string filled(std::string_view text, std::size_t column) {
  std::string result;
  std::size_t taken = column;
  while (!text.empty()) {
    const auto word = text.substr(0, text.find(' '));
    text.remove_prefix(std::min(text.size(), word.size() + 1));
    if (taken > column && taken + 1 + word.size() > lineWidth) {
      result += "\n" + std::string(column, ' ');
      taken = column;
    }
    result += (taken > column ? " " : "") + std::string(word);
    taken += (taken > column ? 1 : 0) + word.size();
  }
  return result + "\n";
}

std::string section(const std::string& title, const std::vector<Entry>& entries) {
  std::size_t longest = 0;
  for (const Entry& entry : entries) {
    longest = std::max(longest, entry.name.size());
  }
  std::string text = entries.empty() ? "" : "\n" + title + ":\n";
  for (const Entry& entry : entries) {
    const std::string name = "  " + entry.name + std::string(longest - entry.name.size() + 2, ' ');
    text += name + filled(entry.help, name.size());
  }
  return text;
}

std::string capitalised(std::string_view text) {
  std::string sentence(text);
  sentence.front() = static_cast<char>(std::toupper(static_cast<unsigned char>(sentence.front())));
  return sentence + ".";
}

std::vector<Entry> entriesOf(std::span<const Option> options) {
  std::vector<Entry> entries;
  for (const Option& option : options) {
    const std::string letter = option.letter == '\0' ? "    " : std::string("-") + option.letter + ", ";
    std::string help(option.help);
    for (std::size_t i = 0; i < option.words.size(); ++i) {
      help += (i == 0 ? ": " : ", ") + std::string(option.words[i]);
    }
    entries.push_back({letter + spelling(option), help});
  }
  return entries;
}

std::vector<Entry> entriesOf(const std::vector<const Command*>& commands) {
  std::vector<Entry> entries;
  for (const Command* command : commands) {
    std::string name(command->words);
    for (const Operand& operand : command->operands) {
      name += " " + spelling(operand);
    }
    entries.push_back({name, std::string(command->help)});
  }
  return entries;
}

std::span<const Option> generalOptions() {
  return commonOptions().subspan(connectionOptions(Command::Needs::Login).size());
}

std::string commandHelp(const Command& command) {
  std::string text = "usage: " + synopsis(command) + "\n\n" + filled(capitalised(command.help), 0);
  if (!command.remark.empty()) {
    text += filled(command.remark, 0);
  }
  for (const Operand& operand : command.operands) {
    std::string words;
    for (const auto word : operand.words) {
      words += (words.empty() ? "" : ", ") + std::string(word);
    }
    text += words.empty() ? "" : "\n" + filled(std::string(operand.name) + " is one of " + words + ".", 0);
  }
  return text + section("Options", entriesOf(std::span(command.options))) +
         section("Server and user", entriesOf(connectionOptions(command.needs))) +
         section("General", entriesOf(generalOptions()));
}

std::string joined(const std::vector<std::string>& words) {
  std::string text;
  for (const auto& word : words) {
    text += (text.empty() ? "" : " ") + word;
  }
  return text;
}

} // namespace

std::string programHelp() {
  std::vector<const Command*> commands;
  for (const Command& command : allCommands()) {
    commands.push_back(&command);
  }
  return "usage: lumora COMMAND [OPTION...] [ARGUMENT...]\n\nRuns an operation of a Lumora server.\n" +
         section("Commands", entriesOf(commands)) +
         section("Server and user", entriesOf(connectionOptions(Command::Needs::Login))) +
         section("General", entriesOf(generalOptions())) + "\n\"lumora help COMMAND\" explains a command.\n";
}

std::string helpFor(const std::vector<std::string>& words) {
  if (words.empty()) {
    return programHelp();
  }
  // Behind the command may stand what it is to work with.
  for (const auto& name : {words.size() > 1 ? words[0] + " " + words[1] : words[0], words[0]}) {
    if (const Command* const command = findCommand(name)) {
      return commandHelp(*command);
    }
  }
  const auto group = commandsOfGroup(words.front());
  if (group.empty()) {
    std::vector<std::string_view> all;
    for (const Command& command : allCommands()) {
      all.push_back(command.words);
    }
    throw Failure(exitUsage, "There is no command " + inQuotes(joined(words)) + nearestHint(joined(words), all) + ".");
  }
  return "usage: lumora " + words.front() + " COMMAND [OPTION...] [ARGUMENT...]\n" +
         section("Commands", entriesOf(group));
}

} // namespace lumora::client
