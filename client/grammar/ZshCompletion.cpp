#include "Command.h"
#include "Completions.h"

#include <algorithm>

namespace lumora::client {

namespace {

constexpr const char* beginning = R"(#compdef lumora
# Completion of lumora(1) for zsh. Made from the program's own table of commands.

)";

std::string escaped(std::string_view text, std::string_view special) {
  std::string result;
  for (const char letter : text) {
    if (letter == '\'') {
      result += "'\\''";
    } else {
      result += (special.find(letter) == std::string_view::npos ? "" : "\\") + std::string(1, letter);
    }
  }
  return result;
}

std::string words(const std::vector<std::string_view>& all) {
  std::string text;
  for (const auto word : all) {
    text += (text.empty() ? "" : " ") + std::string(word);
  }
  return text;
}

std::string action(Kind kind, const std::vector<std::string_view>& proposals) {
  if (!proposals.empty()) {
    return "(" + words(proposals) + ")";
  }
  return kind == Kind::File ? "_files" : kind == Kind::Folder ? "_files -/" : "( )";
}

std::string message(std::string_view name) {
  return escaped(name, ":[]\\");
}

// 'name[help]:VALUE:action', as _arguments takes it.
std::string optionSpecifications(const Option& option, const std::string& indentation) {
  const bool takesValue = option.kind != Kind::Flag;
  const std::string help = "[" + escaped(option.help, ":[]\\") + "]";
  const std::string value = takesValue ? ":" + message(option.value) + ":" + action(option.kind, option.words) : "";
  const std::string repeat = option.repeats ? "*" : "";
  std::string text =
      indentation + "'" + repeat + std::string(option.name) + (takesValue ? "=" : "") + help + value + "' \\\n";
  if (option.letter != '\0') {
    text += indentation + "'" + repeat + "-" + option.letter + (takesValue ? "+" : "") + help + value + "' \\\n";
  }
  return text;
}

std::string optionSpecifications(const Command& command, const std::string& indentation) {
  std::string text;
  const auto general = commonOptions().subspan(connectionOptions(Command::Needs::Login).size());
  for (const auto options : {std::span<const Option>(command.options), connectionOptions(command.needs), general}) {
    for (const Option& option : options) {
      text += optionSpecifications(option, indentation);
    }
  }
  return text;
}

std::string operandSpecifications(const Command& command, const std::string& indentation) {
  std::string text;
  for (std::size_t i = 0; i < command.operands.size(); ++i) {
    const Operand& operand = command.operands[i];
    const bool isMany = operand.count == Operand::Count::Many;
    const std::string place =
        isMany ? "*:" : std::to_string(i + 1) + (operand.count == Operand::Count::One ? ":" : "::");
    text += indentation + "'" + place + message(operand.name) + ":" + action(operand.kind, operand.words) + "' \\\n";
  }
  return text;
}

std::string described(std::string_view word, std::string_view help) {
  return "    '" + escaped(word, ":\\") + ":" + escaped(help, "\\") + "'\n";
}

std::vector<std::string_view> firstWords() {
  std::vector<std::string_view> all;
  for (const Command& command : allCommands()) {
    const auto word = command.words.substr(0, command.words.find(' '));
    if (std::ranges::find(all, word) == all.end()) {
      all.push_back(word);
    }
  }
  return all;
}

std::string commandFunction() {
  std::string text = "_lumora_commands() {\n  local -a commands=(\n";
  for (const auto word : firstWords()) {
    const Command* const command = findCommand(word);
    text += described(word, command != nullptr ? std::string(command->help) : "commands about a " + std::string(word));
  }
  return text + described("help", "explain a command") + "  )\n  _describe -t commands command commands\n}\n\n";
}

// Which words can follow the first; none for most.
std::string secondWordFunction() {
  std::string text = "_lumora_second_words() {\n  local -a commands=()\n  case $1 in\n";
  for (const auto word : firstWords()) {
    std::string members;
    for (const Command* command : commandsOfGroup(word)) {
      if (command->words.size() > word.size()) {
        members += "  " + described(command->words.substr(word.size() + 1), command->help);
      }
    }
    text += members.empty() ? "" : "    " + std::string(word) + ") commands=(\n" + members + "    ) ;;\n";
  }
  return text + "  esac\n  (( $#commands )) && _describe -t commands command commands\n}\n\n";
}

std::string argumentsFunction() {
  std::string text = "_lumora_arguments() {\n  case $1 in\n";
  for (const Command& command : allCommands()) {
    text += "    '" + std::string(command.words) + "')\n      _arguments -s -S \\\n" +
            optionSpecifications(command, "        ") + operandSpecifications(command, "        ") + "        ;;\n";
  }
  return text + "    *) return 1 ;;\n  esac\n}\n\n";
}

// Common options may stand before the command; then the words of the command are taken off.
std::string mainFunction() {
  std::string options;
  for (const Option& option : commonOptions()) {
    options += optionSpecifications(option, "    ");
  }
  return "_lumora() {\n"
         "  local curcontext=$curcontext state state_descr line\n"
         "  typeset -A opt_args\n"
         "  _arguments -C -s -S \\\n" +
         options +
         "    '1: :_lumora_commands' \\\n"
         "    '*:: :->rest' && return\n"
         "  [[ $state == rest ]] || return 1\n"
         "  # Now words begins with the command's first word.\n"
         "  if [[ $words[1] == help ]]; then\n"
         "    case $CURRENT in\n"
         "      2) _lumora_commands ;;\n"
         "      3) _lumora_second_words $words[2] ;;\n"
         "    esac\n"
         "    return\n"
         "  fi\n"
         "  if (( CURRENT == 2 )) && [[ $words[2] != -* ]]; then\n"
         "    _lumora_second_words $words[1] && return\n"
         "  fi\n"
         "  local command=$words[1]\n"
         "  if (( CURRENT > 2 )) && _lumora_is_command \"$words[1] $words[2]\"; then\n"
         "    command=\"$words[1] $words[2]\"\n"
         "    shift words\n"
         "    (( CURRENT-- ))\n"
         "  fi\n"
         "  _lumora_arguments $command\n"
         "}\n\n"
         "_lumora \"$@\"\n";
}

std::string isCommandFunction() {
  std::string text;
  for (const Command& command : allCommands()) {
    text += (text.empty() ? "" : "|") + escaped(command.words, " ");
  }
  return "_lumora_is_command() {\n  [[ $1 == (" + text + ") ]]\n}\n\n";
}

} // namespace

std::string zshCompletion() {
  return beginning + commandFunction() + secondWordFunction() + isCommandFunction() + argumentsFunction() +
         mainFunction();
}

} // namespace lumora::client
