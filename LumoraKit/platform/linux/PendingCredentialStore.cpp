#include <LumoraKit/platform/CredentialStore.h>
#include <LumoraKit/platform/linux/Backends.h>

namespace lumora::backend {
namespace {

class AbsentCredentialStore final : public CredentialStore {
public:
  LMRErrorRef add(const std::string&, const std::string&, const Secret&) override { return absent(); }
  LMRErrorRef find(const std::string&, const std::string&, std::string*, Secret*) override { return absent(); }
  LMRErrorRef remove(const std::string&) override { return absent(); }
  LMRErrorRef list(const std::string&, std::vector<CredentialItem>& items) override {
    items.clear();
    return absent();
  }

private:
  static LMRErrorRef absent() {
    return credentialError(CredentialError::NotAvailable, "This build has no credential store");
  }
};

} // namespace

std::shared_ptr<CredentialStore> makeCredentialStore() {
  return std::make_shared<AbsentCredentialStore>();
}

} // namespace lumora::backend
