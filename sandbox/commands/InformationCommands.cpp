#include "../store/Recordings.h"
#include "../store/SingleSignOn.h"
#include "Command.h"

#include <sstream>

namespace lumora::sandbox {

namespace {

Array words(const std::string& text) {
  std::istringstream stream(text);
  Array all;
  for (std::string word; stream >> word;) {
    all.emplace_back(word);
  }
  return all;
}

} // namespace

Dictionary listInfo(Context& context, const Arguments& arguments) {
  const Address address = parseAddress(arguments.text("server"));
  checkAddress(context.store, address);
  Array types = words(context.store.setting("auth_types", "basic digest"));
  if (singleSignOnService(context.store)) {
    types.emplace_back("kerberos");
  }
  return {{"http_auth_type", std::move(types)},
          {"server_version", context.store.setting("server_version", "2.0.1")},
          {"server", context.store.setting("server_kind", "LumoraServer")},
          {"hostname", address.host},
          {"ssl", true}};
}

Dictionary listWorkflows(Context& context, const Arguments&) {
  Array descriptions;
  for (const auto& workflow : workflows(context.store)) {
    descriptions.emplace_back(description(workflow));
  }
  return {{"workflows", std::move(descriptions)},
          {"user_shortname", context.user->name},
          {"user_fullname", context.user->fullName},
          {"server", context.store.setting("server_kind", "LumoraServer")}};
}

Dictionary createRecordingContainer(Context& context, const Arguments& arguments) {
  const Workflow workflow = workflowWithUUID(context.store, arguments.text("workflow_uuid"));
  const Recording recording = createRecording(context.store, workflow, *context.user);
  return {{"recording_uuid", recording.uuid},
          {"submission_uuids", Array(recording.submissionUUIDs.begin(), recording.submissionUUIDs.end())}};
}

} // namespace lumora::sandbox
