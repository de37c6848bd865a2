#pragma once

#include <LumoraKit/platform/LMRError.h>
#include <LumoraKit/platform/MediaCapture.h>

#include <memory>
#include <vector>

/// Listens to the sound of a capture session: how loud it is, and for how long there has been none. It hears what the
/// session captures, whether anything is recorded or not.
///
///     LMRErrorRef error;
///     auto meter = LMRLevelMeter::meterWithCaptureSession_error(session, &error);
///     ...                                                           // twenty times a second
///     for (const lumora::SoundLevel& level : meter->takeLevels()) { bar->set(LMRLevelMeter::decibels(level.peak)); }
///     warning->setVisible(meter->secondsOfSilence() > 10);
///
/// Any thread. Each buffer of sound is read once, on its device's thread: some microseconds of work.
class LUMORA_EXPORT LMRLevelMeter {
public:
  /// Below this root mean square, -60 dB of full scale, sound counts as silence.
  static constexpr double silence = 0.001;

  /// Joins the session with an output of its own, which records nothing, and leaves it when it dies.
  /// \return null, with the error set, when the session takes no further output
  static std::unique_ptr<LMRLevelMeter>
  meterWithCaptureSession_error(const std::shared_ptr<lumora::CaptureSession>& session, LMRErrorRef* error);

  LMRLevelMeter(const LMRLevelMeter&) = delete;
  LMRLevelMeter& operator=(const LMRLevelMeter&) = delete;
  ~LMRLevelMeter();

  /// The loudest since the last call, one entry a channel; none when no sound has come since.
  std::vector<lumora::SoundLevel> takeLevels();
  /// How long nothing louder than silence has come, in seconds: since the meter was made when nothing ever has.
  double secondsOfSilence() const;

  /// In decibels of full scale: 0 for 1, minus infinity for nothing.
  static double decibels(double level);

private:
  class Listener;

  LMRLevelMeter(std::shared_ptr<lumora::CaptureSession> session, std::shared_ptr<lumora::MovieFileOutput> output,
                std::shared_ptr<Listener> listener);

  const std::shared_ptr<lumora::CaptureSession> session_;
  const std::shared_ptr<lumora::MovieFileOutput> output_;
  const std::shared_ptr<Listener> listener_;
};
