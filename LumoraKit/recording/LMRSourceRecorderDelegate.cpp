#include <LumoraKit/recording/LMRSourceRecorderDelegate.h>

LMRSourceRecorderDelegate::~LMRSourceRecorderDelegate() = default;

// A message that is not implemented is not sent; it may still arrive at a delegate that took the place of another
// one while the message was on its way.
void LMRSourceRecorderDelegate::recorderDidStartRecording(const Recorder&) {}
void LMRSourceRecorderDelegate::recorderFailedToStartRecording_error(const Recorder&, const LMRErrorRef&) {}
void LMRSourceRecorderDelegate::recorderDidPauseRecording(const Recorder&) {}
void LMRSourceRecorderDelegate::recorderFailedToPauseRecording_error(const Recorder&, const LMRErrorRef&) {}
void LMRSourceRecorderDelegate::recorderDidResumeRecording(const Recorder&) {}
void LMRSourceRecorderDelegate::recorderFailedToResumeRecording_error(const Recorder&, const LMRErrorRef&) {}
void LMRSourceRecorderDelegate::recorderDidStopRecording(const Recorder&) {}
void LMRSourceRecorderDelegate::recorderFailedToStopRecording_error(const Recorder&, const LMRErrorRef&) {}
void LMRSourceRecorderDelegate::recorderDidCancelRecording(const Recorder&) {}
void LMRSourceRecorderDelegate::recorderFailedToCancelRecording_error(const Recorder&, const LMRErrorRef&) {}
