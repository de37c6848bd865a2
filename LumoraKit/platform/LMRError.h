#pragma once

#include <LumoraKit/platform/Value.h>

#include <memory>
#include <string>
#include <string_view>

/// Domain of server operations; the code is the tool's exit status.
inline constexpr std::string_view LMRErrorDomain = "org.vantor.Lumora";
/// Domain of recording errors found by the framework itself.
inline constexpr std::string_view LMRRecorderErrorDomain = "org.vantor.LumoraRecorder";
/// Domain of failed system calls; the code is errno.
inline constexpr std::string_view LMRPosixErrorDomain = "POSIX";
/// Domain of errors of the machine's capture system; the code is a lumora::CaptureErrorCode.
inline constexpr std::string_view LMRCaptureErrorDomain = "org.vantor.LumoraCapture";

/// Key of the localised description in LMRError::userInfo.
inline constexpr std::string_view LMRLocalizedDescriptionKey = "LocalizedDescription";

class LMRError;

/// How errors are held and passed: shared and immutable; null means "no error".
using LMRErrorRef = std::shared_ptr<const LMRError>;

/// An immutable error value: a domain, a signed code and user information. Any thread.
class LUMORA_EXPORT LMRError {
public:
  /// An error; the text for the user is in `userInfo` under LMRLocalizedDescriptionKey.
  LMRError(std::string domain, std::int64_t code, lumora::Dictionary userInfo);

  /// An error whose user information holds the localised description only.
  static LMRErrorRef make(std::string_view domain, std::int64_t code, std::string localizedDescription);
  /// An error in the POSIX domain: `what` and the text of `errorNumber`.
  static LMRErrorRef fromErrno(int errorNumber, std::string_view what);

  /// Who gave the code its meaning ("org.vantor.Lumora").
  const std::string& domain() const { return domain_; }
  /// What went wrong, in the words of the domain.
  std::int64_t code() const { return code_; }
  /// The text for the user; without one, "Error <code> in <domain>".
  std::string localizedDescription() const;
  /// Everything else that is known of the error, such as a tool's own words under "stderr".
  const lumora::Dictionary& userInfo() const { return userInfo_; }
  /// The text that "%@" prints, for the log: domain, code and description.
  std::string description() const;

private:
  std::string domain_;
  std::int64_t code_;
  lumora::Dictionary userInfo_;
};
