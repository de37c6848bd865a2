#include "../Status.h"
#include "../store/MasterPassword.h"
#include "../submission/Submission.h"
#include "Command.h"

namespace lumora::sandbox {

namespace {

Dictionary reply(const std::string& uuid, const char* state) {
  return {{"uuid", uuid}, {"state", state}};
}

bool isLibrary(Store& store) {
  return store.setting("server_kind") == "LumoraLibrary";
}

Dictionary fileAndReport(Context& context, Submission submission) {
  const Filed filed = fileNow(context.store, std::move(submission));
  for (const auto& path : filed.remaining) {
    context.remarks.push_back(path + " was submitted but could not be removed");
  }
  return reply(filed.episodeUUID, "completed");
}

} // namespace

Dictionary submit(Context& context, const Arguments& arguments) {
  const SubmissionRequest request{arguments.texts("file"), arguments.text("metadata"),
                                  arguments.optionalText("recording_metadata"), arguments.optionalText("workflow"),
                                  arguments.optionalText("submission_uuid")};
  if (arguments.has("async") && request.files.size() > 1 && isLibrary(context.store)) {
    throw Refusal(Status::InvalidArguments, "a library server takes several files at once synchronously only");
  }
  Submission submission = prepare(context.store, request, *context.user);
  submission.removesSources = arguments.has("delete");
  if (arguments.has("async")) {
    return reply(fileInBackground(context.store, std::move(submission)), "uploading");
  }
  return fileAndReport(context, std::move(submission));
}

Dictionary submitWorkflow(Context& context, const Arguments& arguments) {
  const auto workflow = findWorkflow(context.store, arguments.text("workflow"));
  checkMasterPassword(context.store, arguments.optionalText("master_password"), workflow && workflow->isProtected);
  const SubmissionRequest request{arguments.texts("input"), arguments.text("metadata"), std::nullopt,
                                  arguments.text("workflow"), std::nullopt};
  return fileAndReport(context, prepare(context.store, request, *context.user));
}

} // namespace lumora::sandbox
