#include "ToolProgram.h"

#include "Status.h"
#include "Strike.h"
#include "Tool.h"

#include <csignal>
#include <iostream>
#include <iterator>
#include <string_view>

namespace lumora::sandbox {

namespace {

void writeHelp(std::ostream& stream, const std::string& name) {
  stream << "Usage: " << name << " --plistin <REQUEST\n\n"
         << "Reads one request, an array in an XML property list, from standard input and writes the\n"
         << "reply, a dictionary in an XML property list, to standard output. A failure is an exit\n"
         << "status between 10 and 37 with the reason on standard error.\n\n"
         << "This is a stand-in for a Lumora server's tool; lumora-sandbox administrates the server.\n";
}

int fail(const std::string& name, Status status, std::string_view reason) {
  std::cerr << name << ": " << reason << '\n';
  return static_cast<int>(status);
}

int answerStandardInput(const Invocation& invocation) {
  const std::string request{std::istreambuf_iterator<char>(std::cin), {}};
  const Outcome outcome = answer(invocation.tool.value(), invocation.root, request);
  if (!outcome.standardError.empty()) {
    std::cerr << invocation.name << ": " << outcome.standardError;
  }
  std::cout << outcome.standardOutput << std::flush;
  if (!outcome.status) {
    hang();
  }
  return std::cout ? *outcome.status : fail(invocation.name, Status::UnknownServerError, "the reply cannot be written");
}

} // namespace

int runTool(const Invocation& invocation, int argc, char** argv) {
  // A reader that went away and a file-size limit are errors of a write, not ends of the process.
  std::signal(SIGPIPE, SIG_IGN);
  std::signal(SIGXFSZ, SIG_IGN);
  const std::string_view argument = argc == 2 ? argv[1] : "";
  if (argument == "--help") {
    writeHelp(std::cout, invocation.name);
    return 0;
  }
  if (argument != "--plistin") {
    return fail(invocation.name, Status::InvalidArguments, "the only argument must be --plistin");
  }
  if (invocation.root.empty()) {
    return fail(invocation.name, Status::ServerUnavailable, "there is no server's state beside this tool");
  }
  return answerStandardInput(invocation);
}

} // namespace lumora::sandbox
