// The commands about remote cameras.
#include "../grammar/Values.h"
#include "../output/Fields.h"
#include "../output/OutputFile.h"
#include "../output/Text.h"
#include "Context.h"
#include "Groups.h"
#include "Metadata.h"

namespace lumora::client {

namespace {

using Factory = LMRActionFactory;

const std::vector<Field>& cameraFields() {
  static const std::vector<Field> fields{{LMRCameraNameKey, "Name", plainText},
                                         {"state", "State", plainText},
                                         {"recorded", "Recorded", durationText},
                                         {"audio_only", "Audio only", plainText},
                                         {"user", "User", plainText}};
  return fields;
}

std::optional<Dictionary> listCameras(Context& context) {
  return context.reply(Factory::actionToListRemoteCamerasWithSession(context.session()));
}

std::string camerasText(const Context&, const Dictionary& reply) {
  const Array& cameras = list(reply, LMRCamerasKey);
  return cameras.empty() ? "There are no cameras.\n" : table(cameras, cameraFields());
}

/// A command that names a camera and says no more.
template <auto Method> std::optional<Dictionary> tellCamera(Context& context) {
  return context.reply(Method(context.line().operand("CAMERA"), context.session()));
}

std::string cameraText(const Context&, const Dictionary& reply) {
  auto fields = cameraFields();
  fields.push_back({LMRCameraPreviewURLKey, "Preview", plainText});
  return facts(reply, fields);
}

std::string stateText(const Context& context, const Dictionary& reply) {
  const auto state = entry(reply, "state");
  return printable(context.line().operand("CAMERA")) + (state.empty() ? ": done" : " is " + state) + ".\n";
}

std::optional<Dictionary> startCamera(Context& context) {
  const auto delay = number(context.line().value("--delay").value_or("0")).value();
  return context.reply(Factory::actionToStartRemoteCamera_afterDelay_audioOnly_session(
      context.line().operand("CAMERA"), delay, context.line().has("--audio-only"), context.session()));
}

std::optional<Dictionary> previewCamera(Context& context) {
  const std::string& path = context.line().operand("FILE");
  const OutputFile file(path);
  auto reply = tellCamera<&Factory::actionToUpdatePreviewImageForRemoteCamera_session>(context);
  const Value* const value = reply->find(LMRCameraPreviewDataKey);
  const Data* const image = value != nullptr ? value->data() : nullptr;
  if (image == nullptr) {
    throw Failure(exitProtocol, "The server's reply holds no picture.");
  }
  file.write({reinterpret_cast<const char*>(image->data()), image->size()});
  file.commit();
  return path == "-" ? std::nullopt : std::move(reply);
}

std::string previewText(const Context& context, const Dictionary& reply) {
  return "Wrote the picture of " + printable(context.line().operand("CAMERA")) + " to " +
         printable(context.line().operand("FILE")) + " (" +
         byteText(Value(std::uint64_t{reply.find(LMRCameraPreviewDataKey)->data()->size()})) + ").\n";
}

std::optional<Dictionary> stopCamera(Context& context) {
  const auto& line = context.line();
  const auto metadata = userMetadata(line);
  const auto session = context.session();
  const std::string& camera = line.operand("CAMERA");
  const auto workflow = line.value("--workflow");
  const auto action = workflow ? Factory::actionToStopRemoteCamera_andSubmitToWorkflow_withMetadata_session(
                                     camera, workflow, metadata, session)
                               : Factory::actionToStopRemoteCamera_andSubmitToSubmissionUUID_withMetadata_session(
                                     camera, line.value("--submission"), metadata, session);
  const MetadataFiles files(*action);
  return context.reply(action);
}

std::string stopText(const Context& context, const Dictionary& reply) {
  return printable(context.line().operand("CAMERA")) + " stopped, its recording is submitted.\n" +
         facts(reply, {{"uuid", "Episode", plainText}, {"state", "State", plainText}});
}

Command onCamera(std::string_view words, std::string_view help, decltype(Command::run) run,
                 decltype(Command::text) text, std::vector<Option> options = {}) {
  return {words, help, {{.name = "CAMERA"}}, std::move(options), Command::Needs::Login, run, text};
}

std::vector<Option> stopOptions() {
  return withMetadataOptions({
      {.name = "--workflow",
       .letter = 'w',
       .value = "WORKFLOW",
       .kind = Kind::Text,
       .help = "the name of the workflow that gets the recording",
       .need = Option::Need::OneOf},
      {.name = "--submission",
       .value = "UUID",
       .kind = Kind::Text,
       .help = "the submission of a recording container that gets it",
       .need = Option::Need::OneOf},
  });
}

Command previewCommand() {
  return {"camera preview",
          "write a new picture of a camera into a file",
          {{.name = "CAMERA"}, {.name = "FILE", .kind = Kind::File}},
          {},
          Command::Needs::Login,
          previewCamera,
          previewText,
          "The file is written whole or not at all; - stands for standard output."};
}

} // namespace

std::vector<Command> cameraCommands() {
  return {
      {"cameras",
       "list the cameras that the server can record with",
       {},
       {},
       Command::Needs::Login,
       listCameras,
       camerasText},
      onCamera("camera status", "tell what a camera is doing",
               tellCamera<&Factory::actionToGetStatusForRemoteCamera_session>, cameraText),
      previewCommand(),
      onCamera("camera start", "start a recording", startCamera, stateText,
               {{.name = "--delay",
                 .value = "SECONDS",
                 .kind = Kind::Number,
                 .help = "how long the server waits before the camera records"},
                {.name = "--audio-only", .help = "record sound without a picture"}}),
      onCamera("camera pause", "pause the recording", tellCamera<&Factory::actionToPauseRemoteCamera_session>,
               stateText),
      onCamera("camera resume", "go on with the recording", tellCamera<&Factory::actionToResumeRemoteCamera_session>,
               stateText),
      onCamera("camera stop", "end the recording and submit it", stopCamera, stopText, stopOptions()),
      onCamera("camera cancel", "end the recording and throw it away",
               tellCamera<&Factory::actionToCancelRemoteCamera_session>, stateText),
  };
}

} // namespace lumora::client
