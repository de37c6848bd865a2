#pragma once

#include <LumoraKit/platform/LMRError.h>

#include <cstdint>
#include <filesystem>
#include <memory>
#include <optional>
#include <string>
#include <vector>

/// \file
/// Media capture as the recorders use it: devices, inputs with their connections, sessions, and the output that
/// writes a movie file. Everything is any-thread unless it says otherwise; objects are shared, and a session keeps
/// its inputs and outputs.

namespace lumora {

/// What a device or a connection delivers. A muxed device delivers sound and video in one stream; a connection is
/// never muxed.
enum class MediaType { Video, Sound, Muxed };

/// Ticks of the host clock: nanoseconds of CLOCK_MONOTONIC.
using HostTime = std::uint64_t;

/// Codes of the errors in LMRCaptureErrorDomain.
enum class CaptureErrorCode : std::int64_t {
  /// No device with that identifier is there (any more).
  DeviceMissing = 1,
  /// The device, or the system service that it is reached through, refused or failed.
  DeviceFailed = 2,
  /// The device did not open, or did not stop, within 5 seconds.
  DeviceTimedOut = 3,
  /// The device gave no sample for 2 seconds.
  DeviceSilent = 4,
  /// The system put another device in its place.
  DeviceReplaced = 5,
  /// The screen cannot be captured here.
  ScreenUnavailable = 6,
  /// A request that the object does not take in its state: an input that is in another session, a second addition.
  NotPossible = 7,
  /// No encoder for the wanted codec works on this machine.
  EncoderMissing = 8,
  /// Encoding or muxing failed.
  EncodingFailed = 9,
  /// The file cannot be made or written.
  FileNotWritable = 10,
  /// No space is left for the file; what was written stays playable.
  DiskFull = 11,
  /// The recording ended before a sample came.
  NothingRecorded = 12,
  /// The file could not be completed in time; what was written stays playable.
  FinishTimedOut = 13,
  /// The user did not allow the screen to be captured.
  ScreenRefused = 14,
  /// The desktop is asking the user for the screen. The question stays open, and the session can be started again:
  /// that waits for the same answer.
  ScreenNotAllowedYet = 15,
};

/// A camera, microphone or muxed device. Its identifier is the same after a restart of the device, the sound server
/// or the machine.
class LUMORA_EXPORT CaptureDevice {
public:
  virtual ~CaptureDevice();
  /// The identifier, by which deviceWithUniqueID() finds the device again.
  virtual std::string uniqueID() const = 0;
  /// For the user, in the user's language where the system knows it.
  virtual std::string localizedDisplayName() const = 0;
  /// Whether the device delivers that type.
  virtual bool hasMediaType(MediaType type) const = 0;
  /// Makes the device ready for an input. Blocks for 5 seconds at most; null on success.
  virtual LMRErrorRef open() = 0;
};

/// One stream of an input into a session.
class LUMORA_EXPORT CaptureConnection {
public:
  virtual ~CaptureConnection();
  /// Sound or video.
  virtual MediaType mediaType() const = 0;
  /// A disabled connection delivers no samples and has no track in a recording.
  virtual bool isEnabled() const = 0;
  virtual void setEnabled(bool enabled) = 0;
};

/// A source of a session.
class LUMORA_EXPORT CaptureInput {
public:
  virtual ~CaptureInput();
  /// The streams of the input, in an order that stays.
  virtual std::vector<std::shared_ptr<CaptureConnection>> connections() const = 0;
  /// The device behind a device input; null for the screen.
  virtual std::shared_ptr<CaptureDevice> device() const = 0;
};

/// How a connection's track is encoded; what is absent is chosen by the framework.
struct CompressionOptions {
  /// "h264", "mjpeg", "aac" or "pcm".
  std::optional<std::string> codec;
  /// Bits per second.
  std::optional<std::uint32_t> bitRate;
  /// Video only, the width in pixels: with a height, or neither.
  std::optional<std::uint32_t> width;
  /// Video only, the height in pixels: with a width, or neither.
  std::optional<std::uint32_t> height;
  /// The identifier of an encoder of the codec, see MediaCapture::encoders(). One that does not work here (any more) is
  /// logged, and the framework's choice takes its place: a recording never fails for it.
  std::optional<std::string> encoder = std::nullopt;

  friend bool operator==(const CompressionOptions&, const CompressionOptions&) = default;
};

/// An encoder of this machine, for a user to choose from.
struct MediaEncoder {
  /// For CompressionOptions::encoder; the same after a restart of the machine.
  std::string identifier;
  /// For the user: a proper name, the same in all languages.
  std::string name;
  /// Whether the graphics card or the processor has a unit for it.
  bool isHardware = false;

  friend bool operator==(const MediaEncoder&, const MediaEncoder&) = default;
};

/// How loud one channel of a sound buffer is; 1 is full scale.
struct SoundLevel {
  /// The largest magnitude.
  double peak = 0;
  /// The root of the mean square.
  double rms = 0;

