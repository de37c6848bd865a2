#pragma once

#include <LumoraKit/platform/LMRError.h>

#include <memory>
#include <string_view>
#include <type_traits>

class LMRSourceRecorder;

/// The names of the ten messages to a recorder's delegate, for respondsToSelector().
namespace LMRDelegateMessage {
/// @{
/// The name of the message of LMRSourceRecorderDelegate.
inline constexpr std::string_view recorderDidStartRecording = "recorderDidStartRecording:";
inline constexpr std::string_view recorderFailedToStartRecording_error = "recorderFailedToStartRecording:error:";
inline constexpr std::string_view recorderDidPauseRecording = "recorderDidPauseRecording:";
inline constexpr std::string_view recorderFailedToPauseRecording_error = "recorderFailedToPauseRecording:error:";
inline constexpr std::string_view recorderDidResumeRecording = "recorderDidResumeRecording:";
inline constexpr std::string_view recorderFailedToResumeRecording_error = "recorderFailedToResumeRecording:error:";
inline constexpr std::string_view recorderDidStopRecording = "recorderDidStopRecording:";
inline constexpr std::string_view recorderFailedToStopRecording_error = "recorderFailedToStopRecording:error:";
inline constexpr std::string_view recorderDidCancelRecording = "recorderDidCancelRecording:";
inline constexpr std::string_view recorderFailedToCancelRecording_error = "recorderFailedToCancelRecording:error:";
/// @}
} // namespace LMRDelegateMessage

/// Who is told of a recorder's outcomes, always on the main thread and one message at a time, while the thread that
/// reports waits: a delegate must not wait for that thread. The error of a failure may be null.
///
/// The protocol is informal: a delegate implements any of the ten messages, and is not sent the others. Derive from
/// LMRDelegateImplementation, which finds out which ones those are:
///
///     class Controller : public LMRDelegateImplementation<Controller> {
///     public:
///       void recorderDidStopRecording(const Recorder& recorder) override;
///     };
class LUMORA_EXPORT LMRSourceRecorderDelegate {
public:
  /// The recorder that a message is about.
  using Recorder = std::shared_ptr<LMRSourceRecorder>;

  virtual ~LMRSourceRecorderDelegate();

  /// Whether the message of that name ("recorderDidStopRecording:") is implemented. Any thread.
  virtual bool respondsToSelector(std::string_view selector) const = 0;

  /// The recording has begun.
  virtual void recorderDidStartRecording(const Recorder& recorder);
  /// It has not begun. The error, here and below, may be null.
  virtual void recorderFailedToStartRecording_error(const Recorder& recorder, const LMRErrorRef& error);
  /// The recording is paused.
  virtual void recorderDidPauseRecording(const Recorder& recorder);
  /// The recording could not be paused.
  virtual void recorderFailedToPauseRecording_error(const Recorder& recorder, const LMRErrorRef& error);
  /// The recording goes on after a pause.
  virtual void recorderDidResumeRecording(const Recorder& recorder);
  /// The recording could not go on.
  virtual void recorderFailedToResumeRecording_error(const Recorder& recorder, const LMRErrorRef& error);
  /// The recording has ended, and what was recorded is complete.
  virtual void recorderDidStopRecording(const Recorder& recorder);
  /// The recording could not be ended, or it ended with an error: a lost device, a full disk. What was written stays.
  virtual void recorderFailedToStopRecording_error(const Recorder& recorder, const LMRErrorRef& error);
  /// The recording has ended, and nothing of it is kept.
  virtual void recorderDidCancelRecording(const Recorder& recorder);
  /// The recording could not be thrown away.
  virtual void recorderFailedToCancelRecording_error(const Recorder& recorder, const LMRErrorRef& error);
};

namespace lumora::detail {

// &Class::message has the type of the class that declares it last: the delegate's base when nobody overrode it.
template <class MessageOfDelegate, class MessageOfBase>
inline constexpr bool isImplemented = !std::is_same_v<MessageOfDelegate, MessageOfBase>;

template <class Delegate> constexpr bool delegateImplements(std::string_view selector) {
  using Base = LMRSourceRecorderDelegate;
  struct Message {
    std::string_view selector;
    bool isSent = false;
  };
  constexpr Message messages[] = {
      {LMRDelegateMessage::recorderDidStartRecording,
       isImplemented<decltype(&Delegate::recorderDidStartRecording), decltype(&Base::recorderDidStartRecording)>},
      {LMRDelegateMessage::recorderFailedToStartRecording_error,
       isImplemented<decltype(&Delegate::recorderFailedToStartRecording_error),
                     decltype(&Base::recorderFailedToStartRecording_error)>},
      {LMRDelegateMessage::recorderDidPauseRecording,
       isImplemented<decltype(&Delegate::recorderDidPauseRecording), decltype(&Base::recorderDidPauseRecording)>},
      {LMRDelegateMessage::recorderFailedToPauseRecording_error,
       isImplemented<decltype(&Delegate::recorderFailedToPauseRecording_error),
                     decltype(&Base::recorderFailedToPauseRecording_error)>},
      {LMRDelegateMessage::recorderDidResumeRecording,
       isImplemented<decltype(&Delegate::recorderDidResumeRecording), decltype(&Base::recorderDidResumeRecording)>},
      {LMRDelegateMessage::recorderFailedToResumeRecording_error,
       isImplemented<decltype(&Delegate::recorderFailedToResumeRecording_error),
                     decltype(&Base::recorderFailedToResumeRecording_error)>},
      {LMRDelegateMessage::recorderDidStopRecording,
       isImplemented<decltype(&Delegate::recorderDidStopRecording), decltype(&Base::recorderDidStopRecording)>},
      {LMRDelegateMessage::recorderFailedToStopRecording_error,
       isImplemented<decltype(&Delegate::recorderFailedToStopRecording_error),
                     decltype(&Base::recorderFailedToStopRecording_error)>},
      {LMRDelegateMessage::recorderDidCancelRecording,
       isImplemented<decltype(&Delegate::recorderDidCancelRecording), decltype(&Base::recorderDidCancelRecording)>},
      {LMRDelegateMessage::recorderFailedToCancelRecording_error,
       isImplemented<decltype(&Delegate::recorderFailedToCancelRecording_error),
                     decltype(&Base::recorderFailedToCancelRecording_error)>},
  };
  for (const Message& message : messages) {
    if (message.selector == selector) {
      return message.isSent;
    }
  }
  return false;
}

} // namespace lumora::detail

/// The base of a delegate class: answers respondsToSelector() from what `Delegate` overrides, which must be public.
/// A class that derives from such a delegate and overrides more messages names both, so that its own count as well:
/// `class Special : public LMRDelegateImplementation<Special, Controller>`.
template <class Delegate, class Base = LMRSourceRecorderDelegate> class LMRDelegateImplementation : public Base {
public:
  using Base::Base;

  /// Whether `Delegate` overrides the message of that name.
  bool respondsToSelector(std::string_view selector) const override {
    return lumora::detail::delegateImplements<Delegate>(selector);
  }
};
