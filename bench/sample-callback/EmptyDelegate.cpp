#include "EmptyDelegate.h"

namespace {

class EmptyDelegate final : public lumora::MovieFileOutputDelegate {
public:
  using Output = std::shared_ptr<lumora::MovieFileOutput>;
  using File = std::filesystem::path;

  void captureOutput_didStartRecordingToOutputFileAtURL_forConnections(const Output&, const File&,
                                                                       const Connections&) override {}
  void captureOutput_didPauseRecordingToOutputFileAtURL_forConnections(const Output&, const File&,
                                                                       const Connections&) override {}
  void captureOutput_didResumeRecordingToOutputFileAtURL_forConnections(const Output&, const File&,
                                                                        const Connections&) override {}
  void captureOutput_willFinishRecordingToOutputFileAtURL_forConnections_dueToError(const Output&, const File&,
                                                                                    const Connections&,
                                                                                    const LMRErrorRef&) override {}
  void captureOutput_didFinishRecordingToOutputFileAtURL_forConnections_dueToError(const Output&, const File&,
                                                                                   const Connections&,
                                                                                   const LMRErrorRef&) override {}
  void captureOutput_didOutputSampleBuffer_fromConnection(lumora::MovieFileOutput&, const lumora::SampleBuffer&,
                                                          lumora::CaptureConnection&) override {}
};

} // namespace

std::shared_ptr<lumora::MovieFileOutputDelegate> makeEmptyDelegate() {
  return std::make_shared<EmptyDelegate>();
}
