#include "Sources.h"

#include "support/Sessions.h"

#include <LumoraKit/platform/Queues.h>
#include <LumoraKit/testing/FakeRecorders.h>

namespace {

std::shared_ptr<LMRSourceRecorder> makeLocal(const OpenRequests& open) {
  const auto local = lumora::fakes::FakeLocalRecorder::make();
  local->setAnswer([open](LMRSourceRecorder& recorder, const std::string& request) {
    ++*open;
    lumora::Platform::current().queues->concurrentQueue()->async([open, source = recorder.shared_from_this(), request] {
      lumora::fakes::RecorderRequests::succeed(*source, request);
      --*open;
    });
  });
  return local;
}

// The framework's own, with its requests counted.
class RemoteRecorder : public LMRRemoteVideoRecorder {
public:
  RemoteRecorder(const std::string& name, OpenRequests open)
      : LMRRemoteVideoRecorder(name, lumora::tests::passwordSession()), open_(std::move(open)) {}

  void startWithDelay(double delay) override {
    counted([&] { LMRRemoteVideoRecorder::startWithDelay(delay); });
  }
  void pause() override {
    counted([this] { LMRRemoteVideoRecorder::pause(); });
  }
  void resume() override {
    counted([this] { LMRRemoteVideoRecorder::resume(); });
  }
  void stop() override {
    counted([this] { LMRRemoteVideoRecorder::stop(); });
  }
  void cancel() override {
    counted([this] { LMRRemoteVideoRecorder::cancel(); });
  }

private:
  template <class Request> void counted(const Request& request) {
    ++*open_;
    request();
    --*open_;
  }

  const OpenRequests open_;
};

} // namespace

std::shared_ptr<LMRMultipleSourceRecorder> makeRecorder(const Cast& cast, const OpenRequests& open) {
  LMRMultipleSourceRecorder::Recorders sources;
  for (int i = 0; i < cast.locals; ++i) {
    sources.push_back(makeLocal(open));
  }
  for (int i = 0; i < cast.remotes; ++i) {
    sources.push_back(std::make_shared<RemoteRecorder>("Camera " + std::to_string(i), open));
  }
  auto recorder = LMRMultipleSourceRecorder::recorderWithSourceRecorders(std::move(sources));
  recorder->setWorkflowUUID("WORKFLOW");
  recorder->setSession(lumora::tests::passwordSession());
  return recorder;
}

void prepareServer(lumora::fakes::FakePlatform& platform, const Cast& cast) {
  lumora::Array uuids;
  for (int i = 0; i < cast.size(); ++i) {
    uuids.emplace_back("UUID " + std::to_string(i));
  }
  platform.toolRunner->reply("create_recording",
                             lumora::fakes::ToolReply::success({{"submission_uuids", std::move(uuids)}}));
}
