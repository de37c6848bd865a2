#pragma once

#include <LumoraKit/recording/LMRSourceRecorder.h>

#include <string>
#include <vector>

/// A recorder that notes its requests.
class SampleRecorder : public LMRSourceRecorder {
public:
  std::string className() const override { return "SampleRecorder"; }
  void startWithDelay(double delay) override { requests.push_back("start " + std::to_string(delay)); }
  void pause() override { requests.emplace_back("pause"); }
  void resume() override { requests.emplace_back("resume"); }
  void stop() override { requests.emplace_back("stop"); }
  void cancel() override { requests.emplace_back("cancel"); }

  std::vector<std::string> requests;
};

/// A recorder that leaves out every request.
class IdleRecorder : public LMRSourceRecorder {
public:
  std::string className() const override { return "IdleRecorder"; }
};
