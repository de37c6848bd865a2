#include "Command.h"

#include <algorithm>

namespace lumora::client {

namespace {

using Needs = Command::Needs;

const std::vector<Option>& serverOptions() {
  static const std::vector<Option> options{
      {.name = "--server",
       .letter = 's',
       .value = "HOST[:PORT]",
       .kind = Kind::Text,
       .help = "the server; without it the one that LUMORA_SERVER names"},
      {.name = "--port", .value = "PORT", .kind = Kind::Number, .help = "the server's TCP port, 8170 unless given"},
  };
  return options;
}

const std::vector<Option>& userOptions() {
  static const std::vector<Option> options{
      {.name = "--user",
       .letter = 'u',
       .value = "NAME",
       .kind = Kind::Text,
       .help = "the user; without it the one that LUMORA_USER names, else the one who is logged in here"},
  };
  return options;
}

const std::vector<Option>& passwordOptions() {
  static const std::vector<Option> options{
      {.name = "--password-file",
       .value = "FILE",
       .kind = Kind::File,
       .help = "take the password from the first line of a file, - for standard input; without it the terminal is "
               "asked"},
      {.name = "--keychain",
       .help = "take the password from the keychain, where \"lumora password store\" puts it, before the terminal is "
               "asked"},
  };
  return options;
}

const std::vector<Option>& generalOptions() {
  static const std::vector<Option> options{
      {.name = "--root",
       .value = "FOLDER",
       .kind = Kind::Folder,
       .help = "run the server tools below this folder; without it below the one that LUMORA_ROOT names, else the "
               "system's"},
      {.name = "--output",
       .letter = 'o',
       .value = "FORM",
       .kind = Kind::Word,
       .help = "print the reply as text for people, or whole as an XML property list or as JSON",
       .words = {"text", "plist", "json"}},
      {.name = "--progress", .help = "tell the progress on standard error also where that is no terminal"},
      {.name = "--quiet", .letter = 'q', .help = "tell no progress"},
      {.name = "--help", .letter = 'h', .help = "explain the command"},
      {.name = "--version", .help = "print the version"},
  };
  return options;
}

std::vector<Option> joined(std::initializer_list<const std::vector<Option>*> lists) {
  std::vector<Option> all;
  for (const auto* list : lists) {
    all.insert(all.end(), list->begin(), list->end());
  }
  return all;
}

const std::vector<Option>& loginOptions() {
  static const std::vector<Option> kerberos{
      {.name = "--kerberos", .help = "log in with the Kerberos ticket (single sign-on), without a password"}};
  static const auto options = joined({&serverOptions(), &userOptions(), &passwordOptions(), &kerberos});
  return options;
}

std::string requiredOptions(const Command& command) {
  std::string choices;
  for (const Option& option : command.options) {
    if (option.need == Option::Need::OneOf) {
      choices += (choices.empty() ? "" : " | ") + spelling(option);
    }
  }
  return choices.empty() ? "" : " (" + choices + ")";
}

} // namespace

std::span<const Option> commonOptions() {
  static const auto options = joined({&loginOptions(), &generalOptions()});
  return options;
}

std::span<const Option> connectionOptions(Needs needs) {
  static const auto user = joined({&serverOptions(), &userOptions()});
  static const auto passwordLogin = joined({&serverOptions(), &userOptions(), &passwordOptions()});
  switch (needs) {
  case Needs::Server:
    return serverOptions();
  case Needs::User:
    return user;
  case Needs::Login:
    return loginOptions();
  case Needs::PasswordLogin:
    return passwordLogin;
  default:
    return {};
  }
}

std::vector<const Command*> commandsOfGroup(std::string_view word) {
  std::vector<const Command*> found;
  for (const Command& command : allCommands()) {
    if (command.words.substr(0, command.words.find(' ')) == word) {
      found.push_back(&command);
    }
  }
  return found;
}

const Command* findCommand(std::string_view words) {
  const auto commands = allCommands();
  const auto found = std::ranges::find(commands, words, &Command::words);
  return found == commands.end() ? nullptr : &*found;
}

std::string synopsis(const Command& command) {
  std::string text = "lumora " + std::string(command.words) + " [OPTION...]" + requiredOptions(command);
  for (const Operand& operand : command.operands) {
    text += " " + spelling(operand);
  }
  return text;
}

std::string spelling(const Option& option) {
  std::string name(option.name);
  return option.value.empty() ? name : name + " " + std::string(option.value);
}

std::string spelling(const Operand& operand) {
  std::string name(operand.name);
  switch (operand.count) {
  case Operand::Count::Optional:
    return "[" + name + "]";
  case Operand::Count::Many:
    return name + "...";
  default:
    return name;
  }
}

} // namespace lumora::client
