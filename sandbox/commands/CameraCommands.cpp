#include "../Status.h"
#include "../cameras/Movie.h"
#include "../cameras/Preview.h"
#include "../store/Cameras.h"
#include "../submission/Submission.h"
#include "Command.h"

#include <LumoraKit/platform/Files.h>

#include <algorithm>
#include <cctype>
#include <chrono>
#include <initializer_list>
#include <thread>

namespace lumora::sandbox {

namespace {

using States = std::initializer_list<CameraState>;

[[noreturn]] void refuse(const std::string& name, const std::string& reason) {
  throw Refusal(Status::RemoteCameraFailure, "the remote camera \"" + name + "\" " + reason);
}

Camera cameraNamed(Store& store, const std::string& name) {
  const auto camera = findCamera(store, name);
  if (!camera) {
    throw Refusal(Status::RemoteCameraFailure, "there is no remote camera named \"" + name + "\"");
  }
  return *camera;
}

/// The camera, in one of the states that allow the deed and by the user whose recording it is.
Camera cameraFor(Context& context, const std::string& name, const std::string& deed, States allowed) {
  Camera camera = cameraNamed(context.store, name);
  const CameraState state = stateAt(camera, currentMilliseconds());
  if (std::find(allowed.begin(), allowed.end(), state) == allowed.end()) {
    refuse(name, "cannot " + deed + ": it is " + std::string(nameOf(state)));
  }
  if (camera.take && camera.take->user != context.user->name) {
    throw Refusal(Status::NotAuthorized, "the remote camera \"" + name + "\" records for another user");
  }
  return camera;
}

/// RFC 8089, with RFC 3986's escapes.
std::string fileURL(const std::filesystem::path& path) {
  constexpr std::string_view digits = "0123456789ABCDEF";
  constexpr std::string_view unreserved = "-._~/";
  std::string url = "file://";
  for (const char letter : path.string()) {
    const auto byte = static_cast<unsigned char>(letter);
    if ((byte < 0x80 && std::isalnum(byte) != 0) || unreserved.find(letter) != std::string_view::npos) {
      url += letter;
    } else {
      url += {'%', digits[byte >> 4U], digits[byte & 0xFU]};
    }
  }
  return url;
}

Dictionary description(const Store& store, const Camera& camera) {
  const std::int64_t now = currentMilliseconds();
  Dictionary description{{"name", camera.name},
                         {"state", std::string(nameOf(stateAt(camera, now)))},
                         {"preview", fileURL(previewPath(store, camera))}};
  if (camera.take) {
    constexpr double millisecondsOfASecond = 1000;
    description.set("user", camera.take->user);
    description.set("audio_only", camera.take->isAudioOnly);
    description.set("recorded", static_cast<double>(recordedAt(*camera.take, now)) / millisecondsOfASecond);
  }
  return description;
}

/// Changes what a camera is doing, if its state allows that; the reply tells its new state.
template <class Deed>
Dictionary changeCamera(Context& context, const std::string& name, const std::string& verb, States allowed,
                        const Deed& deed) {
  Camera camera;
  context.store.change([&] {
    camera = cameraFor(context, name, verb, allowed);
    deed(camera);
    saveTake(context.store, camera);
  });
  return description(context.store, camera);
}

/// The server waits out a start's delay; the recording may be cancelled meanwhile.
void waitForStart(Store& store, const std::string& name, const Take& take) {
  constexpr std::int64_t glance = 20; // milliseconds
  for (;;) {
    const auto camera = findCamera(store, name);
    if (!camera || !camera->take || camera->take->uuid != take.uuid) {
      refuse(name, "did not start: its recording was cancelled");
    }
    const std::int64_t left = take.begins - currentMilliseconds();
    if (left <= 0) {
      return;
    }
    std::this_thread::sleep_for(std::chrono::milliseconds(std::min(left, glance)));
  }
}

std::int64_t millisecondsFrom(const std::string& name, std::uint64_t delay) {
  constexpr std::uint64_t day = 86400;
  if (delay > day) {
    refuse(name, "does not wait longer than a day");
  }
  return static_cast<std::int64_t>(delay) * 1000;
}

std::string dateText(std::int64_t milliseconds) {
  return Value(Date(std::chrono::seconds(milliseconds / 1000))).description();
}

Dictionary recordingMetadata(const Take& take, std::int64_t end) {
  return {{"RecordingMetadata_START_DATE", dateText(take.begins)},
          {"RecordingMetadata_END_DATE", dateText(end)},
          {"RecordingMetadata_DURATION", Value(static_cast<double>(recordedAt(take, end)) / 1000).description()}};
}

std::string movieName(const std::string& camera) {
  std::string name = camera + ".mov";
  std::replace(name.begin(), name.end(), '/', '-');
  return name;
}

} // namespace

Dictionary listCameras(Context& context, const Arguments&) {
  Array descriptions;
  for (const auto& camera : cameras(context.store)) {
    descriptions.emplace_back(description(context.store, camera));
  }
  return {{"cameras", std::move(descriptions)}};
}

Dictionary cameraStatus(Context& context, const Arguments& arguments) {
  const Camera camera = cameraNamed(context.store, arguments.text("status"));
  Dictionary reply = description(context.store, camera);
  if (arguments.has("update_preview_image")) {
    updatePreview(context.store, camera);
  }
  if (arguments.has("include_preview_image")) {
    reply.set("preview_image_data", readPreview(context.store, camera));
  }
  return reply;
}

Dictionary startCamera(Context& context, const Arguments& arguments) {
  const std::string& name = arguments.text("start");
  const std::int64_t begins = currentMilliseconds() + millisecondsFrom(name, arguments.number("delay"));
  const Take take{makeUUIDString(), context.user->name, arguments.has("audio_only"), begins, begins, 0};
  changeCamera(context, name, "start", {CameraState::Idle}, [&](Camera& camera) { camera.take = take; });
  waitForStart(context.store, name, take);
  return description(context.store, cameraNamed(context.store, name));
}

Dictionary pauseCamera(Context& context, const Arguments& arguments) {
  return changeCamera(context, arguments.text("pause"), "pause", {CameraState::Recording}, [](Camera& camera) {
    camera.take->recorded = recordedAt(*camera.take, currentMilliseconds());
    camera.take->since.reset();
  });
}

Dictionary resumeCamera(Context& context, const Arguments& arguments) {
  return changeCamera(context, arguments.text("resume"), "resume", {CameraState::Paused},
                      [](Camera& camera) { camera.take->since = currentMilliseconds(); });
}

Dictionary cancelCamera(Context& context, const Arguments& arguments) {
  return changeCamera(context, arguments.text("cancel"), "cancel",
                      {CameraState::Starting, CameraState::Recording, CameraState::Paused},
                      [](Camera& camera) { camera.take.reset(); });
}

Dictionary stopCamera(Context& context, const Arguments& arguments) {
  const std::string& name = arguments.text("stop");
  const States stoppable{CameraState::Recording, CameraState::Paused};
  const Take take = *cameraFor(context, name, "stop", stoppable).take;
  const std::int64_t end = currentMilliseconds();

  Submission submission = prepare(context.store,
                                  {{},
                                   arguments.text("metadata"),
                                   std::nullopt,
                                   arguments.optionalText("workflow"),
                                   arguments.optionalText("submission_uuid")},
                                  *context.user);
  submission.episode.recordingMetadata = recordingMetadata(take, end);
  submission.material = {movieName(name), makeMovie(recordedAt(take, end), !take.isAudioOnly)};
  // In the change that files it: of two stops at once one files, and a stop that failed may be tried again.
  submission.alongside = [&] {
    Camera camera = cameraFor(context, name, "stop", stoppable);
    if (camera.take->uuid != take.uuid) {
      refuse(name, "was stopped meanwhile");
    }
    camera.take.reset();
    saveTake(context.store, camera);
  };
  const Filed filed = fileNow(context.store, std::move(submission));
  return {{"uuid", filed.episodeUUID}, {"state", "completed"}};
}

} // namespace lumora::sandbox
