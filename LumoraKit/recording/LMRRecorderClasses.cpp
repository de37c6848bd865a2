#include <LumoraKit/recording/LMRLocalVideoRecorder.h>
#include <LumoraKit/recording/LMRRecorderClasses.h>

lumora::KeyedUnarchiver::ClassTable LMRRecorderClasses() {
  return {
      {"LMRLocalVideoRecorder", [](const auto& coder) { return LMRLocalVideoRecorder::initWithCoder(coder); }},
  };
}
