#include <LumoraKit/actions/LMRActionFactory.h>
#include <LumoraKit/platform/Application.h>
#include <LumoraKit/platform/Assert.h>
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/Queues.h>
#include <LumoraKit/recording/LMRLocalVideoRecorder.h>
#include <LumoraKit/recording/LMRMultipleSourceRecorder.h>
#include <LumoraKit/recording/LMRRemoteVideoRecorder.h>

#include <algorithm>
#include <iterator>
#include <numeric>

namespace {

constexpr std::string_view sourceRecordersKey = "sourceRecorders";
constexpr const char* queueLabel = "org.vantor.LumoraRecorder.recording";

void require(bool holds, std::string_view condition, std::string_view operation) {
  lumora::assertThat(holds, condition, operation, "LMRMultipleSourceRecorder");
}

std::vector<std::string> submissionUUIDs(const LMRAction& action) {
  const auto result = action.result();
  const lumora::Array* const listed = result ? result->array(LMRSubmissionUUIDSKey) : nullptr;
  std::vector<std::string> uuids;
  for (const auto& uuid : listed ? *listed : lumora::Array()) {
    if (const std::string* text = uuid.string()) {
      uuids.push_back(*text);
    }
  }
  return uuids;
}

std::string takeFirst(std::vector<std::string>& uuids) {
  auto first = std::move(uuids.front());
  uuids.erase(uuids.begin());
  return first;
}

} // namespace

std::shared_ptr<LMRMultipleSourceRecorder>
LMRMultipleSourceRecorder::recorderWithSourceRecorders(Recorders sourceRecorders) {
  auto recorder = std::make_shared<LMRMultipleSourceRecorder>(MadeByFactory(), std::move(sourceRecorders));
  recorder->commonInit();
  return recorder;
}

std::shared_ptr<LMRMultipleSourceRecorder>
LMRMultipleSourceRecorder::initWithCoder(const lumora::KeyedUnarchiver& coder) {
  Recorders sources;
  for (const auto& object : coder.decodeObjects(sourceRecordersKey)) {
    if (auto source = std::dynamic_pointer_cast<LMRSourceRecorder>(object)) {
      sources.push_back(std::move(source));
    }
  }
  return recorderWithSourceRecorders(std::move(sources));
}

LMRMultipleSourceRecorder::LMRMultipleSourceRecorder(MadeByFactory, Recorders sourceRecorders)
    : sourceRecorders_(std::move(sourceRecorders)) {}

LMRMultipleSourceRecorder::~LMRMultipleSourceRecorder() = default;

std::string LMRMultipleSourceRecorder::className() const {
  return "LMRMultipleSourceRecorder";
}

void LMRMultipleSourceRecorder::commonInit() {
  const auto self = std::static_pointer_cast<LMRMultipleSourceRecorder>(shared_from_this());
  const auto sources = sourceRecorders();
  for (const auto& source : sources) {
    source->setDelegate(self);
  }
  std::vector<std::size_t> order(sources.size());
  std::iota(order.begin(), order.end(), std::size_t{0});
  setSourceRecorderSubmissionOrder(std::move(order));
}

bool LMRMultipleSourceRecorder::isRemote() const {
  return true;
}

bool LMRMultipleSourceRecorder::isRecorderTester() {
  return lumora::Platform::current().application->identifier() == "org.vantor.lumora.recordertester";
}

bool LMRMultipleSourceRecorder::stateOf(const LMRSourceRecorder& source, std::string_view key) {
  using State = bool (LMRSourceRecorder::*)() const;
  static constexpr std::pair<std::string_view, State> states[] = {
      {"isRemote", &LMRSourceRecorder::isRemote},       {"isRecording", &LMRSourceRecorder::isRecording},
      {"isPaused", &LMRSourceRecorder::isPaused},       {"isStarting", &LMRSourceRecorder::isStarting},
      {"isCancelled", &LMRSourceRecorder::isCancelled},
  };
  const auto* const state = std::find_if(std::begin(states), std::end(states),
                                         [key](const auto& candidate) { return candidate.first == key; });
  require(state != std::end(states), "key is a state of a recorder", "sourceRecordersHaveValue:forKey:");
  return (source.*state->second)();
}

bool LMRMultipleSourceRecorder::sourceRecordersHaveValue_forKey(bool value, std::string_view key) const {
  const auto sources = sourceRecorders();
  return std::all_of(sources.begin(), sources.end(),
                     [&](const Recorder& source) { return stateOf(*source, key) == value; });
}

