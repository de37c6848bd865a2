#include "SecretServiceDialogue.h"

#include "SecretServiceErrors.h"
#include "SecretServiceNames.h"
#include "SecretServicePrompt.h"
#include "SecretVariants.h"

#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <optional>
#include <thread>

namespace lumora::backend {

using namespace secret_service;

namespace {

// Where the user's own bus is. The library would also start one, which nobody else would use.
std::optional<std::string> busAddress() {
  const char* const address = std::getenv("DBUS_SESSION_BUS_ADDRESS");
  if (address && *address != '\0') {
    return address;
  }
  const char* const folder = std::getenv("XDG_RUNTIME_DIR");
  const std::filesystem::path socket = std::filesystem::path(folder ? folder : "") / "bus";
  std::error_code ignored;
  if (!socket.is_absolute() || !std::filesystem::exists(socket, ignored)) {
    return std::nullopt;
  }
  const GLibPtr<gchar> escaped(g_dbus_address_escape_value(socket.c_str()));
  return std::string("unix:path=") + escaped.get();
}

} // namespace

SecretServiceDialogue::SecretServiceDialogue(SecretServiceDeadlines deadlines)
    : deadlines_(deadlines), operation_(deadlines.answer), end_(std::chrono::steady_clock::now() + deadlines.answer) {}

SecretServiceDialogue::~SecretServiceDialogue() = default;

LMRErrorRef SecretServiceDialogue::connect() {
  const auto address = busAddress();
  if (!address) {
    return credentialError(CredentialError::NotAvailable,
                           "The credential store cannot be reached: the user's session has no bus");
  }
  GLibPtr<GError> reason;
  link_ = operation_.connect(*address, reason);
  return link_ ? nullptr : secretServiceError(*reason);
}

LMRErrorRef SecretServiceDialogue::openSession() {
  LMRErrorRef error;
  session_ = SecretServiceSession::open(operation_, *link_, error);
  return error;
}

LMRErrorRef SecretServiceDialogue::search(const SecretAttributes& attributes, Found& found) {
  LMRErrorRef error;
  GVariant* const parameters = g_variant_new("(@a{ss})", variantOf(attributes));
  const auto answer = call(servicePath, serviceInterface, "SearchItems", parameters, "(aoao)", error);
  if (answer) {
    found = {pathsIn(*answer, 0), pathsIn(*answer, 1)};
  }
  return error;
}

// gnome-keyring loses sight of its collections for a moment now and then, when it reads its files again.
LMRErrorRef SecretServiceDialogue::findDefaultCollection(ObjectPath& collection) {
  constexpr int trials = 6;
  constexpr std::chrono::milliseconds pause{20};
  for (int trial = 0; trial < trials; ++trial) {
    LMRErrorRef error;
    GVariant* const parameters = g_variant_new("(s)", "default");
    const auto answer = call(servicePath, serviceInterface, "ReadAlias", parameters, "(o)", error);
    if (!answer) {
      return error;
    }
    collection = textIn(*answer, 0);
    if (collection != noObject) {
      return nullptr;
    }
    std::this_thread::sleep_for(pause);
  }
  return credentialError(CredentialError::NoDefaultCollection, "The credential store has no default collection");
}

LMRErrorRef SecretServiceDialogue::unlock(const std::vector<ObjectPath>& objects) {
  LMRErrorRef error;
  GVariant* const parameters = g_variant_new("(@ao)", variantOf(objects));
  const auto answer = call(servicePath, serviceInterface, "Unlock", parameters, "(aoo)", error);
  return answer ? follow(textIn(*answer, 1)) : error;
}

LMRErrorRef SecretServiceDialogue::create(const ObjectPath& collection, const std::string& label,
                                          const SecretAttributes& attributes, const Secret& secret) {
  GVariantBuilder properties;
  g_variant_builder_init(&properties, G_VARIANT_TYPE("a{sv}"));
  g_variant_builder_add(&properties, "{sv}", "org.freedesktop.Secret.Item.Label", g_variant_new_string(label.c_str()));
  g_variant_builder_add(&properties, "{sv}", "org.freedesktop.Secret.Item.Attributes", variantOf(attributes));
  GVariant* const parameters =
      g_variant_new("(@a{sv}@(oayays)b)", g_variant_builder_end(&properties), session_->encoded(secret), FALSE);
  LMRErrorRef error;
  const auto answer = call(collection, collectionInterface, "CreateItem", parameters, "(oo)", error);
  return answer ? follow(textIn(*answer, 1)) : error;
}

LMRErrorRef SecretServiceDialogue::remove(const ObjectPath& item) {
  LMRErrorRef error;
  const auto answer = call(item, itemInterface, "Delete", nullptr, "(o)", error);
  return answer ? follow(textIn(*answer, 0)) : error;
}

LMRErrorRef SecretServiceDialogue::read(const ObjectPath& item, Secret& secret) {
  LMRErrorRef error;
  GVariant* const parameters = g_variant_new("(o)", session_->path());
  const auto answer = call(item, itemInterface, "GetSecret", parameters, "((oayays))", error);
  auto plain = answer ? session_->decoded(childOf(*answer, 0).get()) : std::nullopt;
  if (plain) {
    secret = std::move(*plain);
  }
  return error || plain ? error : secretServiceMisunderstood();
}

LMRErrorRef SecretServiceDialogue::readAll(const std::vector<ObjectPath>& paths, std::vector<CredentialItem>& items) {
  LMRErrorRef error;
  GVariant* const parameters = g_variant_new("(@aoo)", variantOf(paths), session_->path());
  const auto answer = call(servicePath, serviceInterface, "GetSecrets", parameters, "(a{o(oayays)})", error);
  if (!answer) {
    return error;
  }
  const auto secrets = dictionaryIn(*answer, 0);
  std::vector<DBusMethod> questions;
  std::ranges::transform(paths, std::back_inserter(questions), [](const ObjectPath& path) {
    return DBusMethod{serviceName, path, "org.freedesktop.DBus.Properties", "Get"};
  });
  const auto attributes = operation_.callEach(*link_, questions, g_variant_new("(ss)", itemInterface, "Attributes"));
  for (std::size_t i = 0; i < paths.size(); ++i) {
    const auto coded = secrets.find(paths[i]);
    auto secret = coded == secrets.end() ? std::nullopt : session_->decoded(coded->second.get());
    auto account = attributes[i] ? attributeIn(*attributes[i], "account") : std::nullopt;
    if (secret && account) {
      items.push_back({paths[i], nullptr, std::move(*account), std::move(*secret)});
    } else {
      items.push_back({paths[i], credentialError(CredentialError::ItemNotFound, "The item could not be read")});
    }
  }
  return nullptr;
}

GLibPtr<GVariant> SecretServiceDialogue::call(const ObjectPath& object, const char* interface, const char* method,
                                              GVariant* parameters, const char* answerType, LMRErrorRef& error) {
  GLibPtr<GError> reason;
  auto answer =
      operation_.call(*link_, {serviceName, object, interface, method}, parameters, G_DBUS_CALL_FLAGS_NONE, reason);
  if (!answer) {
    error = secretServiceError(*reason);
  } else if (g_variant_is_of_type(answer.get(), G_VARIANT_TYPE(answerType)) == FALSE) {
    error = secretServiceMisunderstood();
    answer.reset();
  }
  return answer;
}

LMRErrorRef SecretServiceDialogue::follow(const ObjectPath& prompt) {
  if (prompt == noObject) {
    return nullptr;
  }
  const auto beginning = std::chrono::steady_clock::now();
  LMRErrorRef error = SecretServicePrompt(operation_, *link_, prompt).ask(deadlines_.unlock);
  const auto taken = std::chrono::steady_clock::now() - beginning;
  end_ += taken;
  deadlines_.unlock -= std::min(deadlines_.unlock, std::chrono::ceil<std::chrono::milliseconds>(taken));
  return error;
}

} // namespace lumora::backend
