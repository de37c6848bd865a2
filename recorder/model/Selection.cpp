#include "recorder/model/Selection.h"

#include <algorithm>
#include <utility>

namespace recorder {
namespace {

void putFirst(SourceDescriptions& sources, const std::string& identifier) {
  std::stable_partition(sources.begin(), sources.end(),
                        [&](const SourceDescription& each) { return each.identifier == identifier; });
}

bool contains(const SourceDescriptions& sources, const SourceDescription& source) {
  return std::ranges::find(sources, source) != sources.end();
}

} // namespace

void Selection::setPreferences(std::string workflow, std::string camera, std::string microphone) {
  preferredWorkflow_ = std::move(workflow);
  preferredCamera_ = std::move(camera);
  preferredMicrophone_ = std::move(microphone);
  putFirst(microphones_, preferredMicrophone_);
}

void Selection::setWorkflows(std::vector<Workflow> workflows) {
  workflows_ = std::move(workflows);
  update();
}

void Selection::setDevices(SourceDescriptions sources, SourceDescriptions microphones) {
  sources_ = std::move(sources);
  microphones_ = std::move(microphones);
  putFirst(microphones_, preferredMicrophone_);
  update();
}

void Selection::update() {
  if (!workflow()) {
    selected_.clear();
    selectFittingWorkflow();
    return;
  }
  // What the user has not touched may become better.
  const bool isPoor =
      plan_.empty() || std::ranges::all_of(plan_, [](const auto& each) { return each.microphone.empty(); });
  if (plan_.empty() || (!isChosen_ && isPoor)) {
    makePlan();
  }
}

void Selection::selectFittingWorkflow() {
  plan_.clear();
  const auto all = workflows();
  if (all.empty()) {
    return;
  }
  const auto preferred = std::ranges::find(all, preferredWorkflow_, &Workflow::uuid);
  selectWorkflow(preferred == all.end() ? all.front().uuid : preferred->uuid);
}

std::vector<Workflow> Selection::workflows() const {
  const auto sources = allSources();
  std::vector<Workflow> all;
  std::ranges::copy_if(workflows_, std::back_inserter(all),
                       [&](const Workflow& each) { return each.uuid == selected_ || each.fed(sources).has_value(); });
  return all;
}

const Workflow* Selection::workflow() const {
  const auto found = std::ranges::find(workflows_, selected_, &Workflow::uuid);
  return found == workflows_.end() ? nullptr : &*found;
}

void Selection::selectWorkflow(const std::string& uuid) {
  selected_ = uuid;
  isChosen_ = false;
  makePlan();
}

// The sources in the order in which they are offered.
SourceDescriptions Selection::allSources() const {
  auto all = sources_;
  putFirst(all, preferredCamera_);
  all.insert(all.end(), microphones_.begin(), microphones_.end());
  return all;
}

// One microphone is enough: it goes with the first picture of this machine.
void Selection::makePlan() {
  const auto all = allSources();
  const Workflow* const chosen = workflow();
  const auto indexes = chosen ? chosen->fed(all) : std::nullopt;
  if (!indexes) {
    return;
  }
  plan_.clear();
  bool needsMicrophone = !microphones_.empty();
  for (const std::size_t index : *indexes) {
    PlannedSource planned{all[index], {}};
    const bool takesMicrophone = planned.source.hasPicture() && !planned.source.isRemote();
    if (takesMicrophone && std::exchange(needsMicrophone, needsMicrophone && !takesMicrophone)) {
      planned.microphone = microphones_.front().identifier;
    }
    plan_.push_back(std::move(planned));
  }
}

SourceDescriptions Selection::sourcesFor(std::size_t place) const {
  SourceDescriptions fitting;
  for (const SourceDescription& source : allSources()) {
    const bool isElsewhere = std::ranges::any_of(
        plan_, [&](const PlannedSource& each) { return &each != &plan_[place] && each.source == source; });
    if (workflow()->places[place].takes(source.kind) && !isElsewhere) {
      fitting.push_back(source);
    }
  }
  if (!contains(fitting, plan_[place].source)) {
    fitting.insert(fitting.begin(), plan_[place].source);
  }
  return fitting;
}

SourceDescriptions Selection::microphonesFor(std::size_t place) const {
  const SourceDescription& source = plan_[place].source;
  return source.hasPicture() && !source.isRemote() ? microphones_ : SourceDescriptions();
}

void Selection::chooseSource(std::size_t place, const SourceDescription& source) {
  isChosen_ = true;
  plan_[place].source = source;
  if (!source.hasPicture() || source.isRemote()) {
    plan_[place].microphone.clear();
  }
}

void Selection::chooseMicrophone(std::size_t place, const std::string& identifier) {
  isChosen_ = true;
  plan_[place].microphone = identifier;
}

bool Selection::hasMicrophone(const std::string& identifier) const {
  return std::ranges::find(microphones_, identifier, &SourceDescription::identifier) != microphones_.end();
}

bool Selection::isPresent(std::size_t place) const {
  const PlannedSource& planned = plan_[place];
  return contains(allSources(), planned.source) && (planned.microphone.empty() || hasMicrophone(planned.microphone));
}

} // namespace recorder
