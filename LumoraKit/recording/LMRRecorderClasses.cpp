#include <LumoraKit/recording/LMRLocalAudioRecorder.h>
#include <LumoraKit/recording/LMRLocalScreenRecorder.h>
#include <LumoraKit/recording/LMRLocalVideoRecorder.h>
#include <LumoraKit/recording/LMRMultipleSourceRecorder.h>
#include <LumoraKit/recording/LMRRecorderClasses.h>
#include <LumoraKit/recording/LMRRemoteAudioRecorder.h>
#include <LumoraKit/recording/LMRRemoteVideoRecorder.h>

#include <utility>

namespace {

template <class Recorder> std::pair<const std::string, lumora::KeyedUnarchiver::Factory> entry(std::string className) {
  return {std::move(className), [](const auto& coder) { return Recorder::initWithCoder(coder); }};
}

} // namespace

lumora::KeyedUnarchiver::ClassTable LMRRecorderClasses() {
  return {
      entry<LMRLocalVideoRecorder>("LMRLocalVideoRecorder"),
      entry<LMRLocalAudioRecorder>("LMRLocalAudioRecorder"),
      entry<LMRLocalScreenRecorder>("LMRLocalScreenRecorder"),
      entry<LMRRemoteVideoRecorder>("LMRRemoteVideoRecorder"),
      entry<LMRRemoteAudioRecorder>("LMRRemoteAudioRecorder"),
      entry<LMRMultipleSourceRecorder>("LMRMultipleSourceRecorder"),
  };
}
