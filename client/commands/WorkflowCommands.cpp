// The commands about the server's workflows.
#include "../output/Fields.h"
#include "../output/OutputFile.h"
#include "../output/Text.h"
#include "Context.h"
#include "Groups.h"
#include "Metadata.h"

#include <algorithm>

namespace lumora::client {

namespace {

using Factory = LMRActionFactory;
using Session = std::shared_ptr<LMRSession>;

bool isUUID(std::string_view text) {
  constexpr std::string_view pattern = "xxxxxxxx-xxxx-xxxx-xxxx-xxxxxxxxxxxx";
  const auto fits = [](char expected, char letter) {
    return expected == '-' ? letter == '-' : std::isxdigit(static_cast<unsigned char>(letter)) != 0;
  };
  return std::ranges::equal(pattern, text, fits);
}

// Commands take a workflow's name or its UUID, the server's tools only the latter. A word that is neither goes to the
// tool as it is, which refuses it.
std::string workflowUUID(const Context& context, const Session& session, const std::string& word) {
  if (isUUID(word)) {
    return word;
  }
  const auto reply = context.reply(Factory::actionToListWorkflowsWithSession(session));
  for (const Value& workflow : list(reply, LMRWorkflowsKey)) {
    if (workflow.dictionary() != nullptr && workflow.dictionary()->string(LMRWorkflowNameKey) == word) {
      return workflow.dictionary()->string(LMRWorkflowUUIDKey).value_or(word);
    }
  }
  return word;
}

template <class Method> std::optional<Dictionary> replyAboutWorkflow(const Context& context, Method method) {
  const auto session = context.session();
  return context.reply(method(workflowUUID(context, session, context.line().operand("WORKFLOW")), session));
}

// "Video or File + Screen": one part a source.
std::string sourcesText(const Value& value) {
  const Array* const sources = value.array();
  if (sources == nullptr) {
    return plainText(value);
  }
  std::string text;
  for (const Value& source : *sources) {
    const Dictionary* const entries = source.dictionary();
    const Array* const types = entries != nullptr ? entries->array("sourceTypes") : nullptr;
    std::string words;
    for (const Value& type : types != nullptr ? *types : Array{source}) {
      words += (words.empty() ? "" : " or ") + plainText(type);
    }
    const Value* const isFolder = entries != nullptr ? entries->find("isFolder") : nullptr;
    text += (text.empty() ? "" : " + ") + words + (isFolder != nullptr && isFolder->boolean() == true ? " folder" : "");
  }
  return text;
}

const std::vector<Field>& workflowFields() {
  static const std::vector<Field> fields{{LMRWorkflowNameKey, "Name", plainText},
                                         {LMRWorkflowTitleKey, "Title", plainText},
                                         {LMRWorkflowSourcesKey, "Takes", sourcesText},
                                         {LMRWorkflowUUIDKey, "UUID", plainText},
                                         {"protected", "Protected", plainText}};
  return fields;
}

std::optional<Dictionary> listWorkflows(Context& context) {
  return context.reply(Factory::actionToListWorkflowsWithSession(context.session()));
}

std::string workflowsText(const Context&, const Dictionary& reply) {
  const Array& workflows = list(reply, LMRWorkflowsKey);
  return workflows.empty() ? "There are no workflows.\n" : table(workflows, workflowFields());
}

std::optional<Dictionary> workflowInfo(Context& context) {
  return replyAboutWorkflow(context, &Factory::actionToGetWorkflowInformationWithUUID_withSession);
}

std::string workflowText(const Context&, const Dictionary& reply) {
  return facts(reply, workflowFields());
}

std::optional<std::string> masterPassword(const Context& context) {
  const auto password = context.passwords().master();
  return password ? std::optional(password->text()) : std::nullopt;
}

std::optional<Dictionary> installWorkflow(Context& context) {
  const std::string path = readableFile(context.line().operand("FILE"));
  const auto session = context.session();
  return context.reply(Factory::actionToInstallWorkflowFromPath_withMasterPassword_overwrite_withSession(
      path, masterPassword(context), context.line().has("--overwrite"), session));
}

std::optional<Dictionary> downloadWorkflow(Context& context) {
  const std::string& path = context.line().operand("FILE");
  const OutputFile file(path);
  const auto session = context.session();
  const auto uuid = workflowUUID(context, session, context.line().operand("WORKFLOW"));
  auto reply = context.reply(
      Factory::actionToDownloadWorkflowWithUUID_toPath_withSession(uuid, file.temporary().string(), session));
  file.commit();
  return path == "-" ? std::nullopt : std::optional(std::move(reply));
}

std::string downloadText(const Context& context, const Dictionary& reply) {
  const auto name = reply.string(LMRWorkflowNameKey).value_or(context.line().operand("WORKFLOW"));
  return "Downloaded " + printable(name) + " to " + printable(context.line().operand("FILE")) + ".\n";
}

std::optional<Dictionary> deleteWorkflow(Context& context) {
  return replyAboutWorkflow(context, &Factory::actionToDeleteWorkflowWithUUID_withSession);
}

std::string deleteText(const Context& context, const Dictionary& reply) {
  const auto name = reply.string(LMRWorkflowNameKey).value_or(context.line().operand("WORKFLOW"));
  return "Deleted " + printable(name) + ".\n";
}

std::optional<Dictionary> submitWorkflow(Context& context) {
  std::vector<std::string> inputs;
  for (const auto& file : context.line().operands("FILE")) {
    inputs.push_back(readableFile(file));
  }
  const auto metadata = userMetadata(context.line());
  const auto session = context.session();
  const auto password = masterPassword(context);
  const auto action =
      LMRToolActionFactory::actionToSubmitWorkflow_withMasterPassword_metadataPath_andInputs_withSession(
          context.line().operand("WORKFLOW"), password, LMRActionFactoryAdditions::writeToApplicationSupport(metadata),
          inputs, session);
  const MetadataFiles files(*action);
  return context.reply(action);
}

std::string submittedText(const Context& context, const Dictionary& reply) {
  return "Submitted to " + printable(context.line().operand("WORKFLOW")) + ".\n" +
         facts(reply, {{"uuid", "Episode", plainText}, {"state", "State", plainText}});
}

std::optional<Dictionary> createRecording(Context& context) {
  return replyAboutWorkflow(context, &Factory::actionToCreateRecordingContainerForWorkflowUUID_session);
}

std::string submissionsText(const Value& value) {
  std::string text;
  for (const Value& uuid : value.array() != nullptr ? *value.array() : Array{value}) {
    text += (text.empty() ? "" : " ") + plainText(uuid);
  }
  return text;
}

std::string recordingText(const Context&, const Dictionary& reply) {
  return facts(reply, {{LMRRecordingContainerUUIDKey, "Recording", plainText},
                       {LMRSubmissionUUIDSKey, "Submissions", submissionsText}});
}

const Operand workflowOperand{.name = "WORKFLOW"};

std::vector<Option> masterPasswordOptions() {
  return {{.name = "--master-password-file",
           .value = "FILE",
           .kind = Kind::File,
           .help = "take the master password from the first line of a file, - for the next line of standard input"},
          {.name = "--ask-master-password", .help = "ask for the master password at the terminal"}};
}

std::vector<Option> installOptions() {
  auto options = masterPasswordOptions();
  options.push_back({.name = "--overwrite", .help = "replace a workflow of the same name"});
  return options;
}

} // namespace

std::vector<Command> workflowCommands() {
  using Needs = Command::Needs;
  return {
      {"workflows", "list the workflows that one may submit to", {}, {}, Needs::Login, listWorkflows, workflowsText},
      {"workflow info",
       "describe a workflow",
       {workflowOperand},
       {},
       Needs::Login,
       workflowInfo,
       workflowText,
       "A workflow is named by its name or its UUID."},
      {"workflow install",
       "install a workflow from a file",
       {{.name = "FILE", .kind = Kind::File}},
       installOptions(),
       Needs::Login,
       installWorkflow,
       workflowText},
      {"workflow download",
       "write a workflow into a file",
       {workflowOperand, {.name = "FILE", .kind = Kind::File}},
       {},
       Needs::Login,
       downloadWorkflow,
       downloadText,
       "The file is written whole or not at all; - stands for standard output."},
      {"workflow delete", "delete a workflow", {workflowOperand}, {}, Needs::Login, deleteWorkflow, deleteText},
      {"workflow submit",
       "submit files to a workflow, which may be protected by a master password",
       {workflowOperand, {.name = "FILE", .kind = Kind::File, .count = Operand::Count::Many}},
       withMetadataOptions(masterPasswordOptions()),
       Needs::Login,
       submitWorkflow,
       submittedText,
       "The workflow is named by its name."},
      {"recording create",
       "make a container for one recording of several sources",
       {workflowOperand},
       {},
       Needs::Login,
       createRecording,
       recordingText,
       R"(Each source of the workflow gets a submission, for "submit --submission" and "camera stop --submission".)"},
  };
}

} // namespace lumora::client
