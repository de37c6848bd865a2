// lumora-sandbox-ticket keytab KEYTAB         writes the service whose key is in the keytab
// lumora-sandbox-ticket check KEYTAB SERVICE  writes the principal whose ticket for the service the caller holds
//
// Run by the tools, and a program of its own so that they need not load the Kerberos library. Ends with a tool's exit
// status and the reason on standard output when it cannot.

#include "../Status.h"
#include "Kerberos.h"

#include <csignal>
#include <iostream>
#include <string>
#include <string_view>
#include <vector>

#include <unistd.h>

namespace {

using namespace lumora::sandbox;

/// The library tries each Kerberos server several times, for half a minute when none answers.
constexpr unsigned secondsToWait = 5;
constexpr std::string_view nobodyAnswers = "no Kerberos server answered within 5 seconds\n";

void giveUp(int /*signal*/) {
  static_cast<void>(!write(STDOUT_FILENO, nobodyAnswers.data(), nobodyAnswers.size()));
  _exit(static_cast<int>(Status::NoResponse));
}

std::string answer(const std::vector<std::string>& arguments) {
  if (arguments.size() == 2 && arguments[0] == "keytab") {
    return serviceInKeytab(arguments[1]);
  }
  if (arguments.size() == 3 && arguments[0] == "check") {
    return principalOfCaller(arguments[1], arguments[2]);
  }
  throw TicketRefusal(static_cast<int>(Status::InvalidArguments), "this program is for the tools alone");
}

} // namespace

int main(int argc, char** argv) {
  std::signal(SIGALRM, giveUp);
  alarm(secondsToWait);
  try {
    std::cout << answer({argv + 1, argv + argc}) << std::endl;
    return 0;
  } catch (const TicketRefusal& refusal) {
    std::cout << refusal.what() << std::endl;
    return refusal.status();
  }
}
