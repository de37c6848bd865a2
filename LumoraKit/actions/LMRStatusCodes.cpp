#include <LumoraKit/actions/LMRStatusCodes.h>
#include <LumoraKit/login/LMRLocalizedString.h>

#include <map>
#include <string_view>
#include <utility>

namespace lumora {
namespace {

constexpr std::pair<std::int64_t, std::string_view> knownStatuses[] = {
    {10, "Not authorized as root"},
    {11, "Invalid input"},
    {12, "Invalid arguments"},
    {20, "Server is unavailable"},
    {21, "No server at hostname"},
    {22, "No response from server"},
    {23, "Server is not running SSL"},
    {24, "Invalid server certificate"},
    {25, "Unknown server error"},
    {26, "Not authorized"},
    {30, "Submission failed"},
    {31, "Upload server is unavailable"},
    {32, "File upload failed"},
    {33, "File copy failed"},
    {34, "Failed to complete submission"},
    {35, "Couldn't start sharing"},
    {36, "Remote camera failure"},
    {37, "Unknown server error"},
};

using Messages = std::map<std::int64_t, std::string>;

Messages localisedMessages() {
  Messages messages;
  for (const auto& [status, key] : knownStatuses) {
    messages.emplace(status, LMRLocalizedString(key));
  }
  return messages;
}

// Never destroyed: a worker may still fail while the process exits.
const Messages& messages() {
  static const auto* const table = new Messages(localisedMessages());
  return *table;
}

} // namespace

std::string messageForStatusCode(std::int64_t status) {
  const auto known = messages().find(status);
  return known != messages().end() ? known->second : LMRLocalizedString("Generic podcast error");
}

void prepareStatusMessages() {
  messages();
}

} // namespace lumora
