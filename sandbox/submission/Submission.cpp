#include "Submission.h"

#include "../Status.h"
#include "../Strike.h"
#include "../store/Recordings.h"
#include "../store/Uploads.h"
#include "../store/Workflows.h"
#include "Metadata.h"
#include "Staging.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <memory>
#include <numeric>
#include <thread>

#include <fcntl.h>
#include <unistd.h>

namespace lumora::sandbox {

namespace fs = std::filesystem;

namespace {

void addressToWorkflow(Store& store, const std::string& name, Episode& episode) {
  const auto workflow = findWorkflow(store, name);
  if (!workflow) {
    throw Refusal(Status::SubmissionFailed, "there is no workflow \"" + name + "\"");
  }
  episode.workflowUUID = workflow->uuid;
  episode.workflowName = workflow->name;
}

[[noreturn]] void refuseFiledSlot(const std::string& uuid) {
  throw Refusal(Status::SubmissionNotCompleted, "the submission UUID " + uuid + " was filed already");
}

void addressToSlot(Store& store, const std::string& uuid, Episode& episode) {
  const auto slot = findSlot(store, uuid);
  if (!slot) {
    throw Refusal(Status::SubmissionNotCompleted, "there is no submission UUID \"" + uuid + "\"");
  }
  if (slot->user != episode.user) {
    throw Refusal(Status::NotAuthorized, "the submission UUID " + uuid + " belongs to another user's recording");
  }
  if (slot->isFiled) {
    refuseFiledSlot(uuid);
  }
  episode.slotUUID = uuid;
  episode.workflowUUID = slot->workflowUUID;
  episode.workflowName = slot->workflowName;
}

fs::path checkedSource(const std::string& path) {
  std::error_code error;
  const auto status = fs::status(path, error);
  if (!fs::exists(status)) {
    throw Refusal(Status::FileCopyFailed, path + ": " + (error ? error.message() : "no such file"));
  }
  if (!fs::is_regular_file(status)) {
    throw Refusal(Status::FileCopyFailed, path + ": not a regular file");
  }
  return fs::absolute(path);
}

std::vector<std::string> removeSources(const std::vector<fs::path>& sources) {
  std::vector<std::string> remaining;
  for (const auto& source : sources) {
    std::error_code error;
    if (!fs::remove(source, error)) {
      remaining.push_back(source.string());
    }
  }
  return remaining;
}

void record(Store& store, Staging& staging, const Submission& submission) {
  const Episode& episode = submission.episode;
  store.change([&] {
    if (submission.alongside) {
      submission.alongside();
    }
    if (episode.slotUUID && findSlot(store, *episode.slotUUID)->isFiled) {
      refuseFiledSlot(*episode.slotUUID);
    }
    insertEpisode(store, episode);
    completeUpload(store, episode.uuid);
    staging.publish();
  });
  staging.keep();
}

Filed fileFrom(Store& store, Staging& staging, Submission& submission, const Pace& pace) {
  submission.episode.uuid = staging.uuid();
  for (const auto& source : submission.sources) {
    submission.episode.files.push_back(staging.add(source, pace));
  }
  if (submission.material) {
    submission.episode.files.push_back(staging.addContent(submission.material->first, submission.material->second));
  }
  submission.episode.submitted = currentTime();
  record(store, staging, submission);
  return {staging.uuid(), submission.removesSources ? removeSources(submission.sources) : std::vector<std::string>{}};
}

std::int64_t sizeOf(const std::vector<fs::path>& files) {
  return std::accumulate(files.begin(), files.end(), std::int64_t{0}, [](std::int64_t sum, const fs::path& file) {
    std::error_code error;
    const auto size = fs::file_size(file, error);
    return error ? sum : sum + static_cast<std::int64_t>(size);
  });
}

void listUpload(Store& store, const std::string& uuid, const Submission& submission) {
  Upload upload;
  upload.uuid = uuid;
  upload.title = submission.episode.userMetadata.string("Title").value_or("");
  upload.workflowName = submission.episode.workflowName;
  upload.user = submission.episode.user;
  upload.fileCount = static_cast<std::int64_t>(submission.sources.size());
  upload.size = sizeOf(submission.sources);
  upload.started = currentTime();
  insertUpload(store, upload);
}

/// Whoever waits for the tool's outputs to close must not wait for the transfer.
void leaveCaller() {
  setsid();
  const int nowhere = open("/dev/null", O_RDWR | O_CLOEXEC);
  for (const int descriptor : {STDIN_FILENO, STDOUT_FILENO, STDERR_FILENO}) {
    dup2(nowhere, descriptor);
  }
}

/// A latency that strikes a transfer is spread over its bytes; other faults strike before the first one.
Pace strikeTransfer(Store& store, std::int64_t size) {
  const std::chrono::milliseconds latency = strikeTransfer(store);
  return latency.count() == 0 ? nullptr : Pace([latency, size](std::size_t count) {
    std::this_thread::sleep_for(latency * count / std::max<std::int64_t>(size, 1));
  });
}

void transferOrThrow(Store& store, Staging& staging, Submission& submission) {
  store.resume();
  try {
    fileFrom(store, staging, submission, strikeTransfer(store, sizeOf(submission.sources)));
  } catch (const std::exception& failure) {
    failUpload(store, staging.uuid(), failure.what());
  }
}

[[noreturn]] void transfer(Store& store, std::unique_ptr<Staging> staging, Submission& submission) {
  leaveCaller();
  try {
    transferOrThrow(store, *staging, submission);
  } catch (const std::exception&) {
    // Nobody is left to tell: without its process the upload will be found interrupted.
  }
  staging.reset();
  _exit(0);
}

} // namespace

Submission prepare(Store& store, const SubmissionRequest& request, const User& user) {
  Submission submission;
  submission.episode.user = user.name;
  submission.episode.userMetadata = readUserMetadata(request.metadataPath);
  if (request.recordingMetadataPath) {
    submission.episode.recordingMetadata = readRecordingProperties(*request.recordingMetadataPath);
  }
  if (request.submissionUUID) {
    addressToSlot(store, *request.submissionUUID, submission.episode);
  } else {
    addressToWorkflow(store, *request.workflow, submission.episode);
  }
  for (const auto& file : request.files) {
    submission.sources.push_back(checkedSource(file));
  }
  return submission;
}

Filed fileNow(Store& store, Submission submission) {
  Staging staging(store);
  return fileFrom(store, staging, submission, nullptr);
}

std::string fileInBackground(Store& store, Submission submission) {
  auto staging = std::make_unique<Staging>(store);
  std::string uuid = staging->uuid();
  listUpload(store, uuid, submission);
  store.suspend();
  const pid_t child = fork();
  if (child == 0) {
    transfer(store, std::move(staging), submission);
  }
  const int forkError = errno;
  store.resume();
  if (child < 0) {
    failUpload(store, uuid, std::strerror(forkError));
    throw Refusal(Status::UploadServerUnavailable, std::strerror(forkError));
  }
  staging->keep();
  return uuid;
}

} // namespace lumora::sandbox
