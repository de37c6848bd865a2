#pragma once

#include "support/RecordingDelegate.h"
#include "support/Sessions.h"
#include "support/ToolArguments.h"

#include <LumoraKit/platform/PropertyList.h>
#include <LumoraKit/recording/LMRRemoteAudioRecorder.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

/// Cameras of a server that answers from a script.
class RemoteRecorderTest : public testing::Test {
protected:
  RemoteRecorderTest() { recorder_->setDelegate(delegate_); }

  template <class Recorder = LMRRemoteVideoRecorder> std::shared_ptr<Recorder> make() {
    auto recorder = Recorder::recorderWithRemoteRecorderName_session("Studio A", session_);
    recorder->setDelegate(delegate_);
    return recorder;
  }

  /// The property list that the tool received last.
  lumora::Array request() const {
    const auto requests = platform_.toolRunner->requests();
    return requests.empty() ? lumora::Array() : requests.back().elements;
  }

  /// What stands in a request of Alice's before the command's own elements, followed by these.
  static lumora::Array afterLogin(const lumora::Array& elements) {
    using lumora::tests::pair;
    lumora::Array all{pair("server", "lumora.example.org:8170"), pair("auth", "Password"), pair("user", "alice"),
                      pair("pass", "open sesame")};
    all.insert(all.end(), elements.begin(), elements.end());
    return all;
  }

  /// The file that the last request names as its metadata.
  std::string metadataFile() const {
    const auto requests = platform_.toolRunner->requests();
    return requests.empty() ? "" : requests.back().value("metadata").value_or("");
  }
  lumora::Dictionary sentMetadata() const {
    return lumora::dictionaryWithXMLDescription(platform_.files->content(metadataFile()).value_or("")).value();
  }

  lumora::fakes::FakePlatform platform_;
  std::shared_ptr<lumora::tests::RecordingDelegate> delegate_ = std::make_shared<lumora::tests::RecordingDelegate>();
  std::shared_ptr<LMRSession> session_ = lumora::tests::passwordSession();
  std::shared_ptr<LMRRemoteVideoRecorder> recorder_ =
      LMRRemoteVideoRecorder::recorderWithRemoteRecorderName_session("Studio A", session_);
};
