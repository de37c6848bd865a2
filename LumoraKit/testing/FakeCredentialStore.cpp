#include <LumoraKit/testing/FakeCredentialStore.h>

#include <algorithm>

namespace lumora::fakes {
namespace {

LMRErrorRef fakeError(CredentialError code) {
  return credentialError(code, "the credential store was told to fail");
}

} // namespace

FakeCredentialStore::FakeCredentialStore() = default;
FakeCredentialStore::~FakeCredentialStore() = default;

void FakeCredentialStore::put(std::string service, std::string account, std::string secret) {
  const std::lock_guard lock(mutex_);
  items_.push_back({++lastNumber_, {std::move(service), std::move(account), std::move(secret)}});
}

std::vector<StoredCredential> FakeCredentialStore::items() const {
  const std::lock_guard lock(mutex_);
  std::vector<StoredCredential> contents;
  std::ranges::transform(items_, std::back_inserter(contents), &Item::content);
  return contents;
}

std::optional<std::string> FakeCredentialStore::secret(const std::string& service, const std::string& account) const {
  const std::lock_guard lock(mutex_);
  const Item* const item = first(service, account);
  return item ? std::optional(item->content.secret) : std::nullopt;
}

void FakeCredentialStore::fail(CredentialOperation operation, std::optional<CredentialError> error) {
  const std::lock_guard lock(mutex_);
  scripts_[operation].standing = error;
}

void FakeCredentialStore::failOnce(CredentialOperation operation, CredentialError error) {
  const std::lock_guard lock(mutex_);
  scripts_[operation].once.push_back(error);
}

void FakeCredentialStore::failToRead(const std::string& service, const std::string& account, CredentialError error) {
  const std::lock_guard lock(mutex_);
  unreadable_.insert_or_assign({service, account}, error);
}

std::vector<CredentialCall> FakeCredentialStore::calls() const {
  const std::lock_guard lock(mutex_);
  return calls_;
}

std::size_t FakeCredentialStore::callCount() const {
  const std::lock_guard lock(mutex_);
  return calls_.size();
}

void FakeCredentialStore::forgetCalls() {
  const std::lock_guard lock(mutex_);
  calls_.clear();
}

LMRErrorRef FakeCredentialStore::add(const std::string& service, const std::string& account, const Secret& secret) {
  const std::lock_guard lock(mutex_);
  if (LMRErrorRef error = begin({CredentialOperation::Add, service, account})) {
    return error;
  }
  if (first(service, account)) {
    return credentialError(CredentialError::DuplicateItem, "there is such an item already");
  }
  items_.push_back({++lastNumber_, {service, account, secret.text()}});
  return nullptr;
}

LMRErrorRef FakeCredentialStore::find(const std::string& service, const std::string& account, std::string* handle,
                                      Secret* secret) {
  const std::lock_guard lock(mutex_);
  LMRErrorRef error = begin({CredentialOperation::Find, service, account});
  const Item* const item = error ? nullptr : first(service, account);
  if (!item) {
    return error ? error : credentialError(CredentialError::ItemNotFound, "there is no such item");
  }
  error = secret ? readError(item->content) : nullptr;
  if (!error && handle) {
    *handle = std::to_string(item->number);
  }
  if (!error && secret) {
    *secret = Secret(item->content.secret);
  }
  return error;
}

LMRErrorRef FakeCredentialStore::remove(const std::string& handle) {
  const std::lock_guard lock(mutex_);
  if (LMRErrorRef error = begin({CredentialOperation::Remove, "", ""})) {
    return error;
  }
  const auto removed = std::erase_if(items_, [&](const Item& item) { return std::to_string(item.number) == handle; });
  return removed > 0 ? nullptr : credentialError(CredentialError::ItemNotFound, "there is no such item");
}

LMRErrorRef FakeCredentialStore::list(const std::string& service, std::vector<CredentialItem>& items) {
  const std::lock_guard lock(mutex_);
  items.clear();
  LMRErrorRef error = begin({CredentialOperation::List, service, ""});
  if (error) {
    return error;
  }
  for (const auto& [number, content] : items_) {
    if (content.service != service) {
      continue;
    }
    CredentialItem item{.handle = std::to_string(number), .error = readError(content)};
    if (!item.error) {
      item.account = content.account;
      item.secret = Secret(content.secret);
    }
    items.push_back(std::move(item));
  }
  return nullptr;
}

LMRErrorRef FakeCredentialStore::begin(CredentialCall call) {
  const bool isUnderstood = isCredentialText(call.service) && isCredentialText(call.account);
  Script& script = scripts_[call.operation];
  calls_.push_back(std::move(call));
  if (!script.once.empty()) {
    const CredentialError error = script.once.front();
    script.once.pop_front();
    return fakeError(error);
  }
  if (script.standing) {
    return fakeError(*script.standing);
  }
  return isUnderstood ? nullptr : credentialError(CredentialError::UnusableText, "the store cannot keep such a text");
}

const FakeCredentialStore::Item* FakeCredentialStore::first(const std::string& service,
                                                            const std::string& account) const {
  const auto found = std::ranges::find_if(
      items_, [&](const Item& item) { return item.content.service == service && item.content.account == account; });
  return found == items_.end() ? nullptr : &*found;
}

LMRErrorRef FakeCredentialStore::readError(const StoredCredential& item) const {
  const auto found = unreadable_.find({item.service, item.account});
  return found == unreadable_.end() ? nullptr : fakeError(found->second);
}

} // namespace lumora::fakes
