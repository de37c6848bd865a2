#include <LumoraKit/LumoraKit.h>

#include <iostream>

// Lists the workflows of a server: first-steps HOST USER, with the password on standard input.
int main(int argc, char** argv) {
  if (argc != 3) {
    return 2;
  }
  std::string password;
  std::getline(std::cin, password);
  const auto login = LMRAuthenticationAction::actionWithServer_port_userName_password(argv[1], 0, argv[2], password);
  login->runSynchronously();
  if (login->error()) {
    std::cerr << login->error()->localizedDescription() << '\n';
    return 1;
  }
  const auto list = LMRActionFactory::actionToListWorkflowsWithSession(login->session());
  list->runSynchronously();
  const auto reply = list->result();
  if (const lumora::Array* workflows = reply ? reply->array(LMRWorkflowsKey) : nullptr) {
    for (const lumora::Value& workflow : *workflows) {
      std::cout << workflow.dictionary()->string(LMRWorkflowTitleKey).value_or("(no title)") << '\n';
    }
  }
}
