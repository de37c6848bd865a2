#include "FaultRun.h"
#include "OnDisk.h"

#include <LumoraKit/recording/LMRRecordingJournal.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <cerrno>
#include <string>

namespace lumora::tests {
namespace {

using testing::IsSubsetOf;
using testing::SizeIs;
using Notes = std::vector<LMRRecordingNote>;

// A journal with one note of a recording that has ended early.
class Journal : public FaultScenario {
public:
  explicit Journal(const std::filesystem::path& folder) : FaultScenario(folder) {
    LMRRecordingNote note;
    note.workflowUUID = "old";
    EXPECT_FALSE(journal()->open(note));
    old_ = note.identifier;
  }

  void check(const Fault& fault) override {
    EXPECT_TRUE(!error_ || fault.call != 0) << error_->localizedDescription();
    EXPECT_TRUE(!error_ || !error_->localizedDescription().empty());
  }

protected:
  std::filesystem::path folder() const { return folder_ / "journal"; }
  std::shared_ptr<LMRRecordingJournal> journal() {
    return LMRRecordingJournal::journalWithFolder_error(folder(), &error_);
  }

  // The workflows of the notes that the next journal finds, in their order.
  std::vector<std::string> found() {
    std::vector<std::string> workflows;
    for (const auto& note : journal()->takeUnfinished()) {
      workflows.push_back(note.workflowUUID);
    }
    std::ranges::sort(workflows);
    return workflows;
  }

  const OnDisk disk_{folder_};
  LMRErrorRef error_;
  std::string old_;
};

class OpeningNote final : public Journal {
public:
  using Journal::Journal;
  void act() override {
    const auto opened = journal();
    LMRRecordingNote note;
    note.workflowUUID = "new";
    error_ = opened ? opened->open(note) : error_;
    hasIdentifier_ = !note.identifier.empty();
  }
  void check(const Fault& fault) override {
    Journal::check(fault);
    EXPECT_EQ(hasIdentifier_, !error_);
    const bool isNoted = !error_;
    const std::vector<std::string> names =
        isNoted ? std::vector<std::string>{"new", "old"} : std::vector<std::string>{"old"};
    EXPECT_EQ(found(), names);
    EXPECT_THAT(filesBelow(folder()), SizeIs(2 * names.size())) << "a note and its lock each";
  }

private:
  bool hasIdentifier_ = false;
};

TEST(JournalFaults, leaveTheOldNotesAndNothingElse_whenARecordingIsNoted) {
  expectHolds(runWithFaults<OpeningNote>(),
              {"open", "flock", "mkostemp", "write", "fsync", "rename", "close", "getrandom"});
}

class ChangingNote final : public Journal {
public:
  using Journal::Journal;
  void act() override {
    const auto opened = journal();
    const auto notes = opened ? opened->takeUnfinished() : Notes();
    wasTaken_ = notes.size() == 1;
    if (wasTaken_) {
      auto note = notes.front();
      note.workflowUUID = "new";
      error_ = opened->update(note);
    }
  }
  void check(const Fault& fault) override {
    Journal::check(fault);
    EXPECT_TRUE(wasTaken_ || fault.call != 0);
    const bool isAnothers = fault.error == EWOULDBLOCK;
    EXPECT_TRUE(wasTaken_ || error_ || isAnothers || !disk_.platform.log->lines().empty()) << "nothing was told";
    EXPECT_EQ(found(), std::vector<std::string>{wasTaken_ && !error_ ? "new" : "old"});
    EXPECT_THAT(filesBelow(folder()), SizeIs(2));
  }

private:
  bool wasTaken_ = false;
};

TEST(JournalFaults, loseNoNote_whenOneIsTakenAndChanged) {
  expectHolds(runWithFaults<ChangingNote>(),
              {"openat", "readdir", "open", "read", "flock", "write", "rename", "close"});
}

class ClosingNote final : public Journal {
public:
  using Journal::Journal;
  void act() override {
    const auto opened = journal();
    const auto notes = opened ? opened->takeUnfinished() : Notes();
    isClosed_ = notes.size() == 1;
    if (isClosed_) {
      error_ = opened->close(old_);
      isClosed_ = !error_;
    }
  }
  void check(const Fault& fault) override {
    Journal::check(fault);
    EXPECT_TRUE(isClosed_ || fault.call != 0);
    EXPECT_THAT(found(), SizeIs(isClosed_ ? 0 : 1));
    // An empty lock file that cannot be removed stays, and does no harm.
    const bool isLockLeft = disk_.platform.log->contains(".lock cannot be removed");
    EXPECT_THAT(filesBelow(folder()), SizeIs(isClosed_ ? (isLockLeft ? 1 : 0) : 2));
  }

private:
  bool isClosed_ = false;
};

TEST(JournalFaults, leaveTheNoteOrNothing_whenOneIsClosed) {
  expectHolds(runWithFaults<ClosingNote>(), {"unlink"});
}

} // namespace
} // namespace lumora::tests