bool LMRMultipleSourceRecorder::isMixed() const {
  return !sourceRecordersHaveValue_forKey(false, "isRemote") && !sourceRecordersHaveValue_forKey(true, "isRemote");
}

void LMRMultipleSourceRecorder::bootstrap() {
  for (const auto& source : sourceRecorders()) {
    source->bootstrap();
  }
}

void LMRMultipleSourceRecorder::startWithDelay(double delay) {
  setIsStarting(true);
  ask([delay](LMRSourceRecorder& source) { source.startWithDelay(delay); });
}

void LMRMultipleSourceRecorder::pause() {
  ask([](LMRSourceRecorder& source) { source.pause(); });
}

void LMRMultipleSourceRecorder::resume() {
  ask([](LMRSourceRecorder& source) { source.resume(); });
}

void LMRMultipleSourceRecorder::cancel() {
  fanOut([](LMRSourceRecorder& source) { source.cancel(); });
}

// The local sources of a mix follow when the remote ones have reported: see localSourcesFollow().
void LMRMultipleSourceRecorder::ask(const Request& request) const {
  if (!isMixed()) {
    fanOut(request);
    return;
  }
  for (const auto& source : sourceRecorders()) {
    if (source->isRemote()) {
      request(*source);
    }
  }
}

// The queues are all there before the first request is made, so that the sources begin as close together as they can.
void LMRMultipleSourceRecorder::fanOut(const Request& request) const {
  const auto sources = sourceRecorders();
  std::vector<std::shared_ptr<lumora::WorkQueue>> queues;
  queues.reserve(sources.size());
  for (std::size_t i = 0; i < sources.size(); ++i) {
    queues.push_back(lumora::Platform::current().queues->makeSerialQueue(queueLabel));
  }
  for (std::size_t i = 0; i < sources.size(); ++i) {
    queues[i]->async([source = sources[i], request] { request(*source); });
  }
}

void LMRMultipleSourceRecorder::stop() {
  if (isRecorderTester()) {
    for (const auto& source : sourceRecorders()) {
      source->stop();
    }
    return;
  }
  require(workflowUUID().has_value(), "self.workflowUUID != nil", "stop");
  require(session() != nullptr, "self.session != nil", "stop");
  const auto action =
      LMRActionFactory::actionToCreateRecordingContainerForWorkflowUUID_session(workflowUUID(), session());
  action->runSynchronously();
  if (const auto error = action->error()) {
    failedToStopRecordingWithError(error);
    return;
  }
  stopSources(submissionUUIDs(*action));
}

void LMRMultipleSourceRecorder::stopSources(std::vector<std::string> submissionUUIDs) const {
  const auto sources = sourceRecorders();
  const auto order = sourceRecorderSubmissionOrder();
  require(sources.size() <= submissionUUIDs.size(), "[self.sourceRecorders count] <= [submissionUUIDs count]", "stop");
  require(sources.size() == order.size(), "[self.sourceRecorders count] == [self.sourceRecorderSubmissionOrder count]",
          "stop");
  for (const std::size_t index : order) {
    require(index < sources.size(), "index < [self.sourceRecorders count]", "stop");
    stopSource(sources[index], submissionUUIDs);
  }
}

void LMRMultipleSourceRecorder::stopSource(const Recorder& source, std::vector<std::string>& submissionUUIDs) const {
  const auto remote = std::dynamic_pointer_cast<LMRRemoteVideoRecorder>(source);
  const auto local = std::dynamic_pointer_cast<LMRLocalVideoRecorder>(source);
  if (remote) {
    remote->setMetadata(metadata());
    remote->setSubmissionUUID(takeFirst(submissionUUIDs));
  } else if (local) {
    local->setSubmissionUUID(takeFirst(submissionUUIDs));
  } else {
    lumora::log("(%@) Don't know how to stop/submit a %@!", {className(), source->className()});
    return;
  }
  lumora::Platform::current().queues->highPriorityQueue()->async([source] { source->stop(); });
}

// Deliberately without the base: a decoded recorder begins anew.
void LMRMultipleSourceRecorder::encodeWithCoder(lumora::KeyedArchiver& coder) const {
  std::vector<std::shared_ptr<const lumora::Archivable>> sources;
  for (const auto& source : sourceRecorders()) {
    if (auto archivable = std::dynamic_pointer_cast<const lumora::Archivable>(source)) {
      sources.push_back(std::move(archivable));
    }
  }
  coder.encodeObjects(sourceRecordersKey, sources);
}
