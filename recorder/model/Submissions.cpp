#include "recorder/model/Submissions.h"

#include "recorder/model/Texts.h"

#include <any>

namespace recorder {
namespace {

std::int64_t number(const lumora::Dictionary& entry, std::string_view key) {
  const lumora::Value* const value = entry.find(key);
  return value ? value->integer().value_or(0) : 0;
}

LMRErrorRef unusable() {
  return LMRError::make(LMRSubmissionQueueErrorDomain, 1, text("The list of submissions cannot be used"));
}

Transfer transferOf(const lumora::Dictionary& entry) {
  return {entry.string("title").value_or(""), entry.string("state").value_or(""), number(entry, "sent"),
          number(entry, "size"), entry.string("message").value_or("")};
}

} // namespace

LMRErrorRef Submissions::open() {
  LMRErrorRef error;
  queue_ = LMRSubmissionQueue::queueWithError(&error);
  if (!queue_) {
    return error;
  }
  const auto center = lumora::Platform::current().notificationCenter;
  didChange_ = center->observe(LMRSubmissionQueueDidChangeNotification, [this](const std::any&) { changed.notify(); });
  didSubmit_ = center->observe(LMRSubmissionQueueDidSubmitNotification, [this](const std::any& submission) {
    submitted_.insert(submitted_.begin(), std::any_cast<const LMRSubmission&>(submission));
    refreshTransfers();
    changed.notify();
  });
  return nullptr;
}

void Submissions::setSession(const std::shared_ptr<LMRSession>& session) {
  if (queue_) {
    queue_->setSession(session);
  }
}

LMRErrorRef Submissions::add(const std::vector<LMRSubmission>& submissions, const LMRSession& session) {
  LMRErrorRef failure;
  if (!queue_) {
    return unusable();
  }
  for (const LMRSubmission& submission : submissions) {
    if (LMRErrorRef error = queue_->add(submission, session)) {
      failure = std::move(error);
    }
  }
  return failure;
}

LMRErrorRef Submissions::addUnfinished(LMRUnfinishedRecording& recording, const LMRSession& session) {
  return queue_ ? recording.submitToQueue_session_deleteAfterSubmission(*queue_, session, true) : unusable();
}

void Submissions::retry(const std::string& identifier) {
  if (queue_) {
    queue_->retry(identifier);
  }
}

LMRErrorRef Submissions::remove(const std::string& identifier) {
  return queue_ ? queue_->remove(identifier) : nullptr;
}

std::vector<LMRSubmission> Submissions::waiting() const {
  return queue_ ? queue_->submissions() : std::vector<LMRSubmission>();
}

void Submissions::refreshTransfers() {
  if (isAsking_) {
    return;
  }
  isAsking_ = true;
  const auto action = LMRActionFactory::actionToListCurrentTransfers();
  action->setFinishTarget_selector(shared_from_this(), &Submissions::transfersCame);
  action->setErrorTarget_selector(shared_from_this(), &Submissions::transfersFailed);
  action->start();
}

void Submissions::transfersCame(const std::shared_ptr<LMRAction>& action) {
  isAsking_ = false;
  std::vector<Transfer> found;
  const auto reply = action->result();
  const lumora::Array* const uploads = reply ? reply->array("uploads") : nullptr;
  for (const lumora::Value& upload : uploads ? *uploads : lumora::Array()) {
    if (upload.dictionary()) {
      found.push_back(transferOf(*upload.dictionary()));
    }
  }
  if (found != transfers_) {
    transfers_ = std::move(found);
    changed.notify();
  }
}

void Submissions::clearTransfers() {
  const auto action = LMRActionFactory::actionToClearCurrentTransfersList();
  action->setFinishTarget_selector(shared_from_this(), &Submissions::transfersCleared);
  action->start();
}

void Submissions::transfersCleared() {
  refreshTransfers();
}

} // namespace recorder
