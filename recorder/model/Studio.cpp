#include "recorder/model/Studio.h"

#include "recorder/model/Texts.h"

#include <algorithm>

namespace recorder {
namespace {

constexpr lumora::HostTime slowly = 2'000'000'000;

std::string reasonOf(const LMRErrorRef& error) {
  return error ? error->localizedDescription() : text("The reason is not known");
}

} // namespace

std::shared_ptr<Studio> Studio::make() {
  return std::make_shared<Studio>();
}

Studio::Studio() : settings_(Settings::load()) {
  selection_.setPreferences(settings_.workflow, settings_.camera, settings_.microphone);
}

Studio::~Studio() = default;

void Studio::begin() {
  connections_.push_back(devices_->changed.observe([this] { devicesChanged(); }));
  connections_.push_back(catalogue_->changed.observe([this] { devicesChanged(); }));
  connections_.push_back(submissions_->changed.observe([this] { changed.notify(); }));
  if (const LMRErrorRef error = submissions_->open()) {
    tell(filled("Nothing can be submitted: %1", {reasonOf(error)}));
  }
  connections_.push_back(recovery_->changed.observe([this] { recoveryChanged(); }));
  recovery_->open();
  devices_->refresh();
  devices_->findEncoders();
}

// The error is told at once when a take is to be noted.
void Studio::recoveryChanged() {
  if (recovery_->error()) {
    tell(filled("The interrupted recording could not be submitted: %1", {reasonOf(recovery_->error())}));
  }
  changed.notify();
}

void Studio::setSession(std::shared_ptr<LMRSession> session) {
  session_ = std::move(session);
  submissions_->setSession(session_);
  recovery_->find(session_);
  reloadCatalogue();
}

void Studio::reloadCatalogue() {
  catalogue_->load(session_);
  changed.notify();
}

// Folder, quality and encoder count for recorders that are made from now on.
void Studio::setSettings(const Settings& settings) {
  settings_ = settings;
  settings_.save();
  selection_.setPreferences(settings_.workflow, settings_.camera, settings_.microphone);
  if (!isUnderWay()) {
    discardTake();
    sources_.clear();
    sourceConnections_.clear();
    restage();
  }
  changed.notify();
}

void Studio::tick(const PictureSize& pictureSize) {
  for (const auto& source : sources_) {
    source->look(pictureSize);
  }
  const auto now = lumora::Platform::current().mediaCapture->hostTime();
  if (now >= lookAgainAt_) {
    lookAgainAt_ = now + slowly;
    lookSlowly();
  }
}

void Studio::lookSlowly() {
  devices_->refresh();
  if (take_ && !take_->hasEnded()) {
    room_->refresh(take_->recorder());
  }
  if (session_) {
    submissions_->refreshTransfers();
  }
}

// What there is to record, and for what.

void Studio::devicesChanged() {
  SourceDescriptions sources = devices_->cameras();
  if (devices_->hasScreen()) {
    sources.push_back({SourceKind::Screen, "", text("Screen")});
  }
  sources.insert(sources.end(), catalogue_->cameras().begin(), catalogue_->cameras().end());
  selection_.setDevices(std::move(sources), devices_->microphones());
  selection_.setWorkflows(catalogue_->workflows());
  for (std::size_t i = 0; i < sources_.size() && i < selection_.plan().size(); ++i) {
    if (!isUnderWay() && !sources_[i]->error() && !selection_.isPresent(i)) {
      sources_[i]->fail(
          LMRError::make(LMRRecorderErrorDomain, 1, filled("%1 is not connected", {sources_[i]->plan().source.name})));
    }
  }
  restage();
  changed.notify();
}

void Studio::selectWorkflow(const std::string& uuid) {
  if (isUnderWay()) {
    return;
  }
  selection_.selectWorkflow(uuid);
  settings_.workflow = uuid;
  settings_.save();
  restage();
  changed.notify();
}

void Studio::chooseSource(std::size_t place, const SourceDescription& source) {
  if (!isUnderWay()) {
    selection_.chooseSource(place, source);
    restage();
    changed.notify();
  }
}

void Studio::chooseMicrophone(std::size_t place, const std::string& identifier) {
  if (!isUnderWay()) {
    selection_.chooseMicrophone(place, identifier);
    restage();
    changed.notify();
  }
}

void Studio::reopen(std::size_t place) {
  if (!isUnderWay()) {
    discardTake();
    openSource(place);
    changed.notify();
  }
}

// The sources.

// Brings the open sources in line with the plan; those that stay the same stay open.
void Studio::restage() {
  if (isUnderWay() || !session_) {
    return;
  }
  const auto& plan = selection_.plan();
  if (sources_.size() != plan.size()) {
    discardTake();
    sources_.resize(plan.size());
    sourceConnections_.resize(plan.size());
  }
  for (std::size_t i = 0; i < plan.size(); ++i) {
    if (mustReopen(i)) {
      discardTake();
      openSource(i);
    }
  }
  prepareTake();
}

// One that has come back is opened again.
bool Studio::mustReopen(std::size_t place) const {
  const auto& source = sources_[place];
  if (!source || !(source->plan() == selection_.plan()[place])) {
    return true;
  }
  return source->error() && selection_.isPresent(place);
}

void Studio::openSource(std::size_t place) {
  sourceConnections_[place] = lumora::Connection();
  sources_[place] = makeSource(selection_.plan()[place], session_, settings_.videoCompression());
  sourceConnections_[place] = sources_[place]->changed.observe([this] {
    if (!isUnderWay()) {
      prepareTake();
    }
    changed.notify();
  });
  sources_[place]->open();
}

// The take.

void Studio::discardTake() {
  takeConnection_ = lumora::Connection();
  if (std::exchange(take_, nullptr)) {
    for (const auto& source : sources_) {
      if (source && !source->error()) {
        source->renewRecorder();
      }
    }
  }
  room_->clear();
}

// As soon as all sources are ready, so that the files' folder is known and the room on its disk can be told.
void Studio::prepareTake() {
  const bool areReady = !sources_.empty() && std::ranges::all_of(sources_, [](const auto& each) {
    return each && each->state() == SourceState::Ready;
  });
  if (take_ && !areReady) {
    discardTake();
  }
  if (take_ || !areReady) {
    return;
  }
  take_ = Take::make(sources_, selection_.workflow()->uuid, session_);
  takeConnection_ = take_->changed.observe([this] { takeChanged(); });
  room_->refresh(take_->recorder());
}

void Studio::record() {
  if (canRecord()) {
    notice_.clear();
    if (const LMRErrorRef error = recovery_->note(*take_, episode_)) {
      tell(filled("This recording would not be found after a crash: %1", {reasonOf(error)}));
    }
    take_->start();
  }
}

void Studio::takeChanged() {
  const auto take = take_;
  if (take->hasEnded()) {
    takeEnded();
  } else if (take->hasNoPlaceAtServer()) {
    tell(filled("The server did not take the recording, which goes on: %1", {reasonOf(take->problem())}));
  } else if (take->problem()) {
    tell(filled("A source was lost: %1", {reasonOf(take->problem())}));
  }
  const bool canStop = take->state() == TakeState::Recording || take->state() == TakeState::Paused;
  if (canStop && !take->hasNoPlaceAtServer() && take->nothingRecords()) {
    take->stop(episode_);
  }
  changed.notify();
}

void Studio::takeEnded() {
  if (take_->state() == TakeState::Failed) {
    tell(filled("The recording did not start: %1", {reasonOf(take_->problem())}));
  }
  if (take_->state() == TakeState::Stopped) {
    submit();
  } else {
    recovery_->close();
  }
  discardTake();
  restage();
}

void Studio::submit() {
  recovery_->noteEnd(*take_, episode_);
  const auto submissions = take_->submissions(episode_);
  if (const LMRErrorRef error = submissions_->add(submissions, *session_)) {
    tell(filled("The recording could not be submitted: %1", {reasonOf(error)}));
    recovery_->leave();
  } else if (const auto files = take_->files(); submissions.empty() && !files.empty()) {
    tell(filled("The recording was not submitted. It is in %1", {files.front()}));
    recovery_->leave();
  } else {
    recovery_->close();
  }
  submissions_->refreshTransfers();
}

void Studio::tell(const std::string& notice) {
  notice_ = notice;
  changed.notify();
}

void Studio::dismissNotice() {
  tell("");
}

} // namespace recorder
