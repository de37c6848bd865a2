#pragma once

#include "Model.h"
#include "support/RecordingDelegate.h"

#include <LumoraKit/platform/Log.h>
#include <LumoraKit/recording/LMRMultipleSourceRecorder.h>
#include <LumoraKit/testing/FakePlatform.h>
#include <LumoraKit/testing/FakeRecorders.h>
#include <LumoraKit/testing/ManualQueues.h>

#include <memory>
#include <string>
#include <vector>

namespace model {

/// The platform that real recorders of a test run on, with a log that keeps the combined recorder's own lines.
class RealPlatform {
public:
  explicit RealPlatform(bool isTester);

  std::shared_ptr<lumora::fakes::ManualQueues> queues() const { return queues_; }
  lumora::fakes::FakeToolRunner& toolRunner() const { return *platform_.toolRunner; }
  /// Where the log's lines go from now on.
  void traceInto(std::vector<std::string>* trace) const { log_->trace = trace; }

private:
  class OwnLinesLog : public lumora::Log {
  public:
    void write(std::string_view line) override;
    std::vector<std::string>* trace = nullptr;
  };

  lumora::fakes::FakePlatform platform_;
  std::shared_ptr<lumora::fakes::ManualQueues> queues_ = std::make_shared<lumora::fakes::ManualQueues>();
  std::shared_ptr<OwnLinesLog> log_ = std::make_shared<OwnLinesLog>();
};

/// The recorder itself with fake sources, driven by the model's events and traced in the model's words.
class RealRecorder {
public:
  RealRecorder(const RealPlatform& platform, const Mix& mix);
  RealRecorder(const RealRecorder&) = delete;
  RealRecorder& operator=(const RealRecorder&) = delete;
  ~RealRecorder();

  State state() const;
  /// Puts all flags and delegates where the state has them.
  void setState(const State& state);
  std::vector<std::string> apply(const Event& event);

private:
  std::shared_ptr<LMRSourceRecorder> makeSource(Kind kind, std::size_t index);
  template <class Source> std::shared_ptr<LMRSourceRecorder> traced(std::shared_ptr<Source> source, std::size_t index);
  void listenToDelegate();
  void request(Verb verb);
  void report(const Event& event);
  void reportFailure(const Event& event);

  const RealPlatform& platform_;
  std::vector<std::string> trace_;
  std::vector<std::shared_ptr<LMRSourceRecorder>> sources_;
  std::vector<lumora::fakes::RecorderRequests*> requestsOfSources_;
  std::vector<LMRErrorRef> errors_;
  std::shared_ptr<LMRMultipleSourceRecorder> recorder_;
  std::shared_ptr<lumora::tests::RecordingDelegate> delegate_;
};

} // namespace model
