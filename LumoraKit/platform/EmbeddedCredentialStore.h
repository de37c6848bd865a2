#pragma once

#include <LumoraKit/platform/CredentialStore.h>

#include <filesystem>
#include <memory>

namespace lumora {

/// A credential store in one file, for machines without a Secret Service. The application chooses it, keeps the
/// passphrase and asks for it; nothing of it is stored anywhere.
///
///     LMRErrorRef error;
///     auto platform = lumora::Platform::current();
///     platform.credentialStore = lumora::makeEmbeddedCredentialStore(file, lumora::Secret(passphrase), &error);
///     if (platform.credentialStore) {
///       lumora::Platform::install(platform);
///     }
///
/// Any number of processes may use the same file. Every change is made to what the file holds at that moment and put in
/// place as a whole: at any moment, also after a crash or on a full disk, the file holds everything as it was before
/// the change or after it. A file that is damaged is left as it is. A change waits its turn for 5 seconds at most, then
/// fails with CredentialError::TimedOut; otherwise calls take what the disk takes.
///
/// The key is derived from the passphrase by Argon2id (RFC 9106) with 256 MiB of memory, about a second once in this
/// function; the content is sealed with XChaCha20-Poly1305. Neither services nor accounts can be read without the
/// passphrase; the size of the file tells about how much there is.
///
/// \param file made when it is missing, with its folders; readable by the user only. There will be a lock file beside
/// it. \param error where to put why there is no store: CredentialError::WrongPassphrase, CredentialError::Damaged (the
/// file
///        is none of these, or cut off, or changed), CredentialError::Failed (it cannot be read or made); may be null
/// \return null on failure; the file is then as it was before
LUMORA_EXPORT std::shared_ptr<CredentialStore>
makeEmbeddedCredentialStore(const std::filesystem::path& file, const Secret& passphrase, LMRErrorRef* error);

} // namespace lumora
