// The commands that hand files to a workflow, and those about their transfers.
#include "../output/Fields.h"
#include "../output/Text.h"
#include "Context.h"
#include "Groups.h"
#include "Metadata.h"

namespace lumora::client {

namespace {

using Factory = LMRActionFactory;
using Session = std::shared_ptr<LMRSession>;
using ActionRef = std::shared_ptr<LMRAction>;

struct Submission {
  std::vector<std::string> files;
  Dictionary metadata;
  std::optional<Dictionary> recording;
  bool isAsynchronous = false;
  bool deletes = false;
};

Submission submissionOf(const CommandLine& line) {
  Submission submission;
  for (const auto& file : line.operands("FILE")) {
    submission.files.push_back(readableFile(file));
  }
  submission.recording = recordingMetadata(line);
  if (submission.files.size() > 1 && (submission.recording || line.has("--submission"))) {
    throw Failure(exitUsage, "Several files go to a workflow, without recording metadata: use one FILE with these "
                             "options.");
  }
  submission.metadata = userMetadata(line);
  submission.isAsynchronous = line.has("--async");
  submission.deletes = line.has("--delete");
  return submission;
}

ActionRef actionFor(const Submission& submission, const CommandLine& line, const Session& session) {
  const auto workflow = line.value("--workflow");
  if (submission.files.size() > 1) {
    return Factory::actionToSubmitFiles_toWorkflow_metadata_asynchronous_deleteAfterSubmission_session(
        submission.files, workflow, submission.metadata, submission.isAsynchronous, submission.deletes, session);
  }
  const auto make =
      workflow
          ? &Factory::
                actionToSubmitFile_toWorkflow_userMetadata_recordingMetadata_asynchronous_deleteAfterSubmission_session
          : &Factory::
                actionToSubmitFile_toSubmissionUUID_userMetadata_recordingMetadata_asynchronous_deleteAfterSubmission_session;
  return make(submission.files.front(), workflow ? workflow : line.value("--submission"), submission.metadata,
              submission.recording, submission.isAsynchronous, submission.deletes, session);
}

std::optional<Dictionary> submit(Context& context) {
  const auto submission = submissionOf(context.line());
  // A library server takes several files synchronously only, and says what it is at the login.
  const bool kindMatters = submission.isAsynchronous && submission.files.size() > 1;
  const auto session = kindMatters ? context.loggedInSession() : context.session();
  const auto action = actionFor(submission, context.line(), session);
  std::optional<MetadataFiles> files;
  if (!submission.isAsynchronous) {
    files.emplace(*action);
  }
  return context.reply(action);
}

std::string submitText(const Context& context, const Dictionary&) {
  const auto& line = context.line();
  const auto files = line.operands("FILE");
  const std::string what = files.size() == 1 ? printable(files.front()) : std::to_string(files.size()) + " files";
  const auto workflow = line.value("--workflow");
  const std::string where = workflow ? *workflow : "the submission " + line.value("--submission").value_or("");
  return (line.has("--async") ? "Submitting " : "Submitted ") + what + " to " + printable(where) +
         (line.has("--async") ? "; \"lumora transfers\" tells how far it is" : "") + ".\n";
}

std::optional<Dictionary> listTransfers(Context& context) {
  return context.reply(Factory::actionToListCurrentTransfers());
}

std::string transfersText(const Context&, const Dictionary& reply) {
  const Array& transfers = list(reply, "uploads");
  if (transfers.empty()) {
    return "There are no transfers.\n";
  }
  return table(transfers, {{"state", "State", plainText},
                           {"title", "Title", plainText},
                           {"workflow", "Workflow", plainText},
                           {"user", "User", plainText},
                           {"file_count", "Files", plainText},
                           {"sent", "Sent", byteText},
                           {"size", "Size", byteText},
                           {"started", "Started", plainText},
                           {"ended", "Ended", plainText},
                           {"message", "Message", plainText}});
}

std::optional<Dictionary> clearTransfers(Context& context) {
  return context.reply(Factory::actionToClearCurrentTransfersList());
}

std::string clearText(const Context&, const Dictionary& reply) {
  const auto cleared = entry(reply, "cleared");
  return cleared.empty() ? "Forgot the transfers that have ended.\n"
                         : "Forgot " + cleared + (cleared == "1" ? " transfer" : " transfers") + " that had ended.\n";
}

std::vector<Option> submitOptions() {
  auto options = withMetadataOptions({
      {.name = "--workflow",
       .letter = 'w',
       .value = "WORKFLOW",
       .kind = Kind::Text,
       .help = "the name of the workflow",
       .need = Option::Need::OneOf},
      {.name = "--submission",
       .value = "UUID",
       .kind = Kind::Text,
       .help = "a submission of a recording container",
       .need = Option::Need::OneOf},
      {.name = "--async", .help = "do not wait for the transfer"},
      {.name = "--delete", .help = "remove the files once they have been transferred"},
  });
  options.insert(
      options.end(),
      {
          {.name = "--recording-start",
           .value = "DATE",
           .kind = Kind::Date,
           .help = "when the recording began (2026-11-21T09:30:00Z)"},
          {.name = "--recording-end", .value = "DATE", .kind = Kind::Date, .help = "when the recording ended"},
          {.name = "--recording-duration",
           .value = "SECONDS",
           .kind = Kind::Seconds,
           .help = "how long the recording is without its pauses"},
          {.name = "--recording-metadata",
           .value = "KEY=VALUE",
           .kind = Kind::Pair,
           .help = "a further entry about the recording; may be repeated",
           .repeats = true},
      });
  return options;
}

} // namespace

std::vector<Command> submissionCommands() {
  return {
      {"submit",
       "submit files as one episode",
       {{.name = "FILE", .kind = Kind::File, .count = Operand::Count::Many}},
       submitOptions(),
       Command::Needs::Login,
       submit,
       submitText,
       "With --async the metadata stay in the user's data folder, because the transfer may still read them."},
      {"transfers", "list this machine's transfers", {}, {}, Command::Needs::Nothing, listTransfers, transfersText},
      {"transfers clear",
       "forget the transfers that have ended",
       {},
       {},
       Command::Needs::Nothing,
       clearTransfers,
       clearText},
  };
}

} // namespace lumora::client
