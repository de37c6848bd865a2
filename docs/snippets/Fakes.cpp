// The examples about the fakes.

#include <LumoraKit/LumoraKit.h>
#include <LumoraKit/testing/FakePlatform.h>
#include <LumoraKit/testing/FakeRecorders.h>
#include <LumoraKit/testing/ManualQueues.h>

#include <chrono>
#include <memory>

namespace snippets {

using lumora::MediaType;
using lumora::fakes::CredentialOperation;
using lumora::fakes::FakeMediaCapture;
using lumora::fakes::HelperAgentReply;
using lumora::fakes::ToolReply;

void login() {
  lumora::fakes::FakePlatform platform;
  const auto sheet = std::make_shared<LMRServerLoginSheetController>();
  platform.userInterface->panel()->typeServer("studio.example.org");
  platform.userInterface->window()->clickDefaultButton();
}

void credentials() {
  lumora::fakes::FakePlatform platform;
  platform.credentialStore->put("Lumora: lumora.example.org", "ada", "apple");
  platform.credentialStore->fail(CredentialOperation::Find, lumora::CredentialError::Locked);
}

void credentialsOnce(lumora::fakes::FakePlatform& platform) {
  platform.credentialStore->put("Lumora: studio.example.org", "ada", "apple");
  platform.credentialStore->failOnce(CredentialOperation::Add, lumora::CredentialError::Locked);
}

void devices(const std::shared_ptr<LMRLocalVideoRecorder>& recorder,
             const std::shared_ptr<lumora::fakes::FakeMovieFileOutput>& output) {
  lumora::fakes::FakePlatform platform;
  platform.mediaCapture->addDevice("camera", {lumora::MediaType::Video});
  // A session and a recorder are made.
  recorder->start();
  output->emitSample(lumora::MediaType::Video, platform.mediaCapture->advanceHostTime(1));
  output->deliverOutcomes();
}

void captureAlone() {
  auto capture = std::make_shared<FakeMediaCapture>();
  capture->addDevice("camera", {MediaType::Video});
  capture->addDevice("microphone", {MediaType::Sound});
}

void outcomes(const std::shared_ptr<lumora::CaptureSession>& session,
              const std::shared_ptr<LMRLocalVideoRecorder>& recorder,
              const std::shared_ptr<lumora::fakes::FakeMovieFileOutput>& output,
              const std::shared_ptr<FakeMediaCapture>& capture) {
  session->startRunning();
  recorder->start();
  output->emitSample(MediaType::Video, capture->advanceHostTime(1)); // the recorder asks for the file
  output->deliverOutcomes();                                         // ... and learns that it was started
}

void recorders() {
  auto camera = lumora::fakes::FakeLocalRecorder::make();
  auto recorder = LMRMultipleSourceRecorder::recorderWithSourceRecorders({camera});
  recorder->start();
  // The source was asked on a queue of its own.
  camera->didStartRecording();
}

void queues(const std::shared_ptr<LMRSourceRecorder>& recorder) {
  const auto queues = std::make_shared<lumora::fakes::ManualQueues>();
  auto platform = lumora::Platform::current();
  platform.queues = queues;
  platform.mainThread = queues->mainThread();
  lumora::Platform::install(platform);
  recorder->startWithDelay(5);
  queues->advance(std::chrono::seconds(5));
}

void tools() {
  auto runner = std::make_shared<lumora::fakes::FakeToolRunner>();
  runner->reply("listinfo", ToolReply::success({{"server", "lumora.example.org"}}));
  runner->replyOnce("submit", ToolReply::failure(26));
}

void wholePlatform() {
  lumora::fakes::FakePlatform platform;
  platform.toolRunner->reply("listinfo", ToolReply::failure(26));
}

void agents(lumora::fakes::FakePlatform& platform) {
  platform.helperAgent->reply("bind", HelperAgentReply::failure(35));
  platform.helperAgent->replyOnce("bind", HelperAgentReply::noReply(lumora::HelperAgentError::AgentEnded));
}

} // namespace snippets
