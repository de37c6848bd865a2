#include "SecretServiceStore.h"

#include <LumoraKit/platform/linux/AtomicFile.h>
#include <LumoraKit/platform/linux/Backends.h>
#include <LumoraKit/platform/linux/FileLock.h>
#include <LumoraKit/platform/linux/UserFolders.h>

#include <cerrno>
#include <utility>

namespace lumora::backend {
namespace {

constexpr mode_t folderPermissions = 0700;
constexpr const char* lockName = ".org.vantor.lumora.kit.credentials.lock";

// By the names that other programs find items and their kind by.
SecretAttributes attributesOf(const std::string& service) {
  return {{"xdg:schema", "org.vantor.lumora.Credential"}, {"service", service}};
}

SecretAttributes attributesOf(const std::string& service, const std::string& account) {
  auto attributes = attributesOf(service);
  attributes["account"] = account;
  return attributes;
}

// A bus ends the connection of who sends anything else.
LMRErrorRef refusal(const std::string& service, const std::string& account = {}) {
  return isCredentialText(service) && isCredentialText(account)
             ? nullptr
             : credentialError(CredentialError::UnusableText, "The credential store cannot keep such a text");
}

LMRErrorRef notFound() {
  return credentialError(CredentialError::ItemNotFound, "The credential store has no such item");
}

LMRErrorRef takeTurn(FileLock& lock, const std::filesystem::path& folder, FileLock::Time end) {
  LMRErrorRef error = makeDirectories(folder, folderPermissions);
  if (!error) {
    error = lock.take(folder / lockName, end);
  }
  if (!error) {
    return nullptr;
  }
  return credentialError(error->code() == ETIMEDOUT ? CredentialError::TimedOut : CredentialError::Failed,
                         error->localizedDescription());
}

} // namespace

SecretServiceStore::SecretServiceStore(std::filesystem::path lockFolder, SecretServiceDeadlines deadlines)
    : lockFolder_(std::move(lockFolder)), deadlines_(deadlines) {}

// Everything that may take long comes before the turn is taken. The collection is looked for once more in the turn: a
// search tells nothing while the service does not see its collections.
LMRErrorRef SecretServiceStore::add(const std::string& service, const std::string& account, const Secret& secret) {
  if (LMRErrorRef error = refusal(service, account)) {
    return error;
  }
  const auto attributes = attributesOf(service, account);
  SecretServiceDialogue dialogue(deadlines_);
  ObjectPath collection;
  SecretServiceDialogue::Found present;
  FileLock turn;
  LMRErrorRef error = dialogue.connect();
  error = error ? error : dialogue.findDefaultCollection(collection);
  error = error ? error : dialogue.unlock({collection});
  error = error ? error : dialogue.openSession();
  error = error ? error : takeTurn(turn, lockFolder_, dialogue.end());
  error = error ? error : dialogue.findDefaultCollection(collection);
  error = error ? error : dialogue.search(attributes, present);
  if (error) {
    return error;
  }
  if (!present.unlocked.empty() || !present.locked.empty()) {
    return credentialError(CredentialError::DuplicateItem, "The credential store has such an item already");
  }
  return dialogue.create(collection, service, attributes, secret);
}

LMRErrorRef SecretServiceStore::find(const std::string& service, const std::string& account, std::string* handle,
                                     Secret* secret) {
  if (LMRErrorRef error = refusal(service, account)) {
    return error;
  }
  SecretServiceDialogue dialogue(deadlines_);
  SecretServiceDialogue::Found found;
  LMRErrorRef error = dialogue.connect();
  error = error ? error : dialogue.search(attributesOf(service, account), found);
  const bool isLocked = found.unlocked.empty();
  const auto& paths = isLocked ? found.locked : found.unlocked;
  if (error || paths.empty()) {
    return error ? error : notFound();
  }
  if (secret) {
    error = isLocked ? dialogue.unlock({paths.front()}) : nullptr;
    error = error ? error : dialogue.openSession();
    error = error ? error : dialogue.read(paths.front(), *secret);
  }
  if (!error && handle) {
    *handle = paths.front();
  }
  return error;
}

LMRErrorRef SecretServiceStore::remove(const std::string& handle) {
  if (g_variant_is_object_path(handle.c_str()) == FALSE) {
    return notFound();
  }
  SecretServiceDialogue dialogue(deadlines_);
  LMRErrorRef error = dialogue.connect();
  error = error ? error : dialogue.unlock({handle});
  return error ? error : dialogue.remove(handle);
}

LMRErrorRef SecretServiceStore::list(const std::string& service, std::vector<CredentialItem>& items) {
  items.clear();
  if (LMRErrorRef error = refusal(service)) {
    return error;
  }
  SecretServiceDialogue dialogue(deadlines_);
  SecretServiceDialogue::Found found;
  LMRErrorRef error = dialogue.connect();
  error = error ? error : dialogue.search(attributesOf(service), found);
  if (error || (found.unlocked.empty() && found.locked.empty())) {
    return error;
  }
  const LMRErrorRef locked = found.locked.empty() ? nullptr : dialogue.unlock(found.locked);
  auto readable = found.unlocked;
  if (!locked) {
    readable.insert(readable.end(), found.locked.begin(), found.locked.end());
  }
  if (!readable.empty()) {
    error = dialogue.openSession();
    error = error ? error : dialogue.readAll(readable, items);
  }
  if (!error && locked) {
    for (const ObjectPath& path : found.locked) {
      items.push_back({path, locked});
    }
  }
  return error;
}

std::shared_ptr<CredentialStore> makeCredentialStore() {
  return std::make_shared<SecretServiceStore>(userRuntimeFolder());
}

} // namespace lumora::backend
