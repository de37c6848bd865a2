#include "RealRecorder.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <cstdio>
#include <functional>
#include <map>
#include <random>
#include <unordered_map>

namespace {

using namespace model;

std::string nameOf(const Mix& mix) {
  std::string name = mix.empty() ? "Empty" : "";
  for (const Kind kind : mix) {
    name += kind == Kind::Local ? "Local" : kind == Kind::Remote ? "Remote" : "Unknown";
  }
  return name;
}

// Every mix of up to three sources, in every order.
std::vector<Mix> allMixes() {
  std::vector<Mix> all{{}};
  for (std::size_t i = 0; i < all.size(); ++i) {
    const Mix mix = all[i];
    for (const Kind kind : {Kind::Local, Kind::Remote, Kind::Unknown}) {
      if (mix.size() < largestMix) {
        all.push_back(mix);
        all.back().push_back(kind);
      }
    }
  }
  return all;
}

// Of the mixes of three, one for each that differ in the order only: the order shows in two sources already, and the
// long walks take all.
std::vector<Mix> exploredMixes() {
  auto mixes = allMixes();
  std::erase_if(mixes,
                [](const Mix& mix) { return mix.size() == largestMix && !std::is_sorted(mix.begin(), mix.end()); });
  return mixes;
}

std::vector<Mix> mixesOfTwoAtMost() {
  auto mixes = allMixes();
  std::erase_if(mixes, [](const Mix& mix) { return mix.size() > 2; });
  return mixes;
}

std::string nameOfParameter(const testing::TestParamInfo<Mix>& mix) {
  return nameOf(mix.param);
}

// Does the event to both and compares all that can be seen.
void compare(RealRecorder& recorder, Model& model, const Event& event, State& state, std::size_t sourceCount) {
  const State before = state;
  const auto expected = model.apply(event, state);
  const auto seen = recorder.apply(event);
  const State reached = recorder.state();
  if (seen != expected || !(reached == state)) {
    ADD_FAILURE() << "in the state " << before.text(sourceCount) << ", event: " << text(event) << "\nexpected "
                  << state.text(sourceCount) << " with " << testing::PrintToString(expected) << "\nreached  "
                  << reached.text(sourceCount) << " with " << testing::PrintToString(seen);
  }
}

// Visits every state that can be reached once, and does every event there. Equal states have equal futures (which is
// what the long walks are to show), so that all sequences are covered; those that lead through a state are counted.
class Exploration {
public:
  using Step = std::function<void(const Event& event, State& state)>;

  Exploration(std::size_t sourceCount, Step step) : events_(allEvents(sourceCount)), step_(std::move(step)) {}

  void run(int depth) {
    std::map<std::uint32_t, std::uint64_t> level{{State().key(), 1}};
    states_.emplace(State().key(), Visited{State(), {}});
    for (int event = 0; event < depth && !testing::Test::HasFailure(); ++event) {
      std::map<std::uint32_t, std::uint64_t> next;
      for (const auto& [key, ways] : level) {
        for (const auto successor : successors(key)) {
          next[successor] += ways;
        }
      }
      level = std::move(next);
    }
    for (const auto& [key, ways] : level) {
      sequences_ += ways;
    }
  }

  std::uint64_t sequences() const { return sequences_; }
  std::size_t states() const { return states_.size(); }
  std::size_t transitions() const { return transitions_; }

private:
  struct Visited {
    State state;
    std::vector<std::uint32_t> successors;
  };

  std::vector<std::uint32_t> successors(std::uint32_t key) {
    auto found = states_.at(key).successors;
    if (found.empty()) {
      for (const auto& event : events_) {
        State state = states_.at(key).state;
        step_(event, state);
        found.push_back(state.key());
        states_.emplace(state.key(), Visited{state, {}});
      }
      transitions_ += found.size();
      states_.at(key).successors = found;
    }
    return found;
  }

  const std::vector<Event> events_;
  const Step step_;
  std::unordered_map<std::uint32_t, Visited> states_;
  std::uint64_t sequences_ = 0;
  std::size_t transitions_ = 0;
};

void explore(const Mix& mix, bool isTester) {
  const RealPlatform platform(isTester);
  RealRecorder recorder(platform, mix);
  Model model(mix, isTester);
  Exploration exploration(mix.size(), [&](const Event& event, State& state) {
    recorder.setState(state);
    compare(recorder, model, event, state, mix.size());
  });
  exploration.run(6);
  std::printf("%s: %llu sequences of 6 events, through %zu states by %zu compared transitions\n", nameOf(mix).c_str(),
              static_cast<unsigned long long>(exploration.sequences()), exploration.states(),
              exploration.transitions());
}

class SixEvents : public testing::TestWithParam<Mix> {};

TEST_P(SixEvents, haveTheOutcomeOfTheTables_inEverySequence) {
  explore(GetParam(), false);
}

INSTANTIATE_TEST_SUITE_P(Of, SixEvents, testing::ValuesIn(exploredMixes()), nameOfParameter);

class SixEventsInTheTester : public testing::TestWithParam<Mix> {};

TEST_P(SixEventsInTheTester, haveTheOutcomeOfTheTables_inEverySequence) {
  explore(GetParam(), true);
}

INSTANTIATE_TEST_SUITE_P(Of, SixEventsInTheTester, testing::ValuesIn(mixesOfTwoAtMost()), nameOfParameter);

class LongWalk : public testing::TestWithParam<Mix> {};

// Nothing is merged here, and nothing set from outside: a state that the flags do not show would be found out.
TEST_P(LongWalk, hasTheOutcomeOfTheTables_forANewRecorder) {
  const RealPlatform platform(false);
  const auto events = allEvents(GetParam().size());
  std::mt19937 random(1); // the same walks in every run
  std::uniform_int_distribution<std::size_t> any(0, events.size() - 1);
  for (int walk = 0; walk < 50; ++walk) {
    RealRecorder recorder(platform, GetParam());
    Model model(GetParam(), false);
    State state;
    for (int i = 0; i < 30 && !HasFailure(); ++i) {
      Event event = events[any(random)];
      // A failure ends the listening for good, so it comes late.
      if (event.type == Event::Type::Failure && i < 25) {
        event.type = Event::Type::Success;
      }
      compare(recorder, model, event, state, GetParam().size());
    }
  }
}

INSTANTIATE_TEST_SUITE_P(Of, LongWalk, testing::ValuesIn(allMixes()), nameOfParameter);

} // namespace
