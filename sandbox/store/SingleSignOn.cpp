#include "SingleSignOn.h"

namespace lumora::sandbox {

namespace {

namespace fs = std::filesystem;

constexpr const char* serviceKey = "kerberos_service";

} // namespace

std::optional<std::string> singleSignOnService(Store& store) {
  return store.setting(serviceKey);
}

fs::path keytabPath(const Store& store) {
  return store.stateFolder() / "krb5.keytab";
}

void enableSingleSignOn(Store& store, const fs::path& keytab, const std::string& service) {
  const fs::path path = keytabPath(store);
  fs::copy_file(keytab, path, fs::copy_options::overwrite_existing);
  fs::permissions(path, fs::perms::owner_read | fs::perms::owner_write);
  store.setSetting(serviceKey, service);
}

void disableSingleSignOn(Store& store) {
  store.execute("DELETE FROM settings WHERE key = ?", std::string(serviceKey));
  fs::remove(keytabPath(store));
}

void mapPrincipal(Store& store, const std::string& principal, const std::string& user) {
  store.execute("INSERT INTO principals VALUES (?, ?) ON CONFLICT (principal) DO UPDATE SET user = excluded.user",
                principal, user);
}

bool unmapPrincipal(Store& store, const std::string& principal) {
  return store.execute("DELETE FROM principals WHERE principal = ?", principal) > 0;
}

std::vector<std::pair<std::string, std::string>> principals(Store& store) {
  std::vector<std::pair<std::string, std::string>> all;
  auto row = store.query("SELECT principal, user FROM principals ORDER BY principal");
  while (row.executeStep()) {
    all.emplace_back(row.getColumn(0).getString(), row.getColumn(1).getString());
  }
  return all;
}

std::optional<std::string> userOfPrincipal(Store& store, const std::string& principal) {
  auto row = store.query("SELECT user FROM principals WHERE principal = ?", principal);
  return row.executeStep() ? std::optional(row.getColumn(0).getString()) : std::nullopt;
}

} // namespace lumora::sandbox
