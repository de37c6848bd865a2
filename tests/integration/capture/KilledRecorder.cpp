#include "KilledRecorder.h"

#include "CaptureRig.h"
#include "support/Movie.h"

#include <LumoraKit/platform/Platform.h>

#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <thread>

#include <fcntl.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

namespace lumora::testing {

using namespace std::chrono_literals;

namespace {

bool addDevice(MediaCapture& capture, CaptureSession& session, const char* uniqueID) {
  const auto device = capture.deviceWithUniqueID(uniqueID);
  return device && !device->open() && !session.addInput(capture.makeDeviceInput(device));
}

} // namespace

int recordUntilKilled(const std::filesystem::path& file) {
  ::prctl(PR_SET_PDEATHSIG, SIGKILL);
  MediaCapture& capture = *Platform::current().mediaCapture;
  const auto session = capture.makeSession();
  const auto output = capture.makeMovieFileOutput();
  const auto delegate = std::make_shared<NotingDelegate>();
  output->setDelegate(delegate);
  if (!addDevice(capture, *session, "video:lumora_camera") ||
      !addDevice(capture, *session, "audio:lumora_microphone") || session->addOutput(output) ||
      session->startRunning()) {
    return EXIT_FAILURE;
  }
  const HostTime start =
      delegate->atNext(MediaType::Video, [&](MovieFileOutput& self) { self.recordToOutputFileURL(file); });
  if (!delegate->waitFor("did-start", file)) {
    return EXIT_FAILURE;
  }
  std::printf("%llu\n", static_cast<unsigned long long>(start));
  std::fflush(stdout);
  ::pause();
  return EXIT_FAILURE;
}

class KilledRecorder : public CaptureRig {
protected:
  /// The time at which the other process's file begins.
  HostTime startRecorder(const std::filesystem::path& file) {
    int output[2];
    EXPECT_EQ(::pipe2(output, O_CLOEXEC), 0);
    pid_ = ::fork();
    if (pid_ == 0) {
      ::dup2(output[1], STDOUT_FILENO);
      ::execl("/proc/self/exe", "integration-capture", recordUntilKilledSwitch, file.c_str(), nullptr);
      ::_exit(127);
    }
    ::close(output[1]);
    char text[64] = {};
    const auto size = ::read(output[0], text, sizeof text - 1);
    ::close(output[0]);
    return size > 0 ? std::strtoull(text, nullptr, 10) : 0;
  }

  /// Copies the file as a death of the recorder at this moment would leave it; the moment's time.
  HostTime copyAsIfKilled(const std::filesystem::path& from, const std::filesystem::path& to) const {
    const HostTime time = capture().hostTime();
    ::kill(pid_, SIGSTOP);
    int status = 0;
    ::waitpid(pid_, &status, WUNTRACED);
    std::filesystem::copy_file(from, to);
    ::kill(pid_, SIGCONT);
    return time;
  }

  HostTime killRecorder() const {
    const HostTime time = capture().hostTime();
    ::kill(pid_, SIGKILL);
    ::waitpid(pid_, nullptr, 0);
    return time;
  }

  static void expectComplete(const std::filesystem::path& file, HostTime time) {
    const double recorded = static_cast<double>(time) / 1e9;
    const Movie movie(file);
    ASSERT_FALSE(movie.times("v").empty());
    ASSERT_FALSE(movie.times("a").empty());
    EXPECT_TRUE(movie.decodes());
    EXPECT_GT(movie.times("v").back(), recorded - 1.2);
    EXPECT_GT(movie.times("a").back(), recorded - 1.2);
  }

private:
  pid_t pid_ = -1;
};

TEST_F(KilledRecorder, leavesAPlayableFileThatLacksTheLastSecondAtMost_whenKilled) {
  const HostTime start = startRecorder(file("a.mov"));
  ASSERT_NE(start, 0U);
  std::this_thread::sleep_for(2s);
  // Whatever is being written at that moment.
  std::vector<HostTime> times;
  for (int i = 0; i < 8; ++i) {
    std::this_thread::sleep_for(170ms);
    times.push_back(copyAsIfKilled(file("a.mov"), file(std::to_string(i) + ".mov")) - start);
  }
  const HostTime killed = killRecorder() - start;
  expectComplete(file("a.mov"), killed);
  for (std::size_t i = 0; i < times.size(); ++i) {
    expectComplete(file(std::to_string(i) + ".mov"), times[i]);
  }
}

} // namespace lumora::testing
