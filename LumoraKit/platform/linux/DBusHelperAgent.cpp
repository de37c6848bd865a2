#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/PropertyList.h>
#include <LumoraKit/platform/Secret.h>
#include <LumoraKit/platform/linux/Backends.h>
#include <LumoraKit/platform/linux/DBusErrors.h>
#include <LumoraKit/platform/linux/DBusHelperAgent.h>

#include <utility>

namespace lumora::backend {
namespace {

void set(LMRErrorRef* error, LMRErrorRef value) {
  if (error) {
    *error = std::move(value);
  }
}

bool isBusText(const std::string& text) {
  return g_utf8_validate_len(text.data(), text.size(), nullptr) != FALSE;
}

GVariant* bytesVariant(const Data& bytes) {
  return g_variant_new_fixed_array(G_VARIANT_TYPE_BYTE, bytes.data(), bytes.size(), 1);
}

bool isAgent(const std::string& agent, std::string_view domain) {
  return domain == KTHelperAgentDomainSystem && isBusText(agent) && g_dbus_is_interface_name(agent.c_str()) != FALSE;
}

LMRErrorRef malformedReply(const std::string& reason) {
  return helperAgentError(HelperAgentError::MalformedReply, "The helper agent's reply cannot be read: " + reason);
}

// What cannot be sent, or must not be: a bus ends the connection of who sends too much.
LMRErrorRef refusal(const std::string& command, const std::string& request, const Data& authorization) {
  if (!isBusText(command)) {
    return helperAgentError(HelperAgentError::RequestUnwritable, "The command is not a text that a bus can carry");
  }
  const std::size_t size = command.size() + request.size() + authorization.size();
  if (size > MaximumHelperAgentRequest) {
    return helperAgentError(HelperAgentError::RequestTooLarge,
                            format("The request has %u bytes, and a helper agent takes no more than %u",
                                   {text(std::uint64_t{size}), text(std::uint64_t{MaximumHelperAgentRequest})}));
  }
  return nullptr;
}

std::optional<Dictionary> decoded(GVariant& answer, LMRErrorRef* error) {
  if (g_variant_is_of_type(&answer, G_VARIANT_TYPE("(s)")) == FALSE) {
    set(error, malformedReply(format("it is of the type %@", {g_variant_get_type_string(&answer)})));
    return std::nullopt;
  }
  const GLibPtr<GVariant> child(g_variant_get_child_value(&answer, 0));
  gsize length = 0;
  const gchar* const reply = g_variant_get_string(child.get(), &length);
  LMRErrorRef reason;
  auto dictionary = dictionaryWithXMLDescription_error({reply, length}, &reason);
  if (!dictionary) {
    set(error, malformedReply(reason->localizedDescription()));
  }
  return dictionary;
}

} // namespace

struct DBusHelperAgent::Message {
  const std::string& agent;
  const char* method;
  GVariant* parameters;
  GDBusCallFlags flags;
  std::chrono::milliseconds deadline;
};

DBusHelperAgent::DBusHelperAgent(std::chrono::milliseconds deadline) : deadline_(deadline) {}

DBusHelperAgent::~DBusHelperAgent() = default;

std::optional<Authorization> DBusHelperAgent::authorize(const std::string& agent, std::string_view domain,
                                                        const std::string& operation, LMRErrorRef* error) {
  if (!isAgent(agent, domain) || !isBusText(operation)) {
    set(error, helperAgentError(HelperAgentError::NoAgent, "There is no such helper agent or operation"));
    return std::nullopt;
  }
  const auto answer = exchange({agent, "Authorize", g_variant_new("(s)", operation.c_str()),
                                G_DBUS_CALL_FLAGS_ALLOW_INTERACTIVE_AUTHORIZATION, authorizationDeadline},
                               error);
  if (!answer) {
    return std::nullopt;
  }
  if (g_variant_is_of_type(answer.get(), G_VARIANT_TYPE("(ay)")) == FALSE) {
    set(error, malformedReply("it holds no authorization"));
    return std::nullopt;
  }
  const GLibPtr<GVariant> child(g_variant_get_child_value(answer.get(), 0));
  gsize length = 0;
  const auto* const bytes = static_cast<const std::uint8_t*>(g_variant_get_fixed_array(child.get(), &length, 1));
  return Authorization{Data(bytes, bytes + length)};
}

std::optional<Dictionary> DBusHelperAgent::performCommand(const std::string& agent, std::string_view domain,
                                                          AuthorizationRef authorization, const std::string& command,
                                                          const Dictionary& request, LMRErrorRef* error) {
  if (!isAgent(agent, domain)) {
    set(error, helperAgentError(HelperAgentError::NoAgent, "There is no such helper agent"));
    return std::nullopt;
  }
  auto written = xmlDescription(request);
  if (!written) {
    set(error,
        helperAgentError(HelperAgentError::RequestUnwritable, "The request cannot be written as a property list"));
    return std::nullopt;
  }
  const Secret requestText(std::move(*written));
  const Data bytes = authorization ? authorization->bytes : Data();
  if (auto refused = refusal(command, requestText.text(), bytes)) {
    set(error, std::move(refused));
    return std::nullopt;
  }
  GVariant* const parameters =
      g_variant_new("(s@ays)", command.c_str(), bytesVariant(bytes), requestText.text().c_str());
  const auto answer = exchange({agent, "PerformCommand", parameters, G_DBUS_CALL_FLAGS_NONE, deadline_}, error);
  return answer ? decoded(*answer, error) : std::nullopt;
}

GLibPtr<GVariant> DBusHelperAgent::exchange(const Message& message, LMRErrorRef* error) {
  const GLibPtr<GVariant> parameters(g_variant_ref_sink(message.parameters));
  DBusOperation operation(message.deadline);
  const auto link = this->link(operation, error);
  if (!link) {
    return nullptr;
  }
  GLibPtr<GError> reason;
  auto answer = operation.call(*link, message.agent, message.method, parameters.get(), message.flags, reason);
  if (!answer) {
    set(error, helperAgentCallError(*reason, message.agent));
  }
  return answer;
}

std::shared_ptr<DBusLink> DBusHelperAgent::link(DBusOperation& operation, LMRErrorRef* error) {
  if (auto open = sharedLink(nullptr)) {
    return open;
  }
  GError* noAddress = nullptr;
  const GLibPtr<gchar> address(g_dbus_address_get_for_bus_sync(G_BUS_TYPE_SYSTEM, nullptr, &noAddress));
  GLibPtr<GError> reason(noAddress);
  auto connected = address ? operation.connect(address.get(), reason) : nullptr;
  if (!connected) {
    set(error,
        helperAgentError(HelperAgentError::NoBus, format("The system bus cannot be reached: %@", {reason->message})));
    return nullptr;
  }
  return sharedLink(std::move(connected));
}

// Of several first calls the quickest one's connection is used by all: nobody connects under the lock, where others
// would wait past their own deadlines.
std::shared_ptr<DBusLink> DBusHelperAgent::sharedLink(std::shared_ptr<DBusLink> replacement) {
  const std::lock_guard lock(mutex_);
  if (!link_ || !link_->isOpen()) {
    link_.swap(replacement);
  }
  return link_;
}

std::shared_ptr<HelperAgent> makeHelperAgent() {
  return std::make_shared<DBusHelperAgent>();
}

} // namespace lumora::backend
