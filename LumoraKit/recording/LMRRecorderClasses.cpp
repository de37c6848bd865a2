#include <LumoraKit/recording/LMRLocalAudioRecorder.h>
#include <LumoraKit/recording/LMRLocalScreenRecorder.h>
#include <LumoraKit/recording/LMRLocalVideoRecorder.h>
#include <LumoraKit/recording/LMRRecorderClasses.h>

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
  };
}
