#include <LumoraKit/platform/linux/gstreamer/CaptureError.h>
#include <LumoraKit/platform/linux/gstreamer/Session.h>

#include <algorithm>

namespace lumora::backend {
namespace {

LMRErrorRef refuse(const char* why) {
  return captureError(CaptureErrorCode::NotPossible, why);
}

} // namespace

void OutputList::take(const CapturedSample& sample, const std::shared_ptr<Connection>& connection) {
  const auto outputs = outputs_.read();
  for (const auto& entry : *outputs) {
    if (const auto output = entry.lock()) {
      output->take(sample, connection);
    }
  }
}

void OutputList::deviceFailed(const std::shared_ptr<Connection>& connection, const LMRErrorRef& error) {
  const auto outputs = outputs_.read();
  for (const auto& entry : *outputs) {
    if (const auto output = entry.lock()) {
      output->deviceFailed(connection, error);
    }
  }
}

void OutputList::set(const std::vector<std::shared_ptr<FileOutput>>& outputs) {
  outputs_.replace({outputs.begin(), outputs.end()});
}

Session::~Session() {
  stopRunning();
}

LMRErrorRef Session::addInput(const std::shared_ptr<CaptureInput>& input) {
  const auto source = std::dynamic_pointer_cast<SourceInput>(input);
  if (!source) {
    return refuse("The input is not one of this capture system");
  }
  if (LMRErrorRef error = source->check()) {
    return error;
  }
  const std::lock_guard lock(mutex_);
  if (run_) {
    return refuse("An input cannot be added while the session runs");
  }
  if (std::ranges::count(inputs_, source) != 0) {
    return refuse("The input is already in the session");
  }
  inputs_.push_back(source);
  for (const auto& output : outputs_) {
    output->attach(connections());
  }
  return nullptr;
}

LMRErrorRef Session::addOutput(const std::shared_ptr<MovieFileOutput>& output) {
  const auto file = std::dynamic_pointer_cast<FileOutput>(output);
  if (!file) {
    return refuse("The output is not one of this capture system");
  }
  const std::lock_guard lock(mutex_);
  if (!file->join()) {
    return refuse("The output is already in a session");
  }
  file->attach(connections());
  outputs_.push_back(file);
  outputList_->set(outputs_);
  return nullptr;
}

void Session::removeOutput(const std::shared_ptr<MovieFileOutput>& output) {
  const std::lock_guard lock(mutex_);
  const auto found = std::ranges::find(outputs_, output);
  if (found == outputs_.end()) {
    return;
  }
  const std::shared_ptr<FileOutput> file = *found;
  outputs_.erase(found);
  outputList_->set(outputs_);
  file->leave();
}

std::vector<std::shared_ptr<CaptureInput>> Session::inputs() const {
  const std::lock_guard lock(mutex_);
  return {inputs_.begin(), inputs_.end()};
}

std::vector<std::shared_ptr<MovieFileOutput>> Session::outputs() const {
  const std::lock_guard lock(mutex_);
  return {outputs_.begin(), outputs_.end()};
}

std::vector<std::shared_ptr<Connection>> Session::connections() const {
  std::vector<std::shared_ptr<Connection>> result;
  for (const auto& input : inputs_) {
    result.push_back(input->connection());
  }
  return result;
}

LMRErrorRef Session::startRunning() {
  const std::shared_ptr<SessionRun> run = makeRun();
  if (!run) {
    return nullptr;
  }
  LMRErrorRef error = run->start();
  if (error) {
    const std::lock_guard lock(mutex_);
    if (run_ == run) {
      run_.reset();
    }
  }
  return error;
}

std::shared_ptr<SessionRun> Session::makeRun() {
  const std::lock_guard lock(mutex_);
  if (run_) {
    return nullptr;
  }
  std::vector<std::shared_ptr<SourceInput>> enabled;
  for (const auto& input : inputs_) {
    if (input->connection()->isEnabled()) {
      input->connection()->setFailure(nullptr);
      enabled.push_back(input);
    }
  }
  run_ = std::make_shared<SessionRun>(enabled, outputList_, queues_);
  return run_;
}

void Session::stopRunning() {
  std::shared_ptr<SessionRun> run;
  {
    const std::lock_guard lock(mutex_);
    run = std::move(run_);
    for (const auto& output : outputs_) {
      output->recordToOutputFileURL(std::nullopt);
    }
    for (const auto& input : inputs_) {
      input->withdraw();
    }
  }
  if (run) {
    run->stop();
  }
}

bool Session::isRunning() const {
  const std::lock_guard lock(mutex_);
  return run_ && run_->isStarted();
}

} // namespace lumora::backend
