#include "Tool.h"

#include "Status.h"
#include "commands/Command.h"
#include "store/Faults.h"

#include <LumoraKit/platform/PropertyList.h>

#include <thread>

#include <unistd.h>

namespace lumora::sandbox {

namespace {

constexpr const char* garbage = "<html><body>502 Bad Gateway</body>";

[[noreturn]] void hang() {
  for (;;) {
    pause();
  }
}

/// Lets a fault strike before the command runs. True when the reply is to be spoilt.
bool strike(const Fault& fault) {
  switch (fault.kind) {
  case Fault::Kind::Latency:
    std::this_thread::sleep_for(std::chrono::milliseconds(fault.value));
    return false;
  case Fault::Kind::Failure:
    throw Refusal(static_cast<Status>(fault.value), fault.message.value_or("the failure that was asked for"));
  case Fault::Kind::Hang:
    hang();
  case Fault::Kind::Garbage:
    return true;
  }
  return false;
}

bool strikeAll(Store& store, const std::string& command) {
  bool isSpoilt = false;
  for (const auto& fault : takeFaults(store, command)) {
    isSpoilt = strike(fault) || isSpoilt;
  }
  return isSpoilt;
}

/// Single sign-on is always the one user that the server was set up with; there is no ticket to be checked.
std::optional<User> singleSignOnUser(Store& store) {
  const auto name = store.setting("kerberos_user");
  return name ? findUser(store, *name) : std::nullopt;
}

User logIn(Store& store, const Credentials& credentials) {
  checkAddress(store, credentials.server);
  const auto user =
      credentials.user ? authenticate(store, *credentials.user, credentials.password) : singleSignOnUser(store);
  if (!user) {
    throw Refusal(Status::NotAuthorized,
                  credentials.user ? "wrong user name or password" : "the server offers no single sign-on");
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

Outcome answerOrThrow(ToolKind tool, const std::filesystem::path& root, const std::string& request) {
  const auto elements = parseRequest(request);
  const Call call = parseCall(elements, tool);
  const Command& command = findCommand(tool, call);
  checkLogin(command, call);
  const Arguments arguments = match(command.grammar, call.arguments);

  Store store = Store::open(root);
  const bool isSpoilt = strikeAll(store, call.command);
  Context context{store, std::nullopt, {}};
  if (call.credentials) {
    context.user = logIn(store, *call.credentials);
  }
  const Dictionary reply = command.run(context, arguments);

  Outcome outcome{0, isSpoilt ? garbage : xmlDescription(reply).value(), {}};
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
