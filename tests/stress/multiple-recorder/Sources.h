#pragma once

#include <LumoraKit/recording/LMRMultipleSourceRecorder.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <atomic>
#include <memory>
#include <ostream>
#include <string>

/// Which sources a recorder has, and how many.
struct Cast {
  std::string name;
  int locals;
  int remotes;

  int size() const { return locals + remotes; }
  bool isMix() const { return locals > 0 && remotes > 0; }
};

inline void PrintTo(const Cast& cast, std::ostream* stream) {
  *stream << cast.name;
}

/// The requests to sources whose outcome the recorder has not handled yet.
using OpenRequests = std::shared_ptr<std::atomic<int>>;

/// Fake local sources, which report each request's success on a thread of their own; remote sources, whose commands are
/// answered by the platform's tool runner. The recorder has a workflow and a session.
std::shared_ptr<LMRMultipleSourceRecorder> makeRecorder(const Cast& cast, const OpenRequests& open);

/// Lets the server list enough submission UUIDs.
void prepareServer(lumora::fakes::FakePlatform& platform, const Cast& cast);
