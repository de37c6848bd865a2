#include "SealedFileStore.h"

#include <LumoraKit/platform/EmbeddedCredentialStore.h>
#include <LumoraKit/platform/linux/AtomicFile.h>
#include <LumoraKit/platform/linux/FileLock.h>

#include <sodium.h>

#include <cerrno>
#include <system_error>
#include <utility>

namespace lumora::backend {
namespace {

constexpr mode_t folderPermissions = 0700;

LMRErrorRef systemError(const LMRErrorRef& reason) {
  return credentialError(reason->code() == ETIMEDOUT ? CredentialError::TimedOut : CredentialError::Failed,
                         reason->localizedDescription());
}

LMRErrorRef notFound() {
  return credentialError(CredentialError::ItemNotFound, "There is no such item");
}

LMRErrorRef refusal(const std::string& service, const std::string& account = {}) {
  return isCredentialText(service) && isCredentialText(account)
             ? nullptr
             : credentialError(CredentialError::UnusableText, "The credential store cannot keep such a text");
}

// Beside the file, which is another one after each change.
LMRErrorRef takeTurn(FileLock& turn, std::filesystem::path path, std::chrono::milliseconds patience) {
  path += ".lock";
  const LMRErrorRef error = turn.take(path, std::chrono::steady_clock::now() + patience);
  return error ? systemError(error) : nullptr;
}

LMRErrorRef write(const std::filesystem::path& path, const std::string& sealed) {
  const LMRErrorRef error = replaceFile(path, sealed);
  return error ? systemError(error) : nullptr;
}

LMRErrorRef unreadable(const std::filesystem::path& path) {
  return systemError(LMRError::fromErrno(errno, path.string()));
}

// With the first file there is a seal for all processes to come, so it is made in turn.
std::optional<Seal> sealOf(const std::filesystem::path& file, const Secret& passphrase, SealCost cost,
                           std::chrono::milliseconds patience, LMRErrorRef& error) {
  FileLock turn;
  error = takeTurn(turn, file, patience);
  const auto sealed = error ? std::nullopt : contentOfFile(file);
  if (sealed) {
    return Seal::of(*sealed, passphrase, error);
  }
  if (!error && errno != ENOENT) {
    error = unreadable(file);
  }
  auto seal = error ? std::nullopt : Seal::make(passphrase, cost, error);
  if (seal) {
    error = write(file, seal->close(CredentialRecords().encoded()));
  }
  return error ? std::nullopt : std::move(seal);
}

} // namespace

std::shared_ptr<SealedFileStore> SealedFileStore::open(const std::filesystem::path& file, const Secret& passphrase,
                                                       SealCost cost, LMRErrorRef& error,
                                                       std::chrono::milliseconds patience) {
  if (sodium_init() < 0) {
    error = credentialError(CredentialError::Failed, "The machine gives no random numbers");
    return nullptr;
  }
  std::error_code failure;
  const auto path = std::filesystem::absolute(file, failure);
  const LMRErrorRef reason = failure ? LMRError::fromErrno(failure.value(), file.string())
                                     : makeDirectories(path.parent_path(), folderPermissions);
  if (reason) {
    error = systemError(reason);
    return nullptr;
  }
  auto seal = sealOf(path, passphrase, cost, patience, error);
  if (!seal) {
    return nullptr;
  }
  auto store = std::make_shared<SealedFileStore>(path, patience, std::move(*seal));
  CredentialRecords records;
  error = store->read(records);
  return error ? nullptr : store;
}

LMRErrorRef SealedFileStore::add(const std::string& service, const std::string& account, const Secret& secret) {
  if (LMRErrorRef error = refusal(service, account)) {
    return error;
  }
  return change([&](CredentialRecords& records) -> LMRErrorRef {
    if (records.find(service, account)) {
      return credentialError(CredentialError::DuplicateItem, "There is such an item already");
    }
    records.items.push_back({++records.lastNumber, service, account, secret});
    return nullptr;
  });
}

LMRErrorRef SealedFileStore::find(const std::string& service, const std::string& account, std::string* handle,
                                  Secret* secret) {
  CredentialRecords records;
  LMRErrorRef error = refusal(service, account);
  error = error ? error : read(records);
  const CredentialRecord* const item = error ? nullptr : records.find(service, account);
  if (!item) {
    return error ? error : notFound();
  }
  if (handle) {
    *handle = std::to_string(item->number);
  }
  if (secret) {
    *secret = item->secret;
  }
  return nullptr;
}

LMRErrorRef SealedFileStore::remove(const std::string& handle) {
  return change([&](CredentialRecords& records) {
    const auto removed = std::erase_if(
        records.items, [&](const CredentialRecord& item) { return std::to_string(item.number) == handle; });
    return removed > 0 ? nullptr : notFound();
  });
}

LMRErrorRef SealedFileStore::list(const std::string& service, std::vector<CredentialItem>& items) {
  items.clear();
  CredentialRecords records;
  LMRErrorRef error = refusal(service);
  error = error ? error : read(records);
  for (const CredentialRecord& item : records.items) {
    if (item.service == service) {
      items.push_back({std::to_string(item.number), nullptr, item.account, item.secret});
    }
  }
  return error;
}

// Without the turn: the file is only ever replaced as a whole. One that somebody removed is empty.
LMRErrorRef SealedFileStore::read(CredentialRecords& records) const {
  const auto sealed = contentOfFile(file_);
  if (!sealed) {
    return errno == ENOENT ? nullptr : unreadable(file_);
  }
  LMRErrorRef error;
  const auto plain = seal_.open(*sealed, error);
  if (!plain) {
    return error;
  }
  auto decoded = CredentialRecords::decoded(*plain);
  if (!decoded) {
    return credentialError(CredentialError::Damaged, "The password file was written by a newer version");
  }
  records = std::move(*decoded);
  return nullptr;
}

LMRErrorRef SealedFileStore::change(const std::function<LMRErrorRef(CredentialRecords& records)>& how) const {
  FileLock turn;
  CredentialRecords records;
  LMRErrorRef error = takeTurn(turn, file_, patience_);
  error = error ? error : read(records);
  error = error ? error : how(records);
  return error ? error : write(file_, seal_.close(records.encoded()));
}

} // namespace lumora::backend

namespace lumora {

std::shared_ptr<CredentialStore> makeEmbeddedCredentialStore(const std::filesystem::path& file,
                                                             const Secret& passphrase, LMRErrorRef* error) {
  LMRErrorRef reason;
  auto store = backend::SealedFileStore::open(file, passphrase, backend::Seal::defaultCost(), reason);
  if (error) {
    *error = reason;
  }
  return store;
}

} // namespace lumora
