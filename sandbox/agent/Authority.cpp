#include "Authority.h"

#include <LumoraKit/platform/linux/GLibPtr.h>

#include <unistd.h>

namespace lumora::sandbox {

namespace {

using backend::GLibPtr;

/// Given the answer, or null and the error.
using Answer = std::function<void(GVariant* answer, const GError* error)>;

struct Question {
  const char* service;
  const char* path;
  const char* interface;
  const char* method;
  GVariant* parameters;
  const char* answerType;
};

void takeAnswer(GObject* bus, GAsyncResult* result, gpointer data) {
  const std::unique_ptr<Answer> answer(static_cast<Answer*>(data));
  GError* reason = nullptr;
  const GLibPtr<GVariant> value(g_dbus_connection_call_finish(G_DBUS_CONNECTION(bus), result, &reason));
  const GLibPtr<GError> error(reason);
  (*answer)(value.get(), error.get());
}

void ask(GDBusConnection& bus, const Question& question, Answer answer) {
  // Somebody may be typing a password: the answer takes as long as it takes.
  g_dbus_connection_call(&bus, question.service, question.path, question.interface, question.method,
                         question.parameters, G_VARIANT_TYPE(question.answerType), G_DBUS_CALL_FLAGS_NONE, G_MAXINT,
                         nullptr, &takeAnswer, new Answer(std::move(answer)));
}

std::optional<std::string> polkitRefusal(GVariant* answer, const GError* error) {
  if (answer == nullptr) {
    return std::string("polkit cannot be asked: ") + error->message;
  }
  gboolean isAuthorized = FALSE;
  g_variant_get(answer, "((bba{ss}))", &isAuthorized, nullptr, nullptr);
  return isAuthorized != FALSE ? std::nullopt : std::optional<std::string>("polkit does not allow it");
}

GVariant* polkitParameters(const std::string& caller, const std::string& operation, bool mayAskTheUser) {
  constexpr guint32 allowUserInteraction = 1;
  GVariantBuilder subject;
  g_variant_builder_init(&subject, G_VARIANT_TYPE("a{sv}"));
  g_variant_builder_add(&subject, "{sv}", "name", g_variant_new_string(caller.c_str()));
  return g_variant_new("((sa{sv})s@a{ss}us)", "system-bus-name", &subject, operation.c_str(),
                       g_variant_new_array(G_VARIANT_TYPE("{ss}"), nullptr, 0),
                       mayAskTheUser ? allowUserInteraction : 0U, "");
}

class PolkitAuthority final : public Authority {
public:
  void check(GDBusConnection& bus, const std::string& caller, const std::string& operation, bool mayAskTheUser,
             Verdict verdict) override {
    ask(bus,
        {"org.freedesktop.PolicyKit1", "/org/freedesktop/PolicyKit1/Authority", "org.freedesktop.PolicyKit1.Authority",
         "CheckAuthorization", polkitParameters(caller, operation, mayAskTheUser), "((bba{ss}))"},
        [verdict = std::move(verdict)](GVariant* answer, const GError* error) {
          verdict(polkitRefusal(answer, error));
        });
  }
};

std::optional<std::string> ownerRefusal(GVariant* answer, const GError* error) {
  if (answer == nullptr) {
    return std::string("the bus does not tell who asks: ") + error->message;
  }
  guint32 user = 0;
  g_variant_get(answer, "(u)", &user);
  return user == 0 || user == geteuid() ? std::nullopt
                                        : std::optional<std::string>("only the server's owner may do that");
}

class OwnerAuthority final : public Authority {
public:
  void check(GDBusConnection& bus, const std::string& caller, const std::string& /*operation*/, bool /*mayAskTheUser*/,
             Verdict verdict) override {
    ask(bus,
        {"org.freedesktop.DBus", "/org/freedesktop/DBus", "org.freedesktop.DBus", "GetConnectionUnixUser",
         g_variant_new("(s)", caller.c_str()), "(u)"},
        [verdict = std::move(verdict)](GVariant* answer, const GError* error) {
          verdict(ownerRefusal(answer, error));
        });
  }
};

} // namespace

Authority::~Authority() = default;

std::unique_ptr<Authority> polkitAuthority() {
  return std::make_unique<PolkitAuthority>();
}

std::unique_ptr<Authority> ownerAuthority() {
  return std::make_unique<OwnerAuthority>();
}

} // namespace lumora::sandbox
