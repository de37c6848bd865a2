// What recording a camera with a microphone costs in processor time, against the same encoders in a bare pipeline.
// Both sides take turns on the same headless devices, each in a process of its own, and the medians are compared.
#include "support/Figures.h"

#include <LumoraKit/platform/MediaCapture.h>
#include <LumoraKit/platform/Platform.h>

#include <algorithm>
#include <array>
#include <atomic>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <string_view>
#include <thread>

#include <fcntl.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

namespace {

using namespace lumora;

constexpr int rounds = 3;
constexpr HostTime length = 10'000'000'000;
constexpr const char* devices = LUMORA_SOURCE_DIR "/examples/headless-devices";

// 10 s of 720p30 with sound.
constexpr const char* barePipeline =
    "exec gst-launch-1.0 -q pipewiresrc target-object=lumora_camera always-copy=true num-buffers=300 ! "
    "video/x-raw,width=1280,height=720,framerate=30/1 ! queue ! videoconvertscale ! video/x-raw,format=I420 ! "
    "x264enc speed-preset=superfast tune=zerolatency key-int-max=24 option-string=scenecut=0 bitrate=4000 ! "
    "video/x-h264,profile=high ! "
    "h264parse ! queue ! mux. pulsesrc device=lumora_microphone latency-time=10000 num-buffers=1000 ! "
    "audio/x-raw,format=S16LE,rate=48000,channels=2 ! queue ! audioconvert ! avenc_aac bitrate=128000 ! aacparse ! "
    "queue ! mux. qtmux name=mux fragment-duration=800 fragment-mode=dash-or-mss ! "
    "filesink buffer-mode=unbuffered location=\"$0\"";

/// Records 10 seconds as an application does.
class Recorder final : public MovieFileOutputDelegate {
public:
  using Output = std::shared_ptr<MovieFileOutput>;

  explicit Recorder(std::filesystem::path file) : file_(std::move(file)) {}

  bool waitForEnd() {
    done_.wait(false);
    return !failed_;
  }
  /// Pictures at 30 a second from the first to the last one.
  long pictures() const { return std::lround(static_cast<double>(stopped_ - started_) * 30 / 1e9); }