  friend bool operator==(const SoundLevel&, const SoundLevel&) = default;
};

/// A picture as a screen shows it: rows of red, green and blue from the upper left corner, a byte each and without
/// gaps.
struct Picture {
  /// In pixels.
  std::uint32_t width = 0;
  /// In pixels.
  std::uint32_t height = 0;
  /// width * height * 3 bytes.
  std::vector<std::uint8_t> rgb;

  friend bool operator==(const Picture&, const Picture&) = default;
};

/// A captured sample buffer, valid during the callback that shows it.
class LUMORA_EXPORT SampleBuffer {
public:
  virtual ~SampleBuffer();
  /// When it was captured, on the host clock; nothing when the device did not say.
  virtual std::optional<HostTime> hostTime() const = 0;
  /// One a channel; none for a picture. Reads the whole buffer.
  virtual std::vector<SoundLevel> soundLevels() const;
  /// The picture, made smaller where it must be to fit into that size (in pixels), in its own proportions; nothing for
  /// sound, and without a definition of its own. Converts the whole picture: a millisecond or two.
  virtual std::optional<Picture> picture(std::uint32_t maximumWidth, std::uint32_t maximumHeight) const;
};

class MovieFileOutput;

/// Who is told by a movie-file output. Sample buffers arrive on the devices' threads, one thread a connection; the
/// other messages one at a time, in order, on a thread of the output. A delegate may call the output from inside any
/// message.
class LUMORA_EXPORT MovieFileOutputDelegate {
public:
  /// The connections that a message is about: those with a track in the file.
  using Connections = std::vector<std::shared_ptr<CaptureConnection>>;

  virtual ~MovieFileOutputDelegate();
  /// The file exists and its recording has begun.
  virtual void
  captureOutput_didStartRecordingToOutputFileAtURL_forConnections(const std::shared_ptr<MovieFileOutput>& output,
                                                                  const std::filesystem::path& file,
                                                                  const Connections& connections) = 0;
  /// The recording is paused: nothing is written until it is resumed.
  virtual void
  captureOutput_didPauseRecordingToOutputFileAtURL_forConnections(const std::shared_ptr<MovieFileOutput>& output,
                                                                  const std::filesystem::path& file,
                                                                  const Connections& connections) = 0;
  /// The recording goes on.
  virtual void
  captureOutput_didResumeRecordingToOutputFileAtURL_forConnections(const std::shared_ptr<MovieFileOutput>& output,
                                                                   const std::filesystem::path& file,
                                                                   const Connections& connections) = 0;
  /// The last sample is in the file, which is being completed. The error says why the recording ended by itself; null
  /// when it was asked to.
  virtual void captureOutput_willFinishRecordingToOutputFileAtURL_forConnections_dueToError(
      const std::shared_ptr<MovieFileOutput>& output, const std::filesystem::path& file, const Connections& connections,
      const LMRErrorRef& error) = 0;
  /// The file is complete, or writing it was given up; the output takes the next one. A recording that never began is
  /// told of here only, with the error.
  virtual void captureOutput_didFinishRecordingToOutputFileAtURL_forConnections_dueToError(
      const std::shared_ptr<MovieFileOutput>& output, const std::filesystem::path& file, const Connections& connections,
      const LMRErrorRef& error) = 0;
  /// For every sample of every connection, before the output itself uses it: a recording started, paused or resumed
  /// inside this call starts, pauses or resumes at exactly this sample.
  virtual void captureOutput_didOutputSampleBuffer_fromConnection(MovieFileOutput& output,
                                                                  const SampleBuffer& sampleBuffer,
                                                                  CaptureConnection& connection) = 0;
};

/// Writes one movie file at a time from a session's connections. Requests return at once; their outcome is a message
/// to the delegate. Any thread.
///
/// The end of a file that is to be finished is told within 15 seconds, whatever hangs: a device, an encoder or the
/// disk. A file that could not be completed by then has the error FinishTimedOut.
class LUMORA_EXPORT MovieFileOutput {
public:
  virtual ~MovieFileOutput();
  /// Not owned: a delegate that died is not told.
  virtual void setDelegate(const std::weak_ptr<MovieFileOutputDelegate>& delegate) = 0;
  /// The connections of the session that the output was added to.
  virtual std::vector<std::shared_ptr<CaptureConnection>> connections() const = 0;
  /// Takes effect with the next file.
  virtual void setCompressionOptions_forConnection(const CompressionOptions& options,
                                                   const std::shared_ptr<CaptureConnection>& connection) = 0;
  /// Begins to write that file, or, without one, finishes the current file. Asked for the file that it is writing or
  /// finishing, it goes on with that as if it had not been asked: nothing is written over a recording.
  virtual void recordToOutputFileURL(const std::optional<std::filesystem::path>& file) = 0;
  /// Pauses the recording: now, or at the sample whose message this is called in. Without a recording nothing happens.
  virtual void pauseRecording() = 0;
  /// Goes on with a paused recording: now, or at the sample whose message this is called in.
  virtual void resumeRecording() = 0;
  /// The same for a moment of the host clock that has just been, for use inside the message of the first sample
  /// after it: the file begins, is paused and goes on at the moment, not at the sample. Outputs that are asked for the
  /// same moments so keep the same time, however their devices' samples lie. Without a definition of its own an output
  /// takes them for the plain requests.
  virtual void recordToOutputFileURL_atHostTime(const std::filesystem::path& file, HostTime time);
  /// As recordToOutputFileURL_atHostTime(), for a pause.
  virtual void pauseRecordingAtHostTime(HostTime time);
  /// As recordToOutputFileURL_atHostTime(), for the end of a pause.
  virtual void resumeRecordingAtHostTime(HostTime time);
  /// The file being written; nothing when none is.
  virtual std::optional<std::filesystem::path> outputFileURL() const = 0;
  /// What a file will take, in bits a second, by the options and the pictures' size: an estimate. Before the session
  /// runs, the pictures are taken for 1280 x 720.
  virtual std::uint64_t expectedBitRate() const = 0;
};

/// Inputs and outputs that run together.
class LUMORA_EXPORT CaptureSession {
public:
  virtual ~CaptureSession();
  /// Adds an input of this capture system to a session that does not run; null on success.
  virtual LMRErrorRef addInput(const std::shared_ptr<CaptureInput>& input) = 0;
  /// Adds an output with the connections of all inputs; null on success. An output is in one session only, else the
  /// error is NotPossible.
  virtual LMRErrorRef addOutput(const std::shared_ptr<MovieFileOutput>& output) = 0;
  /// Takes an output out. The file that it writes is finished.
  virtual void removeOutput(const std::shared_ptr<MovieFileOutput>& output) = 0;
  /// The inputs in the order of their addition.
  virtual std::vector<std::shared_ptr<CaptureInput>> inputs() const = 0;
  /// The outputs in the order of their addition.
  virtual std::vector<std::shared_ptr<MovieFileOutput>> outputs() const = 0;

