#pragma once

#include <LumoraKit/recording/LMRLocalVideoRecorder.h>
#include <LumoraKit/recording/LMRRemoteVideoRecorder.h>

#include <functional>
#include <memory>
#include <mutex>
#include <string>
#include <utility>
#include <vector>

namespace lumora::fakes {

/// What a fake recorder was asked, and how it answers. Any thread.
class LUMORA_EXPORT RecorderRequests {
public:
  /// Called with each request after it was noted, without a lock, on the thread of the request.
  using Answer = std::function<void(LMRSourceRecorder& recorder, const std::string& request)>;

  RecorderRequests();
  RecorderRequests(const RecorderRequests&) = delete;
  RecorderRequests& operator=(const RecorderRequests&) = delete;
  virtual ~RecorderRequests();

  /// The requests so far, in their order: "bootstrap", "start 2.5" (with the delay), "pause", "resume", "stop",
  /// "cancel".
  std::vector<std::string> requests() const;
  /// Empties the list of requests.
  void forgetRequests();

  /// Null, as in the beginning: the test reports the outcome itself (recorder->didStartRecording()).
  void setAnswer(Answer answer);
  /// An answer: reports the success of the request, inside of it.
  static void succeed(LMRSourceRecorder& recorder, const std::string& request);

protected:
  /// Notes a request, and answers it when requests are answered.
  void take(LMRSourceRecorder& recorder, const std::string& request);
  /// Notes a start with its delay, and answers it when requests are answered.
  void takeStart(LMRSourceRecorder& recorder, double delay);

private:
  mutable std::mutex mutex_;
  std::vector<std::string> requests_;
  Answer answer_;
};

/// A recorder of the kind `Base` that records nothing: it notes its requests, is "starting" after a start, and reports
/// what the test makes it report. For what drives recorders:
///
///     auto camera = lumora::fakes::FakeLocalRecorder::make();
///     auto recorder = LMRMultipleSourceRecorder::recorderWithSourceRecorders({camera});
///     recorder->start();
///     ...
///     camera->didStartRecording();
template <class Base> class FakeRecorder : public Base, public RecorderRequests {
public:
  using Base::Base;

  /// Notes the request "bootstrap". Nothing else happens, here and below, unless requests are answered.
  void bootstrap() override { take(*this, "bootstrap"); }
  /// Notes the request "start" with its delay in seconds.
  void startWithDelay(double delay) override { takeStart(*this, delay); }
  /// Notes the request "pause".
  void pause() override { take(*this, "pause"); }
  /// Notes the request "resume".
  void resume() override { take(*this, "resume"); }
  /// Notes the request "stop".
  void stop() override { take(*this, "stop"); }
  /// Notes the request "cancel".
  void cancel() override { take(*this, "cancel"); }
};

/// A camera of this machine, without a session or an output.
class LUMORA_EXPORT FakeLocalRecorder : public FakeRecorder<LMRLocalVideoRecorder> {
public:
  /// An idle recorder.
  static std::shared_ptr<FakeLocalRecorder> make() { return std::make_shared<FakeLocalRecorder>(MadeByFactory()); }

  using FakeRecorder::FakeRecorder;
  ~FakeLocalRecorder() override;
};

/// A camera of the server, without a session.
class LUMORA_EXPORT FakeRemoteRecorder : public FakeRecorder<LMRRemoteVideoRecorder> {
public:
  /// An idle recorder of the camera with that name.
  static std::shared_ptr<FakeRemoteRecorder> make(std::string remoteRecorderName) {
    return std::make_shared<FakeRemoteRecorder>(std::move(remoteRecorderName), nullptr);
  }

  using FakeRecorder::FakeRecorder;
  ~FakeRemoteRecorder() override;
};

/// A recorder of a kind that the framework does not know, local or remote.
class LUMORA_EXPORT FakeUnknownRecorder : public FakeRecorder<LMRSourceRecorder> {
public:
  /// An idle recorder that says of itself whether it is remote.
  static std::shared_ptr<FakeUnknownRecorder> make(bool isRemote = false) {
    return std::make_shared<FakeUnknownRecorder>(isRemote);
  }

  /// The same as a constructor, for std::make_shared.
  explicit FakeUnknownRecorder(bool isRemote) : isRemote_(isRemote) {}
  ~FakeUnknownRecorder() override;

  std::string className() const override;
  bool isRemote() const override { return isRemote_; }

private:
  const bool isRemote_;
};

} // namespace lumora::fakes
