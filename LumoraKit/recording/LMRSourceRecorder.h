#pragma once

#include <LumoraKit/platform/Clock.h>
#include <LumoraKit/platform/Property.h>
#include <LumoraKit/recording/LMRSourceRecorderDelegate.h>

#include <atomic>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <variant>
#include <vector>

/// Keys of the arguments of one delegate message.
inline constexpr std::string_view LMRDelegateSelector = "selector";
inline constexpr std::string_view LMRDelegateRecorder = "recorder";
inline constexpr std::string_view LMRDelegateError = "error";

/// The arguments of one delegate message, in order: the message's name, the recorder that reports and, for a failure
/// that carries one, the error.
using LMRDelegateArguments =
    std::vector<std::pair<std::string, std::variant<std::string, std::shared_ptr<LMRSourceRecorder>, LMRErrorRef>>>;

/// One source of a recording: its state, its elapsed time and the messages to its delegate. The base of every
/// recorder; it records nothing itself.
///
///     recorder->setDelegate(controller);
///     recorder->bootstrap();
///     recorder->start();
///     ...
///     recorder->stop();
///
/// A recorder is used for one recording and is always held by a std::shared_ptr. A request returns nothing; its
/// outcome is one of ten completion operations, which a subclass calls, and a message to the delegate.
class LUMORA_EXPORT LMRSourceRecorder : public std::enable_shared_from_this<LMRSourceRecorder> {
public:
  LMRSourceRecorder();
  LMRSourceRecorder(const LMRSourceRecorder&) = delete;
  LMRSourceRecorder& operator=(const LMRSourceRecorder&) = delete;
  virtual ~LMRSourceRecorder();

  /// The class's plain name, as the log shows it. Any thread.
  virtual std::string className() const;

  /// Whom to tell; not owned, null when there is none or it died. Any thread.
  std::shared_ptr<LMRSourceRecorderDelegate> delegate() const { return delegate_.get().lock(); }
  void setDelegate(const std::shared_ptr<LMRSourceRecorderDelegate>& delegate) { delegate_.set(delegate); }

  /// The state. Any thread.
  ///
  ///             Starting  Recording  Paused  Cancelled
  ///     Idle       -         -         -         -
  ///     Starting   x         -         -         -
  ///     Recording  -         x         -        any
  ///     Paused     -         -         x        any
  ///     Stopped    -         -         -         -
  ///     Cancelled  -         -         -         x
  bool isStarting() const { return isStarting_; }
  void setIsStarting(bool isStarting) { isStarting_ = isStarting; }
  /// Whether it records at this moment; false while it is paused.
  bool isRecording() const { return isRecording_; }
  void setIsRecording(bool isRecording) { isRecording_ = isRecording; }
  /// Whether a recording that has begun is paused.
  bool isPaused() const { return isPaused_; }
  void setIsPaused(bool isPaused) { isPaused_ = isPaused; }
  /// Never cleared again by the recorder itself.
  bool isCancelled() const { return isCancelled_; }
  void setIsCancelled(bool isCancelled) { isCancelled_ = isCancelled; }

  /// Whether the source is recorded on the server's side. False unless a subclass says otherwise.
  virtual bool isRemote() const;

  /// Seconds recorded so far, the open interval included, over the wall clock. Pauses do not count, nor does the time
  /// between a request and its outcome. Any thread.
  double elapsedRecordingTime() const;
  /// Sets the seconds of the closed intervals.
  void setElapsedRecordingTime(double seconds);
  /// When the open interval began; nothing when none is open. Any thread.
  std::optional<lumora::WallTime> mostRecentStartDate() const;

  /// Prepares the medium; nothing here.
  virtual void bootstrap();
  /// The same as startWithDelay(0.0).
  void start();
  /// Begins the recording after `delay` seconds; the outcome is didStartRecording() or its failure. This and the next
  /// four are for every subclass to override: on this class itself they are programming errors (asserted).
  virtual void startWithDelay(double delay);
  /// Pauses the recording; the outcome is didPauseRecording() or its failure.
  virtual void pause();
  /// Goes on with a paused recording; the outcome is didResumeRecording() or its failure.
  virtual void resume();
  /// Ends the recording and keeps it; the outcome is didStopRecording() or its failure.
  virtual void stop();
  /// Ends the recording and throws it away; the outcome is didCancelRecording() or its failure.
  virtual void cancel();

  /// The ten completion operations, for subclasses, when an outcome is known. Each writes a log line, sets the flags,
  /// updates the clock and tells the delegate, in any state. Any thread. Block until the delegate has handled the
  /// message on the main thread; inline when called there.
  void didStartRecording();
  /// As didStartRecording(), for a start that failed; the error may be null. The same holds for the failures below.
  void failedToStartRecordingWithError(const LMRErrorRef& error);
  /// As didStartRecording(), for a pause.
  void didPauseRecording();
  /// The pause failed; the flags stay as they were.
  void failedToPauseRecordingWithError(const LMRErrorRef& error);
  /// As didStartRecording(), for the end of a pause.
  void didResumeRecording();
  /// The end of the pause failed; the flags stay as they were.
  void failedToResumeRecordingWithError(const LMRErrorRef& error);
  /// As didStartRecording(), for the end of the recording. Leaves isStarting() as it was.
  void didStopRecording();
  /// The stop failed; the flags stay as they were.
  void failedToStopRecordingWithError(const LMRErrorRef& error);
  /// As didStartRecording(), for a recording that was thrown away.
  void didCancelRecording();
  /// The cancellation failed; the flags stay as they were.
  void failedToCancelRecordingWithError(const LMRErrorRef& error);

  /// Opens an interval now. One that was open is dropped without being counted. Any thread.
  void updateMostRecentStartDate();
  /// Closes the open interval and counts it; nothing happens when none is open. Any thread.
  void updateElapsedRecordingTime();

  /// Sends a message to the delegate that the recorder has now. Main thread only.
  void dispatchDelegateMethodWithArguments(const LMRDelegateArguments& arguments) const;

private:
  struct Clock {
    double elapsedRecordingTime = 0;
    std::optional<lumora::WallTime> mostRecentStartDate;
  };

  void notifyDelegate(std::string_view selector, const LMRErrorRef& error = nullptr);
  void request(std::string_view operation, std::string_view line) const;

  lumora::Property<std::weak_ptr<LMRSourceRecorderDelegate>> delegate_;
  std::atomic<bool> isStarting_ = false;
  std::atomic<bool> isRecording_ = false;
  std::atomic<bool> isPaused_ = false;
  std::atomic<bool> isCancelled_ = false;
  mutable std::mutex clockMutex_;
  Clock clock_;
};
