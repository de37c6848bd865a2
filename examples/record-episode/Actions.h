#pragma once

#include <LumoraKit/LumoraKit.h>

#include <memory>
#include <string>
#include <string_view>
#include <vector>

namespace stage {

/// A failed step of the road, as a sentence (a Failure).
[[noreturn]] void fail(const std::string& step, const LMRErrorRef& error);

/// Starts a server operation and serves the main thread until its end; an operation that fails is a Failure.
void runAction(const KTActionRef& action);

/// Runs an operation that lists something: the array that the reply has under a key, as dictionaries.
std::vector<lumora::Dictionary> listed(const std::shared_ptr<LMRAction>& list, std::string_view key);

} // namespace stage
