// The examples about remembered passwords.

#include <LumoraKit/LumoraKit.h>

#include <filesystem>
#include <string>

namespace snippets {

void remember() {
  LMRKeychainAccess::storePassword_forUserName_server("apple", "ada", "lumora.example.org");
  auto password = LMRKeychainAccess::passwordForUserName_server("ada", "lumora.example.org");
  LMRKeychainAccess::removePasswordForUserName_server("ada", "lumora.example.org");
}

void embedded(const std::filesystem::path& file, const std::string& passphrase) {
  LMRErrorRef error;
  auto platform = lumora::Platform::current();
  platform.credentialStore = lumora::makeEmbeddedCredentialStore(file, lumora::Secret(passphrase), &error);
  if (!platform.credentialStore) {
    // error->localizedDescription() says why
  }
  lumora::Platform::install(platform);
}

// EmbeddedCredentialStore.h
void embeddedOrNot(const std::filesystem::path& file, const std::string& passphrase) {
  LMRErrorRef error;
  auto platform = lumora::Platform::current();
  platform.credentialStore = lumora::makeEmbeddedCredentialStore(file, lumora::Secret(passphrase), &error);
  if (platform.credentialStore) {
    lumora::Platform::install(platform);
  }
}

} // namespace snippets
