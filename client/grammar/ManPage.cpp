#include "ManPage.h"

#include "Command.h"

namespace lumora::client {

namespace {

constexpr const char* beginning = R"(.\" Made from the program's own table of commands.
.TH LUMORA 1 2026-11-21 "lumora )" LUMORA_VERSION R"(" "User Commands"
.SH NAME
lumora \- run an operation of a Lumora server
.SH SYNOPSIS
.B lumora
.I COMMAND
.RI [ OPTION ...]
.RI [ ARGUMENT ...]
.SH DESCRIPTION
.B lumora
runs one operation of a Lumora server, or of this machine as a part of one, and prints the reply.
Options may stand anywhere;
.B \-\-
ends them.
The value of a long option follows in the next argument or after an equals sign.
.PP
A password is never an argument.
Without
.B \-\-password\-file
the terminal is asked, also when standard input and outputs lead elsewhere, and does not show what is typed.
.PP
The reply goes to standard output, all else to standard error: there the progress is told while the operation runs,
and what went wrong in one sentence.
Files that
.B lumora
writes are written whole or not at all.
.SH COMMANDS
)";

constexpr const char* ending = R"(.SH OUTPUT
.TP
.B text
For people: tables, dates in local time, sizes in units of 1000 bytes.
What the server's texts hold of control characters is shown as escapes.
It may change from version to version.
.TP
.B plist
The server's whole reply as an XML property list.
.TP
.B json
The same as JSON: dates as strings of ISO 8601 in UTC, data as strings of base64.
.PP
A command without a reply prints an empty dictionary in the last two forms.
.SH ENVIRONMENT
.TP
.B LUMORA_SERVER
The server, as
.B \-\-server
names it.
.TP
.B LUMORA_USER
The user, as
.B \-\-user
names it.
.TP
.B LUMORA_ROOT
The folder that holds the server tools, as
.B \-\-root
names it.
.TP
.BR LC_ALL ", " LC_MESSAGES ", " LANG ", " LANGUAGE
The language of the progress and of the server's errors.
.SH EXIT STATUS
.TP
.B 0
The operation succeeded.
.TP
.BR 10 " to " 37
The status of the server tool: 11 and 12 for what it does not take, 20 to 25 when the server is not to be reached, 26
for a wrong user or password, 30 to 34 for a failed submission, 35 for sharing, 36 for a remote camera.
Any other status of the tool is passed on as well; 127 when it cannot be started.
.TP
.B 64
The command line is wrong.
.TP
.B 65
A file or a password cannot be sent.
.TP
.B 66
A file or a password cannot be read.
.TP
.B 69
The helper agent is not to be reached.
.TP
.BR 73 ", " 74
A file, or the output, cannot be written.
.TP
.B 76
The command was carried out, but the reply cannot be read.
.TP
.B 77
The helper agent gave no permission.
.TP
.BR 129 ", " 130 ", " 143
Ended by SIGHUP, SIGINT (Ctrl-C) or SIGTERM; the server tool was ended first.
.SH EXAMPLES
.EX
export LUMORA_SERVER=lumora.example.org LUMORA_USER=ada
lumora workflows
lumora camera start "Studio A" \-\-delay 5
lumora camera stop "Studio A" \-\-workflow lectures \-\-title "Lecture 1"
lumora submit lecture.mov \-\-workflow lectures \-\-async \-\-password\-file ~/.lumora
lumora cameras \-\-output json < /dev/null
.EE
.SH SEE ALSO
.BR bash (1),
.BR zsh (1)
)";

std::string escaped(std::string_view text) {
  std::string result;
  for (const char letter : text) {
    switch (letter) {
    case '\\':
      result += "\\e";
      break;
    case '-':
      result += "\\-";
      break;
    case '"':
      result += "\\(dq";
      break;
    default:
      result += letter;
    }
  }
  return result;
}

// Prose keeps its hyphens, but not those of options.
std::string prose(std::string_view text) {
  std::string result;
  for (std::size_t i = 0; i < text.size(); ++i) {
    const bool isDash = text[i] == '-' && (i == 0 || text[i - 1] == ' ' || text[i - 1] == '-' || text[i - 1] == '"');
    result += isDash ? "\\-" : text[i] == '-' ? "-" : escaped(text.substr(i, 1));
  }
  return result;
}

std::string sentence(std::string_view text) {
  std::string result = prose(text);
  result.front() = static_cast<char>(std::toupper(static_cast<unsigned char>(result.front())));
  return result + (result.back() == '.' ? "\n" : ".\n");
}

std::string optionEntry(const Option& option) {
  const std::string letter = option.letter == '\0' ? "" : std::string("\\fB\\-") + option.letter + "\\fR, ";
  const std::string value = option.value.empty() ? "" : " \\fI" + escaped(option.value) + "\\fR";
  std::string words;
  for (const auto word : option.words) {
    words += (words.empty() ? " (" : ", ") + std::string(word);
  }
  return ".TP\n" + letter + "\\fB" + escaped(option.name) + "\\fR" + value + "\n" +
         sentence(std::string(option.help) + (words.empty() ? "" : words + ")"));
}

std::string commandEntry(const Command& command) {
  std::string text =
      ".SS " + escaped(synopsis(command).substr(std::string_view("lumora ").size())) + "\n" + sentence(command.help);
  text += command.remark.empty() ? "" : sentence(command.remark);
  for (const Operand& operand : command.operands) {
    std::string words;
    for (const auto word : operand.words) {
      words += (words.empty() ? "" : ", ") + std::string(word);
    }
    text += words.empty() ? "" : std::string(operand.name) + " is one of " + escaped(words) + ".\n";
  }
  for (const Option& option : command.options) {
    text += optionEntry(option);
  }
  return text;
}

// A text line of the source may be broken at any blank.
std::string withShortLines(std::string text) {
  constexpr std::size_t longest = 80;
  std::size_t start = 0;
  for (std::size_t end = 0; (end = text.find('\n', start)) != std::string::npos; start = end + 1) {
    if (const auto blank = text.rfind(' ', start + longest); end - start > longest && text[start] != '.') {
      text[blank] = '\n';
      end = blank;
    }
  }
  return text;
}

} // namespace

std::string manPage() {
  std::string text = beginning;
  for (const Command& command : allCommands()) {
    text += commandEntry(command);
  }
  text += ".SH OPTIONS\nCommands that ask no server heed none of the options about server and user.\n";
  for (const Option& option : commonOptions()) {
    text += optionEntry(option);
  }
  return withShortLines(text + ending);
}

} // namespace lumora::client
