// The commands about a server itself.
#include "../output/Fields.h"
#include "../output/Text.h"
#include "../running/Connection.h"
#include "Context.h"
#include "Groups.h"

namespace lumora::client {

namespace {

std::optional<Dictionary> info(Context& context) {
  const auto address = ServerAddress::of(context.line());
  return context.reply(LMRActionFactory::actionToGetInfoForServer_port(address.host, address.port));
}

std::string infoText(const Context&, const Dictionary& reply) {
  return facts(reply, {{"hostname", "Host", plainText},
                       {"server", "Kind", plainText},
                       {"server_version", "Version", plainText},
                       {LMRServerAuthenticationTypeKey, "Authentication", plainText},
                       {"ssl", "SSL", plainText}});
}

// The session as the login left it: what two replies of the server told.
std::optional<Dictionary> login(Context& context) {
  const auto session = context.loggedInSession();
  Dictionary reply{
      {"server", session->server().value_or("")},
      {"port", int{session->port()}},
      {"authentication", session->authenticationType() == LMRAuthenticationTypePassword ? "password" : "kerberos"},
      {"library", session->isLumoraLibraryServer()}};
  for (const auto& [key, value] : {std::pair("version", session->version()),
                                   {"user_shortname", session->userName()},
                                   {"user_fullname", session->userFullName()}}) {
    if (value) {
      reply.set(key, *value);
    }
  }
  return reply;
}

std::string loginText(const Context&, const Dictionary& reply) {
  return facts(reply, {{"user_shortname", "User", plainText},
                       {"user_fullname", "Name", plainText},
                       {"server", "Server", plainText},
                       {"port", "Port", plainText},
                       {"version", "Version", plainText},
                       {"authentication", "Logged in by", plainText},
                       {"library", "Library server", plainText}});
}

} // namespace

std::vector<Command> serverCommands() {
  return {
      {.words = "info",
       .help = "tell what a server is and how it authenticates",
       .operands = {},
       .options = {},
       .needs = Command::Needs::Server,
       .run = info,
       .text = infoText,
       .remark = "Needs no login."},
      {.words = "login",
       .help = "try the login, and tell who one is",
       .operands = {},
       .options = {},
       .needs = Command::Needs::Login,
       .run = login,
       .text = loginText,
       .remark = "No other command needs it first: each one logs in by itself."},
  };
}

} // namespace lumora::client
