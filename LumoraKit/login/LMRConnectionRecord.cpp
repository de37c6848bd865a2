#include <LumoraKit/login/LMRConnectionRecord.h>
#include <LumoraKit/login/LMRFrameworkUserDefaults.h>
#include <LumoraKit/login/LMRPreferenceKeys.h>

#include <utility>

namespace LMRConnectionRecord {

lumora::Dictionary recordWithSession_port(const LMRSession& session, std::uint16_t port) {
  lumora::Dictionary record;
  const auto server = session.server();
  if (!server) {
    return record;
  }
  record.set(LMRSavedConnectionServerKey, *server);
  record.set(LMRSavedConnectionAuthenticationTypeKey, int{session.authenticationType()});
  record.set(LMRSavedConnectionPortKey, unsigned{port});
  if (auto userName = session.userName()) {
    record.set(LMRSavedConnectionUserNameKey, std::move(*userName));
  }
  return record;
}

void rememberRecentConnection(const lumora::Dictionary& record) {
  const auto server = record.string(LMRSavedConnectionServerKey);
  if (!server) {
    return;
  }
  const auto defaults = LMRFrameworkUserDefaults::standardFrameworkUserDefaults();
  auto stored = defaults->objectForKey(LMRRecentConnectionsKey);
  if (!stored || !stored->dictionary()) {
    stored = lumora::Dictionary();
  }
  stored->dictionary()->set(*server, record);
  defaults->setObject_forKey(stored, LMRRecentConnectionsKey);
}

} // namespace LMRConnectionRecord
