#include "Refusals.h"

#include <set>

#include <sandbox/commands/Command.h>

using namespace lumora;
using namespace lumora::sandbox;
using testing::ElementsAre;

namespace {

const Array server{"server", "localhost:8170"};
const Array file{"file", "/tmp/a.mov"};
const Array metadata{"metadata", "/tmp/a.plist"};
const Array recordingMetadata{"recording_metadata", "/tmp/a.xml"};
const Array workflow{"workflow", "single-video"};
const Array submissionUUID{"submission_uuid", "U"};
const Array workflowUUID{"workflow_uuid", "W"};

Arguments matched(const Array& request, ToolKind tool = ToolKind::Main) {
  const auto elements = parseRequest(textOf(request));
  const Call call = parseCall(elements, tool);
  return match(findCommand(tool, call).grammar, call.arguments);
}

} // namespace

struct Sample {
  const char* name;
  Array request;
  const char* reason = "";
  ToolKind tool = ToolKind::Main;
};

class CommandTaken : public testing::TestWithParam<Sample> {};

TEST_P(CommandTaken, matchesItsGrammar_when) {
  EXPECT_NO_THROW(matched(GetParam().request, GetParam().tool));
}

INSTANTIATE_TEST_SUITE_P(
    Requests, CommandTaken,
    testing::Values(
        Sample{"listinfo", {"listinfo", server}}, Sample{"listworkflows", {"listworkflows"}},
        Sample{"infoworkflow", {"infoworkflow", workflowUUID}},
        Sample{"installworkflow", {"installworkflow", Array{"path", "/w"}}},
        Sample{"installworkflowOverwriting", {"installworkflow", Array{"path", "/w"}, "overwrite"}},
        Sample{"installworkflowWithPassword",
               {"installworkflow", Array{"path", "/w"}, Array{"master_password", "m"}, "overwrite"}},
        Sample{"downloadworkflow", {"downloadworkflow", workflowUUID, Array{"path", "/w"}}},
        Sample{"deleteworkflow", {"deleteworkflow", workflowUUID}},
        Sample{"create_recording", {"create_recording", workflowUUID}},
        Sample{"submit", {"submit", file, metadata, workflow}},
        Sample{"submitIntoUUID", {"submit", file, metadata, submissionUUID}},
        Sample{"submitWithEverything",
               {"submit", Array{"async"}, Array{"delete"}, file, metadata, recordingMetadata, workflow}},
        Sample{"submitSeveral", {"submit", Array{"delete"}, file, file, file, metadata, workflow}},
        Sample{"list_uploads", {"list_uploads"}}, Sample{"clear", {"clear_completed_uploads"}},
        Sample{"listcameras", {"listcameras"}}, Sample{"status", only(Array{"status", "Studio"})},
        Sample{"statusWithPreview", {Array{"status", "Studio"}, "update_preview_image", "include_preview_image"}},
        Sample{"start", {Array{"start", "Studio"}, Array{"delay", 0}}},
        Sample{"startAudioOnly", {Array{"start", "Studio"}, Array{"delay", 5}, "audio_only"}},
        Sample{"pause", only(Array{"pause", "Studio"})}, Sample{"resume", only(Array{"resume", "Studio"})},
        Sample{"cancel", only(Array{"cancel", "Studio"})},
        Sample{"stopIntoWorkflow", {Array{"stop", "Studio"}, metadata, workflow}},
        Sample{"stopIntoUUID", {Array{"stop", "Studio"}, metadata, submissionUUID}},
        Sample{"isbound", {"isbound", "plist"}}, Sample{"getconfig", {"getconfig", "plist"}},
        Sample{"setconfig", {"setconfig", "Capture=high"}}, Sample{"bind", {"bind", "Studio"}},
        Sample{"unbind", {"unbind", "Studio"}},
        Sample{"workflow",
               {Array{"subcommand", "workflow"}, workflow, metadata, Array{"basedir", "/tmp"}, Array{"input", "/a"}},
               "",
               ToolKind::Action},
        Sample{"workflowWithPassword",
               {Array{"subcommand", "workflow"}, workflow, metadata, Array{"basedir", "/tmp"},
                Array{"master_password", "m"}, Array{"input", "/a"}, Array{"input", "/b"}},
               "",
               ToolKind::Action}),
    [](const auto& sample) { return sample.param.name; });

class CommandRefused : public testing::TestWithParam<Sample> {};

TEST_P(CommandRefused, isInvalidArguments_when) {
  EXPECT_THAT(refusalOf([] { matched(GetParam().request, GetParam().tool); }),
              IsRefusal(Status::InvalidArguments, GetParam().reason));
}

