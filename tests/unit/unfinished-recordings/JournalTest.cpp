#include "support/Sessions.h"

#include <LumoraKit/recording/LMRRecordingJournal.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cerrno>
#include <chrono>

namespace {

using testing::IsEmpty;
using testing::SizeIs;

constexpr const char* folder = "/notes";

class RecordingJournal : public testing::Test {
protected:
  RecordingJournal() { restart(); }

  // The application dies and is started again.
  void restart() {
    journal_.reset();
    LMRErrorRef error;
    journal_ = LMRRecordingJournal::journalWithFolder_error(folder, &error);
    ASSERT_NE(journal_, nullptr) << lumora::text(error);
  }

  static LMRRecordingNote note(const std::string& title = "Lecture") {
    LMRRecordingNote note;
    note.began = lumora::Date(std::chrono::seconds(1'264'000'000));
    note.workflowUUID = "W";
    note.userMetadata = {{"Title", title}};
    note.setSession(*lumora::tests::passwordSession());
    note.sources = {{"LMRLocalScreenRecorder", "Screen", "/movies/a.mov", ""},
                    {"LMRRemoteVideoRecorder", "Studio A", "", ""}};
    return note;
  }
  LMRRecordingNote opened(const std::string& title = "Lecture") {
    auto opened = note(title);
    EXPECT_EQ(journal_->open(opened), nullptr);
    return opened;
  }
  std::vector<std::filesystem::path> files() const { return platform_.files->files(); }

  lumora::fakes::FakePlatform platform_;
  std::shared_ptr<LMRRecordingJournal> journal_;
};

TEST_F(RecordingJournal, findsWhatWasOpen_afterItsApplicationHasDied) {
  const auto left = opened();
  restart();
  const auto found = journal_->takeUnfinished();
  ASSERT_THAT(found, SizeIs(1));
  EXPECT_EQ(found[0].dictionaryRepresentation(), left.dictionaryRepresentation());
  EXPECT_TRUE(found[0].isFor(*lumora::tests::passwordSession()));
  ASSERT_THAT(found[0].sources, SizeIs(2));
  EXPECT_TRUE(found[0].sources[0].isLocal());
  EXPECT_FALSE(found[0].sources[1].isLocal());
}

TEST_F(RecordingJournal, findsNothing_whenEverythingWasClosed) {
  const auto closed = opened();
  EXPECT_EQ(journal_->close(closed.identifier), nullptr);
  EXPECT_THAT(files(), IsEmpty());
  restart();
  EXPECT_THAT(journal_->takeUnfinished(), IsEmpty());
}

TEST_F(RecordingJournal, findsTheLastUpdate) {
  auto left = opened();
  left.sources[0].submissionUUID = "S";
  EXPECT_EQ(journal_->update(left), nullptr);
  restart();
  EXPECT_EQ(journal_->takeUnfinished().at(0).sources[0].submissionUUID, "S");
}

TEST_F(RecordingJournal, doesNotOfferWhatIsOpen_toItselfOrAnotherJournal) {
  opened();
  const auto other = LMRRecordingJournal::journalWithFolder_error(folder, nullptr);
  EXPECT_THAT(journal_->takeUnfinished(), IsEmpty());
  EXPECT_THAT(other->takeUnfinished(), IsEmpty());
}

TEST_F(RecordingJournal, offersEachOnce) {
  opened("A");
  opened("B");
  restart();
  const auto other = LMRRecordingJournal::journalWithFolder_error(folder, nullptr);
  EXPECT_THAT(journal_->takeUnfinished(), SizeIs(2));
  EXPECT_THAT(journal_->takeUnfinished(), IsEmpty());
  EXPECT_THAT(other->takeUnfinished(), IsEmpty());
}

TEST_F(RecordingJournal, offersTheOldestFirst) {
  auto late = note("late");
  late.began += std::chrono::hours(1);
  EXPECT_EQ(journal_->open(late), nullptr);
  opened("early");
  restart();
  const auto found = journal_->takeUnfinished();
  ASSERT_THAT(found, SizeIs(2));
  EXPECT_EQ(found[0].userMetadata.string("Title"), "early");
}

TEST_F(RecordingJournal, leavesANoteAlone_whenItCannotBeRead) {
  opened();
  restart();
  platform_.files->writeAtomically("/notes/A.plist", "rubbish");
  platform_.files->writeAtomically("/notes/B.plist", "<plist version=\"1.0\"><dict/></plist>");
  EXPECT_THAT(journal_->takeUnfinished(), SizeIs(1));
  EXPECT_EQ(platform_.files->content("/notes/A.plist"), "rubbish");
  EXPECT_TRUE(platform_.files->content("/notes/B.plist"));
  EXPECT_EQ(platform_.log->count("The note of a recording in "), 2U);
}

TEST_F(RecordingJournal, leavesANoteAlone_whenItWasCopiedUnderAnotherName) {
  const auto left = opened();
  restart();
  const auto text = platform_.files->content("/notes/" + left.identifier + ".plist");
  platform_.files->writeAtomically("/notes/copy.plist", *text);
  EXPECT_THAT(journal_->takeUnfinished(), SizeIs(1));
}

TEST_F(RecordingJournal, hasNoNote_whenTheDiskIsFull) {
  auto refused = note();
  platform_.files->setFailure(ENOSPC);
  const auto error = journal_->open(refused);
  ASSERT_NE(error, nullptr);
  EXPECT_EQ(error->code(), ENOSPC);
  EXPECT_EQ(refused.identifier, "");
  platform_.files->setFailure(0);
  EXPECT_THAT(files(), IsEmpty());
  restart();
  EXPECT_THAT(journal_->takeUnfinished(), IsEmpty());
}

TEST_F(RecordingJournal, keepsTheNoteAsItWas_whenAnUpdateFails) {
  auto left = opened("before");
  left.userMetadata = {{"Title", "after"}};
  platform_.files->setFailure(EIO);
  EXPECT_NE(journal_->update(left), nullptr);
  EXPECT_NE(journal_->close(left.identifier), nullptr);
  platform_.files->setFailure(0);
  restart();
  EXPECT_EQ(journal_->takeUnfinished().at(0).userMetadata.string("Title"), "before");
}

TEST_F(RecordingJournal, refusesWhatIsNotOpenHere) {
  const auto closed = opened();
  EXPECT_EQ(journal_->close(closed.identifier), nullptr);
  EXPECT_NE(journal_->update(closed), nullptr);
  EXPECT_NE(journal_->close(closed.identifier), nullptr);
  EXPECT_THAT(files(), IsEmpty());
}

TEST_F(RecordingJournal, isInTheApplicationsFolder_unlessItIsToldAnother) {
  auto journal = LMRRecordingJournal::journalWithError(nullptr);
  ASSERT_NE(journal, nullptr);
  auto noted = note();
  EXPECT_EQ(journal->open(noted), nullptr);
  EXPECT_THAT(files().at(0).string(), testing::StartsWith("/home/user/.local/share/"));
  EXPECT_EQ(files().at(0).parent_path().filename(), "Recordings");
}

TEST_F(RecordingJournal, isNotThere_whenItsFolderCannotBeMade) {
  LMRErrorRef error;
  platform_.files->setFailure(EACCES);
  EXPECT_EQ(LMRRecordingJournal::journalWithFolder_error("/other", &error), nullptr);
  EXPECT_NE(error, nullptr);
  platform_.files->setApplicationSupportDirectories({});
  error.reset();
  EXPECT_EQ(LMRRecordingJournal::journalWithError(&error), nullptr);
  EXPECT_NE(error, nullptr);
}

} // namespace
