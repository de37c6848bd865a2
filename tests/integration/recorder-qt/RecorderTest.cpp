#include "RecorderRig.h"
#include "support/Movie.h"

#include <gmock/gmock.h>

#include <QLabel>
#include <QListWidget>
#include <QPushButton>
#include <algorithm>
#include <filesystem>
#include <string>
#include <utility>

namespace recorder {
namespace {

using lumora::testing::Movie;
using ::testing::IsEmpty;
using ::testing::SizeIs;

class RecorderWindowTest : public RecorderRig {
protected:
  bool hasPictures() {
    return waitFor([&] {
      for (const auto& source : studio().sources()) {
        if (!source->picture()) {
          return false;
        }
      }
      return !studio().sources().empty();
    });
  }
  bool hasSound() {
    return waitFor([&] { return !studio().sources()[0]->levels().empty(); });
  }
  void recordForAWhile() {
    press("record");
    ASSERT_TRUE(isIn(TakeState::Recording));
    ASSERT_TRUE(waitFor([&] { return studio().take()->elapsedTime() > 1; }));
  }
  static std::string contentOf(const lumora::Dictionary& episode) {
    return lumora::tests::contentOf(episode.array("files")->at(0).dictionary()->string("path").value());
  }
  static Movie movieOf(const lumora::Dictionary& episode) {
    return Movie(episode.array("files")->at(0).dictionary()->string("path").value());
  }
  /// The first camera, as the server's administrator sees it: its name and its state.
  std::string cameraOfServer() const {
    const std::string line = server_->administrate({"camera", "list"}).standardOutput;
    return line.substr(0, line.find('\t', line.find('\t') + 1));
  }
  void expectTwoPartsOfOneRecording(const std::string& title) {
    auto episodes = server_->episodes();
    ASSERT_THAT(episodes, SizeIs(2));
    const auto place = [](const lumora::Dictionary& each) { return each.find("source_index")->integer().value(); };
    std::ranges::sort(episodes, {}, place);
    EXPECT_EQ(place(episodes[0]) + 1, place(episodes[1]));
    EXPECT_EQ(episodes[0].string("recording_uuid"), episodes[1].string("recording_uuid"));
    for (const auto& [episode, codec] : {std::pair(episodes[0], "h264"), std::pair(episodes[1], "png")}) {
      EXPECT_EQ(episode.string("title"), title);
      EXPECT_EQ(movieOf(episode).stream("v", "codec_name"), codec);
      EXPECT_TRUE(movieOf(episode).decodes());
      EXPECT_GT(movieOf(episode).duration(), 1);
    }
  }
  bool listSays(const QString& beginning) const {
    const auto* const list = find<QListWidget>("submissions");
    for (int i = 0; i < list->count(); ++i) {
      if (list->item(i)->text().startsWith(beginning)) {
        return true;
      }
    }
    return false;
  }
  bool hasSubmitted(std::size_t episodes) {
    return waitFor([&] { return !studio().isUnderWay() && server_->episodes().size() == episodes; });
  }
};

TEST_F(RecorderWindowTest, recordsCameraAndScreen_andSubmitsThem) {
  open();
  logIn();
  ASSERT_TRUE(selectWorkflow("Camera and Screen"));
  ASSERT_THAT(studio().sources(), SizeIs(2));
  EXPECT_TRUE(hasPictures());
  EXPECT_TRUE(hasSound());
  type("title", "Waves");
  type("description", "The second lecture.");
  recordForAWhile();
  press("pause");
  ASSERT_TRUE(isIn(TakeState::Paused));
  press("pause");
  ASSERT_TRUE(isIn(TakeState::Recording));
  press("stop");
  ASSERT_TRUE(hasSubmitted(2)) << studio().notice();
  EXPECT_EQ(server_->episodes().front().string("title"), "Waves");
  EXPECT_EQ(studio().notice(), "");
  EXPECT_TRUE(waitFor([&] { return studio().submissions().waiting().empty(); }));
  EXPECT_TRUE(waitFor([&] { return studio().canRecord(); }));
  EXPECT_TRUE(waitFor([&] { return listSays("Waves – Headless camera\nArrived"); }));
  EXPECT_TRUE(waitFor([&] { return listSays("Waves – Screen\nArrived"); }));
}

TEST_F(RecorderWindowTest, recordsACameraOfTheServer_besideOneOfItsOwn) {
  server_->administrate({"camera", "add"}, {"Studio A"});
  server_->administrate({"workflow", "add"},
                        {"two-cameras", "--title", "Two Cameras", "--source", "Video", "--source", "Video"});
  open();
  logIn();
  ASSERT_TRUE(selectWorkflow("Two Cameras"));
  ASSERT_THAT(studio().sources(), SizeIs(2));
  ASSERT_EQ(studio().sources()[1]->plan().source.kind, SourceKind::RemoteCamera);
  EXPECT_TRUE(waitFor([&] { return !studio().sources()[1]->pictureFile().empty(); }));
  type("title", "Two views");
  recordForAWhile();
  EXPECT_EQ(cameraOfServer(), "Studio A\trecording");
  press("pause");
  ASSERT_TRUE(isIn(TakeState::Paused));
  EXPECT_EQ(studio().sources()[1]->state(), SourceState::Paused);
  EXPECT_EQ(cameraOfServer(), "Studio A\tpaused");
  press("pause");
  ASSERT_TRUE(isIn(TakeState::Recording));
  press("stop");
  ASSERT_TRUE(hasSubmitted(2)) << studio().notice();
  EXPECT_EQ(cameraOfServer(), "Studio A\tidle");
  expectTwoPartsOfOneRecording("Two views");
  EXPECT_TRUE(waitFor([&] { return studio().canRecord(); }));
}

// Somebody else records with it.
TEST_F(RecorderWindowTest, tellsThatACameraOfTheServerDoesNotStart_andRecordsLater) {
  server_->administrate({"camera", "add"}, {"Studio A"});
  open();
  logIn();
  ASSERT_TRUE(selectWorkflow("Single Video"));
  studio().chooseSource(0, {SourceKind::RemoteCamera, "Studio A", "Studio A"});
  ASSERT_TRUE(waitFor([&] { return studio().canRecord(); }));
  server_->administrate({"inject", "failure"}, {"--command", "start", "--status", "36", "--times", "1"});
  press("record");
  ASSERT_TRUE(waitFor([&] { return studio().notice().find("did not start") != std::string::npos; }));
  ASSERT_TRUE(waitFor([&] { return studio().canRecord(); }));
  recordForAWhile();
  press("stop");
  ASSERT_TRUE(hasSubmitted(1)) << studio().notice();
  EXPECT_EQ(cameraOfServer(), "Studio A\tidle");
}

TEST_F(RecorderWindowTest, showsALostCamera_andSubmitsWhatThereIs) {
  open();
  logIn();
  ASSERT_TRUE(selectWorkflow("Camera and Screen"));
  recordForAWhile();
  ASSERT_TRUE(desktop().devices->remove("lumora_camera"));
  ASSERT_TRUE(waitFor([&] { return studio().sources()[0]->state() == SourceState::Failed; }));
  EXPECT_EQ(studio().sources()[1]->state(), SourceState::Recording);
  EXPECT_NE(studio().notice(), "");
  press("stop");
  ASSERT_TRUE(hasSubmitted(2)) << studio().notice();
  EXPECT_FALSE(studio().canRecord());
  ASSERT_TRUE(desktop().devices->add("camera", "lumora_camera"));
  EXPECT_TRUE(waitFor([&] { return studio().canRecord(); }));
}

TEST_F(RecorderWindowTest, keepsASubmissionThatFails_andSubmitsItOnRequest) {
  open();
  logIn();
  ASSERT_TRUE(selectWorkflow("Single Video"));
  server_->administrate({"inject", "failure"}, {"--command", "submit", "--status", "20"});
  recordForAWhile();
  press("stop");
  ASSERT_TRUE(waitFor([&] {
    const auto waiting = studio().submissions().waiting();
    return waiting.size() == 1 && waiting.front().lastError;
  }));
  server_->administrate({"inject", "clear"});
  ASSERT_TRUE(waitFor([&] { return find<QListWidget>("submissions")->item(0)->flags() != Qt::NoItemFlags; }));
  find<QListWidget>("submissions")->item(0)->setSelected(true);
  press("submitNow");
  EXPECT_TRUE(hasSubmitted(1));
}

TEST_F(RecorderWindowTest, asksBeforeItCloses_whileItRecords) {
  open();
  logIn();
  ASSERT_TRUE(selectWorkflow("Single Video"));
  recordForAWhile();
  answer("Keep Recording");
  EXPECT_FALSE(window_->close());
  EXPECT_EQ(answers(), 1);
  EXPECT_TRUE(isIn(TakeState::Recording));
  answer("Stop and Submit");
  EXPECT_FALSE(window_->close());
  EXPECT_TRUE(waitFor([&] { return !window_->isVisible(); }));
  EXPECT_THAT(server_->episodes(), SizeIs(1));
}

TEST_F(RecorderWindowTest, discardsTheRecording_afterAQuestion) {
  open();
  logIn();
  ASSERT_TRUE(selectWorkflow("Screen Recording"));
  recordForAWhile();
  answer("Discard");
  press("cancel");
  EXPECT_TRUE(waitFor([&] { return !studio().isUnderWay(); }));
  EXPECT_EQ(answers(), 1);
  EXPECT_TRUE(waitFor([&] { return studio().canRecord(); }));
  for (const auto& entry : std::filesystem::recursive_directory_iterator(home_->path())) {
    EXPECT_NE(entry.path().extension(), ".mov") << entry.path();
  }
  EXPECT_THAT(server_->episodes(), IsEmpty());
}

TEST_F(RecorderWindowTest, recordsWithTheEncoderOfTheSettings) {
  open();
  logIn();
  ASSERT_TRUE(selectWorkflow("Single Video"));
  ASSERT_TRUE(waitFor([&] { return !studio().devices().encoders().empty(); }));
  const std::string last = studio().devices().encoders().back().identifier;
  chooseInSettings("encoder", last);
  EXPECT_EQ(studio().settings().encoder, last);
  ASSERT_TRUE(waitFor([&] { return studio().canRecord(); }));
  recordForAWhile();
  press("stop");
  ASSERT_TRUE(hasSubmitted(1)) << studio().notice();
  // One of them writes its name into the pictures.
  const auto isNamed = contentOf(server_->episodes().front()).find("x264 - core") != std::string::npos;
  EXPECT_EQ(isNamed, studio().devices().encoders().back().name == "x264");
}

// The window goes in the midst of a recording, and with it the journal, as if the program had died.
TEST_F(RecorderWindowTest, offersAnInterruptedRecording_andSubmitsIt) {
  open();
  logIn();
  ASSERT_TRUE(selectWorkflow("Single Video"));
  type("title", "Interrupted");
  recordForAWhile();
  window_.reset();
  open();
  answer("Submit");
  logIn();
  EXPECT_TRUE(waitFor([&] { return answers() == 1; }));
  ASSERT_TRUE(hasSubmitted(1)) << report();
  EXPECT_EQ(server_->episodes().front().string("title"), "Interrupted");
}

TEST_F(RecorderWindowTest, givesEverythingAName) {
  open();
  logIn();
  for (const QWidget* const widget : window_->findChildren<QWidget*>()) {
    const bool isReached =
        (widget->focusPolicy() & Qt::TabFocus) != 0 && widget->isVisible() && !widget->objectName().startsWith("qt_");
    const auto* const button = qobject_cast<const QAbstractButton*>(widget);
    if (isReached) {
      EXPECT_TRUE(!widget->accessibleName().isEmpty() || (button && !button->text().isEmpty()))
          << widget->metaObject()->className() << " " << widget->objectName().toStdString();
    }
  }
}

} // namespace
} // namespace recorder