  /// Starts every device and waits for the first sample of each enabled connection. Blocks for 5 seconds at most.
  /// Null on success; a device that gives no sample in 2 seconds is an error.
  ///
  /// Where the desktop asks the user for the screen, the question is put here, and waited for for 3 seconds. Without
  /// an answer by then the error is ScreenNotAllowedYet, and the question stays until it is answered or stopRunning()
  /// takes it back. Start again, at any time, to go on waiting; once the user has allowed it the session starts.
  virtual LMRErrorRef startRunning() = 0;
  /// Stops the devices and takes back a question for the screen; a file being written is finished. Safe to call when
  /// not running. Returns once the devices have stopped; when called from inside a message to an output's delegate (a
  /// recorder may die there) it returns at once, and they stop afterwards.
  virtual void stopRunning() = 0;
  /// Whether startRunning() has succeeded and nobody has stopped the session since.
  virtual bool isRunning() const = 0;
};

/// The machine's capture system.
class LUMORA_EXPORT MediaCapture {
public:
  virtual ~MediaCapture();

  /// The device of that type that the system prefers; null when there is none.
  virtual std::shared_ptr<CaptureDevice> defaultInputDevice(MediaType type) = 0;
  /// All devices of that type, in an order of the system's.
  virtual std::vector<std::shared_ptr<CaptureDevice>> inputDevices(MediaType type) = 0;
  /// The device with that identifier; null when it is not there.
  virtual std::shared_ptr<CaptureDevice> deviceWithUniqueID(const std::string& uniqueID) = 0;

  /// An input with a connection for each stream of the device.
  virtual std::shared_ptr<CaptureInput> makeDeviceInput(const std::shared_ptr<CaptureDevice>& device) = 0;
  /// An input that captures the main screen: of the X server or, on a Wayland desktop, the one that the user chooses.
  /// The answer holds for the life of the application where the desktop can remember it.
  virtual std::shared_ptr<CaptureInput> makeScreenInput() = 0;
  /// A session without inputs and outputs, which does not run.
  virtual std::shared_ptr<CaptureSession> makeSession() = 0;
  /// An output that is in no session yet.
  virtual std::shared_ptr<MovieFileOutput> makeMovieFileOutput() = 0;

  /// The host clock now.
  virtual HostTime hostTime() const = 0;

  /// The encoders of a codec of CompressionOptions that work on this machine; the one that the framework chooses by
  /// itself is the first. They are tried out when asked for the first time, which blocks for 3 seconds each at most.
  /// Without a definition of its own a capture system names none.
  virtual std::vector<MediaEncoder> encoders(const std::string& codec);
};

} // namespace lumora
