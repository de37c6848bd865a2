#pragma once

#include <LumoraKit/platform/LMRError.h>
#include <LumoraKit/platform/MediaCapture.h>

#include <memory>

namespace lumora {

/// Sees every sample of a session and records nothing. It may outlive whoever made it, for as long as a device shows a
/// sample.
class SampleListener : public MovieFileOutputDelegate {
public:
  using Output = std::shared_ptr<MovieFileOutput>;
  using File = std::filesystem::path;

  /// Adds an output to the session whose delegate the listener is: `session->removeOutput()` ends it.
  /// \return null, with the error set, when the session takes no further output
  /// \param error may be null
  static Output join(CaptureSession& session, const std::shared_ptr<SampleListener>& listener, LMRErrorRef* error);

  void captureOutput_didStartRecordingToOutputFileAtURL_forConnections(const Output& output, const File& file,
                                                                       const Connections& connections) final;
  void captureOutput_didPauseRecordingToOutputFileAtURL_forConnections(const Output& output, const File& file,
                                                                       const Connections& connections) final;
  void captureOutput_didResumeRecordingToOutputFileAtURL_forConnections(const Output& output, const File& file,
                                                                        const Connections& connections) final;
  void captureOutput_willFinishRecordingToOutputFileAtURL_forConnections_dueToError(const Output& output,
                                                                                    const File& file,
                                                                                    const Connections& connections,
                                                                                    const LMRErrorRef& error) final;
  void captureOutput_didFinishRecordingToOutputFileAtURL_forConnections_dueToError(const Output& output,
                                                                                   const File& file,
                                                                                   const Connections& connections,
                                                                                   const LMRErrorRef& error) final;
};

} // namespace lumora
