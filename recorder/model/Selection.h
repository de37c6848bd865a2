#pragma once

#include "recorder/model/Source.h"
#include "recorder/model/Workflow.h"

#include <cstddef>
#include <string>
#include <vector>

namespace recorder {

/// What is to be recorded for which workflow: chosen from what is there, and by the user. Plain logic, without a device
/// or a server.
class Selection {
public:
  /// With what to begin; empty: the first that fits.
  void setPreferences(std::string workflow, std::string camera, std::string microphone);
  /// What there is now. A source that was chosen stays chosen when it has gone.
  void setWorkflows(std::vector<Workflow> workflows);
  void setDevices(SourceDescriptions sources, SourceDescriptions microphones);

  /// Those that can be fed from what there is, and the one that is selected.
  std::vector<Workflow> workflows() const;
  /// Null when there is none to select.
  const Workflow* workflow() const;
  void selectWorkflow(const std::string& uuid);

  /// One a place of the workflow.
  const std::vector<PlannedSource>& plan() const { return plan_; }
  /// What may be chosen for a place: what fits and is at no other place. The chosen one is among them.
  SourceDescriptions sourcesFor(std::size_t place) const;
  SourceDescriptions microphonesFor(std::size_t place) const;
  void chooseSource(std::size_t place, const SourceDescription& source);
  /// Empty for none.
  void chooseMicrophone(std::size_t place, const std::string& identifier);
  /// Whether everything that is planned is there.
  bool isPresent(std::size_t place) const;

private:
  void update();
  void selectFittingWorkflow();
  void makePlan();
  SourceDescriptions allSources() const;
  bool hasMicrophone(const std::string& identifier) const;

  std::string preferredWorkflow_;
  std::string preferredCamera_;
  std::string preferredMicrophone_;
  std::vector<Workflow> workflows_;
  SourceDescriptions sources_;
  SourceDescriptions microphones_;
  std::string selected_;
  std::vector<PlannedSource> plan_;
  // The user has chosen a source or a microphone for this workflow.
  bool isChosen_ = false;
};

} // namespace recorder
