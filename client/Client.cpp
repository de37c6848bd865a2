#include "Client.h"

#include "commands/Context.h"
#include "grammar/Completions.h"
#include "grammar/Help.h"
#include "grammar/ManPage.h"
#include "output/JSON.h"
#include "output/OutputFile.h"
#include "output/Text.h"
#include "running/Interrupts.h"

#include <glib.h>

#include <csignal>
#include <cstdio>

namespace lumora::client {

namespace {

void checkText(const std::vector<std::string>& arguments) {
  for (const auto& argument : arguments) {
    if (g_utf8_validate_len(argument.data(), argument.size(), nullptr) == FALSE) {
      throw Failure(exitUsage, "The argument " + inQuotes(argument) + " is not valid UTF-8.");
    }
  }
}

std::string rendered(const Context& context, const Dictionary& reply) {
  const auto form = context.line().value("--output").value_or("text");
  if (form == "json") {
    return json(reply);
  }
  return form == "plist" ? xmlDescription(reply).value_or("") : context.line().command()->text(context, reply);
}

void runCommand(const CommandLine& line) {
  ActionRunner runner(line);
  const Keychain keychain(runner);
  const auto kept = [&](const std::string& server, const std::string& user) { return keychain.password(server, user); };
  Context context(line, runner, Passwords(line, line.has("--keychain") ? PasswordStore(kept) : nullptr));
  if (const auto reply = line.command()->run(context)) {
    writeToStandardOutput(rendered(context, *reply));
  }
}

std::string help(const CommandLine& line) {
  auto words = line.words();
  if (!words.empty() && words.front() == "help") {
    words.erase(words.begin());
  }
  return helpFor(words);
}

// For the build: what is installed beside the program.
std::string generated(const std::string& what) {
  if (what == "bash") {
    return bashCompletion();
  }
  return what == "zsh" ? zshCompletion() : manPage();
}

void run(const std::vector<std::string>& arguments) {
  checkText(arguments);
  if (arguments.size() == 2 && arguments.front() == "--generate") {
    return writeToStandardOutput(generated(arguments.back()));
  }
  if (arguments.empty()) {
    std::fputs(programHelp().c_str(), stderr);
    throw Failure(exitUsage, "A command is needed.");
  }
  const auto line = CommandLine::parse(arguments);
  if (line.command() != nullptr) {
    runCommand(line);
  } else if (line.has("--version")) {
    writeToStandardOutput("lumora " LUMORA_VERSION "\n");
  } else {
    writeToStandardOutput(help(line));
  }
}

int complain(const char* sentence, int status) {
  std::fprintf(stderr, "lumora: %s\n", sentence);
  return status;
}

} // namespace

int runClient(const std::vector<std::string>& arguments) {
  catchInterrupts();
  // What cannot be written is told by write(2), wherever this program was started from.
  std::signal(SIGPIPE, SIG_IGN);
  Application::setIdentity("org.vantor.lumora.client", "lumora");
  try {
    run(arguments);
    return 0;
  } catch (const Interruption& interruption) {
    endBySignal(interruption.signal);
  } catch (const Failure& failure) {
    return complain(failure.what(), failure.status());
  } catch (const std::exception& error) {
    return complain(error.what(), exitInternal);
  }
}

} // namespace lumora::client
