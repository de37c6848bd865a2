#include "Caller.h"

#include <LumoraKit/actions/LMRActionFactory.h>
#include <LumoraKit/platform/KTHelperAgent.h>
#include <LumoraKit/platform/Platform.h>

#include <charconv>
#include <cstdlib>
#include <iostream>

#include <grp.h>
#include <unistd.h>

namespace lumora::tests {
namespace {

std::string digitsOf(const Data& bytes) {
  constexpr const char* digits = "0123456789abcdef";
  std::string text;
  for (const std::uint8_t byte : bytes) {
    text += digits[byte >> 4U];
    text += digits[byte & 0xFU];
  }
  return text;
}

Data bytesOf(std::string_view digits) {
  Data bytes(digits.size() / 2);
  for (std::size_t index = 0; index < bytes.size(); ++index) {
    std::from_chars(digits.data() + 2 * index, digits.data() + 2 * index + 2, bytes[index], 16);
  }
  return bytes;
}

bool becomeUser(const std::string& number) {
  const auto user = static_cast<uid_t>(std::stoul(number));
  return user == getuid() || (setgroups(0, nullptr) == 0 && setgid(user) == 0 && setuid(user) == 0);
}

void change(const Authorization& authorization, const std::string& value) {
  const auto action = LMRActionFactory::actionToSetRemoteRecorderConfigurationValue_forKey_authorization(
      value, std::string(LMRRemoteRecorderQualityDeviceKey), &authorization);
  action->runSynchronously();
  if (const auto error = action->error()) {
    std::cout << "failed " << error->code() << std::endl;
  } else {
    std::cout << "succeeded " << action->result()->string(LMRRemoteRecorderQualityDeviceKey).value_or("nothing")
              << std::endl;
  }
}

} // namespace

int runCaller(const std::vector<std::string>& arguments) {
  if (!becomeUser(arguments.at(0))) {
    return EXIT_FAILURE;
  }
  std::optional<Authorization> authorization;
  LMRErrorRef error;
  if (arguments.size() > 1) {
    authorization = Authorization{bytesOf(arguments.at(1))};
  } else {
    authorization =
        Platform::current().helperAgent->authorize(std::string(LMRHelperAgentIdentifier), KTHelperAgentDomainSystem,
                                                   "org.vantor.lumagentconfigd.configure", &error);
  }
  if (!authorization) {
    std::cout << "refused " << error->code() << std::endl;
    return EXIT_SUCCESS;
  }
  std::cout << "authorized " << digitsOf(authorization->bytes) << std::endl;
  std::string line;
  std::getline(std::cin, line);
  change(*authorization, line);
  return EXIT_SUCCESS;
}

} // namespace lumora::tests
