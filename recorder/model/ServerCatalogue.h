#pragma once

#include "recorder/model/SourceDescription.h"
#include "recorder/model/Workflow.h"

#include <LumoraKit/LumoraKit.h>

#include <memory>
#include <vector>

namespace recorder {

/// What the server offers to a user: workflows that this application can record for, and cameras. Main thread only.
class ServerCatalogue : public std::enable_shared_from_this<ServerCatalogue> {
public:
  /// Told when an answer has come.
  lumora::Notifier changed;

  /// Asks the session's server; what was known before counts until it has answered.
  void load(const std::shared_ptr<LMRSession>& session);
  /// Whether the workflows have not come yet.
  bool isLoading() const { return isLoading_; }
  /// Why there are no workflows; null when they came.
  const LMRErrorRef& error() const { return error_; }
  const std::vector<Workflow>& workflows() const { return workflows_; }
  const SourceDescriptions& cameras() const { return cameras_; }

private:
  void workflowsCame(const std::shared_ptr<LMRAction>& action);
  void workflowsFailed(const std::shared_ptr<LMRAction>& action);
  void camerasCame(const std::shared_ptr<LMRAction>& action);

  bool isLoading_ = false;
  LMRErrorRef error_;
  std::vector<Workflow> workflows_;
  SourceDescriptions cameras_;
};

} // namespace recorder
