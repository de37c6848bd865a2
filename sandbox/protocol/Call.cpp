#include "Call.h"

#include "../Status.h"
#include "Grammar.h"

#include <charconv>

namespace lumora::sandbox {

namespace {

[[noreturn]] void refuse(const std::string& reason) {
  throw Refusal(Status::InvalidArguments, reason);
}

bool beginsWith(std::span<const Element> elements, std::string_view key) {
  return !elements.empty() && !elements.front().isWord() && elements.front().word == key;
}

void takeUserAndPassword(std::span<const Element>& elements, Credentials& credentials) {
  credentials.user = takeText(elements, "user");
  credentials.password = takeText(elements, "pass");
}

/// The auxiliary tool is not told the kind of login: it is single sign-on when no user follows.
void takeLogin(std::span<const Element>& elements, ToolKind tool, Credentials& credentials) {
  if (tool == ToolKind::Action) {
    if (beginsWith(elements, "user")) {
      takeUserAndPassword(elements, credentials);
    }
    return;
  }
  const std::string kind = takeText(elements, "auth");
  if (kind == "Password") {
    takeUserAndPassword(elements, credentials);
  } else if (kind != "Kerberos") {
    refuse(R"(the value of the element ("auth", ...) is neither "Password" nor "Kerberos")");
  }
}

std::optional<Credentials> takeCredentials(std::span<const Element>& elements, ToolKind tool) {
  if (!beginsWith(elements, "server")) {
    return std::nullopt;
  }
  Credentials credentials;
  credentials.server = parseAddress(takeText(elements, "server"));
  takeLogin(elements, tool, credentials);
  return credentials;
}

void takeCommand(std::span<const Element>& elements, ToolKind tool, Call& call) {
  if (tool == ToolKind::Action) {
    call.command = takeText(elements, "subcommand");
    return;
  }
  if (elements.empty()) {
    refuse("the command is missing");
  }
  call.command = elements.front().word;
  call.isVerb = !elements.front().isWord();
  if (!call.isVerb) {
    elements = elements.subspan(1);
  }
}

} // namespace

Call parseCall(std::span<const Element> elements, ToolKind tool) {
  Call call;
  call.credentials = takeCredentials(elements, tool);
  takeCommand(elements, tool, call);
  call.arguments = elements;
  return call;
}

Address parseAddress(const std::string& text) {
  const auto colon = text.rfind(':');
  if (colon == std::string::npos || colon == 0) {
    refuse("the server \"" + text + "\" is not of the form host:port");
  }
  Address address{text.substr(0, colon), 0};
  const char* const end = text.data() + text.size();
  const auto [stop, error] = std::from_chars(text.data() + colon + 1, end, address.port);
  if (error != std::errc() || stop != end) {
    refuse("the server \"" + text + "\" has no port number");
  }
  return address;
}

} // namespace lumora::sandbox
