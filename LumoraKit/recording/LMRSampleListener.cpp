#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/recording/LMRSampleListener.h>

#include <utility>

namespace lumora {

SampleListener::Output SampleListener::join(CaptureSession& session, const std::shared_ptr<SampleListener>& listener,
                                            LMRErrorRef* error) {
  auto output = Platform::current().mediaCapture->makeMovieFileOutput();
  output->setDelegate(listener);
  if (LMRErrorRef refusal = session.addOutput(output)) {
    if (error) {
      *error = std::move(refusal);
    }
    return nullptr;
  }
  return output;
}

// No file is ever asked for, so these never come.

void SampleListener::captureOutput_didStartRecordingToOutputFileAtURL_forConnections(const Output&, const File&,
                                                                                     const Connections&) {}

void SampleListener::captureOutput_didPauseRecordingToOutputFileAtURL_forConnections(const Output&, const File&,
                                                                                     const Connections&) {}

void SampleListener::captureOutput_didResumeRecordingToOutputFileAtURL_forConnections(const Output&, const File&,
                                                                                      const Connections&) {}

void SampleListener::captureOutput_willFinishRecordingToOutputFileAtURL_forConnections_dueToError(const Output&,
                                                                                                  const File&,
                                                                                                  const Connections&,
                                                                                                  const LMRErrorRef&) {}

void SampleListener::captureOutput_didFinishRecordingToOutputFileAtURL_forConnections_dueToError(const Output&,
                                                                                                 const File&,
                                                                                                 const Connections&,
                                                                                                 const LMRErrorRef&) {}

} // namespace lumora