  void captureOutput_didOutputSampleBuffer_fromConnection(MovieFileOutput& output, const SampleBuffer& sample,
                                                          CaptureConnection& connection) override {
    if (connection.mediaType() != MediaType::Video || stopped_ != 0) {
      return;
    }
    const HostTime time = *sample.hostTime();
    if (started_ == 0) {
      started_ = time;
      output.recordToOutputFileURL(file_);
    } else if (time >= started_ + length) {
      stopped_ = time;
      output.recordToOutputFileURL(std::nullopt);
    }
  }
  void captureOutput_didFinishRecordingToOutputFileAtURL_forConnections_dueToError(const Output&,
                                                                                   const std::filesystem::path&,
                                                                                   const Connections&,
                                                                                   const LMRErrorRef& error) override {
    failed_ = error != nullptr;
    done_ = true;
    done_.notify_all();
  }
  void captureOutput_didStartRecordingToOutputFileAtURL_forConnections(const Output&, const std::filesystem::path&,
                                                                       const Connections&) override {}
  void captureOutput_didPauseRecordingToOutputFileAtURL_forConnections(const Output&, const std::filesystem::path&,
                                                                       const Connections&) override {}
  void captureOutput_didResumeRecordingToOutputFileAtURL_forConnections(const Output&, const std::filesystem::path&,
                                                                        const Connections&) override {}
  void captureOutput_willFinishRecordingToOutputFileAtURL_forConnections_dueToError(const Output&,
                                                                                    const std::filesystem::path&,
                                                                                    const Connections&,
                                                                                    const LMRErrorRef&) override {}

private:
  const std::filesystem::path file_;
  HostTime started_ = 0;
  HostTime stopped_ = 0;
  std::atomic<bool> done_{false};
  std::atomic<bool> failed_{false};
};

[[noreturn]] void fail(const char* what) {
  std::fprintf(stderr, "%s\n", what);
  std::exit(EXIT_FAILURE);
}

// The recording side: prints how many pictures there were to record.
int record(const std::filesystem::path& file) {
  MediaCapture& capture = *Platform::current().mediaCapture;
  const auto session = capture.makeSession();
  for (const char* const name : {"video:lumora_camera", "audio:lumora_microphone"}) {
    const auto device = capture.deviceWithUniqueID(name);
    if (!device || device->open() || session->addInput(capture.makeDeviceInput(device))) {
      fail("a device does not open");
    }
  }
  const auto output = capture.makeMovieFileOutput();
  const auto recorder = std::make_shared<Recorder>(file);
  output->setDelegate(recorder);
  if (session->addOutput(output) || session->startRunning() || !recorder->waitForEnd()) {
    fail("the recording failed");
  }
  session->stopRunning();
  std::printf("%ld\n", recorder->pictures());
  return EXIT_SUCCESS;
}

struct Child {
  double seconds;
  std::string output;
};

// Runs a program to its end: what it printed, and its processor time.
Child run(const std::vector<std::string>& arguments) {
  int output[2];
  if (::pipe2(output, O_CLOEXEC) != 0) {
    fail("pipe2");
  }
  std::vector<char*> words;
  for (const std::string& argument : arguments) {
    words.push_back(const_cast<char*>(argument.c_str()));
  }
  words.push_back(nullptr);
  const pid_t pid = ::fork();
  if (pid == 0) {
    ::dup2(output[1], STDOUT_FILENO);
    ::execvp(words[0], words.data());
    ::_exit(127);
  }
  ::close(output[1]);
  Child child{0, {}};
  std::array<char, 4096> buffer{};
  for (ssize_t size = 0; (size = ::read(output[0], buffer.data(), buffer.size())) > 0;) {
    child.output.append(buffer.data(), static_cast<std::size_t>(size));
  }
  ::close(output[0]);
  int status = 0;
  rusage usage{};
  ::wait4(pid, &status, 0, &usage);
  if (!WIFEXITED(status) || WEXITSTATUS(status) != 0) {
    fail("a side of the bench failed");
  }
  const auto seconds = [](const timeval& time) {
    return static_cast<double>(time.tv_sec) + 1e-6 * static_cast<double>(time.tv_usec);
  };
  child.seconds = seconds(usage.ru_utime) + seconds(usage.ru_stime);
  return child;
}

long picturesIn(const std::filesystem::path& file) {
  return std::atol(run({"ffprobe", "-v", "error", "-select_streams", "v:0", "-count_packets", "-show_entries",
                        "stream=nb_read_packets", "-of", "csv=p=0", file})
                       .output.c_str());
}

int compare(const std::string& self) {
  std::string folder = std::filesystem::temp_directory_path() / "lumora-bench-XXXXXX";
  if (!::mkdtemp(folder.data())) {
    fail("mkdtemp");
  }
  const std::filesystem::path file = std::filesystem::path(folder) / "recording.mov";
  std::vector<double> ours;
  std::vector<double> bare;
  long dropped = 0;
  for (int round = 0; round < rounds; ++round) {
    const Child child = run({self, "--record", file});
    dropped += std::labs(std::atol(child.output.c_str()) - picturesIn(file));
    ours.push_back(child.seconds);
    bare.push_back(run({"sh", "-c", barePipeline, file}).seconds);
    std::printf("round %d: %.2f s against %.2f s of processor time\n", round + 1, ours.back(), bare.back());
  }
  std::filesystem::remove_all(folder);
  std::ranges::sort(ours);
  std::ranges::sort(bare);
  using bench::Bar;
  const bool cheap = bench::report("CPU of a 720p30 recording with sound against the same encoders in gst-launch",
                                   ours[rounds / 2] / bare[rounds / 2], Bar::AtMost, 1.10);
  const bool complete =
      bench::report("frames dropped by that recording", static_cast<double>(dropped), Bar::AtMost, 0, "frames");
  return cheap && complete ? EXIT_SUCCESS : EXIT_FAILURE;
}

} // namespace

int main(int argc, char** argv) {
  const std::string_view mode = argc > 1 ? argv[1] : "";
  if (mode == "--record" && argc == 3) {
    return record(argv[2]);
  }
  if (mode == "--compare") {
    return compare("/proc/self/exe");
  }
  // "/proc/self/exe" would be another program in the script.
  const std::string self = std::filesystem::read_symlink("/proc/self/exe");
  ::execl(devices, devices, self.c_str(), "--compare", nullptr);
  fail("the headless devices do not start");
}
