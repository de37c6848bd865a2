#include "Storer.h"

#include "KeychainTest.h"

#include <cstdlib>
#include <iostream>

namespace lumora::tests {

int runStorer(const std::vector<std::string>& arguments) {
  const int first = std::stoi(arguments.at(1));
  const int last = std::stoi(arguments.at(2));
  KeychainTest::installStore(generousDeadlines);
  std::cout << "ready" << std::endl;
  std::string word;
  std::getline(std::cin, word);
  for (int number = first; number <= last; ++number) {
    LMRKeychainAccess::storePassword_forUserName_server("password " + std::to_string(number), "ada", server);
  }
  std::cout << "done" << std::endl;
  return EXIT_SUCCESS;
}

} // namespace lumora::tests
