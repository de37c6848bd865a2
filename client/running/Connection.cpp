#include "Connection.h"

#include "../Failure.h"
#include "../grammar/Values.h"
#include "../output/Text.h"

#include <glib.h>

#include <cstdlib>
#include <limits>

namespace lumora::client {

namespace {

std::optional<std::uint16_t> portNumber(const std::string& text) {
  const auto value = number(text);
  const bool isPort = value && *value > 0 && *value <= std::numeric_limits<std::uint16_t>::max();
  return isPort ? std::optional(static_cast<std::uint16_t>(*value)) : std::nullopt;
}

[[noreturn]] void refuse(const std::string& sentence) {
  throw Failure(exitUsage, sentence);
}

} // namespace

std::optional<ServerAddress> ServerAddress::parse(const std::string& text) {
  std::string host = text;
  std::string port;
  const auto colon = text.rfind(':');
  const bool isBracketed = text.starts_with('[') && text.find(']') != std::string::npos;
  const bool hasPort =
      isBracketed ? text.find("]:") != std::string::npos : colon != std::string::npos && text.find(':') == colon;
  if (hasPort) {
    host = text.substr(0, colon);
    port = text.substr(colon + 1);
  }
  if (isBracketed) {
    host = host.substr(1, host.size() - 2);
  }
  const auto value = portNumber(port);
  if (host.empty() || (hasPort && !value)) {
    return std::nullopt;
  }
  return ServerAddress{host, value.value_or(0)};
}

ServerAddress ServerAddress::of(const CommandLine& line) {
  auto text = line.value("--server");
  if (!text && !(text = environmentValue("LUMORA_SERVER"))) {
    refuse("A server is needed: give --server HOST, or set LUMORA_SERVER.");
  }
  auto address = parse(*text);
  if (!address) {
    refuse(inQuotes(*text) + " is not a server's address: HOST or HOST:PORT.");
  }
  if (const auto port = line.value("--port")) {
    const auto value = portNumber(*port);
    if (!value) {
      refuse(inQuotes(*port) + " is not a port: 1 to 65535.");
    }
    address->port = *value;
  }
  return *address;
}

std::string userName(const CommandLine& line) {
  if (auto user = line.value("--user")) {
    return *user;
  }
  if (auto user = environmentValue("LUMORA_USER")) {
    return *user;
  }
  return g_get_user_name();
}

std::optional<std::string> environmentValue(const char* name) {
  const char* const value = std::getenv(name);
  if (value == nullptr || *value == '\0') {
    return std::nullopt;
  }
  if (g_utf8_validate(value, -1, nullptr) == FALSE) {
    refuse(std::string(name) + " is not valid UTF-8.");
  }
  return value;
}

} // namespace lumora::client
