#include "Command.h"
#include "Completions.h"

#include <algorithm>
#include <set>

namespace lumora::client {

namespace {

constexpr const char* beginning =
    R"sh(# Completion of lumora(1) for bash. Made from the program's own table of commands.

_lumora_words() {
  mapfile -t COMPREPLY < <(compgen -W "$1" -- "$current")
}

_lumora_files() {
  compopt -o filenames 2>/dev/null
  mapfile -t COMPREPLY < <(compgen "$1" -- "$current")
}

# What an option or an operand takes.
_lumora_value() {
  case $1 in
    file) _lumora_files -f ;;
    folder) _lumora_files -d ;;
    text) COMPREPLY=() ;;
    *) _lumora_words "${1#words:}" ;;
  esac
}

)sh";

constexpr const char* rest = R"sh(_lumora() {
  local current=${COMP_WORDS[COMP_CWORD]} previous='' words=() command='' operands=0 i word kind
  ((COMP_CWORD == 0)) || previous=${COMP_WORDS[COMP_CWORD - 1]}
  # "--option=value" comes as three words.
  if [[ $current == = ]]; then
    current=''
  elif [[ $previous == = ]]; then
    ((COMP_CWORD < 2)) || previous=${COMP_WORDS[COMP_CWORD - 2]}
  fi
  for ((i = 1; i < COMP_CWORD; i++)); do
    word=${COMP_WORDS[i]}
    if [[ $word == -* ]]; then
      [[ ${COMP_WORDS[i + 1]} != = ]] || ((i++))
      [[ -z $(_lumora_option "$word") ]] || ((i++))
    else
      words+=("$word")
    fi
  done
  kind=$(_lumora_option "$previous")
  if [[ -n $kind ]]; then
    _lumora_value "$kind"
    return
  fi
  [[ ${words[0]} != help ]] || words=("${words[@]:1}")
  if [[ -n ${words[1]} && -n $(_lumora_command "${words[0]} ${words[1]}") ]]; then
    command="${words[0]} ${words[1]}"
    operands=$((${#words[@]} - 2))
  elif [[ -n ${words[0]} && -n $(_lumora_command "${words[0]}") ]]; then
    command=${words[0]}
    operands=$((${#words[@]} - 1))
  fi
  if [[ $current == -* ]]; then
    _lumora_words "$(_lumora_command "$command")"
  elif [[ -z ${words[0]} ]]; then
    _lumora_words "$(_lumora_next '')"
  elif ((${#words[@]} == 1)) && [[ -n $(_lumora_next "${words[0]}") ]]; then
    _lumora_words "$(_lumora_next "${words[0]}")"
  else
    _lumora_value "$(_lumora_operand "$command" "$operands")"
  fi
}

complete -F _lumora lumora
)sh";

std::string joined(const std::vector<std::string_view>& words) {
  std::string text;
  for (const auto word : words) {
    text += (text.empty() ? "" : " ") + std::string(word);
  }
  return text;
}

std::string kindWord(Kind kind, const std::vector<std::string_view>& words) {
  if (!words.empty()) {
    return "words:" + joined(words);
  }
  return kind == Kind::File ? "file" : kind == Kind::Folder ? "folder" : "text";
}

std::string branch(const std::string& patterns, const std::string& answer) {
  return "    " + patterns + ") echo '" + answer + "' ;;\n";
}

std::string function(const std::string& comment, const std::string& name, const std::string& branches) {
  return "# " + comment + "\n" + name + "() {\n  case $1 in\n" + branches + "  esac\n}\n\n";
}

std::set<std::string> optionBranches() {
  std::set<std::string> branches;
  const auto add = [&](std::span<const Option> options) {
    for (const Option& option : options) {
      const std::string letter = option.letter == '\0' ? "" : std::string(" | -") + option.letter;
      if (option.kind != Kind::Flag) {
        branches.insert(branch(std::string(option.name) + letter, kindWord(option.kind, option.words)));
      }
    }
  };
  add(commonOptions());
  for (const Command& command : allCommands()) {
    add(command.options);
  }
  return branches;
}

std::string optionsOf(const Command& command) {
  std::vector<std::string_view> names;
  const auto general = commonOptions().subspan(connectionOptions(Command::Needs::Login).size());
  for (const auto options : {std::span<const Option>(command.options), connectionOptions(command.needs), general}) {
    for (const Option& option : options) {
      names.push_back(option.name);
    }
  }
  return joined(names);
}

std::string commandBranches() {
  std::string text;
  for (const Command& command : allCommands()) {
    text += branch("'" + std::string(command.words) + "'", optionsOf(command));
  }
  std::vector<std::string_view> general;
  for (const Option& option : commonOptions()) {
    general.push_back(option.name);
  }
  return text + branch("''", joined(general));
}

std::string nextBranches() {
  std::vector<std::string_view> first{"help"};
  std::string text;
  for (const Command& command : allCommands()) {
    const auto word = command.words.substr(0, command.words.find(' '));
    if (std::ranges::find(first, word) != first.end()) {
      continue;
    }
    first.push_back(word);
    std::vector<std::string_view> second;
    for (const Command* member : commandsOfGroup(word)) {
      if (member->words.size() > word.size()) {
        second.push_back(member->words.substr(word.size() + 1));
      }
    }
    text += second.empty() ? "" : branch(std::string(word), joined(second));
  }
  return branch("''", joined(first)) + text;
}

std::string operandBranches() {
  std::string text;
  for (const Command& command : allCommands()) {
    for (std::size_t i = 0; i < command.operands.size(); ++i) {
      const Operand& operand = command.operands[i];
      const std::string place = operand.count == Operand::Count::Many ? "*" : std::to_string(i);
      text += branch("'" + std::string(command.words) + ":'" + place, kindWord(operand.kind, operand.words));
    }
  }
  return text + branch("*", "text");
}

} // namespace

std::string bashCompletion() {
  std::string options;
  for (const auto& branch : optionBranches()) {
    options += branch;
  }
  auto operands =
      function("What stands at a place behind a command, counted from 0.", "_lumora_operand", operandBranches());
  operands.replace(operands.find("$1 in"), 5, "\"$1:$2\" in");
  return beginning + function("What an option takes; nothing for one without a value.", "_lumora_option", options) +
         function("The options of a command.", "_lumora_command", commandBranches()) +
         function("The words that can follow a first word.", "_lumora_next", nextBranches()) + operands + rest;
}

} // namespace lumora::client
