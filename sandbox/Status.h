#pragma once

#include <stdexcept>
#include <string>

namespace lumora::sandbox {

/// The exit statuses of the tools.
enum class Status {
  Success = 0,
  NotRoot = 10,
  InvalidInput = 11,
  InvalidArguments = 12,
  ServerUnavailable = 20,
  NoServerAtHostname = 21,
  NoResponse = 22,
  NotRunningSSL = 23,
  InvalidCertificate = 24,
  UnknownServerError = 25,
  NotAuthorized = 26,
  SubmissionFailed = 30,
  UploadServerUnavailable = 31,
  UploadFailed = 32,
  FileCopyFailed = 33,
  SubmissionNotCompleted = 34,
  SharingFailed = 35,
  RemoteCameraFailure = 36,
  NotServed = 37,
};

/// How a tool says no: an exit status and the reason for its standard error. Thrown inside the sandbox only.
class Refusal : public std::runtime_error {
public:
  Refusal(Status status, const std::string& reason) : std::runtime_error(reason), status_(status) {}
  Status status() const { return status_; }

private:
  Status status_;
};

} // namespace lumora::sandbox
