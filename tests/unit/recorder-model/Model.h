#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

/// What a recorder of several sources must do, written down a second time and as plainly as possible: flags in, flags
/// and a trace out. It knows no thread, no queue and no object.
namespace model {

enum class Kind { Local, Remote, Unknown };

/// The kinds of the sources, in order. Unknown ones are local.
using Mix = std::vector<Kind>;

enum class Verb { Start, Pause, Resume, Stop, Cancel };

struct Event {
  enum class Type {
    Request,              ///< the application asks the recorder
    StopWithoutContainer, ///< the application asks for a stop, and the server refuses the container
    Success,              ///< a source reports
    Failure               ///< a source reports
  };
  Type type = Type::Request;
  Verb verb = Verb::Start;
  std::size_t source = 0;
};

/// "source 1 failed to pause".
std::string text(const Event& event);

/// Everything that can happen with so many sources.
std::vector<Event> allEvents(std::size_t sourceCount);

struct Flags {
  bool isStarting = false;
  bool isRecording = false;
  bool isPaused = false;
  bool isCancelled = false;

  bool operator==(const Flags&) const = default;
};

constexpr std::size_t largestMix = 3;

struct State {
  Flags recorder;
  std::array<Flags, largestMix> sources;
  /// Whether the recorder is still its sources' delegate.
  bool listens = true;

  bool operator==(const State&) const = default;

  /// What two states must have in common to have the same future: everything but whether a source is starting, which
  /// the recorder must not look at.
  std::uint32_t key() const;
  std::string text(std::size_t sourceCount) const;
};

/// The delay that the application asks for; the error codes of a refused container and of the first source.
constexpr int delay = 5;
constexpr int containerError = 30;
constexpr int firstSourceError = 100;

class Model {
public:
  /// \param isTester whether the application is the recorder test application
  Model(Mix mix, bool isTester) : mix_(std::move(mix)), isTester_(isTester) {}

  /// Changes the state. The trace: what the sources are asked ("0 start 5", "1 stop UUID 0"), what the delegate is told
  /// ("told recorderDidStartRecording:"), and the lines of the recorder's own.
  std::vector<std::string> apply(const Event& event, State& state);

private:
  bool isRemote(std::size_t source) const { return mix_[source] == Kind::Remote; }
  bool isMixed() const;
  void request(Verb verb);
  void stop();
  void ask(std::size_t source, Verb verb, int delayOfStart);
  void succeeded(Verb verb, std::size_t source);
  void startedOrPausedOrResumed(Verb verb);
  void stopped(std::size_t source);
  void failed(Verb verb, std::size_t source);
  void report(Verb verb);
  void reportFailure(Verb verb, int error);

  template <class Holds> bool everySource(Holds holds) const {
    for (std::size_t source = 0; source < mix_.size(); ++source) {
      if (!holds(source)) {
        return false;
      }
    }
    return true;
  }

  const Mix mix_;
  const bool isTester_;
  State* state_ = nullptr;
  std::vector<std::string> trace_;
};

} // namespace model
