#include "Tool.h"

#include "Status.h"
#include "Strike.h"
#include "TicketProgram.h"
#include "commands/Command.h"

#include <LumoraKit/platform/PropertyList.h>

#include <unistd.h>

namespace lumora::sandbox {

namespace {

constexpr const char* garbage = "<html><body>502 Bad Gateway</body>";

/// The outcome of a command with its reply, as far as the faults leave it.
Outcome outcomeOf(const Dictionary& reply, const Damage& damage) {
  Outcome outcome;
  outcome.standardOutput = damage.reply == Damage::Reply::Garbage ? garbage : xmlDescription(reply).value();
  if (damage.reply == Damage::Reply::Half) {
    outcome.standardOutput.resize(outcome.standardOutput.size() / 2);
    outcome.status = damage.status;
  }
  return outcome;
}

User logIn(Store& store, const Credentials& credentials) {
  checkAddress(store, credentials.server);
  if (!credentials.user) {
    return userWithTicket(store);
  }
  const auto user = authenticate(store, *credentials.user, credentials.password);
  if (!user) {
    throw Refusal(Status::NotAuthorized, "wrong user name or password");
  }
  return *user;
}

void checkLogin(const Command& command, const Call& call) {
  const std::string name = "\"" + std::string(command.word) + "\"";
  if (command.login == Command::Login::Required && !call.credentials) {
    throw Refusal(Status::InvalidArguments, name + " needs a server and a login before it");
  }
  if (command.login == Command::Login::None && call.credentials) {
    throw Refusal(Status::InvalidArguments, name + " takes no login");
  }
}

/// The helper agent's exec tool acts as the superuser. It may: only the owner of the state can open it.
void checkPrivilege(const Command& command, ToolKind tool) {
  if (command.isPrivileged && tool != ToolKind::Exec && geteuid() != 0) {
    throw Refusal(Status::NotRoot, "\"" + std::string(command.word) + "\" is for the superuser");
  }
}

Outcome answerOrThrow(ToolKind tool, const std::filesystem::path& root, const std::string& request) {
  const auto elements = parseRequest(request);
  const Call call = parseCall(elements, tool);
  const Command& command = findCommand(tool, call);
  checkLogin(command, call);
  const Arguments arguments = match(command.grammar, call.arguments);

  Store store = Store::open(root);
  checkPrivilege(command, tool);
  const Damage damage = strike(store, call.command);
  Context context{store, std::nullopt, {}, {}};
  if (call.credentials) {
    context.user = logIn(store, *call.credentials);
    context.host = call.credentials->server.host;
  }
  Outcome outcome = outcomeOf(command.run(context, arguments), damage);
  for (const auto& remark : context.remarks) {
    outcome.standardError += remark + "\n";
  }
  return outcome;
}

} // namespace

Outcome answer(ToolKind tool, const std::filesystem::path& root, const std::string& request) {
  try {
    return answerOrThrow(tool, root, request);
  } catch (const Refusal& refusal) {
    return {static_cast<int>(refusal.status()), {}, refusal.what() + std::string("\n")};
  } catch (const std::exception& failure) {
    return {static_cast<int>(Status::UnknownServerError), {}, failure.what() + std::string("\n")};
  }
}

} // namespace lumora::sandbox