INSTANTIATE_TEST_SUITE_P(
    Requests, CommandRefused,
    testing::Values(
        Sample{"unknownWord", {"frobnicate"}, "\"frobnicate\" is not a command"},
        Sample{"unknownVerb", only(Array{"frobnicate", "Studio"}), "\"frobnicate\" is not a command"},
        Sample{"verbAsWord", {"status", "Studio"}, "\"status\" is not a command"},
        Sample{"wordAsVerb", only(Array{"listworkflows", "x"}), "\"listworkflows\" is not a command"},
        Sample{"commandInCapitals", {"ListInfo", server}, "is not a command"},
        Sample{"listinfoWithoutServer", {"listinfo"}, "(\"server\", ...) is missing"},
        Sample{"listinfoWithMore", {"listinfo", server, "plist"}, "the word \"plist\" is unknown, repeated or out"},
        Sample{"listworkflowsWithMore", {"listworkflows", server}, "(\"server\", ...) is unknown, repeated or out"},
        Sample{"uuidMissing", {"create_recording"}, "(\"workflow_uuid\", ...) is missing"},
        Sample{"uuidWithoutValue", {"create_recording", Array{"workflow_uuid"}}, "(\"workflow_uuid\") has no value"},
        Sample{"uuidEmpty", {"create_recording", Array{"workflow_uuid", ""}}, "is empty"},
        Sample{"uuidTwice", {"create_recording", workflowUUID, workflowUUID}, "unknown, repeated or out of place"},
        Sample{"asyncAsWord", {"submit", "async", file, metadata, workflow}, "in its place stands the word \"async\""},
        Sample{"asyncWithValue", {"submit", Array{"async", "1"}, file, metadata, workflow}, "takes no value"},
        Sample{"deleteBeforeAsync", {"submit", Array{"delete"}, Array{"async"}, file, metadata, workflow}, "\"async\""},
        Sample{
            "asyncAfterFile", {"submit", file, Array{"async"}, metadata, workflow}, "(\"metadata\", ...) is missing"},
        Sample{"fileMissing", {"submit", metadata, workflow}, "(\"file\", ...) is missing"},
        Sample{"fileWithoutValue", {"submit", Array{"file"}, metadata, workflow}, "(\"file\") has no value"},
        Sample{"metadataMissing", {"submit", file, workflow}, "(\"metadata\", ...) is missing"},
        Sample{"metadataWithoutValue", {"submit", file, Array{"metadata"}, workflow}, "(\"metadata\") has no value"},
        Sample{"metadataBeforeFile", {"submit", metadata, file, workflow}, "(\"file\", ...) is missing"},
        Sample{"recordingMetadataWithoutValue",
               {"submit", file, metadata, Array{"recording_metadata"}, workflow},
               "(\"recording_metadata\") has no value"},
        Sample{"recordingMetadataFirst", {"submit", file, recordingMetadata, metadata, workflow}, "\"metadata\""},
        Sample{"workflowMissing", {"submit", file, metadata}, "(\"workflow\", ...) or (\"submission_uuid\", ...)"},
        Sample{"workflowAndUUID", {"submit", file, metadata, workflow, submissionUUID}, "out of place"},
        Sample{"delayMissing", only(Array{"start", "Studio"}), "(\"delay\", ...) is missing"},
        Sample{"delayAsText", {Array{"start", "Studio"}, Array{"delay", "5"}}, "is not a number of zero or more"},
        Sample{"delayNegative", {Array{"start", "Studio"}, Array{"delay", -1}}, "is not a number of zero or more"},
        Sample{"audioOnlyAsArray", {Array{"start", "S"}, Array{"delay", 5}, Array{"audio_only"}}, "out of place"},
        Sample{"audioOnlyBeforeDelay", {Array{"start", "S"}, "audio_only", Array{"delay", 5}}, "is missing"},
        Sample{"cameraWithoutValue", only(Array{"status"}), "(\"status\") has no value"},
        Sample{"previewOutOfOrder",
               {Array{"status", "S"}, "include_preview_image", "update_preview_image"},
               "out of place"},
        Sample{"plistMissing", {"isbound"}, "the word \"plist\" is missing"},
        Sample{"plistAsArray", {"getconfig", Array{"plist"}}, "the word \"plist\" is missing"},
        Sample{"setconfigWithoutValue", {"setconfig"}, "is missing"},
        Sample{"bindWithArray", {"bind", Array{"camera", "S"}}, "a word with the camera is missing"},
        Sample{"passwordAfterOverwrite",
               {"installworkflow", Array{"path", "/w"}, "overwrite", Array{"master_password", "m"}},
               "out of place"},
        Sample{"auxiliaryUnknown", only(Array{"subcommand", "submit"}), "\"submit\" is not a command",
               ToolKind::Action},
        Sample{"auxiliaryWithoutInput",
               {Array{"subcommand", "workflow"}, workflow, metadata, Array{"basedir", "/tmp"}},
               "(\"input\", ...) is missing",
               ToolKind::Action}),
    [](const auto& sample) { return sample.param.name; });

TEST(Arguments, textsKeepTheirOrder_whenAKeyIsRepeated) {
  const auto arguments = matched({"submit", Array{"file", "/b"}, Array{"file", "/a"}, metadata, workflow});
  EXPECT_THAT(arguments.texts("file"), ElementsAre("/b", "/a"));
  EXPECT_EQ(arguments.optionalText("workflow"), "single-video");
  EXPECT_EQ(arguments.optionalText("submission_uuid"), std::nullopt);
  EXPECT_FALSE(arguments.has("async"));
}

TEST(Arguments, numberIsRead_whenTheGrammarAsksForOne) {
  EXPECT_EQ(matched({Array{"start", "S"}, Array{"delay", 4'000'000'000U}}).number("delay"), 4'000'000'000U);
}

TEST(Commands, haveOneNameEach) {
  for (const auto tool : {ToolKind::Main, ToolKind::Exec, ToolKind::Action}) {
    std::set<std::string_view> words;
    for (const auto& command : commandsOf(tool)) {
      EXPECT_TRUE(words.insert(command.word).second) << command.word;
    }
  }
}
