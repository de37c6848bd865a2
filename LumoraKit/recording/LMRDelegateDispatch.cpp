// How a recorder's outcome becomes a message to its delegate.
#include <LumoraKit/platform/MainThread.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/recording/LMRSourceRecorder.h>

#include <algorithm>

namespace {

using Delegate = LMRSourceRecorderDelegate;
using Recorder = std::shared_ptr<LMRSourceRecorder>;
using Outcome = void (Delegate::*)(const Recorder&);
using Failure = void (Delegate::*)(const Recorder&, const LMRErrorRef&);

struct Message {
  std::string_view selector;
  std::variant<Outcome, Failure> send;
};

const Message messages[] = {
    {LMRDelegateMessage::recorderDidStartRecording, &Delegate::recorderDidStartRecording},
    {LMRDelegateMessage::recorderFailedToStartRecording_error, &Delegate::recorderFailedToStartRecording_error},
    {LMRDelegateMessage::recorderDidPauseRecording, &Delegate::recorderDidPauseRecording},
    {LMRDelegateMessage::recorderFailedToPauseRecording_error, &Delegate::recorderFailedToPauseRecording_error},
    {LMRDelegateMessage::recorderDidResumeRecording, &Delegate::recorderDidResumeRecording},
    {LMRDelegateMessage::recorderFailedToResumeRecording_error, &Delegate::recorderFailedToResumeRecording_error},
    {LMRDelegateMessage::recorderDidStopRecording, &Delegate::recorderDidStopRecording},
    {LMRDelegateMessage::recorderFailedToStopRecording_error, &Delegate::recorderFailedToStopRecording_error},
    {LMRDelegateMessage::recorderDidCancelRecording, &Delegate::recorderDidCancelRecording},
    {LMRDelegateMessage::recorderFailedToCancelRecording_error, &Delegate::recorderFailedToCancelRecording_error},
};

// The argument under a key, or an empty one.
template <class T> T argument(const LMRDelegateArguments& arguments, std::string_view key) {
  const auto found =
      std::find_if(arguments.begin(), arguments.end(), [key](const auto& entry) { return entry.first == key; });
  const T* value = found == arguments.end() ? nullptr : std::get_if<T>(&found->second);
  return value ? *value : T();
}

} // namespace

void LMRSourceRecorder::notifyDelegate(std::string_view selector, const LMRErrorRef& error) {
  auto delegate = this->delegate();
  const auto recorder = weak_from_this().lock();
  if (!delegate || !delegate->respondsToSelector(selector) || !recorder) {
    return;
  }
  LMRDelegateArguments arguments{{std::string(LMRDelegateSelector), std::string(selector)},
                                 {std::string(LMRDelegateRecorder), recorder}};
  if (error) {
    arguments.emplace_back(LMRDelegateError, error);
  }
  lumora::Platform::current().mainThread->runAndWait([&] {
    // Should its owner have dropped it meanwhile, the delegate dies here and not on the reporting thread.
    delegate.reset();
    dispatchDelegateMethodWithArguments(arguments);
  });
}

void LMRSourceRecorder::dispatchDelegateMethodWithArguments(const LMRDelegateArguments& arguments) const {
  const auto selector = argument<std::string>(arguments, LMRDelegateSelector);
  const auto* const message = std::find_if(std::begin(messages), std::end(messages),
                                           [&](const Message& candidate) { return candidate.selector == selector; });
  const auto receiver = delegate();
  if (message == std::end(messages) || !receiver) {
    return;
  }
  const auto recorder = argument<Recorder>(arguments, LMRDelegateRecorder);
  if (const auto* failure = std::get_if<Failure>(&message->send)) {
    (receiver.get()->**failure)(recorder, argument<LMRErrorRef>(arguments, LMRDelegateError));
  } else {
    (receiver.get()->*std::get<Outcome>(message->send))(recorder);
  }
}
