#pragma once

#include "support/RecordingDelegate.h"
#include "support/Sessions.h"

#include <LumoraKit/recording/LMRMultipleSourceRecorder.h>
#include <LumoraKit/testing/FakePlatform.h>
#include <LumoraKit/testing/FakeRecorders.h>
#include <LumoraKit/testing/ManualQueues.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

/// Several fake sources, and queues that run when the test says so.
class MultipleRecorderTest : public testing::Test {
protected:
  using LocalRecorder = lumora::fakes::FakeLocalRecorder;
  using RemoteRecorder = lumora::fakes::FakeRemoteRecorder;
  using UnknownRecorder = lumora::fakes::FakeUnknownRecorder;

  MultipleRecorderTest() {
    auto platform = lumora::Platform::current();
    platform.queues = queues_;
    platform.mainThread = queues_->mainThread();
    lumora::Platform::install(platform);
  }

  std::shared_ptr<LMRMultipleSourceRecorder> recorderOf(LMRMultipleSourceRecorder::Recorders sources) {
    auto recorder = LMRMultipleSourceRecorder::recorderWithSourceRecorders(std::move(sources));
    recorder->setDelegate(delegate_);
    recorder->setWorkflowUUID("WORKFLOW");
    recorder->setSession(lumora::tests::passwordSession());
    return recorder;
  }

  /// The server lists these submission UUIDs for every container.
  void listUUIDs(lumora::Array uuids) {
    platform_.toolRunner->reply(
        "create_recording",
        lumora::fakes::ToolReply::success({{"recording_uuid", "CONTAINER"}, {"submission_uuids", std::move(uuids)}}));
  }

  std::vector<std::string> told() const { return delegate_->selectors(); }

  lumora::fakes::FakePlatform platform_;
  std::shared_ptr<lumora::fakes::ManualQueues> queues_ = std::make_shared<lumora::fakes::ManualQueues>();
  std::shared_ptr<lumora::tests::RecordingDelegate> delegate_ = std::make_shared<lumora::tests::RecordingDelegate>();
};
