#pragma once

#include <LumoraKit/LumoraKit.h>

#include <memory>
#include <string>

/// A recording application without its window: what its buttons do, and the line of text that it shows. It records a
/// lecture from the default camera and microphone and submits it. Main thread only.
class LectureRecorder : public LMRDelegateImplementation<LectureRecorder>,
                        public std::enable_shared_from_this<LectureRecorder> {
public:
  void logIn(const std::string& server, const std::string& user, const std::string& password);
  void record();
  void stopAndSubmit();

  const std::string& status() const { return status_; }

  void recorderDidStartRecording(const Recorder& recorder) override;
  void recorderDidStopRecording(const Recorder& recorder) override;
  void recorderFailedToStopRecording_error(const Recorder& recorder, const LMRErrorRef& error) override;

private:
  void loggedIn(const std::shared_ptr<LMRAuthenticationAction>& action);
  void submitted(const std::shared_ptr<LMRAction>& action);
  void failed(const KTActionRef& action);
  void run(const KTActionRef& action);

  std::shared_ptr<LMRSession> session_;
  std::shared_ptr<LMRLocalVideoRecorder> recorder_;
  std::string status_ = "Not logged in";
};
