// The commands about passwords that are kept in the keychain.
#include "../output/Text.h"
#include "../running/Connection.h"
#include "Context.h"
#include "Groups.h"

namespace lumora::client {

namespace {

// The login comes first, so that no wrong password is kept.
std::optional<Dictionary> storePassword(Context& context) {
  const auto session = context.loggedInSession();
  context.keychain().store(ServerAddress::of(context.line()).host, userName(context.line()),
                           Secret(session->password().value_or("")));
  return Dictionary{};
}

std::string storeText(const Context& context, const Dictionary&) {
  return "The keychain now holds the password of " + printable(userName(context.line())) + " at " +
         printable(ServerAddress::of(context.line()).host) + ".\n";
}

std::optional<Dictionary> forgetPassword(Context& context) {
  context.keychain().forget(ServerAddress::of(context.line()).host, userName(context.line()));
  return Dictionary{};
}

std::string forgetText(const Context& context, const Dictionary&) {
  return "The keychain no longer holds the password of " + printable(userName(context.line())) + " at " +
         printable(ServerAddress::of(context.line()).host) + ".\n";
}

} // namespace

std::vector<Command> passwordCommands() {
  return {
      {.words = "password store",
       .help = "try the login, and keep the password in the keychain",
       .operands = {},
       .options = {},
       .needs = Command::Needs::PasswordLogin,
       .run = storePassword,
       .text = storeText,
       .remark = "With \"--keychain\" other commands take it from there. The port is no part of it: a user has one "
                 "password at a host."},
      {.words = "password forget",
       .help = "remove the password from the keychain",
       .operands = {},
       .options = {},
       .needs = Command::Needs::User,
       .run = forgetPassword,
       .text = forgetText},
  };
}

} // namespace lumora::client
