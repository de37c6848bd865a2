// What recording a camera with a microphone, and two of them at once, costs in processor time, against the same
// encoders in bare pipelines. Both sides take turns on the same headless devices, each in a process of its own, and the
// medians are compared.
#include "support/Figures.h"
#include "support/TemporaryFolder.h"

#include <LumoraKit/platform/MediaCapture.h>
#include <LumoraKit/platform/Platform.h>

#include <algorithm>
#include <array>
#include <atomic>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <sstream>
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

constexpr std::array cameras{"lumora_camera", "lumora_second"};

using Paths = std::vector<std::filesystem::path>;

// 10 s of 720p30 with sound, for each file at once.
std::string barePipelines(const Paths& files) {
  std::string script;
  std::string waits = "true";
  for (std::size_t i = 0; i < files.size(); ++i) {
    script +=
        std::string("gst-launch-1.0 -q pipewiresrc target-object=") + cameras.at(i) +
        " always-copy=true num-buffers=300 ! "
        "video/x-raw,width=1280,height=720,framerate=30/1 ! queue ! videoconvertscale ! video/x-raw,format=I420 ! "
        "x264enc speed-preset=superfast tune=zerolatency key-int-max=24 option-string=scenecut=0 bitrate=4000 ! "
        "video/x-h264,profile=high ! "
        "h264parse ! queue ! mux. pulsesrc device=lumora_microphone latency-time=20000 num-buffers=500 ! "
        "audio/x-raw,format=S16LE,rate=48000,channels=2 ! queue ! audioconvert ! avenc_aac bitrate=128000 ! "
        "aacparse ! queue ! mux. qtmux name=mux fragment-duration=800 fragment-mode=dash-or-mss ! "
        "filesink buffer-mode=unbuffered location='" +
        files[i].string() + "' & p" + std::to_string(i) + "=$!\n";
    waits += " && wait $p" + std::to_string(i);
  }
  return script + waits;
}

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

struct Source {
  std::shared_ptr<CaptureSession> session;
  std::shared_ptr<MovieFileOutput> output;
  std::shared_ptr<Recorder> recorder;
};

Source open(const char* camera, const std::filesystem::path& file) {
  MediaCapture& capture = *Platform::current().mediaCapture;
  const Source source{capture.makeSession(), capture.makeMovieFileOutput(), std::make_shared<Recorder>(file)};
  for (const std::string& name : {std::string("video:") + camera, std::string("audio:lumora_microphone")}) {
    const auto device = capture.deviceWithUniqueID(name);
    if (!device || device->open() || source.session->addInput(capture.makeDeviceInput(device))) {
      fail("a device does not open");
    }
  }
  source.output->setDelegate(source.recorder);
  if (source.session->addOutput(source.output)) {
    fail("an output is refused");
  }
  return source;
}

// The recording side: prints how many pictures there were to record, a line a file.
int record(const Paths& files) {
  std::vector<Source> sources;
  for (std::size_t i = 0; i < files.size(); ++i) {
    sources.push_back(open(cameras.at(i), files[i]));
  }
  for (const Source& source : sources) {
    if (source.session->startRunning()) {
      fail("a session does not start");
    }
  }
  for (const Source& source : sources) {
    if (!source.recorder->waitForEnd()) {
      fail("the recording failed");
    }
    source.session->stopRunning();
    std::printf("%ld\n", source.recorder->pictures());
  }
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

struct Comparison {
  double ratio;
  long dropped;
};

double median(std::vector<double> values) {
  std::ranges::sort(values);
  return values[values.size() / 2];
}

Comparison compare(const std::string& self, const Paths& files) {
  std::vector<std::string> recording{self, "--record"};
  recording.insert(recording.end(), files.begin(), files.end());
  std::vector<double> ours;
  std::vector<double> bare;
  long dropped = 0;
  for (int round = 0; round < rounds; ++round) {
    const Child child = run(recording);
    std::istringstream pictures(child.output);
    for (const auto& file : files) {
      long count = 0;
      pictures >> count;
      dropped += std::labs(count - picturesIn(file));
    }
    ours.push_back(child.seconds);
    bare.push_back(run({"sh", "-c", barePipelines(files)}).seconds);
    std::printf("round %d, %zu sources: %.2f s against %.2f s of processor time\n", round + 1, files.size(),
                ours.back(), bare.back());
  }
  return {median(ours) / median(bare), dropped};
}

int compare(const std::string& self) {
  const tests::TemporaryFolder folder;
  const std::filesystem::path first = folder / "first.mov";
  const Comparison one = compare(self, {first});
  const Comparison two = compare(self, {first, folder / "second.mov"});
  using bench::Bar;
  bool good = bench::report("CPU of a 720p30 recording with sound against the same encoders in gst-launch", one.ratio,
                            Bar::AtMost, 1.10);
  good &= bench::report("frames dropped by that recording", static_cast<double>(one.dropped), Bar::AtMost, 0, "frames");
  good &=
      bench::report("CPU of two 720p30 sources with sound against two such pipelines", two.ratio, Bar::AtMost, 1.10);
  good &= bench::report("frames dropped by those two", static_cast<double>(two.dropped), Bar::AtMost, 0, "frames");
  return good ? EXIT_SUCCESS : EXIT_FAILURE;
}

} // namespace

int main(int argc, char** argv) {
  const std::string_view mode = argc > 1 ? argv[1] : "";
  if (mode == "--record") {
    return record(Paths(argv + 2, argv + argc));
  }
  if (mode == "--compare") {
    return compare("/proc/self/exe");
  }
  // "/proc/self/exe" would be another program in the script.
  const std::string self = std::filesystem::read_symlink("/proc/self/exe");
  ::execl(devices, devices, "--add", "camera", cameras.back(), self.c_str(), "--compare", nullptr);
  fail("the headless devices do not start");
}
