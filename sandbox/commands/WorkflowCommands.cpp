#include "../Status.h"
#include "../store/MasterPassword.h"
#include "../workflows/Package.h"
#include "Command.h"

namespace lumora::sandbox {

namespace {

void addOrReplace(Store& store, const Workflow& workflow, bool overwrites) {
  if (!findWorkflow(store, workflow.name)) {
    addWorkflow(store, workflow);
  } else if (overwrites) {
    replaceWorkflow(store, workflow);
  } else {
    throw Refusal(Status::InvalidArguments,
                  "there is a workflow named \"" + workflow.name + "\" already, and it is not to be overwritten");
  }
}

Dictionary fullDescription(const Workflow& workflow) {
  Dictionary all = description(workflow);
  all.set("protected", workflow.isProtected);
  return all;
}

} // namespace

Workflow workflowWithUUID(Store& store, const std::string& uuid) {
  const auto workflow = findWorkflowWithUUID(store, uuid);
  if (!workflow) {
    throw Refusal(Status::InvalidArguments, "there is no workflow with the UUID \"" + uuid + "\"");
  }
  return *workflow;
}

Dictionary infoWorkflow(Context& context, const Arguments& arguments) {
  return fullDescription(workflowWithUUID(context.store, arguments.text("workflow_uuid")));
}

Dictionary installWorkflow(Context& context, const Arguments& arguments) {
  const Workflow package = readPackage(arguments.text("path"));
  checkMasterPassword(context.store, arguments.optionalText("master_password"), package.isProtected);
  context.store.change([&] { addOrReplace(context.store, package, arguments.has("overwrite")); });
  return fullDescription(findWorkflow(context.store, package.name).value());
}

Dictionary downloadWorkflow(Context& context, const Arguments& arguments) {
  const Workflow workflow = workflowWithUUID(context.store, arguments.text("workflow_uuid"));
  const std::string& path = arguments.text("path");
  writePackage(path, workflow);
  return {{"uuid", workflow.uuid}, {"name", workflow.name}, {"path", path}};
}

Dictionary deleteWorkflow(Context& context, const Arguments& arguments) {
  const Workflow workflow = workflowWithUUID(context.store, arguments.text("workflow_uuid"));
  removeWorkflow(context.store, workflow.uuid);
  return {{"uuid", workflow.uuid}, {"name", workflow.name}};
}

} // namespace lumora::sandbox
