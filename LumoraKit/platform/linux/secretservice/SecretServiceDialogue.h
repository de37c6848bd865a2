#pragma once

#include "SecretServiceSession.h"

#include <LumoraKit/platform/CredentialStore.h>
#include <LumoraKit/platform/linux/DBusCall.h>

#include <chrono>
#include <map>
#include <memory>
#include <string>
#include <vector>

namespace lumora::backend {

using ObjectPath = std::string;
using SecretAttributes = std::map<std::string, std::string>;

/// How long the Secret Service may take for what one caller wants.
struct SecretServiceDeadlines {
  /// For everything that the service does by itself.
  std::chrono::milliseconds answer = std::chrono::seconds(5);
  /// For the user, who is asked to unlock a collection. Counted apart.
  std::chrono::milliseconds unlock = std::chrono::seconds(60);
};

/// A talk with the Secret Service about what one caller wants, with its deadlines. Each has a connection and a session
/// of its own: there is nothing to be lost between two of them, and the loss of the bus never ends the process. Secrets
/// travel encrypted. One thread at a time.
class LUMORA_INTERNAL SecretServiceDialogue {
public:
  explicit SecretServiceDialogue(SecretServiceDeadlines deadlines);
  SecretServiceDialogue(const SecretServiceDialogue&) = delete;
  SecretServiceDialogue& operator=(const SecretServiceDialogue&) = delete;
  ~SecretServiceDialogue();

  /// When the service's time will be over. Moved by the time that the user takes.
  std::chrono::steady_clock::time_point end() const { return end_; }

  /// To the bus of the user's session. Before everything else.
  LMRErrorRef connect();
  /// Before secrets are read or written.
  LMRErrorRef openSession();

  struct Found {
    std::vector<ObjectPath> unlocked;
    std::vector<ObjectPath> locked;
  };
  /// The items that have these attributes, in the service's order.
  LMRErrorRef search(const SecretAttributes& attributes, Found& found);
  /// CredentialError::NoDefaultCollection when there is none.
  LMRErrorRef findDefaultCollection(ObjectPath& collection);
  /// Asks the user where that is needed. CredentialError::Locked when that was in vain.
  LMRErrorRef unlock(const std::vector<ObjectPath>& objects);

  LMRErrorRef create(const ObjectPath& collection, const std::string& label, const SecretAttributes& attributes,
                     const Secret& secret);
  LMRErrorRef remove(const ObjectPath& item);
  LMRErrorRef read(const ObjectPath& item, Secret& secret);
  /// Appends all these items, read at once; those that cannot be read with their error.
  LMRErrorRef readAll(const std::vector<ObjectPath>& paths, std::vector<CredentialItem>& items);

private:
  GLibPtr<GVariant> call(const ObjectPath& object, const char* interface, const char* method, GVariant* parameters,
                         const char* answerType, LMRErrorRef& error);
  LMRErrorRef follow(const ObjectPath& prompt);

  SecretServiceDeadlines deadlines_;
  DBusOperation operation_;
  std::chrono::steady_clock::time_point end_;
  std::unique_ptr<DBusLink> link_;
  std::unique_ptr<SecretServiceSession> session_;
};

} // namespace lumora::backend
