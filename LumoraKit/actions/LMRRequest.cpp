#include <LumoraKit/actions/LMRRequest.h>
#include <LumoraKit/actions/LMRToolPaths.h>
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/PropertyList.h>

#include <algorithm>
#include <cstdint>
#include <utility>

namespace lumora {
namespace {

bool takesCommandWord(std::string_view tool) {
  return tool == LMRLumoraToolPath || tool == LMRLumoraExecToolPath;
}

void appendCredentials(Array& request, const LMRSession& session, bool withAuthenticationWord) {
  const bool byPassword = session.authenticationType() == LMRAuthenticationTypePassword;
  if (withAuthenticationWord) {
    request.push_back(requestPair("auth", Value(byPassword ? "Password" : "Kerberos")));
  }
  if (byPassword) {
    request.push_back(requestPair("user", session.userName()));
    request.push_back(requestPair("pass", session.password()));
  }
}

Array elementsOf(const Request& request) {
  const bool isServerTool = takesCommandWord(request.tool);
  Array elements;
  if (request.session) {
    elements.push_back(requestPair("server", hostAndPort(request.session->server(), request.session->port())));
    appendCredentials(elements, *request.session, isServerTool);
  }
  if (request.command) {
    elements.push_back(isServerTool ? Value(*request.command) : requestPair("subcommand", *request.command));
  }
  if (request.arguments) {
    elements.insert(elements.end(), request.arguments->begin(), request.arguments->end());
  }
  return elements;
}

// Credentials stand one level deep, as values of pairs.
void wipeValues(Array& elements) {
  for (Value& element : elements) {
    Array* const pair = element.array();
    for (std::size_t index = 1; pair && index < pair->size(); ++index) {
      if (std::string* const text = (*pair)[index].string()) {
        wipe(*text);
      }
    }
  }
}

bool canBeWritten(const Value& element) {
  std::optional<std::string> text = xmlDescription(element);
  if (text) {
    wipe(*text);
  }
  return text.has_value();
}

// Names the element at fault and nothing of its content, which may be a password.
std::string refusalReason(const Array& elements) {
  const auto fault = std::ranges::find_if_not(elements, canBeWritten);
  const auto position = static_cast<std::uint64_t>(fault - elements.begin() + 1);
  return format("Element %u of the request cannot be written as a property list", {text(position)});
}

} // namespace

Value requestPair(std::string_view key, std::optional<Value> value) {
  Array pair;
  pair.reserve(2);
  pair.emplace_back(key);
  if (value) {
    pair.push_back(std::move(*value));
  }
  return pair;
}

std::string hostAndPort(const std::optional<std::string>& host, std::uint16_t port) {
  return format("%@:%u", {text(host), text(unsigned{port})});
}

std::optional<Secret> Request::serialised(std::string& reason) const {
  Array request = elementsOf(*this);
  std::optional<std::string> text = xmlDescription(request);
  if (!text) {
    reason = refusalReason(request);
  }
  wipeValues(request);
  return text ? std::optional<Secret>(std::move(*text)) : std::nullopt;
}

} // namespace lumora
