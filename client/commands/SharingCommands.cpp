// The commands about this machine's own camera, as others may use it.
#include "../output/Fields.h"
#include "../output/Text.h"
#include "Context.h"
#include "Groups.h"

#include <algorithm>

namespace lumora::client {

namespace {

using Factory = LMRActionFactory;

constexpr std::string_view agentRemark =
    "The helper agent of this machine does it, and may ask for a password of its own first.";

const std::vector<Field>& configurationFields() {
  static const std::vector<Field> fields{
      {LMRRemoteRecorderCameraName, LMRRemoteRecorderCameraName, plainText},
      {LMRRemoteRecorderServerHostname, LMRRemoteRecorderServerHostname, plainText},
      {LMRRemoteRecorderQualityDeviceKey, LMRRemoteRecorderQualityDeviceKey, plainText},
      {LMRRemoteRecorderVideoDeviceKey, LMRRemoteRecorderVideoDeviceKey, plainText},
      {LMRRemoteRecorderAudioDeviceKey, LMRRemoteRecorderAudioDeviceKey, plainText},
      {LMRRemoteRecorderCapturePresetKey, LMRRemoteRecorderCapturePresetKey, plainText}};
  return fields;
}

Operand configurationKey(Operand::Count count) {
  Operand operand{.name = "KEY", .kind = Kind::Text, .count = count};
  for (const Field& field : configurationFields()) {
    operand.words.push_back(field.key);
  }
  return operand;
}

std::optional<Dictionary> sharing(Context& context) {
  return context.reply(Factory::actionToGetCameraBindingStatus());
}

std::string sharingText(const Context&, const Dictionary& reply) {
  const Value* const bound = reply.find(LMRCameraBindingStatusKey);
  if (bound == nullptr || !bound->boolean()) {
    return facts(reply, {});
  }
  const auto name = entry(reply, LMRRemoteRecorderCameraName);
  return *bound->boolean() ? "This machine's camera is shared" + (name.empty() ? "" : " as " + name) + ".\n"
                           : "This machine's camera is not shared.\n";
}

std::optional<Dictionary> getConfiguration(Context& context) {
  return context.reply(Factory::actionToGetRemoteRecorderConfiguration());
}

std::string configurationText(const Context& context, const Dictionary& reply) {
  const auto keys = context.line().operands("KEY");
  if (keys.empty()) {
    return reply.empty() ? "Nothing is configured.\n" : facts(reply, configurationFields());
  }
  if (!reply.contains(keys.front())) {
    throw Failure(1, inQuotes(keys.front()) + " is not configured.");
  }
  return entry(reply, keys.front()) + "\n";
}

std::optional<Dictionary> setConfiguration(Context& context) {
  const std::string& key = context.line().operand("KEY");
  const std::string& value = context.line().operand("VALUE");
  if (key.empty() || value.empty() || key.find('=') != std::string::npos) {
    throw Failure(exitUsage, "A setting needs a KEY without \"=\" and a VALUE, both not empty.");
  }
  return context.reply(
      Factory::actionToSetRemoteRecorderConfigurationValue_forKey_authorization(value, key, context.authorization()));
}

std::string setText(const Context& context, const Dictionary&) {
  return printable(context.line().operand("KEY")) + " is now " + printable(context.line().operand("VALUE")) + ".\n";
}

std::optional<Dictionary> bind(Context& context) {
  const auto session = context.passwordSession();
  return context.reply(Factory::actionToBindCamera_session_authorization(context.line().operand("CAMERA"), session,
                                                                         context.authorization()));
}

std::string bindText(const Context& context, const Dictionary&) {
  return "This machine's camera is now shared as " + printable(context.line().operand("CAMERA")) + ".\n";
}

std::optional<Dictionary> unbind(Context& context) {
  const auto session = context.passwordSession();
  return context.reply(Factory::actionToUnbindCamera_session_authorization(context.line().operand("CAMERA"), session,
                                                                           context.authorization()));
}

std::string unbindText(const Context& context, const Dictionary&) {
  return "This machine's camera is no longer shared as " + printable(context.line().operand("CAMERA")) + ".\n";
}

} // namespace

std::vector<Command> sharingCommands() {
  using Needs = Command::Needs;
  return {
      {"sharing", "tell whether this machine's camera is shared", {}, {}, Needs::Nothing, sharing, sharingText},
      {"bind",
       "share this machine's camera with the server",
       {{.name = "CAMERA"}},
       {},
       Needs::PasswordLogin,
       bind,
       bindText,
       agentRemark},
      {"unbind", "end the sharing", {{.name = "CAMERA"}}, {}, Needs::PasswordLogin, unbind, unbindText, agentRemark},
      {"config get",
       "tell how this machine's camera is shared, or one setting of it",
       {configurationKey(Operand::Count::Optional)},
       {},
       Needs::Nothing,
       getConfiguration,
       configurationText},
      {"config set",
       "change a setting of this machine's shared camera",
       {configurationKey(Operand::Count::One), {.name = "VALUE"}},
       {},
       Needs::Nothing,
       setConfiguration,
       setText,
       agentRemark},
  };
}

} // namespace lumora::client
