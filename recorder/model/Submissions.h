#pragma once

#include <LumoraKit/LumoraKit.h>

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

namespace recorder {

/// A transfer of this machine to a server, as the server's tool tells it.
struct Transfer {
  std::string title;
  /// "uploading", "completed" or "failed".
  std::string state;
  std::int64_t sent = 0;
  std::int64_t size = 0;
  std::string message;

  friend bool operator==(const Transfer&, const Transfer&) = default;
};

/// What is on its way to the server: the queue of this application, and the transfers of the server's tool. Main thread
/// only.
class Submissions : public std::enable_shared_from_this<Submissions> {
public:
  /// Told when one of the lists has become another one.
  lumora::Notifier changed;

  /// Opens the queue on the disk. An error when it cannot be used: then nothing can be submitted by this process.
  LMRErrorRef open();

  /// After each login.
  void setSession(const std::shared_ptr<LMRSession>& session);
  /// Null on success.
  LMRErrorRef add(const std::vector<LMRSubmission>& submissions, const LMRSession& session);
  /// A recording that an earlier run has left behind, repaired.
  LMRErrorRef addUnfinished(LMRUnfinishedRecording& recording, const LMRSession& session);
  void retry(const std::string& identifier);
  LMRErrorRef remove(const std::string& identifier);

  std::vector<LMRSubmission> waiting() const;
  /// What the server has taken in this run, newest first.
  const std::vector<LMRSubmission>& submitted() const { return submitted_; }

  /// Asks for the transfers, unless it is asking already.
  void refreshTransfers();
  const std::vector<Transfer>& transfers() const { return transfers_; }
  /// Forgets those that have ended.
  void clearTransfers();

private:
  void transfersCame(const std::shared_ptr<LMRAction>& action);
  void transfersFailed() { isAsking_ = false; }
  void transfersCleared();

  std::shared_ptr<LMRSubmissionQueue> queue_;
  lumora::Connection didChange_;
  lumora::Connection didSubmit_;
  std::vector<LMRSubmission> submitted_;
  bool isAsking_ = false;
  std::vector<Transfer> transfers_;
};

} // namespace recorder
