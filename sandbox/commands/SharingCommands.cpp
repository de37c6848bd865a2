#include "../Status.h"
#include "Command.h"

namespace lumora::sandbox {

// This machine shares no camera and the server knows of none: that is what these commands say.

Dictionary listCameras(Context&, const Arguments&) {
  return {{"cameras", Array{}}};
}

Dictionary cameraVerb(Context&, const Arguments& arguments) {
  for (const auto* verb : {"status", "start", "pause", "resume", "cancel", "stop"}) {
    if (arguments.has(verb)) {
      throw Refusal(Status::RemoteCameraFailure, "there is no remote camera named \"" + arguments.text(verb) + "\"");
    }
  }
  throw Refusal(Status::InvalidArguments, "the camera is missing");
}

Dictionary isBound(Context&, const Arguments&) {
  return {{"Bound", false}};
}

Dictionary getConfiguration(Context&, const Arguments&) {
  return {{"CameraName", ""},          {"TunnelHost", ""},          {"Capture", ""},
          {"RecordingVideoInput", ""}, {"RecordingAudioInput", ""}, {"RecordingCapturePreset", ""}};
}

Dictionary notServed(Context&, const Arguments&) {
  throw Refusal(Status::NotServed, "this server does not offer the command");
}

} // namespace lumora::sandbox
