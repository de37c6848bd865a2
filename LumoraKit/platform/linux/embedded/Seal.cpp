#include "Seal.h"

#include "LittleEndian.h"

#include <sodium.h>

#include <array>

namespace lumora::backend {
namespace {

constexpr std::string_view magic = "LMRCRED1";
constexpr std::size_t saltAt = magic.size() + 2 * sizeof(std::uint64_t);
constexpr std::size_t proofAt = saltAt + crypto_pwhash_SALTBYTES;
constexpr std::size_t proofSize = 32;
constexpr std::size_t digestAt = proofAt + proofSize;
constexpr std::size_t headerSize = digestAt + crypto_generichash_BYTES;
constexpr std::size_t bodyAt = headerSize + crypto_aead_xchacha20poly1305_ietf_NPUBBYTES;
constexpr std::size_t smallest = bodyAt + crypto_aead_xchacha20poly1305_ietf_ABYTES;

// What the two keys that are made of one are for.
constexpr std::uint64_t proofKey = 1;
constexpr std::uint64_t sealingKey = 2;
constexpr std::array<char, crypto_kdf_CONTEXTBYTES> keyContext{'L', 'M', 'R', 'C', 'R', 'E', 'D', '1'};

const unsigned char* bytes(std::string_view text) {
  return reinterpret_cast<const unsigned char*>(text.data());
}

unsigned char* bytes(std::string& text) {
  return reinterpret_cast<unsigned char*>(text.data());
}

LMRErrorRef damaged() {
  return credentialError(CredentialError::Damaged,
                         "The password file is damaged, cut off, or none of this kind. It was left as it is.");
}

std::string digestOf(std::string_view text) {
  std::string digest(crypto_generichash_BYTES, '\0');
  crypto_generichash(bytes(digest), digest.size(), bytes(text), text.size(), nullptr, 0);
  return digest;
}

// Nothing when there is too little memory.
std::optional<Secret> rootKey(const Secret& passphrase, std::string_view salt, SealCost cost) {
  std::string key(crypto_kdf_KEYBYTES, '\0');
  const int result = crypto_pwhash(bytes(key), key.size(), passphrase.text().data(), passphrase.text().size(),
                                   bytes(salt), cost.passes, cost.memory, crypto_pwhash_ALG_ARGON2ID13);
  return result == 0 ? std::optional<Secret>(Secret(std::move(key))) : std::nullopt;
}

Secret derived(const Secret& root, std::uint64_t purpose, std::size_t size) {
  std::string key(size, '\0');
  crypto_kdf_derive_from_key(bytes(key), key.size(), purpose, keyContext.data(), bytes(root.text()));
  return Secret(std::move(key));
}

bool isCostAllowed(SealCost cost) {
  return cost.passes >= crypto_pwhash_OPSLIMIT_MIN && cost.passes <= crypto_pwhash_OPSLIMIT_SENSITIVE &&
         cost.memory >= crypto_pwhash_MEMLIMIT_MIN && cost.memory <= crypto_pwhash_MEMLIMIT_SENSITIVE;
}

LMRErrorRef tooLittleMemory() {
  return credentialError(CredentialError::Failed, "There is too little memory to derive the key of the password file");
}

} // namespace

SealCost Seal::defaultCost() {
  return {crypto_pwhash_OPSLIMIT_MODERATE, crypto_pwhash_MEMLIMIT_MODERATE};
}

std::optional<Seal> Seal::make(const Secret& passphrase, SealCost cost, LMRErrorRef& error) {
  std::string salt(crypto_pwhash_SALTBYTES, '\0');
  randombytes_buf(salt.data(), salt.size());
  const auto root = rootKey(passphrase, salt, cost);
  if (!root) {
    error = tooLittleMemory();
    return std::nullopt;
  }
  std::string header(magic);
  appendNumber(header, cost.passes);
  appendNumber(header, cost.memory);
  header += salt;
  header += derived(*root, proofKey, proofSize).text();
  header += digestOf(header);
  return Seal(std::move(header), derived(*root, sealingKey, crypto_aead_xchacha20poly1305_ietf_KEYBYTES));
}

std::optional<Seal> Seal::of(std::string_view sealed, const Secret& passphrase, LMRErrorRef& error) {
  error = damaged();
  const std::string_view header = sealed.substr(0, headerSize);
  if (sealed.size() < smallest || !header.starts_with(magic) ||
      header.substr(digestAt) != digestOf(header.substr(0, digestAt))) {
    return std::nullopt;
  }
  const SealCost cost{numberAt<std::uint64_t>(header, magic.size()),
                      numberAt<std::uint64_t>(header, magic.size() + sizeof(std::uint64_t))};
  if (!isCostAllowed(cost)) {
    return std::nullopt;
  }
  const auto root = rootKey(passphrase, header.substr(saltAt, crypto_pwhash_SALTBYTES), cost);
  if (!root) {
    error = tooLittleMemory();
    return std::nullopt;
  }
  const Secret proof = derived(*root, proofKey, proofSize);
  if (sodium_memcmp(proof.text().data(), header.substr(proofAt).data(), proofSize) != 0) {
    error = credentialError(CredentialError::WrongPassphrase, "The password file is sealed with another passphrase");
    return std::nullopt;
  }
  error = nullptr;
  return Seal(std::string(header), derived(*root, sealingKey, crypto_aead_xchacha20poly1305_ietf_KEYBYTES));
}

std::string Seal::close(const Secret& plain) const {
  std::string sealed = header_;
  sealed.resize(smallest + plain.text().size());
  randombytes_buf(sealed.data() + headerSize, bodyAt - headerSize);
  crypto_aead_xchacha20poly1305_ietf_encrypt(bytes(sealed) + bodyAt, nullptr, bytes(plain.text()), plain.text().size(),
                                             bytes(header_), header_.size(), nullptr, bytes(sealed) + headerSize,
                                             bytes(key_.text()));
  return sealed;
}

std::optional<Secret> Seal::open(std::string_view sealed, LMRErrorRef& error) const {
  if (sealed.size() < smallest || !sealed.starts_with(header_)) {
    error = damaged();
    return std::nullopt;
  }
  std::string plain(sealed.size() - smallest, '\0');
  const std::string_view body = sealed.substr(bodyAt);
  if (crypto_aead_xchacha20poly1305_ietf_decrypt(bytes(plain), nullptr, nullptr, bytes(body), body.size(),
                                                 bytes(header_), header_.size(), bytes(sealed.substr(headerSize)),
                                                 bytes(key_.text())) != 0) {
    error = damaged();
    return std::nullopt;
  }
  return Secret(std::move(plain));
}

} // namespace lumora::backend
